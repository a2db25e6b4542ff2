#pragma once

#include <cstddef>
#include <cstdint>
#include <iterator>

namespace obd {

// One row of the trouble code catalogue. Both strings are constant data that lives as long as the library.
struct DtcRow
{
    std::int32_t maker; // value of Manufacturer::AutoManufacturer, 0 is the generic group
    char const* code;   // such as "P0420"
    char const* text;   // 1 to 140 ASCII characters
};

// The constant table of trouble codes. Rows are grouped by maker in rising order and sorted by code within a maker; a
// few codes stand more than once under one maker. Rows are made from the packed table as they are read. Stateless and
// safe from any thread.
class DtcTable
{
public:
    class Iterator
    {
    public:
        using iterator_category = std::input_iterator_tag;
        using value_type = DtcRow;
        using difference_type = std::ptrdiff_t;
        using pointer = DtcRow const*;
        using reference = DtcRow;

        explicit Iterator(std::size_t index = 0) noexcept : m_index(index) {}

        DtcRow operator*() const noexcept { return row(m_index); }
        Iterator& operator++() noexcept
        {
            ++m_index;
            return *this;
        }
        Iterator operator++(int) noexcept { return Iterator(m_index++); }
        bool operator==(Iterator const& other) const noexcept { return m_index == other.m_index; }

    private:
        std::size_t m_index;
    };

    static std::size_t size() noexcept;

    // `index` must be below size().
    static DtcRow row(std::size_t index) noexcept;

    static Iterator begin() noexcept { return Iterator(0); }
    static Iterator end() noexcept { return Iterator(size()); }
};

} // namespace obd
