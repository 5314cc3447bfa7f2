#pragma once
// A private folder for the files one test writes, removed with everything in it at the end of the
// test, also where a test took the write or enter permission away from a folder under it.
#include <string>
#include <string_view>

namespace testsupport {

class ScratchFolder {
public:
    // `prefix` names the folder under the temporary folder ("velmora-<area>"), so that a folder a
    // crashed test left behind tells where it comes from.
    explicit ScratchFolder(std::string_view prefix = "velmora-test");
    ~ScratchFolder();
    ScratchFolder(const ScratchFolder&) = delete;
    ScratchFolder& operator=(const ScratchFolder&) = delete;

    const std::string& Path() const { return m_path; }
    // The path of `name` in the folder (it need not exist).
    std::string File(std::string_view name) const;
    // Writes `bytes` to `name` (making the folders on its way) and returns its path.
    std::string Write(std::string_view name, std::string_view bytes) const;
    // Makes the folder `name` (and those on its way) and returns its path.
    std::string MakeFolder(std::string_view name) const;

private:
    std::string m_path;
};

// The path of `name` in a scratch folder the whole program shares, removed when the program ends:
// for files made once and used by many tests or benchmarks.
std::string ProgramScratchFile(std::string_view name);

} // namespace testsupport
