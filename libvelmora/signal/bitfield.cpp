#include "libvelmora/signal/bitfield.h"

#include <fmt/format.h>

#include <cmath>
#include <utility>

namespace velmora {

namespace {

constexpr std::size_t mostBits = 48; // beyond, a double does not hold each whole number

// The whole bytes that hold the field, as one number.
FormulaNode bytesOf(BitField const& field)
{
    std::size_t const begin = field.first / 8;
    std::size_t const end = (field.first + field.length + 7) / 8;
    FormulaNode number;
    for (std::size_t i = 0; i < end - begin; ++i) {
        std::size_t const byte = field.littleEndian ? end - 1 - i : begin + i;
        FormulaNode next{FormulaStep::Byte, static_cast<double>(byte), {}, {}};
        number = i == 0 ? next
                        : combine(FormulaStep::Add, combine(FormulaStep::Multiply, std::move(number), leafNumber(256)),
                                  std::move(next));
    }
    return number;
}

} // namespace

FormulaNode leafNumber(double number)
{
    return {FormulaStep::Number, number, {}, {}};
}

FormulaNode combine(FormulaStep step, FormulaNode left, FormulaNode right)
{
    return {step, 0.0, {}, {std::move(left), std::move(right)}};
}

FormulaNode rawOf(BitField const& field)
{
    FormulaNode raw = bytesOf(field);
    std::size_t const behind = (8 - (field.first + field.length) % 8) % 8;
    if (behind != 0) {
        raw = combine(FormulaStep::ShiftRight, std::move(raw), leafNumber(static_cast<double>(behind)));
    }
    if (field.length % 8 != 0 || field.first % 8 != 0) {
        raw =
            combine(FormulaStep::And, std::move(raw), leafNumber(std::ldexp(1.0, static_cast<int>(field.length)) - 1));
    }
    return field.isSigned ? combine(FormulaStep::Signed, std::move(raw), leafNumber(static_cast<double>(field.length)))
                          : raw;
}

std::optional<std::string> wrongField(BitField const& field)
{
    if (field.length == 0 || field.length > mostBits || (field.isSigned && field.length > 32)) {
        return fmt::format("a field of {} bits has no form here", field.length);
    }
    if (field.littleEndian && (field.first % 8 != 0 || field.length % 8 != 0)) {
        return std::string("a field with its lowest byte first must consist of whole bytes");
    }
    return std::nullopt;
}

} // namespace velmora
