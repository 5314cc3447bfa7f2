// velmora setup new DOC --input PATH --output PATH [...]: the parameter document the wizard's Finish
// writes, made from the command line through the same pages and checks.
#include "apps/velmora/CommandLineSetup.h"
#include "apps/velmora/Commands.h"
#include "apps/velmora/WizardDocument.h"
#include "engine/ModuleHandle.h"
#include "platform/system/FileSystem.h"
#include "platform/system/Text.h"
#include "platform/wpx/Wpx.h"

#include <cstdio>
#include <cstring>
#include <unistd.h>

namespace {

void PrintHelp()
{
    std::printf(
        "Usage: velmora setup new DOC --input PATH [--format rbx0|ascii|excel]\n"
        "                             [--template T.xml | --guess] [--items 0,2]\n"
        "                             --output PATH [--output-format rbx0|ascii|excel] [--title TEXT]\n\n"
        "Writes parameter document DOC holding a setup, as the setup wizard's Finish writes it, after\n"
        "the checks the wizard's pages run, with their messages:\n"
        "  --input PATH    the file to convert, or a folder: every file of its format in it\n"
        "  --format F      the input format; default: told by the extension (of the folder's files)\n"
        "  --template T    the ASCII or Excel template, used as it is; the chosen items are written\n"
        "                  into it, as the wizard does\n"
        "  --guess         a template guessed from the input (from a folder's first file by name) and\n"
        "                  saved beside DOC as DOC's name with \"-template.xml\"; the default for\n"
        "                  ASCII and Excel input when no --template is given\n"
        "  --items LIST    the item positions from 0 to convert, in order (default: as the template\n"
        "                  selects them, else every item)\n"
        "  --output PATH   the output file; for a folder input the output folder; a folder for a\n"
        "                  single file takes the output named as the input\n"
        "  --output-format F  default: told by the output's extension (needed for a folder)\n"
        "  --title TEXT    the title of an rbx0 output\n"
        "DOC is replaced when it exists; file names in DOC's folder are written relative to it.\n\n"
        "Exit status: 0 when DOC is written, 1 when a check refuses the setup (its message is printed)\n"
        "or DOC cannot be written, 2 for bad usage.\n");
}

struct Arguments {
    std::string document;
    host::SetupRequest request;
    bool guess = false;
};

// Fills `arguments`; an empty string, or what is wrong with the command line.
std::string ReadArguments(int argc, char** argv, Arguments& arguments)
{
    if (argc < 2 || std::strcmp(argv[1], "new") != 0)
        return argc < 2 ? "no action given (only \"new\" is known)" : std::string("unknown action ") + argv[1];
    host::SetupRequest& request = arguments.request;
    for (int i = 2; i < argc; ++i) {
        const std::string arg = argv[i];
        const bool hasValue = i + 1 < argc;
        auto value = [&] { return std::string(argv[++i]); };
        if (arg == "--guess") {
            arguments.guess = true;
        } else if (arg[0] == '-' && arg.size() > 1 && !hasValue) {
            return arg == "--input" || arg == "--output" || arg == "--format" || arg == "--output-format" ||
                           arg == "--template" || arg == "--items" || arg == "--title"
                       ? arg + " needs a value"
                       : "unknown option " + arg;
        } else if (arg == "--input") {
            request.input = value();
        } else if (arg == "--output") {
            request.output = value();
        } else if (arg == "--template") {
            request.templatePath = value();
        } else if (arg == "--title") {
            request.title = value();
        } else if (arg == "--format" || arg == "--output-format") {
            const std::string name = value();
            (arg == "--format" ? request.inputFormat : request.outputFormat) = host::FormatOfName(name);
            if (host::FormatOfName(name) == 0)
                return arg + " takes rbx0, ascii or excel, not " + name;
        } else if (arg == "--items") {
            const std::string list = value();
            if (!host::ReadItemList(list, request.items.emplace()))
                return "--items takes positions from 0 separated by commas, such as 0,2, not " + list;
        } else if (arg[0] == '-' && arg.size() > 1) {
            return "unknown option " + arg;
        } else if (!arguments.document.empty()) {
            return "more than one parameter document given";
        } else {
            arguments.document = arg;
        }
    }
    if (arguments.document.empty())
        return "no parameter document given";
    if (request.input.empty() || request.output.empty())
        return request.input.empty() ? "no --input given" : "no --output given";
    if (arguments.guess && !request.templatePath.empty())
        return "--template and --guess exclude each other";
    return {};
}

// "setup.wpx" -> "setup-template.xml", beside it.
std::string GuessedTemplateName(const std::string& document)
{
    std::string stem = document;
    if (const size_t dot = stem.rfind('.'); dot != std::string::npos && dot > stem.rfind('/') + 1)
        stem.erase(dot);
    return stem + "-template.xml";
}

// What Finish does with the setup: the module's document replaced by one holding it, written to
// `document` in one step.
bool WriteDocument(CEngine& engine, const std::string& document, std::string& error)
{
    if (WriteSetup(engine) != 0) {
        error = "no document can be made";
        return false;
    }
    const std::string scratch = document + ".setup-" + std::to_string(::getpid());
    if (!wpxWrite(ModuleWpxDocument(), scratch)) {
        error = scratch + ": cannot write the new document";
        return false;
    }
    if (host::ReplaceDocument(scratch, document, error))
        return true;
    sys::DeleteFile(scratch);
    return false;
}

int SetupNew(int argc, char** argv)
{
    if (host::WantsHelp(argc, argv)) {
        PrintHelp();
        return host::kSuccess;
    }
    Arguments arguments;
    if (const std::string problem = ReadArguments(argc, argv, arguments); !problem.empty())
        return host::UsageError("setup", problem);

    host::SetupRequest request = arguments.request;
    request.guessedTemplate = host::AbsolutePath(GuessedTemplateName(arguments.document));
    const bool guessedBefore = sys::FileExists(request.guessedTemplate);

    CEngine engine;
    host::SetupOutcome outcome;
    const bool built = host::BuildSetup(request, engine, outcome);
    std::string error;
    const bool written = built && WriteDocument(engine, arguments.document, error);
    if (!engine.m_strWorkTemplate.empty())
        sys::DeleteFile(engine.m_strWorkTemplate);
    if (!written && outcome.guess && outcome.guess->spec && !guessedBefore)
        sys::DeleteFile(request.guessedTemplate);
    if (!built) {
        host::PrintRefusal("setup", outcome);
        return outcome.usage ? host::kBadUsage : host::kFailed;
    }
    if (!written) {
        std::fprintf(stderr, "velmora setup: %s\n", text::EscapeControls(error).c_str());
        return host::kFailed;
    }
    if (outcome.guess)
        std::printf("velmora setup: the template guessed from %s is written to %s\n",
                    text::EscapeControls(outcome.guess->file).c_str(),
                    text::EscapeControls(request.guessedTemplate).c_str());
    std::printf("velmora setup: the setup is written to %s\n", text::EscapeControls(arguments.document).c_str());
    return host::kSuccess;
}

} // namespace

VELMORA_REGISTER_COMMAND("setup", "make a parameter document from the command line, with the wizard's checks",
                         SetupNew)
