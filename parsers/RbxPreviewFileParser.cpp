#include "parsers/RbxPreviewFileParser.h"

#include "platform/rbx/OkaRbxItem.h"
#include "platform/rbx/Rbx.h"
#include "platform/rbx/RbxFormat.h"
#include "platform/system/FileSystem.h"
#include "platform/system/OleDateTime.h"
#include "platform/system/Text.h"
#include "platform/units/Units.h"

#include <cmath>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <algorithm>
#include <charconv>
#include <exception>
#include <memory>
#include <vector>

// A file opened through the library, closed and released however the reading ends.
class COpenRbxFile {
public:
    explicit COpenRbxFile(const CString& path) { m_bOpen = rbxFileRead(path.c_str(), &m_pHeader, &m_pFile) == 0; }
    ~COpenRbxFile()
    {
        if (m_bOpen) {
            rbxFileClose(m_pHeader, m_pFile);
            rbxHeaderDestroy(m_pHeader);
        }
    }
    COpenRbxFile(const COpenRbxFile&) = delete;
    COpenRbxFile& operator=(const COpenRbxFile&) = delete;

    bool IsOpen() const { return m_bOpen; }
    rbxHeader* Header() const { return m_pHeader; }
    rbxFile* File() const { return m_pFile; }

private:
    rbxHeader* m_pHeader = nullptr;
    rbxFile* m_pFile = nullptr;
    bool m_bOpen = false;
};

namespace {

// Why the library failed on `path`: its own message, made to name the file, else `otherwise`.
CString LibraryFailure(const CString& path, const CString& otherwise)
{
    if (!sys::FileExists(path))
        return path + ": the file does not exist";
    const CString message = rbxLastError();
    if (message.empty())
        return path + ": " + otherwise;
    return message.rfind(path + ":", 0) == 0 ? message : path + ": " + message;
}

struct AxisValues {
    int type = 0;
    int unitKey = 0;
    CString unitText;
    CString startDate;
    CString startTime;
    double start = 0.0;
    double step = 0.0; // the span for non-equidistant axes
    int steps = 0;
    int index = 0;
};

bool ReadAxis(const rbxHeader* header, AxisValues& axis)
{
    axis.type = rbxGetTimeAxisType(header);
    switch (axis.type) {
    case rbx::kEquidistantRelative:
        return rbxGetEqTimeAxis(header, &axis.unitKey, &axis.unitText, &axis.start, &axis.step, &axis.steps,
                                &axis.index) == 0;
    case rbx::kNonEquidistantRelative:
        return rbxGetNeqTimeAxis(header, &axis.unitKey, &axis.unitText, &axis.start, &axis.step, &axis.steps,
                                 &axis.index) == 0;
    case rbx::kEquidistantCalendar:
        return rbxGetEqCalendarAxis(header, &axis.startDate, &axis.startTime, &axis.unitKey, &axis.unitText,
                                    &axis.start, &axis.step, &axis.steps, &axis.index) == 0;
    case rbx::kNonEquidistantCalendar:
        return rbxGetNeqCalendarAxis(header, &axis.startDate, &axis.startTime, &axis.unitKey, &axis.unitText,
                                     &axis.start, &axis.step, &axis.steps, &axis.index) == 0;
    default:
        return false;
    }
}

// The stamp of the first step before any step offset. Calendar axes start at their start date and
// time plus the start offset; relative axes count from the OLE epoch, 30 December 1899.
COleDateTime BaseStamp(const AxisValues& axis, double daysPerUnit)
{
    COleDateTime base;
    if (rbx::IsCalendarAxis(axis.type)) {
        int year = 0, month = 0, day = 0, hour = 0, minute = 0, second = 0;
        std::sscanf(axis.startDate.c_str(), "%d-%d-%d", &year, &month, &day);
        std::sscanf(axis.startTime.c_str(), "%d:%d:%d", &hour, &minute, &second);
        base.SetDateTime(year, month, day, hour, minute, second);
    }
    return base.AddDays(axis.start * daysPerUnit);
}

// Offset of step `t` from the base stamp, in days.
double StepOffsetDays(const AxisValues& axis, int t, double stepTime, double daysPerUnit)
{
    if (rbx::IsEquidistantAxis(axis.type))
        return t * axis.step * daysPerUnit;
    return stepTime * daysPerUnit;
}

// Writes `value` with `digits` digits, zero-padded, at `out`.
char* PutDigits(char* out, int value, int digits)
{
    for (int i = digits - 1; i >= 0; --i, value /= 10)
        out[i] = static_cast<char>('0' + value % 10);
    return out + digits;
}

// "%Y-%m-%d %H:%M:%S" of `stamp`, written by hand: it runs once per time step of the file.
CString FormatStamp(const COleDateTime& stamp)
{
    int year, month, day, hour, minute, second;
    if (!stamp.GetFields(year, month, day, hour, minute, second))
        return "Invalid DateTime";
    char text[19];
    char* p = PutDigits(text, year, 4);
    *p++ = '-';
    p = PutDigits(p, month, 2);
    *p++ = '-';
    p = PutDigits(p, day, 2);
    *p++ = ' ';
    p = PutDigits(p, hour, 2);
    *p++ = ':';
    p = PutDigits(p, minute, 2);
    *p++ = ':';
    PutDigits(p, second, 2);
    return CString(text, sizeof(text));
}

template <typename T>
T Load(const unsigned char* bytes)
{
    T value;
    std::memcpy(&value, bytes, sizeof(value));
    return value;
}

// The text of one value: "%f" for floating point (six decimals), the character itself, or the
// decimal integer. to_chars gives the same digits as printf, many times faster.
void WriteValue(int dataType, const unsigned char* value, CString& text)
{
    char buffer[400]; // "%f" of the largest double takes 316 characters
    char* const end = buffer + sizeof(buffer);
    std::to_chars_result written{buffer, std::errc()};
    switch (dataType) {
    case rbx::kFloat32:
        written = std::to_chars(buffer, end, static_cast<double>(Load<float>(value)), std::chars_format::fixed, 6);
        break;
    case rbx::kFloat64:
        written = std::to_chars(buffer, end, Load<double>(value), std::chars_format::fixed, 6);
        break;
    case rbx::kChar:
        text.assign(1, static_cast<char>(value[0]));
        return;
    case rbx::kInt32:
        written = std::to_chars(buffer, end, Load<std::int32_t>(value));
        break;
    case rbx::kUInt32:
        written = std::to_chars(buffer, end, Load<std::uint32_t>(value));
        break;
    case rbx::kInt16:
        written = std::to_chars(buffer, end, Load<std::int16_t>(value));
        break;
    case rbx::kInteger:
        written = std::to_chars(buffer, end, Load<std::int64_t>(value));
        break;
    default:
        break;
    }
    text.assign(buffer, written.ec == std::errc() ? written.ptr : buffer);
}

// Reads the next value of an item into `valueBuffer` (large enough for all the item's values) and
// writes the first as text; unknown data types read nothing.
bool ReadValueText(const COpenRbxFile& rbxFile, int dataType, std::vector<unsigned char>& valueBuffer, double& time,
                   CString& text)
{
    if (!rbx::IsValidDataType(dataType)) {
        text.clear();
        return true;
    }
    if (rbxReadItemTimeStep(rbxFile.Header(), rbxFile.File(), &time, valueBuffer.data()) != 0)
        return false;
    WriteValue(dataType, valueBuffer.data(), text);
    return true;
}

} // namespace

CRbxPreviewFileParser::CRbxPreviewFileParser() { rbxInitSystem(); }

std::unique_ptr<COpenRbxFile> CRbxPreviewFileParser::OpenBoundFile()
{
    auto file = sys::FileExists(m_strFile) ? std::make_unique<COpenRbxFile>(m_strFile) : nullptr;
    if (file && file->IsOpen())
        return file;
    m_strFailure = LibraryFailure(m_strFile, "the file cannot be read as an rbx0 file");
    return nullptr;
}

int CRbxPreviewFileParser::Parse(const CString& path)
{
    m_vecItemNames.clear();
    m_vecRawLines.clear();
    m_vecRows.clear();
    rbxInitSystem();
    COpenRbxFile rbxFile(path);
    if (!rbxFile.IsOpen()) {
        m_strFailure = LibraryFailure(path, "the file cannot be read as an rbx0 file");
        return 0;
    }
    rbxHeader* header = rbxFile.Header();
    const int fileType = rbxGetFileType(header);
    if (fileType != rbx::kSharedDeleteValue && fileType != rbx::kPerItemDeleteValue)
        return Fail(path, 0, text::Format("the file type is %d; only types 1 and 4 are read", fileType));
    rbxGetDataType(header);
    AxisValues axis;
    if (!ReadAxis(header, axis) || axis.steps < 0)
        return Fail(path, 0, text::Format("the time axis (of type %d) cannot be read", axis.type));
    double daysPerUnit = 1.0;
    ruqConvertUnit(axis.unitKey, 1.0, units::kUnitDay, &daysPerUnit);
    const COleDateTime base = BaseStamp(axis, daysPerUnit);

    const int itemCount = rbxGetNoOfItems(header);
    std::vector<int> dataTypes;
    size_t largestValue = 16;
    m_vecItemNames.push_back("Date/time");
    for (int i = 1; i <= itemCount; ++i) {
        rbxItem* item = rbxItemD(header, i);
        if (!item || rbxGetItemAxisType(item) != rbx::kScalarItem)
            return Fail(path, 0, text::Format("item %d is not a scalar item (one value per time step)", i));
        CString name;
        int dataType = 0, valueType = 0;
        rbxGetItemInfo(item, nullptr, nullptr, &name, nullptr, nullptr, &dataType);
        rbxGetItemValueType(item, &valueType);
        m_vecItemNames.push_back(std::move(name));
        dataTypes.push_back(dataType);
        const size_t valueBytes = rbx::DataTypeSize(dataType) * static_cast<size_t>(std::max(1, rbxGetItemElementCount(item)));
        largestValue = std::max(largestValue, valueBytes);
    }
    std::vector<unsigned char> valueBuffer(largestValue);

    // The library has checked the step count against the file's size, so the table can be sized once.
    m_vecRows.reserve(static_cast<size_t>(axis.steps));
    for (int t = 0; t < axis.steps; ++t) {
        ui::Row row;
        row.reserve(dataTypes.size() + 1);
        row.emplace_back();
        double stepTime = 0.0;
        for (int dataType : dataTypes) {
            row.emplace_back();
            if (!ReadValueText(rbxFile, dataType, valueBuffer, stepTime, row.back())) {
                m_strFailure = LibraryFailure(path, text::Format("the values of time step %d cannot be read", t + 1));
                return 0;
            }
        }
        row.front() = FormatStamp(base.AddDays(StepOffsetDays(axis, t, stepTime, daysPerUnit)));
        m_vecRows.push_back(std::move(row));
    }
    SetFile(path);
    return 1;
}

int CRbxPreviewFileParser::GetItemNames(CStringList& names)
{
    names.clear();
    const std::unique_ptr<COpenRbxFile> opened = OpenBoundFile();
    if (!opened)
        return 0;
    const COpenRbxFile& rbxFile = *opened;
    try {
        const int fileDataType = rbxGetDataType(rbxFile.Header());
        const int itemCount = rbxGetNoOfItems(rbxFile.Header());
        for (int i = 1; i <= itemCount; ++i) {
            COkaRbxItem description;
            if (rbxItem* item = rbxItemD(rbxFile.Header(), i)) {
                int typeKey = 0, unitKey = 0, dataType = 0;
                CString name;
                rbxGetItemInfo(item, &typeKey, nullptr, &name, &unitKey, nullptr, &dataType);
                description.SetDataType(dataType);
                description.SetDescrip(name);
                description.SetRuqType(typeKey);
                description.SetRuqUnit(unitKey);
                description.SetValueType(fileDataType);
            }
            names.push_back(description.GetDescrip());
        }
    } catch (const std::exception&) {
        // What was collected stands; the caller still gets the names read so far.
    }
    return 1;
}

int CRbxPreviewFileParser::ReadItemTexts(ItemText which, CStringList& texts)
{
    texts.clear();
    const std::unique_ptr<COpenRbxFile> opened = OpenBoundFile();
    if (!opened)
        return 0;
    const COpenRbxFile& rbxFile = *opened;
    try {
        const int itemCount = rbxGetNoOfItems(rbxFile.Header());
        for (int i = 1; i <= itemCount; ++i) {
            rbxItem* item = rbxItemD(rbxFile.Header(), i);
            if (!item || rbxGetItemAxisType(item) != rbx::kScalarItem)
                return Fail(m_strFile, 0, text::Format("item %d is not a scalar item (one value per time step)", i));
            CString typeText, unitText;
            rbxGetItemInfo(item, nullptr, &typeText, nullptr, nullptr, &unitText, nullptr);
            if (which == ItemText::Type)
                texts.push_back(std::move(typeText));
            else if (which == ItemText::Unit)
                texts.push_back(std::move(unitText));
        }
    } catch (const std::exception&) {
        // As for the names: the entries collected so far are the answer.
    }
    return 1;
}

int CRbxPreviewFileParser::GetItemTypes(CStringList& types) { return ReadItemTexts(ItemText::Type, types); }

int CRbxPreviewFileParser::GetUnits(CStringList& units) { return ReadItemTexts(ItemText::Unit, units); }

int CRbxPreviewFileParser::GetValueTypes(CStringList& valueTypes)
{
    return ReadItemTexts(ItemText::None, valueTypes);
}

int CRbxPreviewFileParser::GetItemCount(int& /*count*/) { return 1; }
