#pragma once
// Writes an .xlsx workbook of one sheet in the layout a new Excel template reads with its defaults:
//   row 1  column A empty, then per item "Type[unit]:ValueType"
//   row 2  the date/time title, then the item names
//   row 3+ a date cell ("yyyy/mm/dd hh:mm:ss"), then one number per item; a missing value is a
//          blank cell.
// Rows stream to disk as they come (constant-memory mode).
#include "converter/SeriesWriter.h"

struct lxw_workbook;
struct lxw_worksheet;
struct lxw_format;

namespace converter {

class XlsxSeriesWriter : public SeriesWriter {
public:
    ~XlsxSeriesWriter() override;
    Status Begin(const std::string& path, const SeriesHeader& header, const std::string& title) override;
    Status Write(const Row& row) override;
    Status Finish() override;

    static constexpr unsigned kMaxRows = 1048576;
    static constexpr unsigned kMaxColumns = 16384;

private:
    lxw_workbook* m_workbook = nullptr;
    lxw_worksheet* m_sheet = nullptr;
    lxw_format* m_dateFormat = nullptr;
    std::string m_path;
    std::string m_title;
    unsigned m_row = 2;
};

} // namespace converter
