#include "engine/Engine.h"
#include "tests/engine/EngineTestSupport.h"

#include <gtest/gtest.h>

namespace {

using namespace enginetest;

CEngine& SingleAsciiFile(CEngine& engine)
{
    engine.m_nInputFormat = 2;
    engine.m_strInputFile = "/data/in.csv";
    engine.m_strTemplateName = "/t/ascii.xml";
    engine.m_arrItems = {2, 5};
    engine.m_strOutputFile = "/data/out.rbx0";
    engine.m_strOutputTitle = "Flows";
    engine.SetLogFileDir("/logs");
    return engine;
}

TEST(OverviewText, MatchesTheSummaryByteForByte)
{
    CEngine engine;
    CString text;
    SingleAsciiFile(engine).GetOverviewText(text);
    EXPECT_EQ(text, "Selected Tool\r\n"
                    "\tVelmora\r\n"
                    "\r\n"
                    "Input Data\r\n"
                    "\tType: 1\r\n"
                    "\tFile_format: 2\r\n"
                    "\tBridge: ASCII Timeseries Bridge (General)\r\n"
                    "\tFile_name: /data/in.csv\r\n"
                    "\tFolder_name: \r\n"
                    "\r\n"
                    "TEMPLATE\r\n"
                    "\tTemplate_option: 1\r\n"
                    "\tTemplate_name: /t/ascii.xml\r\n"
                    "\tItems: 2,5\r\n"
                    "\r\n"
                    "OUTPUT\r\n"
                    "\tFile_format: 1\r\n"
                    "\tBridge: rbx Timeseries Bridge\r\n"
                    "\tFile_name: /data/out.rbx0\r\n"
                    "\tFolder_name: \r\n"
                    "\tFile_title: Flows\r\n"
                    "\tLog_file: /logs\r\n");
    EXPECT_EQ(engine.m_strInputBridge, "ASCII Timeseries Bridge (General)");
    EXPECT_EQ(engine.m_strOutputBridge, "rbx Timeseries Bridge");
}

TEST(OverviewText, EmptyItemListLeavesALineWithOneTab)
{
    CEngine engine;
    SingleAsciiFile(engine).m_arrItems.clear();
    CString text;
    engine.GetOverviewText(text);
    EXPECT_NE(text.find("\tTemplate_name: /t/ascii.xml\r\n\t\r\n\r\nOUTPUT\r\n"), std::string::npos) << text;
}

TEST(OverviewText, UnknownFormatPrintsAnEmptyBridgeName)
{
    CEngine engine;
    engine.m_nInputFormat = 9;
    engine.m_nOutputFormat = 0;
    CString text;
    engine.GetOverviewText(text);
    EXPECT_NE(text.find("\tFile_format: 9\r\n\tBridge: \r\n"), std::string::npos) << text;
    EXPECT_NE(text.find("\tFile_format: 0\r\n\tBridge: \r\n"), std::string::npos) << text;
}

TEST(OverviewText, TemplateNameIsTheStoredOne)
{
    CEngine engine;
    SingleAsciiFile(engine).m_nTemplateOption = 3;
    engine.m_pSpecification = std::make_unique<TestSpecification>();
    engine.m_pSpecification->m_strSaveFile = "/t/saved.xml";
    CString text;
    engine.GetOverviewText(text);
    EXPECT_NE(text.find("\tTemplate_name: /t/saved.xml\r\n"), std::string::npos) << text;
}

TEST(OverviewText, AppendsWithoutEmptyingFirst)
{
    CEngine engine;
    CString once;
    engine.GetOverviewText(once);
    CString twice = "before\r\n";
    engine.GetOverviewText(twice);
    engine.GetOverviewText(twice);
    EXPECT_EQ(twice, "before\r\n" + once + once);
}

} // namespace
