#pragma once
// The one way the readers of text files open them. Only regular files open: a FIFO or a device could
// keep a reader waiting or feed it without end. The bytes come out as UTF-8: a UTF-8 byte-order mark
// is passed over, UTF-16 of either byte order (told by its mark, or by a zero byte beside the first
// character) is converted as it is read, and UTF-32 is refused.
#include "platform/system/Status.h"

#include <cstdint>
#include <cstdio>
#include <string>

namespace sys {

// The longest line a reader of delimited text takes; a file without a line break within this many
// bytes is not such a file.
inline constexpr size_t kLongestTextLine = 4 * 1024 * 1024;

class TextFileInput {
public:
    TextFileInput() = default;
    ~TextFileInput();
    TextFileInput(const TextFileInput&) = delete;
    TextFileInput& operator=(const TextFileInput&) = delete;

    // Fails naming the file and why it cannot be read as text.
    Status Open(const std::string& path);
    // Up to `capacity` bytes of the text as UTF-8 into `out`; 0 at the end of the file or on a
    // failure, which status() then describes.
    size_t Read(char* out, size_t capacity);

    // Failed once a read failed or the text turned out to be broken.
    Status status() const { return m_error.empty() ? Status::Ok() : Status::Fail(m_path, 0, m_error); }
    bool IsUtf16() const { return m_encoding != Encoding::Utf8; }
    // Bytes of the file read so far, byte-order mark included.
    std::uint64_t FileBytesRead() const { return m_fileBytes; }

private:
    enum class Encoding { Utf8, Utf16LittleEndian, Utf16BigEndian };

    bool TellEncoding();
    size_t ReadUtf8(char* out, size_t capacity);
    size_t ReadUtf16(char* out, size_t capacity);
    // Converts the whole UTF-16 units of m_pending onto m_decoded, keeping an odd byte or a high
    // surrogate whose partner has not been read yet.
    void DecodePending();
    size_t ReadFile(char* out, size_t length);

    std::string m_path;
    std::FILE* m_file = nullptr;
    Encoding m_encoding = Encoding::Utf8;
    std::string m_pending; // bytes read but not handed out (UTF-8) or not converted yet (UTF-16)
    std::string m_decoded; // UTF-16 converted, handed out from m_decodedAt on
    size_t m_decodedAt = 0;
    std::string m_error;
    std::uint64_t m_fileBytes = 0;
    bool m_atEnd = false;
};

} // namespace sys
