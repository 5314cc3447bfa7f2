#include "wizard/ChoiceList.h"

#include "platform/system/Text.h"

#include <algorithm>

void ChoiceList::AddSorted(const CString& entry)
{
    const CString key = text::ToLower(entry);
    const auto at = std::upper_bound(entries.begin(), entries.end(), key,
                                     [](const CString& k, const CString& e) { return k < text::ToLower(e); });
    const auto index = static_cast<int>(at - entries.begin());
    entries.insert(at, entry);
    if (selected >= index)
        ++selected;
}

void ChoiceList::FillSorted(const CStringList& names)
{
    entries.clear();
    selected = -1;
    for (const CString& name : names)
        AddSorted(name);
}

bool ChoiceList::SelectStartingWith(const CString& prefix)
{
    for (size_t i = 0; i < entries.size(); ++i) {
        if (text::StartsWithNoCase(entries[i], prefix)) {
            selected = static_cast<int>(i);
            return true;
        }
    }
    return false;
}

CString ChoiceList::Text() const
{
    if (selected < 0 || selected >= static_cast<int>(entries.size()))
        return CString();
    return entries[static_cast<size_t>(selected)];
}
