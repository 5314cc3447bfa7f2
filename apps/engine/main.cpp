// Velmora: the conversion engine program. The plug-in starts it as "Velmora <setupFile> 1" on the
// temporary setup file and waits; the exit status says whether every file converted.
#include "converter/ConversionJob.h"
#include "converter/DryRun.h"
#include "converter/OutputFile.h"
#include "converter/RunPlan.h"
#include "platform/system/Text.h"
#include "platform/ui/UserInterface.h"

#include <atomic>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <exception>
#include <memory>
#include <pthread.h>
#include <sys/resource.h>
#include <string>
#include <thread>
#include <unistd.h>

namespace {

// Sent by the conversion thread to the main thread when the run is over.
constexpr int kRunOverSignal = SIGUSR1;
constexpr int kStopSignals[] = {SIGINT, SIGTERM, SIGHUP};

struct Arguments {
    std::string setupFile;
    unsigned threads = 0;
    bool quiet = false;
    bool dryRun = false;
    bool json = false;
    unsigned share = 0, shares = 0; // --shard K/N
};

void PrintUsage(std::FILE* out)
{
    std::fprintf(out,
                 "Usage: Velmora SETUP_FILE [1] [--threads N] [--quiet] [--shard K/N] [--dry-run [--json]]\n\n"
                 "Converts the time-series files a setup file describes (target \"VELMORA\", sections\n"
                 "INPUT, TEMPLATE, OUTPUT) and appends what happened to the log named by Log_file.\n\n"
                 "Options:\n"
                 "  --threads N   convert a folder's files on N threads (default: one per core; any number,\n"
                 "                an interrupted run removes every unfinished output however many are open)\n"
                 "  --quiet       no progress lines on standard error\n"
                 "  --shard K/N   convert only the K-th of N shares of the files (1 <= K <= N): each file\n"
                 "                belongs to one share, chosen by its name, so N runs (on any machines)\n"
                 "                convert every file once; see docs/scaling.md\n"
                 "  --dry-run     read every input file with its template and write nothing (no output,\n"
                 "                no log): print per file its rows, first and last stamp, the rows that do\n"
                 "                not read (file:line:column), missing steps, stamps that repeat or go\n"
                 "                back and accumulated values that decrease, then a summary line; the\n"
                 "                exit status is the one the run would have\n"
                 "  --json        with --dry-run: one JSON object instead\n"
                 "  --help        this text\n\n"
                 "Exit status: 0 every file converted; 1 a file was skipped or failed; 2 bad usage;\n"
                 "3 the setup file cannot be read or cannot run; 128+N stopped by signal N.\n"
                 "See docs/engine.md.\n");
}

// "K/N" with 1 <= K <= N.
bool ReadShard(const std::string& text, unsigned& share, unsigned& shares)
{
    unsigned k = 0, n = 0;
    char rest = 0;
    if (std::sscanf(text.c_str(), "%u/%u%c", &k, &n, &rest) != 2 || k < 1 || k > n)
        return false;
    share = k, shares = n;
    return true;
}

// Fills `arguments`; returns an exit status when the program should stop at once, else -1.
int ReadArguments(int argc, char** argv, Arguments& arguments)
{
    for (int i = 1; i < argc; ++i) {
        const std::string arg = argv[i];
        if (arg == "--help" || arg == "-h") {
            PrintUsage(stdout);
            return converter::kExitOk;
        }
        if (arg == "--quiet") {
            arguments.quiet = true;
        } else if (arg == "--threads" && i + 1 < argc) {
            const int n = std::atoi(argv[++i]);
            if (n < 1) {
                std::fprintf(stderr, "Velmora: --threads needs a number of 1 or more\n");
                return converter::kExitUsage;
            }
            arguments.threads = static_cast<unsigned>(n);
        } else if (arg == "--dry-run") {
            arguments.dryRun = true;
        } else if (arg == "--json") {
            arguments.json = true;
        } else if (arg == "--shard" || arg.rfind("--shard=", 0) == 0) {
            const std::string value = arg == "--shard" ? (i + 1 < argc ? argv[++i] : "") : arg.substr(8);
            if (!ReadShard(value, arguments.share, arguments.shares)) {
                std::fprintf(stderr, "Velmora: --shard needs K/N with 1 <= K <= N, such as 2/8\n");
                return converter::kExitUsage;
            }
        } else if (arguments.setupFile.empty() && !arg.empty() && arg[0] != '-') {
            arguments.setupFile = arg;
        } else if (arg != "1") { // the flag the plug-in passes after the setup file
            std::fprintf(stderr, "Velmora: unexpected argument '%s'\n", text::EscapeControls(arg).c_str());
            PrintUsage(stderr);
            return converter::kExitUsage;
        }
    }
    if (arguments.setupFile.empty()) {
        PrintUsage(stderr);
        return converter::kExitUsage;
    }
    if (arguments.json && !arguments.dryRun) {
        std::fprintf(stderr, "Velmora: --json goes with --dry-run\n");
        return converter::kExitUsage;
    }
    return -1;
}

// The stop signals the program was not started to ignore (nohup, a background job), and the signal
// that ends the wait.
sigset_t WaitedSignals()
{
    sigset_t set;
    sigemptyset(&set);
    for (int signal : kStopSignals) {
        struct sigaction current {};
        if (::sigaction(signal, nullptr, &current) == 0 && current.sa_handler != SIG_IGN)
            sigaddset(&set, signal);
    }
    sigaddset(&set, kRunOverSignal);
    return set;
}

// The log as the setup names it, or standard error when it names a file the run reads (an input,
// the template, the setup file) or cannot be opened.
std::unique_ptr<converter::ConversionLog> OpenLog(const converter::JobSetup& setup)
{
    const std::string path = converter::LogPathFor(setup.logFile);
    if (path.empty())
        return std::make_unique<converter::ConversionLog>(std::string(), stderr);
    if (const std::string what = converter::RunPlan::FileTheRunReads(setup, path); !what.empty()) {
        std::fprintf(stderr, "Velmora: the log file is %s: not appended to; logging to standard error\n",
                     text::EscapeControls(what).c_str());
        return std::make_unique<converter::ConversionLog>(std::string(), stderr);
    }
    auto log = std::make_unique<converter::ConversionLog>(path, nullptr);
    if (log->IsOpen())
        return log;
    std::fprintf(stderr, "Velmora: %s; logging to standard error\n", text::EscapeControls(log->status().problem().Describe()).c_str());
    return std::make_unique<converter::ConversionLog>(std::string(), stderr);
}

// Runs the job on a thread of its own while this thread waits for the end of the run or a stop
// signal. The signals are taken here, in ordinary code rather than a handler, so that the list of
// part files to remove can grow without limit: a stopped run removes every unfinished output.
int RunUntilStopped(const converter::JobSetup& setup, converter::ConversionLog& log, const converter::JobOptions& options,
                    const sigset_t& waited)
{
    std::atomic<bool> over{false};
    int status = converter::kExitSetup;
    const pthread_t waiter = ::pthread_self();
    std::thread job([&] {
        try {
            status = converter::RunJob(setup, log, options);
        } catch (const std::exception& e) {
            log.Write(std::string("stopped: ") + text::EscapeControls(e.what()) + "; exit status 3");
        }
        over = true;
        ::pthread_kill(waiter, kRunOverSignal);
    });
    while (true) {
        int signal = 0;
        if (::sigwait(&waited, &signal) != 0 || (signal == kRunOverSignal && !over))
            continue;
        if (signal == kRunOverSignal)
            break;
        const size_t removed = converter::OutputFile::RemoveAllTemporaries();
        log.Write("stopped by signal " + std::to_string(signal) + " (" + strsignal(signal) + "): " +
                  std::to_string(removed) + " unfinished output(s) removed, the files they would have replaced left "
                  "as they were; exit status " + std::to_string(128 + signal));
        ::_exit(128 + signal);
    }
    job.join();
    return status;
}

// False, with the reason on standard error, when the setup file cannot be read.
bool ReadSetup(const std::string& file, converter::JobSetup& setup)
{
    const sys::Status read = converter::ReadJobSetup(file, setup);
    if (!read)
        std::fprintf(stderr, "Velmora: %s\n", text::EscapeControls(read.problem().Describe()).c_str());
    return read.ok();
}

// The conversion itself, after the setup is read and before any thread starts.
int Convert(const converter::JobSetup& setup, const Arguments& arguments)
{
    // Blocked before any thread starts, so every thread inherits it and only sigwait takes them.
    const sigset_t waited = WaitedSignals();
    ::pthread_sigmask(SIG_BLOCK, &waited, nullptr);
    // A closed standard error must not end a run in the middle of a file.
    std::signal(SIGPIPE, SIG_IGN);
    // Each file converting holds three descriptors (input, output, part file); many threads need many.
    if (rlimit files {}; ::getrlimit(RLIMIT_NOFILE, &files) == 0 && files.rlim_cur < files.rlim_max) {
        files.rlim_cur = files.rlim_max;
        ::setrlimit(RLIMIT_NOFILE, &files);
    }
    std::unique_ptr<converter::ConversionLog> log = OpenLog(setup);
    return RunUntilStopped(setup, *log, {arguments.threads, arguments.quiet ? nullptr : stderr, arguments.share, arguments.shares},
                           waited);
}

} // namespace

int main(int argc, char** argv)
{
    Arguments arguments;
    if (const int status = ReadArguments(argc, argv, arguments); status >= 0)
        return status;

    // The engine runs unattended: nothing it calls may wait for a person.
    ui::SilentUserInterface silent;
    ui::SetProcessUserInterface(&silent);
    try {
        converter::JobSetup setup;
        if (!ReadSetup(arguments.setupFile, setup))
            return converter::kExitSetup;
        // A dry run writes nothing: it needs neither the log nor the watch over part files.
        if (arguments.dryRun)
            return converter::DryRunJob(setup, stdout, arguments.json, arguments.threads, arguments.share, arguments.shares);
        return Convert(setup, arguments);
    } catch (const std::exception& e) {
        std::fprintf(stderr, "Velmora: stopped: %s\n", text::EscapeControls(e.what()).c_str());
        return converter::kExitSetup;
    }
}
