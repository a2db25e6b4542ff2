#pragma once

#include <obd/powertrainparameter.h>
#include <obd/sensorvalue.h>

#include <memory>
#include <string>
#include <vector>

namespace support {

using Bytes = std::vector<unsigned char>;

// Hands a parameter the reply of a module to its own request, with this payload. False if it was refused.
inline bool reply(obd::PowertrainParameter& parameter, std::shared_ptr<obd::IEcu> const& ecu, Bytes const& payload)
{
    Bytes data;
    parameter.requestData(data);
    data[0] = static_cast<unsigned char>(data[0] + 0x40);
    data.insert(data.end(), payload.begin(), payload.end());
    return parameter.setResponseData(ecu, data);
}

// The values of all sensors as the user sees them, such as "1.275 | 99.2". After a sensor that has none the next one
// tells its index: "0.450 | 2: Closed loop".
inline std::string texts(obd::PowertrainParameter& parameter, obd::IEcu const& ecu, obd::UnitSystem system)
{
    std::string all;
    int expected = obd::Pid2Uid(parameter.pid());
    for (auto const& value : parameter.values(ecu, system)) {
        all += all.empty() ? "" : " | ";
        all += value->uid() == expected ? "" : std::to_string(value->uid() % 10) + ": ";
        all += value->textualValue();
        expected = value->uid() + 1;
    }
    return all;
}

} // namespace support
