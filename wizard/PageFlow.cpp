#include "wizard/PageFlow.h"

#include "engine/Engine.h"
#include "resources/ResourceIds.h"

using namespace res;

namespace {

constexpr int kDefault = -1;

// The record's choices, with helpers that read like the flow table.
struct Road {
    int format;
    int type;
    int option;

    bool Rbx() const { return format == 1; }
    bool Ascii() const { return format == 2; }
    bool Excel() const { return format == 3; }
    bool Described() const { return Ascii() || Excel(); }
    bool SingleFile() const { return type == 1; }
    // A single file whose template is modified or made by hand passes the description pages.
    bool DescribedByHand() const { return SingleFile() && option != 1; }
};

int NextOf(int pageId, const Road& road)
{
    switch (pageId) {
    case IDD_SELECT_INPUT:
        return road.Rbx() ? IDD_ITEM_SELECTION : road.Described() ? IDD_DEFINE_TEMPLATE : kDefault;
    case IDD_DEFINE_TEMPLATE:
        if (road.Rbx())
            return IDD_ITEM_SELECTION;
        if (road.Ascii())
            return road.option == 1 ? IDD_ITEM_SELECTION : road.SingleFile() ? IDD_DELIMITERS : IDD_ITEM_SELECTION;
        if (road.Excel())
            return road.option == 1 ? IDD_ITEM_SELECTION : road.SingleFile() ? IDD_TIME_DESC_EXCEL : IDD_ITEM_SELECTION;
        return kDefault;
    case IDD_TIME_DESC_ASCII:
    case IDD_TIME_DESC_EXCEL:
        if (road.Rbx())
            return IDD_SELECT_INPUT;
        return road.Described() ? (road.SingleFile() ? IDD_DATA_DESC : IDD_DEFINE_TEMPLATE) : kDefault;
    case IDD_ITEM_SELECTION:
        if (road.Rbx())
            return IDD_OUTPUT;
        return road.Described() ? (road.DescribedByHand() ? IDD_SAVE_TEMPLATE : IDD_OUTPUT) : kDefault;
    default:
        return kDefault; // delimiters, data description, save template, output: the next page in order
    }
}

int BackOf(int pageId, const Road& road)
{
    switch (pageId) {
    case IDD_TIME_DESC_ASCII:
    case IDD_TIME_DESC_EXCEL:
        if (road.Rbx())
            return IDD_SELECT_INPUT;
        if (road.Ascii())
            return road.SingleFile() ? IDD_DELIMITERS : IDD_DEFINE_TEMPLATE;
        return road.Excel() ? IDD_DEFINE_TEMPLATE : kDefault;
    case IDD_DATA_DESC:
        if (road.Rbx())
            return IDD_SELECT_INPUT;
        if (road.Ascii())
            return road.SingleFile() ? IDD_TIME_DESC_ASCII : IDD_DEFINE_TEMPLATE;
        if (road.Excel())
            return road.SingleFile() ? IDD_TIME_DESC_EXCEL : IDD_DEFINE_TEMPLATE;
        return kDefault;
    case IDD_ITEM_SELECTION:
        if (road.Rbx())
            return IDD_SELECT_INPUT;
        return road.Described() ? (road.DescribedByHand() ? IDD_DATA_DESC : IDD_DEFINE_TEMPLATE) : kDefault;
    case IDD_OUTPUT:
        if (road.Rbx())
            return IDD_ITEM_SELECTION;
        return road.Described() ? (road.DescribedByHand() ? IDD_SAVE_TEMPLATE : IDD_ITEM_SELECTION) : kDefault;
    default:
        return kDefault; // select input, define template, delimiters, save template: the page before
    }
}

} // namespace

int NextPageOf(int pageId, const CEngine* engine)
{
    return engine ? NextOf(pageId, {engine->m_nInputFormat, engine->m_nInputType, engine->m_nTemplateOption})
                  : kDefault;
}

int BackPageOf(int pageId, const CEngine* engine)
{
    return engine ? BackOf(pageId, {engine->m_nInputFormat, engine->m_nInputType, engine->m_nTemplateOption})
                  : kDefault;
}
