#pragma once

#include "libobd/powertrain/formula.h"
#include "libobd/powertrain/quantity.h"

#include <iterator>
#include <string>

// States that come as a code or as a bit, and are shown as a text.
namespace obd::coded {

// The text of a state by its number; none for a number behind the end of the table.
template <auto const& texts>
std::string textOf(unsigned int state)
{
    return state < std::size(texts) ? texts[state] : std::string();
}

constexpr Quantity states(std::string (*textOfState)(unsigned int))
{
    return {0.0, 0.0, {}, {}, nullptr, nullptr, textOfState};
}

// A code, or 0 for one that has no text.
template <auto const& texts>
constexpr formula::Decoded code(formula::Raw raw, IEcu const& /*ecu*/)
{
    return raw < std::size(texts) ? raw : 0;
}

// So many bits of a byte from a position on.
template <unsigned int position, unsigned int count = 1>
constexpr formula::Decoded bits(formula::Raw raw, IEcu const& /*ecu*/)
{
    return raw >> position & ((1U << count) - 1U);
}

// The position of the lowest set bit of a byte, 8 if there is none.
constexpr unsigned int lowestBit(formula::Raw raw)
{
    unsigned int position = 0;
    while (position < 8 && (raw >> position & 1U) == 0) {
        ++position;
    }
    return position;
}

} // namespace obd::coded
