#include "libvelmora/uds/combinedreply.h"

#include <utility>

namespace velmora {

std::optional<std::map<unsigned int, std::vector<unsigned char>>>
divideReply(std::vector<unsigned char> const& payload, std::map<unsigned int, std::size_t> const& lengths)
{
    std::map<unsigned int, std::vector<unsigned char>> parts;
    std::size_t at = 1;
    while (at < payload.size()) {
        if (at + 2 > payload.size()) {
            return std::nullopt;
        }
        unsigned int const id = static_cast<unsigned int>(payload[at]) << 8U | payload[at + 1];
        auto const length = lengths.find(id);
        if (length == lengths.end() || parts.contains(id) || at + 2 + length->second > payload.size()) {
            return std::nullopt;
        }
        std::vector<unsigned char> part{payload.front()};
        auto const first = payload.begin() + static_cast<std::ptrdiff_t>(at);
        part.insert(part.end(), first, first + 2 + static_cast<std::ptrdiff_t>(length->second));
        parts[id] = std::move(part);
        at += 2 + length->second;
    }
    return parts;
}

} // namespace velmora
