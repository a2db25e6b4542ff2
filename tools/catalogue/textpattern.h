#pragma once

#include <cstddef>
#include <map>
#include <string>
#include <string_view>
#include <vector>

namespace catalogue {

// Alternatives by the name of their list.
using Lists = std::map<std::string, std::vector<std::string>, std::less<>>;

// Splits "a | b | c" at the bars and drops the blanks around each part. Throws SourceError when a part is empty.
std::vector<std::string> splitAlternatives(std::string_view text);

// The texts that a pattern stands for. "{Low|High}" gives one text with each word, "{1-4}" and "{A-F}" one for each
// number or letter, "{name}" one for each entry of that list. Of several groups the last one changes fastest. A pattern
// without a group stands `count` times. Throws SourceError for an open brace, an empty or falling group, an unknown
// list, and when groups do not give exactly `count` texts.
std::vector<std::string> expandText(std::string_view pattern, std::size_t count, Lists const& lists);

} // namespace catalogue
