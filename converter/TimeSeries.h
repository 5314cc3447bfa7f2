#pragma once
// The data every reader produces and every writer consumes: a header describing the items and a
// stream of rows, each a time stamp and one value per item.
#include <cmath>
#include <cstdint>
#include <limits>
#include <string>
#include <vector>

namespace converter {

// A time stamp: whole seconds since 1970-01-01 00:00:00, read as local calendar time without any
// zone shift (the files carry no zone).
using Stamp = std::int64_t;

// A value that is not there: the ASCII delete value, an empty field, an rbx0 delete value.
inline constexpr double kMissing = std::numeric_limits<double>::quiet_NaN();
inline bool IsMissing(double value) { return std::isnan(value); }

struct ItemInfo {
    std::string name;
    std::string type;      // item type name (or key as text) as the input gives it
    std::string unit;      // unit name or abbreviation as the input gives it
    std::string valueType; // "Instantaneous", "Accumulated", ...
};

struct SeriesHeader {
    std::string timeTitle = "Date/time";
    std::vector<ItemInfo> items;
};

struct Row {
    Stamp stamp = 0;
    std::vector<double> values; // one per item of the header, kMissing where there is none
};

} // namespace converter
