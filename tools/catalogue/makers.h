#pragma once

#include <cstddef>
#include <optional>
#include <string_view>

namespace catalogue {

// How many names there are, the generic group included. A maker's number is its place in that list.
std::size_t makerCount();

// The name of a maker as the rows show it. `maker` must be below makerCount().
std::string_view makerName(std::size_t maker);

// The number of the maker with exactly this name, or nothing.
std::optional<std::size_t> findMaker(std::string_view name);

} // namespace catalogue
