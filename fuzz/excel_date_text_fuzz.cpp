// Date texts of cells and global dates/times, read the way automation converts a text to a date.
#include "parsers/ExcelFilePreviewParser.h"

#include <cstddef>
#include <cstdint>
#include <string>

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    const std::string text(reinterpret_cast<const char*>(data), size);
    for (DateReading reading : {DateReading::DateTime, DateReading::DateOnly, DateReading::TimeOnly}) {
        COleDateTime value;
        if (ReadDateText(text, reading, value) && !value.IsValid())
            __builtin_trap(); // an accepted text always gives a real date
    }
    return 0;
}
