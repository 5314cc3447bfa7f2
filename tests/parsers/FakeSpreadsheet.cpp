#include "FakeSpreadsheet.h"

#include <algorithm>

namespace fake {

bool ParseAddress(const std::string& address, int& row, int& column)
{
    size_t i = 0;
    column = 0;
    while (i < address.size() && address[i] >= 'A' && address[i] <= 'Z' && i < 3)
        column = column * 26 + (address[i++] - 'A' + 1);
    if (column == 0 || i == address.size())
        return false;
    row = 0;
    for (; i < address.size(); ++i) {
        if (address[i] < '0' || address[i] > '9' || row > 1000000)
            return false;
        row = row * 10 + (address[i] - '0');
    }
    return row >= 1;
}

namespace {

class Block : public sheet::CellRange {
public:
    Block(const Sheet& sheet, int top, int left, int bottom, int right)
        : m_sheet(sheet), m_top(top), m_left(left), m_bottom(bottom), m_right(right)
    {
    }

    sheet::Variant Text() const override
    {
        auto found = m_sheet.cells.find({m_top, m_left});
        return fake::Text(found == m_sheet.cells.end() ? std::string() : found->second.text);
    }

    sheet::Variant Value2() const override
    {
        if (Count() == 1)
            return ValueAt(m_top, m_left);
        sheet::Variant block;
        block.type = sheet::Variant::Array;
        block.rows = m_bottom - m_top + 1;
        block.columns = m_right - m_left + 1;
        for (int r = m_top; r <= m_bottom; ++r)
            for (int c = m_left; c <= m_right; ++c)
                block.cells.push_back(ValueAt(r, c));
        return block;
    }

    int Count() const override { return (m_bottom - m_top + 1) * (m_right - m_left + 1); }
    int Column() const override { return m_left; }
    int Row() const override { return m_top; }
    int RowCount() const override { return m_bottom - m_top + 1; }
    int ColumnCount() const override { return m_right - m_left + 1; }

    int CountValues() const
    {
        int count = 0;
        for (const auto& [place, cell] : m_sheet.cells)
            if (place.first >= m_top && place.first <= m_bottom && place.second >= m_left && place.second <= m_right)
                count += cell.value.IsEmpty() ? 0 : 1;
        return count;
    }

private:
    sheet::Variant ValueAt(int row, int column) const
    {
        auto found = m_sheet.cells.find({row, column});
        return found == m_sheet.cells.end() ? sheet::Variant() : found->second.value;
    }

    const Sheet& m_sheet;
    int m_top, m_left, m_bottom, m_right;
};

} // namespace

void Sheet::Put(const std::string& address, const std::string& textValue)
{
    int row = 0, column = 0;
    if (ParseAddress(address, row, column))
        cells[{row, column}] = Cell {fake::Text(textValue), textValue};
}

void Sheet::Put(const std::string& address, double number, const std::string& display)
{
    int row = 0, column = 0;
    if (ParseAddress(address, row, column))
        cells[{row, column}] = Cell {Number(number), display};
}

void Sheet::PutEmptyText(const std::string& address) { Put(address, std::string()); }

std::shared_ptr<sheet::CellRange> Sheet::Range(const std::string& cell, const std::string& otherCell)
{
    if (log)
        log->push_back("Range " + cell + (otherCell.empty() ? "" : ":" + otherCell));
    int row = 0, column = 0;
    if (failingAddresses.count(cell) || !ParseAddress(cell, row, column))
        throw sheet::AutomationError("bad address " + cell);
    int lastRow = row, lastColumn = column;
    if (!otherCell.empty() && !ParseAddress(otherCell, lastRow, lastColumn))
        throw sheet::AutomationError("bad address " + otherCell);
    return std::make_shared<Block>(*this, row, column, lastRow, lastColumn);
}

double Functions::CountA(const std::shared_ptr<sheet::CellRange>& range)
{
    const auto* block = dynamic_cast<const Block*>(range.get());
    if (block == nullptr)
        throw sheet::AutomationError("CountA of a foreign range");
    return block->CountValues();
}

std::shared_ptr<sheet::CellRange> Sheet::UsedRange()
{
    if (cells.empty())
        return std::make_shared<Block>(*this, 1, 1, 1, 1);
    int top = cells.begin()->first.first, bottom = top;
    int left = cells.begin()->first.second, right = left;
    for (const auto& [place, cell] : cells) {
        top = std::min(top, place.first);
        bottom = std::max(bottom, place.first);
        left = std::min(left, place.second);
        right = std::max(right, place.second);
    }
    return std::make_shared<Block>(*this, top, left, bottom, right);
}

void Workbook::Close(bool saveChanges)
{
    if (log)
        log->push_back(saveChanges ? "Close save" : "Close");
}

int Workbook::Count()
{
    if (countFails)
        throw sheet::AutomationError("Count");
    return static_cast<int>(sheets.size());
}

std::shared_ptr<sheet::Worksheet> Workbook::Item(int number)
{
    if (number < 1 || number > static_cast<int>(sheets.size()))
        throw sheet::AutomationError("no such sheet");
    return sheets[static_cast<size_t>(number - 1)];
}

Workbook& Application::AddWorkbook(const std::string& path, int sheetCount)
{
    auto book = std::make_shared<Workbook>();
    book->log = &log;
    for (int i = 0; i < sheetCount; ++i) {
        book->sheets.push_back(std::make_shared<Sheet>());
        book->sheets.back()->log = nullptr;
    }
    books[path] = book;
    return *book;
}

void Application::Visible(bool visible) { log.push_back(visible ? "Visible true" : "Visible false"); }

std::string Application::Version()
{
    if (versionFails)
        throw sheet::AutomationError("Version");
    return version;
}

void Application::Quit() { log.push_back("Quit"); }

std::shared_ptr<sheet::Workbook> Application::Open(const std::string& path)
{
    log.push_back("Open " + path);
    auto found = books.find(path);
    if (found == books.end())
        throw sheet::AutomationError("cannot open " + path);
    return found->second;
}

} // namespace fake
