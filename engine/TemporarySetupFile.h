#pragma once
// The setup file the engine program is started on. It is created in the temporary folder under the
// name asked for, exclusively and never through a link, readable by its owner only; when the name
// is taken (another run, or anything planted there) a number is added ("My_setup-1.wpx"). Only the
// object that created it removes it: when it goes, and also when the process is stopped by a signal
// it can catch (interrupt, terminate, hang-up, quit) while the file exists.
#include "platform/system/Status.h"

#include <string>

#include <sys/types.h>

class TemporarySetupFile {
public:
    // Writes `content` to `folder` + `name` (`folder` empty or ending in "/"); see Created().
    TemporarySetupFile(const std::string& folder, const std::string& name, const std::string& content);
    ~TemporarySetupFile();
    TemporarySetupFile(const TemporarySetupFile&) = delete;
    TemporarySetupFile& operator=(const TemporarySetupFile&) = delete;

    // False when no file could be made; status() then says why, its message naming the path.
    bool Created() const { return !m_path.empty(); }
    const std::string& Path() const { return m_path; }
    const sys::Status& status() const { return m_status; }

private:
    // Creates the file under `path`: 1 done, 0 the name is taken, -1 failed (m_status set).
    int TryCreate(const std::string& path, const std::string& content);

    std::string m_path;
    sys::Status m_status;
    dev_t m_device = 0;
    ino_t m_inode = 0;
    int m_slot = -1; // where a signal handler finds the path; -1 when none was free
};
