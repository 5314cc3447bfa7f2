#pragma once
// The spreadsheet application the Excel parser drives: the Application / Workbooks / Workbook /
// Worksheets / Worksheet / Range members it calls, in-process. Failures surface as
// AutomationError, the way automation errors reach a caller, so the parser's catching works alike.
#include "formats/workbook/CellValue.h"

#include <memory>
#include <string>

namespace sheet {

class CellRange {
public:
    virtual ~CellRange() = default;
    // The displayed text; for several cells their common text, or Empty (null) when they differ.
    virtual Variant Text() const = 0;
    virtual Variant Value2() const = 0; // raw values; an Array for more than one cell
    virtual int Count() const = 0;      // number of cells
    virtual int Column() const = 0;     // first column, from 1
    virtual int Row() const = 0;        // first row, from 1
    virtual int RowCount() const = 0;    // Rows.Count: the number of rows
    virtual int ColumnCount() const = 0; // Columns.Count: the number of columns
};

class Worksheet {
public:
    virtual ~Worksheet() = default;
    // The range of one cell ("B3") or of the block between two cells.
    virtual std::shared_ptr<CellRange> Range(const std::string& cell, const std::string& otherCell = std::string()) = 0;
    virtual std::shared_ptr<CellRange> UsedRange() = 0;
};

class Worksheets {
public:
    virtual ~Worksheets() = default;
    virtual int Count() = 0;
    virtual std::shared_ptr<Worksheet> Item(int number) = 0; // from 1
};

class Workbook {
public:
    virtual ~Workbook() = default;
    virtual void Close(bool saveChanges) = 0;
    virtual std::shared_ptr<sheet::Worksheets> Worksheets() = 0;
};

class Workbooks {
public:
    virtual ~Workbooks() = default;
    virtual std::shared_ptr<Workbook> Open(const std::string& path) = 0;
};

// The sheet functions the application offers to its callers.
class WorksheetFunction {
public:
    virtual ~WorksheetFunction() = default;
    // The number of cells of `range` that hold a value (an empty text counts, a blank cell not),
    // found without handing out the values.
    virtual double CountA(const std::shared_ptr<CellRange>& range) = 0;
};

class Application {
public:
    virtual ~Application() = default;
    virtual void Visible(bool visible) = 0;
    virtual std::shared_ptr<sheet::Workbooks> Workbooks() = 0;
    virtual std::shared_ptr<sheet::WorksheetFunction> WorksheetFunction() = 0;
    virtual std::string Version() = 0; // such as "16.0"
    virtual void Quit() = 0;
};

// Starts the application; null when it is absent (see VELMORA_SPREADSHEET in docs/spreadsheet.md).
std::shared_ptr<Application> CreateApplication();

} // namespace sheet
