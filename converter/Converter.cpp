#include "converter/Converter.h"

#include "converter/AsciiSeriesReader.h"
#include "converter/AsciiSeriesWriter.h"
#include "converter/ExcelSeriesReader.h"
#include "converter/OutputFile.h"
#include "converter/RbxSeriesReader.h"
#include "converter/RbxSeriesWriter.h"
#include "converter/StampText.h"
#include "converter/XlsSeriesWriter.h"
#include "converter/XlsxSeriesWriter.h"
#include "platform/system/FileSystem.h"
#include "platform/system/Text.h"
#include "templates/AsciiSpecification.h"
#include "templates/ExcelSpecification.h"

#include <cstdio>
#include <exception>
#include <unordered_map>

namespace converter {

namespace {

constexpr std::uint64_t kProgressEvery = 1u << 16;

FileReport Refuse(FileReport report, sys::Status status, bool templateFits)
{
    report.converted = false;
    report.templateFits = templateFits;
    report.problem = status.problem();
    return report;
}

} // namespace

std::unique_ptr<CSpecification> LoadTemplate(sys::FileFormat format, const std::string& path, sys::Status& status)
{
    std::unique_ptr<CSpecification> spec;
    if (format == sys::FileFormat::Ascii)
        spec = std::make_unique<CAsciiSpecification>();
    else if (format == sys::FileFormat::Excel)
        spec = std::make_unique<CExcelSpecification>();
    else
        return nullptr;
    if (!path.empty() && !spec->Load(path)) {
        const std::string why = spec->LastError().empty() ? "it is not a template file" : spec->LastError();
        status = sys::Status::Fail(path, 0, "cannot load the template: " + why);
        return nullptr;
    }
    status = sys::Status::Ok();
    return spec;
}

std::unique_ptr<SeriesReader> MakeReader(sys::FileFormat format, const CSpecification* spec)
{
    switch (format) {
    case sys::FileFormat::Rbx0: return std::make_unique<RbxSeriesReader>();
    case sys::FileFormat::Ascii: return spec ? std::make_unique<AsciiSeriesReader>(*spec) : nullptr;
    case sys::FileFormat::Excel: return spec ? std::make_unique<ExcelSeriesReader>(*spec) : nullptr;
    }
    return nullptr;
}

std::unique_ptr<SeriesWriter> MakeWriter(sys::FileFormat format, const std::string& output)
{
    switch (format) {
    case sys::FileFormat::Rbx0: return std::make_unique<RbxSeriesWriter>();
    case sys::FileFormat::Ascii: return std::make_unique<AsciiSeriesWriter>();
    case sys::FileFormat::Excel:
        if (text::EqualsNoCase(sys::FileExtension(output), ".xls"))
            return std::make_unique<XlsSeriesWriter>();
        return std::make_unique<XlsxSeriesWriter>();
    }
    return nullptr;
}

std::string SelectionProblem(const CUIntArray& items, size_t count)
{
    std::unordered_map<unsigned, size_t> firstEntry;
    for (size_t entry = 1; entry <= items.size(); ++entry) {
        const unsigned item = items[entry - 1];
        if (item >= count)
            return "Items entry " + std::to_string(entry) + " names item " + std::to_string(item) + ", but the file has " +
                   std::to_string(count) + " items (numbered from 0)";
        if (auto [seen, fresh] = firstEntry.emplace(item, entry); !fresh)
            return "Items names item " + std::to_string(item) + " twice (entries " + std::to_string(seen->second) +
                   " and " + std::to_string(entry) + ")";
    }
    return {};
}

sys::Status CanConvert(sys::FileFormat format, const std::string& file, const std::string& templatePath)
{
    try {
        if (!sys::IsRegularFile(file))
            return sys::Status::Fail(file, 0, "no such file");
        if (!sys::IsInputOf(format, file))
            return sys::Status::Fail(file, 0, std::string("the extension does not suit ") + sys::FormatInfo(format).name + " input");
        sys::Status status;
        std::unique_ptr<CSpecification> spec = LoadTemplate(format, templatePath, status);
        if (!status)
            return status;
        std::unique_ptr<SeriesReader> reader = MakeReader(format, spec.get());
        if (!reader)
            return sys::Status::Fail({}, 0, std::string(sys::FormatInfo(format).name) + " input cannot be read by this build");
        if (sys::Status opened = reader->Open(file); !opened)
            return opened;
        Row row;
        if (!reader->Next(row) && !reader->status())
            return reader->status();
        return sys::Status::Ok();
    } catch (const std::exception& e) {
        return sys::Status::Fail(file, 0, e.what());
    }
}

namespace {

// The selected item positions, all of the file's when none is selected; empty with `problem` set
// when the selection names an item twice or one the file does not have.
std::vector<size_t> ResolveSelection(const CUIntArray& items, size_t count, std::string& problem)
{
    std::vector<size_t> selection;
    if (items.empty()) {
        for (size_t i = 0; i < count; ++i)
            selection.push_back(i);
        return selection;
    }
    problem = SelectionProblem(items, count);
    if (problem.empty())
        selection.assign(items.begin(), items.end());
    return selection;
}

FileReport Convert(const FileJob& job, const ProgressFn& progress)
{
    FileReport report;
    report.input = job.input;
    report.output = job.output;
    std::unique_ptr<SeriesReader> reader = MakeReader(job.inputFormat, job.spec);
    if (!reader)
        return Refuse(report, sys::Status::Fail(job.input, 0, std::string(sys::FormatInfo(job.inputFormat).name) + " input needs a template"), false);
    // Only a template can fail to fit; an rbx0 file that cannot be opened is damaged.
    const bool throughTemplate = job.inputFormat != sys::FileFormat::Rbx0;
    if (sys::Status opened = reader->Open(job.input); !opened)
        return Refuse(report, opened, !throughTemplate);
    report.itemsInFile = reader->Header().items.size();
    std::string selectionProblem;
    const std::vector<size_t> selection = ResolveSelection(job.items, report.itemsInFile, selectionProblem);
    if (!selectionProblem.empty())
        return Refuse(report, sys::Status::Fail(job.input, 0, selectionProblem), true);
    if (selection.empty())
        return Refuse(report, sys::Status::Fail(job.input, 0, "the file has no items"), false);
    reader->Select(selection);
    SeriesHeader header;
    header.timeTitle = reader->Header().timeTitle;
    for (size_t item : selection)
        header.items.push_back(reader->Header().items[item]);
    report.itemsWritten = header.items.size();

    OutputFile output(job.output);
    if (sys::Status created = output.Create(); !created)
        return Refuse(report, created, true);
    std::unique_ptr<SeriesWriter> writer = MakeWriter(job.outputFormat, job.output);
    if (sys::Status begun = writer->Begin(output.WriterPath(), header, job.title); !begun)
        return Refuse(report, sys::Status::Fail(job.output, 0, begun.problem().message), true);

    Row row;
    while (reader->Next(row)) {
        if (report.rows == 0)
            report.firstStamp = FormatStamp(row.stamp);
        if (sys::Status written = writer->Write(row); !written)
            return Refuse(report,
                          sys::Status::Fail(job.input, reader->Location(), "cannot write " + job.output + ": " + written.problem().message),
                          true);
        ++report.rows;
        if (progress && report.rows % kProgressEvery == 0)
            progress(report.rows, reader->BytesConsumed());
    }
    report.notes.insert(report.notes.end(), reader->Notes().begin(), reader->Notes().end());
    if (!reader->status())
        return Refuse(report, reader->status(), report.rows > 0 || !throughTemplate);
    if (report.rows > 0)
        report.lastStamp = FormatStamp(row.stamp);
    if (sys::Status finished = writer->Finish(); !finished)
        return Refuse(report, sys::Status::Fail(job.output, 0, finished.problem().message), true);
    writer.reset();
    if (sys::Status committed = output.Commit(); !committed)
        return Refuse(report, committed, true);
    report.converted = true;
    return report;
}

} // namespace

FileReport ConvertFile(const FileJob& job, const ProgressFn& progress)
{
    try {
        return Convert(job, progress);
    } catch (const std::exception& e) {
        FileReport report;
        report.input = job.input;
        report.output = job.output;
        report.problem = sys::Problem{job.input, 0, 0, std::string("conversion stopped: ") + e.what()};
        return report;
    }
}

} // namespace converter
