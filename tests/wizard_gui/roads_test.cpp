// Every road of the wizard that uses a template as it is, a folder, or rbx0 input, clicked through
// on the real widgets with the dialogs answered by script: each ends in Finish and a document the
// host program then runs. Every page of every road is saved as a picture under the build folder.
#include "tests/wizard_gui/RoadTestSupport.h"

#include "wizard/DefineOutputItemsPage.h"

#include <QTreeWidget>

namespace {

using namespace wizardtest;
using guitest::Driver;

// Control ids the roads use.
enum : int { kSingleFile = 201, kAscii = 202, kRbx0 = 203, kExcel = 204, kFolder = 205, kInputFile = 206,
             kInputFolder = 208, kUnchanged = 249, kTemplateBrowse = 254, kTemplate = 263, kOutputAscii = 209,
             kOutputExcel = 210, kOutputFile = 264, kOutputFolder = 268, kTitle = 270 };

using Roads = guitest::RoadTest;

TEST_F(Roads, Rbx0FileChosenInTheSelectorToAscii)
{
    const std::string road = "rbx0-file";
    const std::string said = RunRoad(road, [&](Driver& d) {
        screen.chosenPaths = {inputs.rbxFile};
        screen.chosenItems = {{0, 2}};
        d.Browse(kInputFile);
        EXPECT_EQ(d.Text(kInputFile), inputs.rbxFile);
        NextTo(d, road, CDefineOutputItemsPage::IDD);
        NextTo(d, road, 2283);
        d.Click(kOutputAscii);
        d.Type(kOutputFile, inputs.output + "result");
        FinishFrom(d, road);
    });
    EXPECT_NE(said.find("Status: OK"), std::string::npos) << said;
    EXPECT_TRUE(std::filesystem::exists(inputs.output + "result.txt"));
}

TEST_F(Roads, Rbx0FolderChosenInTheFolderBrowserToExcel)
{
    const std::string road = "rbx0-folder";
    const std::string said = RunRoad(road, [&](Driver& d) {
        d.Click(kFolder);
        screen.chosenPaths = {inputs.rbxFolder.substr(0, inputs.rbxFolder.size() - 1)};
        d.Browse(kInputFolder);
        EXPECT_EQ(d.Text(kInputFolder), inputs.rbxFolder) << "the browser's folder gets its closing /";
        NextTo(d, road, CDefineOutputItemsPage::IDD);
        NextTo(d, road, 2283);
        d.Click(kOutputExcel);
        d.Type(kOutputFolder, inputs.output);
        FinishFrom(d, road);
    });
    EXPECT_NE(said.find("Status: OK"), std::string::npos) << said;
    EXPECT_TRUE(std::filesystem::exists(inputs.output + "a.xlsx"));
}

TEST_F(Roads, AsciiFileWithATemplateToRbx0)
{
    const std::string road = "ascii-file";
    const std::string said = RunRoad(road, [&](Driver& d) {
        d.Click(kAscii);
        screen.chosenPaths = {inputs.asciiFile};
        d.Browse(kInputFile);
        EXPECT_EQ(d.Text(kInputFile), inputs.asciiFile);
        NextTo(d, road, 2279);
        d.Click(kUnchanged);
        screen.chosenPaths = {inputs.asciiTemplate};
        d.Click(kTemplateBrowse);
        EXPECT_EQ(d.Text(kTemplate), inputs.asciiTemplate);
        d.Preview();
        EXPECT_EQ(screen.previews.size(), 1u);
        NextTo(d, road, CDefineOutputItemsPage::IDD);
        auto* list = d.Find<QTreeWidget>(CDefineOutputItemsPage::IDC_ITEMS);
        ASSERT_EQ(list->topLevelItemCount(), 3);
        list->topLevelItem(1)->setCheckState(0, Qt::Unchecked);
        NextTo(d, road, 2283);
        d.Type(kTitle, "Gauge");
        d.Type(kOutputFile, inputs.output + "result");
        FinishFrom(d, road);
    });
    EXPECT_NE(said.find("Status: OK"), std::string::npos) << said;
    EXPECT_TRUE(std::filesystem::exists(inputs.output + "result.rbx0"));
}

TEST_F(Roads, AsciiFolderWithATemplateToRbx0)
{
    const std::string road = "ascii-folder";
    const std::string said = RunRoad(road, [&](Driver& d) {
        d.Click(kFolder);
        d.Click(kAscii);
        d.Type(kInputFolder, inputs.asciiFolder);
        NextTo(d, road, 2279);
        EXPECT_FALSE(d.Find(kUnchanged)->isVisible()) << "a folder has only the one way";
        d.Type(kTemplate, inputs.asciiTemplate);
        NextTo(d, road, CDefineOutputItemsPage::IDD);
        NextTo(d, road, 2283);
        d.Type(kOutputFolder, inputs.output);
        FinishFrom(d, road);
    });
    EXPECT_NE(said.find("Status: OK"), std::string::npos) << said;
    EXPECT_TRUE(std::filesystem::exists(inputs.output + "a.rbx0"));
}

TEST_F(Roads, ExcelFileWithATemplateToExcel)
{
    const std::string road = "excel-file";
    const std::string said = RunRoad(road, [&](Driver& d) {
        d.Click(kExcel);
        d.Type(kInputFile, inputs.excelFile);
        NextTo(d, road, 2279);
        d.Type(kTemplate, inputs.excelTemplate);
        NextTo(d, road, CDefineOutputItemsPage::IDD);
        NextTo(d, road, 2283);
        d.Click(kOutputExcel);
        d.Type(kOutputFile, inputs.output + "result");
        FinishFrom(d, road);
    });
    EXPECT_NE(said.find("Status: OK"), std::string::npos) << said;
    EXPECT_TRUE(std::filesystem::exists(inputs.output + "result.xlsx"));
}

TEST_F(Roads, ExcelFolderWithATemplateToAscii)
{
    const std::string road = "excel-folder";
    const std::string said = RunRoad(road, [&](Driver& d) {
        d.Click(kFolder);
        d.Click(kExcel);
        d.Type(kInputFolder, inputs.excelFolder);
        NextTo(d, road, 2279);
        d.Type(kTemplate, inputs.excelTemplate);
        NextTo(d, road, CDefineOutputItemsPage::IDD);
        NextTo(d, road, 2283);
        d.Click(kOutputAscii);
        d.Type(kOutputFolder, inputs.output);
        FinishFrom(d, road);
    });
    EXPECT_NE(said.find("Status: OK"), std::string::npos) << said;
    EXPECT_TRUE(std::filesystem::exists(inputs.output + "a.txt"));
}

} // namespace
