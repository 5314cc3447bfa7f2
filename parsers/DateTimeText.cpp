#include "parsers/DateTimeText.h"

#include "platform/system/Text.h"


namespace {

enum class Field { None, Year, Month, Day, Hour, Minute, Second };

Field FieldOfFormatToken(const CString& token)
{
    switch (token.front()) {
    case 'Y': case 'y': return Field::Year;
    case 'M': return Field::Month;
    case 'D': case 'd': return Field::Day;
    case 'H': case 'h': return Field::Hour;
    case 'm': return Field::Minute;
    case 'S': case 's': return Field::Second;
    default: return Field::None;
    }
}

bool InRange(Field field, int value)
{
    switch (field) {
    case Field::Year: return value >= 100 && value <= 9999;
    case Field::Month: return value >= 1 && value <= 12;
    case Field::Day: return value >= 1 && value <= 31;
    case Field::Hour: return value >= 0 && value <= 23;
    case Field::Minute:
    case Field::Second: return value >= 0 && value <= 59;
    case Field::None: break;
    }
    return false;
}

// The six fields one interpretation fills; `reads` says which of them this variant reads.
struct Fields {
    int year = 1900, month = 1, day = 1, hour = 0, minute = 0, second = 0;

    int* Slot(Field field)
    {
        switch (field) {
        case Field::Year: return &year;
        case Field::Month: return &month;
        case Field::Day: return &day;
        case Field::Hour: return &hour;
        case Field::Minute: return &minute;
        case Field::Second: return &second;
        case Field::None: break;
        }
        return nullptr;
    }
};

bool ReadsDate(Field f) { return f == Field::Year || f == Field::Month || f == Field::Day; }
bool ReadsTime(Field f) { return f == Field::Hour || f == Field::Minute || f == Field::Second; }

// Pairs the tokens of `format` and `text` and reads the fields that `reads` accepts. A text token
// that is missing leaves its field at the starting value.
bool Interpret(const CString& text, const CString& format, bool (*reads)(Field), Fields& fields)
{
    const CStringList formatTokens = SplitDateTimeTokens(format);
    const CStringList textTokens = SplitDateTimeTokens(text);
    for (size_t k = 0; k < formatTokens.size(); ++k) {
        Field field = FieldOfFormatToken(formatTokens[k]);
        if (!reads(field))
            continue;
        int* slot = fields.Slot(field);
        if (k < textTokens.size() && !text::ScanInt(textTokens[k], *slot))
            return false;
        if (!InRange(field, *slot))
            return false;
    }
    return true;
}

} // namespace

CStringList SplitDateTimeTokens(const CString& text)
{
    CStringList tokens;
    size_t pos = 0;
    while (true) {
        size_t start = text.find_first_not_of(kDateTimeSeparators, pos);
        if (start == CString::npos)
            break;
        size_t end = text.find_first_of(kDateTimeSeparators, start);
        tokens.push_back(text.substr(start, end == CString::npos ? CString::npos : end - start));
        if (end == CString::npos)
            break;
        pos = end;
    }
    return tokens;
}

bool ParseDateTimeText(const CString& text, const CString& format, COleDateTime& result)
{
    Fields fields;
    if (!Interpret(text, format, [](Field f) { return f != Field::None; }, fields))
        return false;
    result.SetDateTime(fields.year, fields.month, fields.day, fields.hour, fields.minute, fields.second);
    return true;
}

bool ParseDateText(const CString& text, const CString& format, CDateFields& date)
{
    Fields fields;
    fields.year = 100;
    if (!Interpret(text, format, ReadsDate, fields))
        return false;
    date = {fields.year, fields.month, fields.day};
    return true;
}

bool ParseTimeText(const CString& text, const CString& format, CTimeFields& time)
{
    Fields fields;
    fields.hour = time.hour;
    fields.minute = time.minute;
    fields.second = time.second;
    if (!Interpret(text, format, ReadsTime, fields))
        return false;
    time = {fields.hour, fields.minute, fields.second};
    return true;
}
