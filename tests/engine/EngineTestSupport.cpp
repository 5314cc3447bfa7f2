#include "tests/engine/EngineTestSupport.h"
#include "engine/ModuleHandle.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <sys/stat.h>
#include <unistd.h>

namespace enginetest {

namespace fs = std::filesystem;

ScratchFolder::ScratchFolder()
{
    std::string pattern = (fs::temp_directory_path() / "engine_test_XXXXXX").string();
    m_path = ::mkdtemp(pattern.data());
}

ScratchFolder::~ScratchFolder() { fs::remove_all(m_path); }

std::string ScratchFolder::File(const std::string& name) const { return (fs::path(m_path) / name).string(); }

ScopedEnv::ScopedEnv(const char* name, std::optional<std::string> value) : m_name(name)
{
    if (const char* previous = std::getenv(name))
        m_previous = previous;
    if (value)
        ::setenv(name, value->c_str(), 1);
    else
        ::unsetenv(name);
}

ScopedEnv::~ScopedEnv()
{
    if (m_previous)
        ::setenv(m_name.c_str(), m_previous->c_str(), 1);
    else
        ::unsetenv(m_name.c_str());
}

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

std::string ReadFile(const std::string& path)
{
    std::ifstream in(path, std::ios::binary);
    std::ostringstream content;
    content << in.rdbuf();
    return content.str();
}

void WriteFile(const std::string& path, const std::string& text)
{
    std::ofstream out(path, std::ios::binary);
    out << text;
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
