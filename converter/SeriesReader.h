#pragma once
// A reader gives the header of a time-series file and then its rows one at a time, so that a
// conversion never holds more than one row.
#include "platform/system/Status.h"
#include "converter/TimeSeries.h"

#include <cstdint>
#include <string>
#include <vector>

namespace converter {

class SeriesReader {
public:
    virtual ~SeriesReader() = default;

    // Opens the file and reads what describes its items. Rows then come from Next.
    virtual sys::Status Open(const std::string& path) = 0;
    // The next row, with one value per selected item; false at the end or on a problem (status()).
    virtual bool Next(Row& row) = 0;
    // How far the reader has come, for progress reports.
    virtual std::uint64_t BytesConsumed() const { return 0; }
    // Where the last row came from: its line (text), worksheet row (Excel) or step number (rbx0).
    virtual long Location() const { return 0; }
    // What the log should say about the file beside its rows (where the data ended, cells read in
    // an unusual way), complete once Next has returned false.
    const std::vector<std::string>& Notes() const { return m_notes; }

    // Every item of the file, in file order.
    const SeriesHeader& Header() const { return m_header; }
    // Restricts the rows to these item positions (from 0, in this order). Call after Open.
    virtual void Select(const std::vector<size_t>& items) { m_selection = items; }
    const std::vector<size_t>& Selection() const { return m_selection; }
    const sys::Status& status() const { return m_status; }

protected:
    bool Fail(const std::string& file, long line, const std::string& message, int column = 0)
    {
        m_status = sys::Status::Fail(file, line, message, column);
        return false;
    }

    SeriesHeader m_header;
    std::vector<size_t> m_selection;
    sys::Status m_status;
    std::vector<std::string> m_notes;
};

} // namespace converter
