#pragma once
// Writes an .xlsx workbook of one sheet in the layout of converter/SheetLayout.h. Header texts are
// shared strings. The sheet's XML is built in a buffer and deflated into the package as the buffer
// fills, so memory stays the same whatever the row count.
#include "converter/SeriesWriter.h"
#include "formats/xlsx/ZipWriter.h"

#include <string>
#include <vector>

namespace converter {

class XlsxSeriesWriter : public SeriesWriter {
public:
    sys::Status Begin(const std::string& path, const SeriesHeader& header, const std::string& title) override;
    sys::Status Write(const Row& row) override;
    sys::Status Finish() override;

    static constexpr unsigned kMaxRows = 1048576;
    static constexpr unsigned kMaxColumns = 16384;

private:
    struct HeaderCells;
    sys::Status WritePackageParts(const HeaderCells& cells, const std::string& title);
    sys::Status WriteHeaderRows(const HeaderCells& cells);
    // Makes room for `bytes` more in the sheet buffer, handing what it holds to the package.
    sys::Status Reserve(size_t bytes);
    sys::Status FlushSheet();
    std::string LastCell() const;

    sheet::ZipWriter m_zip;
    std::string m_path;
    // "<c r=\"B" per column from A, in fixed-size slots so copying one needs no length.
    struct CellOpening {
        char text[16];
        size_t length;
    };
    std::vector<CellOpening> m_cellOpenings;
    std::vector<char> m_sheet;               // sheet XML not yet handed to the package
    size_t m_used = 0;
    unsigned m_row = 2; // rows written so far, the two header rows included
};

} // namespace converter
