#pragma once
// Reads an rbx0 file through the streaming rbx0 reader: the header describes the items, the steps
// come in blocks. Calendar time axes become time stamps; the file's delete values become missing.
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

    Status Open(const std::string& path) override;
    bool Next(Row& row) override;
    std::uint64_t BytesConsumed() const override;
    long Location() const override { return static_cast<long>(m_stepIndex); }

    // Steps read so far, for messages.
    std::uint64_t StepsRead() const { return m_stepIndex; }

private:
    bool FillBlock();

    std::unique_ptr<rbx::CRbxReader> m_reader;
    std::string m_path;
    Stamp m_start = 0;
    double m_secondsPerUnit = 1.0;
    std::vector<double> m_deleteValues; // per item
    std::vector<bool> m_singlePrecision; // per item: compare the delete value as a float
    size_t m_blockSteps = 0;
    std::vector<double> m_times;
    std::vector<double> m_values;
    size_t m_inBlock = 0; // steps in the current block
    size_t m_next = 0;    // next step of the block
    std::uint64_t m_stepIndex = 0;
    std::uint64_t m_recordSize = 0;
};

} // namespace converter
