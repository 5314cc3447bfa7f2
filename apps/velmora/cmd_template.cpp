// velmora template show FILE [--json] | new --format ascii|excel OUT | guess FILE ...: looks into
// template files, writes new ones with the defaults, and proposes one for a data file.
#include "apps/velmora/Commands.h"
#include "apps/velmora/TemplateGuessCommand.h"
#include "templates/TemplateFileLayout.h"
#include "templates/TemplateReport.h"

#include <cstdio>
#include <cstring>
#include <iostream>
#include <string>
#include <vector>

namespace {

void PrintHelp()
{
    std::printf("Usage: velmora template show FILE [--json]\n"
                "       velmora template new --format ascii|excel OUT\n"
                "       velmora template guess FILE [--format ascii|excel] [-o T.xml] [--explain] [--json]\n\n"
                "show  loads template FILE as the kind its root element names (ASCII or Excel) and prints\n"
                "      every value by its file key, then the item definitions. With --json the same as\n"
                "      one JSON object {\"kind\", \"values\", \"items\"}.\n"
                "new   writes a template of the given kind holding the defaults to OUT (UTF-16).\n");
    host::PrintTemplateGuessHelp();
    std::printf("\nExit status: 0 on success, 1 when FILE cannot be loaded (or guessed) or OUT cannot be\n"
                "written, 2 for bad usage.\n");
}

int Show(const std::vector<std::string>& args)
{
    std::string file;
    bool json = false;
    for (const std::string& arg : args) {
        if (arg == "--json")
            json = true;
        else if (!arg.empty() && arg[0] == '-')
            return host::UsageError("template", "unknown option " + arg);
        else if (file.empty())
            file = arg;
        else
            return host::UsageError("template", "show takes one template file");
    }
    if (file.empty())
        return host::UsageError("template", "show needs a template file");

    tmplfile::OpenedTemplate opened;
    if (const sys::Status status = tmplfile::OpenTemplateFile(file, opened); !status) {
        std::fprintf(stderr, "velmora template: %s\n", status.problem().Describe().c_str());
        return host::kFailed;
    }
    if (json)
        tmplfile::WriteTemplateJson(*opened.spec, *opened.layout, std::cout);
    else
        tmplfile::WriteTemplateText(*opened.spec, *opened.layout, std::cout);
    std::cout.flush();
    return std::cout ? host::kSuccess : host::kFailed;
}

int New(const std::vector<std::string>& args)
{
    std::string kind, out;
    for (size_t i = 0; i < args.size(); ++i) {
        if (args[i] == "--format") {
            if (i + 1 == args.size())
                return host::UsageError("template", "--format needs ascii or excel");
            kind = args[++i];
        } else if (args[i].rfind("--format=", 0) == 0) {
            kind = args[i].substr(9);
        } else if (!args[i].empty() && args[i][0] == '-') {
            return host::UsageError("template", "unknown option " + args[i]);
        } else if (out.empty()) {
            out = args[i];
        } else {
            return host::UsageError("template", "new takes one output file");
        }
    }
    if (kind.empty())
        return host::UsageError("template", "new needs --format ascii or --format excel");
    if (out.empty())
        return host::UsageError("template", "new needs an output file");
    tmplfile::OpenedTemplate created = tmplfile::NewTemplate(kind);
    if (!created.spec)
        return host::UsageError("template", "unknown format '" + kind + "'; use ascii or excel");
    if (!created.spec->Save(out)) {
        std::fprintf(stderr, "velmora template: %s\n", created.spec->LastError().c_str());
        return host::kFailed;
    }
    return host::kSuccess;
}

int Template(int argc, char** argv)
{
    if (host::WantsHelp(argc, argv)) {
        PrintHelp();
        return host::kSuccess;
    }
    if (argc < 2)
        return host::UsageError("template", "missing sub-command: show, new or guess");
    std::vector<std::string> args(argv + 2, argv + argc);
    if (std::strcmp(argv[1], "show") == 0)
        return Show(args);
    if (std::strcmp(argv[1], "new") == 0)
        return New(args);
    if (std::strcmp(argv[1], "guess") == 0)
        return host::RunTemplateGuess(args);
    return host::UsageError("template", std::string("unknown sub-command '") + argv[1] + "'; use show, new or guess");
}

} // namespace

VELMORA_REGISTER_COMMAND("template", "show a template file's values, write a new one, or guess one from a data file",
                         Template)
