#include "libvelmora/read/multireply.h"

#include <obd/nack.h>

#include <algorithm>

namespace velmora {

namespace {

constexpr unsigned char currentDataReply = obd::positiveReply(obd::ObdMode::CurrentData);

} // namespace

std::optional<std::map<unsigned char, std::vector<unsigned char>>>
splitMultiReply(std::vector<unsigned char> const& payload, std::vector<unsigned char> const& asked,
                PidLength const& length)
{
    if (payload.size() < 2 || payload.front() != currentDataReply) {
        return std::nullopt;
    }
    std::map<unsigned char, std::vector<unsigned char>> parts;
    std::size_t position = 1;
    while (position < payload.size()) {
        unsigned char const pid = payload[position++];
        bool const expected = std::find(asked.begin(), asked.end(), pid) != asked.end() && !parts.contains(pid);
        std::optional<std::size_t> const bytes = expected ? length(pid) : std::nullopt;
        if (!bytes || payload.size() - position < *bytes) {
            return std::nullopt;
        }
        std::vector<unsigned char>& part = parts[pid];
        part = {currentDataReply, pid};
        auto const data = payload.begin() + static_cast<std::ptrdiff_t>(position);
        part.insert(part.end(), data, data + static_cast<std::ptrdiff_t>(*bytes));
        position += *bytes;
    }
    return parts;
}

} // namespace velmora
