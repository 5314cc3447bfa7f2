#pragma once
// Reads a worksheet through an Excel template over the whole sheet: the header rows give the items
// as the preview parser reads them, every row from the data start row one row of the series, up to
// the first row whose date/time cannot be read. The
// workbook is read on a second thread that hands rows over through a small bounded queue, so
// memory holds a few rows whatever the sheet's length.
#include "converter/NumberText.h"
#include "converter/SeriesReader.h"
#include "converter/StampText.h"

#include <condition_variable>
#include <deque>
#include <map>
#include <memory>
#include <mutex>
#include <thread>

class CSpecification;

namespace sheet {
struct RowCell;
}

namespace converter {

class ExcelSeriesReader : public SeriesReader {
public:
    explicit ExcelSeriesReader(const CSpecification& spec);
    ~ExcelSeriesReader() override;

    sys::Status Open(const std::string& path) override;
    bool Next(Row& row) override;
    void Select(const std::vector<size_t>& items) override;
    long Location() const override { return m_rowNumber; }

private:
    struct SheetRow {
        int number = 0;
        std::vector<sheet::RowCell> cells;
    };
    sys::Status ReadHeader();
    sys::Status ReadItems(const std::map<int, SheetRow>& headerRows);
    void StartRows();
    std::vector<bool> TextColumns() const;
    bool NextSheetRow(SheetRow& sheetRow);
    bool NextRow(Row& row);
    // Ends the data at `row` (the reason follows "the data end at row N, "); always false.
    bool EndData(int row, const std::string& why);
    enum class StampRead { Read, Blank, Unreadable, Failed };
    // Failed sets the status; Unreadable gives the text that could not be read.
    StampRead ReadStamp(const SheetRow& sheetRow, Stamp& stamp, std::string& unreadable);
    bool ReadValues(const SheetRow& sheetRow, Row& row);
    bool IsDeleted(const std::string& text) const;
    void NoteFormulasWithoutResult(const SheetRow& sheetRow);
    // Once the rows are read: one note naming the formula cells read as empty.
    void NoteFormulaCells();

    const CSpecification& m_spec;
    std::string m_path;
    int m_sheet = 1;
    int m_firstColumn = 1;  // f
    int m_lastColumn = 0;   // L
    int m_formatColumns = 1; // W
    int m_stampColumn = 1;   // K
    int m_firstValueColumn = 1; // V
    size_t m_itemCount = 0;
    bool m_deleteInUse = false;
    std::string m_deleteValue;
    std::vector<int> m_slotOfColumn; // sheet column -> place in the row, -1 when not a selected value
    NumberReader m_numbers{"."};
    std::unique_ptr<sys::DateFormat> m_format;
    bool m_useFormat = false;
    sys::DateTimeFields m_start;
    long m_rowNumber = 0; // the sheet row last read
    std::uint64_t m_rowsRead = 0;
    bool m_dataEnded = false;
    bool m_valuesFailed = false; // the last row's values did not read
    std::vector<std::string> m_formulaCells; // the first few, by address
    std::uint64_t m_formulaCellCount = 0;
    bool m_formulaNoted = false;

    // The rows in flight between the reading thread and Next.
    std::thread m_producer;
    std::mutex m_mutex;
    std::condition_variable m_changed;
    std::deque<std::vector<SheetRow>> m_queue;
    std::vector<SheetRow> m_batch; // the batch Next takes its rows from
    size_t m_batchAt = 0;
    bool m_producerDone = false;
    bool m_stop = false;
    std::string m_producerError;
};

} // namespace converter
