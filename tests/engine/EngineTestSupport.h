#pragma once
// Helpers the engine tests share: a small template class, an engine program stand-in that records
// how it was started, and the module's current document.
#include "engine/Engine.h"
#include "platform/wpx/Wpx.h"
#include "templates/Specification.h"
#include "tests/support/Files.h"
#include "tests/support/ScopedEnv.h"
#include "tests/support/ScratchFolder.h"

#include <string>

namespace enginetest {

using testsupport::ReadFile;
using testsupport::ScopedEnv;
using testsupport::ScratchFolder;
using testsupport::WriteFile;

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

// The choices of a setup no one has made yet: one input file, the first input and output formats,
// a template file, nothing parsed and no constraints applied.
void ExpectFirstChoices(const CEngine& engine);

// Parses a document and makes it the module's current one; returns its handle.
WPXHANDLE UseDocument(const std::string& text);
// Closes the module's current document and clears the handle.
void DropModuleDocument();

} // namespace enginetest
