#include "converter/RunPlan.h"

#include "converter/ConversionJob.h"
#include "platform/system/FileSystem.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <set>
#include <sys/stat.h>

namespace converter {

namespace {

std::string BaseName(const std::string& path)
{
    const std::string title = sys::FileTitle(path);
    const size_t dot = title.rfind('.');
    return dot == std::string::npos || dot == 0 ? title : title.substr(0, dot);
}

std::string FolderOfOutput(const std::string& output)
{
    const std::string folder = sys::FolderOf(output);
    return folder.empty() ? std::string(".") : folder;
}

} // namespace

RunPlan::RunPlan(const JobSetup& setup, const std::string& logPath) : RunPlan(setup, logPath, true) {}

std::string RunPlan::FileTheRunReads(const JobSetup& setup, const std::string& path)
{
    return RunPlan(setup, std::string(), false).ReadFileAt(path);
}

RunPlan::RunPlan(const JobSetup& setup, const std::string& logPath, bool judgeOutputs)
{
    const sys::FileFormat in = static_cast<sys::FileFormat>(setup.inputFormat);
    const sys::FileFormat out = static_cast<sys::FileFormat>(setup.outputFormat);
    if (setup.inputType == 1)
        m_files.push_back({setup.inputFile, setup.outputFile, {}, false});
    else if (setup.inputType == 2 && !setup.inputFolder.empty())
        ListFolder(setup, in, out);

    for (const PlannedFile& file : m_files)
        Protect(file.input, "the input file");
    Protect(setup.templateName, "the template");
    Protect(setup.setupFile, "the setup file");
    Protect(logPath, "the log file", true);
    if (judgeOutputs)
        JudgeOutputs();
}

void RunPlan::ListFolder(const JobSetup& setup, sys::FileFormat in, sys::FileFormat out)
{
    std::optional<std::vector<std::string>> names = sys::ListFolder(setup.inputFolder);
    if (!names)
        return;
    std::sort(names->begin(), names->end());
    for (const std::string& name : *names) {
        const std::string path = sys::JoinPath(setup.inputFolder, name);
        std::optional<sys::FileAttributes> attributes = sys::GetAttributes(path);
        if (!attributes || attributes->directory || attributes->hidden || attributes->temporary)
            continue;
        PlannedFile file;
        file.input = path;
        file.output = sys::JoinPath(setup.outputFolder, BaseName(path) + sys::FormatInfo(out).outputExtension);
        if (!attributes->readable)
            file.refusal = "the file cannot be read (permission)";
        else if (!sys::IsInputOf(in, path))
            continue; // not a file of the input format: not part of the conversion
        m_files.push_back(file);
    }
}

void RunPlan::Protect(const std::string& path, const std::string& what, bool isLog)
{
    if (!path.empty())
        m_protected.emplace(sys::IdentityKey(path), Role{what + " " + path, isLog});
}

void RunPlan::JudgeOutputs()
{
    std::map<std::string, std::string> claimedBy; // the input first giving each output, by identity key
    for (PlannedFile& file : m_files) {
        // One look at what stands there: its kind, and who it is when it exists.
        struct stat st {};
        const bool exists = ::stat(file.output.c_str(), &st) == 0;
        const std::string key = exists ? "file " + std::to_string(st.st_dev) + ":" + std::to_string(st.st_ino)
                                       : sys::IdentityKeyIn(FolderOf(file.output).resolved, sys::FileTitle(file.output));
        const auto [claim, first] = claimedBy.emplace(key, file.input);
        if (!file.refusal.empty())
            continue;
        std::string refusal;
        if (const auto found = m_protected.find(key); found != m_protected.end())
            refusal = "its output " + file.output + " is " + found->second.text;
        else if (!first)
            refusal = "its output " + file.output + " is also the output of " + claim->second;
        else
            refusal = PlaceRefusal(file.output, sys::KindOf(file.output));
        file.refusal = refusal;
        file.outputRefused = !refusal.empty();
    }
}

const RunPlan::OutputFolder& RunPlan::FolderOf(const std::string& output)
{
    const std::string folder = FolderOfOutput(output);
    auto [found, fresh] = m_folders.emplace(folder, OutputFolder());
    if (fresh) {
        found->second.resolved = sys::ResolvedFolder(folder);
        if (const std::string why = sys::WhyNotWritable(folder); !why.empty())
            found->second.refusal = "in the folder " + folder + ": " + why;
        found->second.maxName = sys::MaxNameLength(folder);
    }
    return found->second;
}

std::string RunPlan::PlaceRefusal(const std::string& output, sys::EntryKind kind)
{
    if (kind != sys::EntryKind::Missing && kind != sys::EntryKind::Regular)
        return "its output " + output + " is " + sys::Describe(kind) + "; only a regular file is replaced";
    const OutputFolder& folder = FolderOf(output);
    if (!folder.refusal.empty())
        return "cannot write its output " + output + " " + folder.refusal;
    const size_t length = sys::FileTitle(output).size();
    if (length > folder.maxName)
        return "cannot write its output " + output + ": " + std::strerror(ENAMETOOLONG) + " (" + std::to_string(length) +
               " bytes; the file system takes " + std::to_string(folder.maxName) + ")";
    if (kind == sys::EntryKind::Regular) {
        if (const std::string why = sys::WhyNotWritable(output); !why.empty())
            return "cannot replace its output " + output + ": " + why;
    }
    return {};
}

std::vector<std::string> RunPlan::OutputFolders() const
{
    std::set<std::string> folders;
    for (const PlannedFile& file : m_files)
        if (file.refusal.empty())
            folders.insert(FolderOfOutput(file.output));
    return {folders.begin(), folders.end()};
}

std::string RunPlan::ReadFileAt(const std::string& path) const
{
    if (path.empty())
        return {};
    const auto found = m_protected.find(sys::IdentityKey(path));
    return found == m_protected.end() || found->second.isLog ? std::string() : found->second.text;
}

} // namespace converter
