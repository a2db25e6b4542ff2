#include "bindings/python/nativecar.h"
#include "bindings/python/threads.h"
#include "bindings/python/tuples.h"

#include <velmora/catalogue.h>

namespace py = pybind11;

namespace velmora::python {

py::list NativeCar::modules() const
{
    py::list list;
    for (Module const& module : interruptibly([car = open()] { return car->modules(); })) {
        list.append(py::make_tuple(module.id, text(module.name), text(module.description)));
    }
    return list;
}

py::list NativeCar::sensors() const
{
    py::list list;
    for (Sensor const& sensor : interruptibly([car = open()] { return car->sensors(); })) {
        list.append(py::make_tuple(sensor.module, sensor.key, textOrNone(sensor.pid), text(sensor.title)));
    }
    return list;
}

py::list NativeCar::codes() const
{
    return plainModules(interruptibly([car = open()] { return car->codeReports(); }));
}

py::list NativeCar::freezeFrame(unsigned char frame) const
{
    return plainModules(interruptibly([car = open(), frame] { return car->freezeFrame(frame); }));
}

py::list NativeCar::readiness() const
{
    return plainModules(interruptibly([car = open()] { return car->readiness(); }));
}

py::list NativeCar::monitors() const
{
    return plainModules(interruptibly([car = open()] { return car->monitors(); }));
}

py::list NativeCar::info() const
{
    return plainModules(interruptibly([car = open()] { return car->info(); }));
}

py::list NativeCar::counters() const
{
    return plainModules(interruptibly([car = open()] { return car->counters(); }));
}

py::list NativeCar::clear() const
{
    return plainModules(interruptibly([car = open()] { return car->clearCodes(); }));
}

py::tuple explainCode(std::string const& code)
{
    return plain(explain(code));
}

} // namespace velmora::python
