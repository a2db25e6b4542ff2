#include "libobd/service/velmorainstance.h"

#include <atomic>

namespace obd {

namespace {

std::atomic<IObdVelmora*>& holder()
{
    static std::atomic<IObdVelmora*> instance{nullptr};
    return instance;
}

} // namespace

IObdVelmora* VelmoraInstance::get()
{
    return holder();
}

void VelmoraInstance::set(IObdVelmora* instance)
{
    holder() = instance;
}

} // namespace obd
