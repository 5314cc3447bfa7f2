#pragma once
// Scratch folders, small files and templates for the converter tests.
#include "converter/ConversionJob.h"
#include "converter/SeriesWriter.h"
#include "templates/AsciiSpecification.h"

#include <filesystem>
#include <fstream>
#include <sstream>
#include <string>
#include <unistd.h>

namespace convtest {

class ScratchFolder {
public:
    ScratchFolder()
    {
        static int counter = 0;
        m_path = std::filesystem::temp_directory_path() /
                 ("velmora-conv-" + std::to_string(::getpid()) + "-" + std::to_string(counter++));
        std::filesystem::remove_all(m_path);
        std::filesystem::create_directories(m_path);
    }
    ~ScratchFolder() { std::filesystem::remove_all(m_path); }
    std::string Path(const std::string& name) const { return (m_path / name).string(); }
    std::string Root() const { return m_path.string(); }

private:
    std::filesystem::path m_path;
};

// A run over the ASCII files of <folder>/in into rbx0 files in <folder>/out.
inline converter::JobSetup AsciiFolderToRbx0(const ScratchFolder& folder)
{
    converter::JobSetup setup;
    setup.inputType = 2;
    setup.inputFormat = 2;
    setup.inputFolder = folder.Path("in");
    setup.outputFormat = 1;
    setup.outputFolder = folder.Path("out");
    return setup;
}

inline void WriteFile(const std::string& path, const std::string& content)
{
    std::ofstream(path, std::ios::binary) << content;
}

inline std::string ReadFile(const std::string& path)
{
    std::ifstream in(path, std::ios::binary);
    std::stringstream s;
    s << in.rdbuf();
    return s.str();
}

// A template whose items are described globally, so only names and data come from the file.
inline CAsciiSpecification GlobalSpec()
{
    CAsciiSpecification spec;
    spec.m_DataDesc.m_nUnitTypeOption = 0;
    spec.m_DataDesc.m_nUnitOption = 0;
    spec.m_DataDesc.m_nValueTypeOption = 0;
    spec.m_DataDesc.m_nItemDescriptionRow = 1;
    spec.m_DataDesc.m_nStartRow = 2;
    return spec;
}

// Writes `rows` through `writer` into `path`: Begin, a Write for each row, Finish.
inline sys::Status WriteSeries(converter::SeriesWriter& writer, const std::string& path,
                                     const converter::SeriesHeader& header, const std::vector<converter::Row>& rows,
                                     const std::string& title = "")
{
    if (sys::Status begun = writer.Begin(path, header, title); !begun)
        return begun;
    for (const converter::Row& row : rows)
        if (sys::Status written = writer.Write(row); !written)
            return written;
    return writer.Finish();
}

} // namespace convtest
