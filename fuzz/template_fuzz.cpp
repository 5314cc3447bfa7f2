// Feeds arbitrary bytes to both template loaders. A loaded template must render to a file that loads
// again, and splitting the input's lines by the loaded delimiter rules must always reach the end.
#include "platform/ui/UserInterface.h"
#include "templates/AsciiSpecification.h"
#include "templates/ExcelSpecification.h"
#include "templates/TemplateXml.h"

#include <cstdint>
#include <cstdlib>
#include <string>
#include <string_view>

namespace {

template <class Spec>
void Exercise(std::string_view bytes, const tmplfile::FileLayout& layout)
{
    Spec spec;
    if (!spec.LoadFromMemory(bytes, "fuzz.xml"))
        return;
    std::string rendered = tmplfile::RenderTemplate(spec, layout);
    Spec again;
    if (!again.LoadFromMemory(rendered, "rendered.xml"))
        std::abort();
    if (again.m_DataDesc.m_vecItemDefs.size() != spec.m_DataDesc.m_vecItemDefs.size() ||
        again.m_arrSelItems != spec.m_arrSelItems || again.m_DataDesc.m_nStartRow != spec.m_DataDesc.m_nStartRow)
        std::abort();

    std::string line(bytes.substr(0, 4096));
    int pos = 0;
    for (size_t calls = 0; pos != -1; ++calls) {
        spec.NextField(line, pos);
        if (calls > line.size() + 4)
            std::abort();
    }
    spec.CountFormatColumns(1);
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    static ui::SilentUserInterface silent;
    ui::ScopedUserInterface scope(silent);
    std::string_view bytes(reinterpret_cast<const char*>(data), size);
    Exercise<CAsciiSpecification>(bytes, tmplfile::AsciiFileLayout());
    Exercise<CExcelSpecification>(bytes, tmplfile::ExcelFileLayout());
    return 0;
}
