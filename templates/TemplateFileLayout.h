#pragma once
// What a template file holds: the root and extension element names and, for each root attribute in
// write order, the template value it carries and how that value is spelled.
#include "templates/Specification.h"

#include <span>

namespace tmplfile {

enum class ValueForm {
    Number,      // "%d"
    NumberLine,  // "%d\n"
    Text,
    Flag,        // written "true" when the value is not 0
    FlagWhenOne, // written "true" only when the value is exactly 1
    SelItems,    // the selected items, "1,2,3"
};

struct AttributeRule {
    const char* name;
    ValueForm form;
    int* (*number)(CSpecification&);   // every form but Text and SelItems
    CString* (*text)(CSpecification&); // Text
    // Read after all other attributes, so that it overrides a flag naming the same value.
    bool overrides = false;
};

struct FileLayout {
    const char* kind; // "ascii" or "excel"
    const char* root;
    const char* extension;
    std::span<const AttributeRule> attributes;
    bool flagTrueIgnoresCase; // "TRUE" reads as true
};

const FileLayout& AsciiFileLayout();
const FileLayout& ExcelFileLayout();

} // namespace tmplfile
