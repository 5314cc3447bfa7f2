#include "tests/support/ScratchFile.h"

#include <cstdlib>
#include <filesystem>
#include <unistd.h>

namespace testsupport {

ScratchFile::ScratchFile(std::string_view stem, std::string_view extension, std::string_view bytes)
{
    std::string pattern =
        (std::filesystem::temp_directory_path() / (std::string(stem) + "-XXXXXX" + std::string(extension))).string();
    const int fd = ::mkstemps(pattern.data(), static_cast<int>(extension.size()));
    if (fd < 0)
        return;
    size_t written = 0;
    while (written < bytes.size()) {
        const ssize_t n = ::write(fd, bytes.data() + written, bytes.size() - written);
        if (n <= 0)
            break;
        written += static_cast<size_t>(n);
    }
    ::close(fd);
    if (written == bytes.size())
        m_path = pattern;
    else
        ::unlink(pattern.c_str());
}

ScratchFile::~ScratchFile()
{
    if (!m_path.empty())
        ::unlink(m_path.c_str());
}

} // namespace testsupport
