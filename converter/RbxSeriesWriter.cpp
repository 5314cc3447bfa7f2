#include "converter/RbxSeriesWriter.h"

#include "converter/StampText.h"
#include "platform/rbx/RbxWriter.h"
#include "platform/system/Text.h"
#include "platform/units/Units.h"

#include <cerrno>
#include <cstdio>
#include <cstring>

namespace converter {

namespace {

// rbx0 texts are UTF-8; names from 8-bit files are made so as everywhere (text::ToUtf8).
rbx::ItemInfo DescribeItem(const ItemInfo& item)
{
    rbx::ItemInfo info;
    info.name = text::ToUtf8(item.name);
    const units::ItemType* type = units::LookupItemType(item.type.empty() ? "Undefined" : item.type);
    info.itemTypeKey = type ? type->key : units::kItemTypeUndefined;
    info.itemTypeText = item.type.empty() ? "Undefined" : text::ToUtf8(item.type);
    const units::Unit* unit = type ? units::LookupUnit(*type, item.unit) : nullptr;
    info.unitKey = unit ? unit->key : units::kUnitUndefined;
    info.unitText = text::ToUtf8(item.unit);
    info.dataType = rbx::kFloat64;
    const int valueType = rbx::ValueTypeFromName(item.valueType);
    info.valueType = valueType < 0 ? rbx::kInstantaneous : valueType;
    return info;
}

} // namespace

RbxSeriesWriter::RbxSeriesWriter() : m_writer(std::make_unique<rbx::CRbxWriter>()) {}
RbxSeriesWriter::~RbxSeriesWriter() = default;

sys::Status RbxSeriesWriter::Begin(const std::string& path, const SeriesHeader& header, const std::string& title)
{
    m_path = path;
    m_definition = std::make_unique<rbx::FileDefinition>();
    m_definition->title = text::ToUtf8(title);
    m_definition->calendar = true;
    m_definition->timeUnitKey = units::kUnitSecond;
    m_definition->timeUnitText = "second";
    for (const ItemInfo& item : header.items)
        m_definition->items.push_back(DescribeItem(item));
    // The file is created at the first row, whose stamp becomes the start of the time axis, so
    // every step time is a whole number of seconds.
    std::FILE* probe = std::fopen(path.c_str(), "wb");
    if (!probe)
        return sys::Status::Fail(path, 0, std::string("cannot create the file: ") + std::strerror(errno));
    std::fclose(probe);
    return sys::Status::Ok();
}

sys::Status RbxSeriesWriter::OpenWriter()
{
    if (const sys::Status opened = m_writer->Open(m_path, *m_definition); !opened)
        return sys::Status::Fail(m_path, 0, opened.problem().Describe());
    return sys::Status::Ok();
}

sys::Status RbxSeriesWriter::Write(const Row& row)
{
    if (m_first) {
        m_start = row.stamp;
        m_definition->calendarStart = COleDateTime::FromUnixSeconds(row.stamp);
        if (sys::Status opened = OpenWriter(); !opened)
            return opened;
        m_first = false;
    } else if (row.stamp <= m_previous) {
        return sys::Status::Fail(m_path, 0, "time stamps must increase: " + FormatStamp(row.stamp) + " follows " +
                                           FormatStamp(m_previous));
    }
    m_previous = row.stamp;
    if (!m_writer->WriteStep(static_cast<double>(row.stamp - m_start), row.values.data()))
        return sys::Status::Fail(m_path, 0, m_writer->status().problem().Describe());
    return sys::Status::Ok();
}

sys::Status RbxSeriesWriter::Finish()
{
    if (m_first)
        if (sys::Status opened = OpenWriter(); !opened)
            return opened;
    if (const sys::Status closed = m_writer->Close(); !closed)
        return sys::Status::Fail(m_path, 0, closed.problem().Describe());
    return sys::Status::Ok();
}

} // namespace converter
