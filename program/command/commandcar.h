#pragma once

#include "program/globaloptions.h"

#include <velmora/car.h>
#include <velmora/error.h>

#include <string>
#include <vector>

namespace velmora::cli {

// Ctrl-C as a wish to stop, for as long as it lives.
class InterruptStop
{
public:
    InterruptStop();
    ~InterruptStop();
    InterruptStop(InterruptStop const&) = delete;
    InterruptStop& operator=(InterruptStop const&) = delete;

    std::stop_token token() const { return m_source.get_token(); }

private:
    std::stop_source m_source;
};

// The car of one command, connected: tells its progress on standard error as far as the options want it, and Ctrl-C
// ends it.
class CommandCar : private InterruptStop, public Car
{
public:
    explicit CommandCar(GlobalOptions const& options, std::shared_ptr<Recorder> recorder = nullptr);

    GlobalOptions const& options() const { return m_options; }

private:
    GlobalOptions const m_options;
};

// What the global options say of a car. stop ends it.
CarOptions carOptions(GlobalOptions const& options, std::stop_token stop);

// That the vehicle is silent, with the adapter's word for it if it has one.
Error silentVehicle(Car& car, std::string const& what, std::vector<std::string> hints);

} // namespace velmora::cli
