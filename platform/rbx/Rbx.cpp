#include "platform/rbx/Rbx.h"

#include "platform/rbx/RbxReader.h"
#include "platform/system/Text.h"

#include <climits>
#include <cstring>
#include <memory>
#include <vector>

struct rbxItem {
    rbx::ItemInfo info;
    std::size_t offset = 0; // of the item's values in a record
};

struct rbxHeader {
    rbx::FileHeader header;
    std::vector<rbxItem> items;
};

struct rbxFile {
    rbx::CRbxReader reader;
    std::vector<unsigned char> block;
    std::size_t blockSteps = 0;
    std::size_t blockPos = 0;
    std::size_t itemCursor = 0;
};

namespace {

thread_local CString t_lastError;

int Failure(const CString& message)
{
    t_lastError = message;
    return 1;
}

template <typename T>
void Out(T* address, const T& value)
{
    if (address)
        *address = value;
}

int AxisOutputs(const rbxHeader* header, int wantedType, CString* startDate, CString* startTime, int* unitKey,
                CString* unitText, double* start, double* step, int* steps, int* index)
{
    if (!header)
        return Failure("no file header");
    const rbx::TimeAxis& axis = header->header.axis;
    if (axis.type != wantedType)
        return Failure(text::Format("the time axis is of type %d, not %d", axis.type, wantedType));
    Out(startDate, axis.startDate);
    Out(startTime, axis.startTime);
    Out(unitKey, axis.unitKey);
    Out(unitText, axis.unitText);
    Out(start, axis.startOffset);
    Out(step, axis.step);
    Out(steps, static_cast<int>(axis.steps));
    Out(index, axis.startIndex);
    return 0;
}

std::unique_ptr<rbxHeader> MakeHeader(const rbx::FileHeader& fileHeader)
{
    auto header = std::make_unique<rbxHeader>();
    header->header = fileHeader;
    std::size_t offset = 8;
    for (const rbx::ItemInfo& info : fileHeader.items) {
        header->items.push_back({info, offset});
        offset += info.ValueBytes();
    }
    return header;
}

// Makes the next record current; false at the end of the data or on damage.
bool NextRecord(rbxFile& file, std::uint32_t recordSize)
{
    if (file.blockPos + 1 < file.blockSteps) {
        ++file.blockPos;
        return true;
    }
    const std::size_t want = std::max<std::size_t>(1, (1u << 20) / recordSize);
    const std::uint64_t left = file.reader.Header().axis.steps - file.reader.StepsRead();
    file.block.resize(static_cast<std::size_t>(std::min<std::uint64_t>(want, left)) * recordSize);
    std::size_t got = 0;
    if (!file.reader.ReadRawSteps(want, file.block.data(), got)) {
        t_lastError = file.reader.status().problem().Describe();
        return false;
    }
    if (got == 0) {
        t_lastError = "no more time steps";
        return false;
    }
    file.blockSteps = got;
    file.blockPos = 0;
    return true;
}

} // namespace

int rbxInitSystem()
{
    t_lastError.clear();
    return 0;
}

int rbxFileRead(const char* path, rbxHeader** header, rbxFile** file)
{
    Out<rbxHeader*>(header, nullptr);
    Out<rbxFile*>(file, nullptr);
    if (!path || !header || !file)
        return Failure("rbxFileRead needs a path and two outputs");
    auto opened = std::make_unique<rbxFile>();
    if (const sys::Status status = opened->reader.Open(path, rbx::VerifyChecksum::AtOpen); !status)
        return Failure(status.problem().Describe());
    if (opened->reader.Header().axis.steps > static_cast<std::uint64_t>(INT_MAX))
        return Failure(CString(path) + ": more time steps than this call can count");
    *header = MakeHeader(opened->reader.Header()).release();
    *file = opened.release();
    return 0;
}

int rbxGetFileType(const rbxHeader* header) { return header ? header->header.fileType : 0; }
int rbxGetDataType(const rbxHeader* header) { return header ? header->header.dataType : 0; }
int rbxGetTimeAxisType(const rbxHeader* header) { return header ? header->header.axis.type : 0; }
int rbxGetNoOfItems(const rbxHeader* header) { return header ? static_cast<int>(header->items.size()) : 0; }

int rbxGetEqTimeAxis(const rbxHeader* header, int* unitKey, CString* unitText, double* start, double* step, int* steps,
                     int* index)
{
    return AxisOutputs(header, rbx::kEquidistantRelative, nullptr, nullptr, unitKey, unitText, start, step, steps, index);
}

int rbxGetNeqTimeAxis(const rbxHeader* header, int* unitKey, CString* unitText, double* start, double* span, int* steps,
                      int* index)
{
    return AxisOutputs(header, rbx::kNonEquidistantRelative, nullptr, nullptr, unitKey, unitText, start, span, steps, index);
}

int rbxGetEqCalendarAxis(const rbxHeader* header, CString* startDate, CString* startTime, int* unitKey,
                         CString* unitText, double* start, double* step, int* steps, int* index)
{
    return AxisOutputs(header, rbx::kEquidistantCalendar, startDate, startTime, unitKey, unitText, start, step, steps, index);
}

int rbxGetNeqCalendarAxis(const rbxHeader* header, CString* startDate, CString* startTime, int* unitKey,
                          CString* unitText, double* start, double* span, int* steps, int* index)
{
    return AxisOutputs(header, rbx::kNonEquidistantCalendar, startDate, startTime, unitKey, unitText, start, span, steps,
                       index);
}

rbxItem* rbxItemD(rbxHeader* header, int i)
{
    if (!header || i < 1 || i > static_cast<int>(header->items.size()))
        return nullptr;
    return &header->items[static_cast<std::size_t>(i - 1)];
}

int rbxGetItemAxisType(const rbxItem* item) { return item ? item->info.axisType : 0; }

int rbxGetItemInfo(const rbxItem* item, int* typeKey, CString* typeText, CString* name, int* unitKey, CString* unitText,
                   int* dataType)
{
    if (!item)
        return Failure("no item");
    Out(typeKey, item->info.itemTypeKey);
    Out(typeText, item->info.itemTypeText);
    Out(name, item->info.name);
    Out(unitKey, item->info.unitKey);
    Out(unitText, item->info.unitText);
    Out(dataType, item->info.dataType);
    return 0;
}

int rbxGetItemValueType(const rbxItem* item, int* valueType)
{
    if (!item)
        return Failure("no item");
    Out(valueType, item->info.valueType);
    return 0;
}

int rbxGetItemElementCount(const rbxItem* item) { return item ? static_cast<int>(item->info.elementCount) : 0; }

int rbxGetItemDeleteValue(const rbxItem* item, double* deleteValue)
{
    if (!item)
        return Failure("no item");
    Out(deleteValue, item->info.deleteValue);
    return 0;
}

int rbxGetTitle(const rbxHeader* header, CString* title)
{
    if (!header)
        return Failure("no file header");
    Out(title, header->header.title);
    return 0;
}

int rbxReadItemTimeStep(rbxHeader* header, rbxFile* file, double* time, void* value)
{
    if (!header || !file || !file->reader.IsOpen())
        return Failure("no open file");
    if (header->items.empty())
        return Failure("the file has no items");
    const std::uint32_t recordSize = file->reader.Header().recordSize;
    if (header->header.recordSize != recordSize || header->items.size() != file->reader.Header().items.size())
        return Failure("the header and the file handle belong to different files");
    if (file->itemCursor == 0 && !NextRecord(*file, recordSize))
        return 1;
    const unsigned char* record = file->block.data() + file->blockPos * recordSize;
    const rbxItem& item = header->items[file->itemCursor];
    if (time)
        std::memcpy(time, record, sizeof(double));
    if (value)
        std::memcpy(value, record + item.offset, item.info.ValueBytes());
    if (++file->itemCursor == header->items.size())
        file->itemCursor = 0;
    return 0;
}

// The handles are the library's own allocations, handed out by rbxFileRead as the C calls require.
void rbxFileClose(rbxHeader* /*header*/, rbxFile* file) { delete file; }

void rbxHeaderDestroy(rbxHeader* header) { delete header; }

const char* rbxLastError() { return t_lastError.c_str(); }
