#include "wizard/DelimitersForm.h"

#include "engine/Engine.h"
#include "platform/system/Text.h"
#include "wizard/PreviewChain.h"

namespace {

const char* const kUserDefined = "User Defined";

} // namespace

DelimitersState InitialDelimiters()
{
    DelimitersState state;
    for (const char* name : {"Tab", "Comma", "Semi Colon", "Space", kUserDefined})
        state.delimiter.AddSorted(name);
    state.delimiter.SelectStartingWith("Tab");
    for (const char* name : {"Dot", "Comma", "User Locale"})
        state.decimalSeparator.AddSorted(name);
    state.decimalSeparator.SelectStartingWith("Dot");
    return state;
}

void LoadDelimiters(DelimitersState& state, const CEngine& engine)
{
    const CSpecification* spec = engine.m_pSpecification.get();
    if (!spec)
        return;
    state.consecutiveAsOne = spec->m_bIgnoreConsecutiveDelimiters;
    state.ignoreAtLineStart = spec->m_bIgnoreBegginingOfLineDelimiters;
    state.userDelimiter = spec->m_strDefDelimiter;
    state.userDelimiterEnabled =
        text::EqualsNoCase(spec->m_strDelimiter, kUserDefined) && !spec->m_strDefDelimiter.empty();
    state.delimiter.SelectStartingWith(spec->m_strDelimiter);
    state.decimalSeparator.SelectStartingWith(spec->m_strDecimalSeparator);
}

void SelectDelimiter(DelimitersState& state, int index)
{
    state.delimiter.selected = index;
    state.userDelimiterEnabled = state.delimiter.Text() == kUserDefined;
}

void StoreDelimiters(const DelimitersState& state, CEngine* engine)
{
    CSpecification* spec = engine ? engine->m_pSpecification.get() : nullptr;
    if (!spec)
        return;
    spec->m_bIgnoreConsecutiveDelimiters = state.consecutiveAsOne;
    spec->m_bIgnoreBegginingOfLineDelimiters = state.ignoreAtLineStart;
    spec->m_strDelimiter = state.delimiter.Text();
    spec->m_strDecimalSeparator = state.decimalSeparator.Text();
    spec->m_strDefDelimiter = state.userDelimiter;
}

int PreviewDelimiters(const DelimitersState& state, CEngine* engine)
{
    StoreDelimiters(state, engine);
    return RunDefaultPreview(engine);
}
