#pragma once
// Every file a run will write, settled before anything is written: which input gives which output,
// and which outputs are refused because writing them would destroy a file the user did not name as
// an output (an input of the run, the template, the setup file, the log), because two inputs would
// write the same file, or because the file cannot be written there.
#include "converter/Converter.h"

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

    void ListFolder(const JobSetup& setup, Format in, Format out);
    void Protect(const std::string& path, const std::string& what, bool isLog = false);
    void JudgeOutputs();
    // Why `output` cannot be written where it is, or empty.
    std::string PlaceRefusal(const std::string& output);

    std::vector<PlannedFile> m_files;
    std::map<std::string, Role> m_protected;            // by identity key
    std::map<std::string, std::string> m_folderRefusal; // why a folder cannot be written to, by folder
};

} // namespace converter
