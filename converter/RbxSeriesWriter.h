#pragma once
// Writes an rbx0 file through the streaming rbx0 writer: a calendar time axis in seconds from the
// first stamp (equidistant when every step is equal), 64-bit values, item types and units resolved
// in the unit catalogue, missing values stored as the file's delete value.
#include "converter/SeriesWriter.h"

#include <memory>

namespace rbx {
class CRbxWriter;
struct FileDefinition;
}

namespace converter {

class RbxSeriesWriter : public SeriesWriter {
public:
    RbxSeriesWriter();
    ~RbxSeriesWriter() override;
    sys::Status Begin(const std::string& path, const SeriesHeader& header, const std::string& title) override;
    sys::Status Write(const Row& row) override;
    sys::Status Finish() override;

private:
    sys::Status OpenWriter();

    std::unique_ptr<rbx::CRbxWriter> m_writer;
    std::unique_ptr<rbx::FileDefinition> m_definition;
    std::string m_path;
    bool m_first = true;
    Stamp m_start = 0;
    Stamp m_previous = 0;
};

} // namespace converter
