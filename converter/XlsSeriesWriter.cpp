#include "converter/XlsSeriesWriter.h"

#include "converter/SheetLayout.h"
#include "converter/StampText.h"
#include "formats/workbook/LittleEndian.h"
#include "platform/system/Text.h"

#include <cmath>
#include <cstring>

namespace converter {

namespace {

using sheet::Append16;
using sheet::Append32;

enum RecordId : std::uint16_t {
    kEof = 0x000A,
    kDateMode = 0x0022,
    kFont = 0x0031,
    kWindow1 = 0x003D,
    kCodePage = 0x0042,
    kColInfo = 0x007D,
    kBoundSheet = 0x0085,
    kXf = 0x00E0,
    kDimensions = 0x0200,
    kNumber = 0x0203,
    kLabel = 0x0204,
    kWindow2 = 0x023E,
    kStyle = 0x0293,
    kFormat = 0x041E,
    kBof = 0x0809,
};

// Cell styles: 0 to 14 are the style records every workbook has, 15 the cells' General style,
// 16 the dates'.
constexpr unsigned kStyleRecords = 15;
constexpr std::uint16_t kGeneralCell = 15;
constexpr std::uint16_t kDateCell = 16;
constexpr std::uint16_t kDateFormatId = 164; // the first id of a workbook's own formats
constexpr size_t kMaxTextCharacters = 255;   // what a LABEL record may hold
constexpr size_t kFlushBytes = 256 * 1024;

void AppendRecord(std::string& out, std::uint16_t id, const std::string& body)
{
    Append16(out, id);
    Append16(out, static_cast<std::uint32_t>(body.size()));
    out += body;
}

void AppendDouble(std::string& out, double value)
{
    std::uint64_t bits = 0;
    std::memcpy(&bits, &value, sizeof bits);
    Append32(out, static_cast<std::uint32_t>(bits));
    Append32(out, static_cast<std::uint32_t>(bits >> 32));
}

// A text in UTF-16, cut after `limit` code units (never inside a surrogate pair).
std::u16string Utf16Of(std::string_view bytes, size_t limit)
{
    const std::string text = text::ToUtf8(bytes);
    std::u16string out;
    for (size_t at = 0; at < text.size();) {
        const char32_t c = text::NextUtf8Character(text, at);
        if (c < 0x10000) {
            if (out.size() + 1 > limit)
                break;
            out += static_cast<char16_t>(c);
        } else {
            if (out.size() + 2 > limit)
                break;
            out += static_cast<char16_t>(0xD800 + ((c - 0x10000) >> 10));
            out += static_cast<char16_t>(0xDC00 + ((c - 0x10000) & 0x3FF));
        }
    }
    return out;
}

// A BIFF8 text: its length (in `lengthBytes` bytes), a flag byte, then one byte a character when
// every character fits one, else two.
void AppendText(std::string& out, std::string_view text, int lengthBytes)
{
    const std::u16string units = Utf16Of(text, kMaxTextCharacters);
    if (lengthBytes == 1)
        out += static_cast<char>(units.size());
    else
        Append16(out, static_cast<std::uint32_t>(units.size()));
    bool wide = false;
    for (char16_t c : units)
        wide = wide || c > 0xFF;
    out += static_cast<char>(wide ? 1 : 0);
    for (char16_t c : units) {
        if (wide)
            Append16(out, c);
        else
            out += static_cast<char>(c);
    }
}

std::string Bof(std::uint16_t kind)
{
    std::string body;
    Append16(body, 0x0600); // BIFF8
    Append16(body, kind);
    Append16(body, 0x0DBB); // build and year of the application that wrote it
    Append16(body, 0x07CC);
    Append32(body, 0);      // file history
    Append32(body, 0x0006); // lowest version that reads every record
    return body;
}

std::string Font()
{
    std::string body;
    Append16(body, 200);    // 10 points, in twentieths
    Append16(body, 0);      // not italic nor struck out
    Append16(body, 0x7FFF); // the window text colour
    Append16(body, 400);    // normal weight
    Append16(body, 0);      // no superscript
    body += std::string(4, '\0'); // underline, family, character set, reserved
    AppendText(body, "Arial", 1);
    return body;
}

std::string Xf(std::uint16_t format, bool style, unsigned char usedAttributes)
{
    std::string body;
    Append16(body, 0); // font
    Append16(body, format);
    Append16(body, style ? 0xFFF5 : 0x0001); // locked; a style, or a cell of style 0
    body += static_cast<char>(0x20);         // aligned to the bottom
    body += '\0';                            // no rotation
    body += '\0';                            // no indent
    body += static_cast<char>(usedAttributes);
    Append32(body, 0); // no borders
    Append32(body, 0);
    Append16(body, 0x20C0); // the default pattern colours
    return body;
}

// The workbook globals, up to and including their EOF. The sheet follows right after them.
std::string Globals()
{
    std::string out;
    AppendRecord(out, kBof, Bof(0x0005));
    std::string body;
    Append16(body, 1200); // texts are UTF-16 where they are not Latin-1
    AppendRecord(out, kCodePage, body);
    body.clear();
    for (std::uint32_t value : {0x01E0u, 0x005Au, 0x3FCFu, 0x2A4Eu, 0x0038u, 0u, 0u, 1u, 0x0258u})
        Append16(body, value); // window position and size, flags, active sheet, tab width
    AppendRecord(out, kWindow1, body);
    body.clear();
    Append16(body, 0); // days count from 1900
    AppendRecord(out, kDateMode, body);
    for (int font = 0; font < 4; ++font) // font 4 does not exist; 0 to 3 must
        AppendRecord(out, kFont, Font());
    body.clear();
    Append16(body, kDateFormatId);
    AppendText(body, sheet_layout::kStampFormat, 2);
    AppendRecord(out, kFormat, body);
    for (unsigned xf = 0; xf < kStyleRecords; ++xf)
        AppendRecord(out, kXf, Xf(0, true, xf == 0 ? 0x00 : 0xF4));
    AppendRecord(out, kXf, Xf(0, false, 0x00));
    AppendRecord(out, kXf, Xf(kDateFormatId, false, 0x04));
    body.clear();
    Append16(body, 0x8000); // the built-in style of cell style 0 ...
    body += '\0';           // ... "Normal"
    body += static_cast<char>(0xFF);
    AppendRecord(out, kStyle, body);

    body.clear();
    Append32(body, 0); // where the sheet starts, set below
    body += '\0';      // visible
    body += '\0';      // a worksheet
    AppendText(body, sheet_layout::kSheetName, 1);
    const size_t sheetStartAt = out.size() + 4;
    AppendRecord(out, kBoundSheet, body);
    AppendRecord(out, kEof, "");
    sheet::Store32(reinterpret_cast<unsigned char*>(out.data() + sheetStartAt), static_cast<std::uint32_t>(out.size()));
    return out;
}

std::string Dimensions(unsigned rows, unsigned columns)
{
    std::string body;
    Append32(body, 0);
    Append32(body, rows); // one past the last row
    Append16(body, 0);
    Append16(body, columns); // one past the last column
    Append16(body, 0);
    std::string out;
    AppendRecord(out, kDimensions, body);
    return out;
}

// The stamps' column is 20 characters wide, as in the .xlsx output.
std::string ColumnA()
{
    std::string body;
    Append16(body, 0);
    Append16(body, 0);
    Append16(body, 20 * 256 + 182); // in 1/256 of a character, with the cell's padding
    Append16(body, kGeneralCell);
    Append16(body, 0);
    Append16(body, 0);
    std::string out;
    AppendRecord(out, kColInfo, body);
    return out;
}

std::string Window2()
{
    std::string body;
    Append16(body, 0x06B6); // grid lines, headers, zeros, default colours, outline, selected
    Append16(body, 0);      // first visible row
    Append16(body, 0);      // first visible column
    Append32(body, 64);     // header colour: the default
    Append16(body, 0);
    Append16(body, 0);
    Append32(body, 0);
    std::string out;
    AppendRecord(out, kWindow2, body);
    return out;
}

void AppendLabel(std::string& out, unsigned row, unsigned column, std::string_view text)
{
    std::string body;
    Append16(body, row);
    Append16(body, column);
    Append16(body, kGeneralCell);
    AppendText(body, text, 2);
    AppendRecord(out, kLabel, body);
}

void AppendNumber(std::string& out, unsigned row, unsigned column, std::uint16_t style, double value)
{
    Append16(out, kNumber);
    Append16(out, 14);
    Append16(out, row);
    Append16(out, column);
    Append16(out, style);
    AppendDouble(out, value);
}

// Windows-1252 bytes of the characters above 0x7F that it has in 0x80 to 0x9F.
char Windows1252Byte(char32_t c)
{
    static const char16_t kHigh[32] = {0x20AC, 0,      0x201A, 0x0192, 0x201E, 0x2026, 0x2020, 0x2021,
                                       0x02C6, 0x2030, 0x0160, 0x2039, 0x0152, 0,      0x017D, 0,
                                       0,      0x2018, 0x2019, 0x201C, 0x201D, 0x2022, 0x2013, 0x2014,
                                       0x02DC, 0x2122, 0x0161, 0x203A, 0x0153, 0,      0x017E, 0x0178};
    if (c < 0x80 || (c >= 0xA0 && c <= 0xFF))
        return static_cast<char>(c);
    for (int i = 0; i < 32; ++i)
        if (kHigh[i] != 0 && kHigh[i] == c)
            return static_cast<char>(0x80 + i);
    return '?';
}

// The summary property set, holding the document's title (in Windows-1252, code page 1252).
std::string SummaryInformation(const std::string& title)
{
    const std::string utf8 = text::ToUtf8(title);
    std::string text;
    for (size_t at = 0; at < utf8.size();)
        text += Windows1252Byte(text::NextUtf8Character(utf8, at));
    text += '\0';
    text.resize((text.size() + 3) / 4 * 4, '\0');

    std::string properties;
    Append16(properties, 0x0002); // code page: a 16-bit integer
    Append16(properties, 0);
    Append16(properties, 1252);
    Append16(properties, 0);
    const size_t titleAt = properties.size();
    Append16(properties, 0x001E); // title: a text in the code page
    Append16(properties, 0);
    Append32(properties, static_cast<std::uint32_t>(std::strlen(text.c_str()) + 1));
    properties += text;

    std::string section;
    const std::uint32_t table = 8 + 2 * 8; // size and count, then two identifiers with offsets
    Append32(section, table + static_cast<std::uint32_t>(properties.size()));
    Append32(section, 2);
    Append32(section, 1); // code page
    Append32(section, table);
    Append32(section, 2); // title
    Append32(section, table + static_cast<std::uint32_t>(titleAt));
    section += properties;

    static const unsigned char kSummaryFormat[16] = {0xE0, 0x85, 0x9F, 0xF2, 0xF9, 0x4F, 0x68, 0x10,
                                                     0xAB, 0x91, 0x08, 0x00, 0x2B, 0x27, 0xB3, 0xD9};
    std::string out;
    Append16(out, 0xFFFE); // byte order
    Append16(out, 0);      // version
    Append32(out, 0x00020006); // written on a system of this kind
    out += std::string(16, '\0');
    Append32(out, 1); // one property set
    out.append(reinterpret_cast<const char*>(kSummaryFormat), sizeof kSummaryFormat);
    Append32(out, static_cast<std::uint32_t>(out.size() + 4));
    out += section;
    return out;
}

} // namespace

sys::Status XlsSeriesWriter::Begin(const std::string& path, const SeriesHeader& header, const std::string& title)
{
    m_path = path;
    m_title = title;
    m_columns = static_cast<unsigned>(header.items.size() + 1);
    if (header.items.size() + 1 > kMaxColumns)
        return sys::Status::Fail(path, 0, std::to_string(header.items.size()) + " items do not fit the " +
                                         std::to_string(kMaxColumns - 1) + " value columns of an .xls sheet (.xlsx holds 16,383)");
    if (sys::Status opened = m_file.Open(path); !opened)
        return opened;
    m_records = Globals();
    AppendRecord(m_records, kBof, Bof(0x0010));
    m_records += ColumnA();
    m_dimensionsAt = m_records.size();
    m_records += Dimensions(0, 0);
    return WriteHeaderRows(header);
}

sys::Status XlsSeriesWriter::WriteHeaderRows(const SeriesHeader& header)
{
    for (size_t item = 0; item < header.items.size(); ++item)
        AppendLabel(m_records, 0, static_cast<unsigned>(item + 1), sheet_layout::MetadataText(header.items[item]));
    AppendLabel(m_records, 1, 0, sheet_layout::TimeTitle(header));
    for (size_t item = 0; item < header.items.size(); ++item)
        if (!header.items[item].name.empty()) // an empty name stays a blank cell
            AppendLabel(m_records, 1, static_cast<unsigned>(item + 1), header.items[item].name);
    m_rows = sheet_layout::kHeaderRows;
    return Flush(false);
}

sys::Status XlsSeriesWriter::Flush(bool always)
{
    if (!always && m_records.size() < kFlushBytes)
        return sys::Status::Ok();
    sys::Status appended = m_file.Append(m_records);
    m_records.clear();
    return appended;
}

sys::Status XlsSeriesWriter::Write(const Row& row)
{
    if (m_rows >= kMaxRows)
        return sys::Status::Fail(m_path, 0, "more rows than an .xls sheet holds (" + std::to_string(kMaxRows) +
                                           " with the two header rows); .xlsx holds 1,048,576");
    if (const std::optional<double> serial = SheetSerialFromStamp(row.stamp))
        AppendNumber(m_records, m_rows, 0, kDateCell, *serial);
    else
        AppendLabel(m_records, m_rows, 0, FormatStamp(row.stamp)); // before 1900: no date of the sheet
    const size_t count = std::min<size_t>(row.values.size(), m_columns - 1);
    for (size_t i = 0; i < count; ++i)
        if (std::isfinite(row.values[i])) // missing and infinite values stay blank
            AppendNumber(m_records, m_rows, static_cast<unsigned>(i + 1), kGeneralCell, row.values[i]);
    ++m_rows;
    return Flush(false);
}

sys::Status XlsSeriesWriter::Finish()
{
    m_records += Window2();
    AppendRecord(m_records, kEof, "");
    if (sys::Status flushed = Flush(true); !flushed)
        return flushed;
    if (sys::Status dimensions = m_file.Patch(m_dimensionsAt, Dimensions(m_rows, m_columns)); !dimensions)
        return dimensions;
    std::vector<sheet::CompoundFileWriter::Stream> others;
    if (!m_title.empty())
        others.push_back({"\x05SummaryInformation", SummaryInformation(m_title)});
    return m_file.Close("Workbook", others);
}

} // namespace converter
