#include "platform/system/Text.h"

#include <gtest/gtest.h>

namespace {

TEST(EscapeControls, ControlCharactersBecomeEscapesAndTheRestStays)
{
    const std::pair<std::string, std::string> cases[] = {
        {"plain /path/a b.txt", "plain /path/a b.txt"},
        {"x\nFAILED forged: y", "x\\nFAILED forged: y"},
        {std::string("1\0abc", 5), "1\\0abc"},
        {"a\tb\rc", "a\\tb\\rc"},
        {"\x1b[31mred\x7f", "\\x1B[31mred\\x7F"},
        {"next\xC2\x85line", "next\\xC2\\x85line"}, // C1 control in UTF-8
        {"caf\xC3\xA9 \xC2\xA0", "caf\xC3\xA9 \xC2\xA0"}, // letters and a no-break space stay
        {"back\\slash", "back\\slash"},
        {"\xC2", "\xC2"}, // a lone lead byte at the end is no control
    };
    for (const auto& [raw, escaped] : cases)
        EXPECT_EQ(text::EscapeControls(raw), escaped);
}

TEST(CutUtf8, NeverSplitsACharacter)
{
    EXPECT_EQ(text::CutUtf8("abc", 5), "abc");
    EXPECT_EQ(text::CutUtf8("abcdef", 3), "abc");
    EXPECT_EQ(text::CutUtf8("a\xC3\xA9", 2), "a");
    EXPECT_EQ(text::CutUtf8("a\xC3\xA9", 3), "a\xC3\xA9");
    EXPECT_EQ(text::CutUtf8("\xE2\x82\xAC\xE2\x82\xAC", 5), "\xE2\x82\xAC");
    EXPECT_EQ(text::CutUtf8("x", 0), "");
}

} // namespace
