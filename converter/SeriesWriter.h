#pragma once
// A writer takes the header and then the rows one at a time, and completes the file at Finish.
#include "platform/system/Status.h"
#include "converter/TimeSeries.h"

#include <string>

namespace converter {

class SeriesWriter {
public:
    virtual ~SeriesWriter() = default;
    // Creates `path` for these items; `title` is the output's title where the format has one.
    virtual sys::Status Begin(const std::string& path, const SeriesHeader& header, const std::string& title) = 0;
    virtual sys::Status Write(const Row& row) = 0;
    // Completes the file. Until then it is not a valid output.
    virtual sys::Status Finish() = 0;
};

} // namespace converter
