// Runs `velmora preview` on the example files and on bad arguments, as a user would.
#include "ParserTestSupport.h"
#include "templates/AsciiSpecification.h"
#include "tests/support/ShellCommand.h"

#include <gtest/gtest.h>

#include <string>

namespace {

using testsupport::ShellRun;

ShellRun Velmora(const std::string& arguments)
{
    return testsupport::RunShell(std::string(VELMORA_BIN_DIR) + "/velmora preview " + arguments + " 2>/dev/null");
}

std::string Example(const std::string& relative) { return std::string(VELMORA_SOURCE_DIR) + "/examples/" + relative; }

TEST(PreviewCommand, AsciiExampleAsJson)
{
    const ShellRun run = Velmora(Example("data/river_gauge.txt") + " --format ascii --template " +
                            Example("templates/river_gauge.xml") + " --items 1 --json");
    ASSERT_EQ(run.status, 0) << run.out;
    EXPECT_NE(run.out.find("{\"ok\":true,"), std::string::npos);
    EXPECT_NE(run.out.find("\"itemNames\":[\"Time\",\"Level\",\"Flow\"]"), std::string::npos);
    EXPECT_NE(run.out.find("\"previewTitles\":[\"Time\",\"Flow\"]"), std::string::npos);
    EXPECT_NE(run.out.find("[\"2024/03/01 15:00:00\",\"\"]"), std::string::npos); // -999 is the delete value
    EXPECT_NE(run.out.find("\"Time    Level    Flow\""), std::string::npos);       // raw line, tabs opened up
}

TEST(PreviewCommand, FailedParseReportsItsMessages)
{
    testsupport::ScratchFolder folder;
    const std::string file = folder.Write("bad.txt", "h\nTime\tA\n2020/01/01 00:00:00\t3,5\n");
    CAsciiSpecification spec;
    spec.m_DataDesc.m_nUnitTypeOption = 0;
    spec.m_DataDesc.m_nUnitOption = 0;
    spec.m_DataDesc.m_nValueTypeOption = 0;
    ASSERT_EQ(spec.Save(folder.File("t.xml")), 1);
    const ShellRun run = Velmora(file + " --format ascii --json --template " + folder.File("t.xml"));
    EXPECT_EQ(run.status, 1);
    EXPECT_NE(run.out.find("{\"ok\":false,"), std::string::npos) << run.out;
    const std::string message = "{\"text\":\"" + res::LoadString(res::IDS_DECIMAL_SEPARATOR_MISMATCH) + "\",\"caption\":\"\"}";
    EXPECT_NE(run.out.find("\"messages\":[" + message + "]"), std::string::npos) << run.out;
    EXPECT_NE(run.out.find("[\"\",\"Undefined\"]"), std::string::npos); // the rows read before the failure stay
}

TEST(PreviewCommand, EveryFailureSaysWhichFileAndWhy)
{
    testsupport::ScratchFolder folder;
    const std::string notRbx = folder.Write("text.rbx0", "Time\tA\n");
    const std::string notBook = folder.Write("text.xlsx", "Time\tA\n");
    const std::string bad = folder.Write("bad.txt", "h\nTime\tA\n2020/01/01 00:00:00\t3,5\n");
    const struct {
        std::string arguments;
        std::string error;
    } cases[] = {
        {folder.File("absent.rbx0") + " --format rbx0", folder.File("absent.rbx0") + ": the file does not exist"},
        {folder.File("absent.xlsx") + " --format excel", folder.File("absent.xlsx") + ": the file does not exist"},
        {folder.File("absent.txt") + " --format ascii", folder.File("absent.txt") + ": the file does not exist"},
        {notRbx + " --format rbx0", notRbx + ": "},
        {notBook + " --format excel", notBook + ": "},
        {bad + " --format ascii", bad + ":1: the line gives no item type the unit catalogue knows"},
        {"/dev/zero --format ascii", "/dev/zero: it is a device, not a regular file"},
    };
    for (const auto& c : cases) {
        const ShellRun json = Velmora(c.arguments + " --json");
        EXPECT_EQ(json.status, 1) << c.arguments;
        EXPECT_NE(json.out.find("\"error\":\"" + c.error), std::string::npos) << json.out;
        EXPECT_EQ(json.out.find("\"error\":\"\""), std::string::npos) << json.out;
        const ShellRun text = Velmora(c.arguments);
        EXPECT_EQ(text.status, 1) << c.arguments;
        EXPECT_NE(text.out.find("Parse failed: "), std::string::npos) << text.out;
        EXPECT_NE(text.out.find(c.error), std::string::npos) << text.out;
    }
    // A success has no error.
    const ShellRun good = Velmora(Example("data/river_gauge.rbx0") + " --format rbx0 --json");
    EXPECT_EQ(good.status, 0);
    EXPECT_EQ(good.out.find("\"error\""), std::string::npos);
}

TEST(PreviewCommand, RbxExampleAsTable)
{
    const ShellRun run = Velmora(Example("data/river_gauge.rbx0") + " --format rbx0");
    ASSERT_EQ(run.status, 0);
    EXPECT_EQ(run.out.find("Input file"), std::string::npos); // rbx0 files have no raw lines
    EXPECT_NE(run.out.find("Date/time"), std::string::npos);
    EXPECT_NE(run.out.find("2024-03-03 23:00:00"), std::string::npos); // the last of 72 hourly steps
}

TEST(PreviewCommand, BadUsage)
{
    const std::string file = Example("data/river_gauge.txt");
    for (const std::string& arguments :
         {std::string("--format ascii"), file, file + " --format xls", file + " --format ascii --items 2,x",
          file + " --format ascii --bogus", Example("data/river_gauge.rbx0") + " --format rbx0 --template t.xml",
          file + " --format"}) {
        EXPECT_EQ(Velmora(arguments).status, 2) << arguments;
    }
    EXPECT_EQ(Velmora("--help").status, 0);
}

TEST(PreviewCommand, UnloadableTemplateFails)
{
    testsupport::ScratchFolder folder;
    const std::string tmpl = folder.Write("broken.xml", "<not a template");
    EXPECT_EQ(Velmora(Example("data/river_gauge.txt") + " --format ascii --template " + tmpl).status, 1);
}

} // namespace
