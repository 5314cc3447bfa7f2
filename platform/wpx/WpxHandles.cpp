#include "platform/wpx/WpxModel.h"

#include <cstdint>
#include <mutex>
#include <unordered_map>

namespace wpx {

namespace {

// Handles stay far below 2^31 so they survive the host's 32-bit variable; numbers are not reused
// until the counter wraps, so a stale handle finds nothing instead of someone else's object.
constexpr int kMaxHandles = 1 << 24;
constexpr int kLargestNumber = 0x7fffffff;

struct Table {
    std::mutex mutex;
    std::unordered_map<int, Object*> objects;
    std::unordered_map<int, std::unique_ptr<Document>> documents;
    int next = 1;

    int NextFreeNumber()
    {
        if (static_cast<int>(objects.size()) >= kMaxHandles)
            return 0;
        while (objects.count(next))
            next = next == kLargestNumber ? 1 : next + 1;
        int number = next;
        next = next == kLargestNumber ? 1 : next + 1;
        return number;
    }

    int IssueLocked(Object& object)
    {
        if (object.handle)
            return object.handle;
        int number = NextFreeNumber();
        if (!number)
            return 0;
        objects[number] = &object;
        object.handle = number;
        object.doc->issued.push_back(number);
        return number;
    }
};

Table& TheTable()
{
    static Table table;
    return table;
}

// The table number a handle stands for; 0 for null and for values no handle can have.
int NumberOf(WPXHANDLE handle)
{
    std::intptr_t raw = reinterpret_cast<std::intptr_t>(handle);
    return raw <= 0 || raw > kLargestNumber ? 0 : static_cast<int>(raw);
}

} // namespace

WPXHANDLE ToHandle(int number) { return reinterpret_cast<WPXHANDLE>(static_cast<std::intptr_t>(number)); }

int Issue(Object& object)
{
    Table& table = TheTable();
    std::lock_guard lock(table.mutex);
    return table.IssueLocked(object);
}

Object* Find(WPXHANDLE handle)
{
    int number = NumberOf(handle);
    if (!number)
        return nullptr;
    Table& table = TheTable();
    std::lock_guard lock(table.mutex);
    auto found = table.objects.find(number);
    return found == table.objects.end() ? nullptr : found->second;
}

WPXHANDLE Register(std::unique_ptr<Document> document)
{
    Table& table = TheTable();
    std::lock_guard lock(table.mutex);
    int number = table.IssueLocked(*document);
    if (!number)
        return nullptr;
    table.documents[number] = std::move(document);
    return ToHandle(number);
}

bool Release(WPXHANDLE handle)
{
    std::unique_ptr<Document> doomed;
    {
        Table& table = TheTable();
        std::lock_guard lock(table.mutex);
        auto found = table.documents.find(NumberOf(handle));
        if (found == table.documents.end())
            return false;
        doomed = std::move(found->second);
        table.documents.erase(found);
        for (int number : doomed->issued)
            table.objects.erase(number);
    }
    return true; // the document itself is freed outside the lock
}

int InUse()
{
    Table& table = TheTable();
    std::lock_guard lock(table.mutex);
    return static_cast<int>(table.objects.size());
}

Document* FindDocument(WPXHANDLE handle)
{
    Object* object = Find(handle);
    return object && object->kind == Kind::Document ? static_cast<Document*>(object) : nullptr;
}

Container* FindContainer(WPXHANDLE handle)
{
    Object* object = Find(handle);
    return object && object->kind == Kind::Container ? static_cast<Container*>(object) : nullptr;
}

Keyword* FindKeyword(WPXHANDLE handle)
{
    Object* object = Find(handle);
    return object && object->kind == Kind::Keyword ? static_cast<Keyword*>(object) : nullptr;
}

Param* FindParam(WPXHANDLE handle)
{
    Object* object = Find(handle);
    return object && object->kind == Kind::Param ? static_cast<Param*>(object) : nullptr;
}

WPXHANDLE HandleOf(Object* object)
{
    if (!object)
        return nullptr;
    int number = Issue(*object);
    return number ? ToHandle(number) : nullptr;
}

Param& Keyword::AddParam(WpxParamKind type)
{
    params.push_back(std::make_unique<Param>(doc));
    params.back()->type = type;
    return *params.back();
}

Container& Container::AddSection(const std::string& sectionName)
{
    Entry entry;
    entry.section = std::make_unique<Container>(doc, false, sectionName);
    entries.push_back(std::move(entry));
    return *entries.back().section;
}

Keyword& Container::AddKeyword(const std::string& keywordName)
{
    Entry entry;
    entry.keyword = std::make_unique<Keyword>(doc, keywordName);
    entries.push_back(std::move(entry));
    return *entries.back().keyword;
}

Container& Document::AddTarget(const std::string& targetName)
{
    targets.push_back(std::make_unique<Container>(this, true, targetName));
    return *targets.back();
}

} // namespace wpx
