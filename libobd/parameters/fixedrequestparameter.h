#pragma once

#include "libobd/parameters/saelines.h"

#include <obd/obdparameter.h>

#include <optional>
#include <vector>

namespace obd {

// A query whose request does not change: a lead of service, identifier and what else the reply repeats, and a tail that
// it does not. A reply begins with the lead, its service raised by 0x40.
class FixedRequestParameter : public ObdParameter
{
protected:
    explicit FixedRequestParameter(std::vector<unsigned char> lead, std::vector<unsigned char> tail = {});

    void getRequestData(std::vector<unsigned char>& data) const override;
    void getSignature(std::vector<unsigned char>& signature) const override;

    // The lines of a reply from a legacy bus; it must outlive them. Nothing, with a log line, for what is no such
    // reply to this request.
    std::optional<SaeLines> saeLines(std::vector<unsigned char> const& data) const;

private:
    std::vector<unsigned char> m_lead;
    std::vector<unsigned char> m_tail;
};

// The bytes by which requests of service 08 are filled up where their length is fixed: on the legacy buses.
std::vector<unsigned char> requestFillers(ObdProtocol protocol);

} // namespace obd
