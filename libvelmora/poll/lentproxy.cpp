#include "libvelmora/poll/lentproxy.h"

namespace velmora {

namespace {

using Status = obd::IDevice::Status;

constexpr unsigned char liveData = 0x01;

} // namespace

void LentProxy::begin()
{
    m_lent.clear();
    m_asked.clear();
}

Status LentProxy::execute(std::string const& command, std::string& response, unsigned int timeoutMs)
{
    return m_wire.proxy().execute(command, response, timeoutMs);
}

Status LentProxy::execute(std::vector<unsigned char> const& request, obd::ResponseMap& responses,
                          unsigned int timeoutMs)
{
    bool const isSingle = request.size() == 2 && request[0] == liveData;
    if (isSingle) {
        m_asked.insert(request[1]);
        if (auto const lent = m_lent.find(request[1]); lent != m_lent.end()) {
            if (lent->second.empty()) {
                return Status::NoResponse;
            }
            responses[m_ecu->id()] = lent->second;
            return Status::Ok;
        }
    }
    obd::ResponseMap all;
    Status const status = m_wire.execute(request, all, timeoutMs);
    if (auto const own = all.find(m_ecu->id()); own != all.end()) {
        responses.insert(*own);
    }
    return status == Status::Ok && responses.empty() ? Status::NoResponse : status;
}

} // namespace velmora
