#include "platform/system/FileFormat.h"

#include "platform/system/FileSystem.h"
#include "platform/system/Text.h"

#include <algorithm>
#include <cstdio>

namespace sys {

namespace {

constexpr size_t kTextProbeBytes = 40960;

} // namespace

const FileFormatInfo& FormatInfo(FileFormat format) { return kFileFormats[Number(format) - 1]; }

const FileFormatInfo* FindFormat(int number)
{
    for (const FileFormatInfo& info : kFileFormats)
        if (Number(info.format) == number)
            return &info;
    return nullptr;
}

const FileFormatInfo* FindFormatNamed(std::string_view name)
{
    for (const FileFormatInfo& info : kFileFormats)
        if (text::EqualsNoCase(name, info.name))
            return &info;
    return nullptr;
}

const FileFormatInfo* FindFormatOfBridge(std::string_view bridgeName)
{
    for (const FileFormatInfo& info : kFileFormats)
        if (bridgeName == info.bridgeName)
            return &info;
    return nullptr;
}

bool HasInputExtension(FileFormat format, const std::string& path)
{
    const std::string extension = FileExtension(path);
    const auto& extensions = FormatInfo(format).inputExtensions;
    return std::any_of(extensions.begin(), extensions.end(),
                       [&](const char* known) { return known && text::EqualsNoCase(extension, known); });
}

bool LooksLikeText(const std::string& path)
{
    std::string error;
    std::FILE* file = OpenRegularFile(path, error);
    if (!file)
        return false;
    char buffer[4096];
    size_t total = 0;
    bool text = true;
    while (total < kTextProbeBytes && text) {
        const size_t got = std::fread(buffer, 1, std::min(sizeof buffer, kTextProbeBytes - total), file);
        if (got == 0)
            break;
        text = std::find(buffer, buffer + got, '\0') == buffer + got;
        total += got;
    }
    std::fclose(file);
    return text && total > 0;
}

bool IsInputOf(FileFormat format, const std::string& path)
{
    if (HasInputExtension(format, path))
        return true;
    return FormatInfo(format).textWithoutExtension && FileExtension(path).empty() && LooksLikeText(path);
}

} // namespace sys
