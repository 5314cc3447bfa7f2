#pragma once
// An output file is written under a temporary name beside its final place and renamed over it only
// when complete, so a failed conversion neither leaves a half-written file nor destroys an old one.
#include "converter/Problem.h"

#include <string>

namespace converter {

class OutputFile {
public:
    explicit OutputFile(std::string finalPath);
    ~OutputFile(); // removes the temporary file unless committed
    OutputFile(const OutputFile&) = delete;
    OutputFile& operator=(const OutputFile&) = delete;

    // Where the writer writes: a hidden name in the final file's folder, unique to this object.
    const std::string& TemporaryPath() const { return m_temporary; }
    const std::string& FinalPath() const { return m_final; }
    // Renames the temporary file to the final path, replacing what was there.
    Status Commit();

    // Removes every temporary file still being written; safe to call from a signal handler, so an
    // interrupted run leaves no part files either.
    static void RemoveAllTemporaries();

private:
    std::string m_final;
    std::string m_temporary;
    bool m_committed = false;
    int m_slot = -1; // place in the list RemoveAllTemporaries walks; -1 when it did not fit
};

} // namespace converter
