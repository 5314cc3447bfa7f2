// The wizard's page flow without a window: for every input format, input kind and template
// option, Next from the select-input page walks the road the setup needs and Back retraces it.
#include "engine/Engine.h"
#include "resources/ResourceIds.h"
#include "wizard/PageFlow.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <vector>

using namespace res;

namespace {

constexpr int kWelcome = 100;
constexpr int kOverview = 101;
const std::vector<int> kSheet = {kWelcome,           IDD_SELECT_INPUT,    IDD_DEFINE_TEMPLATE, IDD_DELIMITERS,
                                 IDD_TIME_DESC_ASCII, IDD_TIME_DESC_EXCEL, IDD_DATA_DESC,       IDD_ITEM_SELECTION,
                                 IDD_SAVE_TEMPLATE,  IDD_OUTPUT,          kOverview};
const std::vector<int> kToolPages(kSheet.begin() + 1, kSheet.end() - 1);

int SheetNeighbour(int page, int step)
{
    const auto at = std::find(kSheet.begin(), kSheet.end(), page) - kSheet.begin();
    return kSheet[static_cast<size_t>(at + step)];
}

// Where a button leads: the flow's answer, or the neighbour in sheet order when it has none.
int Follow(int page, int answer, int step) { return answer == -1 ? SheetNeighbour(page, step) : answer; }

std::vector<int> WalkForward(const CEngine& engine)
{
    std::vector<int> road{IDD_SELECT_INPUT};
    while (road.back() != kOverview && road.size() < kSheet.size())
        road.push_back(Follow(road.back(), NextPageOf(road.back(), &engine), +1));
    return road;
}

// A record holding the three choices the flow reads.
struct Record : CEngine {
    Record(int format, int type, int option)
    {
        m_nInputFormat = format;
        m_nInputType = type;
        m_nTemplateOption = option;
    }
};

const std::vector<int> kRbxRoad = {IDD_SELECT_INPUT, IDD_ITEM_SELECTION, IDD_OUTPUT, kOverview};
const std::vector<int> kTemplateRoad = {IDD_SELECT_INPUT, IDD_DEFINE_TEMPLATE, IDD_ITEM_SELECTION, IDD_OUTPUT, kOverview};
const std::vector<int> kAsciiByHandRoad = {IDD_SELECT_INPUT,   IDD_DEFINE_TEMPLATE, IDD_DELIMITERS,
                                           IDD_TIME_DESC_ASCII, IDD_DATA_DESC,       IDD_ITEM_SELECTION,
                                           IDD_SAVE_TEMPLATE,  IDD_OUTPUT,          kOverview};
const std::vector<int> kExcelByHandRoad = {IDD_SELECT_INPUT, IDD_DEFINE_TEMPLATE, IDD_TIME_DESC_EXCEL,
                                           IDD_DATA_DESC,    IDD_ITEM_SELECTION,  IDD_SAVE_TEMPLATE,
                                           IDD_OUTPUT,       kOverview};

const std::vector<int>& ExpectedRoad(int format, int type, int option)
{
    if (format == 1)
        return kRbxRoad;
    if (type != 1 || option == 1)
        return kTemplateRoad;
    return format == 2 ? kAsciiByHandRoad : kExcelByHandRoad;
}

} // namespace

TEST(PageFlow, EveryFormatKindAndOptionWalksItsRoadAndBackRetracesIt)
{
    for (int format = 1; format <= 3; ++format)
        for (int type = 1; type <= 2; ++type)
            for (int option = 1; option <= 3; ++option) {
                SCOPED_TRACE(testing::Message() << "format " << format << ", type " << type << ", option " << option);
                const Record engine(format, type, option);
                const std::vector<int> road = WalkForward(engine);
                EXPECT_EQ(road, ExpectedRoad(format, type, option));
                for (size_t i = 0; i + 1 < road.size(); ++i) {
                    const int page = road[i];
                    const int before = i == 0 ? kWelcome : road[i - 1];
                    EXPECT_EQ(Follow(page, BackPageOf(page, &engine), -1), before) << "Back from " << page;
                }
            }
}

TEST(PageFlow, FormatsOutsideOneToThreeAndAMissingRecordMakeNoChoice)
{
    for (int format : {0, 4})
        for (int type = 1; type <= 2; ++type)
            for (int option = 1; option <= 3; ++option) {
                const Record engine(format, type, option);
                for (int page : kToolPages) {
                    EXPECT_EQ(NextPageOf(page, &engine), -1) << "format " << format << ", page " << page;
                    EXPECT_EQ(BackPageOf(page, &engine), -1) << "format " << format << ", page " << page;
                }
            }
    for (int page : kToolPages) {
        EXPECT_EQ(NextPageOf(page, nullptr), -1) << page;
        EXPECT_EQ(BackPageOf(page, nullptr), -1) << page;
    }
}

// Pages a road never reaches still answer as the table says, so a road that changes under them
// (a new input chosen after Back) cannot lead into a page the input has no use for.
TEST(PageFlow, PagesOffTheRoadSendRbx0BackToTheInputAndFoldersToTheTemplate)
{
    struct Case {
        int page, format, type, option;
        int next, back;
    };
    const Case cases[] = {
        {IDD_TIME_DESC_ASCII, 1, 1, 2, IDD_SELECT_INPUT, IDD_SELECT_INPUT},
        {IDD_TIME_DESC_EXCEL, 1, 2, 3, IDD_SELECT_INPUT, IDD_SELECT_INPUT},
        {IDD_TIME_DESC_ASCII, 2, 2, 2, IDD_DEFINE_TEMPLATE, IDD_DEFINE_TEMPLATE},
        {IDD_TIME_DESC_EXCEL, 3, 2, 3, IDD_DEFINE_TEMPLATE, IDD_DEFINE_TEMPLATE},
        {IDD_TIME_DESC_ASCII, 3, 1, 2, IDD_DATA_DESC, IDD_DEFINE_TEMPLATE},
        {IDD_DATA_DESC, 1, 1, 1, -1, IDD_SELECT_INPUT},
        {IDD_DATA_DESC, 2, 2, 2, -1, IDD_DEFINE_TEMPLATE},
        {IDD_DEFINE_TEMPLATE, 1, 1, 2, IDD_ITEM_SELECTION, -1},
        {IDD_ITEM_SELECTION, 3, 2, 2, IDD_OUTPUT, IDD_DEFINE_TEMPLATE},
        {IDD_OUTPUT, 2, 2, 3, -1, IDD_ITEM_SELECTION},
    };
    for (const Case& c : cases) {
        const Record engine(c.format, c.type, c.option);
        EXPECT_EQ(NextPageOf(c.page, &engine), c.next) << "Next from " << c.page << ", format " << c.format;
        EXPECT_EQ(BackPageOf(c.page, &engine), c.back) << "Back from " << c.page << ", format " << c.format;
    }
}
