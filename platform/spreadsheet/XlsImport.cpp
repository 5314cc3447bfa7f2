// .xls (BIFF8 in a compound file) through FreeXL. FreeXL gives each cell's value and tells dates,
// date-times and times apart, but not the number format itself; those three show with fixed
// formats of our own (see docs/spreadsheet.md).
#include "platform/spreadsheet/WorkbookImport.h"

#include "platform/spreadsheet/CompoundFile.h"

#include "platform/system/OleDateTime.h"

#include <freexl.h>

#include <cstdint>
#include <cstdio>
#include <cstring>
#include <fstream>
#include <optional>
#include <utility>
#include <vector>

namespace sheet {

namespace {

const char* const kDateCode = "m/d/yyyy";
const char* const kDateTimeCode = "m/d/yyyy h:mm:ss";
const char* const kTimeCode = "h:mm:ss";

std::string FreeXlWhy(int code)
{
    switch (code) {
    case FREEXL_FILE_NOT_FOUND: return "the file does not exist.";
    case FREEXL_INSUFFICIENT_MEMORY: return "not enough memory to read the workbook.";
    case FREEXL_BIFF_WORKBOOK_NOT_FOUND: return "the compound file holds no workbook stream.";
    case FREEXL_BIFF_INVALID_BOF: return "the workbook stream is damaged (bad BOF record).";
    case FREEXL_BIFF_INVALID_SST:
    case FREEXL_BIFF_ILLEGAL_SST_INDEX: return "the workbook's shared string table is damaged.";
    case FREEXL_UNSUPPORTED_CHARSET:
    case FREEXL_INVALID_CHARACTER: return "the workbook's text uses a character set that cannot be read.";
    case FREEXL_CRAFTED_FILE: return "the workbook is damaged (inconsistent records).";
    default: return "the compound file is damaged (error " + std::to_string(code) + ").";
    }
}

class Handle {
public:
    ~Handle()
    {
        if (m_handle != nullptr)
            freexl_close(m_handle);
    }
    const void* m_handle = nullptr;
};

void Check(int code, const std::string& path)
{
    if (code != FREEXL_OK)
        throw OpenError(path, FreeXlWhy(code));
}

// FreeXL answers some damaged streams with success and no handle.
void CheckOpened(int code, const Handle& handle, const std::string& path)
{
    Check(code, path);
    if (handle.m_handle == nullptr)
        throw OpenError(path, "the workbook stream is damaged (unexpected records).");
}

unsigned Le16(const unsigned char* p) { return p[0] | p[1] << 8; }

std::uint32_t Le32(const unsigned char* p)
{
    return static_cast<std::uint32_t>(Le16(p)) | static_cast<std::uint32_t>(Le16(p + 2)) << 16;
}

// Whether a string of `count` characters starting at `at` (after its option byte, whose bit 0
// means two bytes per character) fits a record of `length` bytes.
bool StringFits(const std::vector<unsigned char>& stream, size_t body, unsigned length, unsigned at, unsigned count)
{
    if (at >= length)
        return count == 0;
    const unsigned width = (stream[body + at] & 1) ? 2 : 1;
    return at + 1 + static_cast<std::uint64_t>(count) * width <= length;
}

// A sheet's DIMENSION record: first row, row past the last, first column, column past the last
// (rows in 32 bits in BIFF8, 16 bits in older streams). FreeXL works through the whole declared
// grid, so a grid larger than the format allows costs seconds on a tiny file.
bool DimensionFits(const std::vector<unsigned char>& stream, size_t body, unsigned length)
{
    std::uint64_t firstRow = 0, endRow = 0;
    unsigned firstColumn = 0, endColumn = 0;
    const unsigned char* p = &stream[body];
    if (length >= 14) {
        firstRow = Le32(p), endRow = Le32(p + 4), firstColumn = Le16(p + 8), endColumn = Le16(p + 10);
    } else if (length >= 8) {
        firstRow = Le16(p), endRow = Le16(p + 2), firstColumn = Le16(p + 4), endColumn = Le16(p + 6);
    } else {
        return false;
    }
    return firstRow <= endRow && endRow <= 65536 && firstColumn <= endColumn && endColumn <= 256;
}

// FreeXL copies records into a buffer of the largest BIFF8 record (8224 bytes) and trusts the
// string lengths of FORMAT, BOUNDSHEET and LABEL records: check both before it reads.
void CheckRecords(const std::string& path, const std::vector<unsigned char>& stream)
{
    size_t at = 0;
    bool dimensionSeen = false;
    for (unsigned n = 1; at + 4 <= stream.size(); ++n) {
        const unsigned id = Le16(&stream[at]);
        const unsigned length = Le16(&stream[at + 2]);
        const size_t body = at + 4;
        const std::string where = "record " + std::to_string(n) + " at byte " + std::to_string(at);
        if (length > 8224)
            throw OpenError(path, "the workbook stream is damaged (" + where + " is longer than a record may be).");
        if (body + length > stream.size())
            throw OpenError(path, "the workbook stream is damaged (" + where + " is cut short).");
        bool fits = true;
        if (id == 0x041E && length >= 4) // FORMAT: id, count, options, characters
            fits = StringFits(stream, body, length, 4, Le16(&stream[body + 2]));
        else if (id == 0x0085 && length >= 7) // BOUNDSHEET: position, state, type, count, options
            fits = StringFits(stream, body, length, 7, stream[body + 6]);
        else if (id == 0x0204 && length >= 8) // LABEL: row, column, format, count, options
            fits = StringFits(stream, body, length, 8, Le16(&stream[body + 6]));
        if (!fits)
            throw OpenError(path, "the workbook stream is damaged (" + where + " holds a text longer than itself).");
        if (id == 0x0200 && !DimensionFits(stream, body, length))
            throw OpenError(path, "the workbook stream is damaged (" + where + " sizes its sheet beyond 65536 rows by 256 columns).");
        // FreeXL allocates a sheet's cells at its DIMENSION record; a second one corrupts its heap.
        if (id == 0x0809)
            dimensionSeen = false;
        else if (id == 0x0200 && std::exchange(dimensionSeen, true))
            throw OpenError(path, "the workbook stream is damaged (" + where + " sizes its sheet a second time).");
        at = body + length;
    }
}

// Checks the container and the workbook stream before FreeXL reads them.
void CheckContainer(const std::string& path)
{
    CompoundFile file(path);
    if (file.Find("EncryptedPackage"))
        throw OpenError(path, "the workbook is password-protected.");
    std::optional<CompoundFile::Entry> workbook = file.Find("Workbook");
    if (!workbook)
        workbook = file.Find("Book");
    if (!workbook)
        throw OpenError(path, "the compound file holds no workbook stream.");
    CheckRecords(path, file.Read(*workbook));
}

// FreeXL keeps every cell of a sheet in memory at once: refuse sheets whose grid is too big
// before it allocates them. The metadata-only open reads no cells.
void CheckDimensions(const std::string& path, const ImportLimits& limits)
{
    Handle info;
    CheckOpened(freexl_open_info(path.c_str(), &info.m_handle), info, path);
    unsigned sheets = 0;
    Check(freexl_get_info(info.m_handle, FREEXL_BIFF_SHEET_COUNT, &sheets), path);
    for (unsigned s = 0; s < sheets; ++s) {
        unsigned rows = 0;
        unsigned short columns = 0;
        if (freexl_select_active_worksheet(info.m_handle, static_cast<unsigned short>(s)) != FREEXL_OK ||
            freexl_worksheet_dimensions(info.m_handle, &rows, &columns) != FREEXL_OK)
            continue;
        if (static_cast<std::uint64_t>(rows) * columns > limits.maxXlsSheetCells)
            throw OpenError(path, "sheet " + std::to_string(s + 1) + " spans " + std::to_string(rows) + " rows by " +
                                      std::to_string(columns) + " columns, more cells than a workbook preview reads.");
    }
}

bool ParseIsoDate(const char* text, int& year, int& month, int& day)
{
    return text != nullptr && std::sscanf(text, "%d-%d-%d", &year, &month, &day) == 3;
}

bool ParseIsoTime(const char* text, int& hour, int& minute, int& second)
{
    return text != nullptr && std::sscanf(text, "%d:%d:%d", &hour, &minute, &second) == 3;
}

double SerialOf(int year, int month, int day) { return static_cast<double>(DaysFromCivil(year, month, day)); }
double FractionOf(int hour, int minute, int second) { return (hour * 3600.0 + minute * 60.0 + second) / 86400.0; }

struct DateStyles {
    unsigned date, dateTime, time;
};

// Fills `cell` from FreeXL's value; false for an empty cell.
bool ToCell(const FreeXL_CellValue& value, const DateStyles& styles, ImportedCell& cell)
{
    int y = 0, mo = 0, d = 0, h = 0, mi = 0, s = 0;
    switch (value.type) {
    case FREEXL_CELL_INT:
        cell.type = Variant::Number;
        cell.number = value.value.int_value;
        return true;
    case FREEXL_CELL_DOUBLE:
        cell.type = Variant::Number;
        cell.number = value.value.double_value;
        return true;
    case FREEXL_CELL_TEXT:
    case FREEXL_CELL_SST_TEXT:
        cell.type = Variant::Text;
        cell.text = value.value.text_value != nullptr ? value.value.text_value : "";
        return true;
    case FREEXL_CELL_DATE:
        if (!ParseIsoDate(value.value.text_value, y, mo, d))
            return false;
        cell.type = Variant::Number;
        cell.number = SerialOf(y, mo, d);
        cell.style = styles.date;
        return true;
    case FREEXL_CELL_DATETIME:
        if (!ParseIsoDate(value.value.text_value, y, mo, d))
            return false;
        if (const char* blank = std::strchr(value.value.text_value, ' '))
            ParseIsoTime(blank + 1, h, mi, s);
        cell.type = Variant::Number;
        cell.number = SerialOf(y, mo, d) + FractionOf(h, mi, s);
        cell.style = styles.dateTime;
        return true;
    case FREEXL_CELL_TIME:
        if (!ParseIsoTime(value.value.text_value, h, mi, s))
            return false;
        cell.type = Variant::Number;
        cell.number = FractionOf(h, mi, s);
        cell.style = styles.time;
        return true;
    default:
        return false;
    }
}

} // namespace

void ImportXls(const std::string& path, ImportSink& sink, StyleTable& styles, const ImportLimits& limits)
{
    std::ifstream probe(path, std::ios::binary | std::ios::ate);
    if (probe && static_cast<std::uint64_t>(probe.tellg()) > limits.maxFileBytes)
        throw OpenError(path, "the file is larger than " + std::to_string(limits.maxFileBytes >> 20) + " MiB.");
    probe.close();
    CheckContainer(path);
    CheckDimensions(path, limits);

    Handle workbook;
    CheckOpened(freexl_open(path.c_str(), &workbook.m_handle), workbook, path);
    unsigned password = 0;
    if (freexl_get_info(workbook.m_handle, FREEXL_BIFF_PASSWORD, &password) == FREEXL_OK && password == FREEXL_BIFF_OBFUSCATED)
        throw OpenError(path, "the workbook is password-protected.");
    DateStyles dateStyles{styles.Add(NumberFormat(kDateCode)), styles.Add(NumberFormat(kDateTimeCode)),
                          styles.Add(NumberFormat(kTimeCode))};

    unsigned sheets = 0;
    Check(freexl_get_info(workbook.m_handle, FREEXL_BIFF_SHEET_COUNT, &sheets), path);
    for (unsigned s = 0; s < sheets; ++s) {
        const char* name = nullptr;
        Check(freexl_get_worksheet_name(workbook.m_handle, static_cast<unsigned short>(s), &name), path);
        sink.AddSheet(name != nullptr ? name : "");
    }
    for (unsigned s = 0; s < sheets; ++s) {
        Check(freexl_select_active_worksheet(workbook.m_handle, static_cast<unsigned short>(s)), path);
        unsigned rows = 0;
        unsigned short columns = 0;
        Check(freexl_worksheet_dimensions(workbook.m_handle, &rows, &columns), path);
        for (unsigned r = 0; r < rows; ++r) {
            for (unsigned short c = 0; c < columns; ++c) {
                FreeXL_CellValue value;
                if (freexl_get_cell_value(workbook.m_handle, r, c, &value) != FREEXL_OK)
                    continue;
                ImportedCell cell;
                cell.row = static_cast<int>(r) + 1;
                cell.column = c + 1;
                if (ToCell(value, dateStyles, cell))
                    sink.AddCell(static_cast<int>(s), cell);
            }
        }
        sink.EndSheet(static_cast<int>(s));
    }
}

} // namespace sheet
