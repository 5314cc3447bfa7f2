#pragma once
// Helpers the engine tests share: a private folder, environment overrides, a small template
// class, and an engine program stand-in that records how it was started.
#include "platform/wpx/Wpx.h"
#include "templates/Specification.h"

#include <optional>
#include <string>

namespace enginetest {

class ScratchFolder {
public:
    ScratchFolder();
    ~ScratchFolder();
    ScratchFolder(const ScratchFolder&) = delete;
    ScratchFolder& operator=(const ScratchFolder&) = delete;
    std::string File(const std::string& name) const;
    const std::string& Path() const { return m_path; }

private:
    std::string m_path;
};

// Sets (or, with nullopt, removes) an environment variable until the end of the scope.
class ScopedEnv {
public:
    ScopedEnv(const char* name, std::optional<std::string> value);
    ~ScopedEnv();
    ScopedEnv(const ScopedEnv&) = delete;
    ScopedEnv& operator=(const ScopedEnv&) = delete;

private:
    std::string m_name;
    std::optional<std::string> m_previous;
};

// A template whose Save only records where it was asked to write.
class TestSpecification : public CSpecification {
public:
    int Save(const CString& path) override
    {
        m_strSavedTo = path;
        return 1;
    }
    CString m_strSavedTo;
};

// Writes an executable shell script `name` into `folder` that appends its arguments (one a line)
// to <folder>/args.txt, copies its first argument to <folder>/setup-copy.wpx and exits with
// $ENGINE_TEST_EXIT (0 when unset). Returns its path.
std::string WriteRecordingEngine(const ScratchFolder& folder, const std::string& name = "engine.sh");

std::string ReadFile(const std::string& path);
void WriteFile(const std::string& path, const std::string& text);

// Parses a document and makes it the module's current one; returns its handle.
WPXHANDLE UseDocument(const std::string& text);
// Closes the module's current document and clears the handle.
void DropModuleDocument();

} // namespace enginetest
