#pragma once

#include <obd/export.h>
#include <obd/outcome.h>
#include <obd/sensordatamodels.h>

#include <memory>
#include <string>
#include <vector>

namespace obd {

/// What is known of the current control module, and what it tells of itself and the vehicle (service 09). The fetch
/// operations ask the vehicle and block their caller meanwhile; call from any thread but the dispatcher's worker. The
/// others read what was learnt when the connection was opened. Without a connection or a control module texts and lists
/// are empty and booleans false, and so are those that are fetched where the vehicle does not answer; the log tells
/// why.
class IEcuService
{
public:
    virtual ~IEcuService() = default;

    /// All that the library can show of PIDs up to 0x7F, and what it works out, whether the module supports it or not,
    /// in the names, units and ranges of the module and the unit system of the settings; without readings. PIDs above:
    /// see furtherParameters.
    virtual std::vector<std::shared_ptr<ParameterDataModel>> supportedParameters() = 0;
    /// Whether the module reports the parameter. The library's own parameters are no PIDs, so it is no judge of them.
    virtual bool isParameterSupported(std::shared_ptr<ParameterDataModel> const& parameter) = 0;

    /// The OBD standard that the module reports to meet, such as "EOBD".
    virtual std::string standardDescription() = 0;
    virtual std::string protocolDescription() = 0; ///< of the bus
    virtual std::string ecuName() = 0;             ///< such as "ECM"
    virtual std::string ecuDescription() = 0;      ///< such as "Engine Control"

    virtual bool hasVehicleIdentificationNumber() = 0;          ///< by what the module says it supports
    virtual std::string fetchVehicleIdentificationNumber() = 0; ///< empty if it is not told
    /// Names of the software and calibrations, and their checksums in the same order.
    virtual bool hasCalibrationIds() = 0;
    virtual std::vector<std::string> fetchCalibrationIds() = 0;      ///< empty if they are not told
    virtual bool hasVerificationNumbers() = 0;                       ///< by what the module says it supports
    virtual std::vector<std::string> fetchVerificationNumbers() = 0; ///< hexadecimal; empty if they are not told
    virtual bool hasEngineSerialNumber() = 0;                        ///< by what the module says it supports
    virtual std::string fetchEngineSerialNumber() = 0;               ///< empty if it is not told
    /// The exhaust regulation or type approval number.
    virtual bool hasErotan() = 0;
    virtual std::string fetchErotan() = 0; ///< empty if it is not told

    /// As supportedParameters, of PIDs above 0x7F.
    virtual std::vector<std::shared_ptr<ParameterDataModel>> furtherParameters() = 0;

    /// The fetch operations, each with how it went. What the module says it does not offer is not asked for.
    virtual Outcome<std::string> askVehicleIdentificationNumber() = 0;
    virtual Outcome<std::vector<std::string>> askCalibrationIds() = 0;      ///< fetchCalibrationIds
    virtual Outcome<std::vector<std::string>> askVerificationNumbers() = 0; ///< fetchVerificationNumbers
    virtual Outcome<std::string> askEngineSerialNumber() = 0;               ///< fetchEngineSerialNumber
    virtual Outcome<std::string> askErotan() = 0;                           ///< fetchErotan
};

namespace EcuServiceBuilder {

/// A new service on the top-level object that was built last, which must outlive it; null before the first one. Build
/// and drop it on the thread that dispatches: see IObdVelmora.
OBD_EXPORT std::shared_ptr<IEcuService> createEcuService();

} // namespace EcuServiceBuilder

} // namespace obd
