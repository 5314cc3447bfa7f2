#pragma once
// Raised when a data file exists but cannot be opened or read (no permission, held by another
// program, a folder in its place). Parsers let it through; whoever runs a parse catches it.
#include "platform/system/Status.h"

#include <stdexcept>
#include <string>

class CFileException : public std::runtime_error {
public:
    // The text reads "path: reason", or "path:line: reason" when a line (from 1) is concerned.
    CFileException(const std::string& path, const std::string& reason, long line = 0)
        : std::runtime_error(path + (line > 0 ? ":" + std::to_string(line) : std::string()) + ": " + reason),
          m_strPath(path)
    {
    }
    // The exception a reader's problem becomes at a parser's operation.
    explicit CFileException(const sys::Problem& problem) : CFileException(problem.file, problem.message, problem.line) {}
    const std::string& Path() const { return m_strPath; }

private:
    std::string m_strPath;
};
