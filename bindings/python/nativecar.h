#pragma once

#include "bindings/python/nativewatch.h"

#include <velmora/car.h>

#include <pybind11/pybind11.h>

#include <memory>
#include <string>
#include <vector>

namespace velmora::python {

// A car for Python: closed when told to, and an error, not a crash, from then on.
class NativeCar
{
public:
    explicit NativeCar(CarOptions const& options);
    ~NativeCar();
    NativeCar(NativeCar const&) = delete;
    NativeCar& operator=(NativeCar const&) = delete;

    // All of these let go of Python's lock; Ctrl-C ends the wait.
    pybind11::list read(std::vector<std::string> const& sensors) const;
    std::unique_ptr<NativeWatch> watch(std::vector<std::string> const& sensors, pybind11::object const& callback) const;
    void reconnect() const;
    std::string reportJson() const;

    pybind11::list modules() const;
    pybind11::list sensors() const;
    pybind11::list codes() const;
    pybind11::list freezeFrame(unsigned char frame) const;
    pybind11::list readiness() const;
    pybind11::list monitors() const;
    pybind11::list info() const;
    pybind11::list counters() const;
    pybind11::list clear() const;

    void close();

private:
    // Throws Error for a closed car.
    std::shared_ptr<Car> open() const;

    std::shared_ptr<Car> m_car;
    ClosedAtExit m_atExit{[this] { close(); }};
};

// A car with the program's settings and the given ones; None for what is not given.
std::unique_ptr<NativeCar> openCar(std::string const& port, pybind11::dict const& options);

// All meanings of a trouble code: code, system, and pairs of maker and text.
pybind11::tuple explainCode(std::string const& code);

} // namespace velmora::python
