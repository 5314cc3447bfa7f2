// The zip package writer: entries whole and streamed, the rewritable head of a streamed entry,
// checked by unpacking with zlib and by Python's zipfile; write failures with their cause.
#include "checksums/Crc32.h"
#include "formats/xlsx/ZipWriter.h"
#include "tests/converter/TestFiles.h"
#include "tests/converter/ZipContents.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <random>

using namespace sheet;

namespace {

std::string RandomBytes(size_t size, unsigned seed)
{
    std::mt19937 random(seed);
    std::string bytes(size, '\0');
    for (char& c : bytes)
        c = static_cast<char>(random());
    return bytes;
}

std::string Repetitive(size_t size)
{
    std::string text;
    for (size_t row = 0; text.size() < size; ++row)
        text += "<row r=\"" + std::to_string(row) + "\"><c r=\"A" + std::to_string(row) + "\"><v>1.5</v></c></row>";
    text.resize(size);
    return text;
}

// Writes the parts in order; a part whose name ends in '+' is streamed in pieces of 100,000 bytes.
sys::Status WritePackage(const std::string& path, const std::vector<std::pair<std::string, std::string>>& parts,
                    size_t bufferBytes = 256 * 1024)
{
    ZipWriter zip(bufferBytes);
    if (sys::Status opened = zip.Open(path); !opened)
        return opened;
    for (const auto& [name, data] : parts) {
        if (name.back() != '+') {
            if (sys::Status added = zip.AddEntry(name, data); !added)
                return added;
            continue;
        }
        if (sys::Status begun = zip.BeginEntry(name.substr(0, name.size() - 1)); !begun)
            return begun;
        for (size_t at = 0; at < data.size(); at += 100000)
            if (sys::Status appended = zip.Append(std::string_view(data).substr(at, 100000)); !appended)
                return appended;
        if (sys::Status ended = zip.EndEntry(); !ended)
            return ended;
    }
    return zip.Close();
}

} // namespace

TEST(ZipWriter, PartsUnpackToWhatWasWritten)
{
    testsupport::ScratchFolder folder;
    const std::vector<std::pair<std::string, std::string>> parts = {
        {"empty.xml", ""},
        {"[Content_Types].xml", "<Types/>"},
        {"dir/random.bin", RandomBytes(700000, 1)},   // larger than the output buffer, incompressible
        {"dir/streamed.xml+", Repetitive(3000000)},  // many pieces, packs to a fraction
        {"dir/streamed-random.bin+", RandomBytes(1000003, 2)},
        {"streamed-empty+", ""},
    };
    const std::string path = folder.File("parts.zip");
    ASSERT_TRUE(WritePackage(path, parts)) << "write";
    const std::string bytes = testsupport::ReadFile(path);
    const convtest::ZipContents contents = convtest::Unzip(bytes);
    ASSERT_EQ(contents.error, "");
    ASSERT_EQ(contents.parts.size(), parts.size());
    for (const auto& [name, data] : parts) {
        const std::string stored = name.back() == '+' ? name.substr(0, name.size() - 1) : name;
        ASSERT_TRUE(contents.parts.count(stored)) << stored;
        EXPECT_TRUE(contents.parts.at(stored) == data) << stored;
    }
    EXPECT_LT(bytes.size(), 700000 + 1000003 + 3000000 / 5) << "the repetitive part is packed";
}

TEST(ZipWriter, SmallOutputBuffersSplitHeadersAndTheirPatchesAcrossWrites)
{
    // Over these sizes every header, and every patch of its sizes and CRC, lands partly in the
    // file and partly in the buffer for some of them.
    testsupport::ScratchFolder folder;
    const std::vector<std::pair<std::string, std::string>> parts = {
        {"a", "x"}, {"b+", Repetitive(2000)}, {"c", RandomBytes(1000, 6)}, {"d+", ""}, {"e", Repetitive(777)}, {"f", ""}};
    for (size_t buffer = 1; buffer <= 64; ++buffer) {
        const std::string path = folder.File("small-" + std::to_string(buffer) + ".zip");
        ASSERT_TRUE(WritePackage(path, parts, buffer)) << buffer;
        const convtest::ZipContents contents = convtest::Unzip(testsupport::ReadFile(path));
        ASSERT_EQ(contents.error, "") << buffer;
        EXPECT_TRUE(contents.parts.at("b") == parts[1].second) << buffer;
        EXPECT_TRUE(contents.parts.at("c") == parts[2].second) << buffer;
        EXPECT_EQ(contents.parts.at("e"), parts[4].second) << buffer;
    }
    ZipWriter zip(5);
    const std::string path = folder.File("head.zip");
    ASSERT_TRUE(zip.Open(path));
    ASSERT_TRUE(zip.BeginEntry("h", "0123456789"));
    ASSERT_TRUE(zip.Append(Repetitive(100)));
    ASSERT_TRUE(zip.EndEntry("abcdefghij"));
    ASSERT_TRUE(zip.Close());
    EXPECT_EQ(convtest::Unzip(testsupport::ReadFile(path)).parts.at("h"), "abcdefghij" + Repetitive(100));
}

TEST(ZipWriter, PythonZipfileAcceptsThePackage)
{
    if (std::system("python3 -c 'import zipfile' 2>/dev/null") != 0)
        GTEST_SKIP() << "python3 is not available";
    testsupport::ScratchFolder folder;
    const std::string path = folder.File("py.zip");
    ASSERT_TRUE(WritePackage(path, {{"a.txt", "alpha"}, {"b/big.xml+", Repetitive(500000)}, {"c.bin", RandomBytes(4096, 3)}}));
    const std::string script = "import zipfile,sys\n"
                               "z=zipfile.ZipFile(sys.argv[1])\n"
                               "assert z.testzip() is None\n"
                               "assert z.namelist()==['a.txt','b/big.xml','c.bin'], z.namelist()\n"
                               "assert z.read('a.txt')==b'alpha'\n"
                               "assert len(z.read('b/big.xml'))==500000\n";
    testsupport::WriteFile(folder.File("check.py"), script);
    EXPECT_EQ(std::system(("python3 " + folder.File("check.py") + " " + path).c_str()), 0);
}

TEST(ZipWriter, HeadOfAStreamedPartCanBeReplaced)
{
    testsupport::ScratchFolder folder;
    const std::string path = folder.File("head.zip");
    ZipWriter zip;
    ASSERT_TRUE(zip.Open(path));
    ASSERT_TRUE(zip.AddEntry("first", "before"));
    ASSERT_TRUE(zip.BeginEntry("sheet.xml", "<dimension ref=\"A1:A2\"    />"));
    const std::string rest = Repetitive(600000);
    ASSERT_TRUE(zip.Append(rest));
    EXPECT_FALSE(zip.EndEntry("too short")) << "a head of another length cannot replace it";

    ZipWriter again;
    ASSERT_TRUE(again.Open(path));
    ASSERT_TRUE(again.BeginEntry("sheet.xml", "<dimension ref=\"A1:A2\"    />"));
    ASSERT_TRUE(again.Append(rest));
    ASSERT_TRUE(again.EndEntry("<dimension ref=\"A1:K12345\"/>"));
    ASSERT_TRUE(again.Close());
    const convtest::ZipContents contents = convtest::Unzip(testsupport::ReadFile(path));
    ASSERT_EQ(contents.error, "");
    EXPECT_TRUE(contents.parts.at("sheet.xml") == "<dimension ref=\"A1:K12345\"/>" + rest);
}

TEST(ZipWriter, ChecksumIsZlibsOnEveryLengthAndAlignment)
{
    // The writer takes the checksum of the rbx0 files; it must be zip's CRC-32 exactly.
    const std::string bytes = RandomBytes(100000, 4);
    for (size_t offset : {0, 1, 3, 7})
        for (size_t length : {0, 1, 15, 16, 63, 64, 65, 127, 128, 1000, 65537, 99990}) {
            const auto* data = reinterpret_cast<const Bytef*>(bytes.data() + offset);
            EXPECT_EQ(checksum::Crc32(0, data, length), crc32(0, data, static_cast<uInt>(length)))
                << "offset " << offset << " length " << length;
        }
}

TEST(ZipWriter, WriteFailuresNameTheFileAndTheCause)
{
    struct Case {
        const char* path;
        const char* cause;
    } cases[] = {
        {"/dev/full", "No space left on device"},
        {"/nonexistent-folder/x.zip", "No such file or directory"},
    };
    for (const Case& c : cases) {
        const sys::Status status = WritePackage(c.path, {{"a", RandomBytes(300000, 5)}, {"b+", Repetitive(2000000)}});
        ASSERT_FALSE(status) << c.path;
        EXPECT_EQ(status.problem().file, c.path);
        EXPECT_NE(status.problem().message.find(c.cause), std::string::npos) << status.problem().message;
    }
}

TEST(ZipWriter, CallsOutOfOrderFailInsteadOfWritingABrokenPackage)
{
    testsupport::ScratchFolder folder;
    ZipWriter unopened;
    EXPECT_FALSE(unopened.AddEntry("a", "x"));
    ZipWriter zip;
    ASSERT_TRUE(zip.Open(folder.File("order.zip")));
    EXPECT_FALSE(zip.Append("no entry open"));
    ZipWriter streaming;
    ASSERT_TRUE(streaming.Open(folder.File("open.zip")));
    ASSERT_TRUE(streaming.BeginEntry("a"));
    EXPECT_FALSE(streaming.BeginEntry("b")) << "one streamed part at a time";
    ZipWriter unfinished;
    ASSERT_TRUE(unfinished.Open(folder.File("unfinished.zip")));
    ASSERT_TRUE(unfinished.BeginEntry("a"));
    EXPECT_FALSE(unfinished.Close()) << "a part still open";
}
