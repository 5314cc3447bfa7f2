// Feeds arbitrary bytes to the parameter-document reader. Whatever it accepts must format and
// read back to the same text, and every handle it hands out must be released on close.
#include "platform/wpx/Wpx.h"

#include <cstdint>
#include <cstdlib>
#include <string>

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    const int before = wpxHandlesInUse();
    std::string text(reinterpret_cast<const char*>(data), size);
    WPXHANDLE doc = nullptr;
    CString error;
    if (wpxParse(text, "fuzz.wpx", "/base", &doc, &error)) {
        // Walk everything the reading calls reach.
        for (int t = 1; WPXHANDLE target = wpxTargetByNum(doc, t); ++t)
            for (int s = 1; WPXHANDLE section = wpxSectionByNum(target, s); ++s)
                wpxGetName(section);
        std::string formatted = wpxFormat(doc);
        WPXHANDLE again = nullptr;
        CString secondError;
        if (!wpxParse(formatted, "formatted.wpx", "", &again, &secondError) || wpxFormat(again) != formatted)
            std::abort();
        wpxClose(&again);
        wpxClose(&doc);
    } else if (error.rfind("fuzz.wpx:", 0) != 0 || doc != nullptr) {
        std::abort(); // a refusal always names the source and line, and hands out nothing
    }
    if (wpxHandlesInUse() != before)
        std::abort();
    return 0;
}
