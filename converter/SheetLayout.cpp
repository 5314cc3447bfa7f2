#include "converter/SheetLayout.h"

namespace converter::sheet_layout {

std::string MetadataText(const ItemInfo& item)
{
    auto part = [](std::string text, const std::string& fallback) {
        for (char& c : text)
            if (c == '[' || c == ']' || c == ':')
                c = ' ';
        return text.empty() ? fallback : text;
    };
    return part(item.type, "Undefined") + "[" + part(item.unit, "Undefined") + "]:" +
           part(item.valueType, "Instantaneous");
}

std::string TimeTitle(const SeriesHeader& header)
{
    return header.timeTitle.empty() ? "Date/time" : header.timeTitle;
}

} // namespace converter::sheet_layout
