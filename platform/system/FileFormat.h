#pragma once
// The three file formats of a setup, in one table: the setup's number, the name the log and the
// commands use, the bridge component's name, the extensions of input files and the text test for a
// text file without one, the extension of outputs. Readers and writers are chosen by the format:
// the engine's in converter/Converter.cpp (MakeReader, MakeWriter), the preview's in
// parsers/ParserFactory.cpp (MakeSpecification, MakeParser).
#include <array>
#include <string>
#include <string_view>

namespace sys {

// The numbers are the setup's ("File_format").
enum class FileFormat : int { Rbx0 = 1, Ascii = 2, Excel = 3 };

constexpr int Number(FileFormat format) { return static_cast<int>(format); }

struct FileFormatInfo {
    FileFormat format;
    const char* name;       // "rbx0", "ASCII", "Excel"; a command line names it in any letter case
    const char* bridgeName; // the bridge component's name of its reader
    const char* outputExtension;
    std::array<const char*, 3> inputExtensions; // letter case does not matter; null past the last
    bool textWithoutExtension;                  // a text file without extension is one too
};

inline constexpr FileFormatInfo kFileFormats[] = {
    {FileFormat::Rbx0, "rbx0", "rbx Timeseries Bridge", ".rbx0", {".rbx0", nullptr, nullptr}, false},
    {FileFormat::Ascii, "ASCII", "ASCII Timeseries Bridge (General)", ".txt", {".txt", ".tab", ".csv"}, true},
    {FileFormat::Excel, "Excel", "Excel Timeseries Bridge", ".xlsx", {".xls", ".xlsx", nullptr}, false},
};

const FileFormatInfo& FormatInfo(FileFormat format);
// The format of a setup's number; null for a number that names none.
const FileFormatInfo* FindFormat(int number);
// The format of a name ("rbx0", "ascii", "excel", any letter case); null for another name.
const FileFormatInfo* FindFormatNamed(std::string_view name);
// The format a bridge name selects (exactly as written); null for another name.
const FileFormatInfo* FindFormatOfBridge(std::string_view bridgeName);

// True when the extension of `path` is one of the format's input extensions.
bool HasInputExtension(FileFormat format, const std::string& path);
// The text test for a file without extension: a regular file, not empty, without a zero byte in
// its first 40,960 bytes.
bool LooksLikeText(const std::string& path);
// True when `path` is an input file of the format by its name: its extension, or the text test
// for a file without one where the format takes those.
bool IsInputOf(FileFormat format, const std::string& path);

} // namespace sys
