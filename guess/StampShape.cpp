#include "guess/StampShape.h"

#include "platform/system/Text.h"

#include <cctype>
#include <cstdio>

namespace guess {
namespace {

bool IsDigit(char c) { return c >= '0' && c <= '9'; }

struct Piece {
    bool digits = false;
    size_t start = 0;
    size_t length = 0;
};

std::vector<Piece> PiecesOf(std::string_view text)
{
    std::vector<Piece> pieces;
    for (size_t i = 0; i < text.size();) {
        const bool digits = IsDigit(text[i]);
        size_t j = i;
        while (j < text.size() && IsDigit(text[j]) == digits)
            ++j;
        pieces.push_back({digits, i, j - i});
        i = j;
    }
    return pieces;
}

int NumberOf(std::string_view text, const Piece& piece)
{
    int value = 0;
    for (size_t i = 0; i < piece.length && i < 9; ++i)
        value = value * 10 + (text[piece.start + i] - '0');
    return value;
}

bool OnlyOf(std::string_view text, std::string_view allowed)
{
    for (char c : text)
        if (allowed.find(c) == std::string_view::npos)
            return false;
    return !text.empty();
}

// The separator between two date numbers: one of "/", "-", ".".
bool IsDateSeparator(std::string_view text) { return text == "/" || text == "-" || text == "."; }

// Between a date and its time: blanks, or "T".
bool IsDateTimeSeparator(std::string_view text) { return text == "T" || OnlyOf(text, " "); }

bool IsAmPm(std::string_view suffix)
{
    const std::string lower = text::ToLower(text::Trim(suffix));
    return lower == "am" || lower == "pm" || lower == "a.m." || lower == "p.m." || lower == "a" || lower == "p";
}

// Reads the clock numbers starting at digit run `first` of `runs`; their separators are `seps`
// (seps[i] stands between runs[i] and runs[i + 1]). The number of clock numbers, 0 when none.
int ClockNumbers(std::string_view text, const std::vector<Piece>& runs, const std::vector<std::string_view>& seps,
                 size_t first)
{
    const size_t left = runs.size() - first;
    if (left < 2 || seps[first] != ":")
        return 0;
    for (size_t i = first; i < first + std::min<size_t>(left, 3); ++i)
        if (runs[i].length > 2)
            return 0;
    if (NumberOf(text, runs[first]) > 23 || NumberOf(text, runs[first + 1]) > 59)
        return 0;
    if (left == 2)
        return 2;
    if (seps[first + 1] == ":") {
        if (NumberOf(text, runs[first + 2]) > 59)
            return 0;
        // A fraction of a second may follow; it is read past.
        if (left == 3 || (left == 4 && seps[first + 2] == "."))
            return 3;
        return 0;
    }
    // "13:45.5": a fraction of a minute is no clock we read.
    return 0;
}

} // namespace

StampShape ShapeOf(std::string_view raw)
{
    StampShape shape;
    // The runs index `raw`: blanks around the text are passed over, not cut off.
    size_t begin = 0, end = raw.size();
    while (begin < end && (raw[begin] == ' ' || raw[begin] == '\t'))
        ++begin;
    while (end > begin && (raw[end - 1] == ' ' || raw[end - 1] == '\t'))
        --end;
    const std::string_view text = raw.substr(0, end);
    if (begin == end || !IsDigit(text[begin]))
        return shape;
    std::vector<Piece> pieces = PiecesOf(text.substr(begin));
    for (Piece& piece : pieces)
        piece.start += begin;
    std::string_view suffix;
    if (!pieces.back().digits) {
        suffix = text.substr(pieces.back().start);
        pieces.pop_back();
    }
    std::vector<Piece> runs;
    std::vector<std::string_view> seps;
    for (const Piece& piece : pieces) {
        if (piece.digits)
            runs.push_back(piece);
        else
            seps.push_back(text.substr(piece.start, piece.length));
    }
    for (std::string_view sep : seps)
        if (!OnlyOf(sep, "/ T:-."))
            return shape;
    const bool amPm = IsAmPm(suffix);
    if (!suffix.empty() && suffix != "Z" && !amPm)
        return shape;
    seps.emplace_back(); // no separator after the last run

    if (runs.size() == 1) {
        const size_t length = runs[0].length;
        const int century = length >= 8 ? NumberOf(text, {true, runs[0].start, 2}) : 0;
        if ((length == 8 || length == 12 || length == 14) && (century == 19 || century == 20)) {
            shape.kind = length == 8 ? StampKind::Date : StampKind::DateTime;
            shape.flaw = StampFlaw::NoSeparators;
        }
        return shape;
    }

    size_t clockStart = 0;
    if (runs.size() >= 3 && IsDateSeparator(seps[0]) && seps[1] == seps[0]) {
        const int a = NumberOf(text, runs[0]), b = NumberOf(text, runs[1]), c = NumberOf(text, runs[2]);
        if (runs[0].length == 4 && runs[1].length <= 2 && runs[2].length <= 2) {
            if (b < 1 || b > 12 || c < 1 || c > 31)
                return shape;
            shape.yearFirst = true;
        } else if (runs[2].length == 4 && runs[0].length <= 2 && runs[1].length <= 2) {
            if (a < 1 || b < 1 || a > 31 || b > 31 || (a > 12 && b > 12))
                return shape;
            shape.firstNumber = a;
            shape.secondNumber = b;
        } else if (runs[0].length <= 2 && runs[1].length <= 2 && runs[2].length <= 2) {
            shape.flaw = StampFlaw::TwoDigitYear;
        } else {
            return shape;
        }
        shape.runs = {{runs[0].start, runs[0].length}, {runs[1].start, runs[1].length}, {runs[2].start, runs[2].length}};
        if (runs.size() == 3) {
            shape.kind = StampKind::Date;
            if (amPm)
                shape = StampShape();
            return shape;
        }
        if (!IsDateTimeSeparator(seps[2]))
            return StampShape();
        clockStart = 3;
    }
    const int clock = ClockNumbers(text, runs, seps, clockStart);
    if (clock == 0)
        return StampShape();
    for (size_t i = clockStart; i < clockStart + static_cast<size_t>(clock); ++i)
        shape.runs.push_back({runs[i].start, runs[i].length});
    shape.timeNumbers = clock;
    shape.kind = clockStart == 0 ? StampKind::Time : StampKind::DateTime;
    if (amPm)
        shape.flaw = StampFlaw::AmPm;
    return shape;
}

std::string FormatOf(std::string_view text, const StampShape& shape, DateOrder order)
{
    std::vector<const char*> letters;
    if (shape.kind == StampKind::Date || shape.kind == StampKind::DateTime) {
        if (order == DateOrder::YearMonthDay)
            letters = {"YYYY", "MM", "DD"};
        else if (order == DateOrder::DayMonthYear)
            letters = {"DD", "MM", "YYYY"};
        else
            letters = {"MM", "DD", "YYYY"};
    }
    for (const char* clock : {"HH", "mm", "ss"})
        if (letters.size() < shape.runs.size())
            letters.push_back(clock);
    std::string format;
    for (size_t i = 0; i < shape.runs.size(); ++i) {
        if (i > 0) {
            const size_t from = shape.runs[i - 1].start + shape.runs[i - 1].length;
            format.append(text.substr(from, shape.runs[i].start - from));
        }
        format += letters[i];
    }
    return format;
}

namespace {

bool ValidDate(int year, int month, int day) { return year >= 1000 && month >= 1 && month <= 12 && day >= 1 && day <= 31; }

std::string DateText(int year, int month, int day) { return text::Format("%04d-%02d-%02d", year, month, day); }

} // namespace

std::string FindDateIn(std::string_view text)
{
    const std::vector<Piece> pieces = PiecesOf(text);
    for (size_t i = 0; i < pieces.size(); ++i) {
        const Piece& p = pieces[i];
        if (!p.digits)
            continue;
        if (p.length == 8) {
            const std::string_view d = text.substr(p.start, 8);
            const int year = std::stoi(std::string(d.substr(0, 4))), month = std::stoi(std::string(d.substr(4, 2))),
                      day = std::stoi(std::string(d.substr(6, 2)));
            if ((year / 100 == 19 || year / 100 == 20) && ValidDate(year, month, day))
                return DateText(year, month, day);
            continue;
        }
        if (i + 4 >= pieces.size() || !pieces[i + 2].digits || !pieces[i + 4].digits)
            continue;
        const std::string_view s1 = text.substr(pieces[i + 1].start, pieces[i + 1].length);
        const std::string_view s2 = text.substr(pieces[i + 3].start, pieces[i + 3].length);
        if (!IsDateSeparator(s1) || s1 != s2)
            continue;
        const int a = NumberOf(text, p), b = NumberOf(text, pieces[i + 2]), c = NumberOf(text, pieces[i + 4]);
        if (p.length == 4 && ValidDate(a, b, c))
            return DateText(a, b, c);
        if (pieces[i + 4].length == 4) {
            if (a > 12 && ValidDate(c, b, a))
                return DateText(c, b, a);
            if (b > 12 && ValidDate(c, a, b))
                return DateText(c, a, b);
        }
    }
    return {};
}

std::string FindTimeIn(std::string_view text)
{
    const std::vector<Piece> pieces = PiecesOf(text);
    for (size_t i = 0; i + 2 < pieces.size(); ++i) {
        const Piece& h = pieces[i];
        if (!h.digits || h.length > 2 || text.substr(pieces[i + 1].start, pieces[i + 1].length) != ":" ||
            !pieces[i + 2].digits || pieces[i + 2].length != 2)
            continue;
        const int hour = NumberOf(text, h), minute = NumberOf(text, pieces[i + 2]);
        int second = 0;
        if (i + 4 < pieces.size() && text.substr(pieces[i + 3].start, pieces[i + 3].length) == ":" &&
            pieces[i + 4].digits && pieces[i + 4].length == 2)
            second = NumberOf(text, pieces[i + 4]);
        if (hour <= 23 && minute <= 59 && second <= 59)
            return text::Format("%02d:%02d:%02d", hour, minute, second);
    }
    return {};
}

} // namespace guess
