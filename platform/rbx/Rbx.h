#pragma once
// The rbx data-file calls in the C style the preview parser uses: opaque handles, outputs by address
// (a null address skips that output), 0 for success where a status is returned. A failing call
// leaves a message naming the file and the problem in rbxLastError().
#include "platform/system/Types.h"

struct rbxHeader;
struct rbxFile;
struct rbxItem;

// Prepares the library (clears the last error). Always 0.
int rbxInitSystem();
// Opens `path`, checks its header and data checksum, and gives a header and a file handle positioned
// at the first time step. 0 on success; otherwise both outputs are null.
int rbxFileRead(const char* path, rbxHeader** header, rbxFile** file);

// The file's type (1 or 4), its common data type (0 when items differ), its time axis type (1..4),
// its item count; 0 for a null header.
int rbxGetFileType(const rbxHeader* header);
int rbxGetDataType(const rbxHeader* header);
int rbxGetTimeAxisType(const rbxHeader* header);
int rbxGetNoOfItems(const rbxHeader* header);

// The time axis, each call for its own axis type (nonzero when the file has another). `step` is the
// time step; the non-equidistant calls give the span (last time minus first) in its place.
int rbxGetEqTimeAxis(const rbxHeader* header, int* unitKey, CString* unitText, double* start,
                     double* step, int* steps, int* index);
int rbxGetNeqTimeAxis(const rbxHeader* header, int* unitKey, CString* unitText, double* start,
                      double* span, int* steps, int* index);
int rbxGetEqCalendarAxis(const rbxHeader* header, CString* startDate, CString* startTime, int* unitKey,
                         CString* unitText, double* start, double* step, int* steps, int* index);
int rbxGetNeqCalendarAxis(const rbxHeader* header, CString* startDate, CString* startTime, int* unitKey,
                          CString* unitText, double* start, double* span, int* steps, int* index);

// Item `i`, 1-based; null when there is none. The handle lives as long as the header.
rbxItem* rbxItemD(rbxHeader* header, int i);
int rbxGetItemAxisType(const rbxItem* item);
int rbxGetItemInfo(const rbxItem* item, int* typeKey, CString* typeText, CString* name, int* unitKey,
                   CString* unitText, int* dataType);
int rbxGetItemValueType(const rbxItem* item, int* valueType);
// Values per step of the item (1 for scalar items).
int rbxGetItemElementCount(const rbxItem* item);
int rbxGetItemDeleteValue(const rbxItem* item, double* deleteValue);
int rbxGetTitle(const rbxHeader* header, CString* title);

// The next value in file order (per step, the items in order): the step's time in axis units and
// the item's value written at `value` in its data type (a profile item writes all its values).
// Nonzero after the last value or on damaged data.
int rbxReadItemTimeStep(rbxHeader* header, rbxFile* file, double* time, void* value);

void rbxFileClose(rbxHeader* header, rbxFile* file);
void rbxHeaderDestroy(rbxHeader* header);

// The message of the last failing call on this thread; empty when none failed.
const char* rbxLastError();
