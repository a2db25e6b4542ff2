#include "libvelmora/signal/importing/wicanformula.h"

#include "libvelmora/signal/formula.h"
#include "libvelmora/signal/formulawords.h"

#include <algorithm>
#include <cctype>
#include <regex>

namespace velmora {

namespace {

constexpr std::size_t frameBytes = 8;
constexpr std::size_t firstFrameData = 6;

// The place in the payload, the service being 0, of a byte counted in frames; nothing for a PCI byte.
std::optional<std::size_t> payloadPlace(std::size_t byte, ReplyFrames frames)
{
    if (frames == ReplyFrames::One) {
        return byte >= 1 && byte < frameBytes ? std::optional(byte - 1) : std::nullopt;
    }
    if (byte < frameBytes) {
        return byte >= 2 ? std::optional(byte - 2) : std::nullopt;
    }
    std::size_t const frame = byte / frameBytes; // 1 is the first consecutive one
    std::size_t const inside = byte % frameBytes;
    return inside == 0 ? std::nullopt : std::optional(firstFrameData + (frame - 1) * 7 + inside - 1);
}

class FrameBytes
{
public:
    FrameBytes(ReplyFrames frames, std::size_t echo) : m_frames(frames), m_echo(echo) {}

    std::string name(std::size_t byte, std::size_t position) const
    {
        auto const place = payloadPlace(byte, m_frames);
        if (!place || *place < m_echo || *place - m_echo >= 702) {
            throw FormulaError("byte " + std::to_string(byte) + " of the frames is no data", position);
        }
        return byteName(*place - m_echo);
    }

    // The bytes from first to last as one number, the first being the highest.
    std::string range(std::size_t first, std::size_t last, bool isSigned, std::size_t position) const
    {
        if (last < first || last - first > 3 || first / frameBytes != last / frameBytes) {
            throw FormulaError("a range of bytes must stand in one frame, in rising order, with at most four",
                               position);
        }
        std::string text = name(first, position);
        for (std::size_t byte = first + 1; byte <= last; ++byte) {
            text = "(" + text + "*256+" + name(byte, position) + ")";
        }
        return isSigned ? "signed(" + text + "," + std::to_string((last - first + 1) * 8) + ")" : text;
    }

private:
    ReplyFrames m_frames;
    std::size_t m_echo;
};

std::regex const& bytePattern()
{
    static std::regex const pattern(R"(\[([BS])([0-9]{1,4}):[BS]([0-9]{1,4})\]|([BS])([0-9]{1,4})(?::([0-7]))?)");
    return pattern;
}

} // namespace

std::string fromFrameBytes(std::string const& expression, ReplyFrames frames, std::size_t echo)
{
    if (expression.size() > longestFormula) {
        throw FormulaError("the formula is too long", longestFormula);
    }
    FrameBytes const bytes(frames, echo);
    std::string text;
    auto rest = expression.cbegin();
    for (std::sregex_iterator each(expression.begin(), expression.end(), bytePattern()), end; each != end; ++each) {
        std::smatch const& match = *each;
        auto const position = static_cast<std::size_t>(match.position());
        text.append(rest, match[0].first);
        rest = match[0].second;
        if (match[1].matched) {
            text += bytes.range(std::stoul(match[2]), std::stoul(match[3]), match[1] == "S", position);
        } else if (match[6].matched) {
            text += "bit(" + bytes.name(std::stoul(match[5]), position) + "," + match[6].str() + ")";
        } else {
            std::string const name = bytes.name(std::stoul(match[5]), position);
            text += match[4] == "S" ? "signed8(" + name + ")" : name;
        }
    }
    return text.append(rest, expression.cend());
}

std::size_t highestFrameByte(std::string const& expression)
{
    std::size_t highest = 0;
    std::string const text = expression.substr(0, longestFormula);
    for (std::sregex_iterator each(text.begin(), text.end(), bytePattern()), end; each != end; ++each) {
        highest = std::max<std::size_t>(highest, std::stoul((*each)[1].matched ? (*each)[3] : (*each)[5]));
    }
    return highest;
}

} // namespace velmora
