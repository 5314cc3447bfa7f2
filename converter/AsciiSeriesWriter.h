#pragma once
// Writes a tab-delimited text in the layout a new ASCII template reads with its defaults, so the
// output reads back without a template file:
//   row 1  per item "Type[unit]:ValueType"
//   row 2  the date/time title, then the item names
//   row 3+ "YYYY/MM/DD HH:mm:ss", then one value per item; a missing value is an empty field.
#include "converter/SeriesWriter.h"
#include "converter/StampText.h"

#include <cstdio>
#include <vector>

namespace converter {

class AsciiSeriesWriter : public SeriesWriter {
public:
    ~AsciiSeriesWriter() override;
    sys::Status Begin(const std::string& path, const SeriesHeader& header, const std::string& title) override;
    sys::Status Write(const Row& row) override;
    sys::Status Finish() override;

    // A header text made safe for a tab-delimited field that the reader splits back unchanged.
    static std::string CleanField(const std::string& text);

private:
    sys::Status Flush();

    std::FILE* m_file = nullptr;
    std::string m_path;
    std::vector<char> m_buffer;
    size_t m_used = 0;
    StampPrinter m_stamps;
};

} // namespace converter
