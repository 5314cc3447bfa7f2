#pragma once
// One file of given bytes under the temporary folder for the life of the object: readers that take
// a path (fuzz targets, benchmarks) get their input through it.
#include <cstddef>
#include <string>
#include <string_view>

namespace testsupport {

class ScratchFile {
public:
    // `stem` starts the file's name and `extension` (".xlsx") ends it: some readers go by it.
    ScratchFile(std::string_view stem, std::string_view extension, std::string_view bytes);
    ScratchFile(std::string_view stem, std::string_view extension, const unsigned char* data, size_t size)
        : ScratchFile(stem, extension, std::string_view(reinterpret_cast<const char*>(data), size))
    {
    }
    ~ScratchFile();
    ScratchFile(const ScratchFile&) = delete;
    ScratchFile& operator=(const ScratchFile&) = delete;

    // Empty when the file could not be written.
    const std::string& Path() const { return m_path; }

private:
    std::string m_path;
};

} // namespace testsupport
