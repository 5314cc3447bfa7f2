// The file preview dialog on real widgets: titles and column widths of both lists, the hidden
// input part of rbx0 previews, and lists that show the caller's rows without copying them.
#include "tests/wizard_gui/GuiTestSupport.h"

#include "platform/ui/qt/QtUserInterface.h"
#include "wizard/FilePreviewDlg.h"

#include <QHeaderView>
#include <QLabel>
#include <QPushButton>
#include <QScrollBar>
#include <QTableView>

namespace {

// The dialog laid out and filled as DoModal does, but shown without a modal loop.
struct ShownPreview {
    ShownPreview(const std::vector<ui::Row>& input, const std::vector<std::string>& titles, const std::vector<ui::Row>& rows)
    {
        dialog.m_vecInputLines = input;
        dialog.m_vecHeader = titles;
        dialog.m_vecResultRows = rows;
        dialog.show();
        dialog.OnInitDialog();
    }
    std::vector<int> Widths(QTableView* list) const
    {
        std::vector<int> widths;
        for (int c = 0; c < list->model()->columnCount(); ++c)
            widths.push_back(list->horizontalHeader()->sectionSize(c));
        return widths;
    }
    std::string Title(QTableView* list, int column) const
    {
        return list->model()->headerData(column, Qt::Horizontal).toString().toStdString();
    }
    CFilePreviewDlg dialog;
};

TEST(PreviewDialog, AnAsciiPreviewHasOneInputColumnAsWideAsTheList)
{
    const std::vector<ui::Row> lines = {{"Date/time    Level"}, {"2021/01/01 00:00:00    1.5"}};
    const std::vector<std::string> titles = {"Date/time", "Level"};
    const std::vector<ui::Row> rows = {{"2021/01/01 00:00:00", "1.5"}};
    ShownPreview shown(lines, titles, rows);
    QTableView* input = shown.dialog.m_listInput;
    EXPECT_EQ(shown.dialog.windowTitle(), "File Preview Dialog");
    ASSERT_EQ(input->model()->columnCount(), 1);
    EXPECT_EQ(shown.Title(input, 0), "Item1");
    EXPECT_EQ(shown.Widths(input), std::vector<int>{input->width() - 5});
    EXPECT_EQ(input->model()->rowCount(), 2);
    QTableView* result = shown.dialog.m_listResult;
    EXPECT_EQ(shown.Title(result, 1), "Level");
    const int half = (result->width() - 5) / 2;
    EXPECT_EQ(shown.Widths(result), (std::vector<int>{half, half}));
    EXPECT_TRUE(input->isVisible());
    EXPECT_EQ(shown.dialog.findChild<QPushButton*>("id1")->text(), "&Close");
    guitest::SavePicture(shown.dialog, "preview-ascii");
}

TEST(PreviewDialog, AnExcelPreviewSharesTheWidthAmongItsCellColumnsWithoutMinimum)
{
    const std::vector<ui::Row> cells(3, ui::Row(40, "1"));
    ShownPreview shown(cells, {}, {});
    QTableView* input = shown.dialog.m_listInput;
    ASSERT_EQ(input->model()->columnCount(), 40);
    EXPECT_EQ(shown.Title(input, 39), "Item40");
    const int each = (input->width() - 5) / 40;
    EXPECT_LT(each, 60);
    EXPECT_EQ(shown.Widths(input), std::vector<int>(40, each));
    EXPECT_EQ(shown.dialog.m_listResult->model()->columnCount(), 0) << "no rows leave the result list empty";
}

TEST(PreviewDialog, ThirtyTitlesOnANarrowListGetSixtyPixelsAndScroll)
{
    std::vector<std::string> titles;
    for (int i = 0; i < 30; ++i)
        titles.push_back("T" + std::to_string(i));
    const std::vector<ui::Row> rows = {ui::Row(32, "v")};
    ShownPreview shown({{"line"}}, titles, rows);
    QTableView* result = shown.dialog.m_listResult;
    ASSERT_LT(result->width(), 30 * 60);
    EXPECT_EQ(shown.Widths(result), std::vector<int>(30, 60));
    EXPECT_GT(result->horizontalScrollBar()->maximum(), 0);
    EXPECT_EQ(result->model()->columnCount(), 30) << "cells beyond the last title are not shown";
}

TEST(PreviewDialog, WithoutInputLinesTheResultTakesTheWholeDialog)
{
    const std::vector<ui::Row> line = {{"x"}};
    CFilePreviewDlg reference;
    reference.m_vecInputLines = line;
    reference.show();
    reference.OnInitDialog();
    const QRect inputLabel = reference.InputLabel()->geometry();
    const QRect inputList = reference.m_listInput->geometry();
    const QRect resultList = reference.m_listResult->geometry();

    const std::vector<std::string> titles = {"DateTime", "Level"};
    const std::vector<ui::Row> rows = {{"2021-01-01 00:00:00", "1"}};
    ShownPreview shown({}, titles, rows);
    EXPECT_FALSE(shown.dialog.InputLabel()->isVisible());
    EXPECT_FALSE(shown.dialog.m_listInput->isVisible());
    EXPECT_EQ(shown.dialog.ResultLabel()->geometry().topLeft(), inputLabel.topLeft());
    const QRect moved = shown.dialog.m_listResult->geometry();
    EXPECT_EQ(moved.top(), inputList.top());
    EXPECT_EQ(moved.left(), resultList.left());
    EXPECT_EQ(moved.right(), resultList.right());
    EXPECT_EQ(moved.bottom(), resultList.bottom());
    guitest::SavePicture(shown.dialog, "preview-rbx0");
}

TEST(PreviewDialog, TheListsReadTheCallersRowsInPlace)
{
    std::vector<ui::Row> rows = {{"2021-01-01", "1"}, {"2021-01-02"}};
    const std::vector<std::string> titles = {"DateTime", "Level"};
    ShownPreview shown({}, titles, rows);
    QAbstractItemModel* model = shown.dialog.m_listResult->model();
    EXPECT_EQ(model->index(1, 1).data().toString(), "") << "a missing cell is blank";
    rows[0][1] = "changed";
    EXPECT_EQ(model->index(0, 1).data().toString(), "changed") << "the dialog holds no copy";
}

TEST(PreviewDialog, TheQtInterfaceShowsItModallyWithTheParsersTitle)
{
    const std::vector<ui::Row> rows = {{"a", "1"}};
    const std::vector<std::string> titles = {"DateTime", "Level"};
    ui::PreviewContent content;
    content.title = "gauge.txt";
    content.headers = titles;
    content.resultRows = rows;
    std::string seenTitle;
    int seenRows = -1;
    QTimer::singleShot(0, [&] {
        auto* dialog = qobject_cast<CFilePreviewDlg*>(QApplication::activeModalWidget());
        ASSERT_NE(dialog, nullptr);
        seenTitle = dialog->windowTitle().toStdString();
        seenRows = dialog->m_listResult->model()->rowCount();
        guitest::Press(dialog->findChild<QPushButton*>("id1"));
    });
    ui::QtUserInterface().ShowPreview(content);
    EXPECT_EQ(seenTitle, "gauge.txt");
    EXPECT_EQ(seenRows, 1);
}

} // namespace
