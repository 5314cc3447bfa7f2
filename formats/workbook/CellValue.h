#pragma once
// A cell's value as the workbook readers hand it and the automation members return it, and the
// error both give up with.
#include <stdexcept>
#include <string>
#include <vector>

namespace sheet {

class AutomationError : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

// A cell value or a block of them, as Value2 and Text give it.
struct Variant {
    enum Type { Empty, Number, Text, Boolean, Error, Array };
    Type type = Empty;
    double number = 0.0;   // Number; also Boolean (0/1)
    std::string text;      // Text; the error text ("#N/A", ...) for Error
    // Array: rows x columns, row-major, indexed from 1 by At().
    int rows = 0;
    int columns = 0;
    std::vector<Variant> cells;

    const Variant& At(int row, int column) const { return cells[static_cast<size_t>((row - 1) * columns + (column - 1))]; }
    bool IsEmpty() const { return type == Empty; }
};

} // namespace sheet
