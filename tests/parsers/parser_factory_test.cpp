#include "parsers/AsciiFilePreviewParser.h"
#include "parsers/ExcelFilePreviewParser.h"
#include "parsers/ParserFactory.h"
#include "parsers/RbxPreviewFileParser.h"
#include "platform/system/FileFormat.h"
#include "templates/AsciiSpecification.h"
#include "templates/ExcelSpecification.h"

#include <gtest/gtest.h>

namespace {

constexpr int kFormatRbx0 = sys::Number(sys::FileFormat::Rbx0);
constexpr int kFormatAscii = sys::Number(sys::FileFormat::Ascii);
constexpr int kFormatExcel = sys::Number(sys::FileFormat::Excel);
constexpr int kFormats[] = {kFormatRbx0, kFormatAscii, kFormatExcel};

// The number of the format a command line names; 0 for another name.
int FormatFromName(const char* name)
{
    const sys::FileFormatInfo* info = sys::FindFormatNamed(name);
    return info ? sys::Number(info->format) : 0;
}

TEST(ParserFactory, EachFormatsParserServesThatFormatOnly)
{
    for (int made : kFormats) {
        const std::unique_ptr<CFilePreviewParser> parser = MakeParser(made);
        ASSERT_NE(parser, nullptr) << made;
        for (int asked : kFormats)
            EXPECT_EQ(IsParserOfFormat(parser.get(), asked), made == asked) << made << " asked " << asked;
        EXPECT_FALSE(IsParserOfFormat(parser.get(), 0)) << made;
    }
    EXPECT_FALSE(IsParserOfFormat(nullptr, kFormatRbx0));
    EXPECT_EQ(MakeParser(0), nullptr);
    EXPECT_EQ(MakeParser(4), nullptr);
}

TEST(ParserFactory, TemplatesOnlyForTheFormatsThatNeedOne)
{
    EXPECT_EQ(MakeSpecification(kFormatRbx0), nullptr);
    EXPECT_EQ(MakeSpecification(0), nullptr);
    EXPECT_NE(dynamic_cast<CAsciiSpecification*>(MakeSpecification(kFormatAscii).get()), nullptr);
    EXPECT_NE(dynamic_cast<CExcelSpecification*>(MakeSpecification(kFormatExcel).get()), nullptr);
}

TEST(ParserFactory, FormatNamesInAnyCase)
{
    const std::pair<const char*, int> cases[] = {
        {"rbx0", kFormatRbx0}, {"ASCII", kFormatAscii}, {"Excel", kFormatExcel}, {"rbx", 0}, {"", 0}, {"csv", 0}};
    for (const auto& [name, format] : cases)
        EXPECT_EQ(FormatFromName(name), format) << name;
}

} // namespace
