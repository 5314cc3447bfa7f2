#pragma once
// Cutting item types, units and value types out of header cells such as "Rain [mm]" or
// "Rain:Accumulated".
#include "platform/system/Types.h"

// The part before the first "[" (trailing blanks kept); the text itself when it has no "[".
CString TextBeforeBracket(const CString& text);
// The token at the first "[", with the run of brackets there skipped; the text itself without "[".
CString TextInBrackets(const CString& text);
// The token at the first ":", with the run of colons there skipped; the text itself without ":".
CString TextAfterColon(const CString& text);
