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

    // Lets Next pass over a data row that does not read (a value that is no number, a line of
    // another shape) instead of stopping there: the row's problem is kept in Rejected() and the
    // reading goes on. Dry runs report every such row of a file; a conversion keeps this off.
    void PassOverFaultyRows(bool on) { m_passOverFaults = on; }
    // The rows passed over, the first kKeptRejections of them; RejectedCount() counts all.
    const std::vector<sys::Problem>& Rejected() const { return m_rejected; }
    std::uint64_t RejectedCount() const { return m_rejectedCount; }
    static constexpr size_t kKeptRejections = 1000;

protected:
    // After a data row failed with m_status: true, with the problem kept and the status cleared,
    // when rows that do not read are passed over.
    bool PassOverFault()
    {
        if (!m_passOverFaults || m_status.ok())
            return false;
        if (m_rejected.size() < kKeptRejections)
            m_rejected.push_back(m_status.problem());
        ++m_rejectedCount;
        m_status = sys::Status::Ok();
        return true;
    }

    bool Fail(const std::string& file, long line, const std::string& message, int column = 0)
    {
        m_status = sys::Status::Fail(file, line, message, column);
        return false;
    }

    SeriesHeader m_header;
    std::vector<size_t> m_selection;
    sys::Status m_status;
    std::vector<std::string> m_notes;

private:
    bool m_passOverFaults = false;
    std::vector<sys::Problem> m_rejected;
    std::uint64_t m_rejectedCount = 0;
};

} // namespace converter
