#pragma once

#include "libobd/bytes/bytes.h"
#include "libobd/parameters/fixedrequestparameter.h"

#include <obd/dtcdatamodel.h>

#include <map>
#include <memory>
#include <string>
#include <vector>

namespace obd {

// The text of a trouble code from its first two bytes, such as "P0133" from 01 33 (SAE J2012). Empty where the lower 12
// bits are zero: that is how a vehicle fills places that hold no code. Throws std::out_of_range for less than two
// bytes.
std::string dtcToString(std::vector<unsigned char> const& bytes);

// Asks all control modules for one of their lists of trouble codes. On CAN a reply holds the number of codes and then
// the codes; on the legacy buses it consists of lines with room for three, unused places filled with zeros
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
    void parseCodes(unsigned int ecuId, ByteView codes);

    std::map<unsigned int, std::vector<std::shared_ptr<DtcDataModel>>> m_codes; // by module id
};

// The codes that a module has confirmed (service 03); they light the malfunction indicator.
class ConfirmedTroubleCodes : public DtcParameter
{
public:
    ConfirmedTroubleCodes() : DtcParameter(0x03) {}
};

// The codes that a module found in this driving cycle or the last and has yet to confirm (service 07).
class PendingTroubleCodes : public DtcParameter
{
public:
    PendingTroubleCodes() : DtcParameter(0x07) {}
};

// The codes that stay until the module itself has seen the repair (service 0A).
class PermanentTroubleCodes : public DtcParameter
{
public:
    PermanentTroubleCodes() : DtcParameter(0x0A) {}
};

} // namespace obd
