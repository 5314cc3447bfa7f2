#include "converter/ExcelSeriesReader.h"

#include "formats/workbook/CellAddress.h"
#include "formats/workbook/WorkbookReader.h"
#include "platform/system/Text.h"
#include "resources/StringTable.h"
#include "templates/HeaderCells.h"
#include "templates/Specification.h"

#include <algorithm>
#include <cmath>
#include <utility>

namespace converter {

namespace {

// Rows go from the reading thread to Next in batches, so the two threads meet once a batch
// instead of once a row.
constexpr size_t kBatchRows = 256;
constexpr size_t kQueuedBatches = 4;
// Formula cells without a result the log names; the rest it counts.
constexpr size_t kListedFormulaCells = 10;

const sheet::RowCell* CellAt(const std::vector<sheet::RowCell>& cells, int column)
{
    auto it = std::lower_bound(cells.begin(), cells.end(), column,
                               [](const sheet::RowCell& cell, int c) { return cell.column < c; });
    return it != cells.end() && it->column == column ? &*it : nullptr;
}

std::string TextAt(const std::vector<sheet::RowCell>& cells, int column)
{
    const sheet::RowCell* cell = CellAt(cells, column);
    return cell ? cell->text : std::string();
}

bool IsValueTypeName(const std::string& name)
{
    int code = 0;
    return text::EqualsNoCase(name, "Instantaneous") || CSpecification::GetValueTypeCode(name, code);
}

} // namespace

ExcelSeriesReader::ExcelSeriesReader(const CSpecification& spec) : m_spec(spec) {}

ExcelSeriesReader::~ExcelSeriesReader()
{
    {
        std::lock_guard<std::mutex> lock(m_mutex);
        m_stop = true;
    }
    m_changed.notify_all();
    if (m_producer.joinable())
        m_producer.join();
}

sys::Status ExcelSeriesReader::Open(const std::string& path)
{
    m_path = path;
    m_header = SeriesHeader();
    m_header.timeTitle = "DateTime";
    m_sheet = m_spec.m_DataDesc.m_nExcelSheet;
    m_formatColumns = m_spec.CountFormatColumns(1);
    m_stampColumn = m_spec.GetDateTimeColumn();
    m_deleteInUse = m_spec.m_DataDesc.m_nDeleteValueCheck != 0;
    if (m_spec.m_DataDesc.m_nStartRow < 1)
        return m_status = sys::Status::Fail(path, 0, "the data start row of the template must be 1 or more");
    if (m_stampColumn < 1)
        return m_status = sys::Status::Fail(path, 0, "the template's date/time option must be 0, 1 or 2");
    if (sys::Status header = ReadHeader(); !header)
        return m_status = header;
    std::vector<size_t> all(m_itemCount);
    for (size_t i = 0; i < all.size(); ++i)
        all[i] = i;
    Select(all);
    StartRows();
    return m_status;
}

// One pass over the sheet for its used columns and the header rows.
sys::Status ExcelSeriesReader::ReadHeader()
{
    const CDataDescription& data = m_spec.m_DataDesc;
    sheet::WorkbookReader workbook;
    if (const sys::Status opened = workbook.Open(m_path); !opened)
        return sys::Status::Fail(m_path, 0, opened.problem().message);
    if (m_sheet < 1 || m_sheet > workbook.SheetCount())
        return sys::Status::Fail(m_path, 0, res::LoadString(res::IDS_SHEET_INDEX_TOO_LARGE));

    std::vector<int> wanted{data.m_nStartRow, 1};
    if (data.m_nItemTitleOption == 0)
        wanted.push_back(data.m_nItemDescriptionRow);
    for (auto [option, row] : {std::pair{data.m_nUnitTypeOption, data.m_nUnitTypeRow},
                               std::pair{data.m_nUnitOption, data.m_nUnitRow},
                               std::pair{data.m_nValueTypeOption, data.m_nValueTypeRow}})
        if (option == 1)
            wanted.push_back(row);
    std::map<int, SheetRow> headerRows;
    int first = 0, last = 0;
    // This pass goes over the whole sheet for its used columns; only the header rows need the
    // texts of their numbers.
    const std::vector<bool> noNumberTexts;
    const sys::Status read = workbook.ReadRows(m_sheet, [&](int row, const std::vector<sheet::RowCell>& cells) {
        if (!cells.empty()) {
            first = first == 0 ? cells.front().column : std::min(first, cells.front().column);
            last = std::max(last, cells.back().column);
        }
        if (std::find(wanted.begin(), wanted.end(), row) != wanted.end()) {
            SheetRow& header = headerRows[row] = SheetRow{row, cells};
            for (sheet::RowCell& cell : header.cells)
                if (cell.value.type != sheet::Variant::Text)
                    cell.text = workbook.DisplayedText(cell);
        }
        return true;
    }, &noNumberTexts);
    if (!read)
        return sys::Status::Fail(m_path, 0, read.problem().message);
    for (const auto& [row, header] : headerRows)
        if (row < data.m_nStartRow)
            NoteFormulasWithoutResult(header);
    if (last < 2 || last - first < 1)
        return sys::Status::Fail(m_path, 0, "the sheet has fewer than two used columns");
    m_firstColumn = first;
    m_lastColumn = last;
    m_firstValueColumn = m_stampColumn != first ? first : first + m_formatColumns;
    if (m_deleteInUse)
        m_deleteValue = data.m_nDeleteValueRadio == 1
                            ? (headerRows.count(data.m_nDeleteValueRow) ? TextAt(headerRows[data.m_nDeleteValueRow].cells, 1) : std::string())
                            : data.m_strDeleteValue;
    return ReadItems(headerRows);
}

sys::Status ExcelSeriesReader::ReadItems(const std::map<int, SheetRow>& headerRows)
{
    const CDataDescription& data = m_spec.m_DataDesc;
    std::vector<int> valueColumns;
    for (int x = m_firstValueColumn; x <= m_lastColumn; ++x)
        if (x < m_stampColumn || x >= m_stampColumn + m_formatColumns)
            valueColumns.push_back(x);
    m_itemCount = valueColumns.size();
    if (m_itemCount == 0)
        return sys::Status::Fail(m_path, data.m_nStartRow, res::LoadString(res::IDS_NO_ITEM_COLUMN));
    static const std::vector<sheet::RowCell> kNoCells;
    auto rowCells = [&](int row) -> const std::vector<sheet::RowCell>& {
        auto it = headerRows.find(row);
        return it == headerRows.end() ? kNoCells : it->second.cells;
    };

    // The sheet's own date/time title when it has one, so a round trip keeps it.
    if (data.m_nItemTitleOption == 0) {
        const std::string title = TextAt(rowCells(data.m_nItemDescriptionRow), m_stampColumn);
        if (!title.empty())
            m_header.timeTitle = title;
    }
    m_header.items.assign(m_itemCount, ItemInfo());
    for (size_t i = 0; i < m_itemCount; ++i) {
        ItemInfo& item = m_header.items[i];
        const int column = valueColumns[i];
        const CItemDefinition* def = i < data.m_vecItemDefs.size() ? &data.m_vecItemDefs[i] : nullptr;
        if (data.m_nItemTitleOption == 0) {
            item.name = TextAt(rowCells(data.m_nItemDescriptionRow), column);
            if (item.name.empty())
                item.name = "Item" + std::to_string(column - m_firstColumn + 1);
        } else {
            item.name = m_itemCount > data.m_vecItemDefs.size() ? "Item" + std::to_string(i + 1) : def->m_strTitle;
        }
        struct Part {
            int option;
            int row;
            const std::string& global;
            std::string CItemDefinition::*member;
            CString (*cut)(const CString&);
            int emptyMessage;
            std::string& target;
        } parts[] = {
            {data.m_nUnitTypeOption, data.m_nUnitTypeRow, data.m_strGlobalUnitType, &CItemDefinition::m_strType,
             TextBeforeBracket, res::IDS_NO_ITEM_TYPE, item.type},
            {data.m_nUnitOption, data.m_nUnitRow, data.m_strGlobalUnit, &CItemDefinition::m_strUnit, TextInBrackets,
             res::IDS_NO_UNIT_TYPE, item.unit},
            {data.m_nValueTypeOption, data.m_nValueTypeRow, data.m_strGlobalValueType, &CItemDefinition::m_strValueType,
             TextAfterColon, res::IDS_NO_VALUE_TYPE, item.valueType},
        };
        for (Part& part : parts) {
            switch (part.option) {
            case 0: part.target = part.global; break;
            case 1:
                part.target = part.cut(TextAt(rowCells(part.row), column));
                if (part.target.empty())
                    return sys::Status::Fail(m_path, part.row, res::LoadString(part.emptyMessage));
                break;
            case 2: part.target = def ? def->*part.member : std::string(); break;
            default: return sys::Status::Fail(m_path, 0, "the template's item options must be 0, 1 or 2");
            }
        }
        if (!IsValueTypeName(item.valueType))
            return sys::Status::Fail(m_path, data.m_nValueTypeRow,
                                res::LoadString(res::IDS_VALUE_TYPE_INVALID) + " '" + item.valueType + "'");
    }

    const CTimeDescription& time = m_spec.m_TimeDesc;
    m_start = sys::DateTimeFields();
    switch (time.m_nDateTimeOption) {
    case 0:
        m_useFormat = time.m_bUseDTFormat != 0;
        m_format = std::make_unique<sys::DateFormat>(time.m_strDateTimeFormat);
        break;
    case 1:
        m_useFormat = time.m_bUseTFormat != 0;
        m_format = std::make_unique<sys::DateFormat>(time.m_strTimeFormat, sys::DateFormat::Reads::Time);
        m_start.year = 100;
        if (!sys::DateFormat("YYYY-MM-DD", sys::DateFormat::Reads::Date).Read(time.m_strGlobalDate, m_start))
            return sys::Status::Fail(m_path, 0, "the template's global date '" + time.m_strGlobalDate + "' is not YYYY-MM-DD");
        break;
    case 2:
        m_useFormat = time.m_bUseDFormat != 0;
        m_format = std::make_unique<sys::DateFormat>(time.m_strDateFormat, sys::DateFormat::Reads::Date);
        if (!sys::DateFormat("HH:mm:ss", sys::DateFormat::Reads::Time).Read(time.m_strGlobalTime, m_start))
            return sys::Status::Fail(m_path, 0, "the template's global time '" + time.m_strGlobalTime + "' is not HH:mm:ss");
        m_start.year = 100;
        break;
    default: return sys::Status::Fail(m_path, 0, "the template's date/time option must be 0, 1 or 2");
    }
    return sys::Status::Ok();
}

void ExcelSeriesReader::Select(const std::vector<size_t>& items)
{
    SeriesReader::Select(items);
    // An item selected twice fills only its last slot, as in the text reader.
    std::vector<int> slotOfItem(m_itemCount, -1);
    for (size_t slot = 0; slot < items.size(); ++slot)
        if (items[slot] < m_itemCount)
            slotOfItem[items[slot]] = static_cast<int>(slot);
    m_slotOfColumn.assign(static_cast<size_t>(m_lastColumn) + 1, -1);
    size_t item = 0;
    for (int x = m_firstValueColumn; x <= m_lastColumn; ++x) {
        if (x >= m_stampColumn && x < m_stampColumn + m_formatColumns)
            continue;
        m_slotOfColumn[static_cast<size_t>(x)] = slotOfItem[item++];
    }
}

void ExcelSeriesReader::StartRows()
{
    const int startRow = m_spec.m_DataDesc.m_nStartRow;
    m_producer = std::thread([this, startRow, textColumns = TextColumns()] {
        sheet::WorkbookReader workbook;
        std::vector<SheetRow> batch;
        auto handOver = [&] {
            std::unique_lock<std::mutex> lock(m_mutex);
            m_changed.wait(lock, [&] { return m_stop || m_queue.size() < kQueuedBatches; });
            if (m_stop)
                return false;
            m_queue.push_back(std::exchange(batch, {}));
            m_changed.notify_all();
            return true;
        };
        sys::Status read = workbook.Open(m_path);
        if (read)
            read = workbook.ReadRows(m_sheet, [&](int number, const std::vector<sheet::RowCell>& cells) {
                if (number < startRow)
                    return true;
                batch.push_back(SheetRow{number, cells});
                return batch.size() < kBatchRows || handOver();
            }, textColumns.empty() ? nullptr : &textColumns);
        if (read && !batch.empty())
            handOver();
        std::lock_guard<std::mutex> lock(m_mutex);
        if (!read && !m_stop)
            m_producerError = read.problem().message;
        m_producerDone = true;
        m_changed.notify_all();
    });
}

// The columns whose numbers are needed as the sheet displays them: the date/time columns, and
// every column when a delete value is compared with the displayed texts. Empty means every one.
std::vector<bool> ExcelSeriesReader::TextColumns() const
{
    if (m_deleteInUse)
        return {};
    std::vector<bool> columns(static_cast<size_t>(std::max(m_lastColumn, m_stampColumn + m_formatColumns)) + 1, false);
    for (int w = 0; w < m_formatColumns; ++w)
        columns[static_cast<size_t>(m_stampColumn + w)] = true;
    return columns;
}

bool ExcelSeriesReader::NextSheetRow(SheetRow& sheetRow)
{
    if (m_batchAt == m_batch.size()) {
        std::unique_lock<std::mutex> lock(m_mutex);
        m_changed.wait(lock, [&] { return !m_queue.empty() || m_producerDone; });
        if (m_queue.empty())
            return false;
        m_batch = std::move(m_queue.front());
        m_queue.pop_front();
        m_batchAt = 0;
        m_changed.notify_all();
    }
    sheetRow = std::move(m_batch[m_batchAt++]);
    return true;
}

bool ExcelSeriesReader::Next(Row& row)
{
    while (!NextRow(row)) {
        if (!m_valuesFailed || !PassOverFault()) {
            NoteFormulaCells();
            return false;
        }
        m_valuesFailed = false;
    }
    return true;
}

bool ExcelSeriesReader::NextRow(Row& row)
{
    if (!m_status || m_dataEnded)
        return false;
    SheetRow sheetRow;
    if (!NextSheetRow(sheetRow)) {
        std::lock_guard<std::mutex> lock(m_mutex);
        if (!m_producerError.empty())
            return Fail(m_path, m_rowNumber, m_producerError);
        return false;
    }
    // Rows without cells are not handed over: a gap is an empty row, which ends the data.
    const int expected = m_rowNumber == 0 ? m_spec.m_DataDesc.m_nStartRow : static_cast<int>(m_rowNumber) + 1;
    if (sheetRow.number > expected)
        return EndData(expected, "which is empty: the rows below it are not converted");
    m_rowNumber = sheetRow.number;
    NoteFormulasWithoutResult(sheetRow);
    std::string unreadable;
    switch (ReadStamp(sheetRow, row.stamp, unreadable)) {
    case StampRead::Read:
        break;
    case StampRead::Blank:
        return EndData(sheetRow.number, "whose date/time cell is empty: it and the rows below it are not converted");
    case StampRead::Unreadable:
        // A start row that is no data row means the template does not describe the sheet.
        if (m_rowsRead == 0)
            return Fail(m_path, sheetRow.number, res::LoadString(res::IDS_DATETIME_UNPARSABLE) + " '" + unreadable + "'");
        return EndData(sheetRow.number, "whose date/time '" + unreadable +
                                            "' cannot be read: it and the rows below it are not converted");
    case StampRead::Failed:
        return false;
    }
    if (!ReadValues(sheetRow, row)) {
        m_valuesFailed = true;
        return false;
    }
    ++m_rowsRead;
    return true;
}

// The first row whose date/time cannot be read ends the data, as in the preview; later rows are
// notes. The log says where the data ended.
bool ExcelSeriesReader::EndData(int row, const std::string& why)
{
    m_dataEnded = true;
    m_notes.push_back("the data end at row " + std::to_string(row) + ", " + why);
    std::lock_guard<std::mutex> lock(m_mutex);
    m_stop = true;
    m_queue.clear();
    m_batch.clear();
    m_batchAt = 0;
    m_changed.notify_all();
    return false;
}

void ExcelSeriesReader::NoteFormulasWithoutResult(const SheetRow& sheetRow)
{
    for (const sheet::RowCell& cell : sheetRow.cells) {
        if (!cell.formulaWithoutResult)
            continue;
        if (m_formulaCells.size() < kListedFormulaCells)
            m_formulaCells.push_back(sheet::ColumnLetters(cell.column) + std::to_string(sheetRow.number));
        ++m_formulaCellCount;
    }
}

void ExcelSeriesReader::NoteFormulaCells()
{
    if (m_formulaCellCount == 0 || m_formulaNoted)
        return;
    std::string cells;
    for (const std::string& cell : m_formulaCells)
        cells += (cells.empty() ? "" : ", ") + cell;
    if (m_formulaCellCount > m_formulaCells.size())
        cells += " and " + std::to_string(m_formulaCellCount - m_formulaCells.size()) + " more";
    m_notes.push_back(std::to_string(m_formulaCellCount) + (m_formulaCellCount == 1 ? " formula cell" : " formula cells") +
                      " without a result (or with an empty one) read as empty: " + cells);
    m_formulaNoted = true;
}

bool ExcelSeriesReader::IsDeleted(const std::string& text) const
{
    return m_deleteInUse && text::EqualsNoCase(text, m_deleteValue);
}

ExcelSeriesReader::StampRead ExcelSeriesReader::ReadStamp(const SheetRow& sheetRow, Stamp& stamp,
                                                           std::string& unreadable)
{
    const CTimeDescription& time = m_spec.m_TimeDesc;
    const int option = time.m_nDateTimeOption;
    sys::DateTimeFields fields = m_start;
    if (m_useFormat) {
        std::string joined;
        for (int w = 0; w < m_formatColumns; ++w)
            joined += TextAt(sheetRow.cells, m_stampColumn + w) + " ";
        joined = text::Trim(joined);
        if (joined.empty())
            return StampRead::Blank;
        if (!m_format->Read(joined, fields)) {
            unreadable = joined;
            return StampRead::Unreadable;
        }
    } else {
        const sheet::RowCell* cell = CellAt(sheetRow.cells, m_stampColumn);
        if (!cell || (cell->value.type == sheet::Variant::Text && text::Trim(cell->text).empty()))
            return StampRead::Blank;
        std::optional<Stamp> value;
        if (cell->value.type == sheet::Variant::Number) {
            const double serial = cell->value.number;
            if (serial >= 60 && serial < 61) {
                Fail(m_path, sheetRow.number, "the date/time cell holds 29 February 1900 (day 60 of the sheet's "
                                              "calendar), which the calendar does not have");
                return StampRead::Failed;
            }
            value = StampFromSheetSerial(serial);
            if (!value) {
                unreadable = text::Format("%.15g", serial); // no date of the years 100 to 9999
                return StampRead::Unreadable;
            }
        } else {
            sys::DateTimeFields parsed = option == 0 ? sys::DateTimeFields() : m_start;
            if (m_format->Read(cell->text, parsed))
                value = StampFromFields(parsed);
        }
        if (!value) {
            unreadable = cell->text;
            return StampRead::Unreadable;
        }
        const sys::DateTimeFields cellFields = FieldsFromStamp(*value);
        if (option == 0)
            fields = cellFields;
        else if (option == 1)
            fields.hour = cellFields.hour, fields.minute = cellFields.minute, fields.second = cellFields.second;
        else
            fields.year = cellFields.year, fields.month = cellFields.month, fields.day = cellFields.day;
    }
    std::optional<Stamp> value = StampFromFields(fields);
    if (!value) {
        Fail(m_path, sheetRow.number, "the date/time of the row does not exist in the calendar");
        return StampRead::Failed;
    }
    stamp = *value;
    return StampRead::Read;
}

bool ExcelSeriesReader::ReadValues(const SheetRow& sheetRow, Row& row)
{
    row.values.assign(m_selection.size(), kMissing);
    for (const sheet::RowCell& cell : sheetRow.cells) {
        if (cell.column < 0 || cell.column > m_lastColumn)
            continue;
        const int slot = m_slotOfColumn[static_cast<size_t>(cell.column)];
        if (slot < 0 || IsDeleted(cell.text))
            continue;
        double value = kMissing;
        switch (cell.value.type) {
        case sheet::Variant::Number:
        case sheet::Variant::Boolean: value = cell.value.number; break;
        case sheet::Variant::Text:
            if (m_numbers.Read(cell.text, value) == ValueText::NotANumber)
                return Fail(m_path, sheetRow.number, "the value '" + cell.text + "' is not a number", cell.column);
            break;
        default: break; // empty and error cells are missing values
        }
        row.values[static_cast<size_t>(slot)] = value;
    }
    return true;
}

} // namespace converter
