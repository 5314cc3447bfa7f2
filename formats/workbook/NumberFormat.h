#pragma once
// What a sheet displays for a cell: its value rendered through the cell's number format code
// ("General", "0.00", "#,##0", "0%", "0.00E+00", "@", "yyyy/mm/dd hh:mm:ss", up to four sections
// positive;negative;zero;text). Rendering assumes a column wide enough for the text.
#include "formats/workbook/CellValue.h"

#include <string>
#include <string_view>
#include <vector>

namespace sheet {

namespace format_detail {
enum class Kind {
    Literal, Digit, Point, Comma, Percent, Exponent, General, TextAt,
    Year, Month, Day, Hour, Minute, Second, SubSecond, AmPm, ElapsedHours, ElapsedMinutes, ElapsedSeconds
};
struct Token {
    Kind kind = Kind::Literal;
    std::string text;  // literal text; the placeholder character for Digit; "AM/PM" or "A/P"
    int width = 1;     // letters in a date/time run, digits after the point for SubSecond
    bool plus = false; // Exponent written "E+"
};
struct Condition {
    std::string op; // "<", "<=", ">", ">=", "=", "<>"; empty when the section has none
    double operand = 0.0;
    bool Holds(double value) const;
};
struct Section {
    std::vector<Token> tokens;
    Condition condition;
    bool isDateTime = false;
    bool hasAmPm = false;
};
} // namespace format_detail

class NumberFormat {
public:
    NumberFormat();                         // General
    explicit NumberFormat(std::string_view code);

    std::string Render(const Variant& value) const;
    std::string RenderNumber(double value) const;
    std::string RenderText(const std::string& text) const;

    // True when numbers shown with this format read as dates or times.
    bool IsDateTime() const;
    const std::string& Code() const { return m_code; }

    // The code behind a built-in format id (0-49); "General" for ids without one.
    static std::string BuiltinCode(int id);

private:
    const format_detail::Section* SectionFor(double value, bool& prefixMinus, double& shown) const;

    std::string m_code;
    std::vector<format_detail::Section> m_sections; // numeric sections (at most three)
    format_detail::Section m_textSection;
    bool m_hasTextSection = false;
};

// A number as the General format shows it: at most 11 characters besides the sign, switching
// to scientific notation for very large or very small magnitudes.
std::string FormatGeneral(double value);

} // namespace sheet
