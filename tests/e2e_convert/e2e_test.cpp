// End to end through the built programs: "velmora run DOC" loads the plug-in, which writes the
// engine's setup file and starts the engine program; the files it leaves are then read back with
// the converter library.
#include "converter/Converter.h"
#include "tests/e2e_convert/RunSupport.h"
#include "templates/Specification.h"
#include "tests/support/ScratchLocale.h"
#include "tests/support/ShellCommand.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <csignal>
#include <spawn.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

namespace fs = std::filesystem;
using Format = sys::FileFormat;

namespace {

using e2e::kSample;
using e2e::ReadFile;
using e2e::WriteFile;

class EndToEnd : public ::testing::Test {
protected:
    fs::path Path(const std::string& name) const { return m_folder.File(name); }

    struct Setup {
        int type = 1;
        Format in = Format::Ascii;
        std::string input; // file or folder
        std::string templateName;
        std::string items; // "0, 2"
        Format out = Format::Rbx0;
        std::string output;
        bool silent = true;
    };

    // Writes the host's document and runs the host program on it; returns its exit status.
    int RunHost(const Setup& s)
    {
        const bool folder = s.type == 2;
        std::ostringstream doc;
        doc << "wpx 1\ntarget \"OkaToolbox\"\n  section \"Setup\"\n    Name = \"e2e run\"\n"
            << "    section \"INPUT\"\n      Type = " << s.type << "\n      File_format = " << static_cast<int>(s.in)
            << "\n      File_name = file \"" << (folder ? "" : s.input) << "\"\n      Folder_name = file \""
            << (folder ? s.input : "") << "\"\n    end\n"
            << "    section \"TEMPLATE\"\n      Template_option = 1\n      Template_name = file \"" << s.templateName
            << "\"\n      Items = " << s.items << "\n    end\n"
            << "    section \"OUTPUT\"\n      File_format = " << static_cast<int>(s.out) << "\n      File_name = file \""
            << (folder ? "" : s.output) << "\"\n      Folder_name = file \"" << (folder ? s.output : "")
            << "\"\n      File_title = \"E2E\"\n      Log_file = file \"" << Path("run.log").string() << "\"\n    end\n"
            << "  end\nend\nwpx end\n";
        WriteFile(Path("setup.wpx"), doc.str());
        // The engine's setup file is named after the setup in the temporary folder: give each test
        // its own folder so that tests running side by side never share that file.
        const std::string command = "TMPDIR='" + m_folder.Path() + "' " + std::string(VELMORA_BIN_DIR) + "/velmora run " + (s.silent ? "--silent '" : "'") +
                                    Path("setup.wpx").string() + "' >'" + Path("host.out").string() + "' 2>&1";
        return testsupport::ShellStatus(command);
    }

    std::string Log() const { return ReadFile(Path("run.log")); }

    // `kSample` in `format` at `path`, made with the library.
    void MakeInput(Format format, const fs::path& path)
    {
        if (format == Format::Ascii) {
            WriteFile(path, kSample);
            return;
        }
        WriteFile(Path("seed.txt"), kSample);
        sys::Status status;
        auto spec = converter::LoadTemplate(Format::Ascii, "", status);
        auto report = converter::ConvertFile({Format::Ascii, Path("seed.txt").string(), spec.get(), {}, format, path.string(), ""});
        ASSERT_TRUE(report.converted) << report.problem.Describe();
        fs::remove(Path("seed.txt"));
    }

    // The file at `path` read back as text in the engine's own layout.
    std::string AsText(Format format, const fs::path& path)
    {
        if (format == Format::Ascii)
            return ReadFile(path);
        sys::Status status;
        auto spec = converter::LoadTemplate(format, "", status);
        const fs::path text = Path("readback.txt");
        auto report = converter::ConvertFile({format, path.string(), spec.get(), {}, Format::Ascii, text.string(), ""});
        EXPECT_TRUE(report.converted) << report.problem.Describe();
        return ReadFile(text);
    }

    testsupport::ScratchFolder m_folder{"velmora-e2e"};
};

const std::string kSelectedAsText = "Undefined[Undefined]:Instantaneous\tRainfall[mm]:Accumulated\n"
                                    "Time\tOther\tRain\n"
                                    "2020/01/01 00:00:00\t7\t0.1\n"
                                    "2020/01/01 00:15:00\t8\t\n"
                                    "2020/01/01 00:30:00\t9\t0.3\n";

const Format kFormats[] = {Format::Rbx0, Format::Ascii, Format::Excel};

TEST_F(EndToEnd, EveryFormatPairSingleFileWithSelection)
{
    for (Format in : kFormats)
        for (Format out : kFormats) {
            SCOPED_TRACE(std::string(sys::FormatInfo(in).name) + " to " + sys::FormatInfo(out).name);
            const fs::path input = Path(std::string("in") + sys::FormatInfo(in).outputExtension);
            const fs::path output = Path(std::string("out") + sys::FormatInfo(out).outputExtension);
            MakeInput(in, input);
            ASSERT_EQ(RunHost({1, in, input.string(), "", "2, 0", out, output.string()}), 0)
                << ReadFile(Path("host.out")) << Log();
            std::string expected = kSelectedAsText;
            if (in == Format::Rbx0 || out == Format::Rbx0) // an rbx0 file has no title for its time column
                expected.replace(expected.find("Time\t"), 4, "Date/time");
            EXPECT_EQ(AsText(out, output), expected);
            fs::remove(output);
        }
}

TEST_F(EndToEnd, EveryFormatPairFolderWithSelection)
{
    for (Format in : kFormats)
        for (Format out : kFormats) {
            SCOPED_TRACE(std::string(sys::FormatInfo(in).name) + " folder to " + sys::FormatInfo(out).name);
            fs::remove_all(Path("in"));
            fs::remove_all(Path("out"));
            fs::create_directories(Path("in"));
            fs::create_directories(Path("out"));
            const std::string extension = sys::FormatInfo(in).outputExtension;
            MakeInput(in, Path("in/one" + extension));
            MakeInput(in, Path("in/two" + extension));
            ASSERT_EQ(RunHost({2, in, Path("in").string(), "", "1", out, Path("out").string()}), 0) << Log();
            const std::string title = in == Format::Rbx0 || out == Format::Rbx0 ? "Date/time" : "Time";
            const std::string expected = "Water Level[m]:Instantaneous\n" + title +
                                         "\tLevel\n2020/01/01 00:00:00\t1.25\n2020/01/01 00:15:00\t1.5\n"
                                         "2020/01/01 00:30:00\t\n";
            for (const char* name : {"one", "two"})
                EXPECT_EQ(AsText(out, Path(std::string("out/") + name + sys::FormatInfo(out).outputExtension)), expected);
        }
}

TEST_F(EndToEnd, FolderWithAMisfitConvertsTheRestAndFails)
{
    fs::create_directories(Path("in"));
    fs::create_directories(Path("out"));
    WriteFile(Path("in/a.txt"), kSample);
    WriteFile(Path("in/b.csv"), kSample);
    WriteFile(Path("in/misfit.txt"), "no template describes this\n");
    WriteFile(Path("out/misfit.rbx0"), "an older output");
    EXPECT_EQ(RunHost({2, Format::Ascii, Path("in").string(), "", "", Format::Rbx0, Path("out").string(), false}), 1);
    EXPECT_NE(ReadFile(Path("host.out")).find("Conversion complete. Some files are skipped because they do not match the template."),
              std::string::npos)
        << ReadFile(Path("host.out"));
    EXPECT_EQ(AsText(Format::Rbx0, Path("out/a.rbx0")), kSample.substr(0, kSample.find("Time")) + "Date/time" +
                                                               kSample.substr(kSample.find("Time") + 4));
    EXPECT_TRUE(fs::exists(Path("out/b.rbx0")));
    EXPECT_EQ(ReadFile(Path("out/misfit.rbx0")), "an older output");
    EXPECT_NE(Log().find("SKIPPED " + Path("in/misfit.txt").string()), std::string::npos) << Log();
    EXPECT_NE(Log().find("Some files are skipped because they do not match the template."), std::string::npos);
}

TEST_F(EndToEnd, BrokenLineFarIntoTheFileFailsWithItsLineAndNoOutput)
{
    std::string content = kSample.substr(0, kSample.find("2020"));
    long long seconds = 0;
    char line[96];
    for (int n = 3; n <= 500005; ++n, ++seconds) {
        std::snprintf(line, sizeof line, "2020/01/%02lld %02lld:%02lld:%02lld\t%d\t1\t2\n", 1 + seconds / 86400,
                      seconds / 3600 % 24, seconds / 60 % 60, seconds % 60, n);
        content += n == 500000 ? std::string("2020/01/01 00:00:00\t1\t2\n") : std::string(line);
    }
    WriteFile(Path("big.txt"), content);
    EXPECT_EQ(RunHost({1, Format::Ascii, Path("big.txt").string(), "", "", Format::Rbx0, Path("big.rbx0").string()}), 1);
    EXPECT_FALSE(fs::exists(Path("big.rbx0")));
    EXPECT_NE(Log().find(Path("big.txt").string() + ":500000: "), std::string::npos) << Log();
    for (const auto& entry : fs::directory_iterator(m_folder.Path()))
        EXPECT_EQ(entry.path().filename().string().find(".part-"), std::string::npos) << entry.path();
}

TEST_F(EndToEnd, DamagedInputsFailWithAClearEntry)
{
    MakeInput(Format::Rbx0, Path("good.rbx0"));
    const std::string bytes = ReadFile(Path("good.rbx0"));
    WriteFile(Path("cut.rbx0"), bytes.substr(0, bytes.size() - 5));
    EXPECT_EQ(RunHost({1, Format::Rbx0, Path("cut.rbx0").string(), "", "", Format::Ascii, Path("cut.txt").string()}), 1);
    EXPECT_FALSE(fs::exists(Path("cut.txt")));
    EXPECT_NE(Log().find(Path("cut.rbx0").string() + ": "), std::string::npos) << Log();

    MakeInput(Format::Excel, Path("good.xlsx"));
    const std::string workbook = ReadFile(Path("good.xlsx"));
    WriteFile(Path("bad.xlsx"), workbook.substr(0, workbook.size() / 2));
    EXPECT_EQ(RunHost({1, Format::Excel, Path("bad.xlsx").string(), "", "", Format::Ascii, Path("bad.txt").string()}), 1);
    EXPECT_FALSE(fs::exists(Path("bad.txt")));
    EXPECT_NE(Log().find(Path("bad.xlsx").string() + ": "), std::string::npos) << Log();
}

TEST_F(EndToEnd, InterruptedEngineLeavesNoPartFile)
{
    WriteFile(Path("big.txt"), e2e::LargeSample(1000000));
    WriteFile(Path("engine.wpx"), "wpx 1\ntarget \"VELMORA\"\n section \"INPUT\"\n  File_format = 2\n  File_name = file \"big.txt\"\n"
                                  " end\n section \"OUTPUT\"\n  File_format = 2\n  File_name = file \"big.out.txt\"\n  Log_file = file \"engine.log\"\n end\nend\nwpx end\n");
    const std::string engine = std::string(VELMORA_BIN_DIR) + "/Velmora";
    const std::string setup = Path("engine.wpx").string();
    char* argv[] = {const_cast<char*>(engine.c_str()), const_cast<char*>(setup.c_str()), const_cast<char*>("1"),
                    const_cast<char*>("--quiet"), nullptr};
    pid_t pid = 0;
    ASSERT_EQ(posix_spawn(&pid, engine.c_str(), nullptr, nullptr, argv, environ), 0);
    auto partFiles = [&] {
        int count = 0;
        for (const auto& entry : fs::directory_iterator(m_folder.Path()))
            count += entry.path().filename().string().find(".part-") != std::string::npos ? 1 : 0;
        return count;
    };
    int status = 0;
    bool running = true;
    while (partFiles() == 0 && running)
        running = waitpid(pid, &status, WNOHANG) == 0;
    if (!running)
        GTEST_SKIP() << "the engine finished before it could be interrupted";
    ::kill(pid, SIGTERM);
    ASSERT_EQ(waitpid(pid, &status, 0), pid);
    ASSERT_TRUE(WIFEXITED(status));
    EXPECT_EQ(WEXITSTATUS(status), 128 + SIGTERM);
    EXPECT_EQ(partFiles(), 0);
    EXPECT_FALSE(fs::exists(Path("big.out.txt")));
}

// Text files as other programs write them: those that can be read convert, the rest are refused
// by name with the reason, and nothing waits on a FIFO.
TEST_F(EndToEnd, AwkwardTextFilesConvertOrAreRefusedByName)
{
    fs::create_directories(Path("in"));
    fs::create_directories(Path("out"));
    WriteFile(Path("in/bom.txt"), "\xEF\xBB\xBF" + kSample);
    const std::string python = "open('" + Path("in/python16.txt").string() + "', 'w', encoding='utf-16', newline='')"
                               ".write(open('" + Path("in/bom.txt").string() + "', encoding='utf-8-sig').read())";
    ASSERT_EQ(std::system(("/usr/bin/python3 -c \"" + python + "\"").c_str()), 0);
    std::string latin = kSample;
    latin.replace(latin.find("\tRain\t"), 6, "\tNiederschlag \xC4 \x80\t");
    WriteFile(Path("in/latin.txt"), latin);
    WriteFile(Path("in/odd16.txt"), ReadFile(Path("in/python16.txt")) + "x");
    WriteFile(Path("in/endless.txt"), std::string(5 << 20, '7'));
    ASSERT_EQ(::mkfifo(Path("in/fifo.txt").c_str(), 0600), 0);
    // Without extension a FIFO is no text file: not part of the run, and never opened.
    ASSERT_EQ(::mkfifo(Path("in/pipe").c_str(), 0600), 0);

    EXPECT_EQ(RunHost({2, Format::Ascii, Path("in").string(), "", "", Format::Ascii, Path("out").string()}), 1);
    EXPECT_EQ(Log().find(Path("in/pipe").string()), std::string::npos) << Log();
    EXPECT_EQ(ReadFile(Path("out/bom.txt")), kSample);
    EXPECT_EQ(ReadFile(Path("out/python16.txt")), kSample);
    EXPECT_NE(ReadFile(Path("out/latin.txt")).find("\tNiederschlag \xC3\x84 \xE2\x82\xAC\t"), std::string::npos)
        << ReadFile(Path("out/latin.txt"));
    for (const char* refused : {"odd16", "endless", "fifo"}) {
        EXPECT_FALSE(fs::exists(Path("out/" + std::string(refused) + ".txt"))) << refused;
        EXPECT_NE(Log().find(Path("in/" + std::string(refused) + ".txt").string() + ":"), std::string::npos)
            << refused << "\n" << Log();
    }
    EXPECT_NE(Log().find("UTF-16"), std::string::npos) << Log();
}

// "User Locale" means the same to the check and to the engine: the decimal separator of the
// environment's locale.
TEST_F(EndToEnd, CheckAndEngineAgreeOnTheUserLocale)
{
    const testsupport::ScratchLocale& german = testsupport::ScratchLocale::German();
    if (!german.Available())
        GTEST_SKIP() << "localedef cannot build de_DE.UTF-8 here (no localedef or no locale sources)";
    WriteFile(Path("comma.txt"), "Undefined[Undefined]:Instantaneous\nTime\tLevel\n2020/01/01 00:00:00\t3,5\n");
    sys::Status status;
    std::unique_ptr<CSpecification> spec = converter::LoadTemplate(Format::Ascii, "", status);
    spec->m_strDecimalSeparator = "User Locale";
    ASSERT_EQ(spec->Save(Path("locale.xml").string()), 1);
    const Setup setup{1, Format::Ascii, Path("comma.txt").string(), Path("locale.xml").string(), "", Format::Ascii,
                      Path("out.txt").string()};
    auto check = [this] {
        const std::string command = std::string(VELMORA_BIN_DIR) + "/velmora check '" + Path("setup.wpx").string() +
                                    "' >'" + Path("check.out").string() + "' 2>&1";
        return testsupport::ShellStatus(command);
    };
    {
        const testsupport::LocaleEnvironment environment(german, testsupport::ScratchLocale::kName, nullptr, nullptr);
        EXPECT_EQ(RunHost(setup), 0) << Log();
        EXPECT_NE(ReadFile(Path("out.txt")).find("\t3.5\n"), std::string::npos) << ReadFile(Path("out.txt"));
        EXPECT_EQ(check(), 0) << ReadFile(Path("check.out"));
    }
    const testsupport::LocaleEnvironment environment(german, "C", nullptr, nullptr);
    EXPECT_EQ(RunHost(setup), 1);
    EXPECT_EQ(check(), 1) << ReadFile(Path("check.out"));
    EXPECT_NE(ReadFile(Path("check.out")).find("FAIL "), std::string::npos) << ReadFile(Path("check.out"));
}

TEST_F(EndToEnd, EngineProgramHelpAndUsage)
{
    const std::string engine = std::string(VELMORA_BIN_DIR) + "/Velmora";
    auto status = [](const std::string& command) { return testsupport::ShellStatus(command + " >/dev/null 2>&1"); };
    EXPECT_EQ(status(engine + " --help"), 0);
    EXPECT_EQ(status(engine), 2);
    EXPECT_EQ(status(engine + " --bogus x.wpx"), 2);
    EXPECT_EQ(status(engine + " '" + Path("missing.wpx").string() + "' 1"), 3);
}

} // namespace
