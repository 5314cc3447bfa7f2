#pragma once
// The first rows of a workbook's sheet as a sample: each cell with the text the sheet shows, its
// number, and whether its format shows the number as a date or a time.
#include "guess/Sample.h"

#include <string>

namespace guess {

// Reads at most `maxRows` rows of the first sheet that holds cells. False with `error` naming the
// file and the cause when the workbook cannot be read.
bool ReadSheetSample(const std::string& path, size_t maxRows, Sample& sample, std::string& error);

} // namespace guess
