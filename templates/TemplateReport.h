#pragma once
// Opening a template file of either kind and listing its values, for people (text) and programs (JSON).
#include "templates/Specification.h"

#include <memory>
#include <ostream>

namespace tmplfile {

struct FileLayout;

struct OpenedTemplate {
    std::unique_ptr<CSpecification> spec;
    const FileLayout* layout = nullptr; // the kind's file layout; its `kind` is "ascii" or "excel"
};

// Loads `path` into `opened`, a template of the kind its root element names; on failure `opened`
// holds no template.
sys::Status OpenTemplateFile(const CString& path, OpenedTemplate& opened);

// A new template with the defaults; `kind` is "ascii" or "excel", anything else gives null.
OpenedTemplate NewTemplate(const CString& kind);

// Every value by its ASCII file key, then the Excel-only values by their Excel keys, then the items.
void WriteTemplateText(CSpecification& spec, const FileLayout& layout, std::ostream& out);
// The same as one JSON object {"kind", "values", "items"}.
void WriteTemplateJson(CSpecification& spec, const FileLayout& layout, std::ostream& out);

} // namespace tmplfile
