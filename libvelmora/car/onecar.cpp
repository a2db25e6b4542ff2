#include "libvelmora/car/onecar.h"

#include <velmora/error.h>

#include <atomic>

namespace velmora {

namespace {

std::atomic<bool> carStands{false};

} // namespace

OneCar::OneCar()
{
    if (carStands.exchange(true)) {
        throw Error(ErrorKind::WrongUse, "There is a car in this process already",
                    {"a process has one car at a time: destroy the first one, or run another process"});
    }
}

OneCar::~OneCar()
{
    carStands = false;
}

} // namespace velmora
