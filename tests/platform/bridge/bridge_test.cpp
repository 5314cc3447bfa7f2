// The real bridge component: its verdict on a template and a data file must be what the conversion
// engine does with the same files, for every input format.
#include "tests/engine/CheckTestSupport.h"
#include "tests/support/XlsxWorkbook.h"

#include "converter/AsciiSeriesWriter.h"
#include "converter/Converter.h"
#include "converter/RbxSeriesWriter.h"
#include "engine/Engine.h"
#include "platform/bridge/BridgeComponent.h"
#include "platform/bridge/BridgeVerdict.h"
#include "platform/ui/UserInterface.h"
#include "templates/AsciiSpecification.h"
#include "templates/ExcelSpecification.h"

#include <gtest/gtest.h>

#include <filesystem>


using checktest::ScratchFolder;

namespace {

const char* const kBridgeNames[] = {"", "rbx Timeseries Bridge", "ASCII Timeseries Bridge (General)",
                                    "Excel Timeseries Bridge"};

// Three hourly steps of two items, one value missing.
void WriteSeries(converter::SeriesWriter& writer, const std::string& path)
{
    converter::SeriesHeader header;
    header.timeTitle = "Date/time";
    header.items = {{"Level", "Water level", "m", "Instantaneous"}, {"Flow", "Discharge", "m^3/s", "Instantaneous"}};
    ASSERT_TRUE(writer.Begin(path, header, "Gauge").ok());
    const converter::Stamp start = 1609459200; // 2021-01-01 00:00:00
    for (int step = 0; step < 3; ++step) {
        converter::Row row;
        row.stamp = start + 3600 * step;
        row.values = {1.5 + step, step == 1 ? converter::kMissing : 2.5 * step};
        ASSERT_TRUE(writer.Write(row).ok());
    }
    ASSERT_TRUE(writer.Finish().ok());
}

// The workbook a user would save from the spreadsheet application: shared strings, real date cells,
// in the layout a new Excel template reads.
void WriteWorkbook(const std::string& path)
{
    testsupport::XlsxWorkbook book(path);
    book.Text(1, 2, "Water level[m]:Instantaneous");
    book.Text(1, 3, "Discharge[m^3/s]:Instantaneous");
    book.Text(2, 1, "Date/time");
    book.Text(2, 2, "Level");
    book.Text(2, 3, "Flow");
    for (int step = 0; step < 3; ++step) {
        book.DateTime(3 + step, 1, lxw_datetime{2021, 1, 1, step, 0, 0.0}, "yyyy/mm/dd hh:mm:ss");
        book.Number(3 + step, 2, 1.5 + step);
        book.Number(3 + step, 3, 2.5 * step);
    }
    ASSERT_TRUE(book.Close());
}

struct Verdict {
    unsigned short value = 0;
    CString reason;
};

// Asks the component the way the setup record does.
Verdict Ask(const CString& bridgeName, const CString& templatePath, const CString& file, short scan = 0)
{
    std::unique_ptr<bridge::ITimeSeriesComponent> component = bridge::CreateComponent();
    EXPECT_NE(component, nullptr);
    std::unique_ptr<bridge::ITimeSeriesBridge> ts;
    component->GetBridge(ts);
    EXPECT_NE(ts, nullptr);
    ts->SetBridgeName(bridgeName);
    ts->SetParameters("TemplateFilePath=" + templatePath);
    ts->SetDataFile(file);
    ts->SetFolderScan(scan);
    Verdict verdict;
    EXPECT_EQ(ts->GetVerdict(&verdict.value), 1);
    verdict.reason = ts->GetReason();
    return verdict;
}

// The setup's number of the format a bridge name selects; 0 for an unknown name.
int FormatOfBridge(const char* bridgeName)
{
    const sys::FileFormatInfo* info = sys::FindFormatOfBridge(bridgeName);
    return info ? sys::Number(info->format) : 0;
}

// What the engine does with the same files: convert to rbx0 and report success.
bool EngineConverts(int format, const std::string& file, const std::string& templatePath, const ScratchFolder& scratch)
{
    sys::Status status;
    const auto inputFormat = static_cast<sys::FileFormat>(format);
    std::unique_ptr<CSpecification> spec = converter::LoadTemplate(inputFormat, templatePath, status);
    if (!status)
        return false;
    converter::FileJob job;
    job.inputFormat = inputFormat;
    job.input = file;
    job.spec = spec.get();
    job.outputFormat = sys::FileFormat::Rbx0;
    job.output = scratch.File("engine-output.rbx0");
    const bool converted = converter::ConvertFile(job).converted;
    std::filesystem::remove(job.output);
    return converted;
}

class BridgeVerdictTest : public testing::Test {
protected:
    void SetUp() override
    {
        converter::AsciiSeriesWriter ascii;
        WriteSeries(ascii, asciiFile);
        converter::RbxSeriesWriter rbx;
        WriteSeries(rbx, rbxFile);
        WriteWorkbook(excelFile);

        ASSERT_EQ(CAsciiSpecification().Save(asciiTemplate), 1);
        CAsciiSpecification commaSeparated;
        commaSeparated.m_strDelimiter = "Comma";
        ASSERT_EQ(commaSeparated.Save(asciiMisfit), 1);
        ASSERT_EQ(CExcelSpecification().Save(excelTemplate), 1);
        CExcelSpecification fifthSheet;
        fifthSheet.m_DataDesc.m_nExcelSheet = 5;
        ASSERT_EQ(fifthSheet.Save(excelMisfit), 1);
    }

    void ExpectAgreement(int format, const std::string& file, const std::string& templatePath, bool expected)
    {
        const Verdict verdict = Ask(kBridgeNames[format], templatePath, file);
        EXPECT_EQ(verdict.value, expected ? bridge::kVerdictTrue : bridge::kVerdictFalse) << file << ": " << verdict.reason;
        EXPECT_EQ(verdict.value == bridge::kVerdictTrue, EngineConverts(format, file, templatePath, scratch))
            << "the bridge and the engine disagree on " << file << " with " << templatePath;
        EXPECT_EQ(verdict.reason.empty(), expected) << verdict.reason;
    }

    ScratchFolder scratch;
    ui::ScriptedUserInterface screen;
    ui::ScopedUserInterface watching{screen};
    std::string asciiFile = scratch.File("gauge.txt");
    std::string rbxFile = scratch.File("gauge.rbx0");
    std::string excelFile = scratch.File("gauge.xlsx");
    std::string asciiTemplate = scratch.File("ascii.xml");
    std::string asciiMisfit = scratch.File("ascii-comma.xml");
    std::string excelTemplate = scratch.File("excel.xml");
    std::string excelMisfit = scratch.File("excel-sheet5.xml");
};

} // namespace

TEST_F(BridgeVerdictTest, AsciiTemplateThatFitsAndOneThatDoesNot)
{
    ExpectAgreement(2, asciiFile, asciiTemplate, true);
    ExpectAgreement(2, asciiFile, asciiMisfit, false);
    EXPECT_TRUE(screen.boxes.empty()) << "the bridge reads silently; it showed: " << screen.boxes.front().text;
}

TEST_F(BridgeVerdictTest, ExcelTemplateThatFitsAndOneThatDoesNot)
{
    CExcelSpecification defaults;
    const bool engineReadsExcel = converter::MakeReader(sys::FileFormat::Excel, &defaults) != nullptr;
    if (!engineReadsExcel)
        std::printf("note: the conversion engine of this build reads no Excel input, so neither does the bridge\n");
    ExpectAgreement(3, excelFile, excelTemplate, engineReadsExcel);
    ExpectAgreement(3, excelFile, excelMisfit, false);
    EXPECT_TRUE(screen.boxes.empty());
}

TEST_F(BridgeVerdictTest, RbxFileThatReadsAndOneThatIsTruncated)
{
    ExpectAgreement(1, rbxFile, asciiTemplate, true);
    const auto size = std::filesystem::file_size(rbxFile);
    const std::string truncated = scratch.File("truncated.rbx0");
    std::filesystem::copy_file(rbxFile, truncated);
    std::filesystem::resize_file(truncated, size / 2);
    ExpectAgreement(1, truncated, asciiTemplate, false);
}

TEST_F(BridgeVerdictTest, FilesOfAnotherFormatAreRefused)
{
    ExpectAgreement(2, rbxFile, asciiTemplate, false);
    ExpectAgreement(1, asciiFile, asciiTemplate, false);
    ExpectAgreement(3, asciiFile, excelTemplate, false);
}

TEST_F(BridgeVerdictTest, UnknownBridgeMissingFileOrUnloadableTemplateGiveFalse)
{
    const std::string garbage = scratch.Write("garbage.xml", "<not a template");
    struct Case {
        const char* what;
        CString bridgeName;
        CString templatePath;
        CString file;
    } cases[] = {
        {"unknown bridge", "CSV Bridge", asciiTemplate, asciiFile},
        {"bridge name in other case", "ascii timeseries bridge (general)", asciiTemplate, asciiFile},
        {"missing data file", kBridgeNames[2], asciiTemplate, scratch.File("missing.txt")},
        {"empty data file name", kBridgeNames[2], asciiTemplate, ""},
        {"template that does not load", kBridgeNames[2], garbage, asciiFile},
        {"missing template", kBridgeNames[2], scratch.File("missing.xml"), asciiFile},
        {"no template", kBridgeNames[2], "", asciiFile},
        {"excel template that does not load", kBridgeNames[3], garbage, excelFile},
    };
    for (const Case& c : cases) {
        const Verdict verdict = Ask(c.bridgeName, c.templatePath, c.file);
        EXPECT_EQ(verdict.value, bridge::kVerdictFalse) << c.what;
        EXPECT_FALSE(verdict.reason.empty()) << c.what;
    }
}

TEST_F(BridgeVerdictTest, ReasonNamesTheFileAndWhatWasExpected)
{
    const Verdict misfit = Ask(kBridgeNames[2], asciiMisfit, asciiFile);
    EXPECT_NE(misfit.reason.find(asciiFile), std::string::npos) << misfit.reason;
    const Verdict unknown = Ask("CSV Bridge", asciiTemplate, asciiFile);
    EXPECT_NE(unknown.reason.find("CSV Bridge"), std::string::npos) << unknown.reason;
}

TEST_F(BridgeVerdictTest, FolderScanPassesOverHiddenFiles)
{
    const std::string hidden = scratch.File(".gauge.txt");
    std::filesystem::copy_file(asciiFile, hidden);
    EXPECT_EQ(Ask(kBridgeNames[2], asciiTemplate, hidden, bridge::kSingleFile).value, bridge::kVerdictTrue);
    EXPECT_EQ(Ask(kBridgeNames[2], asciiTemplate, hidden, bridge::kFolderScan).value, bridge::kVerdictFalse);
    EXPECT_EQ(Ask(kBridgeNames[2], asciiTemplate, asciiFile, bridge::kFolderScan).value, bridge::kVerdictTrue);
}

TEST_F(BridgeVerdictTest, SetupRecordSeesTheSameVerdicts)
{
    CEngine engine;
    EXPECT_EQ(engine.BridgeAccepts(asciiFile, asciiTemplate, 2, 0), 1);
    EXPECT_EQ(engine.BridgeAccepts(asciiFile, asciiMisfit, 2, 0), 0);
    EXPECT_EQ(engine.BridgeAccepts(rbxFile, asciiTemplate, 1, 0), 1);

    const std::string folder = scratch.MakeFolder("in");
    std::filesystem::copy_file(asciiFile, folder + "/b.txt");
    scratch.Write("in/a.txt", "not a time series\n");
    CString match;
    EXPECT_EQ(engine.FindMatchingFile(folder, match, 2, asciiTemplate), 1);
    EXPECT_EQ(match, folder + "/b.txt");
    EXPECT_EQ(engine.FindMatchingFile(folder, match, 2, asciiMisfit), 0);
}

TEST(BridgeNames, SelectTheFormatExactly)
{
    EXPECT_EQ(FormatOfBridge("rbx Timeseries Bridge"), 1);
    EXPECT_EQ(FormatOfBridge("ASCII Timeseries Bridge (General)"), 2);
    EXPECT_EQ(FormatOfBridge("Excel Timeseries Bridge"), 3);
    EXPECT_EQ(FormatOfBridge("Excel Timeseries Bridge "), 0);
    EXPECT_EQ(FormatOfBridge(""), 0);
    EXPECT_EQ(bridge::TemplatePathOf("TemplateFilePath=/t/a b=c.xml"), "/t/a b=c.xml");
    EXPECT_EQ(bridge::TemplatePathOf("TemplateFilePath="), "");
    EXPECT_EQ(bridge::TemplatePathOf("Template=/t/a.xml"), "");
}
