#pragma once
// What the command-line tests share: a scratch folder, running the built programs, inputs of every
// format (workbooks written by Python's own writers) and the values read back from any output.
#include "converter/RbxSeriesReader.h"
#include "converter/RbxSeriesWriter.h"

#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <map>
#include <sstream>
#include <string>
#include <vector>

#include <sys/wait.h>
#include <unistd.h>

namespace cli {

namespace fs = std::filesystem;

class Scratch {
public:
    Scratch()
    {
        static int counter = 0;
        m_root = fs::temp_directory_path() / ("velmora-cli-" + std::to_string(::getpid()) + "-" + std::to_string(counter++));
        fs::remove_all(m_root);
        fs::create_directories(m_root);
    }
    ~Scratch() { fs::remove_all(m_root); }
    Scratch(const Scratch&) = delete;
    Scratch& operator=(const Scratch&) = delete;
    std::string operator/(const std::string& name) const { return (m_root / name).string(); }
    std::string Folder(const std::string& name) const
    {
        fs::create_directories(m_root / name);
        return (m_root / name).string();
    }

private:
    fs::path m_root;
};

inline std::string ReadFile(const std::string& path)
{
    std::ifstream in(path, std::ios::binary);
    std::stringstream s;
    s << in.rdbuf();
    return s.str();
}

inline void WriteFile(const std::string& path, const std::string& content)
{
    std::ofstream(path, std::ios::binary) << content;
}

struct Outcome {
    int status = -1;
    std::string out, err;
};

// Runs `program` (in the build's bin folder) with `arguments` (already quoted for the shell).
inline Outcome Run(const std::string& program, const std::string& arguments)
{
    static int counter = 0;
    const std::string base = (fs::temp_directory_path() / ("velmora-cli-out-" + std::to_string(::getpid()) + "-" +
                                                           std::to_string(counter++)))
                                 .string();
    const std::string command = std::string(VELMORA_BIN_DIR) + "/" + program + " " + arguments + " >" + base +
                                ".out 2>" + base + ".err";
    const int raw = std::system(command.c_str());
    Outcome outcome;
    outcome.status = WIFEXITED(raw) ? WEXITSTATUS(raw) : -1;
    outcome.out = ReadFile(base + ".out");
    outcome.err = ReadFile(base + ".err");
    fs::remove(base + ".out");
    fs::remove(base + ".err");
    return outcome;
}

inline std::string Quote(const std::string& text)
{
    std::string quoted = "'";
    for (char c : text)
        quoted += c == '\'' ? std::string("'\\''") : std::string(1, c);
    return quoted + "'";
}

// Six rows ten minutes apart; Level holds 1.5, 1.6, ... 2.0.
inline const std::vector<std::string> kLevels = {"1.5", "1.6", "1.7", "1.8", "1.9", "2"};

inline void WriteCsv(const std::string& path)
{
    std::string text = "Time;Level;Rain\n";
    for (size_t r = 0; r < kLevels.size(); ++r)
        text += "2021-01-01 00:" + std::to_string(r) + "0;" + kLevels[r] + ";" + std::to_string(r) + "\n";
    WriteFile(path, text);
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

inline int Python(const std::string& script)
{
    const std::string file = (fs::temp_directory_path() / ("velmora-cli-" + std::to_string(::getpid()) + ".py")).string();
    WriteFile(file, script);
    const int status = std::system(("/usr/bin/python3 " + file + " >/dev/null 2>&1").c_str());
    fs::remove(file);
    return status;
}

// A workbook made by xlsxwriter (.xlsx) or xlwt (.xls), as another program would make it.
inline void WriteWorkbook(const std::string& path)
{
    std::string levels;
    for (const std::string& level : kLevels)
        levels += level + ",";
    const bool xls = path.size() > 4 && path.substr(path.size() - 4) == ".xls";
    const std::string script =
        std::string("import datetime\nlevels=[") + levels + "]\n" +
        (xls ? "import xlwt\nwb=xlwt.Workbook();ws=wb.add_sheet('S1');f=xlwt.easyxf(num_format_str='yyyy-mm-dd hh:mm')\n"
               "put=lambda r,c,v,fm=None: ws.write(r,c,v,fm) if fm else ws.write(r,c,v)\n"
             : "import xlsxwriter\nwb=xlsxwriter.Workbook(" + Quote(path) + ");ws=wb.add_worksheet();"
               "f=wb.add_format({'num_format':'yyyy-mm-dd hh:mm'})\n"
               "put=lambda r,c,v,fm=None: ws.write_datetime(r,c,v,fm) if fm else ws.write(r,c,v)\n") +
        "for c,t in enumerate(['Time','Level','Rain']): put(0,c,t)\n"
        "for r,v in enumerate(levels):\n"
        "  put(r+1,0,datetime.datetime(2021,1,1,0,10*r),f); put(r+1,1,v); put(r+1,2,r)\n" +
        (xls ? "wb.save(" + Quote(path) + ")\n" : "wb.close()\n");
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
    std::string text = ReadFile(path);
    if (extension == ".xls" || extension == ".xlsx") {
        const std::string list = path + ".levels";
        Python((extension == ".xls" ? "import xlrd\ns=xlrd.open_workbook(" + Quote(path) +
                                          ").sheet_by_index(0)\nrows=[[c.value for c in s.row(r)] for r in range(s.nrows)]\n"
                                    : "import openpyxl\ns=openpyxl.load_workbook(" + Quote(path) +
                                          ").worksheets[0]\nrows=[[c.value for c in r] for r in s.iter_rows()]\n") +
               "col=[r.index(x) for r in rows for x in r if x=='Level'][0]\n"
               "vals=[r[col] for r in rows if isinstance(r[col],(int,float))]\n"
               "open(" + Quote(list) + ",'w').write('\\n'.join('%g'%v for v in vals))\n");
        text = ReadFile(list);
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
        files[entry.path().string()] = entry.is_regular_file() ? ReadFile(entry.path().string()) : "<folder>";
    return files;
}

} // namespace cli
