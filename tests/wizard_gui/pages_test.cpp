// The pages on the real widgets: the Preview button on each page and after Back, each refusal's
// message with the page staying, the radios' effect on the record, the folder browser's "/",
// the ticks of stored items, the output names, Cancel, Help, and what screen readers and keyboard
// users get on every page.
#include "tests/wizard_gui/GuiTestSupport.h"

#include "engine/ModuleHandle.h"
#include "platform/harbor/qt/OverviewPage.h"
#include "platform/harbor/qt/WelcomePage.h"
#include "platform/wpx/Wpx.h"
#include "resources/StringTable.h"
#include "platform/ui/qt/SpinButton.h"
#include "tests/wizard_gui/RoadTestSupport.h"
#include "wizard/DataDescSettingPage.h"
#include "wizard/DelimitersSettingPage.h"
#include "wizard/DataManualDefineDlg.h"
#include "wizard/ExcelTimeDescSettingPage.h"
#include "wizard/SaveTempFilePage.h"
#include "wizard/SetupGui.h"
#include "wizard/TimeDescSettingPage.h"

#include <QComboBox>
#include <QStyleOptionComboBox>
#include <QGroupBox>
#include <QRadioButton>
#include <QLabel>
#include <QPushButton>
#include <QTreeWidget>

namespace {

using namespace wizardtest;
using guitest::Driver;
using guitest::WizardWindow;

enum : int { kWelcome = CWelcomePage::IDD, kSelectInput = 2278, kDefineTemplate = 2279, kDelimiters = 2280,
             kAsciiTime = 2281, kExcelTime = 2289, kDataDesc = 2290, kItems = 2285, kSaveTemplate = 2282,
             kOutput = 2283, kOverview = COverviewPage::IDD };
enum : int { kSingleFile = 201, kAscii = 202, kRbx0 = 203, kExcel = 204, kFolder = 205, kInputFile = 206,
             kInputFolder = 208, kUnchanged = 249, kModify = 259, kManual = 261, kTemplate = 263, kItemList = 276,
             kOutputRbx0 = 207, kOutputAscii = 209, kOutputExcel = 210, kOutputFile = 264, kOutputFolder = 268,
             kTitle = 270 };

class Pages : public testing::Test {
protected:
    // From the welcome page to the first page after select input, with `format` and `path`.
    void ToAfterInput(Driver& d, int format, bool singleFile, const std::string& path)
    {
        d.Next();
        if (!singleFile)
            d.Click(kFolder);
        d.Click(format == 1 ? kRbx0 : format == 2 ? kAscii : kExcel);
        d.Type(singleFile ? kInputFile : kInputFolder, path);
        d.Next();
    }
    // From the welcome page to `page` of `file` described by hand.
    void ToDescriptionPage(Driver& d, int format, const std::string& file, int page)
    {
        ToAfterInput(d, format, true, file);
        d.Click(kManual);
        for (int step = 0; step < 5 && d.Page() != page; ++step)
            d.Next();
        ASSERT_EQ(d.Page(), page);
    }
    void ToItems(Driver& d, int format, const std::string& file, const std::string& templatePath)
    {
        ToAfterInput(d, format, true, file);
        if (format != 1) {
            d.Type(kTemplate, templatePath);
            d.Next();
        }
        ASSERT_EQ(d.Page(), kItems);
    }
    // The one message shown since the last call, with the page's warning style.
    std::string Said()
    {
        std::string text;
        EXPECT_EQ(screen.boxes.size(), 1u);
        if (!screen.boxes.empty()) {
            text = screen.boxes.back().text;
            EXPECT_EQ(screen.boxes.back().type, ui::MB_OK | ui::MB_ICONEXCLAMATION);
            EXPECT_EQ(screen.boxes.back().caption, "");
        }
        screen.boxes.clear();
        return text;
    }

    ScratchFolder scratch;
    Inputs inputs{scratch};
    ui::ScriptedUserInterface screen;
    ui::ScopedUserInterface watching{screen};
    CEngine engine;
};

TEST_F(Pages, PreviewButtonIsShownByThePagesThatPreviewAndHiddenAfterEveryBack)
{
    WizardWindow w(&engine);
    EXPECT_FALSE(w.PreviewVisible()) << "welcome";
    w.Next();
    EXPECT_FALSE(w.PreviewVisible()) << "select input";
    w.Click(kAscii);
    w.Type(kInputFile, inputs.asciiFile);
    w.Next();
    ASSERT_EQ(w.Page(), kDefineTemplate);
    EXPECT_TRUE(w.PreviewVisible());
    QAbstractButton* next = w.Wizard().button(QWizard::NextButton);
    const QRect preview = w.Wizard().m_btnPreview->geometry();
    EXPECT_EQ(preview.left(), 10);
    EXPECT_EQ(preview.size(), next->size());
    EXPECT_EQ(preview.top(), next->mapTo(&w.Wizard(), QPoint(0, 0)).y());
    w.Click(kManual);
    EXPECT_FALSE(w.PreviewVisible());
    w.Click(kUnchanged);
    EXPECT_TRUE(w.PreviewVisible());
    w.Type(kTemplate, inputs.asciiTemplate);
    w.Next();
    ASSERT_EQ(w.Page(), kItems);
    EXPECT_TRUE(w.PreviewVisible());
    w.Next();
    ASSERT_EQ(w.Page(), kOutput);
    EXPECT_FALSE(w.PreviewVisible());
    w.Type(kOutputFile, inputs.output + "result");
    w.Next();
    ASSERT_EQ(w.Page(), kOverview);
    EXPECT_FALSE(w.PreviewVisible());

    w.Back(); // overview -> output
    EXPECT_FALSE(w.PreviewVisible());
    w.Back();
    ASSERT_EQ(w.Page(), kItems);
    EXPECT_TRUE(w.PreviewVisible()) << "the page reached shows it again";
    w.Back();
    ASSERT_EQ(w.Page(), kDefineTemplate);
    EXPECT_TRUE(w.PreviewVisible());
    w.Back();
    ASSERT_EQ(w.Page(), kSelectInput);
    EXPECT_FALSE(w.PreviewVisible());
}

TEST_F(Pages, ThePagesThatDescribeAFileShowPreviewAndItRunsWithTheirValues)
{
    WizardWindow w(&engine);
    ToAfterInput(w, 2, true, inputs.asciiFile);
    w.Click(kManual);
    EXPECT_FALSE(w.PreviewVisible());
    for (int page : {kDelimiters, kAsciiTime, kDataDesc, kItems, kSaveTemplate}) {
        w.Next();
        ASSERT_EQ(w.Page(), page);
        EXPECT_TRUE(w.PreviewVisible()) << page;
    }
    w.Next();
    ASSERT_EQ(w.Page(), kOutput);
    EXPECT_FALSE(w.PreviewVisible());
    for (int page : {kSaveTemplate, kItems, kDataDesc, kAsciiTime, kDelimiters}) {
        w.Back();
        ASSERT_EQ(w.Page(), page);
        EXPECT_TRUE(w.PreviewVisible()) << "the page reached shows it again: " << page;
    }
    w.Choose(CDelimitersSettingPage::IDC_DELIMITER, "Comma");
    w.Preview();
    ASSERT_EQ(screen.previews.size(), 1u);
    EXPECT_TRUE(screen.previews[0].resultRows.empty()) << "split at commas, the file reads as it stands";
    EXPECT_EQ(engine.m_pSpecification->m_strDelimiter, "Comma");
    w.Choose(CDelimitersSettingPage::IDC_DELIMITER, "Tab");
    w.Preview();
    ASSERT_EQ(screen.previews.size(), 2u);
    EXPECT_EQ(screen.previews[1].resultRows.size(), 7u);
    EXPECT_TRUE(std::filesystem::is_empty(inputs.temp)) << "no working file left";
}

TEST_F(Pages, Rbx0NeverShowsTheTemplatePagesInEitherDirection)
{
    WizardWindow w(&engine);
    ToAfterInput(w, 1, true, inputs.rbxFile);
    std::vector<int> visited{w.Page()};
    w.Next();
    visited.push_back(w.Page());
    w.Type(kOutputFile, inputs.output + "result");
    w.Next();
    visited.push_back(w.Page());
    for (int i = 0; i < 3; ++i) {
        w.Back();
        visited.push_back(w.Page());
    }
    EXPECT_EQ(visited, (std::vector<int>{kItems, kOutput, kOverview, kOutput, kItems, kSelectInput}));
}

TEST_F(Pages, EachRefusalSaysWhyAndKeepsThePage)
{
    const std::string dat = scratch.Write("gauge.dat", "x\t1\n");
    WizardWindow w(&engine);
    w.Next();
    w.Click(kAscii);
    w.Type(kInputFile, dat);
    w.Next();
    EXPECT_EQ(w.Page(), kSelectInput);
    EXPECT_EQ(Said(), res::LoadString(res::IDS_FILE_INVALID));
    {
        const ScopedEnv absent("VELMORA_SPREADSHEET", std::string("absent"));
        w.Click(kExcel);
        w.Type(kInputFile, inputs.excelFile);
        w.Next();
        EXPECT_EQ(w.Page(), kSelectInput);
        EXPECT_EQ(Said(), res::LoadString(res::IDS_EXCEL_MISSING));
    }
    w.Click(kFolder);
    w.Click(kAscii);
    w.Type(kInputFolder, scratch.File("none/"));
    w.Next();
    EXPECT_EQ(w.Page(), kSelectInput);
    EXPECT_EQ(Said(), res::LoadString(res::IDS_FOLDER_INVALID));

    w.Type(kInputFolder, inputs.asciiFolder);
    w.Next();
    ASSERT_EQ(w.Page(), kDefineTemplate);
    w.Next();
    EXPECT_EQ(w.Page(), kDefineTemplate);
    EXPECT_EQ(Said(), res::LoadString(res::IDS_NO_TEMPLATE_SELECTED));
    w.Type(kTemplate, inputs.excelTemplate);
    w.Next();
    EXPECT_EQ(w.Page(), kDefineTemplate);
    EXPECT_EQ(Said(), res::LoadString(res::IDS_TEMPLATE_NO_MATCH));
    w.Type(kTemplate, inputs.asciiTemplate);
    w.Next();
    ASSERT_EQ(w.Page(), kItems);

    auto* list = w.Find<QTreeWidget>(kItemList);
    for (int i = 0; i < list->topLevelItemCount(); ++i)
        list->topLevelItem(i)->setCheckState(0, Qt::Unchecked);
    w.Next();
    EXPECT_EQ(w.Page(), kItems);
    EXPECT_EQ(Said(), res::LoadString(res::IDS_SELECT_MORE_ITEMS));
    w.Preview();
    EXPECT_EQ(Said(), res::LoadString(res::IDS_SELECT_MORE_ITEMS));
    EXPECT_TRUE(screen.previews.empty());
    list->topLevelItem(0)->setCheckState(0, Qt::Checked);
    w.Next();
    ASSERT_EQ(w.Page(), kOutput);

    w.Type(kOutputFolder, scratch.File("none"));
    w.Next();
    EXPECT_EQ(w.Page(), kOutput);
    EXPECT_EQ(Said(), res::LoadString(res::IDS_FOLDER_INVALID));
}

TEST_F(Pages, TheOutputNameGetsTheFormatsExtensionAndAsciiRefusesCsv)
{
    const ScopedEnv excel("VELMORA_SPREADSHEET_VERSION", std::string("16.0"));
    WizardWindow w(&engine);
    ToItems(w, 1, inputs.rbxFile, "");
    w.Next();
    struct Case {
        int radio;
        std::string expected;
    };
    for (const Case& c : {Case{kOutputRbx0, "result.rbx0"}, Case{kOutputExcel, "result.xlsx"}, Case{kOutputAscii, "result.txt"}}) {
        ASSERT_EQ(w.Page(), kOutput);
        w.Click(c.radio);
        EXPECT_EQ(w.Find(kTitle)->isEnabled(), c.radio == kOutputRbx0) << "only rbx0 has a title";
        w.Type(kOutputFile, inputs.output + "result");
        w.Next();
        EXPECT_EQ(w.Page(), kOverview);
        EXPECT_EQ(engine.m_strOutputFile, inputs.output + c.expected);
        w.Back();
    }
    w.Click(kOutputAscii);
    w.Type(kOutputFile, inputs.output + "result.CSV");
    w.Next();
    EXPECT_EQ(w.Page(), kOutput);
    EXPECT_EQ(Said(), res::LoadString(res::IDS_FILE_NAME_INVALID));
    EXPECT_EQ(engine.m_strOutputFile, inputs.output + "result.txt") << "the record keeps the last accepted name";
}

TEST_F(Pages, TheTypeRadiosStartTheSetupAfreshAndTheFormatRadiosDoNot)
{
    engine.m_nInputFormat = 2;
    engine.m_strInputFile = inputs.asciiFile;
    engine.m_nOutputFormat = 3;
    engine.m_strOutputFile = "kept.xlsx";
    WizardWindow w(&engine);
    w.Next();
    EXPECT_TRUE(w.Find<QAbstractButton>(kAscii)->isChecked()) << "the page shows the record";
    EXPECT_EQ(w.Text(kInputFile), inputs.asciiFile);
    w.Click(kExcel);
    w.Click(kRbx0);
    EXPECT_EQ(engine.m_nInputFormat, 2);
    EXPECT_EQ(engine.m_strOutputFile, "kept.xlsx");
    EXPECT_EQ(w.Text(kInputFile), "") << "a format radio empties the file field";
    w.Click(kFolder);
    EXPECT_EQ(engine.m_nOutputFormat, 1);
    EXPECT_EQ(engine.m_strOutputFile, "");
    EXPECT_FALSE(w.Find(kInputFile)->isEnabled());
    EXPECT_TRUE(w.Find(kInputFolder)->isEnabled());
    engine.m_strOutputFile = "again.txt";
    w.Click(kSingleFile);
    EXPECT_EQ(engine.m_strOutputFile, "");
}

TEST_F(Pages, TheFolderBrowserAlwaysGivesAClosingSlash)
{
    WizardWindow w(&engine);
    w.Next();
    w.Click(kFolder);
    w.Type(kInputFolder, "not a folder");
    screen.chosenPaths = {inputs.rbxFolder.substr(0, inputs.rbxFolder.size() - 1), inputs.asciiFolder};
    w.Browse(kInputFolder);
    EXPECT_EQ(w.Text(kInputFolder), inputs.rbxFolder);
    ASSERT_EQ(screen.folderRequests.size(), 1u);
    EXPECT_EQ(screen.folderRequests[0].startFolder, "") << "a text that is no folder starts at the desktop";
    EXPECT_EQ(screen.folderRequests[0].prompt, res::LoadString(res::IDS_SELECT_FOLDER));
    w.Browse(kInputFolder);
    EXPECT_EQ(w.Text(kInputFolder), inputs.asciiFolder);
    EXPECT_EQ(screen.folderRequests[1].startFolder, inputs.rbxFolder);
}

TEST_F(Pages, StoredItemsAreTickedAndWithoutThemEveryItemIs)
{
    {
        WizardWindow w(&engine);
        ToItems(w, 1, inputs.rbxFile, "");
        auto* list = w.Find<QTreeWidget>(kItemList);
        ASSERT_EQ(list->topLevelItemCount(), 3);
        for (int i = 0; i < 3; ++i) {
            EXPECT_EQ(list->topLevelItem(i)->text(0).toStdString(), kItemNames[i]);
            EXPECT_EQ(list->topLevelItem(i)->checkState(0), Qt::Checked);
        }
        EXPECT_EQ(list->headerItem()->text(0), "Output Items");
    }
    engine.m_arrItems = {0, 2};
    WizardWindow w(&engine);
    ToItems(w, 1, inputs.rbxFile, "");
    auto* list = w.Find<QTreeWidget>(kItemList);
    EXPECT_EQ(list->topLevelItem(0)->checkState(0), Qt::Checked);
    EXPECT_EQ(list->topLevelItem(1)->checkState(0), Qt::Unchecked);
    EXPECT_EQ(list->topLevelItem(2)->checkState(0), Qt::Checked);
}

TEST_F(Pages, AStoredModifyWithoutFileShowsManualAndFoldersHideTheRadios)
{
    engine.m_nInputFormat = 2;
    engine.m_strInputFile = inputs.asciiFile;
    engine.m_nTemplateOption = 2;
    WizardWindow w(&engine);
    w.Next();
    w.Next();
    ASSERT_EQ(w.Page(), kDefineTemplate);
    EXPECT_TRUE(w.Find<QAbstractButton>(kManual)->isChecked());
    EXPECT_FALSE(w.PreviewVisible());
    EXPECT_EQ(w.Find<QLabel>(265)->text().toStdString(), res::LoadString(res::IDS_SINGLE_ASCII));
}

TEST_F(Pages, ChangingATemplateBringsTheDescriptionPagesAndBackFromOutputLeadsToSaving)
{
    WizardWindow w(&engine);
    ToAfterInput(w, 2, true, inputs.asciiFile);
    w.Type(kTemplate, inputs.asciiTemplate);
    w.Next();
    EXPECT_EQ(w.Page(), kItems) << "a template used as it is";
    w.Back();
    w.Click(kModify);
    std::vector<int> visited;
    for (int i = 0; i < 6; ++i) {
        w.Next();
        visited.push_back(w.Page());
    }
    EXPECT_EQ(visited, (std::vector<int>{kDelimiters, kAsciiTime, kDataDesc, kItems, kSaveTemplate, kOutput}));
    w.Back();
    EXPECT_EQ(w.Page(), kSaveTemplate);
}

TEST_F(Pages, BackFromTheDataDescriptionLeadsToTheTimePageOfTheFormat)
{
    for (int format : {2, 3}) {
        WizardWindow w(&engine);
        ToAfterInput(w, format, true, format == 2 ? inputs.asciiFile : inputs.excelFile);
        w.Click(kManual);
        w.Next();
        if (format == 2)
            w.Next();
        ASSERT_EQ(w.Page(), format == 2 ? kAsciiTime : kExcelTime);
        w.Next();
        ASSERT_EQ(w.Page(), kDataDesc);
        w.Back();
        EXPECT_EQ(w.Page(), format == 2 ? kAsciiTime : kExcelTime);
    }
}

TEST_F(Pages, TheTimePagesRefuseAColumnBeforeAFormatAndTheExcelFormatEvenWhenUnticked)
{
    WizardWindow w(&engine);
    ToDescriptionPage(w, 3, inputs.excelFile, kExcelTime);
    w.Click(CExcelTimeDescSettingPage::IDC_OPTION_SAME_TIME);
    EXPECT_FALSE(w.Find(CExcelTimeDescSettingPage::IDC_DATE_FORMAT)->isEnabled());
    EXPECT_TRUE(w.Find(CExcelTimeDescSettingPage::IDC_DATE_COLUMN)->isEnabled());
    EXPECT_TRUE(w.Find(CExcelTimeDescSettingPage::IDC_TIME_VALUE)->isEnabled());
    EXPECT_FALSE(w.Find(CExcelTimeDescSettingPage::IDC_DATETIME_COLUMN)->isEnabled());
    w.Find<QLineEdit>(CExcelTimeDescSettingPage::IDC_DATE_FORMAT)->setText("DD/MM/YYYY q");
    w.Type(CExcelTimeDescSettingPage::IDC_DATE_COLUMN, "0");
    w.Next();
    EXPECT_EQ(w.Page(), kExcelTime);
    EXPECT_EQ(Said(), res::LoadString(res::IDS_COLUMN_NOT_POSITIVE));
    w.Type(CExcelTimeDescSettingPage::IDC_DATE_COLUMN, "1");
    w.Next();
    EXPECT_EQ(w.Page(), kExcelTime);
    EXPECT_EQ(Said(), res::LoadString(res::IDS_DATETIME_FORMAT_LETTERS));
    w.Preview();
    EXPECT_EQ(Said(), res::LoadString(res::IDS_DATETIME_FORMAT_LETTERS));
    EXPECT_TRUE(screen.previews.empty());
}

TEST_F(Pages, TheSpinsStepWithinTheirRangeAndTypedNumbersStayAsTyped)
{
    WizardWindow w(&engine);
    ToDescriptionPage(w, 2, inputs.asciiFile, kAsciiTime);
    auto* spin = w.Find<ui::SpinButton>(CTimeDescSettingPage::IDC_DATETIME_SPIN);
    ASSERT_NE(spin, nullptr);
    w.Type(CTimeDescSettingPage::IDC_DATETIME_COLUMN, "1");
    QTest::mouseClick(spin, Qt::LeftButton, Qt::NoModifier, QPoint(spin->width() / 2, spin->height() - 2));
    EXPECT_EQ(w.Text(CTimeDescSettingPage::IDC_DATETIME_COLUMN), "1") << "stops at 1";
    QTest::mouseClick(spin, Qt::LeftButton, Qt::NoModifier, QPoint(spin->width() / 2, 2));
    EXPECT_EQ(w.Text(CTimeDescSettingPage::IDC_DATETIME_COLUMN), "2");
    w.Type(CTimeDescSettingPage::IDC_DATETIME_COLUMN, "100");
    QTest::keyClick(w.Find(CTimeDescSettingPage::IDC_DATETIME_COLUMN), Qt::Key_Up);
    EXPECT_EQ(w.Text(CTimeDescSettingPage::IDC_DATETIME_COLUMN), "100") << "stops at 100";
    w.Type(CTimeDescSettingPage::IDC_DATETIME_COLUMN, "250");
    w.Next();
    EXPECT_EQ(w.Page(), kDataDesc);
    EXPECT_EQ(engine.m_pSpecification->m_TimeDesc.m_nDateTimeCol, 250);
}

TEST_F(Pages, TheGridsUnitListFollowsTheTypeAndOkChecksTheCatalogue)
{
    const std::string file = scratch.Write("upper.txt", "Water Level[M]:Instantaneous\tDischarge[m^3/s]:Instantaneous\n"
                                                        "Time\tLevel\tFlow\n"
                                                        "2021/01/01 00:00:00\t1.5\t2.5\n");
    WizardWindow w(&engine);
    ToDescriptionPage(w, 2, file, kDataDesc);
    w.Click(CDataDescSettingPage::IDC_TYPES_BY_HAND);
    bool shown = false;
    guitest::WhenDialogShown([&](QDialog& dialog) {
        shown = true;
        auto& grid = *dynamic_cast<CDataManualDefineDlg&>(dialog).m_wndGrid;
        EXPECT_EQ(dialog.windowTitle(), "User Defined");
        EXPECT_EQ(grid.horizontalHeaderItem(0)->text(), "Name ");
        EXPECT_EQ(guitest::CellText(grid, 1, 3), "M") << "the file's unit, which only types may change here";
        EXPECT_EQ(guitest::CellText(grid, 1, 2), "Undefined") << "no types defined yet";
        EXPECT_FALSE(grid.item(0, 2)->flags() & Qt::ItemIsEditable);
        guitest::ChooseInCell(grid, 1, 2, "Discharge");
        guitest::PressCell(grid, 1, 3);
        EXPECT_EQ(guitest::CellText(grid, 1, 3), "M") << "a unit that cannot be edited is not reset";
        auto* ok = dialog.findChild<QPushButton*>(ui::ControlName(CDataManualDefineDlg::IDOK));
        guitest::Press(ok);
        EXPECT_TRUE(dialog.isVisible());
        ASSERT_EQ(screen.boxes.size(), 1u);
        EXPECT_EQ(screen.boxes[0].text, res::LoadString(res::IDS_UNIT_TYPE_MISMATCH));
        screen.boxes.clear();
        guitest::ChooseInCell(grid, 1, 2, "Water Level");
        guitest::ChooseInCell(grid, 2, 2, "Discharge");
        guitest::Press(ok);
        EXPECT_FALSE(dialog.isVisible()) << "M is meter's abbreviation in another case";
    });
    w.Click(CDataDescSettingPage::IDC_DEFINE_TYPES);
    EXPECT_TRUE(shown);
    EXPECT_TRUE(screen.boxes.empty());
    w.Next();
    EXPECT_EQ(w.Page(), kItems);
    ASSERT_EQ(engine.m_pSpecification->m_DataDesc.m_vecItemDefs.size(), 2u);
    EXPECT_EQ(engine.m_pSpecification->m_DataDesc.m_vecItemDefs[0].m_strType, "Water Level");
}

TEST_F(Pages, TheGridOffersTheUnitsOfTheRowsTypeAndAClickResetsTheUnit)
{
    const std::string file = scratch.Write("level.txt", "Water Level[m]:Instantaneous\n"
                                                        "Time\tLevel\n"
                                                        "2021/01/01 00:00:00\t1.5\n");
    WizardWindow w(&engine);
    ToDescriptionPage(w, 2, file, kDataDesc);
    w.Click(CDataDescSettingPage::IDC_UNITS_BY_HAND);
    guitest::WhenDialogShown([&](QDialog& dialog) {
        auto& grid = *dynamic_cast<CDataManualDefineDlg&>(dialog).m_wndGrid;
        EXPECT_EQ(guitest::CellText(grid, 1, 3), "undefined") << "the file gives no units";
        EXPECT_EQ(grid.item(0, 1)->background().color(), grid.palette().button().color()) << "types are shaded";
        guitest::PressCell(grid, 1, 3);
        auto* list = qobject_cast<QComboBox*>(grid.indexWidget(grid.model()->index(0, 2)));
        ASSERT_NE(list, nullptr);
        EXPECT_EQ(list->itemText(0), "centimeter") << "Water Level's units, sorted";
        EXPECT_EQ(guitest::CellText(grid, 1, 3), "centimeter") << "the click reset the unit";
        guitest::ChooseEntry(list, "meter");
        EXPECT_EQ(guitest::CellText(grid, 1, 3), "meter");
        guitest::Press(dialog.findChild<QPushButton*>(ui::ControlName(CDataManualDefineDlg::IDCANCEL)));
    });
    w.Click(CDataDescSettingPage::IDC_DEFINE_UNITS);
    w.Next();
    EXPECT_EQ(w.Page(), kItems) << "cancelled: Next fills the definitions from the file";
    ASSERT_EQ(engine.m_pSpecification->m_DataDesc.m_vecItemDefs.size(), 1u);
    EXPECT_EQ(engine.m_pSpecification->m_DataDesc.m_vecItemDefs[0].m_strUnit, "undefined");
}

TEST_F(Pages, DecliningToReplaceAFileKeepsTheSavePage)
{
    const std::string existing = scratch.Write("template.xml", "old");
    WizardWindow w(&engine);
    ToDescriptionPage(w, 2, inputs.asciiFile, kSaveTemplate);
    EXPECT_EQ(w.Text(CSaveTempFilePage::IDC_FILE), existing) << "folder/template.xml is proposed";
    screen.answers = {ui::IDNO};
    w.Next();
    EXPECT_EQ(w.Page(), kSaveTemplate);
    ASSERT_EQ(screen.boxes.size(), 1u);
    EXPECT_EQ(screen.boxes[0].text, res::LoadString(res::IDS_FILE_EXISTS_REPLACE));
    EXPECT_EQ(screen.boxes[0].caption, "Save template file");
    EXPECT_EQ(w.Text(CSaveTempFilePage::IDC_FILE), existing);
    screen.boxes.clear();
    w.Type(CSaveTempFilePage::IDC_FILE, scratch.File("template.TXT"));
    w.Next();
    EXPECT_EQ(w.Page(), kSaveTemplate);
    EXPECT_EQ(Said(), res::LoadString(res::IDS_TEMPLATE_NAME_INVALID));
    screen.chosenPaths = {scratch.File("chosen.xml")};
    guitest::Press(w.Find<QAbstractButton>(CSaveTempFilePage::IDC_BROWSE));
    EXPECT_EQ(w.Text(CSaveTempFilePage::IDC_FILE), scratch.File("chosen.xml"));
    ASSERT_EQ(screen.fileRequests.size(), 1u);
    EXPECT_FALSE(screen.fileRequests[0].open);
    EXPECT_EQ(screen.fileRequests[0].filter, "XML Files (*.xml)|*.xml|All Files (*.*)|*.*||");
    w.Next();
    EXPECT_EQ(w.Page(), kOutput);
    EXPECT_EQ(guitest::ReadFile(existing), "old");
}

TEST_F(Pages, CancelAndClosingWriteNothingAndKeepTheHostsDocument)
{
    WPXHANDLE document = nullptr;
    CString error;
    ASSERT_EQ(wpxParse("wpx 1\ntarget \"OkaToolbox\"\n section \"Setup\"\n  Name = \"Kept\"\n end\nend\nwpx end\n", "doc",
                       "", &document, &error),
              1)
        << error;
    const int handle = wpxHandleToInt(document);
    SetModuleWpxHandle(handle);
    const std::string before = wpxFormat(document);
    const int cancelled = guitest::RunModal(ShowSetupWizard, [&](Driver& d) {
        ToItems(d, 1, inputs.rbxFile, "");
        d.Cancel();
    });
    EXPECT_EQ(cancelled, 2);
    EXPECT_EQ(GetModuleWpxHandle(), handle);
    EXPECT_EQ(wpxFormat(document), before);
    const int closed = guitest::RunModal(ShowSetupWizard, [](Driver& d) { d.Wizard().close(); });
    EXPECT_EQ(closed, 2);
    EXPECT_EQ(GetModuleWpxHandle(), handle);
    wpxClose(&document);
    SetModuleWpxHandle(0);
}

TEST_F(Pages, FinishReplacesTheHostsDocumentWithTheNewSetup)
{
    SetModuleWpxHandle(0);
    const int finished = guitest::RunModal(ShowSetupWizard, [&](Driver& d) {
        ToItems(d, 1, inputs.rbxFile, "");
        d.Next();
        d.Type(kOutputFile, inputs.output + "result");
        d.Next();
        ASSERT_EQ(d.Page(), kOverview);
        const QString summary = d.Wizard().findChild<COverviewPage*>()->SummaryText();
        EXPECT_TRUE(summary.contains("\tFile_name: " + QString::fromStdString(inputs.output) + "result.rbx0"))
            << summary.toStdString();
        d.Finish();
    });
    EXPECT_EQ(finished, 12325);
    ASSERT_NE(GetModuleWpxHandle(), 0);
    CString output;
    WPXHANDLE setup = wpxSectionByNum(wpxTargetByNum(ModuleWpxDocument(), 1), 1);
    wpxGetParamFilename(wpxSectionByNameNum(setup, "OUTPUT", 1), "File_name", &output, 1, 1);
    EXPECT_EQ(output, inputs.output + "result.rbx0");
    WPXHANDLE document = ModuleWpxDocument();
    wpxClose(&document);
    SetModuleWpxHandle(0);
}

TEST_F(Pages, HelpExplainsEachToolPage)
{
    WizardWindow w(&engine);
    EXPECT_FALSE(w.Wizard().button(QWizard::HelpButton)->isVisible()) << "the welcome page has no help";
    w.Next();
    QAbstractButton* help = w.Wizard().button(QWizard::HelpButton);
    ASSERT_TRUE(help->isVisible());
    guitest::Press(help);
    ASSERT_EQ(screen.boxes.size(), 1u);
    EXPECT_EQ(screen.boxes[0].caption, "Velmora Help");
    EXPECT_EQ(screen.boxes[0].text.rfind("Select Input\n\n", 0), 0u) << screen.boxes[0].text;
}

// What a screen reader, an automation tool and a keyboard user need, checked on every page of the
// rbx0 and the ASCII road: names, mnemonics that do not clash, the tab order of the layout, and no
// text cut off.
class Accessibility : public Pages {
protected:
    void CheckPage(Driver& d)
    {
        SCOPED_TRACE(testing::Message() << "page " << d.Page());
        CheckWindow(d.Wizard(), *d.Wizard().currentPage());
    }
    // The controls of `content` on `window`: names, mnemonics, nothing cut off, the tab order.
    static void CheckWindow(QWidget& window, QWidget& content)
    {
        for (QWidget* control : guitest::Controls(content)) {
            if (qobject_cast<QLineEdit*>(control) || qobject_cast<QAbstractItemView*>(control) ||
                qobject_cast<QComboBox*>(control) || qobject_cast<ui::SpinButton*>(control)) {
                EXPECT_FALSE(control->accessibleName().isEmpty()) << control->objectName().toStdString();
            }
        }
        const QString letters = ui::MnemonicsUnder(&window);
        for (QChar letter : letters)
            EXPECT_EQ(letters.count(letter), 1) << "mnemonic " << QString(letter).toStdString() << " in " << letters.toStdString();
        for (QAbstractButton* button : content.findChildren<QAbstractButton*>()) {
            if (button->isVisibleTo(&content) && button->text() != "..." && !button->text().isEmpty() &&
                !ReachedThroughItsGroup(*button)) {
                EXPECT_TRUE(button->text().contains('&')) << button->text().toStdString() << " has no mnemonic";
            }
        }
        CheckNothingClipped(window);
        CheckTabOrder(content);
    }
    // A radio button in a group box with a letter: the letter leads to the group's chosen button,
    // the arrow keys to the others.
    static bool ReachedThroughItsGroup(const QAbstractButton& button)
    {
        auto* group = qobject_cast<QGroupBox*>(button.parentWidget());
        return qobject_cast<const QRadioButton*>(&button) && group && group->title().contains('&');
    }
    static void CheckNothingClipped(QWidget& wizard)
    {
        for (QLabel* label : wizard.findChildren<QLabel*>()) {
            if (!label->isVisible() || label->text().isEmpty())
                continue;
            if (label->wordWrap())
                EXPECT_LE(label->heightForWidth(label->width()), label->height()) << label->text().toStdString();
            else
                EXPECT_GE(label->width(), label->sizeHint().width()) << label->text().toStdString();
        }
        for (QAbstractButton* button : wizard.findChildren<QAbstractButton*>()) {
            if (!button->isVisible())
                continue;
            // A push button's size hint has a style minimum; its text is what must fit.
            const int needed = qobject_cast<QPushButton*>(button)
                                   ? button->fontMetrics().horizontalAdvance(QString(button->text()).remove('&')) + 8
                                   : button->sizeHint().width();
            EXPECT_GE(button->width(), needed) << button->text().toStdString();
        }
        for (QComboBox* list : wizard.findChildren<QComboBox*>()) {
            if (!list->isVisible())
                continue;
            QStyleOptionComboBox option;
            option.initFrom(list);
            const int room =
                list->style()->subControlRect(QStyle::CC_ComboBox, &option, QStyle::SC_ComboBoxEditField, list).width();
            for (int i = 0; i < list->count(); ++i)
                EXPECT_LE(list->fontMetrics().horizontalAdvance(list->itemText(i)), room) << list->itemText(i).toStdString();
        }
    }
    // Tab moves through the controls line by line, left to right.
    static void CheckTabOrder(QWidget& page)
    {
        QList<QWidget*> order;
        for (QWidget* w = page.nextInFocusChain(); w && w != &page; w = w->nextInFocusChain())
            if (page.isAncestorOf(w) && w->isVisible() && (w->focusPolicy() & Qt::TabFocus) && !order.contains(w))
                order << w;
        for (qsizetype i = 1; i < order.size(); ++i) {
            const QPoint a = order[i - 1]->mapTo(&page, QPoint(0, 0));
            const QPoint b = order[i]->mapTo(&page, QPoint(0, 0));
            const bool sameLine = std::abs(a.y() - b.y()) < order[i]->height() / 2 + 2;
            EXPECT_TRUE(sameLine ? a.x() < b.x() : a.y() < b.y())
                << order[i - 1]->objectName().toStdString() << " before " << order[i]->objectName().toStdString();
        }
    }
};

TEST_F(Accessibility, EveryPageOfTheRoadsIsNamedReachableAndUnclipped)
{
    WizardWindow w(&engine);
    CheckPage(w);
    w.Next();
    CheckPage(w);
    w.Click(kAscii);
    w.Type(kInputFile, inputs.asciiFile);
    w.Next();
    CheckPage(w);
    w.Type(kTemplate, inputs.asciiTemplate);
    w.Next();
    CheckPage(w);
    w.Next();
    CheckPage(w);
    w.Type(kOutputFile, inputs.output + "result");
    w.Next();
    ASSERT_EQ(w.Page(), kOverview);
    CheckPage(w);
    for (int id : {kSingleFile, kFolder, kRbx0, kAscii, kExcel, kInputFile, kInputFolder, kUnchanged, kModify, kManual,
                   kTemplate, kItemList, kOutputRbx0, kOutputAscii, kOutputExcel, kOutputFile, kOutputFolder, kTitle})
        EXPECT_NE(w.Find(id), nullptr) << "no control id" << id;
    EXPECT_EQ(w.Find(kInputFile)->accessibleName(), "File:");
    EXPECT_EQ(w.Find(kTitle)->accessibleName(), "Title:");
    EXPECT_EQ(w.Find(277)->accessibleName().isEmpty() ? w.Find<QAbstractButton>(277)->text() : QString(), "&Preview");
}

TEST_F(Accessibility, EveryPageOfTheDescriptionByHandAndTheGridAreNamedReachableAndUnclipped)
{
    WizardWindow w(&engine);
    ToAfterInput(w, 2, true, inputs.asciiFile);
    w.Click(kManual);
    const std::vector<int> road = {kDelimiters, kAsciiTime, kDataDesc, kItems, kSaveTemplate, kOutput};
    for (int page : road) {
        w.Next();
        ASSERT_EQ(w.Page(), page);
        CheckPage(w);
        if (page == kDataDesc) {
            w.Click(CDataDescSettingPage::IDC_NAMES_BY_HAND);
            bool shown = false;
            guitest::WhenDialogShown([&](QDialog& dialog) {
                shown = true;
                CheckWindow(dialog, dialog);
                EXPECT_EQ(dialog.findChild<QWidget*>("id314")->accessibleName(), "Item definitions");
            });
            w.Click(CDataDescSettingPage::IDC_DEFINE_NAMES);
            EXPECT_TRUE(shown);
            w.Click(CDataDescSettingPage::IDC_NAMES_IN_ROW);
        }
    }
    EXPECT_EQ(w.Find(CDataDescSettingPage::IDC_NAME_ROW)->accessibleName(), "Item names in row:");
    EXPECT_EQ(w.Find(CDataDescSettingPage::IDC_DEFINE_TYPES)->accessibleName(), "Define item types manually");

    WizardWindow excel(&engine);
    ToAfterInput(excel, 3, true, inputs.excelFile);
    excel.Click(kManual);
    excel.Next();
    ASSERT_EQ(excel.Page(), kExcelTime);
    excel.Click(CExcelTimeDescSettingPage::IDC_OPTION_SAME_DATE);
    CheckPage(excel);
    EXPECT_EQ(excel.Find(CExcelTimeDescSettingPage::IDC_TIME_FORMAT)->accessibleName(), "Time format:");
    EXPECT_EQ(excel.Find(CExcelTimeDescSettingPage::IDC_DATE_VALUE)->accessibleName(), "Date value:");
}

} // namespace
