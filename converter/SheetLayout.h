#pragma once
// The one-sheet layout both workbook writers (.xlsx and .xls) give their output, the one a new
// Excel template reads with its defaults:
//   row 1  column A empty, then per item "Type[unit]:ValueType"
//   row 2  the date/time title, then the item names (an empty name stays a blank cell)
//   row 3+ a date cell shown as "yyyy/mm/dd hh:mm:ss", then one number per item; a missing or
//          infinite value is a blank cell. A stamp before 1900, which a sheet cannot show as a
//          date, is a text cell "YYYY/MM/DD HH:mm:ss" instead.
#include "converter/TimeSeries.h"

#include <string>

namespace converter::sheet_layout {

inline constexpr const char* kSheetName = "Sheet1";
inline constexpr const char* kStampFormat = "yyyy/mm/dd hh:mm:ss";
inline constexpr int kHeaderRows = 2;

// The row 1 text of an item. The units cell must hold text in brackets, or reading the unit row
// back refuses it: brackets and colons in the parts become blanks, empty parts their defaults.
std::string MetadataText(const ItemInfo& item);

// The row 2 text above the dates.
std::string TimeTitle(const SeriesHeader& header);

} // namespace converter::sheet_layout
