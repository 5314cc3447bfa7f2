// Reading the sheet of a large .xlsx with our own package reader and XML scanner, against libzip
// (zip_fread streaming) with expat doing the same work: the same limit checks on the zip directory,
// the same cell extraction (CellBuilder: cell reference, type, value text, shared strings) into
// the same sink. The unpacking and the XML reading are also measured apart: unpacking the sheet
// part in 64 KiB chunks, and reading the unpacked sheet from memory in 64 KiB chunks.
// Run: build/bin/xlsx_library_bench --benchmark_repetitions=5 --benchmark_report_aggregates_only=true
#include "formats/workbook/WorkbookImport.h"
#include "formats/xlsx/XlsxPartReaders.h"
#include "formats/xlsx/XmlScanner.h"
#include "formats/xlsx/ZipReader.h"

#include <benchmark/benchmark.h>
#include <expat.h>
#include <xlsxwriter.h>
#include <zip.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <exception>
#include <fstream>
#include <memory>
#include <stdexcept>
#include <string>
#include <string_view>
#include <unistd.h>

namespace {

constexpr long kRows = 400000;
constexpr int kNumberColumns = 5;
constexpr std::size_t kChunk = 64 * 1024;
constexpr const char* kSheetPart = "xl/worksheets/sheet1.xml";
constexpr const char* kStringsPart = "xl/sharedStrings.xml";

// A date column, five number columns and a column of shared strings (a few labels repeated).
class Workbook {
public:
    Workbook() : m_path("/tmp/velmora-xlsx-library-bench-" + std::to_string(::getpid()) + ".xlsx")
    {
        lxw_workbook* book = workbook_new(m_path.c_str());
        lxw_worksheet* sheet = workbook_add_worksheet(book, "Data");
        lxw_format* date = workbook_add_format(book);
        format_set_num_format(date, "yyyy/mm/dd hh:mm");
        lxw_format* fixed = workbook_add_format(book);
        format_set_num_format(fixed, "0.00");
        const char* labels[] = {"north", "south", "east", "west", "calibration", "idle", "ramp", "hold"};
        for (long r = 0; r < kRows; ++r) {
            const auto row = static_cast<lxw_row_t>(r);
            worksheet_write_number(sheet, row, 0, 44333 + r / 144.0, date);
            for (int c = 1; c <= kNumberColumns; ++c)
                worksheet_write_number(sheet, row, static_cast<lxw_col_t>(c), (r % 1000) * 0.25 + c, fixed);
            worksheet_write_string(sheet, row, kNumberColumns + 1, labels[r % 8], nullptr);
        }
        workbook_close(book);
    }
    ~Workbook() { std::remove(m_path.c_str()); }
    const std::string& Path() const { return m_path; }

private:
    std::string m_path;
};

const std::string& WorkbookPath()
{
    static const Workbook workbook;
    return workbook.Path();
}

// Adds up what arrives, so no cell's work can be left out.
class TallySink : public sheet::ImportSink {
public:
    bool AddSheet(const std::string&) override { return true; }
    bool AddCell(int, const sheet::ImportedCell& cell) override
    {
        ++cells;
        sum += cell.number + static_cast<double>(cell.text.size());
        return true;
    }
    bool EndSheet(int) override { return true; }
    void Reset() { cells = 0, sum = 0; }
    long cells = 0;
    double sum = 0;
};

void Report(benchmark::State& state, const TallySink& sink)
{
    if (sink.cells != kRows * (kNumberColumns + 2))
        state.SkipWithError(("read " + std::to_string(sink.cells) + " cells").c_str());
    state.counters["cells"] = static_cast<double>(sink.cells);
    state.counters["value_sum"] = sink.sum; // equal for every reader that reads the same cells
    benchmark::DoNotOptimize(sink.sum);
}

// ---- ours --------------------------------------------------------------------------------------

sheet::XmlScanner ScannerOf(sheet::ZipReader::PartStream& part, const std::string& name)
{
    return sheet::XmlScanner([&part](char* out, std::size_t capacity) { return part.Read(out, capacity); }, name);
}

void ReadWithOurs(TallySink& sink)
{
    const sheet::ImportLimits limits;
    sheet::ZipReader package(WorkbookPath(), limits);
    sheet::xlsx::SharedStrings strings;
    {
        auto part = package.Open(*package.Find(kStringsPart));
        sheet::XmlScanner xml = ScannerOf(*part, kStringsPart);
        sheet::xlsx::ReadSharedStrings(xml, strings);
    }
    const sheet::xlsx::CellStyles styles;
    auto part = package.Open(*package.Find(kSheetPart));
    sheet::XmlScanner xml = ScannerOf(*part, kSheetPart);
    sheet::xlsx::ReadSheetCells(xml, {strings, styles, false, limits}, 0, sink);
}

// ---- libzip + expat ----------------------------------------------------------------------------

class LibzipPackage {
public:
    LibzipPackage(const std::string& path, const sheet::ImportLimits& limits) : m_path(path)
    {
        int error = 0;
        m_zip = zip_open(path.c_str(), ZIP_RDONLY | ZIP_CHECKCONS, &error);
        if (m_zip == nullptr) {
            zip_error_t why;
            zip_error_init_with_code(&why, error);
            const std::string text = zip_error_strerror(&why);
            zip_error_fini(&why);
            throw sheet::OpenError(path, "the zip package is damaged (" + text + ").");
        }
        CheckSizes(limits);
    }
    ~LibzipPackage() { zip_discard(m_zip); }
    LibzipPackage(const LibzipPackage&) = delete;
    LibzipPackage& operator=(const LibzipPackage&) = delete;

    // Gives the part to `consume` in chunks of up to 64 KiB; the CRC is checked at its end.
    template <typename Consume>
    void Stream(const char* name, Consume&& consume)
    {
        const zip_int64_t index = zip_name_locate(m_zip, name, ZIP_FL_ENC_RAW);
        zip_file_t* file = index < 0 ? nullptr : zip_fopen_index(m_zip, static_cast<zip_uint64_t>(index), 0);
        if (file == nullptr)
            throw sheet::OpenError(m_path, std::string("the part ") + name + " cannot be opened.");
        std::unique_ptr<zip_file_t, int (*)(zip_file_t*)> closer(file, zip_fclose);
        char buffer[kChunk];
        for (;;) {
            const zip_int64_t got = zip_fread(file, buffer, sizeof buffer);
            if (got < 0)
                throw sheet::OpenError(m_path, std::string("the zip package is damaged (the part ") + name + " " +
                                                   zip_error_strerror(zip_file_get_error(file)) + ").");
            consume(buffer, static_cast<std::size_t>(got), got == 0);
            if (got == 0)
                return;
        }
    }

private:
    // The zip-bomb bounds, from the directory before anything is unpacked.
    void CheckSizes(const sheet::ImportLimits& limits)
    {
        std::uint64_t total = 0;
        const zip_int64_t count = zip_get_num_entries(m_zip, 0);
        for (zip_int64_t i = 0; i < count; ++i) {
            zip_stat_t stat;
            if (zip_stat_index(m_zip, static_cast<zip_uint64_t>(i), 0, &stat) != 0)
                throw sheet::OpenError(m_path, "the zip package is damaged (bad directory entry).");
            if (stat.size > limits.maxEntryBytes ||
                (stat.size > (16u << 20) && stat.size > stat.comp_size * limits.maxCompressionRatio))
                throw sheet::OpenError(m_path, std::string("the part ") + stat.name + " would unpack to too much.");
            total += stat.size;
            if (total > limits.maxUncompressedBytes)
                throw sheet::OpenError(m_path, "the package would unpack to too much.");
        }
    }

    std::string m_path;
    zip_t* m_zip = nullptr;
};

std::string_view LocalName(const XML_Char* name)
{
    const char* colon = std::strrchr(name, ':');
    return colon != nullptr ? colon + 1 : name;
}

// The value of the attribute of that local name; namespace declarations do not count.
const char* Attribute(const XML_Char** attributes, std::string_view name)
{
    for (; *attributes != nullptr; attributes += 2)
        if (std::strncmp(*attributes, "xmlns", 5) != 0 && LocalName(*attributes) == name)
            return attributes[1];
    return nullptr;
}

// An expat parser feeding handlers of a derived reader. A failure in a handler stops the parser
// and is thrown again once expat has returned.
class ExpatPart {
public:
    explicit ExpatPart(std::string part) : m_part(std::move(part)), m_parser(XML_ParserCreate(nullptr))
    {
        XML_SetUserData(m_parser, this);
        XML_SetElementHandler(m_parser, &ExpatPart::OnStart, &ExpatPart::OnEnd);
        XML_SetCharacterDataHandler(m_parser, &ExpatPart::OnText);
        XML_SetEntityDeclHandler(m_parser, &ExpatPart::OnEntityDeclaration);
        XML_SetParamEntityParsing(m_parser, XML_PARAM_ENTITY_PARSING_NEVER);
    }
    virtual ~ExpatPart() { XML_ParserFree(m_parser); }
    ExpatPart(const ExpatPart&) = delete;
    ExpatPart& operator=(const ExpatPart&) = delete;

    // False when the reading was stopped by the sink.
    bool Feed(const char* bytes, std::size_t count, bool last)
    {
        if (m_stopped)
            return false;
        const XML_Status status = XML_Parse(m_parser, bytes, static_cast<int>(count), last ? 1 : 0);
        if (m_failure)
            std::rethrow_exception(m_failure);
        if (status == XML_STATUS_ERROR && !m_stopped)
            Fail(std::string("the XML is damaged (") + XML_ErrorString(XML_GetErrorCode(m_parser)) + ")", Offset());
        return !m_stopped;
    }

protected:
    virtual void Start(std::string_view name, const XML_Char** attributes) = 0;
    virtual void End(std::string_view name) = 0;
    virtual void Text(std::string_view text) = 0;

    void Stop()
    {
        m_stopped = true;
        XML_StopParser(m_parser, XML_FALSE);
    }
    std::uint64_t Offset() const { return static_cast<std::uint64_t>(XML_GetCurrentByteIndex(m_parser)); }
    std::size_t Depth() const { return m_depth; }
    const std::string& Part() const { return m_part; }
    [[noreturn]] void Fail(const std::string& why, std::uint64_t offset) const
    {
        throw sheet::XmlScanner::Error(m_part + ", byte " + std::to_string(offset) + ": " + why);
    }

private:
    template <typename Handler>
    static void Guarded(void* self, Handler&& handler)
    {
        auto* part = static_cast<ExpatPart*>(self);
        if (part->m_failure)
            return;
        try {
            handler(*part);
        } catch (...) {
            part->m_failure = std::current_exception();
            XML_StopParser(part->m_parser, XML_FALSE);
        }
    }
    static void XMLCALL OnStart(void* self, const XML_Char* name, const XML_Char** attributes)
    {
        Guarded(self, [&](ExpatPart& part) {
            if (++part.m_depth > sheet::XmlScanner::kMaxDepth)
                part.Fail("the XML is damaged (elements nested too deep)", part.Offset());
            part.Start(LocalName(name), attributes);
        });
    }
    static void XMLCALL OnEnd(void* self, const XML_Char* name)
    {
        Guarded(self, [&](ExpatPart& part) {
            part.End(LocalName(name));
            --part.m_depth;
        });
    }
    static void XMLCALL OnText(void* self, const XML_Char* text, int length)
    {
        Guarded(self, [&](ExpatPart& part) { part.Text(std::string_view(text, static_cast<std::size_t>(length))); });
    }
    static void XMLCALL OnEntityDeclaration(void* self, const XML_Char*, int, const XML_Char*, int, const XML_Char*,
                                            const XML_Char*, const XML_Char*, const XML_Char*)
    {
        Guarded(self, [](ExpatPart& part) { part.Fail("the XML declares entities, which are not read", part.Offset()); });
    }

    std::string m_part;
    XML_Parser m_parser;
    std::size_t m_depth = 0;
    bool m_stopped = false;
    std::exception_ptr m_failure;
};

// The texts of <t> inside a rich-text element (a shared string, an inline string); phonetic runs
// and elements inside a <t> are passed over.
class RichText {
public:
    void Begin(std::size_t depth, std::string* to)
    {
        m_depth = depth;
        m_to = to;
    }
    bool Active() const { return m_depth != 0; }
    void Start(std::string_view name, std::size_t depth)
    {
        if (m_skipDepth != 0 || m_textDepth != 0)
            m_skipDepth = m_skipDepth != 0 ? m_skipDepth : depth;
        else if (name == "t")
            m_textDepth = depth;
        else if (name == "rPh")
            m_skipDepth = depth;
    }
    void End(std::size_t depth)
    {
        if (depth == m_skipDepth)
            m_skipDepth = 0;
        else if (depth == m_textDepth)
            m_textDepth = 0;
        else if (depth == m_depth)
            m_depth = 0;
    }
    bool Text(std::string_view text)
    {
        if (m_textDepth == 0 || m_skipDepth != 0)
            return true;
        m_to->append(text);
        return m_to->size() <= sheet::XmlScanner::kMaxTokenBytes;
    }

private:
    std::size_t m_depth = 0;
    std::size_t m_textDepth = 0;
    std::size_t m_skipDepth = 0;
    std::string* m_to = nullptr;
};

class ExpatSharedStrings : public ExpatPart {
public:
    explicit ExpatSharedStrings(sheet::xlsx::SharedStrings& strings) : ExpatPart(kStringsPart), m_strings(strings) {}

private:
    void Start(std::string_view name, const XML_Char**) override
    {
        if (m_rich.Active()) {
            m_rich.Start(name, Depth());
        } else if (name == "si") {
            m_text.clear();
            m_rich.Begin(Depth(), &m_text);
        }
    }
    void End(std::string_view) override
    {
        const bool wasActive = m_rich.Active();
        m_rich.End(Depth());
        if (wasActive && !m_rich.Active())
            m_strings.Add(m_text);
    }
    void Text(std::string_view text) override
    {
        if (!m_rich.Text(text))
            Fail("a text longer than " + std::to_string(sheet::XmlScanner::kMaxTokenBytes) + " bytes", Offset());
    }

    sheet::xlsx::SharedStrings& m_strings;
    RichText m_rich;
    std::string m_text;
};

class ExpatSheet : public ExpatPart {
public:
    ExpatSheet(const sheet::xlsx::SheetContext& context, int index, sheet::ImportSink& sink)
        : ExpatPart(kSheetPart), m_builder(context, kSheetPart), m_index(index), m_sink(sink) {}

private:
    void Start(std::string_view name, const XML_Char** attributes) override
    {
        const std::size_t depth = Depth();
        if (m_cellDepth != 0)
            StartInCell(name, depth);
        else if (depth == 2)
            m_inSheetData = name == "sheetData";
        else if (m_inSheetData && name == "row")
            StartRow(attributes);
        else if (m_inSheetData && name == "c")
            StartCell(attributes, depth);
    }

    void StartRow(const XML_Char** attributes)
    {
        const char* number = Attribute(attributes, "r");
        m_builder.StartRow(number != nullptr ? std::optional<std::string_view>(number) : std::nullopt, Offset());
    }

    void StartCell(const XML_Char** attributes, std::size_t depth)
    {
        m_cellDepth = depth;
        const char* reference = Attribute(attributes, "r");
        const char* type = Attribute(attributes, "t");
        const char* style = Attribute(attributes, "s");
        m_raw.offset = Offset();
        m_raw.reference.assign(reference != nullptr ? reference : "");
        m_raw.type.assign(type != nullptr ? type : "n");
        m_raw.style = style != nullptr ? static_cast<unsigned>(std::strtoul(style, nullptr, 10)) : 0;
        m_raw.hasValue = m_raw.hasInline = m_raw.hasFormula = false;
        m_raw.value.clear();
        m_raw.inlineText.clear();
    }

    void StartInCell(std::string_view name, std::size_t depth)
    {
        if (m_skipDepth != 0 || m_valueDepth != 0) {
            m_skipDepth = m_skipDepth != 0 ? m_skipDepth : depth;
        } else if (m_rich.Active()) {
            m_rich.Start(name, depth);
        } else if (name == "v") {
            m_raw.hasValue = true;
            m_valueDepth = depth;
        } else if (name == "is") {
            m_raw.hasInline = true;
            m_rich.Begin(depth, &m_raw.inlineText);
        } else {
            m_raw.hasFormula = m_raw.hasFormula || name == "f";
            m_skipDepth = depth;
        }
    }

    void End(std::string_view) override
    {
        const std::size_t depth = Depth();
        if (depth == m_skipDepth) {
            m_skipDepth = 0;
        } else if (depth == m_valueDepth) {
            m_valueDepth = 0;
        } else if (m_rich.Active()) {
            m_rich.End(depth);
        } else if (depth == m_cellDepth) {
            m_cellDepth = 0;
            if (const sheet::ImportedCell* cell = m_builder.Build(m_raw); cell != nullptr && !m_sink.AddCell(m_index, *cell))
                Stop();
        } else if (depth == 2) {
            m_inSheetData = false;
        }
    }

    void Text(std::string_view text) override
    {
        if (m_skipDepth != 0)
            return;
        if (m_valueDepth != 0)
            m_raw.value.append(text);
        else if (!m_rich.Text(text))
            Fail("a text longer than " + std::to_string(sheet::XmlScanner::kMaxTokenBytes) + " bytes", Offset());
        if (m_raw.value.size() > sheet::XmlScanner::kMaxTokenBytes)
            Fail("a text longer than " + std::to_string(sheet::XmlScanner::kMaxTokenBytes) + " bytes", Offset());
    }

    sheet::xlsx::CellBuilder m_builder;
    int m_index;
    sheet::ImportSink& m_sink;
    bool m_inSheetData = false;
    std::size_t m_cellDepth = 0;
    std::size_t m_valueDepth = 0;
    std::size_t m_skipDepth = 0;
    RichText m_rich;
    sheet::xlsx::RawCell m_raw;
};

void ReadWithLibraries(TallySink& sink)
{
    const sheet::ImportLimits limits;
    LibzipPackage package(WorkbookPath(), limits);
    sheet::xlsx::SharedStrings strings;
    {
        ExpatSharedStrings reader(strings);
        package.Stream(kStringsPart, [&](const char* bytes, std::size_t count, bool last) { reader.Feed(bytes, count, last); });
    }
    const sheet::xlsx::CellStyles styles;
    ExpatSheet reader({strings, styles, false, limits}, 0, sink);
    package.Stream(kSheetPart, [&](const char* bytes, std::size_t count, bool last) { reader.Feed(bytes, count, last); });
}

// ---- the unpacked sheet, for the XML alone -----------------------------------------------------

const std::string& UnpackedSheet()
{
    static const std::string sheetText = [] {
        sheet::ZipReader package(WorkbookPath(), sheet::ImportLimits());
        return package.ReadAll(*package.Find(kSheetPart));
    }();
    return sheetText;
}

const sheet::xlsx::SharedStrings& Strings()
{
    static const sheet::xlsx::SharedStrings strings = [] {
        sheet::ZipReader package(WorkbookPath(), sheet::ImportLimits());
        auto part = package.Open(*package.Find(kStringsPart));
        sheet::XmlScanner xml = ScannerOf(*part, kStringsPart);
        sheet::xlsx::SharedStrings read;
        sheet::xlsx::ReadSharedStrings(xml, read);
        return read;
    }();
    return strings;
}

// ---- benchmarks --------------------------------------------------------------------------------

// Reads the workbook into a sink with `read` for each iteration.
template <typename Read>
void ReadWhole(benchmark::State& state, Read read)
{
    WorkbookPath(); // made before the timing starts
    TallySink sink;
    for (auto _ : state) {
        sink.Reset();
        read(sink);
    }
    Report(state, sink);
}

void BM_WorkbookImport(benchmark::State& state)
{
    ReadWhole(state, [&](TallySink& sink) {
        sheet::StyleTable styles;
        if (!sheet::ImportWorkbook(WorkbookPath(), sink, styles).ok())
            state.SkipWithError("the workbook did not read");
    });
}

void BM_SheetOurs(benchmark::State& state) { ReadWhole(state, ReadWithOurs); }
void BM_SheetLibzipExpat(benchmark::State& state) { ReadWhole(state, ReadWithLibraries); }

void BM_UnpackOurs(benchmark::State& state)
{
    WorkbookPath(); // made before the timing starts
    std::uint64_t bytes = 0;
    for (auto _ : state) {
        sheet::ZipReader package(WorkbookPath(), sheet::ImportLimits());
        auto part = package.Open(*package.Find(kSheetPart));
        char buffer[kChunk];
        bytes = 0;
        while (const std::size_t got = part->Read(buffer, sizeof buffer))
            bytes += got;
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * bytes));
    state.counters["part_MB"] = static_cast<double>(bytes) / 1e6;
    std::ifstream file(WorkbookPath(), std::ios::binary | std::ios::ate);
    state.counters["file_MB"] = static_cast<double>(file.tellg()) / 1e6;
}

void BM_UnpackLibzip(benchmark::State& state)
{
    WorkbookPath(); // made before the timing starts
    std::uint64_t bytes = 0;
    for (auto _ : state) {
        LibzipPackage package(WorkbookPath(), sheet::ImportLimits());
        bytes = 0;
        package.Stream(kSheetPart, [&](const char*, std::size_t count, bool) { bytes += count; });
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * bytes));
}

// Reads the unpacked sheet from memory into a sink with `read` for each iteration.
template <typename Read>
void ReadUnpacked(benchmark::State& state, Read read)
{
    WorkbookPath(); // made before the timing starts
    const std::string& text = UnpackedSheet();
    const sheet::xlsx::CellStyles styles;
    const sheet::ImportLimits limits;
    TallySink sink;
    for (auto _ : state) {
        sink.Reset();
        read(text, sheet::xlsx::SheetContext{Strings(), styles, false, limits}, sink);
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * text.size()));
    Report(state, sink);
}

void BM_XmlOurs(benchmark::State& state)
{
    ReadUnpacked(state, [](const std::string& text, const sheet::xlsx::SheetContext& context, TallySink& sink) {
        std::size_t at = 0;
        sheet::XmlScanner xml(
            [&](char* out, std::size_t capacity) {
                const std::size_t take = std::min(capacity, text.size() - at);
                std::memcpy(out, text.data() + at, take);
                at += take;
                return take;
            },
            kSheetPart);
        sheet::xlsx::ReadSheetCells(xml, context, 0, sink);
    });
}

void BM_XmlExpat(benchmark::State& state)
{
    ReadUnpacked(state, [](const std::string& text, const sheet::xlsx::SheetContext& context, TallySink& sink) {
        ExpatSheet reader(context, 0, sink);
        // Through a 64 KiB buffer, as the unpacked chunks would arrive.
        char buffer[kChunk];
        std::size_t at = 0;
        do {
            const std::size_t take = std::min(kChunk, text.size() - at);
            std::memcpy(buffer, text.data() + at, take);
            at += take;
            reader.Feed(buffer, take, at == text.size());
        } while (at < text.size());
    });
}

// The floor under any expat reader: the parse alone, its handlers only counting elements.
void BM_XmlExpatParseOnly(benchmark::State& state)
{
    WorkbookPath(); // made before the timing starts
    const std::string& text = UnpackedSheet();
    long elements = 0;
    for (auto _ : state) {
        elements = 0;
        XML_Parser parser = XML_ParserCreate(nullptr);
        XML_SetUserData(parser, &elements);
        XML_SetElementHandler(
            parser, [](void* count, const XML_Char*, const XML_Char**) { ++*static_cast<long*>(count); },
            [](void*, const XML_Char*) {});
        XML_SetCharacterDataHandler(parser, [](void*, const XML_Char*, int) {});
        std::size_t at = 0;
        do {
            const std::size_t take = std::min(kChunk, text.size() - at);
            at += take;
            if (XML_Parse(parser, text.data() + at - take, static_cast<int>(take), at == text.size() ? 1 : 0) != XML_STATUS_OK)
                state.SkipWithError("expat failed");
        } while (at < text.size());
        XML_ParserFree(parser);
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * text.size()));
    state.counters["elements"] = static_cast<double>(elements);
}

} // namespace

BENCHMARK(BM_WorkbookImport)->Unit(benchmark::kMillisecond)->MeasureProcessCPUTime();
BENCHMARK(BM_SheetOurs)->Unit(benchmark::kMillisecond)->MeasureProcessCPUTime();
BENCHMARK(BM_SheetLibzipExpat)->Unit(benchmark::kMillisecond)->MeasureProcessCPUTime();
BENCHMARK(BM_UnpackOurs)->Unit(benchmark::kMillisecond)->MeasureProcessCPUTime();
BENCHMARK(BM_UnpackLibzip)->Unit(benchmark::kMillisecond)->MeasureProcessCPUTime();
BENCHMARK(BM_XmlOurs)->Unit(benchmark::kMillisecond)->MeasureProcessCPUTime();
BENCHMARK(BM_XmlExpat)->Unit(benchmark::kMillisecond)->MeasureProcessCPUTime();
BENCHMARK(BM_XmlExpatParseOnly)->Unit(benchmark::kMillisecond)->MeasureProcessCPUTime();

BENCHMARK_MAIN();
