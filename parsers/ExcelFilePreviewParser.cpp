#include "parsers/ExcelFilePreviewParser.h"

#include "platform/system/DateFormat.h"
#include "platform/system/FileSystem.h"
#include "platform/system/Text.h"
#include "platform/ui/UserInterface.h"
#include "resources/StringTable.h"
#include "templates/HeaderCells.h"

#include <algorithm>

namespace {

// Worksheet rows the previews read at most.
constexpr int kLastPreviewRow = 20;
// The widest sheet the application has (column XFD).
constexpr int kLastSheetColumn = 16384;

const char* const kStampFormat = "%Y/%m/%d %H:%M:%S";

// The object model hands back null where automation would raise; both mean the call failed.
template <typename T>
std::shared_ptr<T> Require(std::shared_ptr<T> object, const char* what)
{
    if (!object)
        throw sheet::AutomationError(std::string("no ") + what);
    return object;
}

// The range of one cell. A place outside the grid has no address and is refused here, without
// relying on the sheet to refuse an empty one.
std::shared_ptr<sheet::CellRange> CellRangeAt(sheet::Worksheet& sheet, int row, int column)
{
    const CString address = CExcelFilePreviewParser::CellAddress(row, column);
    if (address.empty())
        throw sheet::AutomationError("no cell at row " + std::to_string(row) + ", column " + std::to_string(column));
    return Require(sheet.Range(address), "Range");
}

} // namespace

// ---------------------------------------------------------------------------------------------
// Life of the application

CExcelFilePreviewParser::CExcelFilePreviewParser() : CExcelFilePreviewParser(&sheet::CreateApplication) {}

CExcelFilePreviewParser::CExcelFilePreviewParser(const ApplicationFactory& startApplication)
{
    StartApplication(startApplication);
}

CExcelFilePreviewParser::~CExcelFilePreviewParser()
{
    m_dispWorksheets.reset();
    CloseOpenWorkbook();
    m_dispWorkbooks.reset();
    if (m_dispApplication) {
        try {
            m_dispApplication->Quit();
        } catch (const sheet::AutomationError&) {
            // Nothing more can be done for an application that will not quit.
        }
        m_dispApplication.reset();
    }
}

void CExcelFilePreviewParser::StartApplication(const ApplicationFactory& startApplication)
{
    try {
        m_dispApplication = startApplication ? startApplication() : nullptr;
    } catch (const sheet::AutomationError&) {
        m_dispApplication.reset();
    }
    if (!m_dispApplication)
        return;
    try {
        m_dispApplication->Visible(false);
        m_dispWorkbooks = m_dispApplication->Workbooks();
    } catch (const sheet::AutomationError&) {
        // OpenWorkbook asks for the collection again, so a parser without it can still recover.
        m_dispWorkbooks.reset();
    }
}

void CExcelFilePreviewParser::CloseOpenWorkbook()
{
    // A closed workbook's sheets are gone with it; keeping them would read a file no longer open.
    m_dispWorksheets.reset();
    if (!m_dispWorkbook)
        return;
    try {
        m_dispWorkbook->Close(false);
    } catch (const sheet::AutomationError&) {
        // Forget the workbook anyway: the next open starts afresh.
    }
    m_dispWorkbook.reset();
}

int GetExcelVersion() { return GetExcelVersion(&sheet::CreateApplication); }

int GetExcelVersion(const CExcelFilePreviewParser::ApplicationFactory& startApplication)
{
    const int unknown = 10;
    std::shared_ptr<sheet::Application> application;
    try {
        application = startApplication ? startApplication() : nullptr;
    } catch (const sheet::AutomationError&) {
        return unknown;
    }
    if (!application)
        return unknown;
    try {
        const std::string version = application->Version();
        application->Quit();
        return text::AtoI(version);
    } catch (const sheet::AutomationError&) {
        try {
            application->Quit();
        } catch (const sheet::AutomationError&) {
        }
        return unknown;
    }
}

// ---------------------------------------------------------------------------------------------
// Workbook and sheet

void CExcelFilePreviewParser::SetFile(const CString& path)
{
    if (!text::EqualsNoCase(path, m_strFile))
        CFilePreviewParser::SetFile(path);
    m_nUsedColumns = -1;
}

int CExcelFilePreviewParser::OpenWorkbook(const CString& path, CString& message)
{
    // A FIFO or a device would keep the workbook reader waiting.
    if (!m_dispApplication || !sys::IsRegularFile(path))
        return 0;
    try {
        m_dispWorkbooks.reset();
        m_dispWorkbooks = Require(m_dispApplication->Workbooks(), "Workbooks");
        CloseOpenWorkbook();
        m_dispWorkbook = Require(m_dispWorkbooks->Open(path), "Workbook");
        m_dispWorksheets = Require(m_dispWorkbook->Worksheets(), "Worksheets");
        return 1;
    } catch (const sheet::AutomationError& error) {
        message = res::LoadString(res::IDS_FAILED_TO_OPEN_FILE) + path;
        return Fail(path, 0, error.what());
    }
}

int CExcelFilePreviewParser::CloseWorkbook()
{
    CloseOpenWorkbook();
    m_dispWorkbooks.reset();
    return 1;
}

int CExcelFilePreviewParser::CheckSheetIndex(int n)
{
    if (!m_dispWorksheets)
        return 0;
    int count = 0;
    try {
        count = m_dispWorksheets->Count();
    } catch (const sheet::AutomationError&) {
        return 1;
    }
    if (n >= 1 && n <= count)
        return 1;
    return Refuse(res::IDS_SHEET_INDEX_TOO_LARGE);
}

std::shared_ptr<sheet::Worksheet> CExcelFilePreviewParser::ReachSheet(bool allowNoTemplate)
{
    if (!m_dispWorksheets || (!m_pSpecification && !allowNoTemplate))
        return nullptr;
    const int number = m_pSpecification ? m_pSpecification->m_DataDesc.m_nExcelSheet : 1;
    if (!CheckSheetIndex(number))
        return nullptr;
    try {
        return m_dispWorksheets->Item(number);
    } catch (const sheet::AutomationError&) {
        return nullptr;
    }
}

// A column of the used range counts when one of its cells holds a value. The application counts
// each column's values itself, so no sheet's values are ever fetched at once, however long.
int CExcelFilePreviewParser::CountUsedColumnsOf(sheet::Worksheet& sheet, int& count) const
{
    try {
        auto used = Require(sheet.UsedRange(), "UsedRange");
        const int cells = used->Count();
        count = 0;
        if (cells < 2)
            return 0;
        auto functions = Require(m_dispApplication ? m_dispApplication->WorksheetFunction() : nullptr, "WorksheetFunction");
        const int top = used->Row();
        const int bottom = top + used->RowCount() - 1;
        const int left = used->Column();
        for (int column = left; column < left + used->ColumnCount(); ++column) {
            auto values = Require(sheet.Range(CellAddress(top, column), CellAddress(bottom, column)), "Range");
            if (functions->CountA(values) > 0)
                ++count;
        }
        return 1;
    } catch (const sheet::AutomationError&) {
        return 0;
    }
}

int CExcelFilePreviewParser::CountUsedColumns(int& count)
{
    auto sheet = ReachSheet();
    if (!sheet)
        return 0;
    if (!CountUsedColumnsOf(*sheet, count))
        return 0;
    m_nUsedColumns = count;
    return 1;
}

int CExcelFilePreviewParser::FirstUsedColumnOf(sheet::Worksheet& sheet, int& column) const
{
    try {
        column = Require(sheet.UsedRange(), "UsedRange")->Column();
        return 1;
    } catch (const sheet::AutomationError&) {
        return 0;
    }
}

int CExcelFilePreviewParser::GetFirstUsedColumn(int& column)
{
    auto sheet = ReachSheet();
    return sheet ? FirstUsedColumnOf(*sheet, column) : 0;
}

CString CExcelFilePreviewParser::CellAddress(int row, int column)
{
    if (row < 1 || column < 1 || column > kLastSheetColumn)
        return CString();
    // Bijective base 26: A..Z, AA..ZZ, AAA..; column 28 is AB.
    CString letters;
    for (int rest = column; rest > 0; rest = (rest - 1) / 26)
        letters.insert(letters.begin(), static_cast<char>('A' + (rest - 1) % 26));
    return letters + std::to_string(row);
}

CStringList CExcelFilePreviewParser::ReadTexts(sheet::Worksheet& sheet, int row, int firstColumn, int lastColumn,
                                               bool keepPlaces) const
{
    CStringList texts;
    // No cell lies beyond the sheet's last column, so a wider request ends there.
    lastColumn = std::min(lastColumn, kLastSheetColumn);
    for (int column = firstColumn; column <= lastColumn; ++column) {
        try {
            texts.push_back(VariantText(CellRangeAt(sheet, row, column)->Text()));
        } catch (const sheet::AutomationError&) {
            if (keepPlaces)
                texts.emplace_back();
        }
    }
    return texts;
}

int CExcelFilePreviewParser::ReadRowCells(int row, int firstColumn, int lastColumn, CStringList& cells)
{
    cells.clear();
    if (row < 1 || firstColumn < 0 || lastColumn < 0 || lastColumn < firstColumn)
        return 0;
    auto sheet = ReachSheet();
    if (!sheet)
        return 0;
    cells = ReadTexts(*sheet, row, firstColumn, lastColumn, false);
    return 1;
}

int CExcelFilePreviewParser::ReadDateTimeCells(int row, int column, int n, std::vector<sheet::Variant>& cells,
                                               bool asText)
{
    auto sheet = ReachSheet();
    if (!sheet || n < 0)
        return 0;
    cells.assign(static_cast<size_t>(n), sheet::Variant());
    for (int k = 0; k < n; ++k) {
        try {
            const int cellColumn = column > kLastSheetColumn - k ? kLastSheetColumn + 1 : column + k;
            auto range = CellRangeAt(*sheet, row, cellColumn);
            cells[static_cast<size_t>(k)] = (n == 1 && !asText) ? range->Value2() : range->Text();
        } catch (const sheet::AutomationError&) {
            CloseWorkbook();
            return 0;
        }
    }
    return 1;
}

// ---------------------------------------------------------------------------------------------
// Time stamps

namespace {

using sys::DateFormat;
using sys::DateTimeFields;

bool TakeTimeOfDay(const COleDateTime& value, DateTimeFields& time)
{
    int year, month, day;
    return value.GetFields(year, month, day, time.hour, time.minute, time.second);
}

bool TakeDate(const COleDateTime& value, DateTimeFields& date)
{
    int hour, minute, second;
    return value.GetFields(date.year, date.month, date.day, hour, minute, second);
}

COleDateTime Combine(const DateTimeFields& date, const DateTimeFields& time)
{
    return COleDateTime(date.year, date.month, date.day, time.hour, time.minute, time.second);
}

COleDateTime InvalidDateTime()
{
    COleDateTime value;
    value.SetStatus(COleDateTime::invalid);
    return value;
}

// The W cells' texts each followed by a blank, trimmed.
CString JoinCellTexts(const std::vector<sheet::Variant>& cells)
{
    CString joined;
    for (const sheet::Variant& cell : cells)
        joined += VariantText(cell) + " ";
    return text::Trim(joined);
}

// One date or time for all rows, the other half from the row's cells.
struct RowTimeParts {
    const std::vector<sheet::Variant>& cells;
    const CString& joined;
    bool useFormat;
};

// `text` read by `format` from the fields `start` into `fields`, which stay as they were when the
// text does not read.
bool ReadFields(const CString& text, const CString& format, DateFormat::Reads reads, DateTimeFields start,
                DateTimeFields& fields)
{
    if (!DateFormat(format, reads).Read(text, start))
        return false;
    fields = start;
    return true;
}

// The two halves of a stamp: each is read from a text by its format, or taken from a date-time.
struct DateHalf {
    static constexpr DateReading kGlobalReading = DateReading::DateOnly;
    // Year, month and day from the text, starting at 1 January of the year 100.
    static bool Parse(const CString& text, const CString& format, DateTimeFields& date)
    {
        return ReadFields(text, format, DateFormat::Reads::Date, {100, 1, 1, 0, 0, 0}, date);
    }
    static bool Take(const COleDateTime& value, DateTimeFields& date) { return TakeDate(value, date); }
    static COleDateTime With(const DateTimeFields& date, const DateTimeFields& time) { return Combine(date, time); }
};

struct TimeHalf {
    static constexpr DateReading kGlobalReading = DateReading::TimeOnly;
    // Hour, minute and second from the text; those it does not reach keep the values passed in.
    static bool Parse(const CString& text, const CString& format, DateTimeFields& time)
    {
        return ReadFields(text, format, DateFormat::Reads::Time, time, time);
    }
    static bool Take(const COleDateTime& value, DateTimeFields& time) { return TakeTimeOfDay(value, time); }
    static COleDateTime With(const DateTimeFields& time, const DateTimeFields& date) { return Combine(date, time); }
};

// `GlobalHalf` is one text for all rows (`globalText`); `RowHalf` comes from the row's cells, read by
// `rowFormat` when the row is taken as text. False when the row holds no stamp; an unreadable global
// half gives an invalid stamp instead, so the row still shows.
template <typename GlobalHalf, typename RowHalf>
bool GlobalWithRowHalf(const RowTimeParts& row, const CString& globalText, const CString& rowFormat,
                       COleDateTime& stamp)
{
    COleDateTime global;
    const bool globalRead = ReadDateText(globalText, GlobalHalf::kGlobalReading, global);
    DateTimeFields globalFields;
    DateTimeFields rowFields;
    if (row.useFormat) {
        if (!RowHalf::Parse(row.joined, rowFormat, rowFields))
            return false;
        stamp = globalRead && GlobalHalf::Take(global, globalFields) ? GlobalHalf::With(globalFields, rowFields)
                                                                     : InvalidDateTime();
        return true;
    }
    if (row.cells.empty() || row.cells.front().IsEmpty() || !globalRead || !GlobalHalf::Take(global, globalFields))
        return false;
    COleDateTime cell;
    stamp = VariantToDate(row.cells.front(), cell) && RowHalf::Take(cell, rowFields)
                ? GlobalHalf::With(globalFields, rowFields)
                : InvalidDateTime();
    return true;
}

} // namespace

int CExcelFilePreviewParser::ReadRowDateTime(int row, CString& stamp)
{
    if (!m_pSpecification)
        return 0;
    const CTimeDescription& td = m_pSpecification->m_TimeDesc;
    const int width = m_pSpecification->CountFormatColumns(1);
    const int column = m_pSpecification->GetDateTimeColumn();
    const bool asText = td.m_bUseDTFormat == 1 || td.m_bUseTFormat == 1 || td.m_bUseDFormat == 1;

    std::vector<sheet::Variant> cells;
    if (!ReadDateTimeCells(row, column, width, cells, asText))
        return 0;
    CString joined;
    if (asText) {
        joined = JoinCellTexts(cells);
        if (joined.empty())
            return 0;
    }

    COleDateTime value;
    switch (td.m_nDateTimeOption) {
    case 0:
        if (td.m_bUseDTFormat == 1) {
            DateTimeFields fields;
            if (!DateFormat(td.m_strDateTimeFormat).Read(joined, fields))
                return 0;
            value.SetDateTime(fields.year, fields.month, fields.day, fields.hour, fields.minute, fields.second);
        } else if (cells.empty() || cells.front().IsEmpty() || !VariantToDate(cells.front(), value)) {
            return 0;
        }
        break;
    case 1:
        if (!GlobalWithRowHalf<DateHalf, TimeHalf>({cells, joined, td.m_bUseTFormat == 1}, td.m_strGlobalDate,
                                                    td.m_strTimeFormat, value))
            return 0;
        break;
    case 2:
        if (!GlobalWithRowHalf<TimeHalf, DateHalf>({cells, joined, td.m_bUseDFormat == 1}, td.m_strGlobalTime,
                                                    td.m_strDateFormat, value))
            return 0;
        break;
    default:
        return 0;
    }
    stamp = value.Format(kStampFormat);
    return 1;
}

// ---------------------------------------------------------------------------------------------
// Items

bool CExcelFilePreviewParser::BoundFileAndTemplate() const
{
    return m_pSpecification && sys::FileExists(m_strFile);
}

bool CExcelFilePreviewParser::IsDateTimeCell(int index, int firstUsedColumn) const
{
    // Wide arithmetic: the column comes from a template file and may be any number.
    const long long first = static_cast<long long>(m_pSpecification->GetDateTimeColumn()) - firstUsedColumn;
    const long long width = m_pSpecification->CountFormatColumns(1);
    return index >= first && index <= first + width - 1;
}

int CExcelFilePreviewParser::GetItemCount(int& count)
{
    if (!m_pSpecification)
        return 0;
    const int width = m_pSpecification->CountFormatColumns(1);
    if (m_nUsedColumns == -1 && CountUsedColumns(m_nUsedColumns) && m_nUsedColumns <= 1)
        return 0;
    if (m_nUsedColumns > width)
        count = m_nUsedColumns - width;
    return 1;
}

int CExcelFilePreviewParser::GetItemNames(CStringList& names)
{
    if (!BoundFileAndTemplate())
        return 0;
    int count = 0;
    if (!GetItemCount(count))
        return 0;
    const CDataDescription& dd = m_pSpecification->m_DataDesc;
    if (dd.m_nItemTitleOption == 1) {
        if (static_cast<size_t>(count) > dd.m_vecItemDefs.size()) {
            for (int i = 1; i <= count; ++i)
                names.push_back(text::Format("Item%d", i));
        } else {
            for (int i = 0; i < count; ++i)
                names.push_back(dd.m_vecItemDefs[static_cast<size_t>(i)].m_strTitle);
        }
        return 1;
    }
    if (dd.m_nItemTitleOption != 0)
        return 0;

    return ReadItemCells(dd.m_nItemDescriptionRow, [&names](size_t index, const CString& cell) {
        names.push_back(cell.empty() ? text::Format("Item%d", static_cast<int>(index) + 1) : cell);
        return true;
    });
}

int CExcelFilePreviewParser::ReadItemCells(int row, const std::function<bool(size_t, const CString&)>& take)
{
    int columns = 0;
    CountUsedColumns(columns);
    int first = 1;
    if (!GetFirstUsedColumn(first))
        first = 1;
    CStringList cells;
    if (!ReadRowCells(row, first, first + columns - 1, cells))
        return 0;
    for (size_t i = 0; i < cells.size(); ++i) {
        if (IsDateTimeCell(static_cast<int>(i), first))
            continue;
        if (!take(i, cells[i]))
            return 0;
    }
    return 1;
}

int CExcelFilePreviewParser::ReadHeaderRow(int row, CString (*extract)(const CString&), int messageId,
                                           CStringList& values)
{
    return ReadItemCells(row, [&](size_t, const CString& cell) {
        CString value = extract(cell);
        if (value.empty())
            return Refuse(messageId, row) != 0;
        values.push_back(std::move(value));
        return true;
    });
}

int CExcelFilePreviewParser::ReadItemDescriptions(int option, const CString& global, int row,
                                                  CString (*extract)(const CString&), int messageId,
                                                  CString CItemDefinition::*field, CStringList& values)
{
    if (!BoundFileAndTemplate())
        return 0;
    int count = 0;
    GetItemCount(count);
    switch (option) {
    case 0:
        values.insert(values.end(), static_cast<size_t>(std::max(count, 0)), global);
        return 1;
    case 1:
        return ReadHeaderRow(row, extract, messageId, values);
    case 2:
        for (const CItemDefinition& definition : m_pSpecification->m_DataDesc.m_vecItemDefs)
            values.push_back(definition.*field);
        return 1;
    default:
        return 0;
    }
}

int CExcelFilePreviewParser::GetItemTypes(CStringList& types)
{
    if (!m_pSpecification)
        return 0;
    const CDataDescription& dd = m_pSpecification->m_DataDesc;
    return ReadItemDescriptions(dd.m_nUnitTypeOption, dd.m_strGlobalUnitType, dd.m_nUnitTypeRow, &TextBeforeBracket,
                                res::IDS_NO_ITEM_TYPE, &CItemDefinition::m_strType, types);
}

int CExcelFilePreviewParser::GetUnits(CStringList& units)
{
    if (!m_pSpecification)
        return 0;
    const CDataDescription& dd = m_pSpecification->m_DataDesc;
    return ReadItemDescriptions(dd.m_nUnitOption, dd.m_strGlobalUnit, dd.m_nUnitRow, &TextInBrackets,
                                res::IDS_NO_UNIT_TYPE, &CItemDefinition::m_strUnit, units);
}

int CExcelFilePreviewParser::GetValueTypes(CStringList& valueTypes)
{
    if (!m_pSpecification)
        return 0;
    const CDataDescription& dd = m_pSpecification->m_DataDesc;
    return ReadItemDescriptions(dd.m_nValueTypeOption, dd.m_strGlobalValueType, dd.m_nValueTypeRow, &TextAfterColon,
                                res::IDS_NO_VALUE_TYPE, &CItemDefinition::m_strValueType, valueTypes);
}

// ---------------------------------------------------------------------------------------------
// Parsing

bool CExcelFilePreviewParser::BeginReading(const CString& path)
{
    const CString file = path.empty() ? m_strFile : path;
    if (!m_dispApplication)
        return Fail(file, 0, "the spreadsheet application is not available");
    if (!sys::FileExists(file))
        return Fail(file, 0, "the file does not exist");
    if (!sys::IsRegularFile(file))
        return Fail(file, 0, "it is not a regular file");
    CString message;
    if (!OpenWorkbook(file, message))
        return false;
    m_vecItemNames.clear();
    m_vecRows.clear();
    m_vecRawLines.clear();
    return true;
}

int CExcelFilePreviewParser::FailParse()
{
    CloseWorkbook();
    if (m_strFailure.empty())
        Fail(m_strFile, 0, "the worksheet cannot be read as the template describes");
    return 0;
}

bool CExcelFilePreviewParser::ReadDeleteValue(sheet::Worksheet& sheet, CString& deleteValue) const
{
    const CDataDescription& dd = m_pSpecification->m_DataDesc;
    if (dd.m_nDeleteValueCheck != 1)
        return false;
    if (dd.m_nDeleteValueRadio != 1) {
        deleteValue = dd.m_strDeleteValue;
        return true;
    }
    const CStringList cell = ReadTexts(sheet, dd.m_nDeleteValueRow, 1, 1, false);
    if (cell.empty())
        return false; // an unreadable delete-value cell deletes nothing
    deleteValue = cell.front();
    return true;
}

int CExcelFilePreviewParser::Parse(const CString& path)
{
    if (!m_pSpecification)
        return Fail(path.empty() ? m_strFile : path, 0, "there is no template to read it with");
    if (!BeginReading(path))
        return 0;

    const CDataDescription& dd = m_pSpecification->m_DataDesc;
    if (!m_dispWorksheets || !CheckSheetIndex(dd.m_nExcelSheet))
        return FailParse();
    std::shared_ptr<sheet::Worksheet> sheet;
    try {
        sheet = Require(m_dispWorksheets->Item(dd.m_nExcelSheet), "Worksheet");
    } catch (const sheet::AutomationError&) {
        return FailParse();
    }
    int columns = 0;
    if (!CountUsedColumns(columns) || columns < 0)
        return FailParse();

    using Getter = int (CExcelFilePreviewParser::*)(CStringList&);
    for (Getter get : {&CExcelFilePreviewParser::GetItemTypes, &CExcelFilePreviewParser::GetUnits,
                       &CExcelFilePreviewParser::GetValueTypes}) {
        CStringList row;
        if (!(this->*get)(row) || row.empty())
            return FailParse();
        row.insert(row.begin(), CString());
        m_vecRows.push_back(std::move(row));
    }
    if (!GetItemNames(m_vecItemNames) || m_vecItemNames.empty())
        return FailParse();
    m_vecItemNames.insert(m_vecItemNames.begin(), "DateTime");

    CString deleteValue;
    const bool deleting = ReadDeleteValue(*sheet, deleteValue);
    int first = 0;
    if (!FirstUsedColumnOf(*sheet, first))
        first = 0;
    const int last = std::min(columns + first - 1, kLastSheetColumn);

    for (int row = 1; row < dd.m_nStartRow && row <= kLastPreviewRow; ++row)
        m_vecRawLines.push_back(ReadTexts(*sheet, row, 1, last, false));

    const long long dateColumn = m_pSpecification->GetDateTimeColumn();
    const long long width = m_pSpecification->CountFormatColumns(1);
    const long long firstValueColumn = dateColumn != first ? first : first + width;
    for (int row = dd.m_nStartRow; row <= kLastPreviewRow; ++row) {
        CString stamp;
        if (!ReadRowDateTime(row, stamp))
            break; // the first row without a readable time stamp ends the data
        ui::Row dataRow {stamp};
        ui::Row rawRow = ReadTexts(*sheet, row, 1, last, true);
        for (int x = 1; x <= last; ++x) {
            const bool isDateTime = x >= dateColumn && x <= dateColumn + width - 1;
            if (x < firstValueColumn || isDateTime)
                continue;
            const CString& cell = rawRow[static_cast<size_t>(x - 1)];
            dataRow.push_back(deleting && text::EqualsNoCase(cell, deleteValue) ? CString() : cell);
        }
        m_vecRows.push_back(std::move(dataRow));
        m_vecRawLines.push_back(std::move(rawRow));
    }
    CloseWorkbook();
    return 1;
}

int CExcelFilePreviewParser::ReadRawLines(const CString& path)
{
    if (!BeginReading(path))
        return 0;
    auto sheet = ReachSheet(true);
    if (!sheet)
        return FailParse();
    int columns = 1;
    CountUsedColumnsOf(*sheet, columns);
    int first = 1;
    FirstUsedColumnOf(*sheet, first);
    for (int row = 1; row <= kLastPreviewRow; ++row)
        m_vecRawLines.push_back(ReadTexts(*sheet, row, 1, std::min(columns + first - 1, kLastSheetColumn), false));
    CloseWorkbook();
    return 1;
}

// ---------------------------------------------------------------------------------------------
// Cell values

CString VariantText(const sheet::Variant& value)
{
    switch (value.type) {
    case sheet::Variant::Text:
    case sheet::Variant::Error:
        return value.text;
    case sheet::Variant::Number:
        return text::Format("%.15g", value.number);
    case sheet::Variant::Boolean:
        return value.number != 0.0 ? "TRUE" : "FALSE";
    case sheet::Variant::Empty:
    case sheet::Variant::Array:
        break;
    }
    return CString();
}

namespace {

bool IsDigit(char c) { return c >= '0' && c <= '9'; }

// A run of 1 to 4 digits and nothing else.
bool ReadNumber(const CString& piece, int& value)
{
    if (piece.empty() || piece.size() > 4 || !std::all_of(piece.begin(), piece.end(), IsDigit))
        return false;
    value = text::AtoI(piece);
    return true;
}

CStringList SplitAt(const CString& text, char separator)
{
    CStringList pieces;
    size_t start = 0;
    for (size_t at; (at = text.find(separator, start)) != CString::npos; start = at + 1)
        pieces.push_back(text.substr(start, at - start));
    pieces.push_back(text.substr(start));
    return pieces;
}

// Two-digit years fall in 1930..2029, as automation places them.
int WidenYear(int year, size_t digits)
{
    if (digits > 2)
        return year;
    return year < 30 ? 2000 + year : 1900 + year;
}

bool ReadDatePart(const CString& piece, sys::DateTimeFields& date)
{
    const size_t separatorAt = piece.find_first_of("-/.");
    if (separatorAt == CString::npos)
        return false;
    const char separator = piece[separatorAt];
    const CStringList parts = SplitAt(piece, separator);
    int numbers[3];
    if (parts.size() != 3)
        return false;
    for (int i = 0; i < 3; ++i)
        if (!ReadNumber(parts[static_cast<size_t>(i)], numbers[i]))
            return false;
    if (parts[0].size() >= 3) {
        date = {numbers[0], numbers[1], numbers[2]};
    } else if (separator == '/') {
        date = {WidenYear(numbers[2], parts[2].size()), numbers[0], numbers[1]};
    } else {
        date = {WidenYear(numbers[2], parts[2].size()), numbers[1], numbers[0]};
    }
    return IsValidCalendarDate(date.year, date.month, date.day);
}

// "10:00", "10:00:00" or "10:00:00.25" (the fraction is dropped), 12-hour when `meridiem` is 'A' or 'P'.
bool ReadTimePart(const CString& piece, char meridiem, sys::DateTimeFields& time)
{
    CString clock = piece;
    const size_t fractionAt = clock.find('.');
    if (fractionAt != CString::npos) {
        const CString fraction = clock.substr(fractionAt + 1);
        if (fraction.empty() || !std::all_of(fraction.begin(), fraction.end(), IsDigit))
            return false;
        clock.resize(fractionAt);
    }
    const CStringList parts = SplitAt(clock, ':');
    if (parts.size() < 2 || parts.size() > 3 || parts[0].size() > 2 || parts[1].size() != 2)
        return false;
    if (parts.size() == 3 && parts[2].size() != 2)
        return false;
    if (fractionAt != CString::npos && parts.size() != 3)
        return false;
    time = sys::DateTimeFields();
    if (!ReadNumber(parts[0], time.hour) || !ReadNumber(parts[1], time.minute))
        return false;
    if (parts.size() == 3 && !ReadNumber(parts[2], time.second))
        return false;
    if (meridiem != 0) {
        if (time.hour < 1 || time.hour > 12)
            return false;
        time.hour = time.hour % 12 + (meridiem == 'P' ? 12 : 0);
    }
    return time.hour <= 23 && time.minute <= 59 && time.second <= 59;
}

// Removes a trailing "AM" or "PM" and gives 'A' or 'P'; 0 when there is none.
char TakeMeridiem(CString& text)
{
    if (text.size() < 2)
        return 0;
    const CString tail = text::ToLower(text.substr(text.size() - 2));
    if (tail != "am" && tail != "pm")
        return 0;
    text = text::Trim(text.substr(0, text.size() - 2));
    return tail == "am" ? 'A' : 'P';
}

// Splits "date time", "dateTtime", "date" or "time" into its two parts.
bool SplitDateAndTime(const CString& text, CString& datePart, CString& timePart)
{
    size_t gap = text.find(' ');
    if (gap == CString::npos) {
        const size_t t = text.find('T');
        if (t != CString::npos && t > 0 && t + 1 < text.size() && IsDigit(text[t - 1]) && IsDigit(text[t + 1]))
            gap = t;
    }
    if (gap == CString::npos) {
        (text.find(':') != CString::npos ? timePart : datePart) = text;
        return true;
    }
    datePart = text.substr(0, gap);
    timePart = text::Trim(text.substr(gap + 1));
    return !datePart.empty() && timePart.find(' ') == CString::npos && timePart.find(':') != CString::npos;
}

} // namespace

bool ReadDateText(const CString& input, DateReading reading, COleDateTime& value)
{
    CString text = text::Trim(input);
    const char meridiem = TakeMeridiem(text);
    CString datePart, timePart;
    if (text.empty() || !SplitDateAndTime(text, datePart, timePart))
        return false;
    if (meridiem != 0 && timePart.empty())
        return false;
    // A text without a date lies on day 0 of the automation calendar.
    sys::DateTimeFields date{1899, 12, 30, 0, 0, 0};
    sys::DateTimeFields time{1899, 12, 30, 0, 0, 0};
    if (!datePart.empty() && !ReadDatePart(datePart, date))
        return false;
    if (!timePart.empty() && !ReadTimePart(timePart, meridiem, time))
        return false;
    if (reading == DateReading::DateOnly)
        time.hour = time.minute = time.second = 0;
    if (reading == DateReading::TimeOnly)
        date = {1899, 12, 30};
    value = COleDateTime(date.year, date.month, date.day, time.hour, time.minute, time.second);
    return value.IsValid();
}

bool VariantToDate(const sheet::Variant& value, COleDateTime& date)
{
    switch (value.type) {
    case sheet::Variant::Number:
        date = COleDateTime(value.number);
        return date.IsValid();
    case sheet::Variant::Boolean:
        // Automation holds true as -1.
        date = COleDateTime(value.number != 0.0 ? -1.0 : 0.0);
        return true;
    case sheet::Variant::Text:
        return ReadDateText(value.text, DateReading::DateTime, date);
    case sheet::Variant::Empty:
    case sheet::Variant::Error:
    case sheet::Variant::Array:
        break;
    }
    return false;
}
