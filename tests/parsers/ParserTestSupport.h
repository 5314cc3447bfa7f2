#pragma once
// Shared by the parser tests: the message boxes a scripted user interface recorded, as string ids.
#include "platform/ui/UserInterface.h"
#include "resources/StringTable.h"
#include "tests/support/ScratchFolder.h"

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

} // namespace parsertest
