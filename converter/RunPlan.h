#pragma once
// Every file a run will write, settled before anything is written: which input gives which output,
// and which outputs are refused because writing them would destroy a file the user did not name as
// an output (an input of the run, the template, the setup file, the log), because two inputs would
// write the same file, or because the file cannot be written there.
#include "converter/Converter.h"
#include "platform/system/FileSystem.h"

#include <map>
#include <string>
#include <vector>

namespace converter {

struct JobSetup;

struct PlannedFile {
    std::string input;
    std::string output;
    std::string refusal;        // why the file is not even tried; empty when it is
    bool outputRefused = false; // the refusal is about the output
};

class RunPlan {
public:
    // Lists the inputs (a folder's files of the input format, in name order), names their outputs
    // and judges the outputs. `logPath` is where the log goes, empty for standard error. The setup's
    // formats must be valid.
    RunPlan(const JobSetup& setup, const std::string& logPath);
    // What `path` is to the run of `setup` when it names a file the run reads, as ReadFileAt says;
    // the outputs are not judged.
    static std::string FileTheRunReads(const JobSetup& setup, const std::string& path);

    const std::vector<PlannedFile>& Files() const { return m_files; }
    // The folders outputs will be written to, each once.
    std::vector<std::string> OutputFolders() const;
    // What `path` is to the run when it names a file the run reads ("the input file ...", "the
    // template ...", "the setup file ..."); empty when it names none of them.
    std::string ReadFileAt(const std::string& path) const;

private:
    struct Role {
        std::string text; // "the input file /data/a.txt"
        bool isLog = false;
    };
    // What every output in one folder shares, found out once.
    struct OutputFolder {
        std::string resolved; // absolute, links resolved
        std::string refusal;  // why this user cannot write there, or empty
        size_t maxName = 0;
    };

    RunPlan(const JobSetup& setup, const std::string& logPath, bool judgeOutputs);
    void ListFolder(const JobSetup& setup, sys::FileFormat in, sys::FileFormat out);
    void Protect(const std::string& path, const std::string& what, bool isLog = false);
    void JudgeOutputs();
    const OutputFolder& FolderOf(const std::string& output);
    // Why `output`, of this kind, cannot be written where it is, or empty.
    std::string PlaceRefusal(const std::string& output, sys::EntryKind kind);

    std::vector<PlannedFile> m_files;
    std::map<std::string, Role> m_protected;          // by identity key
    std::map<std::string, OutputFolder> m_folders;    // by the folder as spelled
};

} // namespace converter
