#include "platform/wpx/Wpx.h"
#include "tests/support/Files.h"
#include "tests/support/ScratchFolder.h"

#include <gtest/gtest.h>

#include <climits>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <string>
#include <unistd.h>

namespace {

namespace fs = std::filesystem;

using testsupport::ScratchFolder;

// Everything the reading calls can see of a keyword list, as one line per entry.
void Dump(WPXHANDLE container, int depth, std::string& out);

void DumpKeyword(WPXHANDLE keyword, const std::string& indent, std::string& out)
{
    out += indent + "kw[" + wpxGetName(keyword) + "]";
    for (int n = 1; n <= wpxGetNoParams(keyword); ++n) {
        WPXHANDLE param = wpxParamByNum(keyword, n);
        switch (wpxGetParamKind(param)) {
        case wpxInt: out += " int(" + std::to_string(wpxGetInt(param)) + ")"; break;
        case wpxText: out += " text[" + wpxGetText(param) + "]"; break;
        case wpxFilename: out += " file[" + wpxGetText(param) + "]"; break;
        default: out += " ?"; break;
        }
    }
    out += "\n";
}

std::string DumpDocument(WPXHANDLE doc)
{
    std::string out;
    for (int t = 1; WPXHANDLE target = wpxTargetByNum(doc, t); ++t) {
        out += "target[" + wpxGetName(target) + "]\n";
        Dump(target, 1, out);
    }
    return out;
}

void Dump(WPXHANDLE container, int depth, std::string& out)
{
    // The reading calls find keywords by name; walking names seen in the formatted text is not
    // possible, so sections are listed by number and keywords by the names the tests use.
    std::string indent(2 * depth, ' ');
    for (const char* name : {"", "Type", "Text", "List", "Empty", "end", "target", "has blank", "-x", "ünï", "File"})
        for (int n = 1; WPXHANDLE keyword = wpxKeywordByNameNum(container, name, n); ++n)
            DumpKeyword(keyword, indent, out);
    for (int s = 1; WPXHANDLE section = wpxSectionByNum(container, s); ++s) {
        out += indent + "section[" + wpxGetName(section) + "]\n";
        Dump(section, depth + 1, out);
    }
}

const std::string kAwkwardTexts[] = {
    "",
    "plain",
    "two  blanks and trailing ",
    "quote \" inside",
    "back\\slash\\",
    "line\nbreak\r\nand\ttab",
    "caf\xC3\xA9 \xE6\x97\xA5\xE6\x9C\xAC \xF0\x9F\x98\x80",   // é, two CJK letters, an emoji
    std::string("nul\0byte", 8),
    "\x01\x1F\x7F control",
    "\xFF\xFE broken \xC3 utf8 \xED\xA0\x80",                  // stray bytes, a cut sequence, a surrogate
    "# not a comment, end, target \"x\", wpx end",
};

WPXHANDLE BuildAwkwardDocument()
{
    WPXHANDLE doc = wpxCreate();
    wpxAddTarget(doc, "First target");
    wpxPutParam(doc, "Type", INT_MIN);
    wpxAddSection(doc, "with \"quotes\" and \\");
    for (const std::string& text : kAwkwardTexts)
        wpxPutParam(doc, "Text", text);
    // Absolute, since relative file names are anchored at the reading document's folder.
    for (const std::string& text : kAwkwardTexts)
        wpxPutParamFilename(doc, "File", text.empty() ? "" : ("/" + text).c_str());
    wpxAddKeyword(doc, "List");
    for (int value : {0, -1, 7, INT_MAX, INT_MIN})
        wpxAddInt(doc, value);
    wpxAddKeyword(doc, "Empty");
    wpxAddSection(doc, "");
    for (const char* key : {"", "end", "target", "has blank", "-x", "ünï"})
        wpxPutParam(doc, key, 1);
    wpxEndSection(doc);
    wpxEndSection(doc);
    wpxEndSection(doc);
    wpxAddTarget(doc, "second");
    wpxEndSection(doc);
    return doc;
}

TEST(WpxRoundTrip, AwkwardValuesReadBackIdentically)
{
    ScratchFolder scratch;
    WPXHANDLE written = BuildAwkwardDocument();
    ASSERT_EQ(wpxWrite(written, scratch.File("awkward.wpx")), 1);

    WPXHANDLE read = nullptr;
    std::string error;
    ASSERT_EQ(wpxRead(scratch.File("awkward.wpx"), &read, &error), 1) << error;
    std::string expected = DumpDocument(written);
    EXPECT_NE(expected.find("text[quote \" inside]"), std::string::npos); // the dump sees the values
    EXPECT_EQ(DumpDocument(read), expected);
    EXPECT_EQ(wpxFormat(read), wpxFormat(written));
    wpxClose(&written);
    wpxClose(&read);
}

TEST(WpxRoundTrip, EveryLineOfTheFileIsValidUtf8Text)
{
    WPXHANDLE doc = BuildAwkwardDocument();
    std::string text = wpxFormat(doc);
    wpxClose(&doc);
    for (unsigned char c : text)
        EXPECT_TRUE(c == '\n' || (c >= 0x20 && c != 0x7F)) << "raw control byte " << int(c);
    EXPECT_EQ(text.find('\xFF'), std::string::npos);
    EXPECT_NE(text.find("caf\xC3\xA9"), std::string::npos) << "non-ASCII text is written as it is";
}

TEST(WpxRead, RelativeFileNamesAreAnchoredAtTheDocumentsFolder)
{
    ScratchFolder scratch;
    fs::create_directory(scratch.File("docs"));
    testsupport::WriteFile(scratch.File("docs/setup.wpx"), "wpx 1\n"
                                              "target \"T\"\n"
                                              "  File = file \"data/in.csv\", file \"\", file \"/abs/x\", file \"../up.txt\"\n"
                                              "  Text = \"data/in.csv\"\n"
                                              "end\n"
                                              "wpx end\n");
    WPXHANDLE doc = nullptr;
    std::string error;
    ASSERT_EQ(wpxRead(scratch.File("docs/setup.wpx"), &doc, &error), 1) << error;
    WPXHANDLE file = wpxKeywordByNameNum(wpxTargetByNum(doc, 1), "File", 1);
    EXPECT_EQ(wpxGetText(wpxParamByNum(file, 1)), scratch.File("docs/data/in.csv"));
    EXPECT_EQ(wpxGetText(wpxParamByNum(file, 2)), "");
    EXPECT_EQ(wpxGetText(wpxParamByNum(file, 3)), "/abs/x");
    EXPECT_EQ(wpxGetText(wpxParamByNum(file, 4)), scratch.File("up.txt"));
    CString text;
    wpxGetParam(wpxTargetByNum(doc, 1), "Text", &text, 1, 1);
    EXPECT_EQ(text, "data/in.csv") << "texts are never treated as paths";
    wpxClose(&doc);
}

TEST(WpxRelative, NamesInsideTheFolderAreWrittenRelativeAndReadBackTheSame)
{
    ScratchFolder scratch;
    const std::string docs = scratch.File("docs");
    fs::create_directory(docs);
    const std::string inside = docs + "/data/in.csv";
    const std::string folder = docs + "/out/";
    const std::string outside = scratch.File("docsx/a.txt");
    const std::string nested = docs + "/t.xml";
    const std::string text = "wpx 1\n"
                             "target \"T\"\n"
                             "  File = file \"" + inside + "\", file \"" + folder + "\", file \"" + outside +
                             "\", file \"\", file \"" + docs + "\"\n"
                             "  Text = \"" + inside + "\"\n"
                             "  section \"S\"\n"
                             "    Name = file \"" + nested + "\"\n"
                             "  end\n"
                             "end\n"
                             "wpx end\n";
    WPXHANDLE doc = nullptr;
    std::string error;
    ASSERT_EQ(wpxParse(text, "built", "", &doc, &error), 1) << error;
    EXPECT_EQ(wpxMakeFileNamesRelative(doc, docs + "/"), 3);
    const std::string written = wpxFormat(doc);
    EXPECT_NE(written.find("file \"data/in.csv\""), std::string::npos) << written;
    EXPECT_NE(written.find("file \"out/\""), std::string::npos) << written;
    EXPECT_NE(written.find("file \"t.xml\""), std::string::npos) << written;
    EXPECT_NE(written.find("file \"" + outside + "\""), std::string::npos) << "outside the folder stays absolute";
    EXPECT_NE(written.find("Text = \"" + inside + "\""), std::string::npos) << "texts are no file names";
    ASSERT_EQ(wpxWrite(doc, docs + "/setup.wpx"), 1);
    wpxClose(&doc);

    ASSERT_EQ(wpxRead(docs + "/setup.wpx", &doc, &error), 1) << error;
    WPXHANDLE file = wpxKeywordByNameNum(wpxTargetByNum(doc, 1), "File", 1);
    EXPECT_EQ(wpxGetText(wpxParamByNum(file, 1)), inside);
    EXPECT_EQ(wpxGetText(wpxParamByNum(file, 2)), folder) << "a folder keeps its closing /";
    EXPECT_EQ(wpxGetText(wpxParamByNum(file, 3)), outside);
    EXPECT_EQ(wpxGetText(wpxParamByNum(file, 5)), docs);
    CString name;
    wpxGetParamFilename(wpxSectionByNameNum(wpxTargetByNum(doc, 1), "S", 1), "Name", &name, 1, 1);
    EXPECT_EQ(name, nested);
    EXPECT_EQ(wpxMakeFileNamesRelative(doc, "relative/folder"), 0) << "only an absolute folder anchors";
    wpxClose(&doc);
}

TEST(WpxRead, CommentsBlankLinesIndentationCrLfAndByteOrderMarkAreAccepted)
{
    WPXHANDLE doc = nullptr;
    std::string error;
    const std::string text = "\xEF\xBB\xBF# made by hand\r\n\r\nwpx 1\r\n"
                             "target \"T\"\r\n\t# comment\r\n   Type=  5 ,-6\r\n  \"quoted key\" = \"v\"\r\nend\r\nwpx end\r\n";
    ASSERT_EQ(wpxParse(text, "hand.wpx", "", &doc, &error), 1) << error;
    WPXHANDLE type = wpxKeywordByNameNum(wpxTargetByNum(doc, 1), "Type", 1);
    ASSERT_EQ(wpxGetNoParams(type), 2);
    EXPECT_EQ(wpxGetInt(wpxParamByNum(type, 2)), -6);
    CString value;
    EXPECT_EQ(wpxGetParam(wpxTargetByNum(doc, 1), "quoted key", &value, 1, 1), 1);
    EXPECT_EQ(value, "v");
    wpxClose(&doc);
}

struct DamagedCase {
    const char* name;
    std::string text;
    int line;
    const char* expectation; // part of the message
};

class WpxDamaged : public testing::TestWithParam<DamagedCase> {};

TEST_P(WpxDamaged, IsRefusedWithLineAndExpectation)
{
    const DamagedCase& c = GetParam();
    WPXHANDLE doc = reinterpret_cast<WPXHANDLE>(1);
    std::string error;
    const int before = wpxHandlesInUse();
    EXPECT_EQ(wpxParse(c.text, "bad.wpx", "", &doc, &error), 0);
    EXPECT_EQ(doc, nullptr);
    EXPECT_EQ(wpxHandlesInUse(), before);
    EXPECT_EQ(error.rfind("bad.wpx:" + std::to_string(c.line) + ": ", 0), 0u) << error;
    EXPECT_NE(error.find(c.expectation), std::string::npos) << error;
}

const std::string kHead = "wpx 1\ntarget \"T\"\n";

INSTANTIATE_TEST_SUITE_P(
    Cases, WpxDamaged,
    testing::Values(
        DamagedCase{"Empty", "", 1, "expected the first line \"wpx 1\""},
        DamagedCase{"NotADocument", "hello\n", 1, "not a parameter document"},
        DamagedCase{"OtherVersion", "wpx 2\n", 1, "unsupported version 2"},
        DamagedCase{"TruncatedInsideSection", kHead + "section \"S\"\n  A = 1\n", 5, "ends inside section \"S\" opened on line 3; expected \"end\""},
        DamagedCase{"TruncatedAfterTarget", kHead + "end\n", 4, "without its last line \"wpx end\""},
        DamagedCase{"UnclosedText", kHead + "A = \"abc\nend\nwpx end\n", 3, "expected a closing quote"},
        DamagedCase{"UnknownEscape", kHead + "A = \"a\\qb\"\n", 3, "unknown escape \\q"},
        DamagedCase{"ShortHexEscape", kHead + "A = \"\\x4\"\n", 3, "two hex digits"},
        DamagedCase{"NumberTooLarge", kHead + "A = 2147483648\n", 3, "out of range"},
        DamagedCase{"NumberTooSmall", kHead + "A = -2147483649\n", 3, "out of range"},
        DamagedCase{"MissingEquals", kHead + "A 1\n", 3, "expected \"=\" after keyword \"A\""},
        DamagedCase{"TrailingComma", kHead + "A = 1,\n", 3, "a number, a \"text\" or file \"name\""},
        DamagedCase{"JunkAfterParameter", kHead + "A = 1 2\n", 3, "expected \",\" or the end of the line"},
        DamagedCase{"BareWordParameter", kHead + "A = yes\n", 3, "expected a parameter of \"A\""},
        DamagedCase{"FileWithoutQuotes", kHead + "A = file x\n", 3, "quoted file name"},
        DamagedCase{"KeywordOutsideTarget", "wpx 1\nA = 1\n", 2, "outside any target"},
        DamagedCase{"SectionOutsideTarget", "wpx 1\nsection \"S\"\n", 2, "expected \"target\" first"},
        DamagedCase{"NestedTarget", kHead + "target \"U\"\n", 3, "inside target \"T\" opened on line 2"},
        DamagedCase{"StrayEnd", "wpx 1\nend\n", 2, "without an open target or section"},
        DamagedCase{"TrailerInsideTarget", kHead + "wpx end\n", 3, "expected \"end\" first"},
        DamagedCase{"TextAfterTrailer", kHead + "end\nwpx end\ntarget \"X\"\n", 5, "after the last line"},
        DamagedCase{"InvalidUtf8", kHead + "A = \"\xC3\x28\"\n", 3, "invalid UTF-8 in column 6"},
        DamagedCase{"RawControlCharacter", kHead + "A = \"a\x01\"\n", 3, "control character 0x01"},
        DamagedCase{"NameWithoutQuotes", "wpx 1\ntarget T\n", 2, "quoted name after \"target\""},
        DamagedCase{"TooDeep", kHead + [] {
                        std::string s;
                        for (int i = 0; i < 70; ++i)
                            s += "section \"s\"\n";
                        return s;
                    }(),
                    66, "nested deeper"}),
    [](const testing::TestParamInfo<DamagedCase>& param) { return param.param.name; });

TEST(WpxRead, NoTruncationOfAValidFileIsAccepted)
{
    WPXHANDLE doc = BuildAwkwardDocument();
    std::string text = wpxFormat(doc);
    wpxClose(&doc);
    // Cutting anywhere before the final "wpx end" line must be noticed.
    size_t trailer = text.rfind("wpx end");
    for (size_t length = 0; length < trailer + 7; ++length) {
        WPXHANDLE partial = nullptr;
        std::string error;
        ASSERT_EQ(wpxParse(text.substr(0, length), "cut.wpx", "", &partial, &error), 0) << "accepted " << length;
        EXPECT_EQ(error.rfind("cut.wpx:", 0), 0u);
    }
}

TEST(WpxRead, MissingFileFolderDeviceAndHugeFileAreRefused)
{
    ScratchFolder scratch;
    WPXHANDLE doc = nullptr;
    std::string error;
    EXPECT_EQ(wpxRead(scratch.File("absent.wpx"), &doc, &error), 0);
    EXPECT_NE(error.find(scratch.File("absent.wpx")), std::string::npos) << error;
    EXPECT_EQ(wpxRead(scratch.Path(), &doc, &error), 0);
    EXPECT_NE(error.find("is a folder"), std::string::npos) << error;
    EXPECT_EQ(doc, nullptr);
    EXPECT_EQ(wpxRead("/dev/zero", &doc, &error), 0) << "an endless device is not read";
    EXPECT_NE(error.find("/dev/zero: is not a regular file"), std::string::npos) << error;
    testsupport::WriteFile(scratch.File("huge.wpx"), "wpx 1\n");
    fs::resize_file(scratch.File("huge.wpx"), (64u << 20) + 1); // sparse: costs no disk
    EXPECT_EQ(wpxRead(scratch.File("huge.wpx"), &doc, &error), 0);
    EXPECT_NE(error.find("larger than 64 MiB"), std::string::npos) << error;
}

TEST(WpxHandles, SurviveA32BitIntAndDieWithTheirDocument)
{
    const int before = wpxHandlesInUse();
    WPXHANDLE doc = BuildAwkwardDocument();
    int number = wpxHandleToInt(doc);
    EXPECT_GT(number, 0);
    EXPECT_EQ(wpxHandleFromInt(number), doc);
    WPXHANDLE target = wpxTargetByNum(wpxHandleFromInt(number), 1);
    ASSERT_NE(target, nullptr);
    EXPECT_EQ(wpxTargetByNum(doc, 1), target) << "asking twice gives the same handle";
    WPXHANDLE section = wpxSectionByNum(target, 1);
    ASSERT_NE(section, nullptr);

    EXPECT_EQ(wpxClose(&doc), 1);
    EXPECT_EQ(doc, nullptr);
    EXPECT_EQ(wpxHandlesInUse(), before);
    EXPECT_EQ(wpxSectionByNum(target, 1), nullptr) << "a part of a closed document is gone";
    EXPECT_EQ(wpxGetName(section), "");
    WPXHANDLE stale = wpxHandleFromInt(number);
    EXPECT_EQ(wpxClose(&stale), 0);
    EXPECT_EQ(wpxHandleFromInt(-1), reinterpret_cast<WPXHANDLE>(static_cast<intptr_t>(-1))) << "sign-extended";
    EXPECT_EQ(wpxTargetByNum(wpxHandleFromInt(-1), 1), nullptr);
}

TEST(WpxBuild, PositionRulesAreKept)
{
    WPXHANDLE doc = wpxCreate();
    EXPECT_EQ(wpxAddSection(doc, "S"), 0) << "a section needs a target";
    EXPECT_EQ(wpxPutParam(doc, "A", 1), 0) << "a keyword needs a target";
    EXPECT_EQ(wpxAddInt(doc, 1), 0) << "no keyword to add to";
    EXPECT_EQ(wpxEndSection(doc), 0);
    EXPECT_EQ(wpxAddTarget(doc, "T"), 1);
    EXPECT_EQ(wpxAddTarget(doc, "U"), 0) << "targets do not nest";
    EXPECT_EQ(wpxAddSection(doc, "S"), 1);
    EXPECT_EQ(wpxAddKeyword(doc, "L"), 1);
    EXPECT_EQ(wpxAddInt(doc, 4), 1);
    EXPECT_EQ(wpxEndSection(doc), 1);
    EXPECT_EQ(wpxAddInt(doc, 5), 0) << "closing the section ends the keyword list";
    WPXHANDLE list = wpxKeywordByNameNum(wpxSectionByNameNum(wpxTargetByNum(doc, 1), "S", 1), "L", 1);
    EXPECT_EQ(wpxGetNoParams(list), 1);
    wpxClose(&doc);
}

TEST(WpxGetters, LeaveTheValueAloneWhenNothingFits)
{
    WPXHANDLE doc = nullptr;
    std::string error;
    ASSERT_EQ(wpxParse(kHead + "N = 3, \"t\"\nN = 4\nF = file \"/f\"\nE =\nend\nwpx end\n", "g.wpx", "", &doc, &error), 1)
        << error;
    WPXHANDLE target = wpxTargetByNum(doc, 1);
    int number = 99;
    CString text = "unchanged";
    EXPECT_EQ(wpxGetParam(nullptr, "N", &number, 1, 1), 0);
    EXPECT_EQ(wpxGetParam(target, "Missing", &number, 1, 1), 0);
    EXPECT_EQ(wpxGetParam(target, "N", &number, 1, 2), 0) << "the second parameter is a text";
    EXPECT_EQ(wpxGetParam(target, "N", &number, 1, 3), 0);
    EXPECT_EQ(wpxGetParam(target, "E", &number, 1, 1), 0);
    EXPECT_EQ(wpxGetParam(target, "N", &text, 1, 1), 0) << "an int is not a text";
    EXPECT_EQ(number, 99);
    EXPECT_EQ(text, "unchanged");
    EXPECT_EQ(wpxGetParam(target, "N", &number, 2, 1), 1);
    EXPECT_EQ(number, 4);
    EXPECT_EQ(wpxGetParamFilename(target, "F", &text, 1, 1), 1);
    EXPECT_EQ(text, "/f");
    EXPECT_EQ(wpxGetParamFilename(target, "N", &text, 1, 2), 1) << "a text serves as a file name";
    EXPECT_EQ(text, "t");
    EXPECT_EQ(wpxGetInt(wpxParamByNum(wpxKeywordByNameNum(target, "N", 1), 2)), 0);
    EXPECT_EQ(wpxSectionByNum(target, 1), nullptr);
    EXPECT_EQ(wpxTargetByNum(doc, 0), nullptr);
    EXPECT_EQ(wpxTargetByNum(doc, 2), nullptr);
    wpxClose(&doc);
}

} // namespace
