#pragma once
// What the wizard tests share: input files of every format with a template each, written the way
// users get them (the engine's own writers for text and rbx0, a spreadsheet library for .xlsx),
// and a setup record pointed at a scratch temporary folder.
#include "tests/engine/CheckTestSupport.h"

#include "converter/AsciiSeriesWriter.h"
#include "converter/RbxSeriesWriter.h"
#include "templates/AsciiSpecification.h"
#include "templates/ExcelSpecification.h"

#include <gtest/gtest.h>
#include <xlsxwriter.h>

#include <filesystem>
#include <string>

namespace wizardtest {

using checktest::ScopedEnv;
using checktest::ScratchFolder;

// The three items every input holds.
inline const char* const kItemNames[] = {"Level", "Flow", "Rain"};

// Four hourly steps of three items.
inline void WriteSeries(converter::SeriesWriter& writer, const std::string& path)
{
    converter::SeriesHeader header;
    header.items = {{"Level", "Water level", "m", "Instantaneous"},
                    {"Flow", "Discharge", "m^3/s", "Instantaneous"},
                    {"Rain", "Rainfall", "mm", "Instantaneous"}};
    ASSERT_TRUE(writer.Begin(path, header, "Gauge").ok());
    const converter::Stamp start = 1609459200; // 2021-01-01 00:00:00
    for (int step = 0; step < 4; ++step) {
        converter::Row row;
        row.stamp = start + 3600 * step;
        row.values = {1.5 + step, 2.5 * step, 0.25 * step};
        ASSERT_TRUE(writer.Write(row).ok());
    }
    ASSERT_TRUE(writer.Finish().ok());
}

// A workbook as the spreadsheet application saves it, in the layout a new Excel template reads.
inline void WriteWorkbook(const std::string& path)
{
    lxw_workbook* workbook = workbook_new(path.c_str());
    ASSERT_NE(workbook, nullptr);
    lxw_worksheet* sheet = workbook_add_worksheet(workbook, nullptr);
    lxw_format* date = workbook_add_format(workbook);
    format_set_num_format(date, "yyyy/mm/dd hh:mm:ss");
    const char* descriptions[] = {"Water level[m]:Instantaneous", "Discharge[m^3/s]:Instantaneous",
                                  "Rainfall[mm]:Instantaneous"};
    worksheet_write_string(sheet, 1, 0, "Date/time", nullptr);
    for (lxw_col_t column = 1; column <= 3; ++column) {
        worksheet_write_string(sheet, 0, column, descriptions[column - 1], nullptr);
        worksheet_write_string(sheet, 1, column, kItemNames[column - 1], nullptr);
    }
    for (int step = 0; step < 4; ++step) {
        lxw_datetime stamp = {2021, 1, 1, step, 0, 0.0};
        const auto row = static_cast<lxw_row_t>(2 + step);
        worksheet_write_datetime(sheet, row, 0, &stamp, date);
        for (lxw_col_t column = 1; column <= 3; ++column)
            worksheet_write_number(sheet, row, column, 1.5 * column + step, nullptr);
    }
    ASSERT_EQ(workbook_close(workbook), LXW_NO_ERROR);
}

// Input files of every format: one single file each, a folder of two each, and a template for
// ASCII and one for Excel. The temporary folder of the process is a scratch folder of its own.
struct Inputs {
    explicit Inputs(const ScratchFolder& scratch)
        : temp(scratch.MakeFolder("tmp") + "/"), asciiFile(scratch.File("gauge.txt")), rbxFile(scratch.File("gauge.rbx0")),
          excelFile(scratch.File("gauge.xlsx")), asciiFolder(scratch.MakeFolder("ascii") + "/"),
          rbxFolder(scratch.MakeFolder("rbx") + "/"), excelFolder(scratch.MakeFolder("excel") + "/"),
          asciiTemplate(scratch.File("ascii.xml")), excelTemplate(scratch.File("excel.xml")), output(scratch.MakeFolder("out") + "/")
    {
        converter::AsciiSeriesWriter ascii;
        WriteSeries(ascii, asciiFile);
        converter::RbxSeriesWriter rbx;
        WriteSeries(rbx, rbxFile);
        WriteWorkbook(excelFile);
        for (const char* name : {"a", "b"}) {
            std::filesystem::copy_file(asciiFile, asciiFolder + name + ".txt");
            std::filesystem::copy_file(rbxFile, rbxFolder + name + ".rbx0");
            std::filesystem::copy_file(excelFile, excelFolder + name + ".xlsx");
        }
        EXPECT_EQ(CAsciiSpecification().Save(asciiTemplate), 1);
        EXPECT_EQ(CExcelSpecification().Save(excelTemplate), 1);
    }

    std::string temp;
    ScopedEnv tmpdir{"TMPDIR", temp};
    std::string asciiFile;
    std::string rbxFile;
    std::string excelFile;
    std::string asciiFolder;
    std::string rbxFolder;
    std::string excelFolder;
    std::string asciiTemplate;
    std::string excelTemplate;
    std::string output;
};

} // namespace wizardtest
