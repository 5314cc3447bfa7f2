#pragma once
// Reading date/time texts by format strings such as "YYYY/MM/DD HH:mm:ss". Both texts are split at
// any of "/ T:-.|"; the k-th format token says what the k-th text token holds, by its first letter:
// Y/y year, M month, D/d day, H/h hour, m minute, S/s second; other tokens are passed over.
#include "platform/system/OleDateTime.h"
#include "platform/system/Types.h"

// The separators of date/time texts and formats.
inline constexpr const char* kDateTimeSeparators = "/ T:-.|";

// The tokens of `text` split at any run of the date/time separators.
CStringList SplitDateTimeTokens(const CString& text);

// Reads all six fields (starting from 1900-01-01 00:00:00). False when a token the format names is
// not a number or is out of range; an impossible calendar date (30 February) still succeeds, with
// an invalid `result`.
bool ParseDateTimeText(const CString& text, const CString& format, COleDateTime& result);

struct CDateFields {
    int year = 100;
    int month = 1;
    int day = 1;
};
// Reads only year, month and day; hour, minute and second tokens are passed over.
bool ParseDateText(const CString& text, const CString& format, CDateFields& date);

struct CTimeFields {
    int hour = 0;
    int minute = 0;
    int second = 0;
};
// Reads only hour, minute and second; fields the text does not reach keep the values passed in.
bool ParseTimeText(const CString& text, const CString& format, CTimeFields& time);
