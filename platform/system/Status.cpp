#include "platform/system/Status.h"

namespace sys {

std::string Problem::Describe() const
{
    std::string text = file;
    if (line > 0)
        text += ":" + std::to_string(line);
    if (line > 0 && column > 0)
        text += ":" + std::to_string(column);
    if (!text.empty())
        text += ": ";
    return text + message;
}

} // namespace sys
