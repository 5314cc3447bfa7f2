// The zip package reader: parts unpacked in chunks of any size give back what was packed, and
// every kind of damage to the packed data or the directory is caught by name.
#include "tests/support/TestWorkbooks.h"

#include "formats/xlsx/ZipReader.h"
#include "formats/xlsx/ZipWriter.h"

#include <gtest/gtest.h>

#include <zlib.h>

#include <cstring>
#include <fstream>
#include <random>

using sheet::AutomationError;
using sheet::ImportLimits;
using sheet::ZipReader;

namespace {

using testsupport::ReadFile;

std::string Noise(std::size_t size)
{
    std::mt19937 random(7);
    std::string text(size, ' ');
    for (char& c : text)
        c = "0123456789.,;<>cv\n"[random() % 18];
    return text;
}

// A package made by our writer: a small part and a large streamed one.
std::string WrittenPackage(const std::string& small, const std::string& large)
{
    const std::string path = sheettest::TempFile("written.zip");
    sheet::ZipWriter writer;
    EXPECT_TRUE(writer.Open(path).ok());
    EXPECT_TRUE(writer.AddEntry("small.xml", small).ok());
    EXPECT_TRUE(writer.BeginEntry("large.xml").ok());
    for (std::size_t at = 0; at < large.size(); at += 100000)
        EXPECT_TRUE(writer.Append(std::string_view(large).substr(at, 100000)).ok());
    EXPECT_TRUE(writer.EndEntry().ok());
    EXPECT_TRUE(writer.Close().ok());
    return path;
}

void Put16(std::string& out, unsigned value) { out += static_cast<char>(value & 0xFF), out += static_cast<char>(value >> 8 & 0xFF); }
void Put32(std::string& out, std::uint32_t value) { Put16(out, value & 0xFFFF), Put16(out, value >> 16); }

// A one-part package written by hand, its data stored as given.
std::string HandPackage(const std::string& name, const std::string& data, unsigned method, unsigned flags = 0)
{
    const std::uint32_t crc = static_cast<std::uint32_t>(crc32(0, reinterpret_cast<const Bytef*>(data.data()), static_cast<uInt>(data.size())));
    std::string local, central, end;
    Put32(local, 0x04034b50u), Put16(local, 20), Put16(local, flags), Put16(local, method), Put32(local, 0);
    Put32(local, crc), Put32(local, static_cast<std::uint32_t>(data.size())), Put32(local, static_cast<std::uint32_t>(data.size()));
    Put16(local, static_cast<unsigned>(name.size())), Put16(local, 0);
    local += name + data;
    Put32(central, 0x02014b50u), Put16(central, 20), Put16(central, 20), Put16(central, flags), Put16(central, method);
    Put32(central, 0), Put32(central, crc), Put32(central, static_cast<std::uint32_t>(data.size()));
    Put32(central, static_cast<std::uint32_t>(data.size())), Put16(central, static_cast<unsigned>(name.size()));
    Put16(central, 0), Put16(central, 0), Put16(central, 0), Put16(central, 0), Put32(central, 0), Put32(central, 0);
    central += name;
    Put32(end, 0x06054b50u), Put16(end, 0), Put16(end, 0), Put16(end, 1), Put16(end, 1);
    Put32(end, static_cast<std::uint32_t>(central.size())), Put32(end, static_cast<std::uint32_t>(local.size())), Put16(end, 0);
    const std::string path = sheettest::TempFile("hand.zip");
    sheettest::WriteFile(path, local + central + end);
    return path;
}

std::string ReadInChunks(ZipReader& package, const std::string& name, std::size_t chunk)
{
    const ZipReader::Entry* entry = package.Find(name);
    if (entry == nullptr)
        return "(missing)";
    auto part = package.Open(*entry);
    std::string out;
    std::string buffer(chunk, '\0');
    for (std::size_t got; (got = part->Read(buffer.data(), chunk)) > 0;)
        out.append(buffer.data(), got);
    return out;
}

// The message of reading every part of the package at `path` ("" when all read).
std::string ReadFailure(const std::string& path)
{
    try {
        ZipReader package(path, ImportLimits());
        for (const ZipReader::Entry& entry : package.Entries())
            package.ReadAll(entry);
    } catch (const AutomationError& e) {
        return e.what();
    }
    return std::string();
}

} // namespace

TEST(ZipReader, PartsComeBackWhateverTheChunkSize)
{
    const std::string large = Noise(3 << 20);
    const std::string path = WrittenPackage("<small/>", large);
    ZipReader package(path, ImportLimits());
    ASSERT_EQ(package.Entries().size(), 2u);
    EXPECT_EQ(package.ReadAll(*package.Find("small.xml")), "<small/>");
    for (std::size_t chunk : {1u, 7u, 65536u, 1u << 22})
        EXPECT_EQ(ReadInChunks(package, "large.xml", chunk), large) << "chunks of " << chunk;
    EXPECT_EQ(package.Find("Large.xml"), nullptr);
}

TEST(ZipReader, StoredPartsAreCopied)
{
    ZipReader package(HandPackage("a.txt", "plain bytes", 0), ImportLimits());
    EXPECT_EQ(ReadInChunks(package, "a.txt", 3), "plain bytes");
}

TEST(ZipReader, DamageIsNamedWithThePart)
{
    const std::string path = WrittenPackage("<small/>", Noise(200000));
    const std::string good = ReadFile(path);
    const std::size_t largeData = good.find("large.xml") + 9;
    const std::size_t directory = good.find("PK\x01\x02");

    std::string flipped = good;
    flipped[largeData + 5000] = static_cast<char>(flipped[largeData + 5000] ^ 0x5A);
    std::string badCrc = good;
    badCrc[directory + 16] = static_cast<char>(badCrc[directory + 16] ^ 1); // CRC of small.xml
    std::string shortSize = good;
    shortSize[directory + 24] = 3; // small.xml claims 3 bytes

    struct Case {
        std::string bytes;
        const char* why;
    } cases[] = {
        {flipped, "the part large.xml"},
        {badCrc, "the part small.xml fails its checksum"},
        {shortSize, "the part small.xml unpacks to more than the package says"},
        {good.substr(0, good.size() / 2), "no central directory"},
    };
    for (const Case& c : cases) {
        const std::string damaged = sheettest::TempFile("damaged.zip");
        sheettest::WriteFile(damaged, c.bytes);
        const std::string message = ReadFailure(damaged);
        EXPECT_NE(message.find(damaged), std::string::npos) << message;
        EXPECT_NE(message.find(c.why), std::string::npos) << message;
    }
}

TEST(ZipReader, UnreadableMethodsAndEncryptionAreRefused)
{
    EXPECT_NE(ReadFailure(HandPackage("a.xml", "xyz", 12)).find("packed with method 12, which is not read"), std::string::npos);
    EXPECT_NE(ReadFailure(HandPackage("a.xml", "xyz", 0, 1)).find("the part a.xml is encrypted"), std::string::npos);
}
