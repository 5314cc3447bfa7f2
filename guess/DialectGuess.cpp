#include "guess/DialectGuess.h"

#include "guess/CellKinds.h"
#include "guess/StampShape.h"
#include "platform/system/Text.h"

#include <algorithm>
#include <map>

namespace guess {
namespace {

// Characters that may stand alone as a user delimiter. The date and time separators (":", "/",
// "-", ".") and the characters of numbers are not among them: they would cut stamps and values.
constexpr std::string_view kUserDelimiterChars = "|!#$%&*^~@\\=";
// Characters whose doubled form ("::", "||") may be a user delimiter.
constexpr std::string_view kDoubledDelimiterChars = ":|;,#~!^*/\\=_";

struct Scored {
    Dialect dialect;
    size_t fieldCount = 0;
    bool hasStampColumn = false;
    double evenness = 0; // share of the data lines with the common field count
    double typed = 0;    // share of their fields that are numbers, dates, times or blank
    size_t emptyColumns = 0;
    int flags = 0;
    std::string stampExample;

    // Better first: a column of dates or times, then even and typed lines, then fewer columns that
    // are always empty, then fewer flags.
    bool operator<(const Scored& other) const
    {
        if (hasStampColumn != other.hasStampColumn)
            return !hasStampColumn;
        const double a = evenness * typed, b = other.evenness * other.typed;
        if (std::abs(a - b) > 1e-9)
            return a < b;
        if (emptyColumns != other.emptyColumns)
            return emptyColumns > other.emptyColumns;
        return flags > other.flags;
    }
};

std::vector<const TextLine*> NonEmptyLines(const TextHead& head)
{
    std::vector<const TextLine*> lines;
    for (const TextLine& line : head.lines)
        if (!Trimmed(line.text).empty())
            lines.push_back(&line);
    return lines;
}

// The lines most likely to be data: the later half of the head.
std::vector<const TextLine*> DataSide(const std::vector<const TextLine*>& lines)
{
    const size_t from = lines.size() / 2;
    return std::vector<const TextLine*>(lines.begin() + static_cast<std::ptrdiff_t>(from), lines.end());
}

size_t SharedBy(const std::vector<const TextLine*>& lines, std::string_view piece)
{
    size_t count = 0;
    for (const TextLine* line : lines)
        if (line->text.find(piece) != std::string::npos)
            ++count;
    return count;
}

bool StartsWith(const std::vector<const TextLine*>& lines, const std::string& delimiter)
{
    for (const TextLine* line : lines)
        if (line->text.rfind(delimiter, 0) == 0)
            return true;
    return false;
}

std::vector<Dialect> Candidates(const std::vector<const TextLine*>& dataSide)
{
    std::vector<Dialect> names;
    for (const char* name : {"Tab", "Comma", "Semi Colon", "Space"})
        names.push_back({name, "", false, false});
    const size_t most = dataSide.size() * 4 / 5;
    for (char c : kUserDelimiterChars)
        if (SharedBy(dataSide, std::string(1, c)) > most && most > 0)
            names.push_back({"User Defined", std::string(1, c), false, false});
    for (char c : kDoubledDelimiterChars) {
        const std::string doubled(2, c);
        if (SharedBy(dataSide, doubled) > most && most > 0)
            names.push_back({"User Defined", doubled, false, false});
    }
    std::vector<Dialect> all;
    for (const Dialect& plain : names) {
        const std::string text = plain.Text();
        all.push_back(plain);
        const bool runs = SharedBy(dataSide, text + text) > 0;
        const bool leading = StartsWith(dataSide, text);
        if (runs)
            all.push_back({plain.delimiterName, plain.userDelimiter, true, false});
        if (leading) {
            all.push_back({plain.delimiterName, plain.userDelimiter, false, true});
            all.push_back({plain.delimiterName, plain.userDelimiter, true, true});
        }
    }
    return all;
}

Scored Score(const Dialect& dialect, const std::vector<const TextLine*>& dataSide)
{
    Scored scored;
    scored.dialect = dialect;
    scored.flags = (dialect.consecutive ? 1 : 0) + (dialect.leading ? 1 : 0);
    LineSplitter splitter(dialect);
    std::vector<std::vector<std::string>> split;
    std::map<size_t, size_t> counts;
    for (const TextLine* line : dataSide) {
        bool quoteError = false;
        split.push_back(splitter.Split(line->text, &quoteError));
        if (quoteError)
            split.back().clear(); // a malformed quote does not read; it counts against the dialect
        ++counts[split.back().size()];
    }
    size_t best = 0;
    for (const auto& [count, lines] : counts)
        if (lines >= best) // ties go to the larger count
            best = lines, scored.fieldCount = count;
    if (scored.fieldCount < 2 || dataSide.empty())
        return scored;
    scored.evenness = static_cast<double>(best) / static_cast<double>(dataSide.size());
    size_t cells = 0, typed = 0;
    std::vector<size_t> stampCells(scored.fieldCount, 0), emptyCells(scored.fieldCount, 0);
    for (const std::vector<std::string>& fields : split) {
        if (fields.size() != scored.fieldCount)
            continue;
        for (size_t c = 0; c < fields.size(); ++c) {
            ++cells;
            typed += LooksTyped(fields[c]) ? 1 : 0;
            if (ShapeOf(fields[c]).kind != StampKind::None) {
                ++stampCells[c];
                if (scored.stampExample.empty())
                    scored.stampExample = fields[c];
            }
            emptyCells[c] += Trimmed(fields[c]).empty() ? 1 : 0;
        }
    }
    scored.typed = cells ? static_cast<double>(typed) / static_cast<double>(cells) : 0;
    for (size_t c = 0; c < scored.fieldCount; ++c) {
        scored.hasStampColumn = scored.hasStampColumn || stampCells[c] * 5 >= best * 3;
        scored.emptyColumns += emptyCells[c] == best ? 1 : 0;
    }
    return scored;
}

std::string Percent(double share) { return text::Format("%.0f%%", share * 100); }

std::string Quote(std::string_view text) { return "'" + text::EscapeControls(text) + "'"; }

// The decimal separator the values of the data lines use.
void GuessDecimal(const Sample& sample, size_t fieldCount, DialectGuess& guess)
{
    size_t comma = 0, point = 0;
    std::string commaExample, pointExample;
    for (const SampleRow& row : sample.rows) {
        if (row.cells.size() != fieldCount)
            continue;
        for (const SampleCell& cell : row.cells) {
            if (ShapeOf(cell.text).kind != StampKind::None)
                continue;
            if (IsCommaDecimal(cell.text)) {
                if (comma++ == 0)
                    commaExample = Trimmed(cell.text);
            } else if (IsPointDecimal(cell.text)) {
                if (point++ == 0)
                    pointExample = Trimmed(cell.text);
            }
        }
    }
    Finding finding{"DecimalSeparator", "Dot", "", ""};
    if (comma > point) {
        guess.decimalName = finding.value = "Comma";
        finding.evidence = std::to_string(comma) + " values such as " + Quote(commaExample) +
                           " have a comma between their digits";
    } else if (point > 0) {
        finding.evidence = std::to_string(point) + " values such as " + Quote(pointExample) + " have a decimal point";
    } else {
        finding.evidence = "no value has a decimal part; the point is the default";
    }
    if (comma > 0 && point > 0)
        finding.ambiguity = "values use both: " + std::to_string(point) + " with a point (" + Quote(pointExample) + "), " +
                            std::to_string(comma) + " with a comma (" + Quote(commaExample) +
                            "); the more frequent was taken, and lines whose values use the other will fail";
    else if (comma > 0 && guess.dialect.delimiterName != "Comma")
        finding.ambiguity = "a comma could also separate fields; but the lines split evenly at " +
                            DescribeDialect(guess.dialect) + ", and the commas stand inside the values";
    guess.findings.push_back(finding);
}

} // namespace

std::string DescribeDialect(const Dialect& dialect)
{
    std::string name = dialect.delimiterName == "User Defined" ? "User Defined " + Quote(dialect.userDelimiter)
                                                               : dialect.delimiterName;
    if (dialect.consecutive)
        name += ", runs as one";
    if (dialect.leading)
        name += ", leading ones passed over";
    return name;
}

Sample SplitHead(const TextHead& head, const Dialect& dialect)
{
    Sample sample;
    LineSplitter splitter(dialect);
    for (const TextLine& line : head.lines) {
        if (Trimmed(line.text).empty())
            continue;
        SampleRow row;
        row.number = line.number;
        row.line = line.text;
        for (std::string& field : splitter.Split(line.text))
            row.cells.push_back({std::move(field), false, false, 0});
        sample.rows.push_back(std::move(row));
    }
    sample.rowsRead = head.lines.empty() ? 0 : head.lines.back().number;
    sample.wholeFile = head.wholeFile;
    return sample;
}

std::optional<DialectGuess> GuessDialect(const TextHead& head, Refusal& refusal)
{
    const std::vector<const TextLine*> lines = NonEmptyLines(head);
    if (lines.empty()) {
        refusal = {0, head.lines.empty() ? "the file is empty" : "the file holds only blank lines"};
        return std::nullopt;
    }
    for (const TextLine* line : lines)
        if (line->text.find('\0') != std::string::npos) {
            refusal = {line->number, "the line holds a zero byte: this is no text file"};
            return std::nullopt;
        }
    const std::vector<const TextLine*> dataSide = DataSide(lines);
    std::vector<Scored> scored;
    for (const Dialect& dialect : Candidates(dataSide))
        scored.push_back(Score(dialect, dataSide));
    std::stable_sort(scored.begin(), scored.end(), [](const Scored& a, const Scored& b) { return b < a; });
    const Scored& best = scored.front();
    if (best.fieldCount < 2) {
        refusal = {dataSide.front()->number, "no delimiter splits the line into two fields or more (tried Tab, Comma, "
                                             "Semi Colon, Space and user delimiters): " +
                                                 Quote(text::CutUtf8(dataSide.front()->text, 80))};
        return std::nullopt;
    }

    DialectGuess guess;
    guess.dialect = best.dialect;
    guess.fieldCount = best.fieldCount;
    Finding delimiter{"Delimiter", DescribeDialect(best.dialect), "", ""};
    delimiter.evidence = Percent(best.evenness) + " of the last " + std::to_string(dataSide.size()) +
                         " lines read split into " + std::to_string(best.fieldCount) + " fields, " + Percent(best.typed) +
                         " of them numbers, dates, times or blank";
    if (!best.stampExample.empty())
        delimiter.evidence += " (a date/time field: " + Quote(best.stampExample) + ")";
    for (size_t i = 1; i < scored.size(); ++i) {
        const Scored& other = scored[i];
        const bool sameDelimiter = other.dialect.delimiterName == best.dialect.delimiterName &&
                                   other.dialect.userDelimiter == best.dialect.userDelimiter;
        if (other.fieldCount < 2 || sameDelimiter)
            continue;
        if (other.hasStampColumn && other.evenness * other.typed >= 0.8 * best.evenness * best.typed)
            delimiter.ambiguity = DescribeDialect(other.dialect) + " splits the lines too (" + Percent(other.evenness) +
                                  " into " + std::to_string(other.fieldCount) + " fields, " + Percent(other.typed) +
                                  " typed); " + DescribeDialect(best.dialect) + " gives the more even and typed fields";
        break;
    }
    guess.findings.push_back(delimiter);
    GuessDecimal(SplitHead(head, best.dialect), best.fieldCount, guess);
    return guess;
}

} // namespace guess
