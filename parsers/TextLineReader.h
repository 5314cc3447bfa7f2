#pragma once
// Reads a text file line by line with the line ends removed ("\n" and "\r\n"), as UTF-8 (a byte-order
// mark passed over, UTF-16 converted). Zero bytes are kept as they are. A line is read whole up to
// sys::kLongestTextLine bytes; a file without a line break within that many bytes is refused, so no
// input, however large, can make a reader hold more.
#include "platform/system/TextFileInput.h"
#include "platform/system/Types.h"

#include <vector>

class CTextLineReader {
public:
    // Opens `path`; throws CFileException when it cannot be opened or is not a regular file.
    explicit CTextLineReader(const CString& path);

    // The next line into `line`, of which at most `keep` bytes are kept (the rest is read past); false
    // at the end of the file. Throws CFileException on a read error or a line longer than the limit.
    bool ReadLine(CString& line, size_t keep = sys::kLongestTextLine);
    // Passes over the next line without keeping it; false at the end of the file.
    bool SkipLine();
    // The number of the line read last, from 1.
    long LineNumber() const { return m_nLine; }

private:
    // Refills the buffer; false at the end of the file.
    bool Fill();
    // Reads to the end of the next line, appending at most `keep` - `line.size()` bytes of it to
    // `line` when given; false when the file had nothing more.
    bool Walk(CString* line, size_t keep);
    // Throws CFileException with `reason`, about `line` when above 0.
    [[noreturn]] void Refuse(const CString& reason, long line = 0) const;

    CString m_strPath;
    sys::TextFileInput m_input;
    std::vector<char> m_buffer;
    size_t m_nBegin = 0;
    size_t m_nEnd = 0;
    long m_nLine = 0;
    size_t m_nLastLength = 0; // of the line walked last, line end excluded
};
