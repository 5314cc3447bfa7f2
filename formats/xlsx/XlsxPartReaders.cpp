#include "formats/xlsx/XlsxPartReaders.h"

#include "formats/workbook/CellAddress.h"
#include "platform/system/OleDateTime.h"

#include <charconv>
#include <cmath>
#include <cstdlib>
#include <limits>
#include <map>

namespace sheet::xlsx {

namespace {

using Token = XmlScanner::Token;

// Days from 30 December 1899 to 1 January 1904, where the 1904 date system counts from.
constexpr double k1904Offset = 1462;

std::string_view TrimSpaces(std::string_view text)
{
    const auto space = [](char c) { return c == ' ' || c == '\t' || c == '\r' || c == '\n'; };
    while (!text.empty() && space(text.front()))
        text.remove_prefix(1);
    while (!text.empty() && space(text.back()))
        text.remove_suffix(1);
    return text;
}

template <typename Int>
std::optional<Int> ParseUnsigned(std::string_view text)
{
    text = TrimSpaces(text);
    Int value{};
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), value);
    if (text.empty() || error != std::errc() || end != text.data() + text.size())
        return std::nullopt;
    return value;
}

// Appends the text of the element whose StartTag was just read, up to its EndTag; elements
// inside it are passed over.
void AppendElementText(XmlScanner& xml, std::string& to)
{
    const std::size_t depth = xml.Depth();
    for (;;) {
        const Token token = xml.Next();
        if (token == Token::Text) {
            if (to.size() + xml.Text().size() > XmlScanner::kMaxTokenBytes)
                xml.Fail("a text longer than " + std::to_string(XmlScanner::kMaxTokenBytes) + " bytes");
            to.append(xml.Text());
        } else if (token == Token::StartTag) {
            xml.SkipElement();
        } else if (xml.Depth() < depth || token == Token::End) {
            return;
        }
    }
}

// The text of a shared string or inline string element: its <t>, or the <t> of each run <r>.
// Phonetic runs (<rPh>) spell out the text's reading and are not part of it.
void AppendRichText(XmlScanner& xml, std::string& to)
{
    const std::size_t depth = xml.Depth();
    for (;;) {
        const Token token = xml.Next();
        if (token == Token::StartTag) {
            if (xml.Name() == "t")
                AppendElementText(xml, to);
            else if (xml.Name() == "rPh")
                xml.SkipElement();
        } else if (token == Token::End || (token == Token::EndTag && xml.Depth() < depth)) {
            return;
        }
    }
}

int Digits(std::string_view text, std::size_t at, std::size_t count)
{
    if (at + count > text.size())
        return -1;
    int value = 0;
    for (std::size_t i = at; i < at + count; ++i) {
        if (text[i] < '0' || text[i] > '9')
            return -1;
        value = value * 10 + (text[i] - '0');
    }
    return value;
}

// "hh:mm[:ss[.fff]]" from `at` as seconds of the day, and where it ends.
std::optional<double> ParseClock(std::string_view text, std::size_t& at)
{
    const int hour = Digits(text, at, 2);
    const int minute = at + 2 < text.size() && text[at + 2] == ':' ? Digits(text, at + 3, 2) : -1;
    if (hour < 0 || hour > 23 || minute < 0 || minute > 59)
        return std::nullopt;
    at += 5;
    double second = 0;
    if (at < text.size() && text[at] == ':') {
        const int whole = Digits(text, at + 1, 2);
        if (whole < 0 || whole > 59)
            return std::nullopt;
        second = whole;
        at += 3;
        if (at < text.size() && text[at] == '.') {
            std::size_t end = at + 1;
            while (end < text.size() && text[end] >= '0' && text[end] <= '9')
                ++end;
            if (end == at + 1)
                return std::nullopt;
            second += std::strtod(std::string(text.substr(at, end - at)).c_str(), nullptr);
            at = end;
        }
    }
    return hour * 3600.0 + minute * 60.0 + second;
}

} // namespace

void SharedStrings::Add(std::string_view text)
{
    m_chars.append(text);
    m_ends.push_back(m_chars.size());
}

std::string_view SharedStrings::At(std::size_t index) const
{
    const std::size_t begin = index == 0 ? 0 : m_ends[index - 1];
    return std::string_view(m_chars).substr(begin, m_ends[index] - begin);
}

std::optional<double> ParseNumber(std::string_view text)
{
    text = TrimSpaces(text);
    if (!text.empty() && text.front() == '+') {
        text.remove_prefix(1);
        if (!text.empty() && text.front() == '-')
            return std::nullopt;
    }
    double value = 0;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), value);
    if (text.empty() || end != text.data() + text.size())
        return std::nullopt;
    if (error == std::errc::result_out_of_range) {
        // Below the smallest subnormal the value is zero; above the largest double it is no number.
        value = std::strtod(std::string(text).c_str(), nullptr);
        if (std::isinf(value))
            return std::nullopt;
    } else if (error != std::errc() || !std::isfinite(value)) {
        return std::nullopt;
    }
    return value;
}

std::optional<double> ParseIsoDate(std::string_view text)
{
    text = TrimSpaces(text);
    double days = 0;
    std::size_t at = 0;
    const bool hasDate = text.size() >= 10 && text[4] == '-';
    if (hasDate) {
        const int year = Digits(text, 0, 4);
        const int month = text[7] == '-' ? Digits(text, 5, 2) : -1;
        const int day = Digits(text, 8, 2);
        if (year < 0 || month < 0 || day < 0 || !IsValidCalendarDate(year, month, day))
            return std::nullopt;
        days = static_cast<double>(DaysFromCivil(year, month, day));
        at = 10;
        if (at == text.size())
            return days;
        if (text[at] != 'T' && text[at] != ' ')
            return std::nullopt;
        ++at;
    }
    const std::optional<double> seconds = ParseClock(text, at);
    if (!seconds)
        return std::nullopt;
    if (at < text.size() && text[at] == 'Z')
        ++at;
    if (at != text.size())
        return std::nullopt;
    return days + *seconds / 86400.0;
}

void ReadSharedStrings(XmlScanner& xml, SharedStrings& strings)
{
    std::string text;
    for (Token token = xml.Next(); token != Token::End; token = xml.Next()) {
        if (token == Token::StartTag && xml.Name() == "si") {
            text.clear();
            AppendRichText(xml, text);
            strings.Add(text);
        }
    }
}

CellStyles ReadStyles(XmlScanner& xml, StyleTable& table)
{
    std::map<unsigned, std::string> customCodes; // by number format id
    std::vector<unsigned> xfFormats;             // number format id of each cell format
    std::string_view section;                    // the element at depth 2 last opened
    std::string sectionName;
    for (Token token = xml.Next(); token != Token::End; token = xml.Next()) {
        if (token != Token::StartTag)
            continue;
        if (xml.Depth() == 2) {
            sectionName.assign(xml.Name());
            section = sectionName;
        } else if (xml.Depth() == 3 && section == "numFmts" && xml.Name() == "numFmt") {
            const std::optional<unsigned> id = ParseUnsigned<unsigned>(xml.Attribute("numFmtId").value_or(""));
            if (!id)
                xml.Fail("a number format without a valid numFmtId");
            customCodes[*id] = std::string(xml.Attribute("formatCode").value_or("General"));
        } else if (xml.Depth() == 3 && section == "cellXfs" && xml.Name() == "xf") {
            if (xfFormats.size() == kMaxCellFormats)
                xml.Fail("more than " + std::to_string(kMaxCellFormats) + " cell formats");
            xfFormats.push_back(ParseUnsigned<unsigned>(xml.Attribute("numFmtId").value_or("0")).value_or(0));
        }
    }
    // Many cell formats share a number format: each code is parsed once.
    std::map<unsigned, NumberFormat> formats;
    CellStyles styles;
    styles.dateStyles.assign(xfFormats.size(), false);
    for (std::size_t xf = 0; xf < xfFormats.size(); ++xf) {
        const unsigned id = xfFormats[xf];
        auto known = formats.find(id);
        if (known == formats.end()) {
            auto custom = customCodes.find(id);
            const std::string code = custom != customCodes.end() ? custom->second : NumberFormat::BuiltinCode(static_cast<int>(id));
            known = formats.emplace(id, NumberFormat(code)).first;
        }
        table.Set(static_cast<unsigned>(xf), known->second);
        styles.dateStyles[xf] = known->second.IsDateTime();
    }
    return styles;
}

CellBuilder::CellBuilder(const SheetContext& context, std::string part) : m_context(context), m_part(std::move(part)) {}

void CellBuilder::Fail(const std::string& why, std::uint64_t offset) const
{
    throw XmlScanner::Error(m_part + ", byte " + std::to_string(offset) + ": " + why);
}

void CellBuilder::FailOutsideGrid(int row, int column, std::uint64_t offset) const
{
    Fail("cell row " + std::to_string(row) + ", column " + std::to_string(column) + " lies outside the sheet's grid of " +
             std::to_string(m_context.limits.maxRows) + " rows and " + std::to_string(m_context.limits.maxColumns) +
             " columns",
         offset);
}

// A row without a number follows the one before.
void CellBuilder::StartRow(std::optional<std::string_view> number, std::uint64_t offset)
{
    if (number) {
        const std::optional<int> row = ParseUnsigned<int>(*number);
        if (!row || *row < 1 || *row > 1048576)
            Fail("the row number '" + std::string(*number) +
                     "' is malformed or lies outside the sheet's grid (1048576 rows, 16384 columns)",
                 offset);
        m_row = *row;
    } else {
        ++m_row;
    }
    if (m_row > m_context.limits.maxRows)
        FailOutsideGrid(m_row, 1, offset);
    m_column = 0;
}

const ImportedCell* CellBuilder::Build(const RawCell& raw)
{
    m_cell = ImportedCell();
    m_cell.style = raw.style;
    Place(raw, m_cell);
    Interpret(raw, m_cell);
    // A blank cell counts only when it carries a style other than General's default.
    return m_cell.type != Variant::Empty || m_cell.style != 0 ? &m_cell : nullptr;
}

// A cell without a reference follows the one before in its row.
void CellBuilder::Place(const RawCell& raw, ImportedCell& cell)
{
    if (raw.reference.empty()) {
        cell.row = std::max(m_row, 1);
        cell.column = m_column + 1;
    } else {
        const std::optional<CellPosition> position = ParseCellAddress(raw.reference);
        if (!position)
            Fail("the cell reference '" + raw.reference +
                     "' is malformed or lies outside the sheet's grid (1048576 rows, 16384 columns)",
                 raw.offset);
        cell.row = position->row;
        cell.column = position->column;
    }
    if (cell.row > m_context.limits.maxRows || cell.column > m_context.limits.maxColumns)
        FailOutsideGrid(cell.row, cell.column, raw.offset);
    m_row = cell.row;
    m_column = cell.column;
}

void CellBuilder::Interpret(const RawCell& raw, ImportedCell& cell) const
{
    const std::string& type = raw.type;
    const std::string& value = raw.value;
    if (type == "inlineStr") {
        cell.type = Variant::Text;
        cell.text = raw.hasInline ? raw.inlineText : value;
    } else if (type == "str") {
        cell.type = Variant::Text; // a formula's text result
        cell.text = value;
        cell.formulaWithoutResult = raw.hasFormula && value.empty();
    } else if (TrimSpaces(value).empty()) {
        // A cell without a value is blank; a formula without one was written by a tool that does
        // not calculate (<f>...</f><v></v>) and reads as the empty text.
        if (raw.hasFormula) {
            cell.type = Variant::Text;
            cell.formulaWithoutResult = true;
        }
    } else if (type == "n") {
        const std::optional<double> number = ParseNumber(value);
        if (!number)
            Fail("the cell " + CellName(cell) + " holds '" + value.substr(0, 40) + "', which is not a number", raw.offset);
        cell.type = Variant::Number;
        cell.number = *number;
        const std::vector<bool>& dates = m_context.styles.dateStyles;
        if (m_context.date1904 && cell.style < dates.size() && dates[cell.style])
            cell.number += k1904Offset;
    } else if (type == "s") {
        const std::optional<std::size_t> index = ParseUnsigned<std::size_t>(value);
        if (!index || *index >= m_context.strings.Count())
            Fail("the cell " + CellName(cell) + " refers to shared string '" + value.substr(0, 40) + "' of " +
                 std::to_string(m_context.strings.Count()), raw.offset);
        cell.type = Variant::Text;
        cell.text = m_context.strings.At(*index);
    } else if (type == "str") {
        cell.type = Variant::Text;
        cell.text = value;
    } else if (type == "b") {
        const std::string_view flag = TrimSpaces(value);
        if (flag != "0" && flag != "1" && flag != "true" && flag != "false")
            Fail("the cell " + CellName(cell) + " holds '" + value.substr(0, 40) + "', which is not a boolean", raw.offset);
        cell.type = Variant::Boolean;
        cell.number = flag == "1" || flag == "true" ? 1 : 0;
    } else if (type == "e") {
        cell.type = Variant::Error;
        cell.text = TrimSpaces(value);
    } else if (type == "d") {
        const std::optional<double> serial = ParseIsoDate(value);
        if (!serial)
            Fail("the cell " + CellName(cell) + " holds '" + value.substr(0, 40) + "', which is not an ISO 8601 date", raw.offset);
        cell.type = Variant::Number;
        cell.number = *serial;
    } else {
        Fail("the cell " + CellName(cell) + " has the unknown type '" + type.substr(0, 40) + "'", raw.offset);
    }
}

namespace {

class SheetCellReader {
public:
    SheetCellReader(XmlScanner& xml, const SheetContext& context, int index, ImportSink& sink)
        : m_xml(xml), m_builder(context, xml.PartName()), m_index(index), m_sink(sink) {}

    // False when the sink stopped the reading.
    bool Read();

private:
    void ReadCell();

    XmlScanner& m_xml;
    CellBuilder m_builder;
    int m_index;
    ImportSink& m_sink;
    bool m_stopped = false;
    RawCell m_raw;
};

bool SheetCellReader::Read()
{
    bool inSheetData = false;
    for (Token token = m_xml.Next(); token != Token::End && !m_stopped; token = m_xml.Next()) {
        if (token == Token::EndTag && m_xml.Depth() == 1) {
            inSheetData = false;
        } else if (token != Token::StartTag) {
            continue;
        } else if (m_xml.Depth() == 2) {
            inSheetData = m_xml.Name() == "sheetData";
        } else if (inSheetData && m_xml.Name() == "row") {
            m_builder.StartRow(m_xml.Attribute("r"), m_xml.TokenOffset());
        } else if (inSheetData && m_xml.Name() == "c") {
            ReadCell();
        }
    }
    return !m_stopped;
}

void SheetCellReader::ReadCell()
{
    m_raw.offset = m_xml.TokenOffset();
    m_raw.reference.assign(m_xml.Attribute("r").value_or(""));
    m_raw.type.assign(m_xml.Attribute("t").value_or("n"));
    const std::optional<std::string_view> style = m_xml.Attribute("s");
    m_raw.style = style ? ParseUnsigned<unsigned>(*style).value_or(0) : 0;
    m_raw.hasValue = m_raw.hasInline = m_raw.hasFormula = false;
    m_raw.value.clear();
    m_raw.inlineText.clear();

    const std::size_t depth = m_xml.Depth();
    for (;;) {
        const Token token = m_xml.Next();
        if (token == Token::EndTag && m_xml.Depth() < depth)
            break;
        if (token != Token::StartTag)
            continue;
        if (m_xml.Name() == "v") {
            m_raw.hasValue = true;
            AppendElementText(m_xml, m_raw.value);
        } else if (m_xml.Name() == "is") {
            m_raw.hasInline = true;
            AppendRichText(m_xml, m_raw.inlineText);
        } else {
            m_raw.hasFormula = m_raw.hasFormula || m_xml.Name() == "f";
            m_xml.SkipElement(); // the formula itself, and extensions
        }
    }
    if (const ImportedCell* cell = m_builder.Build(m_raw))
        m_stopped = !m_sink.AddCell(m_index, *cell);
}

} // namespace

bool ReadSheetCells(XmlScanner& xml, const SheetContext& context, int index, ImportSink& sink)
{
    return SheetCellReader(xml, context, index, sink).Read();
}

} // namespace sheet::xlsx
