#include "libvelmora/read/makerreader.h"

#include "libvelmora/read/diagnosticreaders.h"
#include "libvelmora/vehicle/vin.h"

namespace velmora {

MakerChoice readMaker(Session& session, std::string const& named)
{
    std::vector<std::string> vins;
    if (named.empty()) {
        for (auto const& ecu : session.selectedModules()) {
            vins.push_back(readVin(session, *ecu));
            if (isVin(vins.back())) {
                break;
            }
        }
    }
    return chooseMaker(named, vins);
}

} // namespace velmora
