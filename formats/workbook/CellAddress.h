#pragma once
// A1-style cell addresses ("B3", "$AB$12"), columns A..XFD.
#include <optional>
#include <string>
#include <string_view>

namespace sheet {

struct CellPosition {
    int row = 0;    // from 1
    int column = 0; // from 1
};

// The position an address names, or nothing when it is not an address of the sheet's grid.
std::optional<CellPosition> ParseCellAddress(std::string_view address, int maxRows = 1048576, int maxColumns = 16384);

std::string ColumnLetters(int column);

} // namespace sheet
