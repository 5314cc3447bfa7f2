// How the toolbox's dialog requests read in Qt, and the preview list's column rules, without
// showing anything.
#include "platform/ui/qt/DialogTranslation.h"
#include "wizard/FilePreviewDlg.h"

#include <gtest/gtest.h>

namespace {

using namespace ui;

TEST(DialogTranslation, FiltersBecomeQtNameFiltersWithTheirOwnPatterns)
{
    struct Case {
        std::string filter;
        QStringList expected;
    };
    const Case cases[] = {
        {"Time Series Files (*.rbx0;*.rqt) |*.rbx0;*.rqt|All Files (*.*) |*.*||",
         {"Time Series Files (*.rbx0 *.rqt)", "All Files (*)"}},
        {"Text Files (*.txt)|*.txt|Comma Separated Files (*.csv)|*.csv|Tab Delimited Files (*.tab)|*.tab|All Files (*.*)|*.*||",
         {"Text Files (*.txt)", "Comma Separated Files (*.csv)", "Tab Delimited Files (*.tab)", "All Files (*)"}},
        {"Excel Files (*.xlsx) | *.xlsx| All Files (*.*) | *.*||", {"Excel Files (*.xlsx)", "All Files (*)"}},
        {"XML Files|*.xml||", {"XML Files (*.xml)"}},
        {"", {}},
    };
    for (const Case& c : cases)
        EXPECT_EQ(NameFiltersOf(c.filter), c.expected) << c.filter;
}

TEST(DialogTranslation, FileDialogFlagsExtensionsAndInitialNames)
{
    FileDialogRequest open{true, "*.txt", "*.txt", "Text Files (*.txt)|*.txt||", OFN_ALLOWMULTISELECT | OFN_HIDEREADONLY | OFN_OVERWRITEPROMPT};
    FileDialogSetup setup = SetupOfFileDialog(open);
    EXPECT_EQ(setup.acceptMode, QFileDialog::AcceptOpen);
    EXPECT_EQ(setup.fileMode, QFileDialog::ExistingFiles);
    EXPECT_EQ(setup.defaultSuffix, "txt");
    EXPECT_EQ(setup.selectedName, "") << "a pattern is no name to show";

    FileDialogRequest mustExist{true, "xml", "/data/old.xml", "", OFN_FILEMUSTEXIST};
    setup = SetupOfFileDialog(mustExist);
    EXPECT_EQ(setup.fileMode, QFileDialog::ExistingFile);
    EXPECT_EQ(setup.selectedName, "old.xml");
    EXPECT_EQ(setup.startFolder, "/data");

    FileDialogRequest save{false, ".xlsx", "*.xlsx", "", OFN_OVERWRITEPROMPT | OFN_HIDEREADONLY | OFN_FILEMUSTEXIST};
    setup = SetupOfFileDialog(save);
    EXPECT_EQ(setup.acceptMode, QFileDialog::AcceptSave);
    EXPECT_EQ(setup.fileMode, QFileDialog::AnyFile) << "a save dialog names files that do not exist yet";
    EXPECT_TRUE(setup.confirmOverwrite);
    EXPECT_EQ(setup.defaultSuffix, "xlsx");
    EXPECT_FALSE(SetupOfFileDialog({false, "", "", "", 0}).confirmOverwrite);
    EXPECT_EQ(SetupOfFileDialog({true, "", "", "", 0}).fileMode, QFileDialog::AnyFile);
}

TEST(DialogTranslation, MessageBoxStylesAndAnswers)
{
    EXPECT_EQ(LookOfMessageBox(MB_OK | MB_ICONEXCLAMATION).buttons, QMessageBox::Ok);
    EXPECT_EQ(LookOfMessageBox(MB_OK | MB_ICONEXCLAMATION).icon, QMessageBox::Warning);
    EXPECT_EQ(LookOfMessageBox(MB_YESNO | MB_ICONQUESTION).buttons, QMessageBox::Yes | QMessageBox::No);
    EXPECT_EQ(LookOfMessageBox(MB_YESNO | MB_ICONQUESTION).icon, QMessageBox::Question);
    EXPECT_EQ(LookOfMessageBox(MB_YESNOCANCEL).buttons, QMessageBox::Yes | QMessageBox::No | QMessageBox::Cancel);
    EXPECT_EQ(LookOfMessageBox(MB_OKCANCEL | MB_ICONSTOP).icon, QMessageBox::Critical);
    EXPECT_EQ(LookOfMessageBox(MB_ICONINFORMATION).icon, QMessageBox::Information);
    EXPECT_EQ(LookOfMessageBox(MB_RETRYCANCEL).defaultButton, QMessageBox::Retry);
    EXPECT_EQ(LookOfMessageBox(MB_OK).icon, QMessageBox::NoIcon);
    EXPECT_EQ(AnswerOfButton(QMessageBox::Ok), IDOK);
    EXPECT_EQ(AnswerOfButton(QMessageBox::Yes), IDYES);
    EXPECT_EQ(AnswerOfButton(QMessageBox::No), IDNO);
    EXPECT_EQ(AnswerOfButton(QMessageBox::Cancel), IDCANCEL);
    EXPECT_EQ(AnswerOfButton(QMessageBox::NoButton), IDCANCEL) << "a box closed without a button";
}

TEST(PreviewColumns, TheWidthIsSharedOutAndTitledColumnsKeepSixtyPixels)
{
    EXPECT_EQ(FillListColumnWidth(605, 1, false), 600);
    EXPECT_EQ(FillListColumnWidth(605, 7, false), 85);
    EXPECT_EQ(FillListColumnWidth(605, 30, false), 20) << "untitled columns have no minimum";
    EXPECT_EQ(FillListColumnWidth(605, 30, true), 60);
    EXPECT_EQ(FillListColumnWidth(605, 4, true), 150);
    const std::vector<ui::Row> rows = {{"a", "b", "c"}, {"d"}};
    const std::vector<std::string> titles = {"DateTime", "x"};
    EXPECT_EQ(FillListColumnCount(rows, {}), 3);
    EXPECT_EQ(FillListColumnCount(rows, titles), 2);
    EXPECT_EQ(FillListColumnCount({}, titles), 0);
    const std::vector<ui::Row> emptyFirst = {{}, {"a"}};
    EXPECT_EQ(FillListColumnCount(emptyFirst, {}), 0);
    EXPECT_EQ(FillListColumnCount(emptyFirst, titles), 2);
}

} // namespace
