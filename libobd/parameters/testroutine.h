#pragma once

#include "libobd/parameters/fixedrequestparameter.h"

#include <map>

namespace obd {

// Starts a routine of service 08, control of an on-board system, and keeps by module whether it was accepted.
class TestRoutine : public FixedRequestParameter
{
public:
    enum Result : int
    {
        Accepted = 0,
        Refused = 1,
        NoAnswer = 2,
    };

    // protocol: that of the connection, by which the request is filled up.
    TestRoutine(unsigned char id, ObdProtocol protocol);

    void clear() override;

    // NoAnswer, with a log line, for a module that told nothing.
    Result result(IEcu const& ecu) const;

protected:
    bool fromBytes(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& data) override;

private:
    bool parseFromCanBus(unsigned int ecuId, std::vector<unsigned char> const& data);
    bool parseFromNonCanBus(unsigned int ecuId, std::vector<unsigned char> const& data);

    std::map<unsigned int, Result> m_results; // by module id
};

} // namespace obd
