#pragma once
// Reading and writing template files as XML documents. A template file is small and machine-written,
// so anything unusual (oversized, a DTD, absurd nesting, a value that is not what its attribute
// needs) fails the whole load with a message rather than being half-read.
#include "platform/system/Status.h"
#include "templates/TemplateFileLayout.h"

#include <pugixml.hpp>

#include <cstddef>
#include <exception>
#include <string>
#include <string_view>

namespace tmplfile {

inline constexpr size_t kMaxFileBytes = 16u << 20;
inline constexpr size_t kMaxValueBytes = 1u << 20;
inline constexpr size_t kMaxItemDefinitions = 100000;
inline constexpr int kMaxElementDepth = 1000;

inline constexpr const char* kDeclarationData = "version='1.0'   encoding='UTF-16'";
inline constexpr const char* kSchemaInstanceNamespace = "http://www.w3.org/2001/XMLSchema-instance";

// Reads at most kMaxFileBytes of `path`; fails when the file cannot be read or is larger.
sys::Status ReadFileBytes(const CString& path, std::string& bytes);

// The text of a file in UTF-8, from UTF-8 (with or without a byte-order mark; a file that is not
// well-formed UTF-8 is read as Windows-1252, text::ToUtf8) or UTF-16 of either byte order (told by
// its byte-order mark, or by the first character being "<").
sys::Status DecodeToUtf8(std::string_view bytes, std::string& utf8);

// Parses a template file's bytes; a problem names the file `name`. Refuses DTDs and deep nesting.
sys::Status ParseDocument(std::string_view bytes, const CString& name, pugi::xml_document& document);

// The first element called `name` anywhere in the document, in document order; null when none.
pugi::xml_node FindElement(const pugi::xml_document& document, const char* name);

// Fills the template from the document by `layout`; fails (the template partly filled) on a bad value.
sys::Status ReadTemplate(const pugi::xml_document& document, const FileLayout& layout, const CString& name,
                         CSpecification& spec);

// Writes the template by `layout` as UTF-16 (little endian, with byte-order mark) to `path`.
sys::Status WriteTemplate(CSpecification& spec, const FileLayout& layout, const CString& path);

// The file contents WriteTemplate would write, for callers that store them elsewhere; throws
// std::bad_alloc when the document cannot be built.
std::string RenderTemplate(CSpecification& spec, const FileLayout& layout);

// The common body of both kinds' Load: reads into a copy and commits it only when everything was good.
template <class Spec>
sys::Status LoadInto(Spec& spec, const FileLayout& layout, std::string_view bytes, const CString& path)
{
    try {
        pugi::xml_document document;
        if (sys::Status parsed = ParseDocument(bytes, path, document); !parsed)
            return parsed;
        Spec staged(spec);
        if (sys::Status read = ReadTemplate(document, layout, path, staged); !read)
            return read;
        spec = staged;
        return sys::Status::Ok();
    } catch (const std::exception& e) {
        return sys::Status::Fail(path, 0, std::string("cannot be read: ") + e.what());
    }
}

} // namespace tmplfile
