#pragma once
// Reads a worksheet of a workbook through an Excel template by driving the spreadsheet application
// the way a user would: cell texts and values come through its object model, one Range at a time.
#include "parsers/FilePreviewParser.h"
#include "platform/spreadsheet/Spreadsheet.h"
#include "platform/system/OleDateTime.h"
#include "templates/Specification.h"

#include <functional>
#include <memory>

class CExcelFilePreviewParser : public CGeneralFileParser {
public:
    using ApplicationFactory = std::function<std::shared_ptr<sheet::Application>()>;

    // Starts the spreadsheet application; without one every operation fails silently.
    CExcelFilePreviewParser();
    // Starts the application through `startApplication` (tests hand in their own).
    explicit CExcelFilePreviewParser(const ApplicationFactory& startApplication);
    // Closes the open workbook unsaved and ends the application.
    ~CExcelFilePreviewParser() override;

    int Parse(const CString& path) override;
    int GetItemNames(CStringList& names) override;
    int GetItemTypes(CStringList& types) override;
    int GetUnits(CStringList& units) override;
    int GetValueTypes(CStringList& valueTypes) override;
    int GetItemCount(int& count) override;
    // Rebinds only when the path really changes; always forgets the cached column count.
    void SetFile(const CString& path) override;
    int ReadRawLines(const CString& path) override;
    // The number of columns of the sheet's used range holding at least one value.
    virtual int CountUsedColumns(int& count);

    // Opens `path`, closing any workbook open before; on failure `message` says which file.
    int OpenWorkbook(const CString& path, CString& message);
    int CloseWorkbook();

    // 1 when sheet `n` exists; shows message 2321 when it does not.
    int CheckSheetIndex(int n);
    int GetFirstUsedColumn(int& column);
    // "B3" style address; columns run A..Z, AA..ZZ, AAA..XFD. Empty outside the sheet's grid.
    static CString CellAddress(int row, int column);
    // The displayed texts of one row; a cell that cannot be read is left out.
    int ReadRowCells(int row, int firstColumn, int lastColumn, CStringList& cells);
    // `n` cells from (row, column): raw values when one cell is read as a value, else texts.
    int ReadDateTimeCells(int row, int column, int n, std::vector<sheet::Variant>& cells, bool asText);
    // The time stamp of data row `row` as "%Y/%m/%d %H:%M:%S"; 0 when it cannot be read.
    int ReadRowDateTime(int row, CString& stamp);

    bool HasApplication() const { return m_dispApplication != nullptr; }
    bool IsWorkbookOpen() const { return m_dispWorkbook != nullptr; }

    std::shared_ptr<sheet::Application> m_dispApplication;
    std::shared_ptr<sheet::Workbook> m_dispWorkbook;
    std::shared_ptr<sheet::Workbooks> m_dispWorkbooks;
    std::shared_ptr<sheet::Worksheets> m_dispWorksheets;
    int m_nUsedColumns = -1;

private:
    void StartApplication(const ApplicationFactory& startApplication);
    void CloseOpenWorkbook();
    // The template's sheet (sheet 1 without a template when `allowNoTemplate`); null on failure.
    std::shared_ptr<sheet::Worksheet> ReachSheet(bool allowNoTemplate = false);
    int CountUsedColumnsOf(sheet::Worksheet& sheet, int& count) const;
    int FirstUsedColumnOf(sheet::Worksheet& sheet, int& column) const;
    // Texts of (row, first..last); unreadable cells are left out or, with `keepPlaces`, read as "".
    CStringList ReadTexts(sheet::Worksheet& sheet, int row, int firstColumn, int lastColumn, bool keepPlaces) const;
    bool BoundFileAndTemplate() const;
    // True for the cell positions (counted from the first used column) that hold the date/time.
    bool IsDateTimeCell(int index, int firstUsedColumn) const;
    // Reads `row` across the used columns and hands every cell that is not a date/time cell, with its
    // position from the first used column, to `take`; 0 when the row cannot be read or `take` refuses.
    int ReadItemCells(int row, const std::function<bool(size_t index, const CString& cell)>& take);
    // Reads one header row and cuts a value out of every item cell; 0 (after `messageId`) on an empty one.
    int ReadHeaderRow(int row, CString (*extract)(const CString&), int messageId, CStringList& values);
    // The shared body of GetItemTypes, GetUnits and GetValueTypes.
    int ReadItemDescriptions(int option, const CString& global, int row, CString (*extract)(const CString&),
                             int messageId, CString CItemDefinition::*field, CStringList& values);
    // Opens the workbook of `path` (else of the bound file) and forgets the last result.
    bool BeginReading(const CString& path);
    bool ReadDeleteValue(sheet::Worksheet& sheet, CString& deleteValue) const;
    int FailParse();
};

// What a date text is read for: the whole value, its date alone or its time alone.
enum class DateReading { DateTime, DateOnly, TimeOnly };

// Reads a date/time text the way the spreadsheet's automation converts a text to a date. Accepted:
// "2021-05-17", "2021/05/17", "2021.05.17", "5/17/2021" (month first), "17.05.2021" (day first), two-digit
// years (00-29 are 20xx), optionally followed by a blank or "T" and a time "10:00", "10:00:00" or
// "10:00:00.5", with an optional "AM"/"PM"; or a time alone. A time alone lies on 30 December 1899.
bool ReadDateText(const CString& text, DateReading reading, COleDateTime& value);
// Converts a cell value to a date: a number is an OLE date, a text is read by ReadDateText.
bool VariantToDate(const sheet::Variant& value, COleDateTime& date);
// The displayed text a variant stands for.
CString VariantText(const sheet::Variant& value);

// The major version of the installed spreadsheet application, 10 when it cannot be found out.
int GetExcelVersion();
int GetExcelVersion(const CExcelFilePreviewParser::ApplicationFactory& startApplication);
