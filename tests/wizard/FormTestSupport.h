#pragma once
// The fixture of the tests of the pages' decisions: a setup record, dialogs answered by script and
// input files of every format, with the steps that bring the record to a page.
#include "tests/wizard/WizardTestSupport.h"

#include "engine/Engine.h"
#include "platform/ui/UserInterface.h"
#include "wizard/DefineTemplateForm.h"
#include "wizard/SelectInputForm.h"

namespace wizardtest {

class FormTest : public testing::Test {
protected:
    // The select-input page with `format` and a file (or a folder) entered.
    static SelectInputState InputChoice(int format, bool singleFile, const std::string& path)
    {
        SelectInputState state = InitialSelectInput();
        if (!singleFile)
            ClickFolder(state, nullptr);
        ClickFormat(state, format);
        (singleFile ? state.file : state.folder) = path;
        return state;
    }
    // The record as the select-input page leaves it, and, given a template, as the define-template
    // page leaves it with that template used unchanged.
    void ChooseInput(int format, bool singleFile, const std::string& path, const std::string& templatePath = "")
    {
        ASSERT_TRUE(AcceptSelectInput(InputChoice(format, singleFile, path), &engine));
        if (!templatePath.empty()) {
            DefineTemplateState choice;
            LoadDefineTemplate(choice, engine);
            ClickExistingTemplate(choice, 1);
            choice.path = templatePath;
            ASSERT_TRUE(AcceptDefineTemplate(choice, &engine));
        }
        screen.boxes.clear();
    }
    // The record as the define-template page leaves it for `file` described by hand.
    void DescribeByHand(int format, const std::string& file)
    {
        ASSERT_TRUE(AcceptSelectInput(InputChoice(format, true, file), &engine));
        DefineTemplateState choice;
        LoadDefineTemplate(choice, engine);
        ClickManual(choice);
        ASSERT_TRUE(AcceptDefineTemplate(choice, &engine));
        screen.boxes.clear();
    }
    // The warning a check gave (its result `accepted`), or "" when it accepted; a refusal is one box
    // with the warning icon.
    std::string WarningOf(int accepted)
    {
        EXPECT_EQ(accepted == 1, screen.boxes.empty());
        std::string text;
        if (!screen.boxes.empty()) {
            EXPECT_EQ(screen.boxes.size(), 1u);
            EXPECT_EQ(screen.boxes[0].type, ui::MB_OK | ui::MB_ICONEXCLAMATION);
            text = screen.boxes[0].text;
        }
        screen.boxes.clear();
        return text;
    }
    std::vector<std::string> Messages() const
    {
        std::vector<std::string> texts;
        for (const auto& box : screen.boxes)
            texts.push_back(box.text);
        return texts;
    }

    ScratchFolder scratch;
    Inputs inputs{scratch};
    ui::ScriptedUserInterface screen;
    ui::ScopedUserInterface watching{screen};
    CEngine engine;
};

} // namespace wizardtest
