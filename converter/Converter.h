#pragma once
// The conversion of one file, shared by the engine program and the bridge: choose the reader of the
// input format (through its template for ASCII and Excel), the writer of the output format, and
// stream the selected items from one to the other into a temporary file renamed when complete.
#include "platform/system/Status.h"
#include "converter/SeriesReader.h"
#include "converter/SeriesWriter.h"
#include "platform/system/FileFormat.h"
#include "platform/system/Types.h"

#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <vector>

class CSpecification;

namespace converter {

// The template of an ASCII or Excel input: loaded from `path`, or a new template's defaults when
// `path` is empty; null with `status` set when the file cannot be loaded. Null for rbx0.
std::unique_ptr<CSpecification> LoadTemplate(sys::FileFormat format, const std::string& path, sys::Status& status);

// A reader of `format`; its template (ASCII and Excel) must outlive it.
std::unique_ptr<SeriesReader> MakeReader(sys::FileFormat format, const CSpecification* spec);
// The writer of `format`; Excel output whose name ends in ".xls" gets an .xls workbook, any
// other an .xlsx package. (Names, numbers and extensions of the formats: sys::kFileFormats.)
std::unique_ptr<SeriesWriter> MakeWriter(sys::FileFormat format, const std::string& output);

// Why the item selection `items` (positions from 0, in output order) cannot be taken from a file
// of `count` items: an item named twice or one beyond the file's. Empty when it can.
std::string SelectionProblem(const CUIntArray& items, size_t count);

// Ok when the engine would convert `file` with this template: its extension suits the format and
// the reader accepts its header and its first data row; else the problem that stops it.
sys::Status CanConvert(sys::FileFormat format, const std::string& file, const std::string& templatePath);

struct FileJob {
    sys::FileFormat inputFormat = sys::FileFormat::Ascii;
    std::string input;
    const CSpecification* spec = nullptr; // the template, for ASCII and Excel input
    CUIntArray items;                     // item positions from 0; empty converts all
    sys::FileFormat outputFormat = sys::FileFormat::Rbx0;
    std::string output;
    std::string title;
};

struct FileReport {
    std::string input;
    std::string output;
    bool converted = false;
    bool templateFits = true;     // false when the reader refused the file before any row
    std::uint64_t rows = 0;
    size_t itemsInFile = 0;
    size_t itemsWritten = 0;
    std::string firstStamp, lastStamp;
    std::vector<std::string> notes; // things the log should mention on a converted file
    sys::Problem problem;                // why not, when not converted
};

// Called now and then while a file converts: rows so far and input bytes consumed.
using ProgressFn = std::function<void(std::uint64_t rows, std::uint64_t bytes)>;

// Converts one file; never throws. The output exists afterwards only when `converted` is true.
FileReport ConvertFile(const FileJob& job, const ProgressFn& progress = {});

} // namespace converter
