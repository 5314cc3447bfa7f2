// The engine and the bridge on text files other tools write: byte-order marks, UTF-16, 8-bit names,
// inputs that are not files, and the decimal separator of the user's locale.
#include "TestFiles.h"
#include "ZipContents.h"
#include "converter/Converter.h"
#include "platform/rbx/RbxReader.h"
#include "platform/system/TextFileInput.h"
#include "tests/support/ScratchLocale.h"
#include "tests/support/Utf16.h"

#include <gtest/gtest.h>

#include <sys/stat.h>

using namespace converter;

namespace {

const std::string kText = "Date/time\tPegel \xC3\x96hringen\tRain\n"
                          "2020/01/01 00:00:00\t1.5\t0.1\n"
                          "2020/01/01 01:00:00\t2.5\t0.2\n";

using testsupport::Utf16;

FileReport Convert(const CSpecification& spec, const std::string& input, sys::FileFormat out, const std::string& output)
{
    FileJob job{sys::FileFormat::Ascii, input, &spec, {}, out, output, "Title"};
    return ConvertFile(job);
}

class TextInputConversion : public ::testing::Test {
protected:
    testsupport::ScratchFolder folder;
    CAsciiSpecification spec = convtest::GlobalSpec();
};

TEST_F(TextInputConversion, MarksAndUtf16ReadAsTheirText)
{
    const struct {
        const char* label;
        std::string bytes;
    } cases[] = {
        {"UTF-8 with a byte-order mark", "\xEF\xBB\xBF" + kText},
        {"UTF-16 little endian with a mark", "\xFF\xFE" + Utf16(kText, false)},
        {"UTF-16 big endian with a mark", "\xFE\xFF" + Utf16(kText, true)},
        {"UTF-16 little endian without a mark", Utf16(kText, false)},
    };
    testsupport::WriteFile(folder.File("plain.txt"), kText);
    ASSERT_TRUE(Convert(spec, folder.File("plain.txt"), sys::FileFormat::Ascii, folder.File("plain.out")).converted);
    const std::string expected = testsupport::ReadFile(folder.File("plain.out"));
    ASSERT_EQ(spec.Save(folder.File("t.xml")), 1) << spec.LastError();
    for (const auto& c : cases) {
        testsupport::WriteFile(folder.File("in.txt"), c.bytes);
        const FileReport report = Convert(spec, folder.File("in.txt"), sys::FileFormat::Ascii, folder.File("out.txt"));
        ASSERT_TRUE(report.converted) << c.label << ": " << report.problem.Describe();
        EXPECT_EQ(testsupport::ReadFile(folder.File("out.txt")), expected) << c.label;
        const sys::Status verdict = CanConvert(sys::FileFormat::Ascii, folder.File("in.txt"), folder.File("t.xml"));
        EXPECT_TRUE(verdict) << c.label << ": " << verdict.problem().Describe();
    }
}

TEST_F(TextInputConversion, DataOnTheFirstLineAfterAMark)
{
    spec.m_DataDesc.m_nItemTitleOption = 1;
    spec.m_DataDesc.m_nStartRow = 1;
    const std::string data = kText.substr(kText.find('\n') + 1);
    for (const std::string& bytes : {"\xEF\xBB\xBF" + data, "\xFF\xFE" + Utf16(data, false)}) {
        testsupport::WriteFile(folder.File("in.txt"), bytes);
        const FileReport report = Convert(spec, folder.File("in.txt"), sys::FileFormat::Ascii, folder.File("out.txt"));
        ASSERT_TRUE(report.converted) << report.problem.Describe();
        EXPECT_EQ(report.rows, 2u);
        EXPECT_EQ(report.firstStamp, "2020/01/01 00:00:00");
    }
}

TEST_F(TextInputConversion, WhatCannotBeReadIsRefusedByName)
{
    const std::string fifo = folder.File("fifo.txt");
    ASSERT_EQ(::mkfifo(fifo.c_str(), 0600), 0);
    testsupport::WriteFile(folder.File("odd.txt"), "\xFF\xFE" + Utf16(kText, false) + "x");
    testsupport::WriteFile(folder.File("utf32.txt"), std::string("\xFF\xFE\0\0D\0\0\0", 8));
    testsupport::WriteFile(folder.File("endless.txt"), std::string(sys::kLongestTextLine + 1, 'x'));
    const std::pair<std::string, const char*> cases[] = {
        {fifo, "FIFO"},
        {folder.File("odd.txt"), "UTF-16"},
        {folder.File("utf32.txt"), "UTF-32"},
        {folder.File("endless.txt"), "longer than"},
    };
    for (const auto& [path, reason] : cases) {
        const FileReport report = Convert(spec, path, sys::FileFormat::Rbx0, folder.File("out.rbx0"));
        EXPECT_FALSE(report.converted) << path;
        const std::string problem = report.problem.Describe();
        EXPECT_EQ(problem.rfind(path, 0), 0u) << problem;
        EXPECT_NE(problem.find(reason), std::string::npos) << problem;
    }
}

// Names from an 8-bit file are Windows-1252 text in every output.
TEST_F(TextInputConversion, EightBitNamesAreWindows1252InEveryOutput)
{
    testsupport::WriteFile(folder.File("in.txt"), "Date/time\tPegel \xD6hringen \x80\tRain\n2020/01/01 00:00:00\t1.5\t0.1\n");
    const std::string name = "Pegel \xC3\x96hringen \xE2\x82\xAC";

    ASSERT_TRUE(Convert(spec, folder.File("in.txt"), sys::FileFormat::Rbx0, folder.File("out.rbx0")).converted);
    rbx::CRbxReader reader;
    ASSERT_TRUE(reader.Open(folder.File("out.rbx0"))) << reader.status().problem().Describe();
    EXPECT_EQ(reader.Header().items.at(0).name, name);

    ASSERT_TRUE(Convert(spec, folder.File("in.txt"), sys::FileFormat::Ascii, folder.File("out.txt")).converted);
    EXPECT_NE(testsupport::ReadFile(folder.File("out.txt")).find("\t" + name + "\t"), std::string::npos);

    ASSERT_TRUE(Convert(spec, folder.File("in.txt"), sys::FileFormat::Excel, folder.File("out.xlsx")).converted);
    const convtest::ZipContents zip = convtest::Unzip(testsupport::ReadFile(folder.File("out.xlsx")));
    ASSERT_EQ(zip.error, "");
    EXPECT_NE(zip.parts.at("xl/sharedStrings.xml").find(">" + name + "<"), std::string::npos);
}

TEST_F(TextInputConversion, UserLocaleTakesTheDecimalSeparatorFromTheEnvironment)
{
    const testsupport::ScratchLocale& german = testsupport::ScratchLocale::German();
    if (!german.Available())
        GTEST_SKIP() << "localedef cannot build de_DE.UTF-8 here (no localedef or no locale sources)";
    spec.m_strDecimalSeparator = "User Locale";
    testsupport::WriteFile(folder.File("in.txt"), "Date/time\tA\n2020/01/01 00:00:00\t3,5\n");
    {
        const testsupport::LocaleEnvironment environment(german, testsupport::ScratchLocale::kName, nullptr, nullptr);
        const FileReport report = Convert(spec, folder.File("in.txt"), sys::FileFormat::Ascii, folder.File("out.txt"));
        ASSERT_TRUE(report.converted) << report.problem.Describe();
        EXPECT_NE(testsupport::ReadFile(folder.File("out.txt")).find("\t3.5\n"), std::string::npos);
    }
    const testsupport::LocaleEnvironment environment(german, nullptr, "C", testsupport::ScratchLocale::kName);
    EXPECT_FALSE(Convert(spec, folder.File("in.txt"), sys::FileFormat::Ascii, folder.File("out.txt")).converted)
        << "LC_NUMERIC names the C locale, whose separator is the point";
}

} // namespace
