#pragma once
// Reading a text file line by line, counting lines from 1, as UTF-8 (a byte-order mark passed
// over, UTF-16 converted; see TextFileInput). A line ends at "\n"; a "\r" before it goes too, and
// zero bytes stay. No line is taken whole beyond kLongestTextLine bytes: a file without a line break
// within that many is refused, so no input can make a reader hold more.
//
// Lines come two ways: Next hands out a whole line inside the reader's buffer (the engine, which
// reads every byte), Read copies at most a given number of bytes of a line and passes over the
// rest without holding it (the preview, which shows the start of a line).
#include "platform/system/Status.h"
#include "platform/system/TextFileInput.h"

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace sys {

class TextLineReader {
public:
    // Bytes past the end of every line from Next that may be read, so that a line can be scanned
    // in wide blocks; what they hold is unspecified.
    static constexpr size_t kReadableAfterLine = 64;

    // How a line over the limit is reported. The preview tells what it looked for and did not find,
    // the engine's log what it found; both mean the same limit.
    enum class OverlongLine {
        NoLineBreak, // "no line break within 4194304 bytes; this is not a delimited text file"
        TooLong,     // "the line is longer than 4194304 bytes; this is not a delimited text file"
    };

    // `firstBuffer` bytes are read at a time until a longer line makes Next grow the buffer.
    explicit TextLineReader(OverlongLine wording = OverlongLine::TooLong, size_t firstBuffer = 256 * 1024);
    TextLineReader(const TextLineReader&) = delete;
    TextLineReader& operator=(const TextLineReader&) = delete;

    Status Open(const std::string& path);
    // The next line without its end, valid until the next call. False at the end of the file or on
    // a failure (status() then says which).
    bool Next(std::string_view& line);
    // The next line into `line`, of which at most `keep` bytes are kept (a character cut there is
    // dropped whole); the rest is read past. False at the end of the file or on a failure.
    bool Read(std::string& line, size_t keep = kLongestTextLine);
    // Passes over the next line without keeping it; false at the end of the file or on a failure.
    bool Skip();

    // The number of the line read last, from 1.
    long LineNumber() const { return m_lineNumber; }
    const Status& status() const { return m_status; }
    // Bytes of text taken so far, line ends included.
    std::uint64_t BytesConsumed() const { return m_consumed; }

private:
    size_t Capacity() const { return m_buffer.size() - kReadableAfterLine; }
    // Moves the unread bytes to the buffer's start and reads more behind them, growing the buffer
    // when it is full; false at the end of the file or on a failure.
    bool Refill();
    // Reads to the end of the next line through the buffer as it stands, appending at most
    // `keep` - `line->size()` bytes of it to `line` when given; false when nothing was left.
    bool Walk(std::string* line, size_t keep, size_t& length);
    bool Fail(const std::string& message);
    std::string OverlongMessage() const;

    OverlongLine m_wording;
    size_t m_firstBuffer;
    TextFileInput m_input;
    bool m_open = false;
    std::string m_path;
    std::vector<char> m_buffer;
    size_t m_begin = 0; // first unread byte
    size_t m_end = 0;   // one past the last byte read
    bool m_eof = false;
    long m_lineNumber = 0;
    std::uint64_t m_consumed = 0;
    Status m_status;
};

} // namespace sys
