#pragma once
// What the two time description pages show and decide, apart from their widgets: which option is
// checked, the formats, columns and pickers of its three groups, which controls are enabled, and
// the checks of Next and Preview. The Excel page adds a "use the format" box to each group.
#include "platform/system/OleDateTime.h"
#include "templates/Specification.h"

#include <array>

class CEngine;

struct TimeDescState {
    bool excel = false;
    int option = 0; // the checked radio: 0 date/time in rows, 1 one date for all, 2 one time for all
    // Per option's group, in option order: the format box and the column box.
    std::array<CString, 3> formats = {"YYYY/MM/DD HH:mm:ss", "HH:mm:ss", "YYYY/MM/DD"};
    std::array<int, 3> columns = {1, 1, 1};
    COleDateTime date = COleDateTime::GetCurrentTime(); // the date picker (option 1)
    COleDateTime time = COleDateTime::GetCurrentTime(); // the time picker (option 2)
    std::array<int, 3> useFormat = {0, 0, 0};           // Excel: the "use the format" boxes
    // The group's column box, spin, picker and (Excel) box; and its format box.
    std::array<bool, 3> groupEnabled = {true, true, true};
    std::array<bool, 3> formatEnabled = {true, true, true};
};

// The page as it is first made: option 0 checked, the pickers at the current local date and time.
TimeDescState InitialTimeDescription(bool excel);
// Puts `record` into the page and enables the chosen option's group (an option outside 0..2 shows
// as 0). A date or time text that cannot be read leaves its picker as it was.
void ShowTimeDescription(TimeDescState& state, const CTimeDescription& record);
// An option radio clicked: its group enabled, the others disabled.
void ClickDateTimeOption(TimeDescState& state, int option);
// Excel: the box of `option`'s group clicked; the format box beside it follows it.
void ClickUseFormat(TimeDescState& state, int option);

// Reads the page into `record` and checks it: the chosen option's column (2294), then its format
// (2304). 0, with the message shown, when refused.
int CollectTimeDescription(const TimeDescState& state, CTimeDescription& record);
// Next: collects into a fresh record and copies it into the template; false keeps the page.
bool AcceptTimeDescription(const TimeDescState& state, CEngine* engine);
// Preview: the same, then the common preview; 0 when refused.
int PreviewTimeDescription(const TimeDescState& state, CEngine* engine);

// The date of a "%Y-%m-%d" text and the time of a "%H:%M:%S" text; false when it cannot be read.
bool ReadPickerDate(const CString& text, COleDateTime& date);
bool ReadPickerTime(const CString& text, COleDateTime& time);
