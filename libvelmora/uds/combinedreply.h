#pragma once

#include <cstddef>
#include <map>
#include <optional>
#include <vector>

namespace velmora {

// The reply to a request of service 22 for several identifiers (ISO 14229-1): 62, then identifier and data of each, in
// any order and without lengths, so that only who knows these can divide it. Each part begins with the 62. Nothing if
// the reply does not divide exactly, names another identifier, or one twice.
std::optional<std::map<unsigned int, std::vector<unsigned char>>>
divideReply(std::vector<unsigned char> const& payload, std::map<unsigned int, std::size_t> const& lengths);

} // namespace velmora
