#include "parsers/FieldCursor.h"

#include "templates/Specification.h"

#include <utility>

CFieldCursor::CFieldCursor(const CSpecification& specification, CString line)
    : m_specification(specification), m_strLine(std::move(line)),
      // Every call but a few takes at least one character: one empty leading field, one empty
      // trailing field and the call that reports the end.
      m_nCallsLeft(2 * static_cast<long long>(m_strLine.size()) + 8)
{
}

CString CFieldCursor::Next()
{
    if (m_nPos == -1)
        return CString();
    if (--m_nCallsLeft < 0) {
        m_nPos = -1;
        return CString();
    }
    return m_specification.NextField(m_strLine, m_nPos);
}

int CountFieldCalls(const CSpecification& specification, const CString& line)
{
    CFieldCursor cursor(specification, line);
    int calls = 0;
    while (!cursor.AtEnd()) {
        cursor.Next();
        ++calls;
    }
    return calls;
}
