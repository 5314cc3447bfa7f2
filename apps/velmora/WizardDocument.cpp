#include "apps/velmora/WizardDocument.h"

#include "platform/system/FileSystem.h"
#include "platform/wpx/Wpx.h"

#include <cstdio>
#include <filesystem>
#include <unistd.h>

namespace host {
namespace {

constexpr int kWizardFinished = 12325;

std::string AbsoluteFolderOf(const std::string& document)
{
    std::error_code error;
    const std::filesystem::path absolute = std::filesystem::absolute(document, error);
    return error ? std::string() : absolute.parent_path().string();
}

// A name beside `document` that no file has yet.
std::string ScratchNameBeside(const std::string& document)
{
    const std::string base = document + ".wizard-" + std::to_string(::getpid());
    std::string candidate = base;
    for (int n = 1; sys::FileExists(candidate); ++n)
        candidate = base + "-" + std::to_string(n);
    return candidate;
}

} // namespace

bool ReplaceDocument(const std::string& savedPath, const std::string& document, std::string& error)
{
    WPXHANDLE saved = nullptr;
    CString message;
    if (!wpxRead(savedPath, &saved, &message)) {
        error = message;
        return false;
    }
    wpxMakeFileNamesRelative(saved, AbsoluteFolderOf(document));
    const bool written = wpxWrite(saved, savedPath) != 0;
    wpxClose(&saved);
    if (!written) {
        error = savedPath + ": cannot write the new document";
        return false;
    }
    std::error_code renameError;
    std::filesystem::rename(savedPath, document, renameError);
    if (renameError) {
        error = document + ": cannot replace it: " + renameError.message();
        return false;
    }
    return true;
}

WizardOutcome RunWizardOnDocument(const Plugin& plugin, const std::string& document)
{
    WizardOutcome outcome;
    int handle = 0;
    if (sys::FileExists(document)) {
        handle = plugin.LoadDocument(document, outcome.error);
        if (!handle)
            return outcome;
    }
    plugin.SetWpxHandle(handle);
    outcome.result = plugin.ShowSetupGUI();
    const int current = plugin.GetWpxHandle();
    if (outcome.result == kWizardFinished && current) {
        const std::string scratch = ScratchNameBeside(document);
        if (!plugin.SaveDocument(current, scratch))
            outcome.error = scratch + ": cannot write the new document";
        else
            outcome.written = ReplaceDocument(scratch, document, outcome.error);
        if (!outcome.written)
            sys::DeleteFile(scratch);
    }
    if (current)
        plugin.CloseDocument(current);
    return outcome;
}

} // namespace host
