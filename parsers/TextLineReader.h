#pragma once
// Reads a text file line by line with the line ends removed ("\n" and "\r\n"). Lines have no
// length limit; zero bytes are kept as they are.
#include "platform/system/Types.h"

#include <cstdio>
#include <memory>
#include <vector>

class CTextLineReader {
public:
    // Opens `path`; throws CFileException when it cannot be opened.
    explicit CTextLineReader(const CString& path);

    // The next line into `line`; false at the end of the file. Throws CFileException on a read error.
    bool ReadLine(CString& line);
    // Passes over the next line without keeping it; false at the end of the file.
    bool SkipLine();

private:
    // Refills the buffer; false at the end of the file.
    bool Fill();

    struct Closer {
        void operator()(std::FILE* file) const { std::fclose(file); }
    };
    CString m_strPath;
    std::unique_ptr<std::FILE, Closer> m_file;
    std::vector<char> m_buffer;
    size_t m_nBegin = 0;
    size_t m_nEnd = 0;
};
