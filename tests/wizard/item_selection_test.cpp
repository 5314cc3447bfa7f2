// The item selection page's decisions without a window: which rows are ticked on activation, the
// refusal of an empty selection, and what Next and Preview store.
#include "tests/wizard/FormTestSupport.h"

#include "engine/Engine.h"
#include "resources/StringTable.h"
#include "wizard/DefineTemplateForm.h"
#include "wizard/ItemSelectionForm.h"
#include "wizard/SelectInputForm.h"

#include <gtest/gtest.h>

namespace {

using namespace wizardtest;

using ItemSelectionTest = FormTest;

TEST_F(ItemSelectionTest, TicksComeFromTheRecordElseTheTemplateElseAllItems)
{
    ChooseInput(2, true, inputs.asciiFile, inputs.asciiTemplate);
    ItemSelection shown = LoadItemSelection(&engine);
    EXPECT_EQ(shown.names, (CStringList{"Level", "Flow", "Rain"}));
    EXPECT_EQ(shown.ticked, (std::vector<bool>{true, true, true}));

    engine.m_pSpecification->m_arrSelItems = {1};
    EXPECT_EQ(LoadItemSelection(&engine).ticked, (std::vector<bool>{false, true, false}));

    engine.m_arrItems = {0, 2};
    EXPECT_EQ(LoadItemSelection(&engine).ticked, (std::vector<bool>{true, false, true})) << "the record wins";

    engine.m_arrItems = {7};
    EXPECT_EQ(LoadItemSelection(&engine).ticked, (std::vector<bool>{false, false, false}))
        << "a position beyond the list ticks nothing";
}

TEST_F(ItemSelectionTest, AnUnreadableFileGivesAnEmptyListAndNextSays2300)
{
    ChooseInput(1, true, inputs.rbxFile);
    std::filesystem::resize_file(inputs.rbxFile, 10);
    const ItemSelection shown = LoadItemSelection(&engine);
    EXPECT_TRUE(shown.names.empty());
    EXPECT_FALSE(AcceptItemSelection(shown.ticked, &engine));
    ASSERT_EQ(screen.boxes.size(), 1u);
    EXPECT_EQ(screen.boxes[0].text, res::LoadString(res::IDS_SELECT_MORE_ITEMS));
    EXPECT_EQ(screen.boxes[0].type, ui::MB_OK | ui::MB_ICONEXCLAMATION);
}

TEST_F(ItemSelectionTest, NothingTickedIsRefusedByNextAndPreviewAndNothingIsStored)
{
    ChooseInput(1, true, inputs.rbxFile);
    engine.m_arrItems = {1};
    EXPECT_FALSE(AcceptItemSelection({false, false, false}, &engine));
    EXPECT_EQ(PreviewItemSelection({false, false, false}, &engine), -1);
    ASSERT_EQ(screen.boxes.size(), 2u);
    EXPECT_EQ(screen.boxes[1].text, res::LoadString(res::IDS_SELECT_MORE_ITEMS));
    EXPECT_EQ(engine.m_arrItems, CUIntArray{1});
    EXPECT_TRUE(screen.previews.empty());
}

TEST_F(ItemSelectionTest, OneTickedItemIsEnoughAndGoesToRecordTemplateAndParser)
{
    ChooseInput(2, true, inputs.asciiFile, inputs.asciiTemplate);
    EXPECT_TRUE(AcceptItemSelection({false, false, true}, &engine));
    EXPECT_EQ(engine.m_arrItems, CUIntArray{2});
    EXPECT_EQ(engine.m_pSpecification->m_arrSelItems, CUIntArray{2});
    EXPECT_EQ(engine.m_pParser->m_arrItems, CUIntArray{2});
}

TEST_F(ItemSelectionTest, AFolderOrAnUnchangedTemplateWritesTheSelectionIntoTheTemplateFile)
{
    ChooseInput(3, false, inputs.excelFolder, inputs.excelTemplate);
    ASSERT_TRUE(AcceptItemSelection({true, false, true}, &engine));
    CExcelSpecification reread;
    ASSERT_EQ(reread.Load(inputs.excelTemplate), 1);
    EXPECT_EQ(reread.m_arrSelItems, (CUIntArray{0, 2}));
}

TEST_F(ItemSelectionTest, PreviewShowsOnlyTheTickedItemsAndLeavesTheTemplateFileAlone)
{
    ChooseInput(2, true, inputs.asciiFile, inputs.asciiTemplate);
    EXPECT_EQ(PreviewItemSelection({false, true, false}, &engine), 1);
    ASSERT_EQ(screen.previews.size(), 1u);
    EXPECT_EQ(screen.previews[0].headers.size(), 2u) << "the time and the one item";
    EXPECT_EQ(engine.m_arrItems, CUIntArray{1});
    CAsciiSpecification reread;
    ASSERT_EQ(reread.Load(inputs.asciiTemplate), 1);
    EXPECT_TRUE(reread.m_arrSelItems.empty());
}

} // namespace
