#include "converter/AsciiSeriesReader.h"

#include "platform/system/Text.h"
#include "platform/units/Units.h"
#include "resources/StringTable.h"
#include "templates/HeaderCells.h"
#include "templates/Specification.h"

#include <algorithm>
#include <cstdint>
#include <map>

namespace converter {

namespace {

std::string Quote(std::string_view text)
{
    constexpr size_t kShown = 60;
    if (text.size() > kShown)
        return "'" + std::string(text.substr(0, kShown)) + "...'";
    return "'" + std::string(text) + "'";
}

bool IsValueTypeName(const std::string& name)
{
    int code = 0;
    return text::EqualsNoCase(name, "Instantaneous") || CSpecification::GetValueTypeCode(name, code);
}

} // namespace

struct AsciiSeriesReader::HeaderLines {
    std::map<long, std::string> byRow; // row number -> line, for the rows the template names
    long fileLines = 0;                // lines seen, up to the last row asked for

    // The line of `row`; empty when the row is below 1 or past the end of the file.
    std::string Line(long row) const
    {
        auto it = byRow.find(row);
        return it == byRow.end() ? std::string() : it->second;
    }
};

AsciiSeriesReader::AsciiSeriesReader(const CSpecification& spec)
    : m_spec(spec), m_splitter(spec.GetDialect()), m_dialect(m_splitter.dialect()), m_numbers(m_dialect.decimalSeparator),
      m_fusable(m_dialect.IsPlain()),
      m_pointDecimals(m_numbers.ReadsPlainDecimals())
{
}

sys::Status AsciiSeriesReader::Open(const std::string& path)
{
    m_path = path;
    m_header = SeriesHeader();
    m_formatColumns = m_spec.CountFormatColumns(1);
    m_stampColumn = m_spec.GetDateTimeColumn();
    const CDataDescription& data = m_spec.m_DataDesc;
    if (data.m_nStartRow < 1)
        return m_status = sys::Status::Fail(path, 0, "the data start row of the template must be 1 or more");
    if (m_stampColumn < 1)
        return m_status = sys::Status::Fail(path, 0, "the template's date/time option must be 0, 1 or 2");

    m_deleteInUse = data.m_nDeleteValueCheck != 0;
    HeaderLines lines;
    sys::Status status = ReadHeaderLines(lines);
    if (status)
        status = CountItems(lines);
    if (status)
        status = ReadNames(lines);
    if (status)
        status = ReadTypesUnitsValueTypes(lines);
    if (status)
        status = PrepareStamps();
    if (!status)
        return m_status = status;

    std::vector<size_t> all(m_itemCount);
    for (size_t i = 0; i < all.size(); ++i)
        all[i] = i;
    Select(all);

    // The data pass: a second reading from the start, passing over the header lines.
    if (sys::Status opened = m_lines.Open(path); !opened)
        return m_status = opened;
    std::string_view skipped;
    for (long row = 1; row < data.m_nStartRow; ++row)
        if (!m_lines.Next(skipped))
            break;
    return m_status = m_lines.status();
}

sys::Status AsciiSeriesReader::ReadHeaderLines(HeaderLines& lines)
{
    const CDataDescription& data = m_spec.m_DataDesc;
    std::vector<long> rows{data.m_nStartRow};
    if (data.m_nItemTitleOption == 0)
        rows.push_back(data.m_nItemDescriptionRow);
    if (data.m_nUnitTypeOption == 1)
        rows.push_back(data.m_nUnitTypeRow);
    if (data.m_nUnitOption == 1)
        rows.push_back(data.m_nUnitRow);
    if (data.m_nValueTypeOption == 1)
        rows.push_back(data.m_nValueTypeRow);
    if (m_deleteInUse && data.m_nDeleteValueRadio == 1)
        rows.push_back(data.m_nDeleteValueRow);
    const long last = *std::max_element(rows.begin(), rows.end());

    sys::TextLineReader source;
    if (sys::Status opened = source.Open(m_path); !opened)
        return opened;
    std::string_view line;
    while (source.LineNumber() < last && source.Next(line))
        if (std::find(rows.begin(), rows.end(), source.LineNumber()) != rows.end())
            lines.byRow[source.LineNumber()] = std::string(line);
    if (!source.status())
        return source.status();
    lines.fileLines = source.LineNumber();

    if (m_deleteInUse)
        m_deleteValue = data.m_nDeleteValueRadio == 1 ? lines.Line(data.m_nDeleteValueRow) : data.m_strDeleteValue;
    if (lines.fileLines < data.m_nStartRow)
        return sys::Status::Fail(m_path, data.m_nStartRow,
                            "the file has " + std::to_string(lines.fileLines) +
                                " lines; the template's data start row is past its end");
    return sys::Status::Ok();
}

// The item count from the data start line, and the item name line's agreement with it.
sys::Status AsciiSeriesReader::CountItems(const HeaderLines& lines)
{
    const CDataDescription& data = m_spec.m_DataDesc;
    const std::string startLine = lines.Line(data.m_nStartRow);
    m_splitter.Split(startLine);
    const auto& calls = m_splitter.Calls();
    if (calls.front().end == -1 || calls.front().text.size() == startLine.size())
        return sys::Status::Fail(m_path, data.m_nStartRow, res::LoadString(res::IDS_START_ROW_NO_DELIMITER));
    const long count = static_cast<long>(calls.size()) - 1 - m_formatColumns;
    if (count < 1)
        return sys::Status::Fail(m_path, data.m_nStartRow, res::LoadString(res::IDS_ITEM_COUNT_WRONG));
    m_itemCount = static_cast<size_t>(count);
    m_columns = static_cast<int>(calls.size()) - m_formatColumns;

    if (data.m_nItemTitleOption != 0)
        return sys::Status::Ok();
    const std::string nameLine = data.m_nItemDescriptionRow < 1 ? std::string() : lines.Line(data.m_nItemDescriptionRow);
    if (nameLine.empty())
        return sys::Status::Fail(m_path, data.m_nItemDescriptionRow, res::LoadString(res::IDS_ITEM_NAME_LINE_EMPTY));
    m_splitter.Split(nameLine);
    if (m_splitter.Calls().front().text.size() == nameLine.size())
        return sys::Status::Fail(m_path, data.m_nItemDescriptionRow, res::LoadString(res::IDS_ITEM_NAME_LINE_NO_DELIMITER));
    if (count > static_cast<long>(m_splitter.Calls().size()) - 1 - m_formatColumns)
        return sys::Status::Fail(m_path, data.m_nItemDescriptionRow, res::LoadString(res::IDS_NAME_COLUMNS_MISMATCH));
    return sys::Status::Ok();
}

sys::Status AsciiSeriesReader::ReadNames(const HeaderLines& lines)
{
    const CDataDescription& data = m_spec.m_DataDesc;
    if (data.m_nItemTitleOption == 1) {
        for (size_t i = 0; i < m_itemCount; ++i) {
            ItemInfo item;
            item.name = m_itemCount > data.m_vecItemDefs.size() ? "Item" + std::to_string(i + 1)
                                                                 : data.m_vecItemDefs[i].m_strTitle;
            m_header.items.push_back(item);
        }
        return sys::Status::Ok();
    }
    if (data.m_nItemTitleOption != 0)
        return sys::Status::Fail(m_path, 0, "the template's item title option must be 0 or 1");

    // Walks the name line column by column, the date/time titles taking W fields at column K.
    const long row = data.m_nItemDescriptionRow;
    const std::string nameLine = lines.Line(row);
    m_splitter.Split(nameLine);
    const auto& calls = m_splitter.Calls();
    const int length = static_cast<int>(m_splitter.Line().size());
    auto named = [&](std::string_view text) { return IsDeleted(text) ? std::string() : std::string(text); };
    std::vector<std::string> names;
    std::optional<std::string> title;
    int pos = 0;
    size_t next = 0;
    for (int j = 1; j <= m_columns; ++j) {
        if (j != m_stampColumn) {
            if (pos == -1 || pos >= length || next >= calls.size())
                return sys::Status::Fail(m_path, row, res::LoadString(res::IDS_NAME_COLUMNS_MISMATCH));
            const auto& call = calls[next++];
            pos = call.end;
            if (pos == -1)
                return sys::Status::Fail(m_path, row, res::LoadString(res::IDS_NAME_COLUMNS_MISMATCH));
            names.push_back(named(call.text));
            continue;
        }
        // Restart from the line's start (after any cut of leading delimiters).
        size_t restart = 0;
        for (size_t c = 0; c < calls.size(); ++c)
            if (calls[c].start == 0)
                restart = c;
        int p = 0;
        size_t c = restart;
        for (int k = 1; k < m_stampColumn; ++k) {
            if (p == -1)
                return sys::Status::Fail(m_path, row, res::LoadString(res::IDS_DATETIME_UNPARSABLE));
            p = calls[c++].end;
        }
        const size_t titleCall = c;
        for (int w = 0; w < m_formatColumns; ++w) {
            if (p >= length)
                return sys::Status::Fail(m_path, row, res::LoadString(res::IDS_ITEM_COUNT_WRONG));
            if (p != -1)
                p = calls[c++].end;
        }
        if (p != -1)
            title = named(calls[titleCall].text);
        pos = p;
        next = c;
    }
    if (title)
        m_header.timeTitle = *title;
    for (size_t i = 0; i < m_itemCount; ++i) {
        ItemInfo item;
        item.name = i < names.size() ? names[i] : std::string();
        m_header.items.push_back(item);
    }
    return sys::Status::Ok();
}

sys::Status AsciiSeriesReader::ReadTypesUnitsValueTypes(const HeaderLines& lines)
{
    const CDataDescription& data = m_spec.m_DataDesc;
    auto& items = m_header.items;

    // Item types and units: `count` fields from the start of their row, no date/time passed over.
    auto fromRow = [&](long row, int stringId, const char* what, auto cut, auto assign) -> sys::Status {
        const std::string line = lines.Line(row);
        if (line.empty())
            return sys::Status::Fail(m_path, row, res::LoadString(stringId));
        m_splitter.Split(line);
        size_t taken = 0;
        std::string dropped;
        const auto& calls = m_splitter.Calls();
        for (size_t c = 0; c < m_itemCount && c < calls.size() && calls[c].end != -1; ++c) {
            std::string value = cut(std::string(calls[c].text));
            // An item type the unit catalogue does not know is passed over, as the preview does.
            if (stringId == res::IDS_ITEM_TYPE_LINE_EMPTY && !units::LookupItemType(value)) {
                dropped = value;
                continue;
            }
            assign(items[taken++], std::move(value));
        }
        if (taken < m_itemCount)
            return sys::Status::Fail(m_path, row,
                                std::string("the ") + what + " row gives " + std::to_string(taken) + " of the " +
                                    std::to_string(m_itemCount) + " items" +
                                    (dropped.empty() ? std::string()
                                                     : "; the item type " + Quote(dropped) + " is not in the unit catalogue"));
        return sys::Status::Ok();
    };
    auto defs = [&](auto assign, auto member) {
        for (size_t i = 0; i < items.size(); ++i)
            assign(items[i], i < data.m_vecItemDefs.size() ? data.m_vecItemDefs[i].*member : std::string());
    };
    auto setType = [](ItemInfo& item, std::string value) { item.type = std::move(value); };
    auto setUnit = [](ItemInfo& item, std::string value) { item.unit = std::move(value); };
    auto setValueType = [](ItemInfo& item, std::string value) { item.valueType = std::move(value); };

    switch (data.m_nUnitTypeOption) {
    case 0: for (auto& item : items) item.type = data.m_strGlobalUnitType; break;
    case 1:
        if (sys::Status s = fromRow(data.m_nUnitTypeRow, res::IDS_ITEM_TYPE_LINE_EMPTY, "item type", TextBeforeBracket, setType); !s)
            return s;
        break;
    case 2: defs(setType, &CItemDefinition::m_strType); break;
    default: return sys::Status::Fail(m_path, 0, "the template's item type option must be 0, 1 or 2");
    }
    switch (data.m_nUnitOption) {
    case 0: for (auto& item : items) item.unit = data.m_strGlobalUnit; break;
    case 1:
        if (sys::Status s = fromRow(data.m_nUnitRow, res::IDS_UNIT_LINE_EMPTY, "unit", TextInBrackets, setUnit); !s)
            return s;
        break;
    case 2: defs(setUnit, &CItemDefinition::m_strUnit); break;
    default: return sys::Status::Fail(m_path, 0, "the template's unit option must be 0, 1 or 2");
    }
    switch (data.m_nValueTypeOption) {
    case 0:
        if (!IsValueTypeName(data.m_strGlobalValueType))
            return sys::Status::Fail(m_path, 0, res::LoadString(res::IDS_VALUE_TYPE_INVALID));
        for (auto& item : items)
            item.valueType = data.m_strGlobalValueType;
        break;
    case 1: {
        const long row = data.m_nValueTypeRow;
        const std::string line = lines.Line(row);
        if (line.empty())
            return sys::Status::Fail(m_path, row, res::LoadString(res::IDS_VALUE_TYPE_LINE_EMPTY));
        m_splitter.Split(line);
        const auto& calls = m_splitter.Calls();
        int pos = 0;
        for (size_t i = 0; i < m_itemCount; ++i) {
            if (pos == -1)
                return sys::Status::Fail(m_path, row, res::LoadString(res::IDS_VALUE_TYPE_LINE_SHORT));
            pos = calls[i].end;
            std::string name = TextAfterColon(std::string(calls[i].text));
            if (pos != -1 && !IsValueTypeName(name))
                return sys::Status::Fail(m_path, row, res::LoadString(res::IDS_VALUE_TYPE_INVALID) + " " + Quote(name));
            items[i].valueType = name;
        }
        break;
    }
    case 2: defs(setValueType, &CItemDefinition::m_strValueType); break;
    default: return sys::Status::Fail(m_path, 0, "the template's value type option must be 0, 1 or 2");
    }
    return sys::Status::Ok();
}

sys::Status AsciiSeriesReader::PrepareStamps()
{
    const CTimeDescription& time = m_spec.m_TimeDesc;
    // Fields joined for reading are separated by blanks; the delimiter also separates the format.
    const std::string extra = m_formatColumns > 1 ? m_dialect.delimiter : std::string();
    m_start = sys::DateTimeFields();
    switch (time.m_nDateTimeOption) {
    case 0:
        m_format = std::make_unique<sys::DateFormat>(time.m_strDateTimeFormat, sys::DateFormat::Reads::DateTime, extra);
        break;
    case 1: {
        sys::DateTimeFields date;
        date.year = 100;
        if (!sys::DateFormat("YYYY-MM-DD", sys::DateFormat::Reads::Date).Read(time.m_strGlobalDate, date))
            return sys::Status::Fail(m_path, 0, "the template's global date " + Quote(time.m_strGlobalDate) +
                                               " is not a date of the form YYYY-MM-DD");
        m_start.year = date.year, m_start.month = date.month, m_start.day = date.day;
        m_format = std::make_unique<sys::DateFormat>(time.m_strTimeFormat, sys::DateFormat::Reads::Time, extra);
        break;
    }
    case 2: {
        sys::DateTimeFields clock;
        if (!sys::DateFormat("HH:mm:ss", sys::DateFormat::Reads::Time).Read(time.m_strGlobalTime, clock))
            return sys::Status::Fail(m_path, 0, "the template's global time " + Quote(time.m_strGlobalTime) +
                                               " is not a time of the form HH:mm:ss");
        m_start.year = 100;
        m_start.hour = clock.hour, m_start.minute = clock.minute, m_start.second = clock.second;
        m_format = std::make_unique<sys::DateFormat>(time.m_strDateFormat, sys::DateFormat::Reads::Date, extra);
        break;
    }
    default: return sys::Status::Fail(m_path, 0, "the template's date/time option must be 0, 1 or 2");
    }
    m_stamps = std::make_unique<StampReader>(*m_format, m_start);
    return sys::Status::Ok();
}

void AsciiSeriesReader::Select(const std::vector<size_t>& items)
{
    SeriesReader::Select(items);
    m_slotOfItem.assign(m_itemCount, -1);
    for (size_t slot = 0; slot < items.size(); ++slot)
        if (items[slot] < m_itemCount)
            m_slotOfItem[items[slot]] = static_cast<int>(slot);
    // An item selected twice fills only its last slot; the others stay missing.
    const size_t filled = static_cast<size_t>(
        std::count_if(m_slotOfItem.begin(), m_slotOfItem.end(), [](int slot) { return slot >= 0; }));
    m_everySlotFilled = filled == items.size();
    m_selectedInFileOrder = m_everySlotFilled && std::is_sorted(items.begin(), items.end()) &&
                            std::adjacent_find(items.begin(), items.end()) == items.end();
    m_spans.resize(m_itemCount);
    m_spanItems.resize(m_itemCount);
    m_scratch.resize(m_itemCount);
}

bool AsciiSeriesReader::IsDeleted(std::string_view field) const
{
    return m_deleteInUse && field.size() == m_deleteValue.size() && text::EqualsNoCase(field, m_deleteValue);
}

bool AsciiSeriesReader::Next(Row& row)
{
    if (!m_status)
        return false;
    std::string_view line;
    while (m_lines.Next(line)) {
        if (line.empty())
            continue;
        if (m_fusable && m_fusedOn) {
            if (m_blockOn && m_stampColumn == 1 && m_formatColumns == 1 && ReadDataLineByBlocks(line, row))
                return true;
            if (ReadDataLineFused(line, row))
                return true;
        }
        if (ReadDataLine(line, row))
            return true;
        if (!PassOverFault())
            return false;
    }
    m_status = m_lines.status();
    return false;
}

bool AsciiSeriesReader::ReadStamp(size_t firstCall, Stamp& stamp)
{
    const auto& calls = m_splitter.Calls();
    std::string_view text = calls[firstCall].text;
    if (m_formatColumns > 1) {
        m_stampBuffer.assign(text);
        for (int w = 1; w < m_formatColumns; ++w) {
            m_stampBuffer.push_back(' ');
            m_stampBuffer.append(calls[firstCall + static_cast<size_t>(w)].text);
        }
        text = m_stampBuffer;
    }
    const long line = m_lines.LineNumber();
    sys::DateTimeFields fields = m_start;
    if (!m_format->Read(text, fields))
        return Fail(m_path, line, res::LoadString(res::IDS_DATETIME_UNPARSABLE) + " " + Quote(text));
    std::optional<Stamp> value = StampFromFields(fields);
    if (!value)
        return Fail(m_path, line, "the date/time " + Quote(text) + " does not exist in the calendar");
    stamp = *value;
    return true;
}

bool AsciiSeriesReader::ReadFieldValue(const char* field, size_t size, double& value) const
{
    if (IsDeleted({field, size})) {
        value = kMissing;
        return true;
    }
    if (m_pointDecimals && ReadPlainField(field, size, value))
        return true;
    double read = kMissing;
    switch (m_numbers.Read({field, size}, read)) {
    case ValueText::Number: value = read; return true;
    case ValueText::Empty: value = kMissing; return true;
    default: return false;
    }
}

bool AsciiSeriesReader::ReadDataLineByBlocks(std::string_view line, Row& row)
{
    delimited::DelimiterWalk delimiters(line, m_dialect.delimiter[0]);
    const size_t length = line.size();
    const size_t stampEnd = delimiters.Next();
    // No delimiter, a line ending just after the date/time, or a quote: the general walk's to judge.
    if (stampEnd + 1 >= length || line[0] == '"')
        return false;
    if (!m_stamps->Read(line.substr(0, stampEnd), row.stamp))
        return false;

    // The fields of the selected items, in the file's order.
    // (Locals, so that the stores into the spans need not reload them.)
    FieldSpan* const spans = m_spans.data();
    size_t* const spanItems = m_spanItems.data();
    const int* const slotOfItem = m_slotOfItem.data();
    size_t count = 0;
    const size_t lastItem = m_itemCount - 1;
    size_t start = stampEnd + 1;
    for (size_t item = 0; item <= lastItem; ++item) {
        const size_t end = delimiters.Next();
        // Every item but the last ends at a delimiter, the last at the line's end.
        if ((end == length) != (item == lastItem))
            return false;
        if (end > start && line[start] == '"')
            return false;
        if (slotOfItem[item] >= 0) {
            spanItems[count] = item;
            spans[count++] = FieldSpan{static_cast<std::uint32_t>(start), static_cast<std::uint32_t>(end - start)};
        }
        start = end + 1;
    }

    if (m_everySlotFilled)
        row.values.resize(m_selection.size());
    else
        row.values.assign(m_selection.size(), kMissing);
    // In file order the values go straight into the row, else through the scratch row.
    double* const values = m_selectedInFileOrder ? row.values.data() : m_scratch.data();
    const bool plainFirst = m_pointDecimals && !m_deleteInUse;
    for (size_t done = 0; done < count; ++done) {
        if (plainFirst) {
            done += m_readPlain(line.data(), spans + done, count - done, values + done);
            if (done == count)
                break;
        }
        if (!ReadFieldValue(line.data() + spans[done].start, spans[done].length, values[done]))
            return false;
    }
    if (!m_selectedInFileOrder)
        for (size_t i = 0; i < count; ++i)
            row.values[static_cast<size_t>(m_slotOfItem[m_spanItems[i]])] = values[i];
    return true;
}

namespace {

// The next field of a plain line, with a field that is a plain decimal read on the way (`read` then
// true and `value` set). False when the field is the rule's to take.
bool NextReading(delimited::PlainFields& fields, std::string_view line, std::string_view& text, int& end,
                 double& value, bool& read)
{
    read = false;
    if (const size_t at = fields.Position(); at < line.size()) {
        const char* const stop = ScanPlainDecimal(line.data() + at, line.data() + line.size(), value);
        if (stop != nullptr && fields.TakeEndingAt(static_cast<size_t>(stop - line.data()), text, end)) {
            read = true;
            return true;
        }
    }
    return fields.Next(text, end);
}

} // namespace

// The same walk as ReadDataLine, with the fields taken as it goes instead of from a split line. A
// first field that is the whole line (no delimiter in it) is ReadDataLine's to report.
bool AsciiSeriesReader::ReadDataLineFused(std::string_view line, Row& row)
{
    delimited::PlainFields fields(line, m_dialect.delimiter[0]);
    const bool readsPlain = m_numbers.ReadsPlainDecimals();
    const int length = static_cast<int>(line.size());
    row.values.assign(m_selection.size(), kMissing);
    bool hadStamp = false;
    int pos = 0;
    int j = 0;
    size_t item = 0;
    std::string_view text;
    while (pos != -1) {
        if (j + 1 == m_stampColumn) {
            std::string_view stampText;
            for (int w = 0; w < m_formatColumns; ++w) {
                if (pos == -1 || !fields.Next(text, pos) || text.size() == line.size())
                    return false;
                if (w == 0) {
                    stampText = text;
                } else {
                    if (w == 1)
                        m_stampBuffer.assign(stampText);
                    m_stampBuffer.push_back(' ');
                    m_stampBuffer.append(text);
                }
            }
            if (m_formatColumns > 1)
                stampText = m_stampBuffer;
            if (!m_stamps->Read(stampText, row.stamp))
                return false;
            hadStamp = true;
            j += m_formatColumns - 1;
            if (pos == length) {
                pos = -1;
                ++j;
            }
        } else {
            const int slot = item < m_slotOfItem.size() ? m_slotOfItem[item] : -1;
            double value = kMissing;
            bool scanned = false;
            const bool taken = slot >= 0 && readsPlain ? NextReading(fields, line, text, pos, value, scanned)
                                                       : fields.Next(text, pos);
            if (!taken || text.size() == line.size())
                return false;
            if (pos != -1) {
                ++item;
                if (slot >= 0 && !IsDeleted(text)) {
                    const ValueText read = scanned ? ValueText::Number : m_numbers.Read(text, value);
                    if (read == ValueText::Number)
                        row.values[static_cast<size_t>(slot)] = value;
                    else if (read != ValueText::Empty)
                        return false;
                }
            }
        }
        ++j;
    }
    return m_columns == j - m_formatColumns && hadStamp;
}

// The data line as the preview parser walks it: column j runs over the logical columns, the
// date/time taking W fields at column K; the line must end up with the start line's columns.
bool AsciiSeriesReader::ReadDataLine(std::string_view line, Row& row)
{
    const long lineNumber = m_lines.LineNumber();
    if (!delimited::Delimiter(m_dialect.delimiter).FoundIn(line))
        return Fail(m_path, lineNumber, res::LoadString(res::IDS_NO_DELIMITERS));
    m_splitter.Split(line);
    if (m_splitter.QuoteError())
        return Fail(m_path, lineNumber, res::LoadString(res::IDS_QUOTE_OR_DELIMITER_MISSING));
    const auto& calls = m_splitter.Calls();
    const int length = static_cast<int>(m_splitter.Line().size());

    row.values.assign(m_selection.size(), kMissing);
    bool hadStamp = false;
    int pos = 0;
    size_t next = 0;
    int j = 0;
    size_t item = 0;
    while (pos != -1) {
        if (j + 1 == m_stampColumn) {
            const size_t first = next;
            for (int w = 0; w < m_formatColumns; ++w) {
                if (pos == -1)
                    return Fail(m_path, lineNumber, res::LoadString(res::IDS_DATETIME_UNPARSABLE));
                pos = calls[next++].end;
            }
            if (!ReadStamp(first, row.stamp))
                return false;
            hadStamp = true;
            j += m_formatColumns - 1;
            if (pos == length) {
                pos = -1;
                ++j;
            }
        } else {
            const delimited::FieldSplitter::Call& call = calls[next++];
            pos = call.end;
            if (pos != -1) {
                const int slot = item < m_slotOfItem.size() ? m_slotOfItem[item] : -1;
                ++item;
                if (slot >= 0 && !IsDeleted(call.text)) {
                    double value = kMissing;
                    const int column = j + 1;
                    switch (m_numbers.Read(call.text, value)) {
                    case ValueText::Number: row.values[static_cast<size_t>(slot)] = value; break;
                    case ValueText::Empty: break;
                    case ValueText::WrongSeparator:
                        return Fail(m_path, lineNumber,
                                    res::LoadString(res::IDS_DECIMAL_SEPARATOR_MISMATCH) + " " + Quote(call.text), column);
                    case ValueText::NotANumber:
                        return Fail(m_path, lineNumber,
                                    "the value " + Quote(call.text) + " of item '" + m_header.items[item - 1].name +
                                        "' is not a number",
                                    column);
                    }
                }
            }
        }
        ++j;
    }
    if (m_columns != j - m_formatColumns)
        return Fail(m_path, lineNumber,
                    res::LoadString(res::IDS_ITEM_COUNT_WRONG) + " (" + std::to_string(j - m_formatColumns) +
                        " columns where the data start line has " + std::to_string(m_columns) + ")");
    if (!hadStamp)
        return Fail(m_path, lineNumber, res::LoadString(res::IDS_NO_DATETIME_COLUMN));
    return true;
}

} // namespace converter
