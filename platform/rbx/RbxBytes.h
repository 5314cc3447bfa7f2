#pragma once
// Little-endian encoding of the rbx0 header fields. Hosts are little-endian (checked at compile
// time), so values are copied as they lie in memory.
#include "platform/system/Types.h"

#include <bit>
#include <cstdint>
#include <cstring>
#include <string_view>
#include <vector>

static_assert(std::endian::native == std::endian::little, "rbx0 files are read and written on little-endian hosts");

namespace rbx::bytes {

template <typename T>
void Put(std::vector<unsigned char>& out, T value)
{
    const auto* p = reinterpret_cast<const unsigned char*>(&value);
    out.insert(out.end(), p, p + sizeof(T));
}

template <typename T>
void PutAt(std::vector<unsigned char>& out, std::size_t offset, T value)
{
    std::memcpy(out.data() + offset, &value, sizeof(T));
}

template <typename T>
T Get(const unsigned char* p)
{
    T value;
    std::memcpy(&value, p, sizeof(T));
    return value;
}

// A text: a 16-bit byte count and the bytes, no terminator.
inline void PutText(std::vector<unsigned char>& out, std::string_view text)
{
    Put<std::uint16_t>(out, static_cast<std::uint16_t>(text.size()));
    out.insert(out.end(), text.begin(), text.end());
}

// Reads fields from a bounded buffer; a read past the end sets `failed` and yields zeros.
class Cursor {
public:
    Cursor(const unsigned char* data, std::size_t size, std::size_t offset) : m_data(data), m_size(size), m_offset(offset) {}

    template <typename T>
    T Read()
    {
        if (!Has(sizeof(T)))
            return T{};
        T value = Get<T>(m_data + m_offset);
        m_offset += sizeof(T);
        return value;
    }

    CString ReadText()
    {
        const auto length = Read<std::uint16_t>();
        if (!Has(length))
            return {};
        CString text(reinterpret_cast<const char*>(m_data + m_offset), length);
        m_offset += length;
        return text;
    }

    bool Failed() const { return m_failed; }
    std::size_t Offset() const { return m_offset; }
    std::size_t Remaining() const { return m_size - m_offset; }

private:
    bool Has(std::size_t count)
    {
        if (m_failed || count > m_size - m_offset) {
            m_failed = true;
            return false;
        }
        return true;
    }

    const unsigned char* m_data;
    std::size_t m_size;
    std::size_t m_offset;
    bool m_failed = false;
};

} // namespace rbx::bytes
