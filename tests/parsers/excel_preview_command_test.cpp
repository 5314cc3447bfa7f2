// `velmora preview --format excel` on workbooks written here, as a user would run it.
#include "XlsxFile.h"
#include "templates/ExcelSpecification.h"
#include "tests/support/ShellCommand.h"

#include <gtest/gtest.h>


namespace {

using testsupport::ShellRun;

ShellRun Preview(const std::string& arguments, const std::string& environment = "")
{
    return testsupport::RunShell(environment + " " + std::string(VELMORA_BIN_DIR) + "/velmora preview " + arguments + " 2>&1");
}

bool Has(const ShellRun& run, const std::string& piece) { return run.out.find(piece) != std::string::npos; }

class ExcelPreviewCommand : public ::testing::Test {
protected:
    void SetUp() override
    {
        m_file.Text(1, 1, "Gauge 12");
        m_file.Text(2, 1, "Date");
        m_file.Text(2, 2, "Level");
        m_file.Text(2, 3, "Flow");
        for (int i = 0; i < 3; ++i) {
            m_file.Date(3 + i, 1, 2021, 5, 17 + i);
            m_file.Number(3 + i, 2, 0.25 + i);
            m_file.Number(3 + i, 3, i == 1 ? -999 : 4);
        }
        m_file.Close();
        m_spec.m_DataDesc.m_nUnitTypeOption = 0;
        m_spec.m_DataDesc.m_nUnitOption = 0;
        m_spec.m_DataDesc.m_nValueTypeOption = 0;
        m_spec.m_DataDesc.m_nDeleteValueCheck = 1;
        m_spec.m_DataDesc.m_nDeleteValueRadio = 0;
        m_spec.m_DataDesc.m_strDeleteValue = "-999.00";
        m_template = m_file.path + ".xml";
    }

    std::string Arguments(const std::string& more)
    {
        EXPECT_EQ(m_spec.Save(m_template), 1);
        return m_file.path + " --format excel --template " + m_template + " " + more;
    }

    XlsxFile m_file {"preview_command"};
    CExcelSpecification m_spec;
    std::string m_template;
};

TEST_F(ExcelPreviewCommand, JsonOfAParsedWorkbook)
{
    const ShellRun run = Preview(Arguments("--items 1 --json"));
    ASSERT_EQ(run.status, 0) << run.out;
    EXPECT_TRUE(Has(run, "{\"ok\":true,")) << run.out;
    EXPECT_TRUE(Has(run, "\"itemNames\":[\"DateTime\",\"Level\",\"Flow\"]")) << run.out;
    EXPECT_TRUE(Has(run, "[\"2021/05/17 00:00:00\",\"0.25\",\"4.00\"]")) << run.out;
    EXPECT_TRUE(Has(run, "[\"2021/05/18 00:00:00\",\"1.25\",\"\"]")) << run.out;
    EXPECT_TRUE(Has(run, "\"previewTitles\":[\"DateTime\",\"Flow\"]")) << run.out;
    EXPECT_TRUE(Has(run, "[\"Gauge 12\",\"\",\"\"]")) << run.out;
}

TEST_F(ExcelPreviewCommand, AbsentApplicationFailsWithoutMessages)
{
    const ShellRun run = Preview(Arguments("--json"), "VELMORA_SPREADSHEET=absent");
    EXPECT_EQ(run.status, 1);
    EXPECT_TRUE(Has(run, "{\"ok\":false,\n\"messages\":[]")) << run.out;
}

} // namespace
