#pragma once
// Shared by the parser tests: a private scratch folder, files written into it, and the message
// boxes a scripted user interface recorded, as string ids.
#include "platform/ui/UserInterface.h"
#include "resources/StringTable.h"

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <string>
#include <vector>

namespace parsertest {

class ScratchFolder {
public:
    ScratchFolder()
    {
        std::string pattern = (std::filesystem::temp_directory_path() / "velmora-parse-XXXXXX").string();
        m_path = ::mkdtemp(pattern.data());
    }
    ~ScratchFolder()
    {
        std::error_code ignored;
        std::filesystem::remove_all(m_path, ignored);
    }
    ScratchFolder(const ScratchFolder&) = delete;
    ScratchFolder& operator=(const ScratchFolder&) = delete;

    std::string Path(const std::string& name) const { return m_path + "/" + name; }
    std::string Write(const std::string& name, const std::string& content) const
    {
        std::ofstream(Path(name), std::ios::binary) << content;
        return Path(name);
    }

private:
    std::string m_path;
};

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
