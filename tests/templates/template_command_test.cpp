// Runs the host program's template command as a person would and checks output and exit status.
#include "TemplateTestSupport.h"
#include "tests/support/ShellCommand.h"

#include "templates/AsciiSpecification.h"
#include "templates/ExcelSpecification.h"

#include <gtest/gtest.h>

#include <string>

using namespace testsupport;

namespace {

struct CommandRun {
    int status = -1;
    std::string out;
    std::string err;
};

CommandRun Velmora(const ScratchFolder& folder, const std::string& args)
{
    const std::string program = std::string(VELMORA_BIN_DIR) + "/velmora";
    const std::string command = ShellQuote(program) + " template " + args + " >" + ShellQuote(folder.File("out.txt")) + " 2>" +
                                ShellQuote(folder.File("err.txt")) + " </dev/null";
    CommandRun run;
    run.status = ShellStatus(command);
    run.out = ReadFile(folder.File("out.txt"));
    run.err = ReadFile(folder.File("err.txt"));
    return run;
}

} // namespace

TEST(TemplateCommand, NewWritesTheDefaultsOfEitherKind)
{
    ScratchFolder folder;
    CommandRun ascii = Velmora(folder, "new --format ascii " + ShellQuote(folder.File("a.xml")));
    ASSERT_EQ(ascii.status, 0) << ascii.err;
    CAsciiSpecification loaded;
    loaded.m_strDelimiter = "Comma";
    ASSERT_EQ(loaded.Load(folder.File("a.xml")), 1) << loaded.LastError();
    EXPECT_EQ(loaded.m_strDelimiter, "Tab");
    EXPECT_EQ(loaded.m_DataDesc.m_nStartRow, 3);

    CommandRun excel = Velmora(folder, "new --format=excel " + ShellQuote(folder.File("e.xml")));
    ASSERT_EQ(excel.status, 0) << excel.err;
    CExcelSpecification excelLoaded;
    EXPECT_EQ(excelLoaded.Load(folder.File("e.xml")), 1) << excelLoaded.LastError();
    EXPECT_EQ(CAsciiSpecification().Load(folder.File("e.xml")), 0);
}

TEST(TemplateCommand, ShowPrintsTextOrJson)
{
    ScratchFolder folder;
    CExcelSpecification spec;
    spec.m_DataDesc.m_nExcelSheet = 2;
    spec.m_DataDesc.m_strGlobalUnit = "\"m\"\t\xC2\xB3";
    spec.m_DataDesc.m_vecItemDefs = {{"Flow", "Flow", "m3/s", "Accumulated"}};
    ASSERT_EQ(spec.Save(folder.File("e.xml")), 1);

    CommandRun text = Velmora(folder, "show " + ShellQuote(folder.File("e.xml")));
    ASSERT_EQ(text.status, 0) << text.err;
    EXPECT_NE(text.out.find("Kind: excel\n"), std::string::npos) << text.out;
    EXPECT_NE(text.out.find("ExcelSheet: 2\n"), std::string::npos) << text.out;
    EXPECT_NE(text.out.find("Items: 1\n"), std::string::npos) << text.out;

    CommandRun json = Velmora(folder, "show --json " + ShellQuote(folder.File("e.xml")));
    ASSERT_EQ(json.status, 0) << json.err;
    EXPECT_EQ(json.out.rfind("{\"kind\":\"excel\",\"values\":{", 0), 0u) << json.out;
    EXPECT_NE(json.out.find("\"ExcelSheet\":2"), std::string::npos);
    // An independent JSON reader accepts the output and sees the same values.
    WriteFile(folder.File("check.py"),
               "import json,sys\n"
               "d=json.load(open(sys.argv[1],encoding='utf-8'))\n"
               "assert d['kind']=='excel'\n"
               "assert d['values']['GlobalUnit']=='\"m\"\\t\\u00b3', d['values']['GlobalUnit']\n"
               "assert d['values']['SelItems']==[]\n"
               "assert d['items']==[{'title':'Flow','type':'Flow','unit':'m3/s','valueType':'Accumulated'}]\n"
               "assert len(d['values'])==35\n");
    std::string check = "python3 " + ShellQuote(folder.File("check.py")) + " " + ShellQuote(folder.File("out.txt"));
    EXPECT_EQ(std::system(check.c_str()), 0) << json.out;
}

TEST(TemplateCommand, FailuresAndBadUsage)
{
    ScratchFolder folder;
    WriteFile(folder.File("bad.xml"), "<ASCIITSBridgeSpecification StartRow='x'/>");
    struct Case {
        std::string args;
        int status;
        const char* errorPart;
    } cases[] = {
        {"show " + ShellQuote(folder.File("missing.xml")), 1, "missing.xml: cannot be opened"},
        {"show " + ShellQuote(folder.File("bad.xml")), 1, "StartRow must be a whole number"},
        {"show --json " + ShellQuote(folder.File("bad.xml")), 1, "bad.xml"},
        {"new --format ascii " + ShellQuote(folder.File("no/such/folder.xml")), 1, "cannot be written"},
        {"show", 2, "needs a template file"},
        {"show a.xml b.xml", 2, "one template file"},
        {"show --yaml a.xml", 2, "unknown option"},
        {"new --format csv x.xml", 2, "unknown format"},
        {"new x.xml", 2, "--format"},
        {"new --format ascii", 2, "output file"},
        {"edit x.xml", 2, "unknown sub-command"},
        {"", 2, "missing sub-command"},
    };
    for (const Case& c : cases) {
        CommandRun run = Velmora(folder, c.args);
        EXPECT_EQ(run.status, c.status) << c.args << "\n" << run.err;
        EXPECT_NE(run.err.find(c.errorPart), std::string::npos) << c.args << "\n" << run.err;
        EXPECT_EQ(run.out, "") << c.args;
    }
    CommandRun help = Velmora(folder, "--help");
    EXPECT_EQ(help.status, 0);
    EXPECT_NE(help.out.find("velmora template show FILE [--json]"), std::string::npos);
}
