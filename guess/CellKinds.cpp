#include "guess/CellKinds.h"

#include "guess/StampShape.h"
#include "guess/TextAccess.h"
#include "platform/system/Text.h"

#include <cmath>
#include <cstdlib>

namespace guess {
namespace {

bool IsDigit(char c) { return c >= '0' && c <= '9'; }

// Digits, then optionally `point` and digits; an optional sign first. At least one digit after
// the point when there is one.
bool IsDecimalWith(std::string_view text, char point)
{
    size_t i = 0;
    if (i < text.size() && (text[i] == '-' || text[i] == '+'))
        ++i;
    const size_t intStart = i;
    while (i < text.size() && IsDigit(text[i]))
        ++i;
    const size_t intDigits = i - intStart;
    if (i == text.size() || text[i] != point)
        return false;
    ++i;
    const size_t fracStart = i;
    while (i < text.size() && IsDigit(text[i]))
        ++i;
    if (i == fracStart || intDigits + (i - fracStart) == 0)
        return false;
    if (point == '.' && i < text.size() && (text[i] == 'e' || text[i] == 'E')) {
        ++i;
        if (i < text.size() && (text[i] == '-' || text[i] == '+'))
            ++i;
        const size_t expStart = i;
        while (i < text.size() && IsDigit(text[i]))
            ++i;
        if (i == expStart)
            return false;
    }
    return i == text.size();
}

} // namespace

std::string Trimmed(std::string_view text) { return text::Trim(text); }

ValueKind ValueOf(const SampleCell& cell, std::string_view decimalSeparator, double& value)
{
    if (cell.numberCell) {
        value = cell.number;
        return ValueKind::Number;
    }
    switch (ReadNumber(cell.text, cell.numberCell ? "." : decimalSeparator, value)) {
    case ValueText::Empty: return ValueKind::Empty;
    case ValueText::Number: return ValueKind::Number;
    default: return ValueKind::Text;
    }
}

bool IsCommaDecimal(std::string_view text) { return IsDecimalWith(Trimmed(text), ','); }

bool IsPointDecimal(std::string_view text) { return IsDecimalWith(Trimmed(text), '.'); }

bool LooksTyped(std::string_view text)
{
    const std::string trimmed = Trimmed(text);
    if (trimmed.empty())
        return true;
    double value = 0;
    if (ReadNumber(trimmed, ".", value) == ValueText::Number || IsCommaDecimal(trimmed))
        return true;
    return ShapeOf(trimmed).kind != StampKind::None;
}

bool IsSentinelNumber(std::string_view raw)
{
    const std::string text = Trimmed(raw);
    double value = 0;
    if (ReadNumber(text, ".", value) != ValueText::Number || !std::isfinite(value))
        return false;
    if (value == -32768 || value == -32767)
        return true;
    const std::string_view body = text[0] == '-' || text[0] == '+' ? std::string_view(text).substr(1) : std::string_view(text);
    const size_t e = body.find_first_of("eE");
    if (e != std::string_view::npos) {
        // 1e-35, -1.0E+30: a power of ten far from any measured value.
        const int exponent = std::atoi(std::string(body.substr(e + 1)).c_str());
        const std::string_view mantissa = body.substr(0, e);
        return std::abs(exponent) >= 20 && (mantissa == "1" || mantissa.rfind("1.", 0) == 0) &&
               mantissa.find_first_not_of("1.0") == std::string_view::npos;
    }
    // Nines: -99, -999.9, 9999; a positive one needs four nines or more.
    size_t nines = 0;
    for (char c : body) {
        if (c == '9')
            ++nines;
        else if (c != '.' && c != '0')
            return false;
    }
    const size_t point = body.find('.');
    const std::string_view whole = body.substr(0, point);
    if (whole.empty() || whole.find_first_not_of('9') != std::string_view::npos)
        return false;
    return value < 0 ? whole.size() >= 2 : whole.size() >= 4;
}

} // namespace guess
