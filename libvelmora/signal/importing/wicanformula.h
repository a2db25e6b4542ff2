#pragma once

#include <optional>
#include <string>

namespace velmora {

// How a reply comes, which tells what its bytes are counted by.
enum class ReplyFrames
{
    One,
    Several,
};

// An expression that counts the bytes of the CAN frames as they came, PCI bytes included (B10, S10, B10:3, [B10:B12]),
// in our grammar, which counts the data behind an echo of that many bytes. Throws FormulaError for bytes that are no
// data, and for a range across the border of frames.
std::string fromFrameBytes(std::string const& expression, ReplyFrames frames, std::size_t echo);

// The highest byte that an expression counts; 0 for none.
std::size_t highestFrameByte(std::string const& expression);

} // namespace velmora
