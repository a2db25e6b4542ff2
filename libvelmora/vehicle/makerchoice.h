#pragma once

#include <velmora/troublecode.h>

#include <string>
#include <vector>

namespace velmora {

// named: the maker that the user chose, or empty. vins: what the control modules told, in any form; the first that is a
// vehicle identification number counts.
MakerChoice chooseMaker(std::string const& named, std::vector<std::string> const& vins);

} // namespace velmora
