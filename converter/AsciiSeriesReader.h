#pragma once
// Reads a delimited text file through an ASCII template, over the whole file: the header rows give
// the items, every data line one row. The lines are split by the one field rule of delimited text
// (delimited/FieldSplitter.h), the header rows read and the data lines checked exactly as the preview
// parser does it; in addition the date/time texts are read with the template's formats and the
// values as numbers with its decimal separator.
#include "platform/system/TextLineReader.h"
#include "converter/NumberText.h"
#include "converter/SeriesReader.h"
#include "converter/StampText.h"
#include "delimited/FieldSplitter.h"

#include <memory>
#include <optional>

class CSpecification;

namespace converter {

class AsciiSeriesReader : public SeriesReader {
public:
    // The template must outlive the reader.
    explicit AsciiSeriesReader(const CSpecification& spec);

    sys::Status Open(const std::string& path) override;
    bool Next(Row& row) override;
    void Select(const std::vector<size_t>& items) override;
    std::uint64_t BytesConsumed() const override { return m_lines.BytesConsumed(); }
    long Location() const override { return m_lines.LineNumber(); }
    // Lines of the common shape (one-character delimiter, both delimiter flags off, no field
    // starting with a quote) are split and read in one pass unless this is turned off; the results
    // are the same either way.
    void UseFusedPass(bool on) { m_fusedOn = on; }
    // Of those, lines of a template whose date/time is the first field alone are read by
    // delimiter positions found in blocks, unless this is turned off; the results are the same.
    void UseBlockPass(bool on) { m_blockOn = on; }

private:
    struct HeaderLines; // the lines the header rows name, read before the data
    sys::Status ReadHeaderLines(HeaderLines& lines);
    sys::Status CountItems(const HeaderLines& lines);
    sys::Status ReadNames(const HeaderLines& lines);
    sys::Status ReadTypesUnitsValueTypes(const HeaderLines& lines);
    sys::Status PrepareStamps();
    bool IsDeleted(std::string_view field) const;
    // One data line into `row`; false with m_status set when the line does not fit the template.
    bool ReadDataLine(std::string_view line, Row& row);
    bool ReadStamp(size_t firstCall, Stamp& stamp);
    // The data line in one pass over its text; false, with nothing reported, when the line needs
    // the splitter or does not read cleanly (ReadDataLine then reads it and reports the fault).
    bool ReadDataLineFused(std::string_view line, Row& row);
    // The data line with the date/time as its first field, by its delimiter positions; false, with
    // nothing reported, when it is not of that shape or does not read cleanly.
    bool ReadDataLineByBlocks(std::string_view line, Row& row);
    bool ReadFieldValue(const char* field, size_t size, double& value) const;

    const CSpecification& m_spec;
    std::string m_path;
    delimited::FieldSplitter m_splitter;  // with the template's dialect
    const delimited::Dialect& m_dialect; // m_splitter's
    NumberReader m_numbers;
    sys::TextLineReader m_lines;

    bool m_fusable = false; // the template allows the one-pass reading of data lines
    bool m_fusedOn = true;
    bool m_blockOn = true;
    bool m_pointDecimals = false;    // "." is the decimal separator
    bool m_selectedInFileOrder = false; // and the selected items are in the file's order
    PlainFieldsReader m_readPlain = FastestPlainFieldsReader();
    std::vector<FieldSpan> m_spans;     // the selected fields of the line being read
    std::vector<size_t> m_spanItems;    // their items
    std::vector<double> m_scratch;      // their values, in file order
    bool m_everySlotFilled = false;  // each data line sets every value of the row
    int m_formatColumns = 1; // W: fields the date/time spans
    int m_stampColumn = 1;   // K: field where it starts
    int m_columns = 0;       // N: logical columns of a data line, the date/time counting as one
    size_t m_itemCount = 0;
    bool m_deleteInUse = false;
    std::string m_deleteValue;

    std::unique_ptr<sys::DateFormat> m_format;
    std::unique_ptr<StampReader> m_stamps; // reads with m_format from m_start
    sys::DateTimeFields m_start;           // starting fields: the global date or time where one applies
    std::string m_stampBuffer;     // the date/time fields joined by blanks
    std::vector<int> m_slotOfItem; // item position -> place in the row, -1 when not selected
};

} // namespace converter
