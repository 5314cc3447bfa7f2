#pragma once
// What the delimiters page shows and decides, apart from its widgets: the delimiter and decimal
// separator lists, the user-defined delimiter box and the two flags, and what Next and Preview
// write into the template. Nothing on the page is ever refused.
#include "wizard/ChoiceList.h"

class CEngine;

struct DelimitersState {
    ChoiceList delimiter;         // 212
    CString userDelimiter;        // 256
    bool userDelimiterEnabled = false;
    int consecutiveAsOne = 0;     // 213
    int ignoreAtLineStart = 0;    // 214
    ChoiceList decimalSeparator;  // 215
};

// The page as it is first made: both lists filled, "Tab" and "Dot" selected, the box disabled.
DelimitersState InitialDelimiters();
// Activation: the template's five values; the box is enabled only for "User Defined" with a text.
// A stored name no entry begins with leaves that list's selection as it was.
void LoadDelimiters(DelimitersState& state, const CEngine& engine);
// A delimiter entry picked: exactly "User Defined" enables the box, which keeps its text.
void SelectDelimiter(DelimitersState& state, int index);
// Next: the five values into the template, unchecked.
void StoreDelimiters(const DelimitersState& state, CEngine* engine);
// Preview: the values into the template, then the common preview.
int PreviewDelimiters(const DelimitersState& state, CEngine* engine);
