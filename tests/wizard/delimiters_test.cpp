// The delimiters page's decisions without a window: the sorted lists, the user-defined delimiter
// box, and what Next writes into the template (nothing is ever refused).
#include "tests/wizard/FormTestSupport.h"

#include "wizard/DelimitersForm.h"

namespace {

using namespace wizardtest;

class Delimiters : public FormTest {
protected:
    void SetUp() override { DescribeByHand(2, inputs.asciiFile); }
    DelimitersState Shown()
    {
        DelimitersState state = InitialDelimiters();
        LoadDelimiters(state, engine);
        return state;
    }
    CSpecification& Template() { return *engine.m_pSpecification; }
};

TEST_F(Delimiters, BothListsShowTheirNamesSortedWithTabAndDotFirstSelected)
{
    const DelimitersState state = InitialDelimiters();
    EXPECT_EQ(state.delimiter.entries, (CStringList{"Comma", "Semi Colon", "Space", "Tab", "User Defined"}));
    EXPECT_EQ(state.delimiter.Text(), "Tab");
    EXPECT_EQ(state.decimalSeparator.entries, (CStringList{"Comma", "Dot", "User Locale"}));
    EXPECT_EQ(state.decimalSeparator.Text(), "Dot");
    EXPECT_FALSE(state.userDelimiterEnabled);
}

TEST_F(Delimiters, TheUserDefinedBoxIsOpenOnlyForUserDefinedWithAText)
{
    struct Case {
        const char* delimiter;
        const char* text;
        bool enabled;
    };
    for (const Case& c : {Case{"User Defined", "", false}, Case{"User Defined", "|", true},
                          Case{"user defined", "|", true}, Case{"Comma", "|", false}}) {
        Template().m_strDelimiter = c.delimiter;
        Template().m_strDefDelimiter = c.text;
        const DelimitersState state = Shown();
        EXPECT_EQ(state.userDelimiterEnabled, c.enabled) << c.delimiter << " / " << c.text;
        EXPECT_EQ(state.userDelimiter, c.text);
    }
}

TEST_F(Delimiters, PickingAnEntryOpensTheBoxForUserDefinedAndOtherwiseClosesItKeepingItsText)
{
    Template().m_strDelimiter = "User Defined";
    Template().m_strDefDelimiter = "";
    DelimitersState state = Shown();
    SelectDelimiter(state, 4);
    EXPECT_TRUE(state.userDelimiterEnabled);
    state.userDelimiter = "||";
    SelectDelimiter(state, 0);
    EXPECT_EQ(state.delimiter.Text(), "Comma");
    EXPECT_FALSE(state.userDelimiterEnabled);
    StoreDelimiters(state, &engine);
    EXPECT_EQ(Template().m_strDelimiter, "Comma");
    EXPECT_EQ(Template().m_strDefDelimiter, "||") << "a closed box still stores its text";
}

TEST_F(Delimiters, NamesAreFoundByTheirBeginningInAnyCaseAndAnUnknownOneKeepsTheSelection)
{
    Template().m_strDelimiter = "semi";
    Template().m_strDecimalSeparator = "Point";
    DelimitersState state = InitialDelimiters();
    SelectDelimiter(state, 2); // Space
    state.decimalSeparator.selected = 0;
    LoadDelimiters(state, engine);
    EXPECT_EQ(state.delimiter.Text(), "Semi Colon");
    EXPECT_EQ(state.decimalSeparator.Text(), "Comma") << "no entry begins with Point";
}

TEST_F(Delimiters, NextStoresAnyCombinationWithoutAWord)
{
    DelimitersState state = Shown();
    SelectDelimiter(state, 4); // User Defined, left empty
    state.decimalSeparator.SelectStartingWith("User Locale");
    state.consecutiveAsOne = 1;
    state.ignoreAtLineStart = 1;
    StoreDelimiters(state, &engine);
    EXPECT_EQ(Template().m_strDelimiter, "User Defined");
    EXPECT_EQ(Template().m_strDefDelimiter, "");
    EXPECT_EQ(Template().m_strDecimalSeparator, "User Locale");
    EXPECT_EQ(Template().m_bIgnoreConsecutiveDelimiters, 1);
    EXPECT_EQ(Template().m_bIgnoreBegginingOfLineDelimiters, 1);
    EXPECT_TRUE(screen.boxes.empty());
}

TEST_F(Delimiters, PreviewShowsTheFileReadWithThePagesValues)
{
    DelimitersState state = Shown();
    SelectDelimiter(state, 0); // Comma: the tab-separated file no longer fits, so it shows as it stands
    EXPECT_EQ(PreviewDelimiters(state, &engine), 1);
    ASSERT_EQ(screen.previews.size(), 1u);
    EXPECT_TRUE(screen.previews[0].resultRows.empty());
    EXPECT_FALSE(screen.previews[0].inputLines.empty());
    EXPECT_EQ(Template().m_strDelimiter, "Comma");
    SelectDelimiter(state, 3); // Tab
    EXPECT_EQ(PreviewDelimiters(state, &engine), 1);
    ASSERT_EQ(screen.previews.size(), 2u);
    EXPECT_EQ(screen.previews[1].resultRows.size(), 3u + 4u) << "three description rows and four steps";
}

} // namespace
