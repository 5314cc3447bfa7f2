#include "formats/workbook/WorkbookImport.h"

#include "platform/system/FileSystem.h"

#include <array>
#include <cstring>
#include <fstream>

namespace sheet {

namespace {

constexpr std::array<unsigned char, 4> kZipMagic = {'P', 'K', 3, 4};
constexpr std::array<unsigned char, 8> kCompoundFileMagic = {0xD0, 0xCF, 0x11, 0xE0, 0xA1, 0xB1, 0x1A, 0xE1};

} // namespace

AutomationError OpenError(const std::string& path, const std::string& why)
{
    return AutomationError("Cannot open " + path + ": " + why);
}

StyleTable::StyleTable()
{
    Clear();
}

const NumberFormat& StyleTable::Format(unsigned style) const
{
    return style < m_formats.size() ? m_formats[style] : m_formats[0];
}

unsigned StyleTable::Add(NumberFormat format)
{
    m_formats.push_back(std::move(format));
    return static_cast<unsigned>(m_formats.size() - 1);
}

void StyleTable::Set(unsigned index, NumberFormat format)
{
    if (index >= m_formats.size())
        m_formats.resize(static_cast<size_t>(index) + 1);
    m_formats[index] = std::move(format);
}

void StyleTable::Clear()
{
    m_formats.assign(1, NumberFormat());
}

WorkbookKind DetectWorkbookKind(const std::string& path)
{
    std::ifstream in(path, std::ios::binary);
    if (!in)
        throw OpenError(path, "the file cannot be read.");
    std::array<unsigned char, 8> head{};
    in.read(reinterpret_cast<char*>(head.data()), head.size());
    size_t got = static_cast<size_t>(in.gcount());
    if (got == 0)
        throw OpenError(path, "the file is empty.");
    if (got >= kZipMagic.size() && std::memcmp(head.data(), kZipMagic.data(), kZipMagic.size()) == 0)
        return WorkbookKind::Xlsx;
    if (got == kCompoundFileMagic.size() && head == kCompoundFileMagic)
        return WorkbookKind::Xls;
    throw OpenError(path, "the file is not a workbook (neither an .xlsx zip package nor an .xls compound file).");
}

sys::Status ImportWorkbook(const std::string& path, ImportSink& sink, StyleTable& styles, const ImportLimits& limits)
{
    try {
        if (!sys::IsRegularFile(path))
            throw OpenError(path, "the file does not exist.");
        styles.Clear();
        if (DetectWorkbookKind(path) == WorkbookKind::Xlsx)
            ImportXlsx(path, sink, styles, limits);
        else
            ImportXls(path, sink, styles, limits);
    } catch (const AutomationError& e) {
        return sys::Status::Fail(path, 0, e.what());
    }
    return sys::Status::Ok();
}

} // namespace sheet
