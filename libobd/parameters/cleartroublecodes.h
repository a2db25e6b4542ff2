#pragma once

#include "libobd/parameters/fixedrequestparameter.h"

#include <map>

namespace obd {

// Makes all control modules clear their trouble codes, and with them freeze frames, test results and readiness
// (service 04).
class ClearTroubleCodes : public FixedRequestParameter
{
public:
    ClearTroubleCodes() : FixedRequestParameter({0x04}) {}

    void clear() override;

    // Whether the module said that it has done so. False, with a log line, for one that did not answer.
    bool isCleared(IEcu const& ecu) const;

protected:
    bool fromBytes(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& data) override;

private:
    std::map<unsigned int, bool> m_cleared; // by module id
};

} // namespace obd
