#pragma once
// Files made and read by other programs' libraries for the tests: the Python workbook writers and
// readers (xlwt, xlrd, openpyxl, xlsxwriter) of the system's own Python, which the pyenv Python
// first on PATH lacks. A test that needs one skips when it cannot be had.
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <string>
#include <sys/wait.h>
#include <unistd.h>

namespace pytools {

inline const char* kPython = "/usr/bin/python3";

inline std::string Quote(const std::string& text)
{
    std::string quoted = "'";
    for (char c : text)
        quoted += c == '\'' ? std::string("'\\''") : std::string(1, c);
    return quoted + "'";
}

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
    const std::string command = std::string(kPython) + " -c " + Quote(imports) + " >/dev/null 2>&1";
    return std::system(command.c_str()) == 0;
}

struct Result {
    int status = -1;    // the script's exit status
    std::string output; // what it printed, standard error included
};

// Runs `script` (the program's text) with `arguments` (each quoted for the shell).
inline Result Run(const std::string& script, const std::string& arguments = "")
{
    char path[] = "/tmp/velmora_py_XXXXXX";
    const int fd = mkstemp(path);
    Result result;
    if (fd < 0)
        return result;
    ::close(fd);
    std::ofstream(path) << script;
    const std::string command = std::string(kPython) + " " + path + " " + arguments + " 2>&1";
    if (FILE* pipe = popen(command.c_str(), "r")) {
        char buffer[4096];
        size_t got = 0;
        while ((got = std::fread(buffer, 1, sizeof buffer, pipe)) > 0)
            result.output.append(buffer, got);
        const int status = pclose(pipe);
        result.status = WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    }
    std::remove(path);
    return result;
}

} // namespace pytools
