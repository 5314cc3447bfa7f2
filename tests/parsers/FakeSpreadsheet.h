#pragma once
// An in-memory spreadsheet application for the parser tests: workbooks are registered by path, cells
// hold a raw value and a displayed text, and every call the parser makes is logged.
#include "platform/spreadsheet/Spreadsheet.h"

#include <map>
#include <set>
#include <string>
#include <utility>
#include <vector>

namespace fake {

struct Cell {
    sheet::Variant value;
    std::string text; // what the sheet displays
};

inline sheet::Variant Number(double n)
{
    sheet::Variant v;
    v.type = sheet::Variant::Number;
    v.number = n;
    return v;
}

inline sheet::Variant Text(std::string s)
{
    sheet::Variant v;
    v.type = sheet::Variant::Text;
    v.text = std::move(s);
    return v;
}

// "AB5" -> column 28, row 5; false for anything else.
bool ParseAddress(const std::string& address, int& row, int& column);

class Sheet : public sheet::Worksheet {
public:
    // A text cell showing its own text.
    void Put(const std::string& address, const std::string& textValue);
    // A number cell shown as `display`.
    void Put(const std::string& address, double number, const std::string& display);
    // A cell holding the empty text: it has a value, yet shows nothing.
    void PutEmptyText(const std::string& address);

    std::shared_ptr<sheet::CellRange> Range(const std::string& cell, const std::string& otherCell) override;
    std::shared_ptr<sheet::CellRange> UsedRange() override;

    std::map<std::pair<int, int>, Cell> cells; // (row, column)
    std::set<std::string> failingAddresses;     // Range() raises for these
    std::vector<std::string>* log = nullptr;
};

class Workbook : public sheet::Workbook, public sheet::Worksheets, public std::enable_shared_from_this<Workbook> {
public:
    void Close(bool saveChanges) override;
    std::shared_ptr<sheet::Worksheets> Worksheets() override { return shared_from_this(); }
    int Count() override;
    std::shared_ptr<sheet::Worksheet> Item(int number) override;

    std::vector<std::shared_ptr<Sheet>> sheets;
    bool countFails = false;
    std::vector<std::string>* log = nullptr;
};

class Functions : public sheet::WorksheetFunction {
public:
    double CountA(const std::shared_ptr<sheet::CellRange>& range) override;
};

class Application : public sheet::Application, public sheet::Workbooks, public std::enable_shared_from_this<Application> {
public:
    // A workbook the application opens for `path` (the file must exist too, the parser checks).
    Workbook& AddWorkbook(const std::string& path, int sheetCount = 1);

    void Visible(bool visible) override;
    std::shared_ptr<sheet::Workbooks> Workbooks() override { return shared_from_this(); }
    std::shared_ptr<sheet::WorksheetFunction> WorksheetFunction() override { return std::make_shared<Functions>(); }
    std::string Version() override;
    void Quit() override;
    std::shared_ptr<sheet::Workbook> Open(const std::string& path) override;

    std::map<std::string, std::shared_ptr<Workbook>> books;
    std::string version = "16.0";
    bool versionFails = false;
    std::vector<std::string> log;
};

} // namespace fake
