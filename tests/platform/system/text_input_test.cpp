// How the bytes of a file become text: the reader every text reader opens files with, the one rule
// for 8-bit text, and the user's decimal separator.
#include "platform/system/FileSystem.h"
#include "platform/system/Text.h"
#include "platform/system/TextFileInput.h"
#include "platform/system/TextLineReader.h"
#include "tests/support/ScratchFolder.h"
#include "tests/support/ScratchLocale.h"
#include "tests/support/Utf16.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <random>
#include <sys/stat.h>

namespace {

// One file of given bytes, alone in a scratch folder.
class TextFile {
public:
    explicit TextFile(const std::string& bytes) : m_path(m_folder.Write("file.txt", bytes)) {}
    const std::string& Path() const { return m_path; }
    const std::string& Folder() const { return m_folder.Path(); }

private:
    testsupport::ScratchFolder m_folder{"velmora-text"};
    std::string m_path;
};

using testsupport::Utf16;

// Everything the input gives, read `chunk` bytes at a time; `error` receives its error.
std::string ReadAll(const std::string& path, size_t chunk, std::string& error)
{
    sys::TextFileInput input;
    if (const sys::Status opened = input.Open(path); !opened) {
        error = opened.problem().message;
        return {};
    }
    std::string text(chunk, '\0'), all;
    while (size_t got = input.Read(text.data(), chunk))
        all.append(text, 0, got);
    error = input.status().problem().message;
    return all;
}

TEST(TextFileInput, GivesUtf8WhateverTheFileHolds)
{
    const std::string utf8 = "Zeit\tPegel \xC3\x96hringen \xF0\x9F\x8C\xA7\r\n2020/01/01 00:00:00\t3,5\n";
    const struct {
        const char* label;
        std::string bytes;
    } cases[] = {
        {"UTF-8", utf8},
        {"UTF-8 with a byte-order mark", "\xEF\xBB\xBF" + utf8},
        {"UTF-16 little endian with a mark", "\xFF\xFE" + Utf16(utf8, false)},
        {"UTF-16 big endian with a mark", "\xFE\xFF" + Utf16(utf8, true)},
        {"UTF-16 little endian without a mark", Utf16(utf8, false)},
        {"UTF-16 big endian without a mark", Utf16(utf8, true)},
    };
    for (const auto& c : cases) {
        TextFile file(c.bytes);
        for (size_t chunk : {1u, 3u, 7u, 65536u}) { // the surrogate pair and the mark meet every cut
            std::string error;
            EXPECT_EQ(ReadAll(file.Path(), chunk, error), utf8) << c.label << ", chunks of " << chunk;
            EXPECT_EQ(error, "") << c.label;
        }
    }
}

TEST(TextFileInput, OnlyTheFirstMarkIsPassedOver)
{
    TextFile file("\xEF\xBB\xBF\xEF\xBB\xBFx");
    std::string error;
    EXPECT_EQ(ReadAll(file.Path(), 64, error), "\xEF\xBB\xBFx");
}

TEST(TextFileInput, RefusesWhatItCannotReadAsText)
{
    const struct {
        const char* label;
        std::string bytes;
        const char* messagePart;
    } cases[] = {
        {"UTF-32 with a mark", std::string("\xFF\xFE\0\0T\0\0\0", 8), "UTF-32"},
        {"UTF-32 big endian with a mark", std::string("\0\0\xFE\xFF\0\0\0T", 8), "UTF-32"},
        {"UTF-32 without a mark", std::string("T\0\0\0i\0\0\0", 8), "UTF-32"},
        {"UTF-16 of an odd length", std::string("\xFF\xFEx\0y", 5), "odd number of bytes"},
        {"UTF-16 with a lone low surrogate", std::string("\xFF\xFEx\0\x00\xDCy\0", 8), "unpaired surrogate at byte 4"},
        {"UTF-16 with a high surrogate before a letter", std::string("\xFF\xFE\x00\xD8y\0", 6), "unpaired surrogate"},
        {"UTF-16 ending in a high surrogate", std::string("\xFF\xFEx\0\x00\xD8", 6), "unpaired surrogate"},
    };
    for (const auto& c : cases) {
        TextFile file(c.bytes);
        std::string error;
        ReadAll(file.Path(), 4096, error);
        EXPECT_NE(error.find(c.messagePart), std::string::npos) << c.label << ": " << error;
    }
}

TEST(TextFileInput, OpensOnlyRegularFiles)
{
    TextFile file("x");
    const std::string fifo = file.Folder() + "/fifo";
    ASSERT_EQ(::mkfifo(fifo.c_str(), 0600), 0);
    const struct {
        std::string path;
        const char* messagePart;
    } cases[] = {
        {fifo, "FIFO"}, // opening must not wait for a writer
        {"/dev/zero", "device"},
        {file.Folder(), "folder"},
        {file.Folder() + "/missing", "No such file"},
    };
    for (const auto& c : cases) {
        sys::TextFileInput input;
        const sys::Status opened = input.Open(c.path);
        EXPECT_FALSE(opened) << c.path;
        EXPECT_NE(opened.problem().message.find(c.messagePart), std::string::npos) << c.path << ": " << opened.problem().message;
        std::string error;
        EXPECT_EQ(sys::OpenRegularFile(c.path, error), nullptr) << c.path;
    }
}

// The line reader hands lines out whole (Next) or copies their start (Read); both ways must give
// the same lines, numbers and byte counts over lines that cross its buffer in every place.
TEST(TextLineReader, WholeLinesAndCopiedLinesAgree)
{
    std::mt19937 random(15);
    const std::string alphabet = "ab\r\t\xC3\x96 ";
    for (int n = 0; n < 200; ++n) {
        std::string content;
        const int lines = static_cast<int>(random() % 12);
        for (int l = 0; l < lines; ++l) {
            const size_t length = random() % 4 == 0 ? random() % 300 : random() % 20;
            for (size_t i = 0; i < length; ++i)
                content += alphabet[random() % alphabet.size()];
            if (l + 1 < lines || random() % 2)
                content += random() % 3 == 0 ? "\r\n" : "\n";
        }
        TextFile file(content);
        sys::TextLineReader whole(sys::TextLineReader::OverlongLine::TooLong, 16);
        sys::TextLineReader copied(sys::TextLineReader::OverlongLine::TooLong, 16);
        sys::TextLineReader cut(sys::TextLineReader::OverlongLine::TooLong, 16);
        ASSERT_TRUE(whole.Open(file.Path()));
        ASSERT_TRUE(copied.Open(file.Path()));
        ASSERT_TRUE(cut.Open(file.Path()));
        // The lines as the file holds them, line ends cut off but a "\r" before them kept.
        std::vector<std::string> raw;
        for (size_t at = 0; at < content.size();) {
            const size_t newline = std::min(content.find('\n', at), content.size());
            raw.push_back(content.substr(at, newline - at));
            at = newline + 1;
        }
        std::string_view line;
        std::string copy, start;
        for (const std::string& held : raw) {
            const std::string expected = !held.empty() && held.back() == '\r' ? held.substr(0, held.size() - 1) : held;
            ASSERT_TRUE(whole.Next(line)) << content;
            EXPECT_EQ(line, expected);
            ASSERT_TRUE(copied.Read(copy)) << content;
            EXPECT_EQ(copy, expected);
            // A start of 10 bytes: a character cut there is dropped; a line that fits loses its "\r".
            std::string expectedStart = held.size() > 10 ? held.substr(0, 10) : expected;
            if (held.size() > 10)
                text::DropPartialCharacter(expectedStart);
            ASSERT_TRUE(cut.Read(start, 10));
            EXPECT_EQ(start, expectedStart);
            EXPECT_EQ(copied.LineNumber(), whole.LineNumber());
            EXPECT_EQ(copied.BytesConsumed(), whole.BytesConsumed());
        }
        EXPECT_FALSE(whole.Next(line));
        EXPECT_FALSE(copied.Read(copy));
        EXPECT_FALSE(cut.Skip());
        EXPECT_TRUE(whole.status() && copied.status() && cut.status());
        EXPECT_EQ(whole.BytesConsumed(), content.size());
    }
}

// A line without a line break within the limit is refused, in either wording, however it is read.
TEST(TextLineReader, RefusesALineWithoutABreakWithinTheLimit)
{
    TextFile file("head\n" + std::string(sys::kLongestTextLine, 'x') + "\nnext\n");
    using Wording = sys::TextLineReader::OverlongLine;
    for (Wording wording : {Wording::NoLineBreak, Wording::TooLong}) {
        sys::TextLineReader whole(wording), skipped(wording);
        ASSERT_TRUE(whole.Open(file.Path()));
        ASSERT_TRUE(skipped.Open(file.Path()));
        std::string_view line;
        ASSERT_TRUE(whole.Next(line));
        EXPECT_FALSE(whole.Next(line));
        ASSERT_TRUE(skipped.Skip());
        EXPECT_FALSE(skipped.Skip());
        const std::string expected = wording == Wording::NoLineBreak ? "no line break within 4194304 bytes"
                                                                     : "the line is longer than 4194304 bytes";
        for (const sys::TextLineReader* reader : {&whole, &skipped}) {
            EXPECT_EQ(reader->status().problem().line, 2);
            EXPECT_NE(reader->status().problem().message.find(expected), std::string::npos)
                << reader->status().problem().message;
        }
    }
    // One byte less is a line.
    TextFile longest(std::string(sys::kLongestTextLine - 1, 'x') + "\nnext");
    sys::TextLineReader reader;
    ASSERT_TRUE(reader.Open(longest.Path()));
    std::string_view line;
    ASSERT_TRUE(reader.Next(line));
    EXPECT_EQ(line.size(), sys::kLongestTextLine - 1);
    ASSERT_TRUE(reader.Next(line));
    EXPECT_EQ(line, "next");
}

TEST(TextBytes, AreUtf8WhenTheyCanBeAndWindows1252Otherwise)
{
    const std::pair<std::string, std::string> cases[] = {
        {"Pegel \xC3\x96hringen", "Pegel \xC3\x96hringen"},            // UTF-8 stays
        {"Pegel \xD6hringen", "Pegel \xC3\x96hringen"},                // Latin-1, the same in Windows-1252
        {"\x80 \x8A \x9F \x93q\x94", "\xE2\x82\xAC \xC5\xA0 \xC5\xB8 \xE2\x80\x9Cq\xE2\x80\x9D"}, // 0x80-0x9F
        {"\x81\x8D\x8F\x90\x9D", "\xC2\x81\xC2\x8D\xC2\x8F\xC2\x90\xC2\x9D"}, // the five holes keep their value
        {"\xC3\x96 and \xD6", "\xC3\x83\xE2\x80\x93 and \xC3\x96"},        // one stray byte: all of it is 8-bit
        {"\xC0\xAF", "\xC3\x80\xC2\xAF"},                                // an overlong form is not UTF-8
        {"\xED\xA0\x80", "\xC3\xAD\xC2\xA0\xE2\x82\xAC"},                // nor is a surrogate
        {"", ""},
    };
    for (const auto& [bytes, text] : cases) {
        EXPECT_EQ(text::ToUtf8(bytes), text) << bytes;
        EXPECT_TRUE(text::IsUtf8(text::ToUtf8(bytes))) << bytes;
    }
}

TEST(TextBytes, CutsKeepWholeCharacters)
{
    const struct {
        std::string text;
        size_t length;
        std::string cut;
    } cases[] = {
        {"abc", 5, "abc"},
        {"ab\xC3\x96", 3, "ab"},                       // inside a two-byte character
        {"a\xE2\x82\xAC", 3, "a"},                     // inside a three-byte character
        {"a\xF0\x9F\x8C\xA7", 4, "a"},                 // inside a four-byte character
        {"a\xF0\x9F\x8C\xA7", 5, "a\xF0\x9F\x8C\xA7"}, // after it
        {"ab\xD6x", 3, "ab"},                          // an 8-bit byte cannot be told from a cut
    };
    for (const auto& c : cases) {
        std::string text = c.text;
        text::CutToLength(text, c.length);
        EXPECT_EQ(text, c.cut) << c.text << " at " << c.length;
    }
}

TEST(TextBytes, JsonStringsAreValidUtf8)
{
    std::string out;
    text::AppendJsonString(out, "a\"b\\c\td\x01 \xD6");
    EXPECT_EQ(out, "\"a\\\"b\\\\c\\td\\u0001 \xC3\x96\"");
}

TEST(UserLocale, DecimalSeparatorComesFromTheEnvironment)
{
    const testsupport::ScratchLocale& german = testsupport::ScratchLocale::German();
    if (!german.Available())
        GTEST_SKIP() << "localedef cannot build de_DE.UTF-8 here (no localedef or no locale sources)";
    const char* const de = testsupport::ScratchLocale::kName;
    const struct {
        const char *lcAll, *lcNumeric, *lang;
        const char* separator;
    } cases[] = {
        {de, nullptr, nullptr, ","},
        {nullptr, de, nullptr, ","},
        {nullptr, nullptr, de, ","},
        {"C", de, de, "."},        // LC_ALL wins
        {nullptr, "C", de, "."},   // LC_NUMERIC comes before LANG
        {nullptr, nullptr, nullptr, "."},
        {"xx_XX.UTF-8", nullptr, nullptr, ""}, // a locale that cannot be had: the caller uses "."
    };
    for (const auto& c : cases) {
        const testsupport::LocaleEnvironment environment(german, c.lcAll, c.lcNumeric, c.lang);
        EXPECT_EQ(sys::LocaleDecimalSeparator(), c.separator)
            << (c.lcAll ? c.lcAll : "-") << " " << (c.lcNumeric ? c.lcNumeric : "-") << " " << (c.lang ? c.lang : "-");
        // The process keeps its own locale, on which the formatting of numbers relies.
        EXPECT_EQ(text::Format("%.1f", 3.5), "3.5");
    }
}

} // namespace
