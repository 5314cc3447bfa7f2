#include "platform/ui/UserInterface.h"

#include "resources/StringTable.h"

#include <cstdio>

namespace ui {
namespace {

ConsoleUserInterface g_console;
UserInterface* g_process = nullptr;
thread_local UserInterface* t_scoped = nullptr;

void PrintRow(std::span<const std::string> row)
{
    std::string line;
    for (size_t i = 0; i < row.size(); ++i) {
        if (i)
            line += '\t';
        line += row[i];
    }
    std::fprintf(stderr, "  %s\n", line.c_str());
}

void PrintRows(std::span<const Row> rows)
{
    for (const Row& row : rows)
        PrintRow(row);
}

} // namespace

UserInterface& Current()
{
    if (t_scoped)
        return *t_scoped;
    return g_process ? *g_process : g_console;
}

void SetProcessUserInterface(UserInterface* ui) { g_process = ui; }

UserInterface* InstalledUserInterface() { return t_scoped ? t_scoped : g_process; }

bool UserInterface::BrowseForFolder(const FolderDialogRequest& request, std::string& path)
{
    return ChooseFolder(request.prompt, path);
}

bool UserInterface::ChooseRbxItems(const RbxSelectionRequest&, std::string&, std::vector<unsigned>&) { return false; }

ScopedUserInterface::ScopedUserInterface(UserInterface& ui) : m_previous(t_scoped) { t_scoped = &ui; }
ScopedUserInterface::~ScopedUserInterface() { t_scoped = m_previous; }

int MessageBox(const std::string& text, const std::string& caption, unsigned type)
{
    return Current().MessageBox(text, caption, type);
}

int ShowStringMessage(int stringId)
{
    return MessageBox(res::LoadString(stringId), std::string(), MB_OK | MB_ICONEXCLAMATION);
}

int DefaultAnswer(unsigned type)
{
    switch (type & 0xF) {
    case MB_YESNO:
    case MB_YESNOCANCEL:
        return IDYES;
    default:
        return IDOK;
    }
}

int ConsoleUserInterface::MessageBox(const std::string& text, const std::string& caption, unsigned type)
{
    if (caption.empty())
        std::fprintf(stderr, "%s\n", text.c_str());
    else
        std::fprintf(stderr, "%s: %s\n", caption.c_str(), text.c_str());
    return DefaultAnswer(type);
}

void ConsoleUserInterface::ShowPreview(const PreviewContent& content)
{
    std::fprintf(stderr, "Preview %s\n", content.title.c_str());
    PrintRows(content.inputLines);
    PrintRow(content.headers);
    PrintRows(content.resultRows);
}

bool ConsoleUserInterface::ChooseFile(const FileDialogRequest&, std::string&) { return false; }
bool ConsoleUserInterface::ChooseFolder(const std::string&, std::string&) { return false; }

int SilentUserInterface::MessageBox(const std::string&, const std::string&, unsigned type)
{
    return DefaultAnswer(type);
}

int ScriptedUserInterface::MessageBox(const std::string& text, const std::string& caption, unsigned type)
{
    boxes.push_back({text, caption, type});
    if (answers.empty())
        return DefaultAnswer(type);
    int answer = answers.front();
    answers.pop_front();
    return answer;
}

void ScriptedUserInterface::ShowPreview(const PreviewContent& content)
{
    previews.push_back({content.title, Rows(content.inputLines.begin(), content.inputLines.end()),
                        std::vector<std::string>(content.headers.begin(), content.headers.end()),
                        Rows(content.resultRows.begin(), content.resultRows.end())});
}

bool ScriptedUserInterface::NextPath(std::string& path)
{
    if (chosenPaths.empty())
        return false;
    path = chosenPaths.front();
    chosenPaths.pop_front();
    return true;
}

bool ScriptedUserInterface::ChooseFile(const FileDialogRequest& request, std::string& path)
{
    fileRequests.push_back(request);
    return NextPath(path);
}

bool ScriptedUserInterface::ChooseFolder(const std::string& prompt, std::string& path)
{
    return BrowseForFolder(FolderDialogRequest{prompt, path, 0}, path);
}

bool ScriptedUserInterface::BrowseForFolder(const FolderDialogRequest& request, std::string& path)
{
    folderRequests.push_back(request);
    return NextPath(path);
}

bool ScriptedUserInterface::ChooseRbxItems(const RbxSelectionRequest& request, std::string& file,
                                           std::vector<unsigned>& items)
{
    rbxRequests.push_back(request);
    if (request.opening)
        request.opening(nullptr);
    if (!NextPath(file))
        return false;
    items.clear();
    if (!chosenItems.empty()) {
        items = chosenItems.front();
        chosenItems.pop_front();
    }
    return true;
}

} // namespace ui
