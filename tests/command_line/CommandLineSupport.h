#pragma once
// What the command-line tests share: running the built programs, inputs of every format (workbooks
// written by libxlsxwriter and Python's xlwt) and the values read back from any output.
#include "converter/RbxSeriesReader.h"
#include "converter/RbxSeriesWriter.h"

#include "tests/support/Files.h"
#include "tests/support/Program.h"
#include "tests/support/ScratchFile.h"
#include "tests/support/ScratchFolder.h"
#include "tests/support/ShellCommand.h"
#include "tests/support/XlsxWorkbook.h"

#include <gtest/gtest.h>

#include <cstdio>
#include <filesystem>
#include <map>
#include <sstream>
#include <string>
#include <vector>

namespace cli {

namespace fs = std::filesystem;

// Runs `program` (in the build's bin folder) with `arguments`, quoted for the shell as a user types them.
inline testsupport::Outcome Run(const std::string& program, const std::string& arguments)
{
    const testsupport::Command command({"/bin/sh", "-c", std::string(VELMORA_BIN_DIR) + "/" + program + " " + arguments});
    return testsupport::RunProgram(command, testsupport::ProgramScratchFile("run.out"),
                                   testsupport::ProgramScratchFile("run.err"));
}

// Six rows ten minutes apart; Level holds 1.5, 1.6, ... 2.0.
inline const std::vector<std::string> kLevels = {"1.5", "1.6", "1.7", "1.8", "1.9", "2"};

inline void WriteCsv(const std::string& path)
{
    std::string text = "Time;Level;Rain\n";
    for (size_t r = 0; r < kLevels.size(); ++r)
        text += "2021-01-01 00:" + std::to_string(r) + "0;" + kLevels[r] + ";" + std::to_string(r) + "\n";
    testsupport::WriteFile(path, text);
}

inline void WriteRbx0(const std::string& path)
{
    converter::RbxSeriesWriter writer;
    converter::SeriesHeader header;
    header.items = {{"Level", "Water level", "m", "Instantaneous"}, {"Rain", "Rainfall", "mm", "Accumulated"}};
    ASSERT_TRUE(writer.Begin(path, header, "Gauge").ok());
    for (size_t r = 0; r < kLevels.size(); ++r)
        ASSERT_TRUE(writer.Write({1609459200 + 600 * static_cast<converter::Stamp>(r), {std::stod(kLevels[r]), 1.0 * r}}).ok());
    ASSERT_TRUE(writer.Finish().ok());
}

// The exit status of `script` run by the system's Python, which has the workbook modules.
inline int Python(const std::string& script)
{
    const testsupport::ScratchFile file("velmora-cli", ".py", script);
    return testsupport::ShellStatus("/usr/bin/python3 " + testsupport::ShellQuote(file.Path()) + " >/dev/null 2>&1");
}

// A workbook made by libxlsxwriter (.xlsx) or Python's xlwt (.xls), as another program would make it.
inline void WriteWorkbook(const std::string& path)
{
    const bool xls = path.size() > 4 && path.substr(path.size() - 4) == ".xls";
    if (!xls) {
        testsupport::XlsxWorkbook book(path);
        book.Text(1, 1, "Time"), book.Text(1, 2, "Level"), book.Text(1, 3, "Rain");
        for (int r = 0; r < static_cast<int>(kLevels.size()); ++r) {
            book.DateTime(r + 2, 1, {2021, 1, 1, 0, 10 * r, 0}, "yyyy-mm-dd hh:mm");
            book.Number(r + 2, 2, std::stod(kLevels[static_cast<size_t>(r)]));
            book.Number(r + 2, 3, r);
        }
        ASSERT_TRUE(book.Close()) << path;
        return;
    }
    std::string levels;
    for (const std::string& level : kLevels)
        levels += level + ",";
    const std::string script =
        "import datetime\nimport xlwt\nlevels=[" + levels + "]\n"
        "wb=xlwt.Workbook();ws=wb.add_sheet('S1');f=xlwt.easyxf(num_format_str='yyyy-mm-dd hh:mm')\n"
        "for c,t in enumerate(['Time','Level','Rain']): ws.write(0,c,t)\n"
        "for r,v in enumerate(levels):\n"
        "  ws.write(r+1,0,datetime.datetime(2021,1,1,0,10*r),f); ws.write(r+1,1,v); ws.write(r+1,2,r)\n"
        "wb.save(" + testsupport::ShellQuote(path) + ")\n";
    ASSERT_EQ(Python(script), 0) << script;
}

inline void WriteInput(const std::string& path)
{
    const std::string extension = fs::path(path).extension().string();
    if (extension == ".rbx0")
        WriteRbx0(path);
    else if (extension == ".xls" || extension == ".xlsx")
        WriteWorkbook(path);
    else
        WriteCsv(path);
}

inline std::string Shown(double value)
{
    char text[32];
    std::snprintf(text, sizeof text, "%g", value);
    return text;
}

// The values of the output's item "Level", read by our own rbx0 reader, from the text, or by
// Python's xlrd and openpyxl.
inline std::vector<std::string> LevelsOf(const std::string& path)
{
    std::vector<std::string> levels;
    const std::string extension = fs::path(path).extension().string();
    if (extension == ".rbx0") {
        converter::RbxSeriesReader reader;
        if (!reader.Open(path).ok())
            return levels;
        size_t level = 0;
        while (level < reader.Header().items.size() && reader.Header().items[level].name != "Level")
            ++level;
        converter::Row row;
        while (reader.Next(row))
            levels.push_back(Shown(row.values.at(level)));
        return levels;
    }
    std::string text = testsupport::ReadFile(path);
    if (extension == ".xls" || extension == ".xlsx") {
        const std::string list = path + ".levels";
        Python((extension == ".xls" ? "import xlrd\ns=xlrd.open_workbook(" + testsupport::ShellQuote(path) +
                                          ").sheet_by_index(0)\nrows=[[c.value for c in s.row(r)] for r in range(s.nrows)]\n"
                                    : "import openpyxl\ns=openpyxl.load_workbook(" + testsupport::ShellQuote(path) +
                                          ").worksheets[0]\nrows=[[c.value for c in r] for r in s.iter_rows()]\n") +
               "col=[r.index(x) for r in rows for x in r if x=='Level'][0]\n"
               "vals=[r[col] for r in rows if isinstance(r[col],(int,float))]\n"
               "open(" + testsupport::ShellQuote(list) + ",'w').write('\\n'.join('%g'%v for v in vals))\n");
        text = testsupport::ReadFile(list);
        fs::remove(list);
        std::istringstream lines(text);
        for (std::string line; std::getline(lines, line);)
            levels.push_back(line);
        return levels;
    }
    // Text: item names on the second line, tab-separated, the stamp first.
    std::istringstream lines(text);
    std::string line;
    std::getline(lines, line);
    std::getline(lines, line);
    size_t column = 0, at = 0;
    for (std::istringstream names(line); std::getline(names, line, '\t'); ++at)
        if (line == "Level")
            column = at;
    while (std::getline(lines, line)) {
        std::istringstream fields(line);
        std::string field;
        for (size_t i = 0; i <= column && std::getline(fields, field, '\t'); ++i) {
        }
        levels.push_back(Shown(std::stod(field)));
    }
    return levels;
}

// Every file under `folder` with its size and content: a run that writes nothing leaves it equal.
inline std::map<std::string, std::string> Snapshot(const std::string& folder)
{
    std::map<std::string, std::string> files;
    for (const auto& entry : fs::recursive_directory_iterator(folder))
        files[entry.path().string()] = entry.is_regular_file() ? testsupport::ReadFile(entry.path().string()) : "<folder>";
    return files;
}

} // namespace cli
