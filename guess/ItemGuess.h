#pragma once
// What the rows above the data say about the items (names, item types, units, value types, each
// from a row of the file, one value for all items, or written into the template's item
// definitions), which item columns hold numbers, and the missing-value marker of the values.
#include "guess/Sample.h"
#include "guess/TimeGuess.h"
#include "templates/Specification.h"

#include <array>
#include <optional>
#include <vector>

namespace guess {

struct ItemLayout {
    std::vector<size_t> columns; // the item columns, from 0 (workbooks: column - 1)

    int titleOption = 1;         // 0 names from nameRow, 1 from the definitions
    int nameRow = 2;
    std::array<int, 3> options{0, 0, 0}; // item type, unit, value type: 0 one for all, 1 a row, 2 definitions
    std::array<int, 3> rows{1, 1, 1};
    std::vector<CItemDefinition> definitions; // complete, when any option asks for them

    bool deleteInUse = false;
    std::string deleteValue;
    CUIntArray selected; // the items that hold numbers, when some do not; else empty (all)
};

// Reads the items from the rows of `sample` above `time.startRow`, and the values of the data rows.
// Nothing, with `refusal` set, when no item column holds numbers.
std::optional<ItemLayout> GuessItems(const Sample& sample, const TimeLayout& time, const TimeContext& context,
                                     const std::string& decimalSeparator, std::vector<Finding>& findings,
                                     Refusal& refusal);

} // namespace guess
