#include "templates/HeaderCells.h"

namespace {

// The token that starts at the first character of `opening`: the run of `skip` characters there
// is passed over, and the token ends before the next `stop` character.
CString TokenAt(const CString& text, char opening, const char* skip, const char* stop)
{
    size_t start = text.find(opening);
    if (text.empty() || start == CString::npos)
        return text;
    start = text.find_first_not_of(skip, start);
    if (start == CString::npos)
        return CString();
    size_t end = text.find_first_of(stop, start);
    return text.substr(start, end == CString::npos ? CString::npos : end - start);
}

} // namespace

CString TextBeforeBracket(const CString& text)
{
    size_t bracket = text.find('[');
    if (text.empty() || bracket == CString::npos)
        return text;
    return text.substr(0, bracket);
}

CString TextInBrackets(const CString& text) { return TokenAt(text, '[', "[]", "[]"); }

CString TextAfterColon(const CString& text) { return TokenAt(text, ':', ":", ":"); }
