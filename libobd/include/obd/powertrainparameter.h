#pragma once

#include <obd/obdmode.h>
#include <obd/obdparameter.h>
#include <obd/parameteridentifier.h>
#include <obd/unitsystem.h>

#include <memory>
#include <string>
#include <vector>

namespace obd {

class SensorInfo;
class SensorValue;

/// The base of all PID classes of services 01 (current data) and 02 (freeze frame): request and expected reply follow
/// from service, PID and frame. Values are kept by control module, so that one object answers for all of them.
class OBD_EXPORT PowertrainParameter : public ObdParameter
{
public:
    /// frame: the freeze frame number, of meaning in service 02 only.
    PowertrainParameter(ObdMode mode, unsigned char frame) : m_frame(frame), m_mode(mode) {}

    ObdMode mode() const { return m_mode; }         ///< service 01, or 02 for a freeze frame
    unsigned char frame() const { return m_frame; } ///< the freeze frame's number

    virtual ParameterIdentifier::Id pid() const = 0; ///< what the parameter is known by

    /// The parameter's name, which may depend on what the module has.
    virtual std::string description(IEcu const& ecu) = 0;
    /// Its sensors with units and ranges, which may depend on the maxima that the module tells.
    virtual std::vector<std::shared_ptr<SensorInfo const>> sensorInfo(IEcu const& ecu) = 0;
    /// What was read last from the module, converted to the unit system. May leave sensors out that have no value.
    virtual std::vector<std::shared_ptr<SensorValue>> values(IEcu const& ecu, UnitSystem system) = 0;

protected:
    void getRequestData(std::vector<unsigned char>& data) const override; ///< service, PID, and the frame in service 02
    void getSignature(std::vector<unsigned char>& signature) const override;
    bool fromBytes(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& data) override;

    /// Reads the bytes behind service, PID and frame. On the legacy buses a checksum may trail the data: read from the
    /// start only. False leaves the module's stored value alone.
    virtual bool fromPayload(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& payload) = 0;

private:
    std::size_t headerLength() const { return m_mode == ObdMode::FreezeFrame ? 3 : 2; }
    void header(std::vector<unsigned char>& data, int offset) const;

    unsigned char m_frame;
    ObdMode m_mode;
};

} // namespace obd
