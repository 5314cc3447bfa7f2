#pragma once
// Runs, templates and series writes the converter tests share.
#include "converter/ConversionJob.h"
#include "converter/SeriesWriter.h"
#include "templates/AsciiSpecification.h"
#include "tests/support/Files.h"
#include "tests/support/ScratchFolder.h"

#include <string>
#include <vector>

namespace convtest {

// A run over the ASCII files of <folder>/in into rbx0 files in <folder>/out.
inline converter::JobSetup AsciiFolderToRbx0(const testsupport::ScratchFolder& folder)
{
    converter::JobSetup setup;
    setup.inputType = 2;
    setup.inputFormat = 2;
    setup.inputFolder = folder.File("in");
    setup.outputFormat = 1;
    setup.outputFolder = folder.File("out");
    return setup;
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
