// .xls workbooks: BIFF5 or BIFF8 record streams in a compound file, read record by record. The
// globals come first (code page, date system, number formats, cell styles, sheet list, shared
// texts); each sheet's cells follow in its own part of the stream, which the sheet list points to.
#include "formats/workbook/WorkbookImport.h"

#include "formats/xls/BiffStream.h"
#include "formats/xls/CompoundFile.h"

#include <algorithm>
#include <cstdint>
#include <fstream>
#include <map>
#include <optional>
#include <utility>
#include <vector>

namespace sheet {

namespace {

enum RecordId : unsigned {
    kFormula = 0x0006,
    kEof = 0x000A,
    kDateMode = 0x0022,
    kFilePass = 0x002F,
    kCodePage = 0x0042,
    kBoundSheet = 0x0085,
    kMulRk = 0x00BD,
    kMulBlank = 0x00BE,
    kSst = 0x00FC,
    kLabelSst = 0x00FD,
    kRString = 0x00D6,
    kXf = 0x00E0,
    kBlank = 0x0201,
    kNumber = 0x0203,
    kLabel = 0x0204,
    kBoolErr = 0x0205,
    kString = 0x0207,
    kRk = 0x027E,
    kFormat = 0x041E,
    kBof = 0x0809,
};

// BOF records of Excel 4.0 and older, whose cell records differ from these.
bool IsOldBof(unsigned id) { return id == 0x0009 || id == 0x0209 || id == 0x0409; }

// Days from 30 December 1899 to 1 January 1904, where the 1904 date system counts from.
constexpr double k1904Offset = 1462;

struct SheetEntry {
    std::string name;
    std::uint32_t offset = 0; // of the sheet's BOF record
    std::uint64_t end = UINT64_MAX; // where the next sheet starts: this one must end before
};

class XlsReader {
public:
    XlsReader(const std::string& path, BiffStream& stream, ImportSink& sink, StyleTable& styles, const ImportLimits& limits)
        : m_path(path), m_stream(stream), m_sink(sink), m_styles(styles), m_limits(limits) {}

    void ReadGlobals();
    void ReadSheets();

private:
    void ReadGlobalRecord(const BiffRecord& record);
    void ReadSharedTexts(const BiffRecord& record);
    void SetStyles();
    void SetSheetEnds();
    void ReadSheet(int index);
    void ReadCellRecord(const BiffRecord& record, int sheet);
    void ReadFormula(BiffCursor& body, ImportedCell& cell, int sheet);
    ImportedCell CellAt(BiffCursor& body, const BiffRecord& record);
    void Emit(int sheet, ImportedCell& cell);

    // Runs `read` over a record, turning a short record into a message that locates it.
    template <typename Read>
    void Guarded(const BiffRecord& record, Read read);

    const std::string& m_path;
    BiffStream& m_stream;
    ImportSink& m_sink;
    bool m_stopped = false; // the sink wants no more
    StyleTable& m_styles;
    const ImportLimits& m_limits;

    BiffTextForm m_textForm;
    bool m_date1904 = false;
    std::map<unsigned, std::string> m_formatCodes; // by format id
    std::vector<unsigned> m_xfFormats;             // format id of each cell style
    std::vector<bool> m_dateStyles;
    std::vector<std::string> m_sharedTexts;
    std::vector<SheetEntry> m_sheets;
    std::optional<ImportedCell> m_formulaAwaitingText;
};

template <typename Read>
void XlsReader::Guarded(const BiffRecord& record, Read read)
{
    try {
        read();
    } catch (const BiffCursor::Short& s) {
        m_stream.Fail(record, s.inText ? "holds a text longer than itself" : "is shorter than its content");
    } catch (const BiffCursor::ForeignCodePage& c) {
        throw OpenError(m_path, "the workbook's texts are in code page " + std::to_string(c.codePage) +
                                    ", which cannot be read; save it as .xlsx.");
    }
}

void XlsReader::ReadGlobals()
{
    BiffRecord record;
    const bool any = m_stream.Next(record);
    if (any && IsOldBof(record.id))
        throw OpenError(m_path, "the workbook is in the format of Excel 4.0 or older, which is not read; save it as .xlsx.");
    if (!any || record.id != kBof)
        m_stream.Fail("it does not start with a BOF record");
    Guarded(record, [&] {
        BiffCursor body(record.body);
        m_textForm.biff8 = body.U16() != 0x0500;
    });
    while (m_stream.Next(record)) {
        if (record.id == kEof) {
            SetStyles();
            return;
        }
        Guarded(record, [&] { ReadGlobalRecord(record); });
    }
    m_stream.Fail("it ends before the workbook's globals do");
}

void XlsReader::ReadGlobalRecord(const BiffRecord& record)
{
    BiffCursor body(record.body);
    switch (record.id) {
    case kFilePass:
        throw OpenError(m_path, "the workbook is password-protected.");
    case kCodePage:
        m_textForm.codePage = body.U16();
        break;
    case kDateMode:
        m_date1904 = body.U16() == 1;
        break;
    case kFormat: {
        const unsigned id = body.U16();
        m_formatCodes[id] = body.Text(m_textForm, m_textForm.biff8 ? 2 : 1);
        break;
    }
    case kXf:
        body.U16(); // font
        m_xfFormats.push_back(body.U16());
        break;
    case kBoundSheet: {
        SheetEntry sheet;
        sheet.offset = body.U32();
        body.U8(); // visibility: hidden sheets are read too
        const unsigned type = body.U8();
        sheet.name = body.Text(m_textForm, 1);
        if (type == 0) // charts, macro sheets and modules hold no cells
            m_sheets.push_back(std::move(sheet));
        break;
    }
    case kSst:
        ReadSharedTexts(record);
        break;
    default:
        break;
    }
}

void XlsReader::ReadSharedTexts(const BiffRecord& record)
{
    BiffCursor body = m_stream.Continued(record);
    body.U32(); // references to the texts in the workbook
    const std::uint32_t count = body.U32();
    // Every text takes at least three bytes, so a damaged count cannot reserve much.
    m_sharedTexts.reserve(std::min<std::size_t>(count, record.body.size() / 3 + 1));
    for (std::uint32_t i = 0; i < count; ++i)
        m_sharedTexts.push_back(body.Text(m_textForm, 2));
}

// Each cell style shows numbers with its format: a FORMAT record's code, else a built-in one.
void XlsReader::SetStyles()
{
    std::map<unsigned, NumberFormat> formats;
    m_dateStyles.assign(m_xfFormats.size(), false);
    for (std::size_t xf = 0; xf < m_xfFormats.size(); ++xf) {
        const unsigned id = m_xfFormats[xf];
        auto known = formats.find(id);
        if (known == formats.end()) {
            auto code = m_formatCodes.find(id);
            known = formats.emplace(id, NumberFormat(code != m_formatCodes.end() ? code->second : NumberFormat::BuiltinCode(static_cast<int>(id)))).first;
        }
        m_styles.Set(static_cast<unsigned>(xf), known->second);
        m_dateStyles[xf] = known->second.IsDateTime();
    }
}

// Sheets may not overlap: reading stops where the next sheet starts, so a damaged sheet list
// cannot make the reader go over the same records again and again.
void XlsReader::SetSheetEnds()
{
    std::vector<std::uint32_t> starts;
    for (const SheetEntry& sheet : m_sheets)
        starts.push_back(sheet.offset);
    std::sort(starts.begin(), starts.end());
    for (SheetEntry& sheet : m_sheets) {
        auto next = std::upper_bound(starts.begin(), starts.end(), sheet.offset);
        if (next != starts.begin() && next - starts.begin() >= 2 && *(next - 2) == sheet.offset)
            m_stream.Fail("two sheets start at byte " + std::to_string(sheet.offset));
        if (next != starts.end())
            sheet.end = *next;
    }
}

void XlsReader::ReadSheets()
{
    SetSheetEnds();
    for (const SheetEntry& sheet : m_sheets)
        if (!m_sink.AddSheet(sheet.name))
            return;
    for (std::size_t s = 0; s < m_sheets.size(); ++s) {
        ReadSheet(static_cast<int>(s));
        if (m_stopped || !m_sink.EndSheet(static_cast<int>(s)))
            return;
    }
}

void XlsReader::ReadSheet(int index)
{
    const SheetEntry& sheet = m_sheets[static_cast<std::size_t>(index)];
    BiffRecord record;
    if (!m_stream.Seek(sheet.offset) || !m_stream.Next(record) || record.id != kBof)
        m_stream.Fail("the sheet '" + sheet.name + "' does not start at byte " + std::to_string(sheet.offset) +
                      " as the sheet list says");
    m_formulaAwaitingText.reset();
    // Charts embedded in a sheet bring their own BOF ... EOF inside it.
    int depth = 1;
    while (!m_stopped && m_stream.Next(record)) {
        if (record.offset >= sheet.end)
            m_stream.Fail("the sheet '" + sheet.name + "' runs into the next sheet without its EOF record");
        if (record.id == kBof) {
            ++depth;
        } else if (record.id == kEof) {
            if (--depth == 0)
                return;
        } else if (depth == 1) {
            ReadCellRecord(record, index);
        }
    }
    if (!m_stopped)
        m_stream.Fail("the sheet '" + sheet.name + "' ends without its EOF record");
}

ImportedCell XlsReader::CellAt(BiffCursor& body, const BiffRecord& record)
{
    ImportedCell cell;
    cell.row = body.U16() + 1;
    cell.column = body.U16() + 1;
    if (cell.column > m_limits.maxColumns)
        m_stream.Fail(record, "places a cell in column " + std::to_string(cell.column) + ", outside the sheet's grid");
    cell.style = body.U16();
    return cell;
}

void XlsReader::Emit(int sheet, ImportedCell& cell)
{
    if (cell.type == Variant::Number && m_date1904 && cell.style < m_dateStyles.size() && m_dateStyles[cell.style])
        cell.number += k1904Offset;
    if (!m_stopped)
        m_stopped = !m_sink.AddCell(sheet, cell);
}

void XlsReader::ReadCellRecord(const BiffRecord& record, int sheet)
{
    if (record.id == kString) {
        if (m_formulaAwaitingText) {
            ImportedCell cell = *std::exchange(m_formulaAwaitingText, std::nullopt);
            Guarded(record, [&] { cell.text = m_stream.Continued(record).Text(m_textForm, 2); });
            cell.formulaWithoutResult = cell.text.empty();
            Emit(sheet, cell);
        }
        return;
    }
    Guarded(record, [&] {
        BiffCursor body(record.body);
        switch (record.id) {
        case kNumber: {
            ImportedCell cell = CellAt(body, record);
            cell.type = Variant::Number;
            cell.number = body.F64();
            Emit(sheet, cell);
            break;
        }
        case kRk: {
            ImportedCell cell = CellAt(body, record);
            cell.type = Variant::Number;
            cell.number = RkValue(body.U32());
            Emit(sheet, cell);
            break;
        }
        case kMulRk:
        case kMulBlank: {
            // Row, first column, then a run of cells (style and RK value, or style only), last column.
            const bool blank = record.id == kMulBlank;
            const std::size_t each = blank ? 2 : 6;
            const std::size_t count = record.body.size() >= 6 ? (record.body.size() - 6) / each : 0;
            ImportedCell cell = CellAt(body, record);
            for (std::size_t i = 0; i < count; ++i, ++cell.column) {
                if (cell.column > m_limits.maxColumns)
                    m_stream.Fail(record, "places a cell in column " + std::to_string(cell.column) + ", outside the sheet's grid");
                if (i > 0)
                    cell.style = body.U16();
                cell.type = blank ? Variant::Empty : Variant::Number;
                if (!blank)
                    cell.number = RkValue(body.U32());
                Emit(sheet, cell);
            }
            break;
        }
        case kBlank: {
            ImportedCell cell = CellAt(body, record);
            Emit(sheet, cell);
            break;
        }
        case kLabelSst: {
            ImportedCell cell = CellAt(body, record);
            const std::uint32_t index = body.U32();
            if (index >= m_sharedTexts.size())
                m_stream.Fail(record, "refers to shared text " + std::to_string(index) + " of " +
                                          std::to_string(m_sharedTexts.size()));
            cell.type = Variant::Text;
            cell.text = m_sharedTexts[index];
            Emit(sheet, cell);
            break;
        }
        case kLabel:
        case kRString: {
            ImportedCell cell = CellAt(body, record);
            cell.type = Variant::Text;
            cell.text = body.Text(m_textForm, 2);
            Emit(sheet, cell);
            break;
        }
        case kBoolErr: {
            ImportedCell cell = CellAt(body, record);
            const unsigned value = body.U8();
            if (body.U8() != 0) {
                cell.type = Variant::Error;
                cell.text = BiffErrorText(value);
            } else {
                cell.type = Variant::Boolean;
                cell.number = value != 0 ? 1 : 0;
            }
            Emit(sheet, cell);
            break;
        }
        case kFormula: {
            ImportedCell cell = CellAt(body, record);
            ReadFormula(body, cell, sheet);
            break;
        }
        default:
            break;
        }
    });
}

// A formula cell shows its last result: a number, or when the top two bytes are FF FF a typed
// result; a text result comes in the STRING record that follows. An empty result (a tool that
// does not calculate writes every formula so) or one of no known type reads as the empty text.
void XlsReader::ReadFormula(BiffCursor& body, ImportedCell& cell, int sheet)
{
    unsigned char result[8];
    for (unsigned char& b : result)
        b = body.U8();
    m_formulaAwaitingText.reset();
    if (result[6] != 0xFF || result[7] != 0xFF) {
        BiffCursor number(std::span<const unsigned char>(result, 8));
        cell.type = Variant::Number;
        cell.number = number.F64();
    } else if (result[0] == 0) {
        cell.type = Variant::Text;
        m_formulaAwaitingText = cell;
        return;
    } else if (result[0] == 1) {
        cell.type = Variant::Boolean;
        cell.number = result[2] != 0 ? 1 : 0;
    } else if (result[0] == 2) {
        cell.type = Variant::Error;
        cell.text = BiffErrorText(result[2]);
    } else {
        cell.type = Variant::Text;
        cell.formulaWithoutResult = true;
    }
    Emit(sheet, cell);
}

CompoundFile::Stream WorkbookStream(CompoundFile& file, const std::string& path)
{
    if (file.Find("EncryptedPackage"))
        throw OpenError(path, "the workbook is password-protected.");
    std::optional<CompoundFile::Entry> workbook = file.Find("Workbook");
    if (!workbook)
        workbook = file.Find("Book");
    if (!workbook)
        throw OpenError(path, "the compound file holds no workbook stream.");
    return file.Open(*workbook);
}

} // namespace

void ImportXls(const std::string& path, ImportSink& sink, StyleTable& styles, const ImportLimits& limits)
{
    std::ifstream probe(path, std::ios::binary | std::ios::ate);
    if (probe && static_cast<std::uint64_t>(probe.tellg()) > limits.maxFileBytes)
        throw OpenError(path, "the file is larger than " + std::to_string(limits.maxFileBytes >> 20) + " MiB.");
    probe.close();
    CompoundFile file(path);
    CompoundFile::Stream workbook = WorkbookStream(file, path);
    BiffStream stream(path, workbook.Size(), [&workbook](std::uint64_t offset, unsigned char* out, std::size_t size) {
        workbook.ReadAt(offset, out, size);
    });
    XlsReader reader(path, stream, sink, styles, limits);
    reader.ReadGlobals();
    reader.ReadSheets();
}

} // namespace sheet
