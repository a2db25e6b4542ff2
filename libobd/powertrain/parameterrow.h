#pragma once

#include "libobd/powertrain/quantity.h"

#include <cstddef>
#include <cstdint>
#include <iterator>
#include <optional>
#include <vector>

namespace obd {

// A big-endian field of a payload.
struct Field
{
    unsigned char offset{0};
    unsigned char width{0}; // bytes, 1 to 4

    constexpr std::size_t end() const { return std::size_t{offset} + width; }
};

constexpr Field byteAt(unsigned char offset)
{
    return {offset, 1};
}

constexpr Field wordAt(unsigned char offset)
{
    return {offset, 2};
}

constexpr Field longAt(unsigned char offset)
{
    return {offset, 4};
}

// Nothing if the payload ends before the field does.
std::optional<std::uint32_t> readField(std::vector<unsigned char> const& payload, Field field);

// From a field's number to the metric one. Nothing if the number says that there is no reading.
using Formula = std::optional<double> (*)(std::uint32_t raw, IEcu const& ecu);

// Bits of a payload's first byte that tell which sensors the vehicle has.
using Availability = unsigned char;

constexpr Availability always = 0;

constexpr Availability bit(int number)
{
    return static_cast<Availability>(1 << number);
}

struct SensorRow
{
    char const* name{nullptr}; // null for a sensor that is called as its parameter
    Availability available{always};
    Field field;
    Formula formula{nullptr};
    Quantity const* quantity{nullptr};
    // A second bit, for sensors that may send the same field in a wider range: it makes them available too, and decides
    // on the formula.
    Availability wide{0};
    Formula wideFormula{nullptr};
};

// All about one PID of services 01 and 02 (SAE J1979).
struct ParameterRow
{
    static constexpr std::size_t maxSensors = 6;

    int pid;
    unsigned char bytes; // the shortest payload that is accepted; more is ignored
    unsigned char zeros; // for a module that has not answered, so many of the first sensors read 0; the others, nothing
    char const* title;
    SensorRow sensors[maxSensors]; // those at the end without a field are not there

    constexpr std::size_t sensorCount() const
    {
        std::size_t count = 0;
        while (count < maxSensors && sensors[count].field.width != 0) {
            ++count;
        }
        return count;
    }

    constexpr bool holdsItsFields() const
    {
        for (std::size_t i = 0; i < sensorCount(); ++i) {
            if (sensors[i].field.end() > bytes) {
                return false;
            }
        }
        return sensorCount() > 0;
    }
};

// The row of a parameter with one number, which has the name of its parameter.
constexpr ParameterRow single(int pid, Field field, Formula formula, Quantity const& quantity, char const* title)
{
    return {pid, static_cast<unsigned char>(field.end()), 1, title, {{nullptr, always, field, formula, &quantity}}};
}

// For compile time checks of tables.
template <typename Rows>
constexpr bool pidsRise(Rows const& rows)
{
    for (std::size_t i = 1; i < std::size(rows); ++i) {
        if (rows[i - 1].pid >= rows[i].pid) {
            return false;
        }
    }
    return true;
}

template <typename Rows>
constexpr bool allHoldTheirFields(Rows const& rows)
{
    for (auto const& row : rows) {
        if (!row.holdsItsFields()) {
            return false;
        }
    }
    return true;
}

// The index of a PID's row; a PID without a row doesn't compile.
template <typename Rows>
consteval std::size_t rowIndex(Rows const& rows, int pid)
{
    std::size_t index = 0;
    while (rows[index].pid != pid) {
        ++index;
    }
    return index;
}

} // namespace obd
