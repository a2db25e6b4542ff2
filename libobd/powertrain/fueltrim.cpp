#include "libobd/powertrain/fueltrim.h"

#include <common/logrecord.h>

#include <atomic>

namespace obd {
namespace {

std::atomic<bool> secondByteInUse{false};

} // namespace

void FuelTrim::setByteBInUse(bool inUse)
{
    secondByteInUse = inUse;
    if (inUse) {
        TERVEX_LOG(Info) << "FuelTrim: byte B in use";
    }
}

bool FuelTrim::byteBInUse()
{
    return secondByteInUse;
}

std::string FuelTrim::description(IEcu const& /*ecu*/)
{
    std::string const title = row().title;
    return byteBInUse() ? title : title + " - " + row().sensors[0].name;
}

formula::Decoded FuelTrim::secondTrim(formula::Raw raw, IEcu const& ecu)
{
    // While byte B is not in use, what stands in its place is filler or a checksum.
    return byteBInUse() && raw >= 128 ? formula::trim(raw, ecu) : std::nullopt;
}

bool FuelTrim::fromPayload(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& payload)
{
    std::size_t const needed = byteBInUse() ? 2 : 1;
    return payload.size() >= needed && TableParameter::fromPayload(ecu, payload);
}

} // namespace obd
