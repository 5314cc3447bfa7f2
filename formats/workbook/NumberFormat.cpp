#include "formats/workbook/NumberFormat.h"

#include "platform/system/OleDateTime.h"

#include <algorithm>
#include <array>
#include <cctype>
#include <cmath>
#include <cstdio>
#include <cstdlib>

namespace sheet {

using format_detail::Condition;
using format_detail::Kind;
using format_detail::Section;
using format_detail::Token;

namespace {

constexpr int kGeneralWidth = 11;
const char* const kTooWide = "########";

// ---------------------------------------------------------------------------------------------
// Decimal digits of a double, rounded the way a sheet does: on the decimal digits of the value
// shown to 15 significant digits, so 2.675 with two decimals gives 2.68.

struct DecimalDigits {
    std::string digits; // 15 significant digits, no leading zero (empty for zero)
    int exponent = 0;   // value = d.ddd... x 10^exponent
};

DecimalDigits ToDecimal(double value)
{
    DecimalDigits d;
    value = std::fabs(value);
    if (value == 0.0 || !std::isfinite(value))
        return d;
    char buffer[64];
    std::snprintf(buffer, sizeof buffer, "%.14e", value);
    std::string_view s(buffer);
    size_t e = s.find('e');
    for (size_t i = 0; i < e; ++i)
        if (std::isdigit(static_cast<unsigned char>(s[i])))
            d.digits.push_back(s[i]);
    d.exponent = std::atoi(buffer + e + 1);
    return d;
}

// Keeps `count` leading digits, rounding half up; a carry may lengthen the number by one digit.
void RoundDigits(DecimalDigits& d, int count)
{
    if (count < 0) {
        d.digits.clear();
        return;
    }
    if (static_cast<int>(d.digits.size()) <= count)
        return;
    bool up = d.digits[static_cast<size_t>(count)] >= '5';
    d.digits.resize(static_cast<size_t>(count));
    if (!up) {
        while (!d.digits.empty() && d.digits.back() == '0')
            d.digits.pop_back();
        return;
    }
    int i = count - 1;
    for (; i >= 0; --i) {
        if (d.digits[static_cast<size_t>(i)] == '9') {
            d.digits[static_cast<size_t>(i)] = '0';
        } else {
            ++d.digits[static_cast<size_t>(i)];
            break;
        }
    }
    if (i < 0) {
        d.digits.insert(d.digits.begin(), '1');
        ++d.exponent;
    }
}

// The value rounded to `decimals` places as integer digits (no leading zeros, empty for zero)
// and exactly `decimals` fraction digits.
void FixedDigits(double value, int decimals, std::string& integerPart, std::string& fractionPart)
{
    DecimalDigits d = ToDecimal(value);
    integerPart.clear();
    fractionPart.assign(static_cast<size_t>(decimals), '0');
    if (d.digits.empty())
        return;
    int keep = d.exponent + 1 + decimals;
    if (keep < 0)
        return;
    if (keep == 0) {
        // Only the rounding digit is left: 0.6 with no decimals gives 1.
        if (d.digits[0] >= '5') {
            d.digits = "1";
            d.exponent += 1;
        } else {
            return;
        }
    } else {
        RoundDigits(d, keep);
    }
    std::string all = d.digits;
    int integerCount = d.exponent + 1;
    for (int i = 0; i < integerCount; ++i)
        integerPart.push_back(i < static_cast<int>(all.size()) ? all[static_cast<size_t>(i)] : '0');
    for (int i = 0; i < decimals; ++i) {
        int index = integerCount + i;
        if (index >= 0 && index < static_cast<int>(all.size()))
            fractionPart[static_cast<size_t>(i)] = all[static_cast<size_t>(index)];
    }
}

std::string TrimFractionZeros(std::string integerPart, std::string fractionPart)
{
    while (!fractionPart.empty() && fractionPart.back() == '0')
        fractionPart.pop_back();
    if (integerPart.empty())
        integerPart = "0";
    return fractionPart.empty() ? integerPart : integerPart + "." + fractionPart;
}

std::string ExponentText(int exponent, bool plus, int minDigits)
{
    std::string digits = std::to_string(std::abs(exponent));
    while (static_cast<int>(digits.size()) < minDigits)
        digits.insert(digits.begin(), '0');
    if (exponent < 0)
        return "-" + digits;
    return plus ? "+" + digits : digits;
}

std::string GeneralScientific(const DecimalDigits& value)
{
    DecimalDigits d = value;
    int decimals = std::abs(d.exponent) >= 100 ? 4 : 5;
    RoundDigits(d, decimals + 1);
    std::string mantissa = d.digits.empty() ? "0" : d.digits.substr(0, 1);
    std::string fraction = d.digits.size() > 1 ? d.digits.substr(1) : std::string();
    return TrimFractionZeros(mantissa, fraction) + "E" + ExponentText(d.exponent, true, 2);
}

// ---------------------------------------------------------------------------------------------
// Tokenizing a format code.

bool IsDigitPlaceholder(char c) { return c == '0' || c == '#' || c == '?'; }

size_t RunLength(std::string_view code, size_t at, char letter)
{
    size_t end = at;
    while (end < code.size() && std::tolower(static_cast<unsigned char>(code[end])) == letter)
        ++end;
    return end - at;
}

bool StartsWithNoCase(std::string_view code, size_t at, std::string_view word)
{
    if (code.size() - at < word.size())
        return false;
    for (size_t i = 0; i < word.size(); ++i)
        if (std::tolower(static_cast<unsigned char>(code[at + i])) != std::tolower(static_cast<unsigned char>(word[i])))
            return false;
    return true;
}

void AddLiteral(Section& section, std::string_view text)
{
    if (!section.tokens.empty() && section.tokens.back().kind == Kind::Literal)
        section.tokens.back().text.append(text);
    else
        section.tokens.push_back(Token{Kind::Literal, std::string(text), 1, false});
}

void AddToken(Section& section, Kind kind, std::string text = std::string(), int width = 1)
{
    section.tokens.push_back(Token{kind, std::move(text), width, false});
}

bool ParseCondition(std::string_view body, Condition& condition)
{
    static const std::array<std::string_view, 6> ops = {"<=", ">=", "<>", "<", ">", "="};
    for (std::string_view op : ops) {
        if (body.substr(0, op.size()) == op) {
            std::string number(body.substr(op.size()));
            char* end = nullptr;
            double operand = std::strtod(number.c_str(), &end);
            if (end == number.c_str())
                return false;
            condition.op = std::string(op);
            condition.operand = operand;
            return true;
        }
    }
    return false;
}

// "[...]": elapsed time, a currency/locale tag, a condition, or a colour (ignored).
void AddBracket(Section& section, std::string_view body)
{
    std::string lower;
    for (char c : body)
        lower.push_back(static_cast<char>(std::tolower(static_cast<unsigned char>(c))));
    if (!lower.empty() && lower.find_first_not_of('h') == std::string::npos)
        AddToken(section, Kind::ElapsedHours, {}, static_cast<int>(lower.size()));
    else if (!lower.empty() && lower.find_first_not_of('m') == std::string::npos)
        AddToken(section, Kind::ElapsedMinutes, {}, static_cast<int>(lower.size()));
    else if (!lower.empty() && lower.find_first_not_of('s') == std::string::npos)
        AddToken(section, Kind::ElapsedSeconds, {}, static_cast<int>(lower.size()));
    else if (!body.empty() && body[0] == '$')
        AddLiteral(section, body.substr(1, body.find('-') == std::string_view::npos ? std::string_view::npos : body.find('-') - 1));
    else
        ParseCondition(body, section.condition);
}

bool HasKind(const Section& section, Kind kind)
{
    return std::any_of(section.tokens.begin(), section.tokens.end(), [kind](const Token& t) { return t.kind == kind; });
}

bool IsDateTimeKind(Kind kind)
{
    switch (kind) {
    case Kind::Year: case Kind::Month: case Kind::Day: case Kind::Hour: case Kind::Minute:
    case Kind::Second: case Kind::SubSecond: case Kind::AmPm: case Kind::ElapsedHours:
    case Kind::ElapsedMinutes: case Kind::ElapsedSeconds:
        return true;
    default:
        return false;
    }
}

// An "m" run next to hours or seconds means minutes.
void ResolveMinutes(Section& section)
{
    std::vector<size_t> timeTokens;
    for (size_t i = 0; i < section.tokens.size(); ++i)
        if (IsDateTimeKind(section.tokens[i].kind))
            timeTokens.push_back(i);
    for (size_t k = 0; k < timeTokens.size(); ++k) {
        Token& token = section.tokens[timeTokens[k]];
        if (token.kind != Kind::Month || token.width > 2)
            continue;
        bool afterHours = k > 0 && (section.tokens[timeTokens[k - 1]].kind == Kind::Hour ||
                                    section.tokens[timeTokens[k - 1]].kind == Kind::ElapsedHours);
        bool beforeSeconds = k + 1 < timeTokens.size() && (section.tokens[timeTokens[k + 1]].kind == Kind::Second ||
                                                          section.tokens[timeTokens[k + 1]].kind == Kind::ElapsedSeconds);
        if (afterHours || beforeSeconds)
            token.kind = Kind::Minute;
    }
}

void FinishSection(Section& section)
{
    ResolveMinutes(section);
    section.isDateTime = std::any_of(section.tokens.begin(), section.tokens.end(),
                                     [](const Token& t) { return IsDateTimeKind(t.kind); });
    section.hasAmPm = HasKind(section, Kind::AmPm);
}

// Reads one token at `at`; returns the position after it.
size_t ReadToken(std::string_view code, size_t at, Section& section)
{
    char c = code[at];
    char lower = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    if (c == '"') {
        size_t end = code.find('"', at + 1);
        if (end == std::string_view::npos)
            end = code.size();
        AddLiteral(section, code.substr(at + 1, end - at - 1));
        return std::min(end + 1, code.size());
    }
    if (c == '\\' || c == '_') {
        if (at + 1 < code.size())
            AddLiteral(section, c == '\\' ? code.substr(at + 1, 1) : std::string_view(" "));
        return at + 2;
    }
    if (c == '*')
        return at + 2; // fill character: the column is assumed just wide enough
    if (c == '[') {
        size_t end = code.find(']', at);
        if (end == std::string_view::npos)
            end = code.size();
        AddBracket(section, code.substr(at + 1, end - at - 1));
        return std::min(end + 1, code.size());
    }
    if (StartsWithNoCase(code, at, "General")) {
        AddToken(section, Kind::General);
        return at + 7;
    }
    if (StartsWithNoCase(code, at, "AM/PM")) {
        AddToken(section, Kind::AmPm, std::string(code.substr(at, 5)));
        return at + 5;
    }
    if (StartsWithNoCase(code, at, "A/P")) {
        AddToken(section, Kind::AmPm, std::string(code.substr(at, 3)));
        return at + 3;
    }
    if (IsDigitPlaceholder(c)) {
        AddToken(section, Kind::Digit, std::string(1, c));
        return at + 1;
    }
    if (c == '.') {
        bool afterSeconds = !section.tokens.empty() && (section.tokens.back().kind == Kind::Second ||
                                                        section.tokens.back().kind == Kind::ElapsedSeconds);
        size_t zeros = RunLength(code, at + 1, '0');
        if (afterSeconds && zeros > 0) {
            AddToken(section, Kind::SubSecond, {}, static_cast<int>(std::min<size_t>(zeros, 3)));
            return at + 1 + zeros;
        }
        AddToken(section, Kind::Point);
        return at + 1;
    }
    if (c == ',') {
        AddToken(section, Kind::Comma);
        return at + 1;
    }
    if (c == '%') {
        AddToken(section, Kind::Percent);
        return at + 1;
    }
    if (lower == 'e' && at + 1 < code.size() && (code[at + 1] == '+' || code[at + 1] == '-')) {
        section.tokens.push_back(Token{Kind::Exponent, {}, 1, code[at + 1] == '+'});
        return at + 2;
    }
    if (c == '@') {
        AddToken(section, Kind::TextAt);
        return at + 1;
    }
    static const std::array<std::pair<char, Kind>, 5> dateLetters = {
        std::pair{'y', Kind::Year}, std::pair{'m', Kind::Month}, std::pair{'d', Kind::Day},
        std::pair{'h', Kind::Hour}, std::pair{'s', Kind::Second}};
    for (auto [letter, kind] : dateLetters) {
        if (lower == letter) {
            size_t run = RunLength(code, at, letter);
            AddToken(section, kind, {}, static_cast<int>(run));
            return at + run;
        }
    }
    AddLiteral(section, code.substr(at, 1));
    return at + 1;
}

std::vector<Section> Tokenize(std::string_view code)
{
    std::vector<Section> sections(1);
    size_t at = 0;
    while (at < code.size()) {
        if (code[at] == ';') {
            sections.emplace_back();
            ++at;
            continue;
        }
        at = ReadToken(code, at, sections.back());
    }
    for (Section& section : sections)
        FinishSection(section);
    return sections;
}

// ---------------------------------------------------------------------------------------------
// Numbers through digit placeholders.

struct NumberLayout {
    std::vector<size_t> integerDigits;  // token indexes
    std::vector<size_t> fractionDigits;
    std::vector<size_t> exponentDigits;
    bool grouping = false;
    int thousandsScale = 0;
    int percents = 0;
    int exponentToken = -1;
};

NumberLayout LayoutOf(const Section& section)
{
    NumberLayout layout;
    enum { Integer, Fraction, Exponent } region = Integer;
    std::vector<size_t> commas;
    for (size_t i = 0; i < section.tokens.size(); ++i) {
        const Token& token = section.tokens[i];
        switch (token.kind) {
        case Kind::Digit:
            if (region == Integer)
                layout.integerDigits.push_back(i);
            else if (region == Fraction)
                layout.fractionDigits.push_back(i);
            else
                layout.exponentDigits.push_back(i);
            break;
        case Kind::Point:
            if (region == Integer)
                region = Fraction;
            break;
        case Kind::Exponent:
            region = Exponent;
            layout.exponentToken = static_cast<int>(i);
            break;
        case Kind::Comma:
            if (region != Exponent)
                commas.push_back(i);
            break;
        case Kind::Percent:
            ++layout.percents;
            break;
        default:
            break;
        }
    }
    // A comma between integer placeholders groups thousands; one after the last placeholder
    // (before any exponent) divides by 1000.
    size_t lastInteger = layout.integerDigits.empty() ? 0 : layout.integerDigits.back();
    size_t lastDigit = layout.fractionDigits.empty() ? lastInteger : layout.fractionDigits.back();
    for (size_t comma : commas) {
        if (!layout.integerDigits.empty() && comma < lastInteger && comma > layout.integerDigits.front())
            layout.grouping = true;
        else if ((!layout.integerDigits.empty() || !layout.fractionDigits.empty()) && comma > lastDigit)
            ++layout.thousandsScale;
    }
    return layout;
}

char Filler(char placeholder)
{
    if (placeholder == '0')
        return '0';
    return placeholder == '?' ? ' ' : '\0';
}

// Places the integer digits right-aligned on the placeholders; extra digits go to the first one.
std::vector<std::string> PlaceIntegerDigits(const Section& section, const NumberLayout& layout, const std::string& digits, bool grouping)
{
    size_t count = layout.integerDigits.size();
    std::vector<std::string> out(count);
    // Positions from the right that print a digit (a real one or a '0' filler), for grouping.
    auto emit = [&](std::string& target, char c, size_t fromRight) {
        target.push_back(c);
        if (grouping && fromRight > 0 && fromRight % 3 == 0 && c != ' ')
            target.push_back(',');
    };
    for (size_t k = 0; k < count; ++k) {
        size_t fromRight = count - 1 - k;
        char placeholder = section.tokens[layout.integerDigits[k]].text[0];
        if (k == 0) {
            for (size_t q = digits.size(); q > count; --q)
                emit(out[k], digits[digits.size() - q], q - 1);
        }
        if (fromRight < digits.size()) {
            emit(out[k], digits[digits.size() - 1 - fromRight], fromRight);
        } else if (char f = Filler(placeholder)) {
            if (f == '0')
                emit(out[k], f, fromRight);
            else
                out[k].push_back(f);
        }
    }
    return out;
}

std::vector<std::string> PlaceFractionDigits(const Section& section, const NumberLayout& layout, const std::string& digits)
{
    size_t count = layout.fractionDigits.size();
    std::vector<std::string> out(count);
    bool trailing = true;
    for (size_t k = count; k-- > 0;) {
        char placeholder = section.tokens[layout.fractionDigits[k]].text[0];
        char digit = digits[k];
        if (trailing && digit == '0' && placeholder != '0') {
            if (placeholder == '?')
                out[k] = " ";
            continue;
        }
        trailing = false;
        out[k] = std::string(1, digit);
    }
    return out;
}

std::string PlaceExponentDigits(const Section& section, const NumberLayout& layout, int exponent)
{
    int minimum = 0;
    for (size_t index : layout.exponentDigits)
        if (section.tokens[index].text[0] == '0')
            ++minimum;
    return ExponentText(exponent, section.tokens[static_cast<size_t>(layout.exponentToken)].plus, minimum);
}

// Mantissa and exponent for scientific formats: the mantissa keeps as many integer digits as
// there are integer placeholders, or, with '#' among them, the exponent steps by their count.
double ScientificParts(double value, const Section& section, const NumberLayout& layout, int& exponent)
{
    int integerCount = std::max<int>(1, static_cast<int>(layout.integerDigits.size()));
    bool engineering = integerCount > 1 && std::any_of(layout.integerDigits.begin(), layout.integerDigits.end(),
                                                       [&](size_t i) { return section.tokens[i].text[0] == '#'; });
    int decimals = static_cast<int>(layout.fractionDigits.size());
    auto split = [&](int magnitude) {
        if (engineering)
            return static_cast<int>(std::floor(static_cast<double>(magnitude) / integerCount)) * integerCount;
        return magnitude - (integerCount - 1);
    };
    DecimalDigits d = ToDecimal(value);
    if (d.digits.empty()) {
        exponent = 0;
        return 0.0;
    }
    exponent = split(d.exponent);
    // Rounding the mantissa can add a digit (9.99 -> 10.0): take the rounded magnitude then.
    DecimalDigits rounded = d;
    RoundDigits(rounded, d.exponent - exponent + 1 + decimals);
    if (rounded.exponent != d.exponent)
        exponent = split(rounded.exponent);
    return value / std::pow(10.0, exponent);
}

std::string RenderDigits(const Section& section, double value)
{
    NumberLayout layout = LayoutOf(section);
    value *= std::pow(100.0, layout.percents);
    value /= std::pow(1000.0, layout.thousandsScale);
    int exponent = 0;
    if (layout.exponentToken >= 0)
        value = ScientificParts(value, section, layout, exponent);

    std::string integerPart, fractionPart;
    FixedDigits(value, static_cast<int>(layout.fractionDigits.size()), integerPart, fractionPart);
    std::vector<std::string> integers = PlaceIntegerDigits(section, layout, integerPart, layout.grouping);
    std::vector<std::string> fractions = PlaceFractionDigits(section, layout, fractionPart);
    if (layout.integerDigits.empty() && !integerPart.empty())
        integers.clear(); // handled below: digits print before the point

    std::string out;
    bool integersPrinted = layout.integerDigits.empty() && integerPart.empty();
    size_t integerIndex = 0, fractionIndex = 0;
    bool exponentPrinted = false;
    for (size_t i = 0; i < section.tokens.size(); ++i) {
        const Token& token = section.tokens[i];
        switch (token.kind) {
        case Kind::Digit:
            if (integerIndex < layout.integerDigits.size() && layout.integerDigits[integerIndex] == i)
                out += integers[integerIndex++];
            else if (fractionIndex < layout.fractionDigits.size() && layout.fractionDigits[fractionIndex] == i)
                out += fractions[fractionIndex++];
            else if (!exponentPrinted) {
                out += PlaceExponentDigits(section, layout, exponent);
                exponentPrinted = true;
            }
            break;
        case Kind::Point:
            if (!integersPrinted && layout.integerDigits.empty()) {
                out += integerPart;
                integersPrinted = true;
            }
            out += '.';
            break;
        case Kind::Exponent:
            out += 'E';
            break;
        case Kind::Percent:
            out += '%';
            break;
        case Kind::Literal:
            out += token.text;
            break;
        case Kind::General:
            out += FormatGeneral(value);
            break;
        default:
            break;
        }
    }
    return out;
}

// "# ?/?": a whole part (when there are placeholders for it) and the closest fraction whose
// denominator has as many digits as the denominator placeholders, or the fixed denominator.
bool RenderFraction(const Section& section, double value, std::string& out)
{
    const auto& t = section.tokens;
    size_t slash = t.size();
    for (size_t i = 0; i < t.size(); ++i)
        if (t[i].kind == Kind::Literal && t[i].text[0] == '/') {
            slash = i;
            break;
        }
    if (slash == t.size() || slash == 0 || t[slash - 1].kind != Kind::Digit)
        return false;
    size_t numeratorStart = slash;
    while (numeratorStart > 0 && t[numeratorStart - 1].kind == Kind::Digit)
        --numeratorStart;
    size_t numeratorWidth = slash - numeratorStart;
    bool hasWhole = false;
    for (size_t i = 0; i < numeratorStart; ++i)
        hasWhole = hasWhole || t[i].kind == Kind::Digit;

    // The denominator: placeholders (or literal digits) after the slash.
    std::string afterSlash = t[slash].text.substr(t[slash].text.find('/') + 1);
    size_t denominatorWidth = 0;
    size_t next = slash + 1;
    for (; afterSlash.empty() && next < t.size() && t[next].kind == Kind::Digit; ++next)
        ++denominatorWidth;
    long parsedDenominator = std::strtol(afterSlash.c_str(), nullptr, 10);
    int fixedDenominator = static_cast<int>(std::clamp<long>(parsedDenominator, 0, 99999));
    int maxDenominator = fixedDenominator > 0 ? fixedDenominator
                                              : static_cast<int>(std::pow(10.0, std::max<size_t>(1, std::min<size_t>(denominatorWidth, 4)))) - 1;

    // Past 10^9 (without a whole part) or 10^15 a fraction has no digits left to show.
    if ((!hasWhole && value >= 1e9) || value >= 1e15) {
        out = FormatGeneral(value);
        return true;
    }
    double whole = hasWhole ? std::floor(value) : 0.0;
    double part = value - whole;
    int bestNumerator = 0, bestDenominator = 1;
    double bestError = part;
    for (int den = fixedDenominator > 0 ? fixedDenominator : 1; den <= maxDenominator; ++den) {
        int num = static_cast<int>(std::lround(part * den));
        double error = std::fabs(part - static_cast<double>(num) / den);
        if (error < bestError - 1e-12) {
            bestError = error;
            bestNumerator = num;
            bestDenominator = den;
        }
        if (fixedDenominator > 0)
            break;
    }
    if (hasWhole && bestNumerator == bestDenominator) {
        whole += 1;
        bestNumerator = 0;
    }
    auto pad = [](std::string s, size_t width, bool left) {
        while (s.size() < width)
            s = left ? " " + s : s + " ";
        return s;
    };
    std::string wholeText = hasWhole && (whole != 0 || bestNumerator == 0) ? std::to_string(static_cast<long long>(whole)) : std::string();
    out.clear();
    for (size_t i = 0; i < numeratorStart; ++i) {
        if (t[i].kind == Kind::Digit) {
            out += wholeText;
            wholeText.clear();
        } else if (t[i].kind == Kind::Literal) {
            out += t[i].text;
        }
    }
    if (bestNumerator == 0 && hasWhole) {
        // No fraction left: blanks keep the digits aligned.
        out += std::string(numeratorWidth + 1 + std::max<size_t>(denominatorWidth, afterSlash.size()), ' ');
    } else {
        out += pad(std::to_string(bestNumerator), numeratorWidth, true);
        out += "/";
        out += fixedDenominator > 0 ? std::to_string(fixedDenominator) : pad(std::to_string(bestDenominator), denominatorWidth, false);
    }
    for (size_t i = next; i < t.size(); ++i)
        if (t[i].kind == Kind::Literal)
            out += t[i].text;
    return true;
}

// ---------------------------------------------------------------------------------------------
// Dates and times from serial numbers (days since 1899-12-30; the sheet's calendar counts a
// 29 February 1900 as serial 60, which shifts the serials before it by one day).

struct Moment {
    int year = 1900, month = 1, day = 0;
    int hour = 0, minute = 0, second = 0;
    int fractionDigits = 0; // digits shown after the seconds
    long long fraction = 0; // those digits as an integer
    long long days = 0;     // whole days (for elapsed time)
    int weekday = 0;        // 0 = Sunday
};

bool ToMoment(double serial, int subSecondDigits, Moment& m)
{
    if (serial < 0 || serial >= 2958466.0)
        return false;
    long long scale = 1;
    for (int i = 0; i < subSecondDigits; ++i)
        scale *= 10;
    long long ticks = std::llround(serial * 86400.0 * static_cast<double>(scale));
    long long perDay = 86400LL * scale;
    m.days = ticks / perDay;
    long long inDay = ticks % perDay;
    m.fractionDigits = subSecondDigits;
    m.fraction = inDay % scale;
    long long seconds = inDay / scale;
    m.hour = static_cast<int>(seconds / 3600);
    m.minute = static_cast<int>(seconds / 60 % 60);
    m.second = static_cast<int>(seconds % 60);
    if (m.days == 0) {
        m.year = 1900, m.month = 1, m.day = 0;
    } else if (m.days == 60) {
        m.year = 1900, m.month = 2, m.day = 29;
    } else {
        CivilFromDays(m.days < 60 ? m.days + 1 : m.days, m.year, m.month, m.day);
    }
    // Serial 1 (1900-01-01) was a Sunday in the sheet's calendar.
    m.weekday = static_cast<int>(m.days % 7);
    return true;
}

std::string Padded(long long value, int width)
{
    std::string s = std::to_string(value);
    while (static_cast<int>(s.size()) < width)
        s.insert(s.begin(), '0');
    return s;
}

const char* const kMonthNames[] = {"January", "February", "March", "April", "May", "June", "July",
                                   "August", "September", "October", "November", "December"};
const char* const kDayNames[] = {"Saturday", "Sunday", "Monday", "Tuesday", "Wednesday", "Thursday", "Friday"};

std::string AmPmText(const std::string& written, int hour)
{
    bool pm = hour >= 12;
    bool lowerCase = !written.empty() && std::islower(static_cast<unsigned char>(written[0]));
    std::string text = written.size() == 3 ? std::string(pm ? "P" : "A") : std::string(pm ? "PM" : "AM");
    if (lowerCase)
        for (char& c : text)
            c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    return text;
}

std::string DateTimePiece(const Token& token, const Moment& m, bool twelveHour)
{
    switch (token.kind) {
    case Kind::Year:
        return token.width <= 2 ? Padded(m.year % 100, 2) : Padded(m.year, 4);
    case Kind::Month:
        if (token.width <= 2)
            return Padded(m.month, token.width);
        if (token.width == 3)
            return std::string(kMonthNames[m.month - 1]).substr(0, 3);
        return token.width == 4 ? kMonthNames[m.month - 1] : std::string(1, kMonthNames[m.month - 1][0]);
    case Kind::Day:
        if (token.width <= 2)
            return Padded(m.day, token.width);
        return token.width == 3 ? std::string(kDayNames[m.weekday]).substr(0, 3) : kDayNames[m.weekday];
    case Kind::Hour: {
        int hour = twelveHour ? (m.hour % 12 == 0 ? 12 : m.hour % 12) : m.hour;
        return Padded(hour, std::min(token.width, 2));
    }
    case Kind::Minute:
        return Padded(m.minute, std::min(token.width, 2));
    case Kind::Second:
        return Padded(m.second, std::min(token.width, 2));
    case Kind::SubSecond:
        return "." + Padded(m.fraction, m.fractionDigits);
    case Kind::AmPm:
        return AmPmText(token.text, m.hour);
    case Kind::ElapsedHours:
        return Padded(m.days * 24 + m.hour, token.width);
    case Kind::ElapsedMinutes:
        return Padded((m.days * 24 + m.hour) * 60 + m.minute, token.width);
    case Kind::ElapsedSeconds:
        return Padded(((m.days * 24 + m.hour) * 60 + m.minute) * 60 + m.second, token.width);
    case Kind::Literal:
    case Kind::Digit:
        return token.text;
    case Kind::Comma:
        return ",";
    case Kind::Point:
        return ".";
    case Kind::Percent:
        return "%";
    default:
        return std::string();
    }
}

std::string RenderDateTime(const Section& section, double serial)
{
    int subSecondDigits = 0;
    for (const Token& token : section.tokens)
        if (token.kind == Kind::SubSecond)
            subSecondDigits = token.width;
    Moment moment;
    if (!ToMoment(serial, subSecondDigits, moment))
        return kTooWide;
    std::string out;
    for (const Token& token : section.tokens)
        out += DateTimePiece(token, moment, section.hasAmPm);
    return out;
}

std::string RenderSection(const Section& section, double value)
{
    if (section.isDateTime)
        return RenderDateTime(section, value);
    bool hasDigits = HasKind(section, Kind::Digit);
    if (!hasDigits && !HasKind(section, Kind::General)) {
        std::string out;
        for (const Token& token : section.tokens)
            if (token.kind == Kind::Literal)
                out += token.text;
            else if (token.kind == Kind::Percent)
                out += '%';
        return out;
    }
    std::string fraction;
    if (hasDigits && RenderFraction(section, value, fraction))
        return fraction;
    return RenderDigits(section, value);
}

bool IsEmptySection(const Section& section) { return section.tokens.empty(); }

} // namespace

bool Condition::Holds(double value) const
{
    if (op == "<") return value < operand;
    if (op == "<=") return value <= operand;
    if (op == ">") return value > operand;
    if (op == ">=") return value >= operand;
    if (op == "=") return value == operand;
    if (op == "<>") return value != operand;
    return false;
}

// ---------------------------------------------------------------------------------------------

std::string FormatGeneral(double value)
{
    if (std::isnan(value))
        return "#NUM!";
    if (std::isinf(value))
        return "#DIV/0!";
    DecimalDigits d = ToDecimal(value);
    if (d.digits.empty())
        return "0";
    std::string sign = value < 0 ? "-" : "";
    if (d.exponent >= kGeneralWidth || d.exponent <= -5)
        return sign + GeneralScientific(d);
    int integerLength = std::max(d.exponent + 1, 1);
    int decimals = std::max(0, kGeneralWidth - integerLength - 1);
    std::string integerPart, fractionPart;
    FixedDigits(value, decimals, integerPart, fractionPart);
    if (static_cast<int>(integerPart.size()) > kGeneralWidth)
        return sign + GeneralScientific(d);
    std::string text = TrimFractionZeros(integerPart, fractionPart);
    return text == "0" ? text : sign + text;
}

NumberFormat::NumberFormat() : NumberFormat("General") {}

NumberFormat::NumberFormat(std::string_view code) : m_code(code)
{
    std::vector<Section> sections = Tokenize(code);
    // A last section holding '@' (or a fourth one) formats text; the others format numbers.
    if (sections.size() >= 4 || (sections.size() > 1 && HasKind(sections.back(), Kind::TextAt))) {
        m_textSection = sections.back();
        m_hasTextSection = true;
        sections.pop_back();
    } else if (sections.size() == 1 && HasKind(sections[0], Kind::TextAt)) {
        m_textSection = sections[0];
        m_hasTextSection = true;
    }
    sections.resize(std::min<size_t>(sections.size(), 3));
    m_sections = std::move(sections);
}

bool NumberFormat::IsDateTime() const
{
    return !m_sections.empty() && m_sections[0].isDateTime;
}

const Section* NumberFormat::SectionFor(double value, bool& prefixMinus, double& shown) const
{
    prefixMinus = false;
    shown = std::fabs(value);
    const size_t count = m_sections.size();
    if (count == 0)
        return nullptr;
    if (!m_sections[0].condition.op.empty()) {
        // Conditional sections: the first whose condition holds, else the remaining one.
        for (size_t i = 0; i < count && i < 2; ++i)
            if (m_sections[i].condition.Holds(value))
                return &m_sections[i];
        return &m_sections[count - 1];
    }
    if (count == 1 || value > 0 || (value == 0 && count == 2)) {
        prefixMinus = value < 0 && !m_sections[0].isDateTime;
        shown = m_sections[0].isDateTime ? value : shown;
        return &m_sections[0];
    }
    if (value < 0)
        return &m_sections[1];
    return &m_sections[2];
}

std::string NumberFormat::RenderNumber(double value) const
{
    if (!std::isfinite(value))
        return FormatGeneral(value);
    bool prefixMinus = false;
    double shown = value;
    const Section* section = SectionFor(value, prefixMinus, shown);
    if (section == nullptr || (IsEmptySection(*section) && m_sections.size() == 1))
        return FormatGeneral(value);
    if (IsEmptySection(*section))
        return std::string();
    if (HasKind(*section, Kind::TextAt) && !HasKind(*section, Kind::Digit) && !section->isDateTime)
        return FormatGeneral(value); // "@": numbers show as General
    std::string text = RenderSection(*section, shown);
    if (prefixMinus && text.find_first_of("123456789") != std::string::npos)
        text.insert(text.begin(), '-');
    return text;
}

std::string NumberFormat::RenderText(const std::string& text) const
{
    if (!m_hasTextSection)
        return text;
    std::string out;
    for (const Token& token : m_textSection.tokens) {
        if (token.kind == Kind::TextAt)
            out += text;
        else if (token.kind == Kind::Literal)
            out += token.text;
    }
    return out;
}

std::string NumberFormat::Render(const Variant& value) const
{
    switch (value.type) {
    case Variant::Number:
        return RenderNumber(value.number);
    case Variant::Text:
        return RenderText(value.text);
    case Variant::Boolean:
        return value.number != 0.0 ? "TRUE" : "FALSE";
    case Variant::Error:
        return value.text;
    default:
        return std::string();
    }
}

std::string NumberFormat::BuiltinCode(int id)
{
    switch (id) {
    case 1: return "0";
    case 2: return "0.00";
    case 3: return "#,##0";
    case 4: return "#,##0.00";
    case 5: return "\"$\"#,##0_);\\(\"$\"#,##0\\)";
    case 6: return "\"$\"#,##0_);[Red]\\(\"$\"#,##0\\)";
    case 7: return "\"$\"#,##0.00_);\\(\"$\"#,##0.00\\)";
    case 8: return "\"$\"#,##0.00_);[Red]\\(\"$\"#,##0.00\\)";
    case 9: return "0%";
    case 10: return "0.00%";
    case 11: return "0.00E+00";
    case 12: return "# ?/?";
    case 13: return "# ?\?/?\?";
    // 14 and 22 follow the system's short date; ours is month/day/four-digit year.
    case 14: return "m/d/yyyy";
    case 15: return "d-mmm-yy";
    case 16: return "d-mmm";
    case 17: return "mmm-yy";
    case 18: return "h:mm AM/PM";
    case 19: return "h:mm:ss AM/PM";
    case 20: return "h:mm";
    case 21: return "h:mm:ss";
    case 22: return "m/d/yyyy h:mm";
    case 37: return "#,##0 ;(#,##0)";
    case 38: return "#,##0 ;[Red](#,##0)";
    case 39: return "#,##0.00;(#,##0.00)";
    case 40: return "#,##0.00;[Red](#,##0.00)";
    case 41: return "_(* #,##0_);_(* \\(#,##0\\);_(* \"-\"_);_(@_)";
    case 42: return "_(\"$\"* #,##0_);_(\"$\"* \\(#,##0\\);_(\"$\"* \"-\"_);_(@_)";
    case 43: return "_(* #,##0.00_);_(* \\(#,##0.00\\);_(* \"-\"?\?_);_(@_)";
    case 44: return "_(\"$\"* #,##0.00_);_(\"$\"* \\(#,##0.00\\);_(\"$\"* \"-\"?\?_);_(@_)";
    case 45: return "mm:ss";
    case 46: return "[h]:mm:ss";
    case 47: return "mmss.0";
    case 48: return "##0.0E+0";
    case 49: return "@";
    default: return "General";
    }
}

} // namespace sheet
