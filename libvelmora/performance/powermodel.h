#pragma once

#include "libvelmora/poll/pollresult.h"

#include <obd/iecu.h>
#include <obd/iobdproxy.h>
#include <obd/ivelmorasettings.h>
#include <obd/powertrainparameter.h>

#include <memory>
#include <optional>

namespace velmora {

// The library's power and torque of a vehicle, fed with readings of speed and engine speed that were asked for anyway,
// so that nothing more goes over the bus. One thread.
class PowerModel
{
public:
    struct Output
    {
        double rpm = 0.0;
        double kilowatt = 0.0;
        double newtonMetre = 0.0;
    };

    // The vehicle's weight is that of the settings.
    PowerModel(std::shared_ptr<obd::IEcu> ecu, obd::IVelmoraSettings const& settings);
    ~PowerModel();
    PowerModel(PowerModel const&) = delete;
    PowerModel& operator=(PowerModel const&) = delete;

    // Takes a reading as soon as it has come. Nothing for others, while one of the two is missing, and more often than
    // twice a second: the steps of whole km/h would look like power.
    std::optional<Output> take(Reading const& reading);

private:
    class Held;

    std::shared_ptr<obd::IEcu> m_ecu;
    std::shared_ptr<Held> m_held;
    std::shared_ptr<obd::PowertrainParameter> m_power;
    std::shared_ptr<obd::PowertrainParameter> m_torque; // updates the power within
    std::chrono::system_clock::time_point m_lastUpdate;
};

// km/h of a reading of service 01, PID 0D, whatever units it was asked for in.
std::optional<double> speedIn(Reading const& reading);
// rpm of one of PID 0C.
std::optional<double> engineSpeedIn(Reading const& reading);

} // namespace velmora
