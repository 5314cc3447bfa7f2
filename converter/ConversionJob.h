#pragma once
// A whole run of the engine program: the setup read from its parameter file, every input file
// converted (a folder's files in parallel), each outcome written to the log, and the exit status.
#include "converter/Converter.h"

#include <cstdio>
#include <mutex>
#include <string>

namespace converter {

// Exit statuses of the engine program.
enum ExitCode : int {
    kExitOk = 0,         // every file converted
    kExitSomeFailed = 1, // a file was skipped or failed (or a folder had nothing to convert)
    kExitUsage = 2,      // wrong arguments
    kExitSetup = 3,      // the setup file cannot be read or describes no possible run
};

// What the engine program takes from the setup file (target "VELMORA").
struct JobSetup {
    int inputType = 1; // 1 a single file, 2 every file of a folder
    int inputFormat = 1;
    std::string inputFile;
    std::string inputFolder;
    int templateOption = 1;
    std::string templateName;
    CUIntArray items;
    int outputFormat = 1;
    std::string outputFile;
    std::string outputFolder;
    std::string title;
    std::string logFile;
    std::string setupFile; // the file the setup was read from
};

// Reads the setup file; false with `error` ("file:line: ...") when it cannot be read.
sys::Status ReadJobSetup(const std::string& path, JobSetup& setup);
// Why the setup cannot run, or empty when it can. An output problem is not one: it refuses only the
// files it concerns (see RunPlan).
std::string CheckJobSetup(const JobSetup& setup);

// Where the log goes: "Log_file" as a file; inside it as "Velmora.log" when it names a folder (an
// existing one, or a path ending in "/"); nowhere but standard error when it is empty.
std::string LogPathFor(const std::string& logSetting);

// The log: appended to its file, each file's entry written whole; also echoed to `echo` if given.
class ConversionLog {
public:
    ConversionLog(const std::string& path, std::FILE* echo);
    ~ConversionLog();
    ConversionLog(const ConversionLog&) = delete;
    ConversionLog& operator=(const ConversionLog&) = delete;

    bool IsOpen() const { return m_file != nullptr; }
    // Why the log file could not be opened.
    const sys::Status& status() const { return m_status; }
    void Write(const std::string& entry);

private:
    std::mutex m_mutex;
    std::FILE* m_file = nullptr;
    std::FILE* m_echo = nullptr;
    sys::Status m_status;
};

struct JobOptions {
    unsigned threads = 0;     // 0: one per core
    std::FILE* progress = nullptr; // progress lines for long runs; null for none
    unsigned share = 0;       // convert only share `share` (from 1) of `shares`; 0: every file
    unsigned shares = 0;
};

// True when `input` belongs to share `share` (from 1) of `shares`. The file's name alone decides
// (a hash of it), so every run of a batch, on any machine, puts each file into the same one share
// however the folder is listed and whatever else it holds.
bool InShare(const std::string& input, unsigned share, unsigned shares);

// Runs the whole setup and returns the exit status.
int RunJob(const JobSetup& setup, ConversionLog& log, const JobOptions& options = {});

// The log entry of one file. Control characters in names and messages are escaped, so each line of
// the entry is one line of the log.
std::string DescribeReport(const FileReport& report);

} // namespace converter
