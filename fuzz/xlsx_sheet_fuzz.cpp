// Feeds arbitrary bytes to the .xlsx part readers without a zip around them. The first byte
// picks the part (sheet, shared strings or styles) and how the source is cut into reads; the
// sheet reader works against a small string table and a date style in the 1904 date system.
#include "formats/xlsx/XlsxPartReaders.h"

#include <algorithm>
#include <cstdint>
#include <cstring>

namespace {

class Sink : public sheet::ImportSink {
public:
    bool AddSheet(const std::string&) override { return true; }
    bool AddCell(int, const sheet::ImportedCell& cell) override
    {
        m_bytes += cell.text.size();
        return true;
    }
    bool EndSheet(int) override { return true; }

private:
    std::size_t m_bytes = 0;
};

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    if (size == 0)
        return 0;
    const unsigned part = data[0] % 3;
    const std::size_t step = 1 + (data[0] >> 2) * 97;
    const char* text = reinterpret_cast<const char*>(data + 1);
    std::size_t left = size - 1;
    sheet::XmlScanner xml(
        [&](char* out, std::size_t capacity) {
            const std::size_t take = std::min({capacity, step, left});
            std::memcpy(out, text, take);
            text += take;
            left -= take;
            return take;
        },
        "fuzz.xml", 4096, 1 << 20);

    sheet::ImportLimits limits;
    limits.maxRows = 100000;
    limits.maxColumns = 1000;
    sheet::xlsx::SharedStrings strings;
    strings.Add("first");
    strings.Add("");
    sheet::xlsx::CellStyles styles;
    styles.dateStyles = {false, true};
    sheet::StyleTable table;
    Sink sink;
    try {
        if (part == 0)
            sheet::xlsx::ReadSheetCells(xml, {strings, styles, true, limits}, 0, sink);
        else if (part == 1)
            sheet::xlsx::ReadSharedStrings(xml, strings);
        else
            sheet::xlsx::ReadStyles(xml, table);
    } catch (const sheet::XmlScanner::Error&) {
    }
    return 0;
}
