#include "converter/ConversionJob.h"

#include "converter/OutputFile.h"
#include "converter/RunPlan.h"
#include "platform/system/FileSystem.h"
#include "platform/system/OleDateTime.h"
#include "platform/system/Text.h"
#include "platform/wpx/Wpx.h"
#include "resources/StringTable.h"
#include "templates/Specification.h"

#include <algorithm>
#include <atomic>
#include <cerrno>
#include <chrono>
#include <cstring>
#include <limits>
#include <system_error>
#include <thread>

namespace converter {

namespace {

constexpr const char* kLogFileName = "Velmora.log";
constexpr size_t kItemsShownInHeader = 20;

// The selection as the run's first log line gives it: a long one by its start and its length.
std::string Join(const CUIntArray& items)
{
    std::string text;
    for (size_t n = 0; n < items.size() && n < kItemsShownInHeader; ++n)
        text += (text.empty() ? "" : ",") + std::to_string(items[n]);
    if (items.size() > kItemsShownInHeader)
        text += ",... (" + std::to_string(items.size()) + " in all)";
    return text.empty() ? "all" : text;
}

std::string Escaped(const std::string& text) { return text::EscapeControls(text); }

// Paces progress lines: at most one a second over all files.
class Progress {
public:
    explicit Progress(std::FILE* out) : m_out(out), m_last(std::chrono::steady_clock::now()) {}
    void Report(const std::string& file, std::uint64_t rows, std::uint64_t bytes)
    {
        if (!m_out)
            return;
        std::lock_guard<std::mutex> lock(m_mutex);
        const auto now = std::chrono::steady_clock::now();
        if (now - m_last < std::chrono::seconds(1))
            return;
        m_last = now;
        std::fprintf(m_out, "Velmora: %s: %llu rows, %.1f MB read\n", Escaped(sys::FileTitle(file)).c_str(),
                     static_cast<unsigned long long>(rows), static_cast<double>(bytes) / 1e6);
        std::fflush(m_out);
    }

private:
    std::FILE* m_out;
    std::mutex m_mutex;
    std::chrono::steady_clock::time_point m_last;
};

} // namespace

sys::Status ReadJobSetup(const std::string& path, JobSetup& setup)
{
    WPXHANDLE doc = nullptr;
    CString readError; // "file:line: message", as the parameter-file library words it
    if (!wpxRead(path, &doc, &readError))
        return readError.empty() ? sys::Status::Fail(path, 0, "cannot read the setup file")
                                 : sys::Status::Fail({}, 0, readError);
    WPXHANDLE target = wpxTargetByNum(doc, 1);
    if (!target || wpxGetName(target) != "VELMORA") {
        wpxClose(&doc);
        return sys::Status::Fail(path, 0, "the setup file has no target \"VELMORA\"");
    }
    setup.setupFile = path;
    WPXHANDLE input = wpxSectionByNameNum(target, "INPUT", 1);
    wpxGetParam(input, "Type", &setup.inputType, 1, 1);
    wpxGetParam(input, "File_format", &setup.inputFormat, 1, 1);
    wpxGetParam(input, "File_name", &setup.inputFile, 1, 1);
    wpxGetParam(input, "Folder_name", &setup.inputFolder, 1, 1);

    WPXHANDLE templ = wpxSectionByNameNum(target, "TEMPLATE", 1);
    wpxGetParam(templ, "Template_option", &setup.templateOption, 1, 1);
    wpxGetParam(templ, "Template_name", &setup.templateName, 1, 1);
    setup.items.clear();
    WPXHANDLE items = wpxKeywordByNameNum(templ, "Items", 1);
    for (int n = 1; n <= wpxGetNoParams(items); ++n) {
        const int item = wpxGetInt(wpxParamByNum(items, n));
        if (item < 0) {
            wpxClose(&doc);
            return sys::Status::Fail(path, 0,
                                     "Items entry " + std::to_string(n) + " is " + std::to_string(item) +
                                         ", not an item position (numbered from 0)");
        }
        setup.items.push_back(static_cast<unsigned>(item));
    }

    WPXHANDLE output = wpxSectionByNameNum(target, "OUTPUT", 1);
    wpxGetParam(output, "File_format", &setup.outputFormat, 1, 1);
    wpxGetParam(output, "File_name", &setup.outputFile, 1, 1);
    wpxGetParam(output, "Folder_name", &setup.outputFolder, 1, 1);
    wpxGetParam(output, "File_title", &setup.title, 1, 1);
    wpxGetParam(output, "Log_file", &setup.logFile, 1, 1);
    wpxClose(&doc);
    return sys::Status::Ok();
}

std::string CheckJobSetup(const JobSetup& setup)
{
    if (!(sys::FindFormat(setup.inputFormat) != nullptr))
        return "the input format " + std::to_string(setup.inputFormat) + " is not 1 (rbx0), 2 (ASCII) or 3 (Excel)";
    if (!(sys::FindFormat(setup.outputFormat) != nullptr))
        return "the output format " + std::to_string(setup.outputFormat) + " is not 1 (rbx0), 2 (ASCII) or 3 (Excel)";
    if (std::string problem = SelectionProblem(setup.items, std::numeric_limits<size_t>::max()); !problem.empty())
        return problem;
    if (setup.inputType == 1) {
        if (setup.inputFile.empty())
            return "no input file is named (INPUT File_name)";
        if (setup.outputFile.empty())
            return "no output file is named (OUTPUT File_name)";
        return {};
    }
    if (setup.inputType == 2) {
        if (!sys::IsDirectory(setup.inputFolder))
            return "the input folder '" + setup.inputFolder + "' does not exist (INPUT Folder_name)";
        if (!sys::IsDirectory(setup.outputFolder))
            return "the output folder '" + setup.outputFolder + "' does not exist (OUTPUT Folder_name)";
        return {};
    }
    return "the input type " + std::to_string(setup.inputType) + " is not 1 (a file) or 2 (a folder)";
}

std::string LogPathFor(const std::string& logSetting)
{
    if (logSetting.empty())
        return {};
    if (logSetting.back() == '/' || sys::IsDirectory(logSetting))
        return sys::JoinPath(logSetting, kLogFileName);
    return logSetting;
}

ConversionLog::ConversionLog(const std::string& path, std::FILE* echo) : m_echo(echo)
{
    if (path.empty())
        return;
    m_file = std::fopen(path.c_str(), "a");
    if (!m_file)
        m_status = sys::Status::Fail(path, 0, std::string("cannot open the log file: ") + std::strerror(errno));
}

ConversionLog::~ConversionLog()
{
    if (m_file)
        std::fclose(m_file);
}

void ConversionLog::Write(const std::string& entry)
{
    std::lock_guard<std::mutex> lock(m_mutex);
    for (std::FILE* out : {m_file, m_echo}) {
        if (!out)
            continue;
        std::fwrite(entry.data(), 1, entry.size(), out);
        if (entry.empty() || entry.back() != '\n')
            std::fputc('\n', out);
        std::fflush(out);
    }
}

std::string DescribeReport(const FileReport& report)
{
    const std::string input = Escaped(report.input);
    const std::string output = Escaped(report.output);
    if (report.converted) {
        std::string entry = "converted " + input + " -> " + output + ": " + std::to_string(report.rows) + " time steps, " +
                            std::to_string(report.itemsWritten) + " of " + std::to_string(report.itemsInFile) + " items";
        if (report.rows > 0)
            entry += ", " + report.firstStamp + " to " + report.lastStamp;
        entry += "\n";
        for (const std::string& note : report.notes)
            entry += "  note: " + Escaped(note) + "\n";
        return entry;
    }
    return std::string(report.templateFits ? "FAILED " : "SKIPPED ") + input + ": " +
           (report.templateFits ? "" : "the template does not fit: ") + Escaped(report.problem.Describe()) + "\n" +
           "  no output written; " + (output.empty() ? std::string("-") : output) + " left as it was\n";
}

bool InShare(const std::string& input, unsigned share, unsigned shares)
{
    // FNV-1a of the name without its folder: the same on every machine and in every build.
    std::uint64_t hash = 14695981039346656037ull;
    for (unsigned char c : sys::FileTitle(input)) {
        hash ^= c;
        hash *= 1099511628211ull;
    }
    return shares > 0 && hash % shares == share - 1;
}

int RunJob(const JobSetup& setup, ConversionLog& log, const JobOptions& options)
{
    const std::string problem = CheckJobSetup(setup);
    const sys::FileFormat in = static_cast<sys::FileFormat>(setup.inputFormat);
    const sys::FileFormat out = static_cast<sys::FileFormat>(setup.outputFormat);
    log.Write("run " + COleDateTime::GetCurrentTime().Format("%Y-%m-%d %H:%M:%S") + ": " + sys::FormatInfo(in).name + " " +
              Escaped(setup.inputType == 2 ? "folder " + setup.inputFolder : "file " + setup.inputFile) + " -> " +
              sys::FormatInfo(out).name + " " +
              Escaped(setup.inputType == 2 ? "folder " + setup.outputFolder : "file " + setup.outputFile) + "; template " +
              (setup.templateName.empty() ? "(defaults)" : Escaped(setup.templateName)) + "; items " + Join(setup.items) +
              (options.shares ? "; share " + std::to_string(options.share) + " of " + std::to_string(options.shares) : ""));
    if (!problem.empty()) {
        log.Write("setup error: " + Escaped(problem) + "\nresult: nothing converted; exit status 3");
        return kExitSetup;
    }

    sys::Status loaded;
    std::unique_ptr<CSpecification> spec = LoadTemplate(in, setup.templateName, loaded);
    if (!loaded) {
        log.Write("setup error: " + Escaped(loaded.problem().Describe()) + "\nresult: nothing converted; exit status 3");
        return kExitSetup;
    }

    // Every output is known and judged before the first is written.
    const RunPlan runPlan(setup, LogPathFor(setup.logFile));
    std::vector<PlannedFile> plan;
    for (const PlannedFile& file : runPlan.Files())
        if (options.shares == 0 || InShare(file.input, options.share, options.shares))
            plan.push_back(file);
    for (const std::string& folder : runPlan.OutputFolders())
        for (const std::string& leftover : OutputFile::RemoveStaleTemporaries(folder))
            log.Write("note: removed " + Escaped(leftover) + ", left by a run that was stopped");

    std::vector<FileReport> reports(plan.size());
    Progress progress(options.progress);
    std::atomic<size_t> next{0};
    auto work = [&]() {
        while (true) {
            const size_t index = next.fetch_add(1);
            if (index >= plan.size())
                return;
            const PlannedFile& file = plan[index];
            FileReport& report = reports[index];
            if (!file.refusal.empty()) {
                report.input = file.input;
                report.output = file.output;
                report.problem = sys::Problem{{}, 0, 0, file.refusal}; // the entry names the input already
            } else {
                FileJob job{in, file.input, spec.get(), setup.items, out, file.output, setup.title};
                report = ConvertFile(job, [&](std::uint64_t rows, std::uint64_t bytes) {
                    progress.Report(file.input, rows, bytes);
                });
            }
            log.Write(DescribeReport(report));
        }
    };
    unsigned threads = options.threads ? options.threads : std::max(1u, std::thread::hardware_concurrency());
    threads = static_cast<unsigned>(std::min<size_t>(threads, std::max<size_t>(1, plan.size())));
    // The workers begin together once all exist: with many threads, the thread making them would
    // otherwise get its turn on the processors only after every worker already converting.
    std::atomic<bool> begin{false};
    std::vector<std::thread> workers;
    for (unsigned t = 1; t < threads; ++t) {
        try {
            workers.emplace_back([&] {
                begin.wait(false);
                work();
            });
        } catch (const std::system_error&) {
            break; // the system gives no more threads: the ones there are convert every file
        }
    }
    begin = true;
    begin.notify_all();
    work();
    for (std::thread& worker : workers)
        worker.join();

    size_t converted = 0;
    for (const FileReport& report : reports)
        converted += report.converted ? 1 : 0;
    const size_t failed = reports.size() - converted;
    // A share may hold none of the files; the folder as a whole is judged by the other shares.
    const bool nothingToDo = reports.empty() && options.shares == 0;
    const int exitCode = (failed == 0 && !nothingToDo) ? kExitOk : kExitSomeFailed;
    std::string summary = "result: " + std::to_string(converted) + " converted, " + std::to_string(failed) +
                          " skipped or failed";
    if (reports.empty())
        summary += options.shares ? "; this share holds none of the " + std::to_string(runPlan.Files().size()) + " files"
                                  : "; the folder holds no " + std::string(sys::FormatInfo(in).name) + " file";
    if (setup.inputType == 2 && failed > 0)
        summary += "; " + res::LoadString(res::IDS_FOLDER_FILES_SKIPPED);
    log.Write(summary + "; exit status " + std::to_string(exitCode));
    return exitCode;
}

} // namespace converter
