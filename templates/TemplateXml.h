#pragma once
// Reading and writing template files as XML documents. A template file is small and machine-written,
// so anything unusual (oversized, a DTD, absurd nesting, a value that is not what its attribute
// needs) fails the whole load with a message rather than being half-read.
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

// Reads at most kMaxFileBytes of `path`; false with `error` set when the file cannot be read or is larger.
bool ReadFileBytes(const CString& path, std::string& bytes, CString& error);

// The text of a file in UTF-8, from UTF-8 (with or without a byte-order mark; a file that is not
// well-formed UTF-8 is read as Windows-1252, text::ToUtf8) or UTF-16 of either byte order (told by
// its byte-order mark, or by the first character being "<").
bool DecodeToUtf8(std::string_view bytes, std::string& utf8, CString& error);

// Parses a template file's bytes; `name` is used in messages. Refuses DTDs and deep nesting.
bool ParseDocument(std::string_view bytes, const CString& name, pugi::xml_document& document, CString& error);

// The first element called `name` anywhere in the document, in document order; null when none.
pugi::xml_node FindElement(const pugi::xml_document& document, const char* name);

// Fills the template from the document by `layout`; false with `error` set (and the template partly filled) on a bad value.
bool ReadTemplate(const pugi::xml_document& document, const FileLayout& layout, const CString& name,
                  CSpecification& spec, CString& error);

// Writes the template by `layout` as UTF-16 (little endian, with byte-order mark) to `path`.
bool WriteTemplate(CSpecification& spec, const FileLayout& layout, const CString& path, CString& error);

// The file contents WriteTemplate would write, for callers that store them elsewhere; throws
// std::bad_alloc when the document cannot be built.
std::string RenderTemplate(CSpecification& spec, const FileLayout& layout);

// The common body of both kinds' Load: reads into a copy and commits it only when everything was good.
template <class Spec>
int LoadInto(Spec& spec, const FileLayout& layout, std::string_view bytes, const CString& path, CString& error)
{
    try {
        pugi::xml_document document;
        if (!ParseDocument(bytes, path, document, error))
            return 0;
        Spec staged(spec);
        if (!ReadTemplate(document, layout, path, staged, error))
            return 0;
        spec = staged;
        error.clear();
        return 1;
    } catch (const std::exception& e) {
        error = path + ": cannot be read: " + e.what();
        return 0;
    }
}

} // namespace tmplfile
