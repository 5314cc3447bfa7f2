// Velmora: the conversion engine program. The plug-in starts it as "Velmora <setupFile> 1" on the
// temporary setup file and waits; the exit status says whether every file converted.
#include "converter/ConversionJob.h"
#include "converter/OutputFile.h"
#include "platform/ui/UserInterface.h"

#include <csignal>
#include <cstdio>
#include <cstring>
#include <unistd.h>
#include <exception>
#include <string>

namespace {

// An interrupted run removes its part files, as a failed conversion does.
void OnTerminate(int signal)
{
    converter::OutputFile::RemoveAllTemporaries();
    ::_exit(128 + signal);
}

void PrintUsage(std::FILE* out)
{
    std::fprintf(out,
                 "Usage: Velmora SETUP_FILE [1]\n\n"
                 "Converts the time-series files a setup file describes (target \"VELMORA\", sections\n"
                 "INPUT, TEMPLATE, OUTPUT) and appends what happened to the log named by Log_file.\n\n"
                 "Options:\n"
                 "  --threads N   convert a folder's files on N threads (default: one per core)\n"
                 "  --quiet       no progress lines on standard error\n"
                 "  --help        this text\n\n"
                 "Exit status: 0 every file converted; 1 a file was skipped or failed; 2 bad usage;\n"
                 "3 the setup file cannot be read or cannot run. See docs/engine.md.\n");
}

} // namespace

int main(int argc, char** argv)
{
    std::string setupFile;
    unsigned threads = 0;
    bool quiet = false;
    for (int i = 1; i < argc; ++i) {
        const std::string arg = argv[i];
        if (arg == "--help" || arg == "-h") {
            PrintUsage(stdout);
            return converter::kExitOk;
        }
        if (arg == "--quiet") {
            quiet = true;
        } else if (arg == "--threads" && i + 1 < argc) {
            const int n = std::atoi(argv[++i]);
            if (n < 1) {
                std::fprintf(stderr, "Velmora: --threads needs a number of 1 or more\n");
                return converter::kExitUsage;
            }
            threads = static_cast<unsigned>(n);
        } else if (setupFile.empty() && !arg.empty() && arg[0] != '-') {
            setupFile = arg;
        } else if (arg != "1") { // the flag the plug-in passes after the setup file
            std::fprintf(stderr, "Velmora: unexpected argument '%s'\n", arg.c_str());
            PrintUsage(stderr);
            return converter::kExitUsage;
        }
    }
    if (setupFile.empty()) {
        PrintUsage(stderr);
        return converter::kExitUsage;
    }

    for (int signal : {SIGINT, SIGTERM, SIGHUP})
        std::signal(signal, OnTerminate);

    // The engine runs unattended: nothing it calls may wait for a person.
    ui::SilentUserInterface silent;
    ui::SetProcessUserInterface(&silent);
    try {
        converter::JobSetup setup;
        std::string error;
        if (!converter::ReadJobSetup(setupFile, setup, error)) {
            std::fprintf(stderr, "Velmora: %s\n", error.c_str());
            return converter::kExitSetup;
        }
        const std::string logPath = converter::LogPathFor(setup.logFile);
        converter::ConversionLog log(logPath, logPath.empty() ? stderr : nullptr);
        if (!log.IsOpen() && !logPath.empty()) {
            std::fprintf(stderr, "Velmora: %s; logging to standard error\n", log.OpenError().c_str());
            converter::ConversionLog fallback({}, stderr);
            return converter::RunJob(setup, fallback, {threads, quiet ? nullptr : stderr});
        }
        return converter::RunJob(setup, log, {threads, quiet ? nullptr : stderr});
    } catch (const std::exception& e) {
        std::fprintf(stderr, "Velmora: stopped: %s\n", e.what());
        return converter::kExitSetup;
    }
}
