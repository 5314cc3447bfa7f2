#pragma once
// What the wizard tests share: input files of every format with a template each, written the way
// users get them (the engine's own writers for text and rbx0, a spreadsheet library for .xlsx),
// and a setup record pointed at a scratch temporary folder.
#include "tests/engine/CheckTestSupport.h"
#include "tests/support/XlsxWorkbook.h"

#include "converter/AsciiSeriesWriter.h"
#include "converter/RbxSeriesWriter.h"
#include "templates/AsciiSpecification.h"
#include "templates/ExcelSpecification.h"

#include <gtest/gtest.h>

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
    testsupport::XlsxWorkbook book(path);
    const char* descriptions[] = {"Water level[m]:Instantaneous", "Discharge[m^3/s]:Instantaneous",
                                  "Rainfall[mm]:Instantaneous"};
    book.Text(2, 1, "Date/time");
    for (int column = 2; column <= 4; ++column) {
        book.Text(1, column, descriptions[column - 2]);
        book.Text(2, column, kItemNames[column - 2]);
    }
    for (int step = 0; step < 4; ++step) {
        book.DateTime(3 + step, 1, lxw_datetime{2021, 1, 1, step, 0, 0.0}, "yyyy/mm/dd hh:mm:ss");
        for (int column = 2; column <= 4; ++column)
            book.Number(3 + step, column, 1.5 * (column - 1) + step);
    }
    ASSERT_TRUE(book.Close());
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
