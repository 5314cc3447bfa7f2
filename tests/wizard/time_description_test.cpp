// The time description pages' decisions without a window: the groups the options enable, the
// Excel page's format boxes, the column check before the format check, and what Next stores.
#include "tests/wizard/FormTestSupport.h"

#include "resources/StringTable.h"
#include "wizard/TimeDescForm.h"

namespace {

using namespace wizardtest;

const std::string kColumnMessage = res::LoadString(res::IDS_COLUMN_NOT_POSITIVE);
const std::string kFormatMessage = res::LoadString(res::IDS_DATETIME_FORMAT_LETTERS);

class TimeDescription : public FormTest {
protected:
    static TimeDescState Shown(bool excel, const CTimeDescription& record)
    {
        TimeDescState state = InitialTimeDescription(excel);
        ShowTimeDescription(state, record);
        return state;
    }
    // The message Collect gave, or "" when it accepted the page.
    std::string Refusal(const TimeDescState& state)
    {
        screen.boxes.clear();
        CTimeDescription record;
        return WarningOf(CollectTimeDescription(state, record));
    }
};

TEST_F(TimeDescription, OnlyTheChosenOptionsColumnAndFormatAreCheckedColumnFirst)
{
    struct Case {
        int option;
        std::array<int, 3> columns;
        std::array<CString, 3> formats;
        std::string expected;
    };
    const Case cases[] = {
        {1, {0, 0, 0}, {"x", "HH:mm:ss", "x"}, kColumnMessage},
        {1, {0, 1, 0}, {"x", "HH:mm:ss", "x"}, ""},
        {1, {1, 0, 1}, {"", "HH:mm:ss.fff", ""}, kColumnMessage},  // the column before the format
        {1, {1, 1, 1}, {"", "HH:mm:ss.fff", ""}, kFormatMessage},
        {0, {1, 0, 0}, {"YYYY-MM-DDTHH:mm:ss", "f", "f"}, ""},      // T separates tokens
        {0, {1, 1, 1}, {"YYYY/MM/DD HH:mm:ss.fff", "", ""}, kFormatMessage},
        {0, {1, 1, 1}, {"", "", ""}, ""},                           // no tokens at all
        {0, {1, 1, 1}, {"yyyy|mm|dd hh:MM:SS", "", ""}, ""},        // s and S pass though unnamed
        {2, {0, 0, 7}, {"bad", "bad", "DD.MM.YYYY"}, ""},
        {2, {1, 1, 0}, {"", "", "DD.MM.YYYY"}, kColumnMessage},
    };
    for (bool excel : {false, true}) {
        for (const Case& c : cases) {
            TimeDescState state = InitialTimeDescription(excel);
            ClickDateTimeOption(state, c.option);
            state.columns = c.columns;
            state.formats = c.formats;
            EXPECT_EQ(Refusal(state), c.expected) << "option " << c.option << " excel " << excel;
        }
    }
}

TEST_F(TimeDescription, TheExcelFormatIsCheckedEvenWhenItsBoxIsNotTicked)
{
    CTimeDescription record;
    record.m_nDateTimeOption = 2;
    record.m_strDateFormat = "DD/MM/YYYY q";
    TimeDescState state = Shown(true, record);
    EXPECT_FALSE(state.formatEnabled[2]) << "the date format waits for its box";
    EXPECT_EQ(Refusal(state), kFormatMessage);
}

TEST_F(TimeDescription, EachOptionEnablesItsGroupAndTheExcelBoxesRuleTheirFormats)
{
    CTimeDescription record;
    record.m_nDateTimeOption = 1;
    record.m_bUseTFormat = 1;
    TimeDescState excel = Shown(true, record);
    EXPECT_EQ(excel.groupEnabled, (std::array<bool, 3>{false, true, false}));
    EXPECT_EQ(excel.formatEnabled, (std::array<bool, 3>{false, true, false}));
    ClickDateTimeOption(excel, 0);
    EXPECT_EQ(excel.groupEnabled, (std::array<bool, 3>{true, false, false}));
    EXPECT_EQ(excel.formatEnabled, (std::array<bool, 3>{false, false, false})) << "0's box is not ticked";
    excel.useFormat[0] = 1;
    ClickUseFormat(excel, 0);
    EXPECT_TRUE(excel.formatEnabled[0]);

    TimeDescState ascii = Shown(false, record);
    EXPECT_EQ(ascii.formatEnabled, (std::array<bool, 3>{false, true, false}));
    record.m_nDateTimeOption = 7;
    EXPECT_EQ(Shown(false, record).option, 0) << "an unknown option shows as the first";
}

TEST_F(TimeDescription, NextStoresTheRecordAndTheAsciiPageClearsTheExcelFlags)
{
    DescribeByHand(2, inputs.asciiFile);
    CTimeDescription& stored = engine.m_pSpecification->m_TimeDesc;
    stored.m_bUseDTFormat = stored.m_bUseTFormat = stored.m_bUseDFormat = 1;
    TimeDescState state = Shown(false, stored);
    ClickDateTimeOption(state, 1);
    state.columns[1] = 250; // typed beyond the spin's range: taken as typed
    state.date = COleDateTime(2021, 5, 1, 0, 0, 0);
    state.time = COleDateTime(1899, 12, 30, 6, 30, 15);
    ASSERT_TRUE(AcceptTimeDescription(state, &engine));
    EXPECT_EQ(stored.m_nDateTimeOption, 1);
    EXPECT_EQ(stored.m_nTimeCol, 250);
    EXPECT_EQ(stored.m_strGlobalDate, "2021-05-01");
    EXPECT_EQ(stored.m_strGlobalTime, "06:30:15");
    EXPECT_EQ(stored.m_bUseDTFormat + stored.m_bUseTFormat + stored.m_bUseDFormat, 0);

    state.columns[1] = 0;
    EXPECT_FALSE(AcceptTimeDescription(state, &engine));
    EXPECT_EQ(stored.m_nTimeCol, 250) << "a refusal leaves the template as it was";
}

TEST_F(TimeDescription, TheExcelPageStoresItsFormatBoxes)
{
    DescribeByHand(3, inputs.excelFile);
    TimeDescState state = Shown(true, engine.m_pSpecification->m_TimeDesc);
    state.useFormat = {1, 0, 1};
    ASSERT_TRUE(AcceptTimeDescription(state, &engine));
    const CTimeDescription& stored = engine.m_pSpecification->m_TimeDesc;
    EXPECT_EQ(stored.m_bUseDTFormat, 1);
    EXPECT_EQ(stored.m_bUseTFormat, 0);
    EXPECT_EQ(stored.m_bUseDFormat, 1);
}

TEST_F(TimeDescription, StoredDatesAndTimesFillThePickersAndUnreadableOnesLeaveThem)
{
    CTimeDescription record;
    record.m_strGlobalDate = "2020-02-29";
    record.m_strGlobalTime = "23:59:58";
    TimeDescState state = Shown(false, record);
    EXPECT_EQ(state.date.Format("%Y-%m-%d"), "2020-02-29");
    EXPECT_EQ(state.time.Format("%H:%M:%S"), "23:59:58");
    for (const char* unreadable : {"2021-02-30", "yesterday", "", "2021-13-01"}) {
        record.m_strGlobalDate = unreadable;
        record.m_strGlobalTime = "25:00:00";
        ShowTimeDescription(state, record);
        EXPECT_EQ(state.date.Format("%Y-%m-%d"), "2020-02-29") << unreadable;
        EXPECT_EQ(state.time.Format("%H:%M:%S"), "23:59:58");
    }
    CTimeDescription collected;
    ASSERT_EQ(CollectTimeDescription(state, collected), 1);
    EXPECT_EQ(collected.m_strGlobalDate, "2020-02-29") << "Next stores the picker's date";
}

} // namespace
