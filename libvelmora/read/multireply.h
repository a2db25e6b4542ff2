#pragma once

#include <cstddef>
#include <functional>
#include <map>
#include <optional>
#include <vector>

namespace velmora {

// How many data bytes a PID of service 01 has in every reply; nothing where that is not known.
using PidLength = std::function<std::optional<std::size_t>(unsigned char pid)>;

// Takes apart the reply of one control module to a request for several PIDs of service 01 (ISO 15765-4: 41, then PID
// and data, PID and data, in any order; the module leaves out what it does not support). Each part comes as the reply
// to a request for its PID alone: 41, PID, data. Nothing if the reply does not divide exactly, tells a PID twice or one
// that was not asked for: then no part of it can be trusted.
std::optional<std::map<unsigned char, std::vector<unsigned char>>>
splitMultiReply(std::vector<unsigned char> const& payload, std::vector<unsigned char> const& asked,
                PidLength const& length);

} // namespace velmora
