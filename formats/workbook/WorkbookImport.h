#pragma once
// Reading workbook files into a stream of cells: .xlsx and .xls by our own readers, chosen by the
// file's content. A failure is a Status whose message reads as automation words it ("Cannot open
// <path>: <why>"). Inside, the two readers give up by throwing OpenError's AutomationError, which
// ImportWorkbook turns into the Status; it never leaves the reading.
#include "formats/workbook/CellValue.h"
#include "formats/workbook/NumberFormat.h"
#include "platform/system/Status.h"

#include <cstdint>
#include <string>
#include <vector>

namespace sheet {

// Bounds that keep a damaged or hostile file from costing unbounded memory or time.
struct ImportLimits {
    std::uint64_t maxFileBytes = 512ull << 20;
    std::uint64_t maxEntryBytes = 512ull << 20;       // one uncompressed part of an .xlsx
    std::uint64_t maxUncompressedBytes = 1024ull << 20; // all parts together
    std::uint64_t maxCompressionRatio = 400;          // beyond this a large part is a zip bomb
    int maxColumns = 16384;                           // XFD
    int maxRows = 1048576;
};

struct ImportedCell {
    int row = 0;    // from 1
    int column = 0; // from 1
    Variant::Type type = Variant::Empty; // Empty: a blank cell that only carries formatting
    double number = 0.0;
    std::string text;
    unsigned style = 0; // index into the StyleTable
    // A formula whose stored result is missing or empty (written by a tool that does not
    // calculate): read as the empty text.
    bool formulaWithoutResult = false;
};

// The number format of every cell style of a workbook.
class StyleTable {
public:
    StyleTable();
    const NumberFormat& Format(unsigned style) const;
    unsigned Add(NumberFormat format);
    // Sets style `index`, growing the table with General styles as needed.
    void Set(unsigned index, NumberFormat format);
    void Clear();
    size_t Size() const { return m_formats.size(); }

private:
    std::vector<NumberFormat> m_formats; // style 0 is always General
};

// Receives a workbook as it is read. Each call returns false to stop the reading there: a reader
// that has what it wants leaves the rest of the file unread.
class ImportSink {
public:
    virtual ~ImportSink() = default;
    virtual bool AddSheet(const std::string& name) = 0;
    // Cells of one sheet arrive in file order (rows ascending in well-formed files).
    virtual bool AddCell(int sheet, const ImportedCell& cell) = 0; // sheet from 0
    // No more cells of `sheet` follow.
    virtual bool EndSheet(int sheet) = 0;
};

enum class WorkbookKind { Xlsx, Xls };

// Tells the format by the first bytes; throws AutomationError when it is neither.
WorkbookKind DetectWorkbookKind(const std::string& path);

// Reads the whole workbook into `sink`, or as far as the sink wants it, and its cell styles into
// `styles`, which are complete before the first cell arrives.
sys::Status ImportWorkbook(const std::string& path, ImportSink& sink, StyleTable& styles,
                           const ImportLimits& limits = ImportLimits());

// Internal entry points of ImportWorkbook, one per format.
void ImportXlsx(const std::string& path, ImportSink& sink, StyleTable& styles, const ImportLimits& limits);
void ImportXls(const std::string& path, ImportSink& sink, StyleTable& styles, const ImportLimits& limits);

// "Cannot open <path>: <why>"
AutomationError OpenError(const std::string& path, const std::string& why);

} // namespace sheet
