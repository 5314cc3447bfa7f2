#include "guess/TimeGuess.h"

#include "guess/CellKinds.h"
#include "platform/system/OleDateTime.h"
#include "platform/system/Text.h"
#include "templates/Specification.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <map>

namespace guess {
namespace {

constexpr size_t kFollowingDataRows = 3; // a start row is followed by this many data rows

std::string Quote(std::string_view text) { return "'" + text::EscapeControls(text) + "'"; }

// A cell's shape; a workbook's date cell whose shown text has none is judged by its day number.
struct CellShape {
    StampShape shape;
    bool byValue = false; // a workbook's number cell shown as a date or time
};

CellShape ShapeOfCell(const SampleCell& cell)
{
    CellShape result;
    result.shape = ShapeOf(cell.text);
    if (cell.numberCell && cell.dateCell) {
        result.byValue = true;
        if (result.shape.kind == StampKind::None || result.shape.flaw != StampFlaw::None) {
            result.shape = StampShape();
            const double whole = std::floor(cell.number);
            result.shape.kind = cell.number < 1 ? StampKind::Time
                                : cell.number == whole ? StampKind::Date
                                                       : StampKind::DateTime;
        }
    }
    return result;
}

const SampleCell* CellAt(const SampleRow& row, size_t column)
{
    return column < row.cells.size() ? &row.cells[column] : nullptr;
}

// The rows whose shape fits a data row: a text line with the data lines' field count, any
// workbook row.
std::vector<size_t> CandidateRows(const Sample& sample, const TimeContext& context)
{
    std::vector<size_t> rows;
    for (size_t i = 0; i < sample.rows.size(); ++i)
        if (sample.excel || sample.rows[i].cells.size() == context.fieldCount)
            rows.push_back(i);
    return rows;
}

struct ColumnKind {
    StampKind kind = StampKind::None;
    size_t count = 0;
};

// What most cells of `column` are in the later half of the candidate rows.
ColumnKind KindOfColumn(const Sample& sample, const std::vector<size_t>& rows, size_t column)
{
    std::map<StampKind, size_t> counts;
    const size_t from = rows.size() / 2;
    for (size_t i = from; i < rows.size(); ++i)
        if (const SampleCell* cell = CellAt(sample.rows[rows[i]], column))
            ++counts[ShapeOfCell(*cell).shape.kind];
    ColumnKind best;
    for (const auto& [kind, count] : counts)
        if (kind != StampKind::None && count > best.count)
            best = {kind, count};
    const size_t considered = rows.size() - from;
    if (best.count * 5 < considered * 3)
        return {};
    return best;
}

struct Placement {
    size_t column = 0;              // from 0
    std::vector<StampKind> kinds;   // of each column spanned
};

std::optional<Placement> PlaceStamp(const Sample& sample, const std::vector<size_t>& rows, size_t columns)
{
    for (size_t c = 0; c < columns; ++c) {
        const StampKind kind = KindOfColumn(sample, rows, c).kind;
        if (kind == StampKind::None)
            continue;
        const StampKind next = c + 1 < columns ? KindOfColumn(sample, rows, c + 1).kind : StampKind::None;
        if ((kind == StampKind::Date && next == StampKind::Time) || (kind == StampKind::Time && next == StampKind::Date))
            return Placement{c, {kind, next}};
        return Placement{c, {kind}};
    }
    return std::nullopt;
}

std::string FlawReason(StampFlaw flaw, const std::string& text)
{
    switch (flaw) {
    case StampFlaw::TwoDigitYear:
        return "the date " + Quote(text) + " has a two-digit year, which no template format reads (years count from 100)";
    case StampFlaw::NoSeparators:
        return "the date/time " + Quote(text) + " has no separators between its numbers, which no template format reads";
    case StampFlaw::AmPm:
        return "the date/time " + Quote(text) + " counts hours with AM/PM, which no template format reads";
    default: return {};
    }
}

// A refusal naming the first date or time of the data rows that no format reads, if any.
bool FindFlaw(const Sample& sample, const std::vector<size_t>& rows, const std::vector<size_t>& columns, Refusal& refusal)
{
    for (size_t index : rows)
        for (size_t column : columns)
            if (const SampleCell* cell = CellAt(sample.rows[index], column)) {
                const CellShape shape = ShapeOfCell(*cell);
                if (shape.shape.flaw != StampFlaw::None && !shape.byValue) {
                    refusal = {sample.rows[index].number, FlawReason(shape.shape.flaw, Trimmed(cell->text))};
                    return true;
                }
            }
    return false;
}

// How a refusal says that no column holds dates or times.
Refusal NoStampColumn(const Sample& sample, const std::vector<size_t>& rows)
{
    std::vector<size_t> all;
    for (size_t i = 0; i < sample.rows.size(); ++i)
        all.push_back(i);
    std::vector<size_t> columns;
    for (size_t c = 0; c < 64; ++c)
        columns.push_back(c);
    Refusal refusal;
    if (FindFlaw(sample, all, columns, refusal))
        return refusal;
    // The first row that looks like data: every cell a number, a date, a time or blank.
    const SampleRow* typical = &sample.rows[rows.empty() ? sample.rows.size() - 1 : rows[rows.size() / 2]];
    for (size_t index : rows) {
        const SampleRow& candidate = sample.rows[index];
        if (std::all_of(candidate.cells.begin(), candidate.cells.end(),
                        [](const SampleCell& cell) { return cell.numberCell || LooksTyped(cell.text); })) {
            typical = &candidate;
            break;
        }
    }
    const SampleRow& row = *typical;
    const std::string what = sample.excel ? "no column of the sheet holds dates or times that a template reads; row "
                                          : "no field of the data lines holds dates or times that a template reads: ";
    refusal.line = row.number;
    refusal.reason = sample.excel ? what + std::to_string(row.number) + " is typical"
                                  : what + Quote(text::CutUtf8(row.line, 80));
    return refusal;
}

struct OrderVotes {
    bool yearFirst = true;
    bool dayFirstSeen = false;   // a first number above 12
    bool monthFirstSeen = false; // a second number above 12
};

OrderVotes VoteOrder(const Sample& sample, const std::vector<size_t>& rows, const Placement& placement)
{
    OrderVotes votes;
    for (size_t w = 0; w < placement.kinds.size(); ++w) {
        if (placement.kinds[w] == StampKind::Time)
            continue;
        for (size_t index : rows)
            if (const SampleCell* cell = CellAt(sample.rows[index], placement.column + w)) {
                const CellShape shape = ShapeOfCell(*cell);
                if (shape.shape.kind == StampKind::None || shape.shape.kind == StampKind::Time || shape.shape.runs.empty())
                    continue;
                if (!shape.shape.yearFirst) {
                    votes.yearFirst = false;
                    votes.dayFirstSeen = votes.dayFirstSeen || shape.shape.firstNumber > 12;
                    votes.monthFirstSeen = votes.monthFirstSeen || shape.shape.secondNumber > 12;
                }
            }
    }
    return votes;
}

StampPart PartOf(int option)
{
    return option == 1 ? StampPart::Time : option == 2 ? StampPart::Date : StampPart::DateTime;
}

StampFields StartFields(const TimeLayout& layout)
{
    StampFields fields;
    if (layout.option == 1) {
        StampFields date;
        date.year = 100;
        ReadStampText(layout.globalDate, "YYYY-MM-DD", StampPart::Date, date);
        fields.year = date.year, fields.month = date.month, fields.day = date.day;
    } else if (layout.option == 2) {
        StampFields clock;
        ReadStampText(layout.globalTime, "HH:mm:ss", StampPart::Time, clock);
        fields.year = 100;
        fields.hour = clock.hour, fields.minute = clock.minute, fields.second = clock.second;
    }
    return fields;
}

// The format of the stamp columns of `row` with the date order given; empty when a cell has no
// shape to build it from.
std::string BuildFormat(const SampleRow& row, const Placement& placement, DateOrder order, const std::string& joiner)
{
    std::string format;
    for (size_t w = 0; w < placement.kinds.size(); ++w) {
        const SampleCell* cell = CellAt(row, placement.column + w);
        if (!cell)
            return {};
        const StampShape shape = ShapeOf(cell->text);
        if (shape.kind == StampKind::None || shape.flaw != StampFlaw::None)
            return {};
        if (w > 0)
            format += joiner;
        format += FormatOf(cell->text, shape, order);
    }
    return format;
}

// The first candidate row whose stamp cells have the kinds of the placement.
const SampleRow* TypicalRow(const Sample& sample, const std::vector<size_t>& rows, const Placement& placement)
{
    for (size_t i = rows.size() / 2; i < rows.size(); ++i) {
        const SampleRow& row = sample.rows[rows[i]];
        bool fits = true;
        for (size_t w = 0; w < placement.kinds.size(); ++w) {
            const SampleCell* cell = CellAt(row, placement.column + w);
            fits = fits && cell && ShapeOf(cell->text).kind == placement.kinds[w];
        }
        if (fits)
            return &row;
    }
    return nullptr;
}

std::string DefaultFormat(int option)
{
    return option == 1 ? "HH:mm:ss" : option == 2 ? "YYYY/MM/DD" : "YYYY/MM/DD HH:mm:ss";
}

// An empty date/time text reads (every field keeps its starting value), but it is no data row's.
bool HasStampText(const SampleRow& row, const TimeLayout& layout)
{
    for (int w = 0; w < layout.width; ++w) {
        const SampleCell* cell = CellAt(row, static_cast<size_t>(layout.column - 1 + w));
        if (!cell || (!cell->numberCell && ShapeOf(cell->text).kind == StampKind::None))
            return false;
    }
    return true;
}

bool IsData(const Sample& sample, const SampleRow& row, const TimeLayout& layout, const TimeContext& context)
{
    Stamp stamp = 0;
    return (sample.excel || row.cells.size() == context.fieldCount) && HasStampText(row, layout) &&
           RowStamp(row, layout, context, sample.excel, stamp);
}

// The data rows of the layout: from the first row that reads and is followed by rows that read.
void FindDataRows(const Sample& sample, TimeLayout& layout, const TimeContext& context)
{
    layout.dataRows.clear();
    std::vector<bool> data(sample.rows.size());
    for (size_t i = 0; i < sample.rows.size(); ++i)
        data[i] = IsData(sample, sample.rows[i], layout, context);
    size_t start = sample.rows.size();
    for (size_t i = 0; i < sample.rows.size() && start == sample.rows.size(); ++i) {
        if (!data[i])
            continue;
        bool followed = true;
        for (size_t j = i + 1; j < sample.rows.size() && j <= i + kFollowingDataRows; ++j)
            followed = followed && data[j];
        if (followed)
            start = i;
    }
    if (start == sample.rows.size())
        for (size_t i = 0; i < sample.rows.size() && start == sample.rows.size(); ++i)
            if (data[i])
                start = i;
    for (size_t i = start; i < sample.rows.size(); ++i)
        if (data[i])
            layout.dataRows.push_back(i);
    layout.startRow = start < sample.rows.size() ? sample.rows[start].number : 0;
}

// How well the stamps of the data rows run: rising steps, and how many share the commonest step.
size_t OrderScore(const Sample& sample, const TimeLayout& layout, const TimeContext& context)
{
    std::vector<Stamp> stamps;
    for (size_t index : layout.dataRows) {
        Stamp stamp = 0;
        if (RowStamp(sample.rows[index], layout, context, sample.excel, stamp))
            stamps.push_back(stamp);
    }
    size_t rising = 0, common = 0;
    std::map<Stamp, size_t> steps;
    for (size_t i = 1; i < stamps.size(); ++i) {
        rising += stamps[i] > stamps[i - 1] ? 1 : 0;
        common = std::max(common, ++steps[stamps[i] - stamps[i - 1]]);
    }
    return rising + common;
}

// The global date or time a header line or the file name gives, with where it was found.
std::string FindGlobal(const Sample& sample, size_t before, const std::string& fileName, bool date, std::string& where)
{
    for (size_t i = 0; i < before && i < sample.rows.size(); ++i) {
        std::string text = sample.rows[i].line;
        if (text.empty())
            for (const SampleCell& cell : sample.rows[i].cells)
                text += cell.text + " ";
        const std::string found = date ? FindDateIn(text) : FindTimeIn(text);
        if (!found.empty()) {
            where = (sample.excel ? "row " : "line ") + std::to_string(sample.rows[i].number) + ", " +
                    Quote(text::CutUtf8(text::Trim(text), 60));
            return found;
        }
    }
    const std::string found = date ? FindDateIn(fileName) : FindTimeIn(fileName);
    if (!found.empty())
        where = "the file name " + Quote(fileName);
    return found;
}

// The index of the first candidate row whose stamp column has the placement's kind: the rows above
// it are header rows.
size_t FirstStampRow(const Sample& sample, const Placement& placement)
{
    for (size_t i = 0; i < sample.rows.size(); ++i)
        if (const SampleCell* cell = CellAt(sample.rows[i], placement.column))
            if (ShapeOfCell(*cell).shape.kind == placement.kinds[0])
                return i;
    return sample.rows.size();
}

const char* OptionText(int option)
{
    switch (option) {
    case 1: return "1 (one date for all rows, the times in the rows)";
    case 2: return "2 (one time for all rows, the dates in the rows)";
    default: return "0 (date and time in the rows)";
    }
}

const char* KindText(StampKind kind)
{
    switch (kind) {
    case StampKind::Date: return "dates";
    case StampKind::Time: return "times";
    default: return "dates with times";
    }
}

std::string ColumnName(bool excel, size_t column)
{
    return (excel ? "column " : "field ") + std::to_string(column + 1);
}

} // namespace

bool RowStamp(const SampleRow& row, const TimeLayout& layout, const TimeContext& context, bool excel, Stamp& stamp)
{
    const size_t first = static_cast<size_t>(layout.column - 1);
    const size_t width = static_cast<size_t>(layout.width);
    StampFields fields = StartFields(layout);
    const StampPart part = PartOf(layout.option);
    if (!excel) {
        if (row.cells.size() < first + width)
            return false;
        std::string text = row.cells[first].text;
        for (size_t w = 1; w < width; ++w)
            text += " " + row.cells[first + w].text;
        return ReadStampText(text, layout.format, part, fields, width > 1 ? context.delimiter : std::string()) &&
               StampOf(fields, stamp);
    }
    if (layout.useFormat) {
        std::string joined;
        for (size_t w = 0; w < width; ++w)
            joined += (first + w < row.cells.size() ? row.cells[first + w].text : std::string()) + " ";
        joined = text::Trim(joined);
        return !joined.empty() && ReadStampText(joined, layout.format, part, fields) && StampOf(fields, stamp);
    }
    const SampleCell* cell = CellAt(row, first);
    if (!cell || (!cell->numberCell && Trimmed(cell->text).empty()))
        return false;
    Stamp value = 0;
    if (cell->numberCell) {
        if (!StampOfSheetSerial(cell->number, value))
            return false;
    } else {
        StampFields parsed = layout.option == 0 ? StampFields() : fields;
        if (!ReadStampText(cell->text, layout.format, part, parsed) || !StampOf(parsed, value))
            return false;
    }
    const StampFields read = FieldsOf(value);
    if (layout.option == 0)
        fields = read;
    else if (layout.option == 1)
        fields.hour = read.hour, fields.minute = read.minute, fields.second = read.second;
    else
        fields.year = read.year, fields.month = read.month, fields.day = read.day;
    return StampOf(fields, stamp);
}

std::optional<TimeLayout> GuessTime(const Sample& sample, const TimeContext& context, std::vector<Finding>& findings,
                                    Refusal& refusal)
{
    const std::vector<size_t> rows = CandidateRows(sample, context);
    const std::optional<Placement> placement = PlaceStamp(sample, rows, context.fieldCount);
    if (!placement) {
        refusal = NoStampColumn(sample, rows);
        return std::nullopt;
    }
    std::vector<size_t> spanned;
    for (size_t w = 0; w < placement->kinds.size(); ++w)
        spanned.push_back(placement->column + w);
    const std::vector<size_t> laterRows(rows.begin() + static_cast<std::ptrdiff_t>(rows.size() / 2), rows.end());
    if (FindFlaw(sample, rows, spanned, refusal))
        return std::nullopt;

    TimeLayout layout;
    layout.column = static_cast<int>(placement->column + 1);
    layout.width = static_cast<int>(placement->kinds.size());
    const StampKind kind = placement->kinds.size() == 2 ? StampKind::DateTime : placement->kinds[0];
    const size_t headerEnd = FirstStampRow(sample, *placement);
    std::string globalWhere;
    if (kind == StampKind::Time) {
        layout.option = 1;
        layout.globalDate = FindGlobal(sample, headerEnd, context.fileName, true, globalWhere);
    } else if (kind == StampKind::Date) {
        layout.globalTime = FindGlobal(sample, headerEnd, context.fileName, false, globalWhere);
        layout.option = layout.globalTime.empty() ? 0 : 2;
    }
    Finding globalFinding;
    if (layout.option == 1) {
        globalFinding = {"GlobalDate", layout.globalDate, "", ""};
        if (layout.globalDate.empty()) {
            layout.globalDate = globalFinding.value = COleDateTime::GetCurrentTime().Format("%Y-%m-%d");
            globalFinding.evidence = "the rows hold times only and neither a line above the data nor the file name names "
                                     "a day: today is taken; set GlobalDate to the day of the file";
        } else {
            globalFinding.evidence = "the rows hold times only; the day is named in " + globalWhere;
        }
    } else if (layout.option == 2) {
        globalFinding = {"GlobalTime", layout.globalTime, "the rows hold dates only; the time of day is named in " + globalWhere,
                         ""};
    }

    // Workbook cells that hold day numbers are read as numbers when one column holds the stamp.
    const SampleRow* typical = TypicalRow(sample, rows, *placement);
    bool numberCells = sample.excel;
    for (size_t index : laterRows)
        if (const SampleCell* cell = CellAt(sample.rows[index], placement->column))
            numberCells = numberCells && (cell->numberCell || Trimmed(cell->text).empty());
    layout.useFormat = !(numberCells && layout.width == 1);

    const OrderVotes votes = VoteOrder(sample, laterRows, *placement);
    std::vector<DateOrder> orders;
    if (votes.yearFirst)
        orders = {DateOrder::YearMonthDay};
    else if (votes.dayFirstSeen && votes.monthFirstSeen) {
        refusal = {typical ? typical->number : 0,
                   "the dates mix day-first and month-first orders (a first number and a second number above 12 both "
                   "occur), so no one format reads them"};
        return std::nullopt;
    } else if (votes.dayFirstSeen)
        orders = {DateOrder::DayMonthYear};
    else if (votes.monthFirstSeen)
        orders = {DateOrder::MonthDayYear};
    else
        orders = {DateOrder::DayMonthYear, DateOrder::MonthDayYear};

    const std::string joiner = sample.excel ? "|" : context.delimiter;
    size_t bestScore = 0;
    std::optional<TimeLayout> best;
    std::vector<std::pair<DateOrder, size_t>> scores;
    for (DateOrder order : orders) {
        TimeLayout tried = layout;
        tried.format = typical ? BuildFormat(*typical, *placement, order, joiner) : std::string();
        if (tried.format.empty()) {
            if (tried.useFormat) {
                refusal = {typical ? typical->number : 0,
                           "the dates and times of " + ColumnName(sample.excel, placement->column) +
                               " are shown in a way no template format reads"};
                return std::nullopt;
            }
            tried.format = DefaultFormat(tried.option);
        }
        FindDataRows(sample, tried, context);
        const size_t score = OrderScore(sample, tried, context) + tried.dataRows.size();
        scores.emplace_back(order, score);
        if (!best || score > bestScore)
            best = tried, bestScore = score;
    }
    layout = *best;
    if (layout.dataRows.empty()) {
        refusal = {typical ? typical->number : 0, "the dates and times of " + ColumnName(sample.excel, placement->column) +
                                                      " do not read with the format " + Quote(layout.format)};
        return std::nullopt;
    }
    if (!sample.excel &&
        CSpecification::CountFormatTokens(layout.format, context.delimiter) != layout.width) {
        refusal = {layout.startRow, "the date/time format " + Quote(layout.format) +
                                        " would not span its columns: the delimiter stands inside it"};
        return std::nullopt;
    }

    const SampleRow& startRow = sample.rows[layout.dataRows.front()];
    std::string example;
    for (size_t w = 0; w < spanned.size(); ++w)
        example += (w ? " + " : "") + Quote(Trimmed(startRow.cells[spanned[w]].text));
    findings.push_back({"DateTimeOption", OptionText(layout.option),
                        layout.width == 2 ? "the date and the time stand in two columns: " +
                                                ColumnName(sample.excel, placement->column) + " and the next hold " +
                                                example
                                          : ColumnName(sample.excel, placement->column) + " of the data rows holds " +
                                                KindText(kind) + ", such as " + example,
                        ""});
    const char* columnKey = layout.option == 1 ? "TimeCol" : layout.option == 2 ? "DateCol" : "DateTimeCol";
    findings.push_back({columnKey, std::to_string(layout.column),
                        layout.width == 2 ? "it spans 2 columns (the format holds the delimiter between its parts)"
                                          : "the first column of the date/time",
                        ""});
    const char* formatKey = layout.option == 1 ? "TimeFormat" : layout.option == 2 ? "DateFormat" : "DateTimeFormat";
    Finding format{formatKey, layout.format, "", ""};
    format.evidence = "reads the stamps of all " + std::to_string(layout.dataRows.size()) + " data rows read";
    if (!layout.useFormat)
        format.evidence = "not used: the cells hold day numbers shown as dates, which are read as they are";
    if (orders.size() == 2) {
        const bool dayWon = layout.format.rfind("DD", 0) == 0 || layout.format.find("DD") < layout.format.find("MM");
        const size_t dayScore = scores[0].second, monthScore = scores[1].second;
        format.ambiguity = "day-first or month-first: no day above 12 tells; ";
        format.ambiguity += dayScore == monthScore
                                ? "both read the rows equally well, so day-first was taken; check the dates"
                                : std::string(dayWon ? "day-first" : "month-first") +
                                      " gives the stamps that rise in even steps (" +
                                      std::to_string(std::max(dayScore, monthScore)) + " against " +
                                      std::to_string(std::min(dayScore, monthScore)) + ")";
    } else if (!votes.yearFirst) {
        format.evidence += votes.dayFirstSeen ? "; day-first, since a first number is above 12"
                                              : "; month-first, since a second number is above 12";
    }
    findings.push_back(format);
    if (sample.excel) {
        const char* useKey = layout.option == 1 ? "UseTFormat" : layout.option == 2 ? "UseDFormat" : "UseDTFormat";
        findings.push_back({useKey, layout.useFormat ? "1" : "0",
                            layout.useFormat ? "the cells are read as the texts they show, with the format"
                                             : "the cells hold day numbers, read as dates without a format",
                            ""});
    }
    if (!globalFinding.key.empty())
        findings.push_back(globalFinding);
    Finding start{"StartRow", std::to_string(layout.startRow),
                  (sample.excel ? "row " : "line ") + std::to_string(layout.startRow) +
                      " is the first whose date/time reads and that is followed by more such rows",
                  ""};
    size_t faults = 0;
    long firstFault = 0;
    for (size_t i = layout.dataRows.front(); i < sample.rows.size(); ++i)
        if (std::find(layout.dataRows.begin(), layout.dataRows.end(), i) == layout.dataRows.end() && faults++ == 0)
            firstFault = sample.rows[i].number;
    if (faults > 0)
        start.ambiguity = std::to_string(faults) + " later row(s) do not read as data (the first: " +
                          (sample.excel ? "row " : "line ") + std::to_string(firstFault) +
                          "); a conversion will fail there, and `velmora check --all` shows every fault";
    findings.push_back(start);
    return layout;
}

} // namespace guess
