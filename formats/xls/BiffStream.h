#pragma once
// The record layer of an .xls workbook stream (BIFF5 and BIFF8): records of a 16-bit id, a
// 16-bit length and a body, where a body too long for one record goes on in CONTINUE records.
// Every read is bounds-checked against the record it belongs to; damage throws AutomationError
// naming the file and the byte where the faulty record starts.
#include <cstddef>
#include <cstdint>
#include <functional>
#include <span>
#include <string>
#include <vector>

namespace sheet {

struct BiffRecord {
    unsigned id = 0;
    std::uint64_t offset = 0; // of the record's header in the stream
    std::span<const unsigned char> body;
};

// How texts of the stream are stored: BIFF8 texts are UTF-16 (optionally with their high bytes
// left out); BIFF5 texts are bytes in the workbook's code page.
struct BiffTextForm {
    bool biff8 = true;
    unsigned codePage = 1252;
};

// Reads the body of one record and of the CONTINUE records that carry it on.
class BiffCursor {
public:
    // Thrown when a read runs past the last segment; `inText` when it happened within a text.
    struct Short {
        bool inText = false;
    };
    // Thrown for a byte text beyond ASCII in a code page that is not read.
    struct ForeignCodePage {
        unsigned codePage = 0;
    };

    explicit BiffCursor(std::vector<std::span<const unsigned char>> segments);
    explicit BiffCursor(std::span<const unsigned char> body) : BiffCursor(std::vector{body}) {}
    // Over bodies it holds itself.
    explicit BiffCursor(std::vector<std::vector<unsigned char>> bodies);
    BiffCursor(BiffCursor&&) = default;
    BiffCursor(const BiffCursor&) = delete;
    BiffCursor& operator=(const BiffCursor&) = delete;

    std::uint8_t U8();
    std::uint16_t U16();
    std::uint32_t U32();
    double F64();
    void Skip(std::uint64_t count);
    bool AtEnd();

    // A text with a character count of `countBytes` (1 or 2) bytes in front, as UTF-8.
    std::string Text(const BiffTextForm& form, unsigned countBytes);

private:
    void ReadBytes(unsigned char* out, std::size_t count);
    bool NextSegment();
    void ReadCharacters(unsigned count, bool wide, bool continuedWithOptions, std::u16string& units);
    void ReadCodePageBytes(unsigned count, unsigned codePage, std::u16string& units);

    std::vector<std::vector<unsigned char>> m_owned; // what m_segments point into, when held here
    std::vector<std::span<const unsigned char>> m_segments;
    std::size_t m_segment = 0;
    std::size_t m_at = 0;
};

// The records of a workbook stream, read through a window of the stream, so that a large stream
// is never held whole.
class BiffStream {
public:
    // Copies `size` bytes from `offset` of the stream to `out`.
    using Source = std::function<void(std::uint64_t offset, unsigned char* out, std::size_t size)>;

    // `path` only names the file in messages.
    BiffStream(std::string path, std::uint64_t size, Source read);

    // Goes to the record whose header starts at `offset`; false when it lies outside the stream.
    bool Seek(std::uint64_t offset);
    // The next record, false at the end of the stream; throws on a record cut short or too long.
    // Its body stays readable until the next call of Next or Continued.
    bool Next(BiffRecord& record);
    // A cursor over `record` and the CONTINUE records right after it, which it steps past.
    BiffCursor Continued(const BiffRecord& record);

    [[noreturn]] void Fail(const BiffRecord& record, const std::string& why) const;
    [[noreturn]] void Fail(const std::string& why) const;

private:
    // The bytes [offset, offset + count) of the stream, from the window (moved there if need be).
    const unsigned char* Bytes(std::uint64_t offset, std::size_t count);

    std::string m_path;
    std::uint64_t m_size = 0;
    Source m_read;
    std::vector<unsigned char> m_window;
    std::uint64_t m_windowStart = 0;
    std::size_t m_windowBytes = 0;
    std::uint64_t m_at = 0;
};

// The text of a cell error code ("#N/A", "#DIV/0!", ...); "#N/A" for unknown codes.
const char* BiffErrorText(unsigned code);

// The value of an RK number: a 30-bit integer or the high bits of a double, optionally / 100.
double RkValue(std::uint32_t rk);

} // namespace sheet
