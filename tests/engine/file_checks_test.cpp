// FolderExists, CheckFileExtension and IsTextFile: the checks of a path against the file system.
#include "tests/engine/CheckTestSupport.h"

#include "engine/Engine.h"
#include "resources/StringTable.h"

#include <gtest/gtest.h>

#include <fstream>

using checktest::ScopedEnv;
using checktest::ScratchFolder;

TEST(FolderExists, AnswersAlikeWithAndWithoutTrailingSeparator)
{
    ScratchFolder scratch;
    const std::string folder = scratch.MakeFolder("data");
    const std::string file = scratch.Write("plain.txt", "x");
    CEngine engine;
    EXPECT_EQ(engine.FolderExists(folder), 1);
    EXPECT_EQ(engine.FolderExists(folder + "/"), 1);
    EXPECT_EQ(engine.FolderExists(file), 0);
    EXPECT_EQ(engine.FolderExists(file + "/"), 0);
    EXPECT_EQ(engine.FolderExists(scratch.File("missing")), 0);
    EXPECT_EQ(engine.FolderExists(scratch.File("missing/")), 0);
}

TEST(FolderExists, RefusesPathsShorterThanTwoOrLongerThan260Characters)
{
    CEngine engine;
    EXPECT_EQ(engine.FolderExists(""), 0);
    EXPECT_EQ(engine.FolderExists("/"), 0);
    EXPECT_EQ(engine.FolderExists("."), 0);
    EXPECT_EQ(engine.FolderExists(".."), 1);

    // An existing folder reached through a path padded with "/./" to an exact length.
    auto padded = [](size_t length) {
        std::string path = "/tmp";
        while (path.size() + 2 <= length)
            path += "/.";
        if (path.size() < length)
            path += "/";
        return path;
    };
    ASSERT_EQ(padded(260).size(), 260u);
    ASSERT_EQ(padded(261).size(), 261u);
    EXPECT_EQ(engine.FolderExists(padded(260)), 1);
    EXPECT_EQ(engine.FolderExists(padded(261)), 0);
}

struct ExtensionCase {
    const char* name;
    int format;
    int expected;
};

class AsciiAndRbxExtension : public testing::TestWithParam<ExtensionCase> {};

TEST_P(AsciiAndRbxExtension, FollowsTheFormatRule)
{
    ScratchFolder scratch;
    const ExtensionCase& c = GetParam();
    const std::string path = scratch.Write(c.name, "2021/01/01 00:00:00\t1\n");
    CEngine engine;
    CString message = "untouched";
    EXPECT_EQ(engine.CheckFileExtension(path, c.format, message), c.expected) << c.name;
    EXPECT_EQ(message, "untouched") << "only the Excel rule writes a message";
}

INSTANTIATE_TEST_SUITE_P(
    Table, AsciiAndRbxExtension,
    testing::Values(ExtensionCase{"a.rbx0", 1, 1}, ExtensionCase{"a.RBX0", 1, 1}, ExtensionCase{"a.rbx", 1, 0},
                    ExtensionCase{"a.txt", 1, 0}, ExtensionCase{"a.txt", 2, 1}, ExtensionCase{"a.CSV", 2, 1},
                    ExtensionCase{"a.Tab", 2, 1}, ExtensionCase{"noextension", 2, 1}, ExtensionCase{"a.dat", 2, 0},
                    ExtensionCase{"a.txt.bak", 2, 0}, ExtensionCase{"a.txt", 4, 0}, ExtensionCase{"a.txt", 0, 0}));

TEST(CheckFileExtension, TakesTheExtensionFromTheLastPathElementOnly)
{
    ScratchFolder scratch;
    const std::string folder = scratch.MakeFolder("dotted.folder");
    std::ofstream(folder + "/readme") << "plain text";
    CEngine engine;
    CString message;
    EXPECT_EQ(engine.CheckFileExtension(folder + "/readme", 2, message), 1);
}

TEST(CheckFileExtension, DatNeverPassesWhateverItHolds)
{
    ScratchFolder scratch;
    const std::string path = scratch.Write("values.dat", "Date\tA\n2021/01/01\t1\n");
    CEngine engine;
    CString message;
    EXPECT_EQ(engine.IsTextFile(path), 1);
    EXPECT_EQ(engine.CheckFileExtension(path, 2, message), 0);
}

TEST(CheckFileExtension, ExtensionlessFileWithZeroByteFails)
{
    ScratchFolder scratch;
    const std::string path = scratch.Write("binary", std::string("ab\0cd", 5));
    CEngine engine;
    CString message;
    EXPECT_EQ(engine.CheckFileExtension(path, 2, message), 0);
}

struct ExcelCase {
    const char* presence; // nullptr: present
    const char* version;
    const char* extension;
    int expected;
};

class ExcelExtension : public testing::TestWithParam<ExcelCase> {};

TEST_P(ExcelExtension, NeedsASuitableSpreadsheetVersionAskedAtEachTest)
{
    const ExcelCase& c = GetParam();
    ScopedEnv presence("VELMORA_SPREADSHEET", c.presence ? std::optional<std::string>(c.presence) : std::nullopt);
    ScopedEnv version("VELMORA_SPREADSHEET_VERSION", c.version);
    CEngine engine;
    CString message;
    const std::string path = std::string("/nowhere/book") + c.extension;
    EXPECT_EQ(engine.CheckFileExtension(path, 3, message), c.expected) << c.extension << " v" << c.version;
    EXPECT_EQ(message, c.expected ? CString() : res::LoadString(res::IDS_EXCEL_MISSING));
}

INSTANTIATE_TEST_SUITE_P(
    Table, ExcelExtension,
    testing::Values(ExcelCase{nullptr, "11.0", ".XLSX", 0}, ExcelCase{nullptr, "11.0", ".xls", 1},
                    ExcelCase{nullptr, "12.0", ".xlsx", 1}, ExcelCase{nullptr, "12.0", ".Xls", 1},
                    ExcelCase{nullptr, "10.0", ".xls", 0}, ExcelCase{nullptr, "16.0", ".csv", 0},
                    ExcelCase{nullptr, "16.0", "", 0}, ExcelCase{"absent", "16.0", ".xls", 0},
                    ExcelCase{"absent", "16.0", ".xlsx", 0}));

TEST(CheckFileExtension, ExcelVersionIsAskedAnewEachTime)
{
    CEngine engine;
    CString message;
    {
        ScopedEnv version("VELMORA_SPREADSHEET_VERSION", "11.0");
        EXPECT_EQ(engine.CheckFileExtension("book.xlsx", 3, message), 0);
    }
    message.clear();
    ScopedEnv version("VELMORA_SPREADSHEET_VERSION", "12.0");
    EXPECT_EQ(engine.CheckFileExtension("book.xlsx", 3, message), 1);
    EXPECT_TRUE(message.empty());
}

TEST(IsTextFile, ZeroByteCountsOnlyWithinTheFirst40960Bytes)
{
    ScratchFolder scratch;
    CEngine engine;
    std::string lateZero(40960, 'a');
    lateZero += '\0';
    std::string lastProbedZero(40959, 'a');
    lastProbedZero += '\0';
    EXPECT_EQ(engine.IsTextFile(scratch.Write("late", lateZero)), 1);
    EXPECT_EQ(engine.IsTextFile(scratch.Write("edge", lastProbedZero)), 0);
    EXPECT_EQ(engine.IsTextFile(scratch.Write("first", std::string(1, '\0'))), 0);
    EXPECT_EQ(engine.IsTextFile(scratch.Write("one", "x")), 1);
}

TEST(IsTextFile, RefusesEmptyPathEmptyFileMissingFileAndFolder)
{
    ScratchFolder scratch;
    CEngine engine;
    EXPECT_EQ(engine.IsTextFile(""), 0);
    EXPECT_EQ(engine.IsTextFile(scratch.Write("empty", "")), 0);
    EXPECT_EQ(engine.IsTextFile(scratch.File("missing")), 0);
    EXPECT_EQ(engine.IsTextFile(scratch.MakeFolder("sub")), 0);
}
