#pragma once
// What the end-to-end tests share: a run's folder, setup documents for the host program and the
// engine program, running the built programs in it, and fingerprints of the files a run must leave
// as they were.
#include "tests/support/Files.h"
#include "tests/support/Program.h"
#include "tests/support/ScratchFolder.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <map>
#include <optional>
#include <sstream>
#include <string>
#include <vector>

#include <fcntl.h>
#include <grp.h>
#include <signal.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

namespace e2e {

namespace fs = std::filesystem;

inline const std::string kBin = VELMORA_BIN_DIR;

// Three items of a new template's layout, three rows.
inline const std::string kSample =
    "Rainfall[mm]:Accumulated\tWater Level[m]:Instantaneous\tUndefined[Undefined]:Instantaneous\n"
    "Time\tRain\tLevel\tOther\n"
    "2020/01/01 00:00:00\t0.1\t1.25\t7\n"
    "2020/01/01 00:15:00\t\t1.5\t8\n"
    "2020/01/01 00:30:00\t0.3\t\t9\n";

using testsupport::Command;
using testsupport::Contains;
using testsupport::Outcome;
using testsupport::ReadFile;
using testsupport::WriteFile;

// `kSample`'s layout with `rows` rows, one second apart: a file that takes a while to convert.
inline std::string LargeSample(long long rows)
{
    std::string content = kSample.substr(0, kSample.find("2020"));
    content.reserve(content.size() + static_cast<size_t>(rows) * 34);
    char line[96];
    for (long long s = 0; s < rows; ++s) {
        const int n = std::snprintf(line, sizeof line, "2020/%02lld/%02lld %02lld:%02lld:%02lld\t%lld\t1\t2\n",
                                    1 + s / 2678400, 1 + s / 86400 % 31, s / 3600 % 24, s / 60 % 60, s % 60, s);
        content.append(line, static_cast<size_t>(n));
    }
    return content;
}

// A text as a parameter document writes it: quoted, with the escapes the format knows.
inline std::string Quote(const std::string& text)
{
    std::string quoted = "\"";
    for (unsigned char c : text) {
        if (c == '"' || c == '\\') {
            quoted += '\\';
            quoted += static_cast<char>(c);
        } else if (c < 0x20 || c == 0x7f) {
            char escape[8];
            std::snprintf(escape, sizeof escape, "\\x%02x", c);
            quoted += escape;
        } else {
            quoted += static_cast<char>(c);
        }
    }
    return quoted + "\"";
}

// The setup of a run; formats as in the setup file (1 rbx0, 2 ASCII, 3 Excel).
struct SetupDoc {
    std::string name = "Gauge";
    int type = 1; // 1 a file, 2 a folder
    int inFormat = 2;
    std::string input; // the file or the folder
    std::string templateName;
    std::string items; // "0, 2"
    int outFormat = 1;
    std::string output; // the file or the folder
    std::string log;
};

inline std::string Sections(const SetupDoc& s)
{
    const bool folder = s.type == 2;
    return "section \"INPUT\"\n Type = " + std::to_string(s.type) + "\n File_format = " + std::to_string(s.inFormat) +
           "\n File_name = file " + Quote(folder ? "" : s.input) + "\n Folder_name = file " + Quote(folder ? s.input : "") +
           "\nend\nsection \"TEMPLATE\"\n Template_option = 1\n Template_name = file " + Quote(s.templateName) +
           "\n Items = " + s.items + "\nend\nsection \"OUTPUT\"\n File_format = " + std::to_string(s.outFormat) +
           "\n File_name = file " + Quote(folder ? "" : s.output) + "\n Folder_name = file " +
           Quote(folder ? s.output : "") + "\n File_title = \"Gauge\"\n Log_file = file " + Quote(s.log) + "\nend\n";
}

// The host's document, as `velmora run` and `velmora check` read it.
inline std::string HostDocument(const SetupDoc& s)
{
    return "wpx 1\ntarget \"OkaToolbox\"\nsection \"Setup\"\nName = " + Quote(s.name) + "\n" + Sections(s) +
           "end\nend\nwpx end\n";
}

// The engine program's setup file.
inline std::string EngineDocument(const SetupDoc& s)
{
    return "wpx 1\ntarget \"VELMORA\"\n" + Sections(s) + "end\nwpx end\n";
}

// The files and folders a run works in, under a private folder that everyone may enter.
class RunFolder {
public:
    RunFolder() : m_root(m_scratch.Path())
    {
        fs::permissions(m_root, fs::perms::all); // an unprivileged run may read and write here too
        fs::permissions(m_scratch.MakeFolder("tmp"), fs::perms::all);
    }

    const fs::path& Root() const { return m_root; }
    std::string Path(const std::string& name) const { return m_scratch.File(name); }
    std::string Write(const std::string& name, const std::string& content) const { return m_scratch.Write(name, content); }
    std::string MakeFolder(const std::string& name) const { return m_scratch.MakeFolder(name); }

    Outcome Run(Command command) const
    {
        command.env.emplace_back("TMPDIR", Path("tmp"));
        return testsupport::RunProgram(command, Path(".out"), Path(".err"));
    }
    // `velmora run DOC --silent` through the plug-in and the engine program.
    Outcome Host(const std::string& document) const { return Run({{kBin + "/velmora", "run", document, "--silent"}}); }
    // The engine program on its setup file.
    Outcome Engine(const std::string& setup, std::vector<std::string> options = {}) const
    {
        Command command{{kBin + "/Velmora", setup, "1", "--quiet"}};
        command.argv.insert(command.argv.end(), options.begin(), options.end());
        return Run(command);
    }
    Outcome Check(const std::string& document, bool unprivileged = false) const
    {
        return Run({{kBin + "/velmora", "check", document}, {}, unprivileged});
    }

    // The hidden part files left anywhere under the folder.
    std::vector<std::string> PartFiles() const
    {
        std::vector<std::string> found;
        for (const auto& entry : fs::recursive_directory_iterator(m_root))
            if (entry.path().filename().string().find(".part-") != std::string::npos)
                found.push_back(entry.path().string());
        return found;
    }

private:
    testsupport::ScratchFolder m_scratch{"velmora-run"};
    fs::path m_root;
};

// What a file is: its kind, and its content (regular file) or target (link).
inline std::string Fingerprint(const fs::path& path)
{
    struct stat st {};
    if (::lstat(path.c_str(), &st) != 0)
        return "missing";
    if (S_ISLNK(st.st_mode))
        return "link to " + fs::read_symlink(path).string();
    if (S_ISFIFO(st.st_mode))
        return "fifo";
    if (S_ISCHR(st.st_mode))
        return "character device " + std::to_string(st.st_rdev);
    if (S_ISDIR(st.st_mode))
        return "folder";
    const std::string content = ReadFile(path);
    return "file of " + std::to_string(content.size()) + " bytes, hash " + std::to_string(std::hash<std::string>{}(content));
}

// Fingerprints taken before a run and compared after it: the files must be as they were; a log
// may only have grown at its end.
class Untouched {
public:
    void Add(const std::string& path) { m_files[path] = Fingerprint(path); }
    void AddLog(const std::string& path) { m_logs[path] = ReadFile(path); }
    void Expect() const
    {
        for (const auto& [path, print] : m_files)
            EXPECT_EQ(Fingerprint(path), print) << path << " was changed";
        for (const auto& [path, content] : m_logs)
            EXPECT_EQ(ReadFile(path).substr(0, content.size()), content) << path << " was changed, not appended to";
    }

private:
    std::map<std::string, std::string> m_files;
    std::map<std::string, std::string> m_logs;
};

} // namespace e2e
