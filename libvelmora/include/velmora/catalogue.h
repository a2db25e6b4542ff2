#pragma once

#include <velmora/export.h>
#include <velmora/troublecode.h>

#include <string>

namespace velmora {

/// All meanings of a trouble code such as "P0420", in any letter case, with or without a car: the generic one first,
/// then those of makers. A code that is not in the catalogue has one meaning, which says so. Throws Error for what is
/// no trouble code. Any thread.
VELMORA_EXPORT TroubleCode explain(std::string const& code);

} // namespace velmora
