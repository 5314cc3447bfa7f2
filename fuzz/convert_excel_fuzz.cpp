// Arbitrary bytes as a workbook through the engine's Excel reader, which reads the sheet on a second
// thread row by row: once with a new template's defaults and once with the names in the first row,
// global item types, units and value types, and a delete value. Every reading must end.
#include "converter/ExcelSeriesReader.h"
#include "platform/ui/UserInterface.h"
#include "templates/ExcelSpecification.h"
#include "tests/support/ScratchFile.h"

#include <cstdint>
#include <cstdio>
#include <exception>
#include <string>

namespace {

// Far more rows than a workbook of the fuzzer's input sizes holds.
constexpr int kMaxRows = 200000;

// `passOver`: rows that do not read are passed over, as a dry run reads them.
void ReadWhole(const CSpecification& spec, const std::string& path, bool passOver = false)
{
    converter::ExcelSeriesReader reader(spec);
    if (!reader.Open(path))
        return;
    reader.PassOverFaultyRows(passOver);
    const size_t items = reader.Header().items.size();
    reader.Select({items, 0, items / 2});
    converter::Row row;
    for (int n = 0; n < kMaxRows && reader.Next(row); ++n) {
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    static ui::SilentUserInterface silent;
    static ui::ScopedUserInterface scope(silent);
    const testsupport::ScratchFile input("velmora-convert-excel-fuzz", ".xlsx", data, size);
    if (input.Path().empty())
        return 0;
    const std::string& path = input.Path();

    // The conversion catches what the libraries throw and reports it for the file.
    try {
        CExcelSpecification defaults;
        ReadWhole(defaults, path);
        CExcelSpecification names;
        names.m_DataDesc.m_nItemDescriptionRow = 1;
        names.m_DataDesc.m_nStartRow = 2;
        names.m_DataDesc.m_nUnitTypeOption = 0;
        names.m_DataDesc.m_nUnitOption = 0;
        names.m_DataDesc.m_nValueTypeOption = 0;
        names.m_DataDesc.m_nDeleteValueCheck = 1;
        names.m_DataDesc.m_nDeleteValueRadio = 0;
        names.m_DataDesc.m_strDeleteValue = "-999";
        ReadWhole(names, path, size % 2 == 1);
    } catch (const std::exception&) {
    }
    return 0;
}
