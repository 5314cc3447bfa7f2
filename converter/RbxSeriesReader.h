#pragma once
// Reads an rbx0 file through the streaming rbx0 reader: the header describes the items, the steps
// come in blocks of records as stored, and each row takes its values straight from its record.
// Calendar time axes become time stamps; the file's delete values become missing.
#include "converter/SeriesReader.h"

#include <memory>

namespace rbx {
class CRbxReader;
}

namespace converter {

class RbxSeriesReader : public SeriesReader {
public:
    RbxSeriesReader();
    ~RbxSeriesReader() override;

    sys::Status Open(const std::string& path) override;
    bool Next(Row& row) override;
    void Select(const std::vector<size_t>& items) override;
    std::uint64_t BytesConsumed() const override;
    long Location() const override { return static_cast<long>(m_stepIndex); }

    // Steps read so far, for messages.
    std::uint64_t StepsRead() const { return m_stepIndex; }

private:
    // Where an item's value lies in a record and which value of it means missing.
    struct Column {
        size_t offset = 0;
        int dataType = 0;
        double deleted = 0.0;
    };

    bool FillBlock();
    double ValueOf(size_t item, const unsigned char* record) const;

    std::unique_ptr<rbx::CRbxReader> m_reader;
    std::string m_path;
    Stamp m_start = 0;
    double m_secondsPerUnit = 1.0;
    std::vector<Column> m_columns; // per item of the file
    std::vector<Column> m_selected; // per selected item; only when all of them are 64-bit values
    size_t m_recordSize = 0;
    size_t m_blockSteps = 0;
    std::vector<unsigned char> m_records; // a block of records as they are stored
    size_t m_inBlock = 0; // steps in the current block
    size_t m_next = 0;    // next step of the block
    std::uint64_t m_stepIndex = 0;
};

} // namespace converter
