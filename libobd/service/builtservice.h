#pragma once

#include "libobd/service/baseservice.h"
#include "libobd/service/velmorainstance.h"

#include <common/logrecord.h>

#include <memory>

namespace obd {

// A service as the builders make it: it follows the connection from the end of its making to the beginning of its end,
// so that no event on another thread finds half of it.
template <class Service>
class BuiltService final : public Service
{
public:
    explicit BuiltService(IObdVelmora const* obd) : Service(obd, BaseService::Following::Later)
    {
        this->startFollowing();
    }
    ~BuiltService() override { this->stopFollowing(); }

    BuiltService(BuiltService const&) = delete;
    BuiltService& operator=(BuiltService const&) = delete;
};

// A new service on the top-level object that was built last. Null, with a log line, before the first.
template <class Service>
std::shared_ptr<Service> buildService()
{
    IObdVelmora const* const obd = VelmoraInstance::get();
    if (obd == nullptr) {
        TERVEX_LOG(Fatal) << "No top-level object to build a service on";
        return nullptr;
    }
    return std::make_shared<BuiltService<Service>>(obd);
}

} // namespace obd
