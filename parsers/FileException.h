#pragma once
// Raised when a data file exists but cannot be opened or read (no permission, held by another
// program, a folder in its place). Parsers let it through; whoever runs a parse catches it.
#include <stdexcept>
#include <string>

class CFileException : public std::runtime_error {
public:
    CFileException(const std::string& path, const std::string& reason)
        : std::runtime_error("Cannot read \"" + path + "\": " + reason), m_strPath(path)
    {
    }
    const std::string& Path() const { return m_strPath; }

private:
    std::string m_strPath;
};
