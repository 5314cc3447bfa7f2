// velmora convert IN OUT: one conversion from the command line. The setup is made as `setup new`
// makes it (the wizard's pages and checks, a template guessed when none is named) and handed to
// the engine program the way `velmora run` hands it.
#include "apps/velmora/CommandLineSetup.h"
#include "apps/velmora/Commands.h"
#include "guess/GuessReport.h"
#include "platform/system/FileSystem.h"
#include "platform/system/Text.h"

#include <cstdio>
#include <filesystem>
#include <unistd.h>

namespace {

void PrintHelp()
{
    std::printf(
        "Usage: velmora convert IN OUT [--to rbx0|ascii|excel] [--format rbx0|ascii|excel]\n"
        "                      [--template T.xml] [--items 0,2] [--title TEXT] [--threads N] [--explain]\n\n"
        "Converts file IN to file OUT, or every file of folder IN into folder OUT, through the same\n"
        "checks as the setup wizard and the same engine program as `velmora run`:\n"
        "  formats     told by the extensions (.rbx0; .txt, .tab, .csv or none for ASCII; .xls, .xlsx);\n"
        "              --format names the input's, --to the output's (needed when OUT is a folder;\n"
        "              a folder OUT for a file IN takes the output named as IN)\n"
        "  --template  the ASCII or Excel template; without it one is guessed from IN (from a\n"
        "              folder's first file by name) and used for every file\n"
        "  --explain   print the evidence of the guessed template's choices first\n"
        "  --items     the item positions from 0 to convert, in order (default: every item)\n"
        "  --title     the title of an rbx0 output\n"
        "  --threads   convert a folder's files on N threads (default: one per core)\n"
        "The engine's log (one line a file, then the result) goes to standard error.\n\n"
        "Exit status: the engine program's (0 every file converted, 1 a file was skipped or failed,\n"
        "3 the setup cannot run), 1 when a check refuses the setup (its message is printed), 2 for\n"
        "bad usage.\n");
}

struct Arguments {
    host::SetupRequest request;
    std::string threads;
    bool explain = false;
};

std::string ReadArguments(int argc, char** argv, Arguments& arguments)
{
    host::SetupRequest& request = arguments.request;
    request.outputFormatOption = "--to";
    request.keepTemplateFile = true;
    std::vector<std::string> paths;
    for (int i = 1; i < argc; ++i) {
        const std::string arg = argv[i];
        if (arg == "--explain") {
            arguments.explain = true;
            continue;
        }
        if (arg.size() < 2 || arg[0] != '-') {
            paths.push_back(arg);
            continue;
        }
        if (arg != "--to" && arg != "--format" && arg != "--template" && arg != "--items" && arg != "--title" &&
            arg != "--threads")
            return "unknown option " + arg;
        if (i + 1 == argc)
            return arg + " needs a value";
        const std::string value = argv[++i];
        if (arg == "--template") {
            request.templatePath = value;
        } else if (arg == "--title") {
            request.title = value;
        } else if (arg == "--threads") {
            if (value.empty() || value.size() > 4 || value.find_first_not_of("0123456789") != std::string::npos ||
                value.find_first_not_of('0') == std::string::npos)
                return "--threads takes a number of threads from 1, not " + value;
            arguments.threads = value;
        } else if (arg == "--items") {
            if (!host::ReadItemList(value, request.items.emplace()))
                return "--items takes positions from 0 separated by commas, such as 0,2, not " + value;
        } else {
            (arg == "--to" ? request.outputFormat : request.inputFormat) = host::FormatOfName(value);
            if (host::FormatOfName(value) == 0)
                return arg + " takes rbx0, ascii or excel, not " + value;
        }
    }
    if (paths.size() != 2)
        return paths.size() < 2 ? "IN and OUT are needed" : "more than IN and OUT given";
    request.input = paths[0];
    request.output = paths[1];
    return {};
}

// A name in the temporary folder for the guessed template, removed when the command ends.
class ScratchTemplate {
public:
    ScratchTemplate()
    {
        std::string folder;
        sys::GetTempPath(4096, folder);
        m_path = sys::JoinPath(folder.empty() ? std::string("/tmp") : folder,
                               "velmora-convert-" + std::to_string(::getpid()) + "-template.xml");
    }
    ~ScratchTemplate() { sys::DeleteFile(m_path); }
    ScratchTemplate(const ScratchTemplate&) = delete;
    ScratchTemplate& operator=(const ScratchTemplate&) = delete;
    const std::string& Path() const { return m_path; }

private:
    std::string m_path;
};

int Convert(int argc, char** argv)
{
    if (host::WantsHelp(argc, argv)) {
        PrintHelp();
        return host::kSuccess;
    }
    Arguments arguments;
    if (const std::string problem = ReadArguments(argc, argv, arguments); !problem.empty())
        return host::UsageError("convert", problem);
    if (arguments.explain && !arguments.request.templatePath.empty())
        return host::UsageError("convert", "--explain tells how a template was guessed; --template names one");

    const ScratchTemplate scratch;
    host::SetupRequest& request = arguments.request;
    request.guessedTemplate = scratch.Path();
    CEngine engine;
    host::SetupOutcome outcome;
    const bool built = host::BuildSetup(request, engine, outcome);
    if (!engine.m_strWorkTemplate.empty())
        sys::DeleteFile(engine.m_strWorkTemplate);
    if (outcome.guess && outcome.guess->spec) {
        if (arguments.explain)
            std::fputs(guess::ExplainGuess(*outcome.guess).c_str(), stdout);
        else
            std::fprintf(stderr, "velmora convert: a template guessed from %s (--explain tells why)\n",
                         text::EscapeControls(outcome.guess->file).c_str());
        std::fflush(stdout);
    }
    if (!built) {
        host::PrintRefusal("convert", outcome);
        return outcome.usage ? host::kBadUsage : host::kFailed;
    }
    engine.SetSetupName("convert");
    std::vector<CString> options;
    if (!arguments.threads.empty())
        options = {"--threads", arguments.threads};
    return engine.LaunchEngine(options);
}

} // namespace

VELMORA_REGISTER_COMMAND("convert", "convert a file or a folder in one command, a template guessed when none is named",
                         Convert)
