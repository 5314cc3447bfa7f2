// velmora template guess FILE [--format ascii|excel] [-o T.xml] [--explain] [--json]: proposes a
// template from the head of a data file.
#include "apps/velmora/Commands.h"
#include "apps/velmora/TemplateGuessCommand.h"
#include "guess/GuessReport.h"
#include "templates/TemplateFileLayout.h"
#include "templates/TemplateReport.h"

#include <cstdio>
#include <iostream>

namespace host {
namespace {

struct GuessArguments {
    std::string file;
    std::string format; // "ascii", "excel" or empty (by the extension)
    std::string output;
    bool explain = false;
    bool json = false;
};

// Fills `arguments`; a usage error's status, or -1.
int ReadArguments(const std::vector<std::string>& args, GuessArguments& arguments)
{
    for (size_t i = 0; i < args.size(); ++i) {
        const std::string& arg = args[i];
        if (arg == "--explain") {
            arguments.explain = true;
        } else if (arg == "--json") {
            arguments.json = true;
        } else if (arg == "--format" || arg == "-o") {
            if (i + 1 == args.size())
                return UsageError("template", arg + " needs a value");
            (arg == "-o" ? arguments.output : arguments.format) = args[++i];
        } else if (arg.rfind("--format=", 0) == 0) {
            arguments.format = arg.substr(9);
        } else if (!arg.empty() && arg[0] == '-') {
            return UsageError("template", "unknown option " + arg);
        } else if (arguments.file.empty()) {
            arguments.file = arg;
        } else {
            return UsageError("template", "guess takes one data file");
        }
    }
    if (arguments.file.empty())
        return UsageError("template", "guess needs a data file");
    if (!arguments.format.empty() && arguments.format != "ascii" && arguments.format != "excel")
        return UsageError("template", "unknown format '" + arguments.format + "'; use ascii or excel");
    return -1;
}

} // namespace

void PrintTemplateGuessHelp()
{
    std::printf(
        "guess  reads the head of data FILE (at most its first 200 lines or 1 MiB, or the first 200 rows of\n"
        "      a workbook's sheet) and proposes a template for it: the delimiter, the decimal separator,\n"
        "      where the dates and times stand and their format, the rows that hold item names, item\n"
        "      types, units and value types, the data start row and the delete value. The engine's own\n"
        "      reader then reads the head with it before it is proposed. --format names the kind of\n"
        "      FILE (default: excel for .xls and .xlsx, else ascii). Without -o the template is printed\n"
        "      as `show` prints it; -o writes it to T.xml. --explain prints the evidence of each choice\n"
        "      and where the file could be read another way; --json prints one object {\"ok\", \"file\",\n"
        "      \"kind\", \"read\", \"template\", \"findings\", \"refusal\"}. A file that cannot be read as a\n"
        "      time series is refused with the reason and the line (exit status 1).\n");
}

int RunTemplateGuess(const std::vector<std::string>& args)
{
    GuessArguments arguments;
    if (const int status = ReadArguments(args, arguments); status >= 0)
        return status;
    const guess::InputKind kind = arguments.format.empty() ? guess::KindOfFile(arguments.file)
                                  : arguments.format == "excel"  ? guess::InputKind::Excel
                                                                 : guess::InputKind::Ascii;
    const guess::TemplateGuess guessed = guess::GuessTemplate(arguments.file, kind);
    if (arguments.json)
        std::cout << guess::GuessJson(guessed);
    else if (arguments.explain)
        std::cout << guess::ExplainGuess(guessed);
    std::cout.flush();
    if (!guessed.spec) {
        if (!arguments.json)
            std::fprintf(stderr, "velmora template: %s\n", guess::DescribeRefusal(guessed).c_str());
        return kFailed;
    }
    if (!arguments.output.empty()) {
        if (!guessed.spec->Save(arguments.output)) {
            std::fprintf(stderr, "velmora template: %s\n", guessed.spec->LastError().c_str());
            return kFailed;
        }
    } else if (!arguments.json && !arguments.explain) {
        const tmplfile::FileLayout& layout =
            kind == guess::InputKind::Excel ? tmplfile::ExcelFileLayout() : tmplfile::AsciiFileLayout();
        tmplfile::WriteTemplateText(*guessed.spec, layout, std::cout);
    }
    std::cout.flush();
    return std::cout ? kSuccess : kFailed;
}

} // namespace host
