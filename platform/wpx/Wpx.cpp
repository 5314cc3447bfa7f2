// The public calls over the document model and the handle table.
#include "platform/wpx/Wpx.h"
#include "platform/wpx/WpxModel.h"
#include "platform/system/FileSystem.h"

#include <cstdint>
#include <cstdio>
#include <filesystem>
#include <fstream>

using namespace wpx;

namespace {

// Files larger than this are refused rather than read into memory.
constexpr std::uintmax_t kMaxDocumentBytes = 64u << 20;

Container* OpenContainer(WPXHANDLE doc)
{
    Document* document = FindDocument(doc);
    return document && !document->open.empty() ? document->open.back() : nullptr;
}

Keyword* AddKeywordHere(WPXHANDLE doc, const CString& key)
{
    Container* container = OpenContainer(doc);
    if (!container)
        return nullptr;
    Keyword& keyword = container->AddKeyword(key);
    container->doc->lastKeyword = &keyword;
    return &keyword;
}

Param* FindParamOf(WPXHANDLE section, const CString& key, int keyNum, int paramNum)
{
    Keyword* keyword = FindKeyword(wpxKeywordByNameNum(section, key, keyNum));
    if (!keyword || paramNum < 1 || paramNum > static_cast<int>(keyword->params.size()))
        return nullptr;
    return keyword->params[paramNum - 1].get();
}

// The folder of `path` as an absolute path, so that relative file names read from the document
// do not depend on where the reader runs.
std::string AbsoluteFolderOf(const CString& path)
{
    std::error_code ec;
    std::filesystem::path absolute = std::filesystem::absolute(std::filesystem::path(path), ec);
    if (ec)
        return sys::FolderOf(path);
    return absolute.parent_path().lexically_normal().string();
}

} // namespace

int wpxHandleToInt(WPXHANDLE handle) { return static_cast<int>(reinterpret_cast<std::intptr_t>(handle)); }

WPXHANDLE wpxHandleFromInt(int handle) { return ToHandle(handle); }

WPXHANDLE wpxCreate() { return Register(std::make_unique<Document>()); }

int wpxAddTarget(WPXHANDLE doc, const CString& name)
{
    Document* document = FindDocument(doc);
    if (!document || !document->open.empty())
        return 0;
    document->open.push_back(&document->AddTarget(name));
    document->lastKeyword = nullptr;
    return 1;
}

int wpxAddSection(WPXHANDLE doc, const CString& name)
{
    Container* container = OpenContainer(doc);
    if (!container)
        return 0;
    container->doc->open.push_back(&container->AddSection(name));
    container->doc->lastKeyword = nullptr;
    return 1;
}

int wpxEndSection(WPXHANDLE doc)
{
    Document* document = FindDocument(doc);
    if (!document || document->open.empty())
        return 0;
    document->open.pop_back();
    document->lastKeyword = nullptr;
    return 1;
}

int wpxPutParam(WPXHANDLE doc, const CString& key, int value)
{
    Keyword* keyword = AddKeywordHere(doc, key);
    if (!keyword)
        return 0;
    keyword->AddParam(wpxInt).intValue = value;
    return 1;
}

int wpxPutParam(WPXHANDLE doc, const CString& key, const CString& value)
{
    Keyword* keyword = AddKeywordHere(doc, key);
    if (!keyword)
        return 0;
    keyword->AddParam(wpxText).text = value;
    return 1;
}

int wpxPutParamFilename(WPXHANDLE doc, const CString& key, const char* value)
{
    Keyword* keyword = AddKeywordHere(doc, key);
    if (!keyword)
        return 0;
    keyword->AddParam(wpxFilename).text = value ? value : "";
    return 1;
}

int wpxAddKeyword(WPXHANDLE doc, const CString& key) { return AddKeywordHere(doc, key) ? 1 : 0; }

int wpxAddInt(WPXHANDLE doc, int value)
{
    Document* document = FindDocument(doc);
    if (!document || !document->lastKeyword)
        return 0;
    document->lastKeyword->AddParam(wpxInt).intValue = value;
    return 1;
}

CString wpxFormat(WPXHANDLE doc)
{
    Document* document = FindDocument(doc);
    return document ? Format(*document) : CString();
}

int wpxWrite(WPXHANDLE doc, const CString& path)
{
    Document* document = FindDocument(doc);
    if (!document || path.empty())
        return 0;
    std::string text = Format(*document);
    std::FILE* file = std::fopen(path.c_str(), "wb");
    if (!file)
        return 0;
    bool written = std::fwrite(text.data(), 1, text.size(), file) == text.size();
    bool closed = std::fclose(file) == 0;
    return written && closed ? 1 : 0;
}

int wpxClose(WPXHANDLE* doc)
{
    if (!doc)
        return 0;
    bool released = Release(*doc);
    *doc = nullptr;
    return released ? 1 : 0;
}

int wpxParse(const CString& text, const CString& sourceName, const CString& baseFolder, WPXHANDLE* doc,
             CString* error)
{
    if (!doc)
        return 0;
    *doc = nullptr;
    auto document = std::make_unique<Document>();
    std::string message;
    if (!Parse(text, sourceName, baseFolder, *document, message)) {
        if (error)
            *error = message;
        return 0;
    }
    *doc = Register(std::move(document));
    if (!*doc && error)
        *error = sourceName + ": too many parameter documents are open";
    return *doc ? 1 : 0;
}

int wpxRead(const CString& path, WPXHANDLE* doc, CString* error)
{
    if (!doc)
        return 0;
    *doc = nullptr;
    CString ignored;
    CString& message = error ? *error : ignored;
    const CString shownPath = path.empty() ? CString("(no file name)") : path;
    std::error_code ec;
    if (std::filesystem::is_directory(path, ec)) {
        message = shownPath + ": is a folder; expected a parameter document";
        return 0;
    }
    if (std::filesystem::exists(path, ec) && !std::filesystem::is_regular_file(path, ec)) {
        message = shownPath + ": is not a regular file; expected a parameter document";
        return 0;
    }
    std::ifstream in(path, std::ios::binary);
    if (path.empty() || !in) {
        message = shownPath + ": cannot open the parameter document";
        return 0;
    }
    std::uintmax_t size = std::filesystem::file_size(path, ec);
    if (ec || size > kMaxDocumentBytes) {
        message = shownPath + (ec ? ": cannot tell the size of the parameter document"
                                  : ": the file is larger than 64 MiB; expected a parameter document");
        return 0;
    }
    std::string content(static_cast<size_t>(size), '\0');
    in.read(content.data(), static_cast<std::streamsize>(content.size()));
    if (in.bad()) {
        message = shownPath + ": cannot read the parameter document";
        return 0;
    }
    content.resize(static_cast<size_t>(in.gcount())); // shorter if the file shrank meanwhile
    return wpxParse(content, path, AbsoluteFolderOf(path), doc, &message);
}

WPXHANDLE wpxTargetByNum(WPXHANDLE doc, int n)
{
    Document* document = FindDocument(doc);
    if (!document || n < 1 || n > static_cast<int>(document->targets.size()))
        return nullptr;
    return HandleOf(document->targets[n - 1].get());
}

WPXHANDLE wpxSectionByNum(WPXHANDLE section, int n)
{
    Container* container = FindContainer(section);
    if (!container || n < 1)
        return nullptr;
    for (Entry& entry : container->entries)
        if (entry.section && --n == 0)
            return HandleOf(entry.section.get());
    return nullptr;
}

WPXHANDLE wpxSectionByNameNum(WPXHANDLE section, const CString& name, int n)
{
    Container* container = FindContainer(section);
    if (!container || n < 1)
        return nullptr;
    for (Entry& entry : container->entries)
        if (entry.section && entry.section->name == name && --n == 0)
            return HandleOf(entry.section.get());
    return nullptr;
}

WPXHANDLE wpxKeywordByNameNum(WPXHANDLE section, const CString& name, int n)
{
    Container* container = FindContainer(section);
    if (!container || n < 1)
        return nullptr;
    for (Entry& entry : container->entries)
        if (entry.keyword && entry.keyword->name == name && --n == 0)
            return HandleOf(entry.keyword.get());
    return nullptr;
}

CString wpxGetName(WPXHANDLE handle)
{
    if (Container* container = FindContainer(handle))
        return container->name;
    if (Keyword* keyword = FindKeyword(handle))
        return keyword->name;
    return CString();
}

int wpxGetNoParams(WPXHANDLE keyword)
{
    Keyword* found = FindKeyword(keyword);
    return found ? static_cast<int>(found->params.size()) : 0;
}

WPXHANDLE wpxParamByNum(WPXHANDLE keyword, int n)
{
    Keyword* found = FindKeyword(keyword);
    if (!found || n < 1 || n > static_cast<int>(found->params.size()))
        return nullptr;
    return HandleOf(found->params[n - 1].get());
}

WpxParamKind wpxGetParamKind(WPXHANDLE param)
{
    Param* found = FindParam(param);
    return found ? found->type : wpxNone;
}

int wpxGetInt(WPXHANDLE param)
{
    Param* found = FindParam(param);
    return found && found->type == wpxInt ? found->intValue : 0;
}

CString wpxGetText(WPXHANDLE param)
{
    Param* found = FindParam(param);
    return found && found->type != wpxInt ? found->text : CString();
}

int wpxGetParam(WPXHANDLE section, const CString& key, int* value, int keyNum, int paramNum)
{
    Param* param = FindParamOf(section, key, keyNum, paramNum);
    if (!value || !param || param->type != wpxInt)
        return 0;
    *value = param->intValue;
    return 1;
}

int wpxGetParam(WPXHANDLE section, const CString& key, CString* value, int keyNum, int paramNum)
{
    Param* param = FindParamOf(section, key, keyNum, paramNum);
    if (!value || !param || param->type == wpxInt)
        return 0;
    *value = param->text;
    return 1;
}

int wpxGetParamFilename(WPXHANDLE section, const CString& key, CString* value, int keyNum, int paramNum)
{
    Param* param = FindParamOf(section, key, keyNum, paramNum);
    if (!value || !param || param->type == wpxInt)
        return 0;
    *value = param->text;
    return 1;
}

namespace {

// `path` relative to `folder` when it lies inside it (lexically, after dropping "." and ".."),
// else empty.
std::string RelativeInside(const std::string& path, const std::filesystem::path& folder)
{
    const std::filesystem::path target = std::filesystem::path(path).lexically_normal();
    const std::filesystem::path relative = target.lexically_relative(folder);
    if (relative.empty() || relative == "." || *relative.begin() == "..")
        return std::string();
    return relative.string();
}

int RelativizeContainer(Container& container, const std::filesystem::path& folder)
{
    int changed = 0;
    for (Entry& entry : container.entries) {
        if (entry.section) {
            changed += RelativizeContainer(*entry.section, folder);
            continue;
        }
        for (auto& param : entry.keyword->params) {
            if (param->type != wpxFilename || param->text.empty() || param->text.front() != '/')
                continue;
            std::string relative = RelativeInside(param->text, folder);
            if (!relative.empty()) {
                // A folder name keeps its closing "/", which the pages rely on.
                if (param->text.back() == '/' && relative.back() != '/')
                    relative += '/';
                param->text = relative;
                ++changed;
            }
        }
    }
    return changed;
}

} // namespace

int wpxMakeFileNamesRelative(WPXHANDLE doc, const CString& folder)
{
    Document* document = FindDocument(doc);
    if (!document || folder.empty() || folder.front() != '/')
        return 0;
    const std::filesystem::path base = std::filesystem::path(folder).lexically_normal() / "";
    int changed = 0;
    for (auto& target : document->targets)
        changed += RelativizeContainer(*target, base.parent_path());
    return changed;
}

int wpxHandlesInUse() { return InUse(); }
