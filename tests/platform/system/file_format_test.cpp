// The table of formats: numbers, names and bridge names found both ways, the extensions of each
// format's inputs, and the text test for a file without extension.
#include "platform/system/FileFormat.h"
#include "tests/support/ScratchFolder.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <sys/stat.h>

namespace {

using sys::FileFormat;

TEST(FileFormats, NumbersNamesAndBridgeNamesFindTheirRow)
{
    for (const sys::FileFormatInfo& info : sys::kFileFormats) {
        EXPECT_EQ(sys::FindFormat(sys::Number(info.format)), &info);
        EXPECT_EQ(&sys::FormatInfo(info.format), &info);
        EXPECT_EQ(sys::FindFormatOfBridge(info.bridgeName), &info);
    }
    EXPECT_EQ(sys::Number(FileFormat::Rbx0), 1);
    EXPECT_EQ(sys::Number(FileFormat::Ascii), 2);
    EXPECT_EQ(sys::Number(FileFormat::Excel), 3);
    EXPECT_EQ(sys::FindFormat(0), nullptr);
    EXPECT_EQ(sys::FindFormat(4), nullptr);
    const std::pair<const char*, const sys::FileFormatInfo*> names[] = {
        {"rbx0", sys::FindFormat(1)}, {"ascii", sys::FindFormat(2)}, {"EXCEL", sys::FindFormat(3)},
        {"rbx", nullptr},             {"", nullptr},                 {"csv", nullptr},
    };
    for (const auto& [name, info] : names)
        EXPECT_EQ(sys::FindFormatNamed(name), info) << name;
    EXPECT_EQ(sys::FindFormatOfBridge("ascii Timeseries Bridge (General)"), nullptr); // exactly as written
    EXPECT_STREQ(sys::FormatInfo(FileFormat::Excel).outputExtension, ".xlsx");
}

TEST(FileFormats, InputExtensionsInAnyLetterCase)
{
    const struct {
        FileFormat format;
        const char* path;
        bool accepted;
    } cases[] = {
        {FileFormat::Rbx0, "/d/a.rbx0", true},  {FileFormat::Rbx0, "/d/a.RBX0", true},
        {FileFormat::Rbx0, "/d/a.txt", false},  {FileFormat::Ascii, "a.CSV", true},
        {FileFormat::Ascii, "a.tab", true},     {FileFormat::Ascii, "a.txt.bak", false},
        {FileFormat::Ascii, "/d.txt/a", false}, {FileFormat::Excel, "b.Xls", true},
        {FileFormat::Excel, "b.xlsx", true},    {FileFormat::Excel, "b.xlsm", false},
        {FileFormat::Excel, "b", false},
    };
    for (const auto& c : cases)
        EXPECT_EQ(sys::HasInputExtension(c.format, c.path), c.accepted) << c.path;
}

class TextTest : public ::testing::Test {
protected:
    std::string Write(const char* name, const std::string& bytes) const { return m_folder.Write(name, bytes); }
    testsupport::ScratchFolder m_folder{"velmora-format"};
};

TEST_F(TextTest, AFileWithoutExtensionIsTextWithoutAZeroInItsFirst40960Bytes)
{
    const std::string zeroLate = std::string(40960, 'a') + std::string(1, '\0');
    const std::string zeroInside = std::string(40959, 'a') + std::string(1, '\0');
    EXPECT_TRUE(sys::LooksLikeText(Write("plain", "T\tA\n1\t2\n")));
    EXPECT_TRUE(sys::LooksLikeText(Write("late", zeroLate)));
    EXPECT_FALSE(sys::LooksLikeText(Write("inside", zeroInside)));
    EXPECT_FALSE(sys::LooksLikeText(Write("empty", "")));
    EXPECT_FALSE(sys::LooksLikeText(m_folder.Path()));
    EXPECT_FALSE(sys::LooksLikeText(m_folder.File("missing")));
    const std::string fifo = m_folder.File("pipe");
    ASSERT_EQ(::mkfifo(fifo.c_str(), 0600), 0);
    EXPECT_FALSE(sys::LooksLikeText(fifo)); // and it does not wait for a writer

    EXPECT_TRUE(sys::IsInputOf(FileFormat::Ascii, Write("data", "x\n")));
    EXPECT_FALSE(sys::IsInputOf(FileFormat::Ascii, Write("binary", std::string("x\0", 2))));
    EXPECT_FALSE(sys::IsInputOf(FileFormat::Rbx0, Write("other", "x\n"))); // only ASCII takes such files
    EXPECT_FALSE(sys::IsInputOf(FileFormat::Ascii, fifo));
}

} // namespace
