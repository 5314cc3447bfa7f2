#pragma once
// Streaming reader of rbx0 files: Open reads and checks the header, then the steps come in blocks
// into the caller's buffers. Every count and length is checked against the file's size before
// anything is allocated; the data checksum is verified at Open for small files and when the last
// step has been read for large ones (or as the caller asks).
#include "platform/rbx/RbxFormat.h"
#include "platform/rbx/RbxValueCodec.h"
#include "platform/system/Status.h"

#include <cstdio>
#include <memory>

namespace rbx {

enum class VerifyChecksum {
    Auto,   // at Open when the data are at most kVerifyAtOpenLimit bytes, else at the end
    AtOpen, // reads the data once at Open
    AtEnd,  // while streaming; the read that returns the last step fails on a mismatch
};

inline constexpr std::uint64_t kVerifyAtOpenLimit = 16u << 20;

class CRbxReader {
public:
    CRbxReader();
    ~CRbxReader();
    CRbxReader(const CRbxReader&) = delete;
    CRbxReader& operator=(const CRbxReader&) = delete;

    // Fails naming the file and what is wrong.
    sys::Status Open(const CString& path, VerifyChecksum verify = VerifyChecksum::Auto);
    void Close();
    bool IsOpen() const;

    const FileHeader& Header() const;
    std::uint64_t StepsRead() const;
    bool AtEnd() const;

    // Reads up to `maxSteps` steps: times[s] in axis units, values[s * ValueCount() + v] converted to
    // double. `stepsRead` is 0 at the end of the data. False on a damaged file (status() says why).
    bool ReadSteps(std::size_t maxSteps, double* times, double* values, std::size_t& stepsRead);
    // The same, the records as stored: RecordSize() bytes each, an 8-byte time and packed values.
    bool ReadRawSteps(std::size_t maxSteps, unsigned char* records, std::size_t& stepsRead);

    // How the last Open or read ended.
    const sys::Status& status() const { return m_status; }

private:
    bool Fail(const CString& what);
    bool OpenFile(const CString& path, VerifyChecksum verify);
    bool ReadHeader(VerifyChecksum verify);
    bool VerifyDataChecksum();
    bool ReadRecords(std::size_t count, unsigned char* records);
    bool CheckTimes(const unsigned char* records, std::size_t count);

    struct State;
    std::unique_ptr<State> m_state;
    sys::Status m_status;
};

} // namespace rbx
