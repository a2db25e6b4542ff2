#pragma once

#include "libobd/parameters/fixedrequestparameter.h"

#include <obd/dtcdatamodel.h>

#include <map>
#include <memory>
#include <vector>

namespace obd {

// Asks all control modules for one of their lists of trouble codes. On CAN a reply holds the number of codes and then
// the codes; on the buses before CAN it consists of lines with room for three, unused places filled with zeros
// (SAE J1979).
class DtcParameter : public FixedRequestParameter
{
public:
    void clear() override;

    // The module's codes in the order of its reply, each with all meanings that the catalogue knows, so that a code of
    // several makers comes several times. Empty for a module without codes and for one that did not answer.
    std::vector<std::shared_ptr<DtcDataModel>> getTroubleCodes(IEcu const& ecu) const;

protected:
    explicit DtcParameter(unsigned char service) : FixedRequestParameter({service}) {}

    // Even where it fails the module's former list is gone: a reply that can't be read says at least that it changed.
    bool fromBytes(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& data) override;

private:
    bool fromCanSystem(unsigned int ecuId, std::vector<unsigned char> const& data);
    bool fromSaeSystem(unsigned int ecuId, std::vector<unsigned char> const& data);
    void parseCodes(unsigned int ecuId, std::vector<unsigned char> const& codes);

    std::map<unsigned int, std::vector<std::shared_ptr<DtcDataModel>>> m_codes; // by module id
};

} // namespace obd
