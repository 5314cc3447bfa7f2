#include "formats/workbook/CellAddress.h"

#include <cctype>

namespace sheet {

std::optional<CellPosition> ParseCellAddress(std::string_view address, int maxRows, int maxColumns)
{
    size_t at = 0;
    auto skipDollar = [&] {
        if (at < address.size() && address[at] == '$')
            ++at;
    };
    skipDollar();
    long long column = 0;
    size_t letters = 0;
    while (at < address.size() && std::isalpha(static_cast<unsigned char>(address[at])) && letters < 4) {
        column = column * 26 + (std::toupper(static_cast<unsigned char>(address[at])) - 'A' + 1);
        ++at, ++letters;
    }
    skipDollar();
    long long row = 0;
    size_t digits = 0;
    while (at < address.size() && std::isdigit(static_cast<unsigned char>(address[at])) && digits < 8) {
        row = row * 10 + (address[at] - '0');
        ++at, ++digits;
    }
    if (letters == 0 || digits == 0 || at != address.size())
        return std::nullopt;
    if (row < 1 || row > maxRows || column < 1 || column > maxColumns)
        return std::nullopt;
    return CellPosition{static_cast<int>(row), static_cast<int>(column)};
}

std::string ColumnLetters(int column)
{
    std::string letters;
    while (column > 0) {
        int digit = (column - 1) % 26;
        letters.insert(letters.begin(), static_cast<char>('A' + digit));
        column = (column - 1) / 26;
    }
    return letters;
}

} // namespace sheet
