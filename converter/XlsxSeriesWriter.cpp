#include "converter/XlsxSeriesWriter.h"

#include "converter/NumberText.h"
#include "converter/SheetLayout.h"
#include "converter/StampText.h"
#include "formats/xlsx/XlsxParts.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <cstring>
#include <unordered_map>

namespace converter {

namespace {

constexpr size_t kSheetBufferBytes = 256 * 1024;
// Room for one cell: opening, row number, style, the longest value text, closing.
constexpr size_t kCellBytes = 80;
constexpr size_t kRowBytes = 64;
// Fixed-size copies may write this far past the text they copy.
constexpr size_t kSlack = 32;
constexpr int kNoString = -1;

template <size_t N>
char* Copy(char* out, const char (&text)[N])
{
    std::memcpy(out, text, N - 1);
    return out + N - 1;
}

} // namespace

// The header texts as shared-string indexes, each distinct text stored once.
struct XlsxSeriesWriter::HeaderCells {
    std::vector<std::string> strings;
    size_t references = 0;
    std::vector<int> metadata; // per item
    int timeTitle = kNoString;
    std::vector<int> names; // per item; kNoString for a blank cell

    explicit HeaderCells(const SeriesHeader& header)
    {
        for (const ItemInfo& item : header.items)
            metadata.push_back(Intern(sheet_layout::MetadataText(item)));
        timeTitle = Intern(sheet_layout::TimeTitle(header));
        // An empty name would read back as "Item<n>"; the cell stays blank as the input had it.
        for (const ItemInfo& item : header.items)
            names.push_back(item.name.empty() ? kNoString : Intern(item.name));
    }

private:
    int Intern(const std::string& text)
    {
        ++references;
        auto [it, added] = m_index.try_emplace(text, static_cast<int>(strings.size()));
        if (added)
            strings.push_back(text);
        return it->second;
    }
    std::unordered_map<std::string, int> m_index;
};

sys::Status XlsxSeriesWriter::Begin(const std::string& path, const SeriesHeader& header, const std::string& title)
{
    m_path = path;
    if (header.items.size() + 1 > kMaxColumns)
        return sys::Status::Fail(path, 0, std::to_string(header.items.size()) + " items do not fit the " +
                                         std::to_string(kMaxColumns - 1) + " value columns of a worksheet");
    if (sys::Status opened = m_zip.Open(path); !opened)
        return opened;
    m_sheet.resize(kSheetBufferBytes);
    m_cellOpenings.clear();
    for (unsigned column = 1; column <= header.items.size() + 1; ++column) {
        const std::string opening = "<c r=\"" + sheet::package::ColumnName(column);
        CellOpening slot{};
        std::memcpy(slot.text, opening.data(), opening.size());
        slot.length = opening.size();
        m_cellOpenings.push_back(slot);
    }
    const HeaderCells cells(header);
    if (sys::Status parts = WritePackageParts(cells, title); !parts)
        return parts;
    return WriteHeaderRows(cells);
}

sys::Status XlsxSeriesWriter::WritePackageParts(const HeaderCells& cells, const std::string& title)
{
    const std::pair<const char*, std::string> parts[] = {
        {"[Content_Types].xml", sheet::package::ContentTypes()},
        {"_rels/.rels", sheet::package::PackageRelationships()},
        {"docProps/core.xml", sheet::package::CoreProperties(title)},
        {"docProps/app.xml", sheet::package::AppProperties()},
        {"xl/workbook.xml", sheet::package::Workbook(sheet_layout::kSheetName)},
        {"xl/_rels/workbook.xml.rels", sheet::package::WorkbookRelationships()},
        {"xl/styles.xml", sheet::package::Styles(sheet_layout::kStampFormat)},
        {"xl/sharedStrings.xml", sheet::package::SharedStrings(cells.strings, cells.references)},
    };
    for (const auto& [name, text] : parts)
        if (sys::Status added = m_zip.AddEntry(name, text); !added)
            return added;
    // The used range is not known before the last row: a placeholder of the same length for now.
    return m_zip.BeginEntry("xl/worksheets/sheet1.xml", sheet::package::SheetHead(LastCell()));
}

sys::Status XlsxSeriesWriter::WriteHeaderRows(const HeaderCells& cells)
{
    auto textCell = [this](unsigned column, const char* row, int index) {
        if (index == kNoString)
            return;
        std::string cell(m_cellOpenings[column].text, m_cellOpenings[column].length);
        cell += row;
        cell += "\" t=\"s\"><v>" + std::to_string(index) + "</v></c>";
        std::memcpy(m_sheet.data() + m_used, cell.data(), cell.size());
        m_used += cell.size();
    };
    for (unsigned row = 1; row <= 2; ++row) {
        if (sys::Status room = Reserve(kRowBytes + m_cellOpenings.size() * kCellBytes); !room)
            return room;
        const char* number = row == 1 ? "1" : "2";
        const std::string open = std::string("<row r=\"") + number + "\">";
        std::memcpy(m_sheet.data() + m_used, open.data(), open.size());
        m_used += open.size();
        if (row == 2)
            textCell(0, number, cells.timeTitle);
        for (size_t item = 0; item < cells.metadata.size(); ++item)
            textCell(static_cast<unsigned>(item + 1), number, row == 1 ? cells.metadata[item] : cells.names[item]);
        m_used = static_cast<size_t>(Copy(m_sheet.data() + m_used, "</row>") - m_sheet.data());
    }
    return sys::Status::Ok();
}

sys::Status XlsxSeriesWriter::Reserve(size_t bytes)
{
    if (m_used + bytes + kSlack <= m_sheet.size())
        return sys::Status::Ok();
    if (sys::Status flushed = FlushSheet(); !flushed)
        return flushed;
    if (bytes + kSlack > m_sheet.size())
        m_sheet.resize(bytes + kSlack);
    return sys::Status::Ok();
}

sys::Status XlsxSeriesWriter::FlushSheet()
{
    const std::string_view pending(m_sheet.data(), m_used);
    m_used = 0;
    return m_zip.Append(pending);
}

sys::Status XlsxSeriesWriter::Write(const Row& row)
{
    if (m_row >= kMaxRows)
        return sys::Status::Fail(m_path, 0, "more rows than a worksheet holds (" + std::to_string(kMaxRows) + ")");
    if (sys::Status room = Reserve(kRowBytes + m_cellOpenings.size() * kCellBytes); !room)
        return room;
    char number[16] = {};
    const size_t digits = static_cast<size_t>(std::to_chars(number, number + sizeof number, m_row + 1).ptr - number);

    char* out = m_sheet.data() + m_used;
    auto openCell = [&](unsigned column) {
        std::memcpy(out, m_cellOpenings[column].text, sizeof m_cellOpenings[column].text);
        out += m_cellOpenings[column].length;
        std::memcpy(out, number, 8); // a row number has at most 7 digits
        out += digits;
    };
    out = Copy(out, "<row r=\"");
    std::memcpy(out, number, 8);
    out += digits;
    out = Copy(out, "\">");
    openCell(0);
    if (const std::optional<double> serial = SheetSerialFromStamp(row.stamp)) {
        out = Copy(out, "\" s=\"1\"><v>");
        out = FormatValue(*serial, out);
        out = Copy(out, "</v></c>");
    } else {
        // Before 1900 a sheet has no dates: the stamp as text, which the default template reads too.
        out = Copy(out, "\" t=\"inlineStr\"><is><t>");
        out = FormatStamp(row.stamp, out);
        out = Copy(out, "</t></is></c>");
    }
    const size_t count = std::min(row.values.size(), m_cellOpenings.size() - 1);
    for (size_t i = 0; i < count; ++i) {
        // A cell holds finite numbers only: missing and infinite values stay blank.
        if (!std::isfinite(row.values[i]))
            continue;
        openCell(static_cast<unsigned>(i + 1));
        out = Copy(out, "\"><v>");
        out = FormatValue(row.values[i], out);
        out = Copy(out, "</v></c>");
    }
    out = Copy(out, "</row>");
    m_used = static_cast<size_t>(out - m_sheet.data());
    ++m_row;
    return sys::Status::Ok();
}

std::string XlsxSeriesWriter::LastCell() const
{
    return sheet::package::ColumnName(static_cast<unsigned>(m_cellOpenings.size())) + std::to_string(m_row);
}

sys::Status XlsxSeriesWriter::Finish()
{
    if (sys::Status flushed = FlushSheet(); !flushed)
        return flushed;
    if (sys::Status tail = m_zip.Append(sheet::package::SheetTail()); !tail)
        return tail;
    if (sys::Status ended = m_zip.EndEntry(sheet::package::SheetHead(LastCell())); !ended)
        return ended;
    return m_zip.Close();
}

} // namespace converter
