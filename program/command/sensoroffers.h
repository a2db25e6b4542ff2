#pragma once

#include "libvelmora/signal/builtinpids.h"

#include <obd/iecu.h>
#include <obd/iecuservice.h>

#include <memory>
#include <vector>

namespace velmora::cli {

struct Offer
{
    std::shared_ptr<obd::ParameterDataModel> parameter;
    bool offered;
};

// What the library can show of the selected module; all of it, or what the module offers.
std::vector<Offer> offers(bool all);

// What the selected module offers and the library does not decode.
std::vector<unsigned char> undecoded(obd::IEcu const& ecu);

// The values of a PID that the library does not decode, as far as their layout is known, and how well it is.
std::vector<BuiltinPid> laterValues(unsigned char pid);

} // namespace velmora::cli
