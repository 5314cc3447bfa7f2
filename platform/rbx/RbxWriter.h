#pragma once
// Streaming writer of rbx0 files. Memory stays constant however many steps are written: the header
// goes out at Open, records follow one by one, and Close patches the step count, the axis kind
// (equidistant when every step is equal), the step or span and the checksums.
#include "platform/rbx/RbxFormat.h"
#include "platform/system/OleDateTime.h"
#include "platform/system/Status.h"

#include <cstdio>
#include <memory>
#include <optional>
#include <vector>

namespace rbx {

// What the caller decides before the first step. The axis kind (equidistant or not) and the number
// of steps are found while writing; `calendar` picks between the calendar and the relative kinds.
struct FileDefinition {
    CString title;
    bool calendar = true;
    int timeUnitKey = 1400; // seconds
    CString timeUnitText = "second";
    // Calendar axes: the time all step times count from. When left empty it becomes the first step's
    // stamp (WriteStepAt), or 1899-12-30 00:00:00 for steps given as plain times.
    std::optional<COleDateTime> calendarStart;
    double startOffset = 0.0;
    int startIndex = 0;
    std::vector<ItemInfo> items;
};

class CRbxWriter {
public:
    CRbxWriter();
    ~CRbxWriter(); // closes an open file as Close does
    CRbxWriter(const CRbxWriter&) = delete;
    CRbxWriter& operator=(const CRbxWriter&) = delete;

    // Creates `path` (replacing it) and writes the header; fails naming the file and the cause.
    sys::Status Open(const CString& path, const FileDefinition& definition);

    // One step: `time` in axis units from the axis start, strictly greater than the previous step's;
    // `values` holds ValueCount() doubles in item order, each converted to its item's data type
    // (rounded to the nearest integer for integer types; NaN stores the item's delete value).
    bool WriteStep(double time, const double* values);
    // A calendar step at `stamp`; the time written is the distance from the calendar start in the
    // axis unit, counted in whole milliseconds.
    bool WriteStepAt(const COleDateTime& stamp, const double* values);
    // One step whose values are already packed little-endian in the items' data types
    // (RecordSize() - 8 bytes).
    bool WriteRawStep(double time, const void* packedValues);

    // Patches the header and closes the file; fails when any write failed.
    sys::Status Close();
    bool IsOpen() const;

    std::size_t ValueCount() const;
    std::uint32_t RecordSize() const;
    std::uint64_t StepCount() const;
    // How the last call ended; a failed step leaves the file failed.
    const sys::Status& status() const { return m_status; }

private:
    bool Fail(const CString& what);
    bool OpenFile(const CString& path, const FileDefinition& definition);
    bool CloseFile();
    bool CheckTime(double time);
    bool PackValues(const double* values);
    bool AppendRecord(double time);
    // Counts the record just placed in the buffer and writes the buffer out when it is full.
    bool RecordAppended(double time);
    bool FlushBuffer();
    bool PatchHeader();

    struct State;
    std::unique_ptr<State> m_state;
    sys::Status m_status;
};

} // namespace rbx
