#pragma once
// The text of the small parts of a one-sheet .xlsx package, and the XML text of cell contents.
#include <string>
#include <string_view>
#include <vector>

namespace sheet::package {

// `text` as XML character data, safe inside elements and quoted attributes. Text that is not UTF-8
// is read as Windows-1252 (text::ToUtf8); control characters XML 1.0 cannot carry become blanks.
std::string XmlText(std::string_view text);

// "A", "B", ..., "Z", "AA", ... for columns from 1.
std::string ColumnName(unsigned column);

std::string ContentTypes();
std::string PackageRelationships();
std::string CoreProperties(const std::string& title);
std::string AppProperties();
// One sheet, named `sheetName`.
std::string Workbook(std::string_view sheetName);
std::string WorkbookRelationships();
// Cell style 1 is the date format `dateFormat` (number format 164).
std::string Styles(std::string_view dateFormat);
// `strings` in index order; `references` counts the cells that use them.
std::string SharedStrings(const std::vector<std::string>& strings, size_t references);

// The opening of the worksheet up to and including <sheetData>, with the used range `lastCell`
// (e.g. "K1002"). The text has the same length for every `lastCell`, so a placeholder can be
// replaced once the row count is known.
std::string SheetHead(const std::string& lastCell);
std::string SheetTail();

} // namespace sheet::package
