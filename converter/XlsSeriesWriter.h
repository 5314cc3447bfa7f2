#pragma once
// Writes an .xls workbook (BIFF8 records in a compound file) of one sheet in the layout of
// converter/SheetLayout.h: texts as LABEL cells, numbers as NUMBER cells, stamps as NUMBER cells
// with the date format. The records stream into the compound file as the rows come; the sheet's
// dimensions are put in place at the end. Memory stays the same for any row count.
//
// The format holds 65,536 rows and 256 columns a sheet: more items fail at Begin, before anything
// is written, more rows at the row that does not fit. A text cell holds at most 255 characters;
// longer header texts are cut there.
#include "converter/SeriesWriter.h"
#include "formats/xls/CompoundFileWriter.h"

#include <string>

namespace converter {

class XlsSeriesWriter : public SeriesWriter {
public:
    sys::Status Begin(const std::string& path, const SeriesHeader& header, const std::string& title) override;
    sys::Status Write(const Row& row) override;
    sys::Status Finish() override;

    static constexpr unsigned kMaxRows = 65536;
    static constexpr unsigned kMaxColumns = 256;

private:
    sys::Status WriteHeaderRows(const SeriesHeader& header);
    sys::Status Flush(bool always);

    sheet::CompoundFileWriter m_file;
    std::string m_path;
    std::string m_title;
    std::string m_records;             // records not yet handed to the file
    std::uint64_t m_dimensionsAt = 0;  // offset of the DIMENSIONS record in the stream
    unsigned m_columns = 0;
    unsigned m_rows = 0; // rows written so far, the header rows included
};

} // namespace converter
