#pragma once
// Files made and read by other programs' libraries for the tests: the Python workbook writers and
// readers (xlwt, xlrd, openpyxl, xlsxwriter) of the system's own Python, which the pyenv Python
// first on PATH lacks. A test that needs one skips when it cannot be had.
#include "tests/support/ScratchFile.h"
#include "tests/support/ShellCommand.h"

#include <string>

namespace pytools {

inline const char* kPython = "/usr/bin/python3";

// True when the system's Python imports every module of `modules` ("xlwt", "openpyxl xlrd").
inline bool Has(const std::string& modules)
{
    std::string imports;
    for (size_t start = 0; start < modules.size();) {
        size_t end = modules.find(' ', start);
        if (end == std::string::npos)
            end = modules.size();
        if (end > start)
            imports += "import " + modules.substr(start, end - start) + ";";
        start = end + 1;
    }
    const std::string command = std::string(kPython) + " -c " + testsupport::ShellQuote(imports) + " >/dev/null 2>&1";
    return testsupport::ShellStatus(command) == 0;
}

struct Result {
    int status = -1;    // the script's exit status
    std::string output; // what it printed, standard error included
};

// Runs `script` (the program's text) with `arguments` (each quoted for the shell).
inline Result Run(const std::string& script, const std::string& arguments = "")
{
    const testsupport::ScratchFile program("velmora_py", ".py", script);
    if (program.Path().empty())
        return {};
    const testsupport::ShellRun run = testsupport::RunShell(std::string(kPython) + " " + program.Path() + " " + arguments + " 2>&1");
    return {run.status, run.out};
}

} // namespace pytools
