#include "guess/ItemGuess.h"

#include "guess/CellKinds.h"
#include "templates/HeaderCells.h"
#include "platform/system/Text.h"
#include "platform/units/Units.h"

#include <algorithm>
#include <map>

namespace guess {
namespace {

enum Part : size_t { kType = 0, kUnit = 1, kValueType = 2 };
constexpr const char* kPartKeys[3][2] = {
    {"UnitTypeOption", "UnitTypeRow"}, {"UnitOption", "UnitRow"}, {"ValueTypeOption", "ValueTypeRow"}};
constexpr const char* kPartNames[3] = {"item types", "units", "value types"};
constexpr const char* kGlobals[3] = {"Undefined", "Undefined", "Instantaneous"};

std::string Quote(std::string_view text) { return "'" + text::EscapeControls(text) + "'"; }

// How a header row's cells stand to the item columns.
enum class Alignment {
    None,      // it cannot be matched to the items: a title or a note
    Columns,   // a cell above every column, the date/time's too
    ItemsOnly, // one cell per item, from the first field on (what a text template's type, unit and
               // value type rows hold)
    OneTitle,  // one title before the items although the date/time spans more columns
};

struct HeaderRow {
    const SampleRow* row = nullptr;
    Alignment alignment = Alignment::None;
    std::vector<std::string> cells; // one per item
    std::array<size_t, 3> matched{}; // cells naming a known item type, a unit, a value type
    size_t texts = 0;                // cells with a text that is no number
};

bool IsInteger(const std::string& text)
{
    return !text.empty() && text.find_first_not_of("0123456789") == std::string::npos;
}

bool IsItemType(const std::string& cell)
{
    const std::string text = TextBeforeBracket(cell);
    if (text.empty())
        return false;
    return units::LookupItemType(text) != nullptr;
}

// A unit of any item type, by key, name or abbreviation.
const units::Unit* FindAnyUnit(const std::string& text)
{
    if (text.empty())
        return nullptr;
    for (const units::ItemType& type : units::ItemTypes())
        if (const units::Unit* unit = units::LookupUnit(type, text))
            return unit;
    return nullptr;
}

bool IsValueType(const std::string& cell)
{
    const std::string text = TextAfterColon(cell);
    int code = 0;
    return text::EqualsNoCase(text, "Instantaneous") || CSpecification::GetValueTypeCode(text, code);
}

HeaderRow ReadHeaderRow(const SampleRow& row, const ItemLayout& items, const TimeLayout& time, const TimeContext& context,
                        bool excel)
{
    HeaderRow header;
    header.row = &row;
    const size_t m = items.columns.size();
    std::vector<std::string> fields;
    for (const SampleCell& cell : row.cells)
        fields.push_back(Trimmed(cell.text));
    // A line ending in its delimiter has one more, empty, field.
    if (!excel && !fields.empty() && fields.back().empty() && fields.size() != context.fieldCount &&
        fields.size() != m)
        fields.pop_back();
    if (excel || fields.size() >= context.fieldCount) {
        header.alignment = Alignment::Columns;
        for (size_t column : items.columns)
            header.cells.push_back(column < fields.size() ? fields[column] : std::string());
    } else if (fields.size() == m) {
        header.alignment = Alignment::ItemsOnly;
        header.cells = fields;
    } else if (time.width > 1 && fields.size() == m + 1) {
        header.alignment = Alignment::OneTitle;
        header.cells.assign(fields.begin() + 1, fields.end());
    } else {
        return header;
    }
    for (const std::string& cell : header.cells) {
        double value = 0;
        if (cell.empty())
            continue;
        const bool number = ReadNumber(cell, ".", value) == ValueText::Number;
        header.texts += number ? 0 : 1;
        header.matched[kType] +=
            (number ? IsInteger(cell) && cell.size() <= 6 && units::FindItemType(text::AtoI(cell)) : IsItemType(cell)) ? 1 : 0;
        header.matched[kUnit] += FindAnyUnit(TextInBrackets(cell)) ? 1 : 0;
        header.matched[kValueType] += !number && IsValueType(cell) ? 1 : 0;
    }
    return header;
}

// A part's row: the row most of whose cells name such things; the one nearest the data on a tie.
const HeaderRow* RowOfPart(const std::vector<HeaderRow>& rows, Part part, size_t m)
{
    const HeaderRow* best = nullptr;
    for (const HeaderRow& row : rows)
        if (row.alignment != Alignment::None && row.matched[part] * 2 >= m && row.matched[part] > 0 &&
            (!best || row.matched[part] >= best->matched[part]))
            best = &row;
    return best;
}

bool HasRole(const HeaderRow& row, const std::array<const HeaderRow*, 3>& parts)
{
    return std::find(parts.begin(), parts.end(), &row) != parts.end();
}

// The names: the text row nearest the data that holds nothing else; else the nearest text row.
const HeaderRow* NameRow(const std::vector<HeaderRow>& rows, const std::array<const HeaderRow*, 3>& parts, size_t m)
{
    for (bool allowShared : {false, true})
        for (auto it = rows.rbegin(); it != rows.rend(); ++it)
            if (it->alignment != Alignment::None && it->texts * 2 >= m && it->texts > 0 &&
                (allowShared || !HasRole(*it, parts)))
                return &*it;
    return nullptr;
}

// The value of part `part` for item `i` as the definitions hold it.
std::string DefinitionValue(const HeaderRow* row, Part part, size_t i)
{
    if (!row)
        return kGlobals[part];
    const std::string& cell = row->cells[i];
    switch (part) {
    case kType: {
        const std::string text = TextBeforeBracket(cell);
        if (const units::ItemType* type = units::LookupItemType(text); type && !text.empty())
            return type->name;
        return "Undefined";
    }
    case kUnit: {
        const std::string text = TextInBrackets(cell);
        return text.empty() ? std::string("Undefined") : text;
    }
    default: return IsValueType(cell) ? TextAfterColon(cell) : std::string("Instantaneous");
    }
}

// True when the reader takes the part from the row as it stands.
bool ReadableAsRow(const HeaderRow& row, Part part, size_t m, bool excel)
{
    const bool placed = excel ? row.alignment == Alignment::Columns : row.alignment == Alignment::ItemsOnly;
    if (!placed)
        return false;
    if (part == kUnit) {
        for (const std::string& cell : row.cells)
            if (TextInBrackets(cell).empty())
                return false;
        return row.matched[kUnit] == m || !excel;
    }
    return row.matched[part] == m;
}

std::string RowName(bool excel, long number) { return (excel ? "row " : "line ") + std::to_string(number); }

std::string Examples(const std::vector<std::string>& cells)
{
    std::string text;
    for (size_t i = 0; i < cells.size() && i < 3; ++i)
        text += (i ? ", " : "") + Quote(cells[i]);
    return text + (cells.size() > 3 ? ", ..." : "");
}

void GuessHeader(const Sample& sample, const TimeLayout& time, const TimeContext& context, ItemLayout& items,
                 std::vector<Finding>& findings)
{
    const size_t m = items.columns.size();
    std::vector<HeaderRow> rows;
    for (const SampleRow& row : sample.rows)
        if (row.number < time.startRow)
            rows.push_back(ReadHeaderRow(row, items, time, context, sample.excel));
    std::array<const HeaderRow*, 3> parts{};
    for (Part part : {kType, kUnit, kValueType})
        parts[part] = RowOfPart(rows, part, m);
    const HeaderRow* names = NameRow(rows, parts, m);

    Finding nameFinding{"ItemTitleOption", "", "", ""};
    if (names && names->alignment == Alignment::Columns) {
        items.titleOption = 0;
        items.nameRow = static_cast<int>(names->row->number);
        nameFinding.value = "0 (names in ItemDescriptionRow " + std::to_string(items.nameRow) + ")";
        nameFinding.evidence = RowName(sample.excel, items.nameRow) + " names the columns above the data: " +
                               Examples(names->cells);
    } else {
        items.titleOption = 1;
        nameFinding.value = "1 (names in the item definitions)";
        nameFinding.evidence =
            names ? RowName(sample.excel, names->row->number) +
                        " names the items but has no title above the date/time, which a name row must have: the names " +
                        Examples(names->cells) + " are written into the template"
                  : "no row above the data names the items: they are called Item1 to Item" + std::to_string(m);
    }
    findings.push_back(nameFinding);

    bool definitionsNeeded = items.titleOption == 1;
    for (Part part : {kType, kUnit, kValueType}) {
        const HeaderRow* row = parts[part];
        Finding finding{kPartKeys[part][0], "", "", ""};
        if (!row) {
            items.options[part] = 0;
            finding.value = std::string("0 (") + kGlobals[part] + " for all items)";
            finding.evidence = std::string("no row above the data holds ") + kPartNames[part];
        } else if (ReadableAsRow(*row, part, m, sample.excel) && !(items.titleOption == 0 && row == names)) {
            items.options[part] = 1;
            items.rows[part] = static_cast<int>(row->row->number);
            finding.value = "1 (" + std::string(kPartKeys[part][1]) + " " + std::to_string(items.rows[part]) + ")";
            finding.evidence = RowName(sample.excel, items.rows[part]) + " holds " + kPartNames[part] + ": " +
                               Examples(row->cells);
        } else {
            items.options[part] = 2;
            definitionsNeeded = true;
            finding.value = "2 (in the item definitions)";
            finding.evidence = RowName(sample.excel, row->row->number) + " holds " + kPartNames[part] + " (" +
                               std::to_string(row->matched[part]) + " of " + std::to_string(m) + " known): " +
                               Examples(row->cells);
            if (row == names && items.titleOption == 0)
                finding.ambiguity = "the same row names the items, and a row serves one purpose only: the " +
                                    std::string(kPartNames[part]) + " are written into the template";
            else if (!sample.excel && row->alignment != Alignment::ItemsOnly)
                finding.ambiguity = "the row has a cell above the date/time, but a text template reads " +
                                    std::string(kPartNames[part]) + " from the first field on: they are written into "
                                                                     "the template";
            else
                finding.ambiguity = "not every cell names one the catalogue knows; the others become " +
                                    std::string(kGlobals[part]);
        }
        findings.push_back(finding);
    }
    if (!definitionsNeeded)
        return;
    for (size_t i = 0; i < m; ++i) {
        CItemDefinition item;
        item.m_strTitle = names && !names->cells[i].empty() ? names->cells[i] : text::Format("Item%d", static_cast<int>(i + 1));
        item.m_strType = DefinitionValue(parts[kType], kType, i);
        item.m_strUnit = DefinitionValue(parts[kUnit], kUnit, i);
        item.m_strValueType = DefinitionValue(parts[kValueType], kValueType, i);
        items.definitions.push_back(item);
    }
}

struct ColumnValues {
    size_t numbers = 0;
    std::map<std::string, size_t> texts;     // non-numbers by text
    std::map<std::string, size_t> sentinels; // numbers that mark a missing value
};

std::vector<ColumnValues> ReadValues(const Sample& sample, const TimeLayout& time, const ItemLayout& items,
                                     const std::string& decimal)
{
    std::vector<ColumnValues> columns(items.columns.size());
    for (size_t index : time.dataRows) {
        const SampleRow& row = sample.rows[index];
        for (size_t i = 0; i < items.columns.size(); ++i) {
            if (items.columns[i] >= row.cells.size())
                continue;
            const SampleCell& cell = row.cells[items.columns[i]];
            double value = 0;
            const std::string text = Trimmed(cell.text);
            switch (ValueOf(cell, decimal, value)) {
            case ValueKind::Number:
                ++columns[i].numbers;
                if (!cell.numberCell ? IsSentinelNumber(text) : IsSentinelNumber(text::Format("%.15g", value)))
                    ++columns[i].sentinels[cell.numberCell ? text::Format("%.15g", value) : text];
                break;
            case ValueKind::Text: ++columns[i].texts[text]; break;
            case ValueKind::Empty: break;
            }
        }
    }
    return columns;
}

void GuessDeleteValue(const std::vector<ColumnValues>& columns, ItemLayout& items, std::vector<Finding>& findings)
{
    std::map<std::string, size_t> markers, sentinels;
    for (const ColumnValues& column : columns) {
        // A text that stands in a column of numbers, as the only text there, marks missing values.
        if (column.texts.size() == 1 && column.numbers > 0)
            markers[column.texts.begin()->first] += column.texts.begin()->second;
        for (const auto& [text, count] : column.sentinels)
            sentinels[text] += count;
    }
    std::string best;
    size_t bestCount = 0;
    bool bestIsNumber = false;
    for (const auto* found : {&sentinels, &markers})
        for (const auto& [text, count] : *found)
            if (count >= 2 && count > bestCount)
                best = text, bestCount = count, bestIsNumber = found == &sentinels;
    Finding finding{"DeleteValueCheck", "0 (no delete value)", "no value recurs that marks a missing value", ""};
    if (bestCount > 0) {
        items.deleteInUse = true;
        items.deleteValue = best;
        finding.value = "1 (DeleteValue " + Quote(best) + ")";
        finding.evidence = Quote(best) + " stands " + std::to_string(bestCount) + " times among the values" +
                           (bestIsNumber ? ", a number files use for no value" : ", a text where numbers stand");
        std::string others;
        for (const auto* found : {&sentinels, &markers})
            for (const auto& [text, count] : *found)
                if (text != best && count >= 2)
                    others += (others.empty() ? "" : ", ") + Quote(text) + " (" + std::to_string(count) + " times)";
        if (!others.empty())
            finding.ambiguity = "a template has one delete value; also recurring: " + others +
                                ", which will read as numbers or fail";
    }
    findings.push_back(finding);
}

} // namespace

std::optional<ItemLayout> GuessItems(const Sample& sample, const TimeLayout& time, const TimeContext& context,
                                     const std::string& decimalSeparator, std::vector<Finding>& findings,
                                     Refusal& refusal)
{
    ItemLayout items;
    size_t first = 0;
    if (sample.excel) {
        first = context.fieldCount;
        for (const SampleRow& row : sample.rows)
            for (size_t c = 0; c < row.cells.size() && c < first; ++c)
                if (!row.cells[c].text.empty() || row.cells[c].numberCell) {
                    first = c;
                    break;
                }
    }
    const size_t stampFrom = static_cast<size_t>(time.column - 1), stampTo = stampFrom + static_cast<size_t>(time.width);
    for (size_t c = first; c < context.fieldCount; ++c)
        if (c < stampFrom || c >= stampTo)
            items.columns.push_back(c);
    const SampleRow& startRow = sample.rows[time.dataRows.front()];
    if (items.columns.empty()) {
        refusal = {startRow.number, "the data rows hold a date/time but no values"};
        return std::nullopt;
    }

    const std::vector<ColumnValues> values = ReadValues(sample, time, items, decimalSeparator);
    GuessDeleteValue(values, items, findings);
    std::vector<size_t> textColumns;
    for (size_t i = 0; i < values.size(); ++i) {
        size_t texts = 0;
        for (const auto& [text, count] : values[i].texts)
            texts += text::EqualsNoCase(text, items.deleteValue) && items.deleteInUse ? 0 : count;
        if (texts > 0)
            textColumns.push_back(i);
        else
            items.selected.push_back(static_cast<unsigned>(i));
    }
    if (items.selected.empty()) {
        refusal = {startRow.number, "no value column of the data rows holds numbers"};
        return std::nullopt;
    }
    if (textColumns.empty()) {
        items.selected.clear();
    } else {
        std::string which;
        for (size_t i : textColumns)
            which += (which.empty() ? "" : ", ") + std::to_string(i);
        CString selected;
        CSpecification::FormatSelItems(items.selected, selected);
        findings.push_back({"SelItems", selected,
                            "the items " + which + " hold texts, not numbers (such as " +
                                Quote(values[textColumns[0]].texts.begin()->first) + "); only the others are selected",
                            ""});
    }
    GuessHeader(sample, time, context, items, findings);
    return items;
}

} // namespace guess
