// .xls (BIFF8 in a compound file) through FreeXL. FreeXL gives each cell's value and tells dates,
// date-times and times apart, but not the number format itself; those three show with fixed
// formats of our own (see docs/spreadsheet.md).
#include "platform/spreadsheet/WorkbookImport.h"

#include "platform/system/OleDateTime.h"

#include <freexl.h>

#include <cstdint>
#include <cstdio>
#include <cstring>
#include <fstream>
#include <vector>

namespace sheet {

namespace {

const char* const kDateCode = "m/d/yyyy";
const char* const kDateTimeCode = "m/d/yyyy h:mm:ss";
const char* const kTimeCode = "h:mm:ss";

std::string FreeXlWhy(int code)
{
    switch (code) {
    case FREEXL_FILE_NOT_FOUND: return "the file does not exist.";
    case FREEXL_INSUFFICIENT_MEMORY: return "not enough memory to read the workbook.";
    case FREEXL_BIFF_WORKBOOK_NOT_FOUND: return "the compound file holds no workbook stream.";
    case FREEXL_BIFF_INVALID_BOF: return "the workbook stream is damaged (bad BOF record).";
    case FREEXL_BIFF_INVALID_SST:
    case FREEXL_BIFF_ILLEGAL_SST_INDEX: return "the workbook's shared string table is damaged.";
    case FREEXL_UNSUPPORTED_CHARSET:
    case FREEXL_INVALID_CHARACTER: return "the workbook's text uses a character set that cannot be read.";
    case FREEXL_CRAFTED_FILE: return "the workbook is damaged (inconsistent records).";
    default: return "the compound file is damaged (error " + std::to_string(code) + ").";
    }
}

// The stream names of an encrypted package are stored in UTF-16 in the compound file's directory.
bool LooksEncrypted(const std::string& path)
{
    const std::string name = "EncryptedPackage";
    std::string wide;
    for (char c : name) {
        wide.push_back(c);
        wide.push_back('\0');
    }
    std::ifstream in(path, std::ios::binary);
    std::string window;
    std::vector<char> chunk(1 << 16);
    while (in) {
        in.read(chunk.data(), static_cast<std::streamsize>(chunk.size()));
        // Keep the tail of the previous chunk so a name across the boundary is still found.
        window = window.substr(window.size() > wide.size() ? window.size() - wide.size() : 0);
        window.append(chunk.data(), static_cast<size_t>(in.gcount()));
        if (window.find(wide) != std::string::npos)
            return true;
    }
    return false;
}

class Handle {
public:
    ~Handle()
    {
        if (m_handle != nullptr)
            freexl_close(m_handle);
    }
    const void* m_handle = nullptr;
};

void Check(int code, const std::string& path)
{
    if (code != FREEXL_OK)
        throw OpenError(path, FreeXlWhy(code));
}

// FreeXL answers some damaged streams with success and no handle.
void CheckOpened(int code, const Handle& handle, const std::string& path)
{
    Check(code, path);
    if (handle.m_handle == nullptr)
        throw OpenError(path, "the workbook stream is damaged (unexpected records).");
}

std::uint32_t Le32(const unsigned char* p)
{
    return static_cast<std::uint32_t>(p[0]) | static_cast<std::uint32_t>(p[1]) << 8 |
           static_cast<std::uint32_t>(p[2]) << 16 | static_cast<std::uint32_t>(p[3]) << 24;
}

// FreeXL trusts the name lengths of the compound file's directory entries and converts that many
// bytes from a 64-byte field. Walk the directory first and refuse entries it would overrun.
void CheckCompoundDirectory(const std::string& path)
{
    std::ifstream in(path, std::ios::binary | std::ios::ate);
    const std::uint64_t size = static_cast<std::uint64_t>(in.tellg());
    std::vector<unsigned char> header(512);
    in.seekg(0);
    if (!in.read(reinterpret_cast<char*>(header.data()), 512))
        throw OpenError(path, "the compound file is damaged (its header is cut short).");
    const unsigned shift = header[30] | header[31] << 8;
    if (shift != 9 && shift != 12)
        throw OpenError(path, "the compound file is damaged (sector size 2^" + std::to_string(shift) + ").");
    const std::uint64_t sectorSize = 1ull << shift;
    const std::uint64_t sectorCount = size > sectorSize ? (size - sectorSize) / sectorSize + 1 : 0;
    auto readSector = [&](std::uint32_t index, std::vector<unsigned char>& out) {
        out.assign(sectorSize, 0);
        if (index >= sectorCount)
            return false;
        in.clear();
        in.seekg(static_cast<std::streamoff>((index + 1ull) * sectorSize));
        return static_cast<bool>(in.read(reinterpret_cast<char*>(out.data()), static_cast<std::streamsize>(sectorSize)));
    };

    // The FAT: the sectors the header lists (enough for the files FreeXL can read at all).
    std::vector<std::uint32_t> fat;
    std::vector<unsigned char> sector;
    const std::uint32_t fatSectors = Le32(&header[44]);
    for (std::uint32_t i = 0; i < fatSectors && i < 109; ++i) {
        if (!readSector(Le32(&header[76 + 4 * i]), sector))
            throw OpenError(path, "the compound file is damaged (its allocation table lies outside the file).");
        for (std::uint64_t k = 0; k + 4 <= sectorSize; k += 4)
            fat.push_back(Le32(&sector[k]));
    }

    std::uint32_t next = Le32(&header[48]);
    if (next >= sectorCount)
        throw OpenError(path, "the compound file is damaged (its directory lies outside the file).");
    for (std::uint64_t steps = 0; next < 0xFFFFFFFAu; ++steps) {
        if (steps > sectorCount || !readSector(next, sector))
            throw OpenError(path, "the compound file is damaged (its directory chain is broken).");
        for (std::uint64_t at = 0; at + 128 <= sectorSize; at += 128) {
            const unsigned nameLength = sector[at + 64] | sector[at + 65] << 8;
            const unsigned type = sector[at + 66];
            if (nameLength > 64 || nameLength % 2 != 0 || type > 5)
                throw OpenError(path, "the compound file is damaged (bad directory entry).");
        }
        next = next < fat.size() ? fat[next] : 0xFFFFFFFEu;
    }
}

// FreeXL keeps every cell of a sheet in memory at once: refuse sheets whose grid is too big
// before it allocates them. The metadata-only open reads no cells.
void CheckDimensions(const std::string& path, const ImportLimits& limits)
{
    Handle info;
    CheckOpened(freexl_open_info(path.c_str(), &info.m_handle), info, path);
    unsigned sheets = 0;
    Check(freexl_get_info(info.m_handle, FREEXL_BIFF_SHEET_COUNT, &sheets), path);
    for (unsigned s = 0; s < sheets; ++s) {
        unsigned rows = 0;
        unsigned short columns = 0;
        if (freexl_select_active_worksheet(info.m_handle, static_cast<unsigned short>(s)) != FREEXL_OK ||
            freexl_worksheet_dimensions(info.m_handle, &rows, &columns) != FREEXL_OK)
            continue;
        if (static_cast<std::uint64_t>(rows) * columns > limits.maxXlsSheetCells)
            throw OpenError(path, "sheet " + std::to_string(s + 1) + " spans " + std::to_string(rows) + " rows by " +
                                      std::to_string(columns) + " columns, more cells than a workbook preview reads.");
    }
}

bool ParseIsoDate(const char* text, int& year, int& month, int& day)
{
    return text != nullptr && std::sscanf(text, "%d-%d-%d", &year, &month, &day) == 3;
}

bool ParseIsoTime(const char* text, int& hour, int& minute, int& second)
{
    return text != nullptr && std::sscanf(text, "%d:%d:%d", &hour, &minute, &second) == 3;
}

double SerialOf(int year, int month, int day) { return static_cast<double>(DaysFromCivil(year, month, day)); }
double FractionOf(int hour, int minute, int second) { return (hour * 3600.0 + minute * 60.0 + second) / 86400.0; }

struct DateStyles {
    unsigned date, dateTime, time;
};

// Fills `cell` from FreeXL's value; false for an empty cell.
bool ToCell(const FreeXL_CellValue& value, const DateStyles& styles, ImportedCell& cell)
{
    int y = 0, mo = 0, d = 0, h = 0, mi = 0, s = 0;
    switch (value.type) {
    case FREEXL_CELL_INT:
        cell.type = Variant::Number;
        cell.number = value.value.int_value;
        return true;
    case FREEXL_CELL_DOUBLE:
        cell.type = Variant::Number;
        cell.number = value.value.double_value;
        return true;
    case FREEXL_CELL_TEXT:
    case FREEXL_CELL_SST_TEXT:
        cell.type = Variant::Text;
        cell.text = value.value.text_value != nullptr ? value.value.text_value : "";
        return true;
    case FREEXL_CELL_DATE:
        if (!ParseIsoDate(value.value.text_value, y, mo, d))
            return false;
        cell.type = Variant::Number;
        cell.number = SerialOf(y, mo, d);
        cell.style = styles.date;
        return true;
    case FREEXL_CELL_DATETIME:
        if (!ParseIsoDate(value.value.text_value, y, mo, d))
            return false;
        if (const char* blank = std::strchr(value.value.text_value, ' '))
            ParseIsoTime(blank + 1, h, mi, s);
        cell.type = Variant::Number;
        cell.number = SerialOf(y, mo, d) + FractionOf(h, mi, s);
        cell.style = styles.dateTime;
        return true;
    case FREEXL_CELL_TIME:
        if (!ParseIsoTime(value.value.text_value, h, mi, s))
            return false;
        cell.type = Variant::Number;
        cell.number = FractionOf(h, mi, s);
        cell.style = styles.time;
        return true;
    default:
        return false;
    }
}

} // namespace

void ImportXls(const std::string& path, ImportSink& sink, StyleTable& styles, const ImportLimits& limits)
{
    std::ifstream probe(path, std::ios::binary | std::ios::ate);
    if (probe && static_cast<std::uint64_t>(probe.tellg()) > limits.maxFileBytes)
        throw OpenError(path, "the file is larger than " + std::to_string(limits.maxFileBytes >> 20) + " MiB.");
    probe.close();
    CheckCompoundDirectory(path);
    if (LooksEncrypted(path))
        throw OpenError(path, "the workbook is password-protected.");
    CheckDimensions(path, limits);

    Handle workbook;
    CheckOpened(freexl_open(path.c_str(), &workbook.m_handle), workbook, path);
    unsigned password = 0;
    if (freexl_get_info(workbook.m_handle, FREEXL_BIFF_PASSWORD, &password) == FREEXL_OK && password == FREEXL_BIFF_OBFUSCATED)
        throw OpenError(path, "the workbook is password-protected.");
    DateStyles dateStyles{styles.Add(NumberFormat(kDateCode)), styles.Add(NumberFormat(kDateTimeCode)),
                          styles.Add(NumberFormat(kTimeCode))};

    unsigned sheets = 0;
    Check(freexl_get_info(workbook.m_handle, FREEXL_BIFF_SHEET_COUNT, &sheets), path);
    for (unsigned s = 0; s < sheets; ++s) {
        const char* name = nullptr;
        Check(freexl_get_worksheet_name(workbook.m_handle, static_cast<unsigned short>(s), &name), path);
        sink.AddSheet(name != nullptr ? name : "");
    }
    for (unsigned s = 0; s < sheets; ++s) {
        Check(freexl_select_active_worksheet(workbook.m_handle, static_cast<unsigned short>(s)), path);
        unsigned rows = 0;
        unsigned short columns = 0;
        Check(freexl_worksheet_dimensions(workbook.m_handle, &rows, &columns), path);
        for (unsigned r = 0; r < rows; ++r) {
            for (unsigned short c = 0; c < columns; ++c) {
                FreeXL_CellValue value;
                if (freexl_get_cell_value(workbook.m_handle, r, c, &value) != FREEXL_OK)
                    continue;
                ImportedCell cell;
                cell.row = static_cast<int>(r) + 1;
                cell.column = c + 1;
                if (ToCell(value, dateStyles, cell))
                    sink.AddCell(static_cast<int>(s), cell);
            }
        }
        sink.EndSheet(static_cast<int>(s));
    }
}

} // namespace sheet
