#pragma once
// The plain types the plug-in's classes are written in: text is UTF-8 in std::string, lists of
// unsigned item numbers are vectors.
#include <string>
#include <vector>

using CString = std::string;
using CUIntArray = std::vector<unsigned>;
using CStringList = std::vector<std::string>;
