#pragma once
// Shared by the parser tests: an ASCII parser on a file of the test's own, and the message boxes a
// scripted user interface recorded, as string ids.
#include "parsers/AsciiFilePreviewParser.h"
#include "platform/ui/UserInterface.h"
#include "resources/StringTable.h"
#include "templates/AsciiSpecification.h"
#include "tests/support/ScratchFolder.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace parsertest {

// The string id of each recorded box, or -1 for a text the string table does not hold.
inline std::vector<int> MessageIds(const ui::ScriptedUserInterface& ui)
{
    std::vector<int> ids;
    for (const auto& box : ui.boxes) {
        int found = -1;
        for (int id = 2275; id <= 2332 && found < 0; ++id)
            if (!box.text.empty() && res::LoadString(id) == box.text)
                found = id;
        ids.push_back(found);
    }
    return ids;
}

// The ASCII preview parser with a template that gives every item's type, unit and value type
// itself, so that only names and data come from the file; message boxes are recorded in `ui`.
class AsciiParserFixture : public ::testing::Test {
protected:
    AsciiParserFixture()
    {
        parser.m_pSpecification = &spec;
        spec.m_DataDesc.m_nUnitTypeOption = 0;
        spec.m_DataDesc.m_nUnitOption = 0;
        spec.m_DataDesc.m_nValueTypeOption = 0;
    }

    // Writes `content` as the file to parse; returns its path.
    std::string Bind(const std::string& content)
    {
        const std::string path = folder.Write("data.txt", content);
        parser.SetFile(path);
        return path;
    }

    testsupport::ScratchFolder folder;
    ui::ScriptedUserInterface ui;
    ui::ScopedUserInterface scope{ui};
    CAsciiSpecification spec;
    CAsciiFilePreviewParser parser;
};

} // namespace parsertest
