#pragma once
// Puts right the two checksums of an rbx0 file's bytes, so that damage made on purpose reaches the
// header and data checks behind them.
#include <vector>

namespace testsupport {

// Leaves `bytes` alone when they are too short to hold a header or name a header size past their end.
void RepairRbxChecksums(std::vector<unsigned char>& bytes);

} // namespace testsupport
