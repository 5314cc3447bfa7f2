// Whole conversions through the library: round trips between formats, item selection, the folder
// job with a misfit file, and outputs that are never left half-written.
#include "TestFiles.h"
#include "converter/ConversionJob.h"
#include "converter/Converter.h"
#include "converter/StampText.h"
#include "platform/rbx/RbxReader.h"
#include "platform/system/Text.h"
#include "templates/AsciiSpecification.h"

#include <gtest/gtest.h>

#include <filesystem>

using namespace converter;
namespace fs = std::filesystem;

namespace {

const std::string kSample = "Rainfall[mm]:Accumulated\tWater Level[m]:Instantaneous\tUndefined[Undefined]:Instantaneous\n"
                            "Date/time\tRain\tLevel\tOther\n"
                            "2020/01/01 00:00:00\t0.1\t1.25\t7\n"
                            "2020/01/01 00:15:00\t\t1.5\t8\n"
                            "2020/01/01 00:30:00\t0.3\t\t9\n";

FileReport Convert(sys::FileFormat in, const std::string& input, sys::FileFormat out, const std::string& output, CUIntArray items = {})
{
    sys::Status status;
    std::unique_ptr<CSpecification> spec = LoadTemplate(in, "", status);
    FileJob job{in, input, spec.get(), std::move(items), out, output, "Title"};
    return ConvertFile(job);
}

std::vector<std::string> LeftoverTemporaries(const std::string& folder)
{
    std::vector<std::string> names;
    for (const auto& entry : fs::directory_iterator(folder))
        if (entry.path().filename().string().find(".part-") != std::string::npos)
            names.push_back(entry.path().string());
    return names;
}

TEST(Conversion, TextThroughRbx0AndBackKeepsEverything)
{
    testsupport::ScratchFolder folder;
    testsupport::WriteFile(folder.File("in.txt"), kSample);
    FileReport there = Convert(sys::FileFormat::Ascii, folder.File("in.txt"), sys::FileFormat::Rbx0, folder.File("mid.rbx0"));
    ASSERT_TRUE(there.converted) << there.problem.Describe();
    EXPECT_EQ(there.rows, 3u);
    FileReport back = Convert(sys::FileFormat::Rbx0, folder.File("mid.rbx0"), sys::FileFormat::Ascii, folder.File("out.txt"));
    ASSERT_TRUE(back.converted) << back.problem.Describe();
    std::string expected = kSample;
    expected.replace(expected.find("Date/time"), 9, "Date/time"); // the rbx0 file names its time column so too
    EXPECT_EQ(testsupport::ReadFile(folder.File("out.txt")), expected);
    EXPECT_TRUE(LeftoverTemporaries(folder.Path()).empty());
}

TEST(Conversion, TextToTextWithSelectionReorders)
{
    testsupport::ScratchFolder folder;
    testsupport::WriteFile(folder.File("in.txt"), kSample);
    FileReport report = Convert(sys::FileFormat::Ascii, folder.File("in.txt"), sys::FileFormat::Ascii, folder.File("out.txt"), {2, 0});
    ASSERT_TRUE(report.converted) << report.problem.Describe();
    EXPECT_EQ(report.itemsWritten, 2u);
    EXPECT_EQ(testsupport::ReadFile(folder.File("out.txt")),
              "Undefined[Undefined]:Instantaneous\tRainfall[mm]:Accumulated\n"
              "Date/time\tOther\tRain\n"
              "2020/01/01 00:00:00\t7\t0.1\n"
              "2020/01/01 00:15:00\t8\t\n"
              "2020/01/01 00:30:00\t9\t0.3\n");
}

TEST(Conversion, ASelectionNamingAnItemTwiceOrOneTheFileLacksIsRefused)
{
    const struct {
        CUIntArray items;
        const char* problem;
    } cases[] = {
        {{2, 0, 9}, "Items entry 3 names item 9, but the file has 3 items (numbered from 0)"},
        {{1, 0, 1}, "Items names item 1 twice (entries 1 and 3)"},
        {{0, 0}, "Items names item 0 twice (entries 1 and 2)"},
        {{3}, "Items entry 1 names item 3, but the file has 3 items (numbered from 0)"},
    };
    testsupport::ScratchFolder folder;
    testsupport::WriteFile(folder.File("in.txt"), kSample);
    for (const auto& c : cases) {
        FileReport report = Convert(sys::FileFormat::Ascii, folder.File("in.txt"), sys::FileFormat::Ascii, folder.File("out.txt"), c.items);
        EXPECT_FALSE(report.converted);
        EXPECT_EQ(report.problem.message, c.problem);
        EXPECT_FALSE(std::filesystem::exists(folder.File("out.txt")));
        EXPECT_EQ(SelectionProblem(c.items, 3), c.problem);
    }
    EXPECT_EQ(SelectionProblem({4, 0, 2}, 5), "");
}

// Through every output kind (Excel output as .xlsx and as .xls) and back to the text.
TEST(Conversion, EveryFormatPairRoundTrips)
{
    const std::pair<sys::FileFormat, const char*> outputs[] = {
        {sys::FileFormat::Rbx0, ".rbx0"}, {sys::FileFormat::Ascii, ".txt"}, {sys::FileFormat::Excel, ".xlsx"}, {sys::FileFormat::Excel, ".xls"}};
    for (const auto& [middle, middleExtension] : outputs)
        for (const auto& [last, lastExtension] : outputs) {
            SCOPED_TRACE(std::string(middleExtension) + " then " + lastExtension);
            testsupport::ScratchFolder folder;
            testsupport::WriteFile(folder.File("in.txt"), kSample);
            const std::string mid = folder.File(std::string("mid") + middleExtension);
            const std::string end = folder.File(std::string("end") + lastExtension);
            FileReport first = Convert(sys::FileFormat::Ascii, folder.File("in.txt"), middle, mid);
            ASSERT_TRUE(first.converted) << first.problem.Describe();
            FileReport second = Convert(middle, mid, last, end);
            ASSERT_TRUE(second.converted) << second.problem.Describe();
            FileReport back = Convert(last, end, sys::FileFormat::Ascii, folder.File("back.txt"));
            ASSERT_TRUE(back.converted) << back.problem.Describe();
            EXPECT_EQ(testsupport::ReadFile(folder.File("back.txt")), kSample);
        }
}

TEST(Conversion, AnXlsWorkbookInTheEngineLayoutReadsWithoutATemplateFile)
{
    // Written record by record by tests/data/spreadsheet/make_test_files.py: date-time cells,
    // blank cells for the missing values.
    testsupport::ScratchFolder folder;
    FileReport report = Convert(sys::FileFormat::Excel, std::string(VELMORA_TEST_DATA) + "/spreadsheet/engine-layout.xls", sys::FileFormat::Ascii,
                                folder.File("out.txt"));
    ASSERT_TRUE(report.converted) << report.problem.Describe();
    EXPECT_EQ(testsupport::ReadFile(folder.File("out.txt")), kSample);
}

TEST(Conversion, ExcelRowsCrossTheReadingBatchesAndDeleteValuesMatchTheDisplayedText)
{
    // 700 rows pass from the reading thread in several batches; every seventh level is -999.
    std::string original = "Rainfall[mm]:Accumulated\tWater Level[m]:Instantaneous\nDate/time\tRain\tLevel\n";
    std::string withoutDeleted = original;
    for (int i = 0; i < 700; ++i) {
        const std::string stamp = text::Format("2020/01/01 %02d:%02d:00", i / 60, i % 60);
        const std::string rain = std::to_string(i % 5) + ".5";
        original += stamp + "\t" + rain + "\t" + (i % 7 == 0 ? "-999" : std::to_string(i)) + "\n";
        withoutDeleted += stamp + "\t" + rain + "\t" + (i % 7 == 0 ? "" : std::to_string(i)) + "\n";
    }
    testsupport::ScratchFolder folder;
    testsupport::WriteFile(folder.File("in.txt"), original);
    ASSERT_TRUE(Convert(sys::FileFormat::Ascii, folder.File("in.txt"), sys::FileFormat::Excel, folder.File("mid.xlsx")).converted);
    FileReport plain = Convert(sys::FileFormat::Excel, folder.File("mid.xlsx"), sys::FileFormat::Ascii, folder.File("plain.txt"));
    ASSERT_TRUE(plain.converted) << plain.problem.Describe();
    EXPECT_EQ(testsupport::ReadFile(folder.File("plain.txt")), original);

    sys::Status status;
    std::unique_ptr<CSpecification> spec = LoadTemplate(sys::FileFormat::Excel, "", status);
    spec->m_DataDesc.m_nDeleteValueCheck = 1;
    spec->m_DataDesc.m_nDeleteValueRadio = 0;
    spec->m_DataDesc.m_strDeleteValue = "-999";
    FileJob job{sys::FileFormat::Excel, folder.File("mid.xlsx"), spec.get(), {}, sys::FileFormat::Ascii, folder.File("deleted.txt"), "Title"};
    FileReport deleted = ConvertFile(job);
    ASSERT_TRUE(deleted.converted) << deleted.problem.Describe();
    EXPECT_EQ(testsupport::ReadFile(folder.File("deleted.txt")), withoutDeleted);
}

TEST(Conversion, Rbx0HeaderDescribesAxisAndItems)
{
    testsupport::ScratchFolder folder;
    struct Case {
        std::string text;
        int axisType;
        double step;
    } cases[] = {
        {kSample, rbx::kEquidistantCalendar, 900},
        {kSample + "2020/01/01 01:30:00\t1\t2\t3\n", rbx::kNonEquidistantCalendar, 5400},
    };
    for (const Case& c : cases) {
        testsupport::WriteFile(folder.File("in.txt"), c.text);
        ASSERT_TRUE(Convert(sys::FileFormat::Ascii, folder.File("in.txt"), sys::FileFormat::Rbx0, folder.File("out.rbx0")).converted);
        rbx::CRbxReader reader;
        ASSERT_TRUE(reader.Open(folder.File("out.rbx0"))) << reader.status().problem().Describe();
        const rbx::FileHeader& header = reader.Header();
        EXPECT_EQ(header.title, "Title");
        EXPECT_EQ(header.axis.type, c.axisType);
        EXPECT_EQ(header.axis.unitKey, 1400);
        EXPECT_EQ(header.axis.startDate, "2020-01-01");
        EXPECT_EQ(header.axis.startTime, "00:00:00");
        EXPECT_DOUBLE_EQ(header.axis.step, c.step);
        ASSERT_EQ(header.items.size(), 3u);
        EXPECT_EQ(header.items[0].itemTypeKey, 103); // Rainfall
        EXPECT_EQ(header.items[0].unitKey, 1002);    // millimeter, found by its abbreviation
        EXPECT_EQ(header.items[0].valueType, rbx::kAccumulated);
        EXPECT_EQ(header.items[1].itemTypeKey, 100);
        EXPECT_EQ(header.items[1].unitKey, 1000);
        EXPECT_EQ(header.items[2].itemTypeKey, 999);
        EXPECT_EQ(header.items[2].dataType, rbx::kFloat64);
    }
}

TEST(Conversion, DamagedWorkbookFailsWithoutOutput)
{
    testsupport::ScratchFolder folder;
    testsupport::WriteFile(folder.File("in.txt"), kSample);
    ASSERT_TRUE(Convert(sys::FileFormat::Ascii, folder.File("in.txt"), sys::FileFormat::Excel, folder.File("good.xlsx")).converted);
    const std::string bytes = testsupport::ReadFile(folder.File("good.xlsx"));
    std::string flipped = bytes;
    for (size_t i = bytes.size() / 3; i < bytes.size() / 3 + 64; ++i)
        flipped[i] = static_cast<char>(~flipped[i]);
    for (const std::string& damaged : {bytes.substr(0, bytes.size() / 2), flipped, std::string("PK not a zip")}) {
        testsupport::WriteFile(folder.File("bad.xlsx"), damaged);
        FileReport report = Convert(sys::FileFormat::Excel, folder.File("bad.xlsx"), sys::FileFormat::Ascii, folder.File("out.txt"));
        EXPECT_FALSE(report.converted);
        EXPECT_FALSE(report.problem.message.empty());
        EXPECT_FALSE(fs::exists(folder.File("out.txt")));
    }
}

TEST(Conversion, FailureLeavesTheOldOutputAndNoTemporary)
{
    testsupport::ScratchFolder folder;
    std::string broken = kSample + "2020/01/01 00:45:00\t1\n"; // one field short
    testsupport::WriteFile(folder.File("in.txt"), broken);
    for (sys::FileFormat out : {sys::FileFormat::Ascii, sys::FileFormat::Rbx0, sys::FileFormat::Excel}) {
        const std::string output = folder.File(std::string("out") + sys::FormatInfo(out).outputExtension);
        testsupport::WriteFile(output, "old content");
        FileReport report = Convert(sys::FileFormat::Ascii, folder.File("in.txt"), out, output);
        ASSERT_FALSE(report.converted) << sys::FormatInfo(out).name;
        EXPECT_EQ(report.problem.line, 6);
        EXPECT_EQ(testsupport::ReadFile(output), "old content") << sys::FormatInfo(out).name;
    }
    EXPECT_TRUE(LeftoverTemporaries(folder.Path()).empty());
}

TEST(Conversion, DecreasingStampsCannotGoToRbx0)
{
    testsupport::ScratchFolder folder;
    testsupport::WriteFile(folder.File("in.txt"), "Undefined[Undefined]:Instantaneous\nT\tA\n2020/01/01 00:00:01\t1\n2020/01/01 00:00:00\t2\n");
    FileReport report = Convert(sys::FileFormat::Ascii, folder.File("in.txt"), sys::FileFormat::Rbx0, folder.File("out.rbx0"));
    ASSERT_FALSE(report.converted);
    EXPECT_EQ(report.problem.line, 4);
    EXPECT_FALSE(fs::exists(folder.File("out.rbx0")));
}

TEST(Conversion, TruncatedRbx0FailsWithoutOutput)
{
    testsupport::ScratchFolder folder;
    testsupport::WriteFile(folder.File("in.txt"), kSample);
    ASSERT_TRUE(Convert(sys::FileFormat::Ascii, folder.File("in.txt"), sys::FileFormat::Rbx0, folder.File("good.rbx0")).converted);
    const std::string bytes = testsupport::ReadFile(folder.File("good.rbx0"));
    for (size_t keep : {size_t{0}, size_t{10}, bytes.size() / 2, bytes.size() - 3}) {
        testsupport::WriteFile(folder.File("cut.rbx0"), bytes.substr(0, keep));
        FileReport report = Convert(sys::FileFormat::Rbx0, folder.File("cut.rbx0"), sys::FileFormat::Ascii, folder.File("out.txt"));
        EXPECT_FALSE(report.converted) << keep;
        EXPECT_FALSE(report.problem.message.empty());
        EXPECT_FALSE(fs::exists(folder.File("out.txt"))) << keep;
    }
}

TEST(Conversion, CanConvertJudgesExtensionTemplateAndContent)
{
    testsupport::ScratchFolder folder;
    testsupport::WriteFile(folder.File("good.txt"), kSample);
    testsupport::WriteFile(folder.File("good.dat"), kSample);
    testsupport::WriteFile(folder.File("noext"), kSample);
    testsupport::WriteFile(folder.File("binary"), std::string("a\0b", 3));
    testsupport::WriteFile(folder.File("misfit.txt"), "just words\n");
    auto reason = [](const sys::Status& verdict) { return verdict.problem().Describe(); };
    const sys::Status good = CanConvert(sys::FileFormat::Ascii, folder.File("good.txt"), "");
    EXPECT_TRUE(good) << reason(good);
    const sys::Status noExtension = CanConvert(sys::FileFormat::Ascii, folder.File("noext"), "");
    EXPECT_TRUE(noExtension) << reason(noExtension);
    EXPECT_FALSE(CanConvert(sys::FileFormat::Ascii, folder.File("good.dat"), ""));
    EXPECT_FALSE(CanConvert(sys::FileFormat::Ascii, folder.File("binary"), ""));
    const sys::Status misfit = CanConvert(sys::FileFormat::Ascii, folder.File("misfit.txt"), "");
    EXPECT_FALSE(misfit);
    EXPECT_NE(reason(misfit).find("misfit.txt"), std::string::npos);
    EXPECT_FALSE(CanConvert(sys::FileFormat::Ascii, folder.File("good.txt"), folder.File("no-template.xml")));
}

TEST(ConversionJob, FolderConvertsTheRestAndReportsTheMisfit)
{
    testsupport::ScratchFolder folder;
    fs::create_directories(folder.File("in"));
    fs::create_directories(folder.File("out"));
    for (const char* name : {"a.txt", "b.csv", "c.tab"})
        testsupport::WriteFile(folder.File(std::string("in/") + name), kSample);
    testsupport::WriteFile(folder.File("in/misfit.txt"), "Undefined[Undefined]:Instantaneous\nT\tA\n2020/01/01\n");
    testsupport::WriteFile(folder.File("in/ignored.dat"), "whatever");
    const JobSetup setup = convtest::AsciiFolderToRbx0(folder);
    ConversionLog log(folder.File("run.log"), nullptr);
    EXPECT_EQ(RunJob(setup, log, {2, nullptr}), kExitSomeFailed);
    for (const char* name : {"a.rbx0", "b.rbx0", "c.rbx0"})
        EXPECT_TRUE(fs::exists(folder.File(std::string("out/") + name))) << name;
    EXPECT_FALSE(fs::exists(folder.File("out/misfit.rbx0")));
    const std::string text = testsupport::ReadFile(folder.File("run.log"));
    EXPECT_NE(text.find("SKIPPED " + folder.File("in/misfit.txt") + ": the template does not fit: " +
                        folder.File("in/misfit.txt") + ":3:"),
              std::string::npos)
        << text;
    EXPECT_NE(text.find("3 converted, 1 skipped or failed"), std::string::npos) << text;
    EXPECT_EQ(text.find("ignored.dat"), std::string::npos) << text;
}

TEST(ConversionJob, SetupProblemsAndLogPlaces)
{
    JobSetup setup;
    setup.inputFormat = 7;
    EXPECT_NE(CheckJobSetup(setup).find("input format 7"), std::string::npos);
    setup.inputFormat = 2;
    EXPECT_NE(CheckJobSetup(setup).find("no input file"), std::string::npos);
    ConversionLog quiet({}, nullptr);
    EXPECT_EQ(RunJob(setup, quiet), kExitSetup);

    testsupport::ScratchFolder folder;
    EXPECT_EQ(LogPathFor(""), "");
    EXPECT_EQ(LogPathFor(folder.Path()), folder.File("Velmora.log"));
    EXPECT_EQ(LogPathFor(folder.Path() + "/new/"), folder.File("new/Velmora.log"));
    EXPECT_EQ(LogPathFor(folder.File("my.log")), folder.File("my.log"));
}

TEST(ConversionJob, SingleFileFailureExitsNonzero)
{
    testsupport::ScratchFolder folder;
    testsupport::WriteFile(folder.File("in.txt"), "nothing useful");
    JobSetup setup;
    setup.inputFormat = 2;
    setup.inputFile = folder.File("in.txt");
    setup.outputFormat = 2;
    setup.outputFile = folder.File("out.txt");
    ConversionLog log(folder.File("log.txt"), nullptr);
    EXPECT_EQ(RunJob(setup, log), kExitSomeFailed);
    EXPECT_FALSE(fs::exists(folder.File("out.txt")));
}

} // namespace
