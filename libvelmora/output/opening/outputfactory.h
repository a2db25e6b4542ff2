#pragma once

#include "libvelmora/output/ioutput.h"
#include "libvelmora/output/outputaddress.h"
#include "libvelmora/output/outputcontext.h"

#include <memory>
#include <string>
#include <vector>

namespace velmora {

// Throws Error if the address makes no sense, what stands there is no plain file, or it names a kind that was left out
// of this build.
std::unique_ptr<IOutput> makeOutput(OutputAddress const& address, OutputContext const& context);

} // namespace velmora
