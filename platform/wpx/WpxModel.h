#pragma once
// The in-memory form of a parameter document and the handle table behind WPXHANDLE. Internal to
// platform/wpx.
#include "platform/wpx/Wpx.h"

#include <memory>
#include <string>
#include <vector>

namespace wpx {

struct Document;

enum class Kind { Document, Container, Keyword, Param };

struct Object {
    explicit Object(Kind k, Document* owner) : kind(k), doc(owner) {}
    virtual ~Object() = default;
    Kind kind;
    Document* doc; // the document this belongs to (itself for a document)
    int handle = 0; // 0 until a handle was asked for
};

struct Param : Object {
    explicit Param(Document* owner) : Object(Kind::Param, owner) {}
    WpxParamKind type = wpxInt;
    int intValue = 0;
    std::string text; // text and file-name values
};

struct Keyword : Object {
    Keyword(Document* owner, std::string n) : Object(Kind::Keyword, owner), name(std::move(n)) {}
    std::string name;
    std::vector<std::unique_ptr<Param>> params;

    Param& AddParam(WpxParamKind type);
};

struct Container;

// One entry of a target or section, kept in the order it was added so writing reproduces it.
struct Entry {
    std::unique_ptr<Container> section;
    std::unique_ptr<Keyword> keyword;
};

struct Container : Object {
    Container(Document* owner, bool target, std::string n)
        : Object(Kind::Container, owner), isTarget(target), name(std::move(n)) {}
    bool isTarget;
    std::string name;
    std::vector<Entry> entries;

    Container& AddSection(const std::string& sectionName);
    Keyword& AddKeyword(const std::string& keywordName);
};

struct Document : Object {
    Document() : Object(Kind::Document, this) {}
    std::vector<std::unique_ptr<Container>> targets;
    std::vector<Container*> open; // building position: the open target, then open sections
    Keyword* lastKeyword = nullptr;
    std::vector<int> issued; // every handle given out for this document and its parts

    Container& AddTarget(const std::string& targetName);
};

// Handle table. Issue gives an object its handle (once; later calls return the same number) and 0
// when the table is full. Find returns null for null, stale or unknown handles.
int Issue(Object& object);
Object* Find(WPXHANDLE handle);
// Takes a new document into the table; null when it is full.
WPXHANDLE Register(std::unique_ptr<Document> document);
// Removes a document and every handle of its parts; false for an unknown handle.
bool Release(WPXHANDLE handle);
int InUse();

WPXHANDLE ToHandle(int number);

// Typed lookups; null when the handle is of another kind.
Document* FindDocument(WPXHANDLE handle);
Container* FindContainer(WPXHANDLE handle);
Keyword* FindKeyword(WPXHANDLE handle);
Param* FindParam(WPXHANDLE handle);

// A handle for an object, or null when the table is full.
WPXHANDLE HandleOf(Object* object);

// Text form of a document, and the reader. The reader fills `document` or returns false with
// `error` set to "source:line: message".
std::string Format(const Document& document);
bool Parse(const std::string& text, const std::string& sourceName, const std::string& baseFolder,
           Document& document, std::string& error);

} // namespace wpx
