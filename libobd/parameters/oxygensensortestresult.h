#pragma once

#include "libobd/parameters/fixedrequestparameter.h"

#include <obd/diagnosticdatamodels.h>
#include <obd/oxygensensorlocation.h>

#include <map>

namespace obd {

// One monitoring test of one oxygen sensor (service 05), which only the legacy buses have.
class OxygenSensorTestResult : public FixedRequestParameter
{
public:
    OxygenSensorTestResult(unsigned char tid, OxygenSensorLocation location);

    void clear() override;

    // Null, with a log line, for a module that delivered none.
    std::shared_ptr<OxygenSensorMonitorDataModel> getResult(std::shared_ptr<IEcu> const& ecu) const;

protected:
    bool fromBytes(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& data) override;

private:
    void store(unsigned int ecuId, unsigned char value, unsigned char minimum, unsigned char maximum);

    unsigned char m_tid;
    std::map<unsigned int, std::shared_ptr<OxygenSensorMonitorDataModel>> m_results; // by module id
};

} // namespace obd
