#include "parsers/AsciiFilePreviewParser.h"

#include "parsers/FieldCursor.h"
#include "parsers/FileException.h"
#include "platform/system/FileSystem.h"
#include "platform/system/Text.h"
#include "platform/system/TextLineReader.h"
#include "platform/units/Units.h"
#include "resources/StringTable.h"
#include "templates/HeaderCells.h"
#include "templates/Specification.h"

#include <algorithm>

namespace {

// The lines of the bound file for the parser's operations, which let a file that cannot be read
// through as CFileException. A preview reads at most what it shows: the start of a long line is
// kept, the rest read past.
class PreviewLines {
public:
    explicit PreviewLines(const CString& path)
    {
        if (const sys::Status opened = m_reader.Open(path); !opened)
            throw CFileException(opened.problem());
    }
    // The next line, at most `keep` bytes of it; false at the end of the file.
    bool Read(CString& line, size_t keep = sys::kLongestTextLine) { return Went(m_reader.Read(line, keep)); }
    bool Skip() { return Went(m_reader.Skip()); }
    long LineNumber() const { return m_reader.LineNumber(); }

private:
    bool Went(bool read) const
    {
        if (!read && !m_reader.status())
            throw CFileException(m_reader.status().problem());
        return read;
    }

    sys::TextLineReader m_reader{sys::TextLineReader::OverlongLine::NoLineBreak, 64 * 1024};
};

// Raw lines are shown with tabs opened up, as a list control cannot show them, and at most their
// first kShownLineBytes bytes.
ui::Row RawRow(const CString& line)
{
    CString shown;
    size_t from = 0;
    const size_t end = std::min(line.size(), CAsciiFilePreviewParser::kShownLineBytes);
    for (size_t tab = line.find('\t'); tab < end; from = tab + 1, tab = line.find('\t', from)) {
        shown.append(line, from, tab - from);
        shown += "    ";
    }
    shown.append(line, from, end - std::min(from, end));
    if (end < line.size())
        text::DropPartialCharacter(shown);
    return ui::Row{std::move(shown)};
}

bool IsKnownValueType(const CString& name)
{
    int code = 0;
    return text::EqualsNoCase(name, "Instantaneous") || CSpecification::GetValueTypeCode(name, code);
}

// The date/time text of a data line: from `start` up to the delimiter (of `delimiterLength`
// characters) in front of `end`, or to the end of the line when the fields ran to it.
CString DateTimeTextOf(const CString& line, int start, int end, int delimiterLength)
{
    // After a line's trailing delimiter the position stands one past its end: nothing is left.
    if (start >= static_cast<int>(line.size()))
        return CString();
    if (end < 0 || end >= static_cast<int>(line.size()))
        return line.substr(static_cast<size_t>(start));
    if (end - delimiterLength <= start)
        return CString();
    return line.substr(static_cast<size_t>(start), static_cast<size_t>(end - delimiterLength - start));
}

} // namespace

bool CAsciiFilePreviewParser::DeleteValue::Matches(const CString& field) const
{
    return active && text::EqualsNoCase(field, text);
}

bool CAsciiFilePreviewParser::HasTemplateAndFile()
{
    if (!m_pSpecification)
        return Fail(m_strFile, 0, "there is no template to read it with");
    if (!sys::FileExists(m_strFile))
        return Fail(m_strFile, 0, "the file does not exist");
    return true;
}

int CAsciiFilePreviewParser::ReadLine(int n, CString& text)
{
    if (n < 0)
        return 0;
    if (!sys::FileExists(m_strFile))
        return Fail(m_strFile, 0, "the file does not exist");
    PreviewLines reader(m_strFile);
    text.clear();
    int passed = 0;
    while (passed + 1 < n && reader.Skip())
        ++passed;
    if (passed + 1 == n && !reader.Read(text))
        text.clear();
    return 1;
}

bool CAsciiFilePreviewParser::ReadHeaderLine(int n, int emptyMessageId, CString& line)
{
    line = ReadLineOrEmpty(n);
    if (!line.empty())
        return true;
    return Refuse(emptyMessageId, n);
}

CString CAsciiFilePreviewParser::ReadLineOrEmpty(int n)
{
    CString line;
    if (n < 1 || !ReadLine(n, line))
        return CString();
    return line;
}

CAsciiFilePreviewParser::DeleteValue CAsciiFilePreviewParser::DetermineDeleteValue()
{
    const CDataDescription& data = m_pSpecification->m_DataDesc;
    DeleteValue value;
    if (data.m_nDeleteValueCheck != 1)
        return value;
    value.active = true;
    value.text = data.m_nDeleteValueRadio == 1 ? ReadLineOrEmpty(data.m_nDeleteValueRow) : data.m_strDeleteValue;
    return value;
}

bool CAsciiFilePreviewParser::CountItemFields(const CString& line, long number, bool isDataLine, int& items)
{
    const int dateTimeFields = m_pSpecification->CountFormatColumns(1);
    CFieldCursor cursor(*m_pSpecification, line);
    const CString first = cursor.Next();
    const bool noDelimiter = first == cursor.Line() || (isDataLine && cursor.AtEnd());
    if (noDelimiter)
        return Refuse(isDataLine ? res::IDS_START_ROW_NO_DELIMITER : res::IDS_ITEM_NAME_LINE_NO_DELIMITER, number);
    items = 0;
    for (int i = 1; !cursor.AtEnd(); ++i) {
        if (i >= dateTimeFields + 1)
            ++items;
        cursor.Next();
    }
    return true;
}

int CAsciiFilePreviewParser::GetItemCount(int& count)
{
    count = 0;
    if (!HasTemplateAndFile())
        return 0;
    const CDataDescription& data = m_pSpecification->m_DataDesc;
    CString startLine;
    if (data.m_nStartRow < 1)
        return Fail(m_strFile, 0, "the template's data start row is below 1");
    if (!ReadLine(data.m_nStartRow, startLine))
        return 0;
    if (!CountItemFields(startLine, data.m_nStartRow, true, count))
        return 0;
    if (count < 1)
        return Refuse(res::IDS_ITEM_COUNT_WRONG, data.m_nStartRow);
    if (data.m_nItemTitleOption == 0) {
        CString nameLine;
        if (!ReadHeaderLine(data.m_nItemDescriptionRow, res::IDS_ITEM_NAME_LINE_EMPTY, nameLine))
            return 0;
        int names = 0;
        if (!CountItemFields(nameLine, data.m_nItemDescriptionRow, false, names))
            return 0;
        if (count > names)
            return Refuse(res::IDS_NAME_COLUMNS_MISMATCH, data.m_nItemDescriptionRow);
    }
    return 1;
}

int CAsciiFilePreviewParser::GetItemNames(CStringList& names)
{
    names.clear();
    int count = 0;
    if (!GetItemCount(count))
        return 0;
    const CDataDescription& data = m_pSpecification->m_DataDesc;
    const size_t wanted = static_cast<size_t>(count);
    if (data.m_nItemTitleOption == 1) {
        if (wanted > data.m_vecItemDefs.size()) {
            for (int i = 1; i <= count; ++i)
                names.push_back(text::Format("Item%d", i));
        } else {
            for (size_t i = 0; i < wanted; ++i)
                names.push_back(data.m_vecItemDefs[i].m_strTitle);
        }
        return 1;
    }
    if (data.m_nItemTitleOption != 0)
        return Fail(m_strFile, 0, text::Format("the template's item title option is %d, not 0 or 1", data.m_nItemTitleOption));
    if (data.m_nItemDescriptionRow < 1)
        return 0;
    CString line;
    if (!ReadHeaderLine(data.m_nItemDescriptionRow, res::IDS_ITEM_NAME_LINE_EMPTY, line))
        return 0;
    const int firstDateTimeField = m_pSpecification->GetDateTimeColumn();
    const int dateTimeFields = m_pSpecification->CountFormatColumns(1);
    CFieldCursor cursor(*m_pSpecification, line);
    for (int field = 1; field < firstDateTimeField && !cursor.AtEnd() && names.size() < wanted; ++field)
        names.push_back(cursor.Next());
    for (int i = 0; i < dateTimeFields && !cursor.AtEnd(); ++i)
        cursor.Next();
    while (!cursor.AtEnd() && names.size() < wanted)
        names.push_back(cursor.Next());
    return 1;
}

int CAsciiFilePreviewParser::TakeHeaderFields(const CString& line, int count, CStringList& fields)
{
    CFieldCursor cursor(*m_pSpecification, line);
    for (int i = 0; i < count && !cursor.AtEnd(); ++i) {
        CString field = cursor.Next();
        if (!cursor.AtEnd())
            fields.push_back(std::move(field));
    }
    return static_cast<int>(fields.size());
}

bool CAsciiFilePreviewParser::IsKnownItemType(const CString& name) const
{
    int number = 0;
    const bool numeric = name.empty() || text::ScanInt(name, number);
    for (int s = 1; s <= ruqGetItemTypeCount(); ++s) {
        int key = 0;
        CString typeName;
        if (!ruqGetItemTypeSeq(s, &key, &typeName))
            continue;
        if (numeric ? number == key : text::EqualsNoCase(name, typeName))
            return true;
    }
    return false;
}

int CAsciiFilePreviewParser::GetItemTypes(CStringList& types)
{
    int count = 0;
    if (!GetItemCount(count))
        return 0;
    const CDataDescription& data = m_pSpecification->m_DataDesc;
    switch (data.m_nUnitTypeOption) {
    case 0:
        types.insert(types.end(), static_cast<size_t>(count), data.m_strGlobalUnitType);
        return 1;
    case 1: {
        CString line;
        if (!ReadHeaderLine(data.m_nUnitTypeRow, res::IDS_ITEM_TYPE_LINE_EMPTY, line))
            return 0;
        CStringList fields;
        TakeHeaderFields(line, count, fields);
        for (const CString& field : fields) {
            CString type = TextBeforeBracket(field);
            if (IsKnownItemType(type))
                types.push_back(std::move(type));
        }
        return 1;
    }
    case 2:
        for (const CItemDefinition& definition : data.m_vecItemDefs)
            types.push_back(definition.m_strType);
        return 1;
    default:
        return FailOnOption("item type", data.m_nUnitTypeOption);
    }
}

int CAsciiFilePreviewParser::GetUnits(CStringList& units)
{
    int count = 0;
    if (!GetItemCount(count))
        count = 0;
    if (!HasTemplateAndFile())
        return 0;
    const CDataDescription& data = m_pSpecification->m_DataDesc;
    switch (data.m_nUnitOption) {
    case 0:
        units.insert(units.end(), static_cast<size_t>(count), data.m_strGlobalUnit);
        return 1;
    case 1: {
        CString line;
        if (!ReadHeaderLine(data.m_nUnitRow, res::IDS_UNIT_LINE_EMPTY, line))
            return 0;
        CStringList fields;
        TakeHeaderFields(line, count, fields);
        for (const CString& field : fields)
            units.push_back(TextInBrackets(field));
        return 1;
    }
    case 2:
        for (const CItemDefinition& definition : data.m_vecItemDefs)
            units.push_back(definition.m_strUnit);
        return 1;
    default:
        return FailOnOption("unit", data.m_nUnitOption);
    }
}

int CAsciiFilePreviewParser::GetValueTypes(CStringList& valueTypes)
{
    int count = 0;
    if (!GetItemCount(count))
        return 0;
    const CDataDescription& data = m_pSpecification->m_DataDesc;
    switch (data.m_nValueTypeOption) {
    case 0:
        if (!IsKnownValueType(data.m_strGlobalValueType))
            return Refuse(res::IDS_VALUE_TYPE_INVALID);
        valueTypes.insert(valueTypes.end(), static_cast<size_t>(count), data.m_strGlobalValueType);
        return 1;
    case 1: {
        CString line;
        if (!ReadHeaderLine(data.m_nValueTypeRow, res::IDS_VALUE_TYPE_LINE_EMPTY, line))
            return 0;
        CFieldCursor cursor(*m_pSpecification, line);
        for (int i = 0; i < count; ++i) {
            if (cursor.AtEnd())
                return Refuse(res::IDS_VALUE_TYPE_LINE_SHORT, data.m_nValueTypeRow);
            CString valueType = TextAfterColon(cursor.Next());
            if (!cursor.AtEnd() && !IsKnownValueType(valueType))
                return Refuse(res::IDS_VALUE_TYPE_INVALID, data.m_nValueTypeRow);
            valueTypes.push_back(std::move(valueType));
        }
        return 1;
    }
    case 2:
        for (const CItemDefinition& definition : data.m_vecItemDefs)
            valueTypes.push_back(definition.m_strValueType);
        return 1;
    default:
        return FailOnOption("value type", data.m_nValueTypeOption);
    }
}

int CAsciiFilePreviewParser::FailOnOption(const char* what, int option)
{
    return Fail(m_strFile, 0, text::Format("the template's %s option is %d, not 0, 1 or 2", what, option));
}

bool CAsciiFilePreviewParser::AppendMetadataRow(const MetadataRow& kind)
{
    CStringList values;
    if (!(this->*kind.get)(values))
        return false;
    if (values.empty()) {
        const int option = m_pSpecification->m_DataDesc.*kind.option;
        if (option == 1)
            return Fail(m_strFile, m_pSpecification->m_DataDesc.*kind.row, CString("the line gives no ") + kind.what);
        return Fail(m_strFile, 0, CString("the template gives no ") + kind.what + " (it defines no items)");
    }
    values.insert(values.begin(), CString());
    m_vecRows.push_back(std::move(values));
    return true;
}

int CAsciiFilePreviewParser::Parse(const CString& /*path*/)
{
    if (!m_pSpecification)
        return Fail(m_strFile, 0, "there is no template to read it with");
    m_vecItemNames.clear();
    m_vecRows.clear();
    m_vecRawLines.clear();
    static const MetadataRow kMetadataRows[] = {
        {&CAsciiFilePreviewParser::GetItemTypes, "item type the unit catalogue knows", &CDataDescription::m_nUnitTypeOption,
         &CDataDescription::m_nUnitTypeRow},
        {&CAsciiFilePreviewParser::GetUnits, "unit", &CDataDescription::m_nUnitOption, &CDataDescription::m_nUnitRow},
        {&CAsciiFilePreviewParser::GetValueTypes, "value type", &CDataDescription::m_nValueTypeOption,
         &CDataDescription::m_nValueTypeRow},
    };
    for (const MetadataRow& kind : kMetadataRows)
        if (!AppendMetadataRow(kind))
            return 0;
    if (!HasTemplateAndFile())
        return 0;
    // Only options 0 to 2 say where the date/time stands; with any other no data line could have one.
    const int option = m_pSpecification->m_TimeDesc.m_nDateTimeOption;
    if (option < 0 || option > 2)
        return Refuse(res::IDS_NO_DATETIME_COLUMN);
    const DeleteValue deleteValue = DetermineDeleteValue();
    int columns = 0;
    if (!ReadColumnCountAndNames(deleteValue, columns))
        return 0;
    return ReadHeaderAndDataLines(columns, deleteValue) ? 1 : 0;
}

bool CAsciiFilePreviewParser::ReadColumnCountAndNames(const DeleteValue& deleteValue, int& columns)
{
    const CDataDescription& data = m_pSpecification->m_DataDesc;
    columns = 0;
    if (data.m_nItemTitleOption == 1) {
        GetItemNames(m_vecItemNames);
        if (!m_vecItemNames.empty()) {
            columns = static_cast<int>(m_vecItemNames.size()) + 1;
            return true;
        }
        int count = 0;
        if (!GetItemCount(count))
            return false;
        columns = count + 1;
        return true;
    }
    if (data.m_nItemTitleOption != 0)
        return true;

    // Lines beyond the end of the file read as empty, so the reading stops there.
    PreviewLines reader(m_strFile);
    CString nameLine, startLine;
    for (long long n = 1; n <= data.m_nStartRow; ++n) {
        const bool wanted = n == data.m_nItemDescriptionRow || n == data.m_nStartRow;
        CString line;
        if (!(wanted ? reader.Read(line) : reader.Skip()))
            break;
        if (n == data.m_nItemDescriptionRow)
            nameLine = line;
        if (n == data.m_nStartRow)
            startLine = std::move(line);
    }
    if (!delimited::Delimiter(m_pSpecification->GetDelimiterString()).FoundIn(startLine))
        return Refuse(res::IDS_NO_DELIMITERS, data.m_nStartRow);
    columns = CountFieldCalls(*m_pSpecification, startLine) - m_pSpecification->CountFormatColumns(1);
    if (columns < 1)
        return Refuse(res::IDS_NO_ITEM_COLUMN, data.m_nStartRow);
    if (nameLine.empty())
        return Refuse(res::IDS_ITEM_NAME_LINE_EMPTY, data.m_nItemDescriptionRow);
    return ReadNamesFromLine(nameLine, columns, deleteValue);
}

bool CAsciiFilePreviewParser::ReadNamesFromLine(const CString& nameLine, int columns, const DeleteValue& deleteValue)
{
    const long lineNumber = m_pSpecification->m_DataDesc.m_nItemDescriptionRow;
    const int firstDateTimeField = m_pSpecification->GetDateTimeColumn();
    const int dateTimeFields = m_pSpecification->CountFormatColumns(1);
    CFieldCursor cursor(*m_pSpecification, nameLine);
    for (int column = 1; column <= columns; ++column) {
        if (column != firstDateTimeField) {
            if (cursor.AtEnd() || cursor.Pos() >= cursor.Length())
                return Refuse(res::IDS_NAME_COLUMNS_MISMATCH, lineNumber);
            CString name = cursor.Next();
            if (cursor.AtEnd())
                return Refuse(res::IDS_NAME_COLUMNS_MISMATCH, lineNumber);
            m_vecItemNames.push_back(deleteValue.Matches(name) ? CString() : std::move(name));
            continue;
        }
        // The date/time title: its first field names the column; the others are passed over.
        cursor.Restart();
        for (int i = 1; i < firstDateTimeField; ++i) {
            if (cursor.AtEnd())
                return Refuse(res::IDS_DATETIME_UNPARSABLE, lineNumber);
            cursor.Next();
        }
        const int titleStart = cursor.Pos();
        for (int i = 0; i < dateTimeFields; ++i) {
            if (!cursor.AtEnd() && cursor.Pos() >= cursor.Length())
                return Refuse(res::IDS_ITEM_COUNT_WRONG, lineNumber);
            if (!cursor.AtEnd())
                cursor.Next();
        }
        if (!cursor.AtEnd()) {
            CString line = cursor.Line();
            int titlePos = titleStart;
            CString title = m_pSpecification->NextField(line, titlePos);
            m_vecItemNames.insert(m_vecItemNames.begin(), deleteValue.Matches(title) ? CString() : title);
        }
    }
    return true;
}

bool CAsciiFilePreviewParser::ReadHeaderAndDataLines(int columns, const DeleteValue& deleteValue)
{
    const int startRow = m_pSpecification->m_DataDesc.m_nStartRow;
    const CString delimiterText = m_pSpecification->GetDelimiterString();
    const delimited::Delimiter delimiter(delimiterText);
    PreviewLines reader(m_strFile);
    CString line;
    for (long long n = 1; n < startRow && reader.Read(line, kShownLineBytes); ++n)
        m_vecRawLines.push_back(RawRow(line));
    size_t cells = 0;
    for (int i = 0; i < kPreviewLines && cells < kPreviewCells && reader.Read(line); ++i) {
        m_vecRawLines.push_back(RawRow(line));
        if (line.empty())
            continue;
        if (!delimiter.FoundIn(line))
            return Refuse(res::IDS_NO_DELIMITERS, reader.LineNumber());
        if (!ParseDataLine(line, reader.LineNumber(), columns, deleteValue))
            return false;
        cells += m_vecRows.back().size();
    }
    return true;
}

bool CAsciiFilePreviewParser::ParseDataLine(const CString& line, long number, int columns, const DeleteValue& deleteValue)
{
    const int firstDateTimeField = m_pSpecification->GetDateTimeColumn();
    const int dateTimeFields = m_pSpecification->CountFormatColumns(1);
    const delimited::Dialect dialect = m_pSpecification->GetDialect();
    CFieldCursor cursor(*m_pSpecification, line);
    ui::Row row;
    bool hasDateTime = false;
    int column = 0;
    while (!cursor.AtEnd()) {
        if (column + 1 == firstDateTimeField) {
            if (!TakeDateTime(cursor, number, row, column))
                return false;
            hasDateTime = true;
        } else {
            CString field = cursor.Next();
            if (!cursor.AtEnd()) {
                if (dialect.UsesOtherDecimalSeparator(field))
                    return Refuse(res::IDS_DECIMAL_SEPARATOR_MISMATCH, number);
                row.push_back(deleteValue.Matches(field) ? CString() : std::move(field));
            }
        }
        ++column;
    }
    if (columns != column - dateTimeFields)
        return Refuse(res::IDS_ITEM_COUNT_WRONG, number);
    if (!hasDateTime)
        return Refuse(res::IDS_NO_DATETIME_COLUMN, number);
    m_vecRows.push_back(std::move(row));
    return true;
}

bool CAsciiFilePreviewParser::TakeDateTime(CFieldCursor& cursor, long number, ui::Row& row, int& column)
{
    const CTimeDescription& time = m_pSpecification->m_TimeDesc;
    const int dateTimeFields = m_pSpecification->CountFormatColumns(1);
    // A format that spans no field would leave the line where it is.
    if (dateTimeFields < 1)
        return Refuse(res::IDS_DATETIME_UNPARSABLE, number);
    const int start = cursor.Pos();
    for (int i = 0; i < dateTimeFields; ++i) {
        if (cursor.AtEnd())
            return Refuse(res::IDS_DATETIME_UNPARSABLE, number);
        cursor.Next();
    }
    const int delimiterLength = static_cast<int>(m_pSpecification->GetDelimiterString().size());
    const CString text = DateTimeTextOf(cursor.Line(), start, cursor.Pos(), delimiterLength);
    CString stamp;
    if (time.m_nDateTimeOption == 1)
        stamp = time.m_strGlobalDate + "  " + text;
    else if (time.m_nDateTimeOption == 2)
        stamp = text + "  " + time.m_strGlobalTime;
    else
        stamp = text;
    row.insert(row.begin(), std::move(stamp));
    column += dateTimeFields - 1;
    if (cursor.Pos() == cursor.Length()) {
        cursor.Finish();
        ++column;
    }
    return true;
}

int CAsciiFilePreviewParser::ReadRawLines(const CString& path)
{
    const CString file = path.empty() ? m_strFile : path;
    if (!sys::FileExists(file))
        return Fail(file, 0, "the file does not exist");
    PreviewLines reader(file);
    m_vecItemNames.clear();
    m_vecRows.clear();
    m_vecRawLines.clear();
    CString line;
    for (int i = 0; i < kPreviewLines && reader.Read(line, kShownLineBytes); ++i)
        m_vecRawLines.push_back(RawRow(line));
    return 1;
}
