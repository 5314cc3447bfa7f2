#include "ParserTestSupport.h"
#include "parsers/AsciiFilePreviewParser.h"
#include "templates/AsciiSpecification.h"

#include <gtest/gtest.h>

namespace {

class PreviewTest : public ::testing::Test {
protected:
    PreviewTest()
    {
        parser.m_vecItemNames = {"Time", "P", "Q", "R"};
        parser.m_vecRows = {{"", "t1", "t2", "t3"}, {"2020/01/01", "1", "2", "3"}, {"2020/01/02", "4"}};
        parser.m_vecRawLines = {{"raw"}};
    }

    ui::ScriptedUserInterface ui;
    ui::ScopedUserInterface scope{ui};
    CAsciiSpecification spec;
    CAsciiFilePreviewParser parser;
};

TEST_F(PreviewTest, EffectiveSelectionPrefersTheParsersOwn)
{
    EXPECT_TRUE(parser.EffectiveSelection().empty());
    parser.m_pSpecification = &spec;
    spec.m_arrSelItems = {2, 0};
    EXPECT_EQ(parser.EffectiveSelection(), (CUIntArray{2, 0}));
    parser.m_arrItems = {1};
    EXPECT_EQ(parser.EffectiveSelection(), (CUIntArray{1}));
}

TEST_F(PreviewTest, RowsFollowTheTemplatesSelectionSkippingMissingCells)
{
    parser.m_pSpecification = &spec;
    spec.m_arrSelItems = {2, 0, 5};
    const ui::Rows expected = {{"", "t3", "t1"}, {"2020/01/01", "3", "1"}, {"2020/01/02", "4"}};
    EXPECT_EQ(parser.BuildPreviewRows(), expected);
    EXPECT_EQ(parser.BuildPreviewTitles(), (CStringList{"Time", "R", "P"}));
}

TEST_F(PreviewTest, WithoutSelectionEverythingIsShown)
{
    EXPECT_EQ(parser.BuildPreviewRows(), parser.m_vecRows);
    EXPECT_EQ(parser.BuildPreviewTitles(), parser.m_vecItemNames);
}

TEST_F(PreviewTest, HandDefinedTitlesReplaceTheParsedNames)
{
    parser.m_pSpecification = &spec;
    spec.m_DataDesc.m_nItemTitleOption = 1;
    spec.m_DataDesc.m_vecItemDefs = {{"Level", "", "", ""}, {"Flow", "", "", ""}, {"Rain", "", "", ""}};
    EXPECT_EQ(parser.BuildPreviewTitles(), (CStringList{"DataTime", "Level", "Flow", "Rain"}));
    parser.m_arrItems = {2, 7, 0};
    EXPECT_EQ(parser.BuildPreviewTitles(), (CStringList{"DataTime", "Rain", "Level"}));

    spec.m_DataDesc.m_nItemTitleOption = 2; // no titles at all
    EXPECT_TRUE(parser.BuildPreviewTitles().empty());
}

TEST_F(PreviewTest, ShowPreviewHandsTheBuiltListsToTheDialog)
{
    parser.m_arrItems = {1};
    parser.SetFile("/data/gauges/river.txt");
    EXPECT_EQ(parser.m_strFileTitle, "river.txt");
    ASSERT_EQ(parser.ShowPreview(""), 1);
    ASSERT_EQ(ui.previews.size(), 1u);
    const ui::RecordedPreview& shown = ui.previews.front();
    EXPECT_EQ(shown.title, "river.txt");
    EXPECT_EQ(shown.inputLines, parser.m_vecRawLines);
    EXPECT_EQ(shown.headers, (CStringList{"Time", "Q"}));
    EXPECT_EQ(shown.resultRows, (ui::Rows{{"", "t2"}, {"2020/01/01", "2"}, {"2020/01/02"}}));

    ASSERT_EQ(parser.ShowPreview("My title"), 1);
    EXPECT_EQ(ui.previews.back().title, "My title");
}

TEST_F(PreviewTest, EmptyPathKeepsTheOldTitle)
{
    parser.SetFile("/a/b.csv");
    parser.SetFile("");
    EXPECT_EQ(parser.m_strFile, "");
    EXPECT_EQ(parser.m_strFileTitle, "b.csv");
}

TEST_F(PreviewTest, NothingToShowShowsNoDialog)
{
    parser.m_vecItemNames.clear();
    parser.m_vecRows.clear();
    parser.m_vecRawLines.clear();
    EXPECT_EQ(parser.ShowPreview("x"), 0);
    EXPECT_TRUE(ui.previews.empty());
}

// Sees where the lists handed to the dialog live, so a copy on the way is caught.
class AddressRecorder : public ui::SilentUserInterface {
public:
    const ui::Row* resultData = nullptr;
    const ui::Row* inputData = nullptr;
    size_t resultCount = 0;
    void ShowPreview(const ui::PreviewContent& content) override
    {
        resultData = content.resultRows.data();
        inputData = content.inputLines.data();
        resultCount = content.resultRows.size();
    }
};

TEST(PreviewBorrowing, WithoutSelectionTheDialogReadsTheParsersOwnRows)
{
    AddressRecorder recorder;
    ui::ScopedUserInterface scope{recorder};
    CAsciiFilePreviewParser parser;
    parser.m_vecItemNames = {"Time", "P", "Q"};
    parser.m_vecRows = {{"2020/01/01", "1", "2"}, {"2020/01/02", "3", "4"}};
    parser.m_vecRawLines = {{"raw"}};

    ASSERT_EQ(parser.ShowPreview(""), 1);
    EXPECT_EQ(recorder.resultData, parser.m_vecRows.data());
    EXPECT_EQ(recorder.inputData, parser.m_vecRawLines.data());
    EXPECT_EQ(recorder.resultCount, 2u);

    parser.m_arrItems = {1};
    ASSERT_EQ(parser.ShowPreview(""), 1);
    EXPECT_NE(recorder.resultData, parser.m_vecRows.data()); // the picked columns are a table of their own
    EXPECT_EQ(recorder.resultCount, 2u);
}

} // namespace
