// The roads of the wizard that describe a file by hand or change a template, clicked through on
// the real widgets: each ends in Finish, a template file that `velmora template show` reads back
// with the values entered, and a document that `velmora run` converts with the expected values.
#include "tests/support/XlsxWorkbook.h"
#include "tests/wizard_gui/RoadTestSupport.h"

#include "wizard/DataDescSettingPage.h"
#include "wizard/DataManualDefineDlg.h"
#include "wizard/DefineOutputItemsPage.h"
#include "wizard/DelimitersSettingPage.h"
#include "wizard/ExcelTimeDescSettingPage.h"
#include "wizard/SaveTempFilePage.h"
#include "wizard/TimeDescSettingPage.h"

#include "resources/StringTable.h"

#include <QDateEdit>
#include <QPushButton>

namespace {

using namespace wizardtest;
using guitest::Driver;
using Data = CDataDescSettingPage;
using Delimiters = CDelimitersSettingPage;
using AsciiTime = CTimeDescSettingPage;
using ExcelTime = CExcelTimeDescSettingPage;

enum : int { kAscii = 202, kExcel = 204, kInputFile = 206, kModify = 259, kManual = 261, kTemplate = 263,
             kOutputAscii = 209, kOutputFile = 264 };
enum : int { kDefineTemplate = 2279, kItems = CDefineOutputItemsPage::IDD, kSaveTemplate = CSaveTempFilePage::IDD,
             kOutput = 2283 };

class HandRoads : public guitest::RoadTest {
protected:
    // From select input to the first description page of `file` (ASCII or Excel), described by
    // hand or, given a template, by changing that template.
    void Describe(Driver& d, const std::string& road, int format, const std::string& file,
                  const std::string& templatePath = "")
    {
        d.Click(format == 2 ? kAscii : kExcel);
        d.Type(kInputFile, file);
        NextTo(d, road, kDefineTemplate);
        if (templatePath.empty()) {
            d.Click(kManual);
        } else {
            d.Click(kModify);
            d.Type(kTemplate, templatePath);
        }
        NextTo(d, road, format == 2 ? int(Delimiters::IDD) : int(ExcelTime::IDD));
    }
    // From item selection through the save page (under `name`, or the proposed one) to an ASCII
    // output file, and Finish.
    void SaveAndFinish(Driver& d, const std::string& road, const std::string& output, const std::string& name = "")
    {
        NextTo(d, road, kSaveTemplate);
        if (!name.empty())
            d.Type(CSaveTempFilePage::IDC_FILE, name);
        NextTo(d, road, kOutput);
        d.Click(kOutputAscii);
        d.Type(kOutputFile, output);
        FinishFrom(d, road);
    }
    // What `velmora template show` prints for `path`.
    std::string TemplateShown(const std::string& path)
    {
        const guitest::ProgramRun shown = Run("velmora", {"template", "show", path});
        EXPECT_TRUE(shown.ok) << path << ": " << shown.err;
        return shown.out;
    }
    // Expects each of `lines` as a line of `text`.
    static void ExpectLines(const std::string& text, const std::vector<std::string>& lines)
    {
        for (const std::string& line : lines)
            EXPECT_NE(("\n" + text).find("\n" + line + "\n"), std::string::npos) << "no line \"" << line << "\" in\n" << text;
    }
    std::string DataFile(const std::string& name, const std::string& content)
    {
        scratch.MakeFolder("data");
        return scratch.Write("data/" + name, content);
    }
};

TEST_F(HandRoads, AsciiWithTabsDateAndTimeInOneColumnAndADeleteValue)
{
    const std::string road = "ascii-by-hand-tab";
    const std::string file = DataFile("gauge.txt", "Water Level[m]:Instantaneous\tDischarge[m^3/s]:Instantaneous\tRainfall[mm]:Accumulated\n"
                                                   "Time\tLevel\tFlow\tRain\n"
                                                   "2021/01/01 00:00:00\t1.5\t2.5\t-999\n"
                                                   "2021/01/01 01:00:00\t1.75\t-999\t0.5\n");
    const std::string said = RunRoad(road, [&](Driver& d) {
        Describe(d, road, 2, file);
        EXPECT_EQ(d.Find<QComboBox>(Delimiters::IDC_DELIMITER)->currentText(), "Tab");
        NextTo(d, road, AsciiTime::IDD);
        NextTo(d, road, Data::IDD);
        d.Tick(Data::IDC_DELETE_VALUE_CHECK, true);
        d.Click(Data::IDC_DELETE_VALUE_USE);
        d.Type(Data::IDC_DELETE_VALUE, "-999");
        NextTo(d, road, kItems);
        SaveAndFinish(d, road, inputs.output + "tab.txt");
    });
    EXPECT_NE(said.find("Status: OK"), std::string::npos) << said;
    ExpectLines(TemplateShown(scratch.File("data/template.xml")),
                {"Delimiter: \"Tab\"", "DecimalSeparator: \"Dot\"", "DateTimeOption: 0", "DateTimeFormat: \"YYYY/MM/DD HH:mm:ss\"",
                 "ItemDescriptionRow: 2", "UnitTypeRow: 1", "StartRow: 3", "DeleteValueCheck: 1", "DeleteValueRadio: 0",
                 "DeleteValue: \"-999\"", "SelItems: 0,1,2"});
    ExpectLines(guitest::ReadFile(inputs.output + "tab.txt"),
                {"Time\tLevel\tFlow\tRain", "2021/01/01 00:00:00\t1.5\t2.5\t", "2021/01/01 01:00:00\t1.75\t\t0.5"});
}

TEST_F(HandRoads, AsciiWithBlanksDecimalCommasAndDateAndTimeInTwoColumns)
{
    const std::string road = "ascii-by-hand-space";
    const std::string file = DataFile("gauge.txt", "Discharge[m^3/s]:Instantaneous Rainfall[mm]:Accumulated\n"
                                                   "Date Time Flow Rain\n"
                                                   "2021-01-01  00:00:00  2,5  0,25\n"
                                                   "2021-01-01  01:00:00  3,5  1,25\n");
    const std::string said = RunRoad(road, [&](Driver& d) {
        Describe(d, road, 2, file);
        d.Choose(Delimiters::IDC_DELIMITER, "Space");
        d.Tick(Delimiters::IDC_CONSECUTIVE, true);
        d.Choose(Delimiters::IDC_DECIMAL_SEPARATOR, "Comma");
        NextTo(d, road, AsciiTime::IDD);
        d.Type(AsciiTime::IDC_DATETIME_FORMAT, "YYYY-MM-DD HH:mm:ss");
        NextTo(d, road, Data::IDD);
        NextTo(d, road, kItems);
        SaveAndFinish(d, road, inputs.output + "space.txt");
    });
    EXPECT_NE(said.find("Status: OK"), std::string::npos) << said;
    ExpectLines(TemplateShown(scratch.File("data/template.xml")),
                {"Delimiter: \"Space\"", "IgnoreConsecutiveDelimiters: 1", "DecimalSeparator: \"Comma\"",
                 "DateTimeFormat: \"YYYY-MM-DD HH:mm:ss\"", "DeleteValueCheck: 0"});
    ExpectLines(guitest::ReadFile(inputs.output + "space.txt"),
                {"Date\tFlow\tRain", "2021/01/01 00:00:00\t2.5\t0.25", "2021/01/01 01:00:00\t3.5\t1.25"});
}

TEST_F(HandRoads, AsciiWithSemicolonsOneDateForAllRowsAndTheDeleteValueInARow)
{
    const std::string road = "ascii-by-hand-semicolon";
    const std::string file = DataFile("gauge.txt", "Water Level[m]:Instantaneous;Rainfall[mm]:Accumulated\n"
                                                   "Time;Level;Rain\n"
                                                   "-999\n"
                                                   "06:00:00;1,5;-999\n"
                                                   "07:00:00;1,75;0,5\n");
    const std::string said = RunRoad(road, [&](Driver& d) {
        Describe(d, road, 2, file);
        d.Choose(Delimiters::IDC_DELIMITER, "Semi Colon");
        d.Choose(Delimiters::IDC_DECIMAL_SEPARATOR, "Comma");
        guitest::SavePicture(d.Wizard(), road + "-delimiters-filled");
        NextTo(d, road, AsciiTime::IDD);
        d.Click(AsciiTime::IDC_OPTION_SAME_DATE);
        d.Find<QDateEdit>(AsciiTime::IDC_DATE_VALUE)->setDate(QDate(2021, 5, 1));
        guitest::SavePicture(d.Wizard(), road + "-time-filled");
        NextTo(d, road, Data::IDD);
        d.Type(Data::IDC_START_ROW, "4");
        d.Tick(Data::IDC_DELETE_VALUE_CHECK, true);
        EXPECT_TRUE(d.Find<QAbstractButton>(Data::IDC_DELETE_VALUE_IN_ROW)->isChecked());
        d.Type(Data::IDC_DELETE_ROW, "3");
        guitest::SavePicture(d.Wizard(), road + "-data-filled");
        NextTo(d, road, kItems);
        SaveAndFinish(d, road, inputs.output + "semicolon.txt");
    });
    EXPECT_NE(said.find("Status: OK"), std::string::npos) << said;
    ExpectLines(TemplateShown(scratch.File("data/template.xml")),
                {"Delimiter: \"Semi Colon\"", "DecimalSeparator: \"Comma\"", "DateTimeOption: 1", "GlobalDate: \"2021-05-01\"",
                 "TimeCol: 1", "StartRow: 4", "DeleteValueCheck: 1", "DeleteValueRadio: 1", "DeleteValueRow: 3"});
    ExpectLines(guitest::ReadFile(inputs.output + "semicolon.txt"),
                {"Time\tLevel\tRain", "2021/05/01 06:00:00\t1.5\t", "2021/05/01 07:00:00\t1.75\t0.5"});
}

TEST_F(HandRoads, AsciiWithNamesTypesUnitsAndValueTypesDefinedInTheGrid)
{
    const std::string road = "ascii-by-hand-grid";
    const std::string file = DataFile("gauge.txt", "2021/01/01 00:00:00\t1.5\t2.5\n"
                                                   "2021/01/01 01:00:00\t1.75\t3.5\n");
    const std::string said = RunRoad(road, [&](Driver& d) {
        Describe(d, road, 2, file);
        NextTo(d, road, AsciiTime::IDD);
        NextTo(d, road, Data::IDD);
        for (int radio : {Data::IDC_NAMES_BY_HAND, Data::IDC_TYPES_BY_HAND, Data::IDC_UNITS_BY_HAND, Data::IDC_VALUE_TYPES_BY_HAND})
            d.Click(radio);
        d.Type(Data::IDC_START_ROW, "1");
        guitest::SavePicture(d.Wizard(), road + "-data-filled");
        guitest::WhenDialogShown([&](QDialog& shown) {
            auto& dialog = dynamic_cast<CDataManualDefineDlg&>(shown);
            CManualDefGridWnd& grid = *dialog.m_wndGrid;
            ASSERT_EQ(grid.rowCount(), 2);
            EXPECT_EQ(guitest::CellText(grid, 1, 1), "Item1");
            guitest::SavePicture(dialog, road + "-grid");
            guitest::TypeInCell(grid, 1, 1, "Level");
            guitest::ChooseInCell(grid, 1, 2, "Water Level");
            guitest::ChooseInCell(grid, 1, 3, "meter");
            guitest::TypeInCell(grid, 2, 1, "Flow");
            guitest::ChooseInCell(grid, 2, 2, "Discharge");
            guitest::ChooseInCell(grid, 2, 3, "cubic meter per second");
            guitest::ChooseInCell(grid, 2, 4, "Accumulated");
            guitest::SavePicture(dialog, road + "-grid-filled");
            guitest::Press(dialog.findChild<QPushButton*>(ui::ControlName(CDataManualDefineDlg::IDOK)));
            EXPECT_FALSE(dialog.isVisible()) << (screen.boxes.empty() ? "" : screen.boxes.back().text);
        });
        d.Click(Data::IDC_DEFINE_NAMES);
        NextTo(d, road, kItems);
        SaveAndFinish(d, road, inputs.output + "grid.txt");
    });
    EXPECT_NE(said.find("Status: OK"), std::string::npos) << said;
    const std::string shown = TemplateShown(scratch.File("data/template.xml"));
    ExpectLines(shown, {"ItemTitleOption: 1", "UnitTypeOption: 2", "UnitOption: 2", "ValueTypeOption: 2", "StartRow: 1"});
    ExpectLines(shown, {"  1: title \"Level\", type \"Water Level\", unit \"meter\", value type \"Instantaneous\"",
                        "  2: title \"Flow\", type \"Discharge\", unit \"cubic meter per second\", value type \"Accumulated\""});
    ExpectLines(guitest::ReadFile(inputs.output + "grid.txt"),
                {"Water Level[meter]:Instantaneous\tDischarge[cubic meter per second]:Accumulated",
                 "Date/time\tLevel\tFlow", "2021/01/01 01:00:00\t1.75\t3.5"});
}

// A workbook whose dates and times are texts in two cells, read with the date/time format.
void WriteTextStampWorkbook(const std::string& path)
{
    testsupport::XlsxWorkbook book(path);
    book.Text(1, 3, "Water Level[m]:Instantaneous");
    book.Text(1, 4, "Rainfall[mm]:Accumulated");
    const char* names[] = {"Date", "Time", "Level", "Rain"};
    for (int column = 1; column <= 4; ++column)
        book.Text(2, column, names[column - 1]);
    for (int step = 0; step < 3; ++step) {
        book.Text(3 + step, 1, "2021-03-01");
        book.Text(3 + step, 2, "0" + std::to_string(step) + ":30:00");
        book.Number(3 + step, 3, 1.5 + step);
        book.Number(3 + step, 4, 0.25 * step);
    }
    ASSERT_TRUE(book.Close());
}

TEST_F(HandRoads, ExcelWithTheDateAndTimeTextsReadByTheFormat)
{
    const std::string road = "excel-by-hand";
    scratch.MakeFolder("data");
    const std::string file = scratch.File("data/stamps.xlsx");
    WriteTextStampWorkbook(file);
    const std::string said = RunRoad(road, [&](Driver& d) {
        Describe(d, road, 3, file);
        EXPECT_FALSE(d.Find(ExcelTime::IDC_DATETIME_FORMAT)->isEnabled()) << "the format waits for its box";
        d.Tick(ExcelTime::IDC_USE_DATETIME_FORMAT, true);
        EXPECT_TRUE(d.Find(ExcelTime::IDC_DATETIME_FORMAT)->isEnabled());
        d.Type(ExcelTime::IDC_DATETIME_FORMAT, "YYYY-MM-DD|HH:mm:ss");
        guitest::SavePicture(d.Wizard(), road + "-time-filled");
        NextTo(d, road, Data::IDD);
        NextTo(d, road, kItems);
        SaveAndFinish(d, road, inputs.output + "excel.txt");
    });
    EXPECT_NE(said.find("Status: OK"), std::string::npos) << said;
    const std::string shown = TemplateShown(scratch.File("data/template.xml"));
    ExpectLines(shown, {"Kind: excel", "UseDTFormat: 1", "DateTimeFormat: \"YYYY-MM-DD|HH:mm:ss\"", "UseTFormat: 0"});
    ExpectLines(guitest::ReadFile(inputs.output + "excel.txt"),
                {"Date\tLevel\tRain", "2021/03/01 00:30:00\t1.5\t0", "2021/03/01 02:30:00\t3.5\t0.5"});
}

TEST_F(HandRoads, AnAsciiTemplateChangedAndSavedOverItselfAfterTheQuestion)
{
    const std::string road = "ascii-modified";
    const std::string said = RunRoad(road, [&](Driver& d) {
        Describe(d, road, 2, inputs.asciiFile, inputs.asciiTemplate);
        NextTo(d, road, AsciiTime::IDD);
        NextTo(d, road, Data::IDD);
        d.Tick(Data::IDC_DELETE_VALUE_CHECK, true);
        d.Click(Data::IDC_DELETE_VALUE_USE);
        d.Type(Data::IDC_DELETE_VALUE, "2.5");
        NextTo(d, road, kItems);
        NextTo(d, road, kSaveTemplate);
        EXPECT_EQ(d.Text(CSaveTempFilePage::IDC_FILE), inputs.asciiTemplate) << "the template changed is proposed";
        screen.answers = {ui::IDYES};
        NextTo(d, road, kOutput);
        ASSERT_EQ(screen.boxes.size(), 1u);
        EXPECT_EQ(screen.boxes[0].text, res::LoadString(res::IDS_OVERWRITE_INPUT_TEMPLATE));
        EXPECT_EQ(screen.boxes[0].caption, "Save template file");
        EXPECT_EQ(screen.boxes[0].type & 0xF, ui::MB_YESNO);
        d.Click(kOutputAscii);
        d.Type(kOutputFile, inputs.output + "modified.txt");
        FinishFrom(d, road);
    });
    EXPECT_NE(said.find("Status: OK"), std::string::npos) << said;
    ExpectLines(TemplateShown(inputs.asciiTemplate), {"DeleteValueCheck: 1", "DeleteValueRadio: 0", "DeleteValue: \"2.5\""});
    ExpectLines(guitest::ReadFile(inputs.output + "modified.txt"),
                {"2021/01/01 00:00:00\t1.5\t0\t0", "2021/01/01 01:00:00\t\t\t0.25"});
}

TEST_F(HandRoads, AnExcelTemplateChangedAndSavedUnderANewName)
{
    const std::string road = "excel-modified";
    const std::string newTemplate = scratch.File("excel-hourly.xml");
    const std::string before = guitest::ReadFile(inputs.excelTemplate);
    const std::string said = RunRoad(road, [&](Driver& d) {
        Describe(d, road, 3, inputs.excelFile, inputs.excelTemplate);
        NextTo(d, road, Data::IDD);
        d.Click(Data::IDC_VALUE_TYPE_SAME);
        d.Choose(Data::IDC_VALUE_TYPE_LIST, "Mean_Step_Accumulated");
        NextTo(d, road, kItems);
        SaveAndFinish(d, road, inputs.output + "excel-modified.txt", newTemplate);
        EXPECT_TRUE(screen.boxes.empty()) << screen.boxes.front().text;
    });
    EXPECT_NE(said.find("Status: OK"), std::string::npos) << said;
    ExpectLines(TemplateShown(newTemplate), {"Kind: excel", "ValueTypeOption: 0", "GlobalValueType: \"Mean_Step_Accumulated\""});
    EXPECT_EQ(guitest::ReadFile(inputs.excelTemplate), before) << "the template started from stays as it was";
    ExpectLines(guitest::ReadFile(inputs.output + "excel-modified.txt"),
                {"Water level[m]:Mean_Step_Accumulated\tDischarge[m^3/s]:Mean_Step_Accumulated\tRainfall[mm]:Mean_Step_Accumulated",
                 "2021/01/01 03:00:00\t4.5\t6\t7.5"});
}

} // namespace
