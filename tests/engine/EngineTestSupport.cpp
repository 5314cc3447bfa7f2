#include "tests/engine/EngineTestSupport.h"
#include "engine/ModuleHandle.h"

#include <gtest/gtest.h>

#include <sys/stat.h>

namespace enginetest {

std::string WriteRecordingEngine(const ScratchFolder& folder, const std::string& name)
{
    std::string path = folder.File(name);
    WriteFile(path, "#!/bin/sh\n"
                    "for a in \"$@\"; do printf '%s\\n' \"$a\" >> '" + folder.File("args.txt") + "'; done\n"
                    "cp \"$1\" '" + folder.File("setup-copy.wpx") + "' 2>/dev/null\n"
                    "exit ${ENGINE_TEST_EXIT:-0}\n");
    ::chmod(path.c_str(), 0755);
    return path;
}

void ExpectFirstChoices(const CEngine& engine)
{
    EXPECT_EQ(engine.m_bConstraintsApplied, 0);
    EXPECT_EQ(engine.m_nInputType, 1);
    EXPECT_EQ(engine.m_nInputFormat, 1);
    EXPECT_EQ(engine.m_nTemplateOption, 1);
    EXPECT_EQ(engine.m_nOutputFormat, 1);
    EXPECT_EQ(engine.m_bParsed, 0);
}

WPXHANDLE UseDocument(const std::string& text)
{
    WPXHANDLE doc = nullptr;
    std::string error;
    EXPECT_EQ(wpxParse(text, "test.wpx", "", &doc, &error), 1) << error;
    SetModuleWpxHandle(wpxHandleToInt(doc));
    return doc;
}

void DropModuleDocument()
{
    WPXHANDLE doc = ModuleWpxDocument();
    wpxClose(&doc);
    SetModuleWpxHandle(0);
}

} // namespace enginetest
