#pragma once
// An output file is written under a temporary name beside its final place and renamed over it only
// when complete, so a failed or interrupted conversion neither leaves a half-written file nor
// destroys an old one. The temporary ("part") file is hidden and names the system start and the
// process writing it, ".<name>.part-<boot>-<pid>-<n>", so that a later run can tell the leftovers of
// a killed process from the files of one still at work.
#include "platform/system/Status.h"

#include <string>
#include <vector>

namespace converter {

class OutputFile {
public:
    explicit OutputFile(std::string finalPath);
    ~OutputFile(); // removes the part file unless committed
    OutputFile(const OutputFile&) = delete;
    OutputFile& operator=(const OutputFile&) = delete;

    // Creates the part file in the final file's folder, exclusively and never through a link.
    sys::Status Create();
    // The part file's name beside the final file; empty until Create succeeds.
    const std::string& TemporaryPath() const { return m_temporary; }
    // Where the writer opens the part file: the file this object created, through its open
    // descriptor (/proc/self/fd/N), so that whatever may take its name in the folder meanwhile (a
    // link planted there) is never written through. The part file's name when /proc is missing.
    const std::string& WriterPath() const { return m_writerPath; }
    const std::string& FinalPath() const { return m_final; }
    // Renames the part file over the final path. Only a regular file is replaced (it keeps its
    // permission bits); anything else standing there by now is left alone and the commit fails, as
    // it does when the part file's name no longer names the file this object created.
    sys::Status Commit();

    // Removes every part file being written and refuses new ones and commits from then on: the
    // run is stopping. Returns how many were removed. It takes a lock, so it is for a thread that
    // waits for stop signals, not for a signal handler.
    static size_t RemoveAllTemporaries();
    // Removes the part files in `folder` that belong to the current user and whose process cannot
    // be running any more; returns their paths.
    static std::vector<std::string> RemoveStaleTemporaries(const std::string& folder);

private:
    std::string m_final;
    std::string m_temporary;
    std::string m_writerPath;
    int m_fd = -1; // the part file, open from its creation to the end
    bool m_committed = false;
};

} // namespace converter
