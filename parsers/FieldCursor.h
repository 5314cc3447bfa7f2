#pragma once
// Walks the fields of one text line with the template's NextField, keeping the line and the running
// position together. The number of calls is capped by the line's length, so a line can never be
// split forever whatever the delimiter settings.
#include "platform/system/Types.h"

class CSpecification;

class CFieldCursor {
public:
    CFieldCursor(const CSpecification& specification, CString line);

    // The next field; the position becomes -1 after the last one.
    CString Next();
    // Starts over at the beginning of the (possibly trimmed) line.
    void Restart() { m_nPos = 0; }
    // Ends the walk as the last field does.
    void Finish() { m_nPos = -1; }

    bool AtEnd() const { return m_nPos == -1; }
    int Pos() const { return m_nPos; }
    // The line as NextField left it (leading delimiters may have been removed).
    const CString& Line() const { return m_strLine; }
    int Length() const { return static_cast<int>(m_strLine.size()); }

private:
    const CSpecification& m_specification;
    CString m_strLine;
    int m_nPos = 0;
    long long m_nCallsLeft;
};

// The number of NextField calls until the position becomes -1 (a line of F fields without a
// trailing delimiter takes F + 1).
int CountFieldCalls(const CSpecification& specification, const CString& line);
