#include "wizard/TimeDescForm.h"

#include "engine/Engine.h"
#include "platform/system/DateFormat.h"
#include "platform/ui/UserInterface.h"
#include "resources/StringTable.h"
#include "wizard/PreviewChain.h"

namespace {

// The tokens of a date or time text when all are numbers and there are `least` to `most` of them.
bool NumberTokens(const CString& text, size_t least, size_t most, std::vector<int>& numbers)
{
    numbers.clear();
    for (std::string_view token : sys::DateTimeTokens(text)) {
        if (token.find_first_not_of("0123456789") != std::string_view::npos || token.size() > 4)
            return false;
        numbers.push_back(std::stoi(std::string(token)));
    }
    return numbers.size() >= least && numbers.size() <= most;
}

void EnableGroups(TimeDescState& state)
{
    for (int group = 0; group < 3; ++group) {
        const bool chosen = group == state.option;
        state.groupEnabled[group] = chosen;
        state.formatEnabled[group] = chosen && (!state.excel || state.useFormat[group] != 0);
    }
}

} // namespace

bool ReadPickerDate(const CString& text, COleDateTime& date)
{
    std::vector<int> n;
    if (!NumberTokens(text, 3, 3, n) || !IsValidCalendarDate(n[0], n[1], n[2]))
        return false;
    date = COleDateTime(n[0], n[1], n[2], date.GetHour(), date.GetMinute(), date.GetSecond());
    return date.IsValid();
}

bool ReadPickerTime(const CString& text, COleDateTime& time)
{
    std::vector<int> n;
    if (!NumberTokens(text, 2, 3, n))
        return false;
    n.resize(3, 0);
    if (n[0] > 23 || n[1] > 59 || n[2] > 59)
        return false;
    COleDateTime read(time.GetYear(), time.GetMonth(), time.GetDay(), n[0], n[1], n[2]);
    if (!read.IsValid())
        return false;
    time = read;
    return true;
}

TimeDescState InitialTimeDescription(bool excel)
{
    TimeDescState state;
    state.excel = excel;
    state.option = 0;
    EnableGroups(state);
    return state;
}

void ShowTimeDescription(TimeDescState& state, const CTimeDescription& record)
{
    const int option = record.m_nDateTimeOption;
    state.option = option >= 0 && option <= 2 ? option : 0;
    if (state.excel)
        state.useFormat = {record.m_bUseDTFormat, record.m_bUseTFormat, record.m_bUseDFormat};
    EnableGroups(state);
    state.formats = {record.m_strDateTimeFormat, record.m_strTimeFormat, record.m_strDateFormat};
    state.columns = {record.m_nDateTimeCol, record.m_nTimeCol, record.m_nDateCol};
    ReadPickerDate(record.m_strGlobalDate, state.date);
    ReadPickerTime(record.m_strGlobalTime, state.time);
}

void ClickDateTimeOption(TimeDescState& state, int option)
{
    state.option = option;
    EnableGroups(state);
}

void ClickUseFormat(TimeDescState& state, int option)
{
    state.formatEnabled[option] = state.useFormat[option] != 0;
}

int CollectTimeDescription(const TimeDescState& state, CTimeDescription& record)
{
    const int option = state.option;
    record.m_nDateTimeOption = option;
    record.m_strDateTimeFormat = state.formats[0];
    record.m_strTimeFormat = state.formats[1];
    record.m_strDateFormat = state.formats[2];
    record.m_strGlobalDate = state.date.Format("%Y-%m-%d");
    record.m_strGlobalTime = state.time.Format("%H:%M:%S");
    record.m_nDateTimeCol = state.columns[0];
    record.m_nTimeCol = state.columns[1];
    record.m_nDateCol = state.columns[2];
    if (state.excel) {
        record.m_bUseDTFormat = state.useFormat[0];
        record.m_bUseTFormat = state.useFormat[1];
        record.m_bUseDFormat = state.useFormat[2];
    }
    if (state.columns[static_cast<size_t>(option)] < 1) {
        ui::ShowStringMessage(res::IDS_COLUMN_NOT_POSITIVE);
        return 0;
    }
    // The Excel page tests the format even when its box is not ticked.
    CString message;
    if (!CSpecification::IsValidDateTimeFormat(state.formats[static_cast<size_t>(option)], message)) {
        ui::MessageBox(message, CString(), ui::MB_OK | ui::MB_ICONEXCLAMATION);
        return 0;
    }
    return 1;
}

bool AcceptTimeDescription(const TimeDescState& state, CEngine* engine)
{
    CTimeDescription record;
    if (!CollectTimeDescription(state, record))
        return false;
    if (engine && engine->m_pSpecification)
        engine->m_pSpecification->m_TimeDesc = record;
    return true;
}

int PreviewTimeDescription(const TimeDescState& state, CEngine* engine)
{
    if (engine && !AcceptTimeDescription(state, engine))
        return 0;
    return RunDefaultPreview(engine);
}
