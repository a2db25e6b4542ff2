#pragma once

#include "libobd/parameters/fixedrequestparameter.h"
#include "libobd/parameters/monitortestitem.h"

#include <map>

namespace obd {

// Test results of service 06: of one on-board monitor on CAN, of one test on the legacy buses, where each record of the
// reply is a monitor of its own. A further reply of the same module is appended.
class MonitorTestResult : public FixedRequestParameter
{
public:
    // id: monitor identifier (MID) on CAN, test identifier (TID) on the legacy buses.
    explicit MonitorTestResult(unsigned char id);

    void clear() override;

    // Empty, with a log line, for a module that delivered none.
    std::vector<std::shared_ptr<ObdMonitorTestItem>> getItems(IEcu const& ecu) const;

protected:
    bool fromBytes(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& data) override;

private:
    bool parseFromCanBus(unsigned int ecuId, std::vector<unsigned char> const& data);
    bool parseFromNonCanBus(unsigned int ecuId, std::vector<unsigned char> const& data);
    std::string descriptionCan() const;
    static std::string descriptionSae(unsigned char component);

    unsigned char m_id;
    std::map<unsigned int, std::vector<std::shared_ptr<ObdMonitorTestItem>>> m_monitors; // by module id
};

} // namespace obd
