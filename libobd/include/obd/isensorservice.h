#pragma once

#include <obd/export.h>
#include <obd/outcome.h>
#include <obd/parameteridentifier.h>
#include <tervex/inotifier.h>

#include <memory>
#include <vector>

namespace obd {

class ParameterDescriptor;
struct ParameterDataModel;
struct SensorDataModel;
struct SensorValueDataModel;

/// Hears of live values. May detach itself, reset the service, select other parameters or drop the service inside a
/// call.
class ISensorServiceObserver
{
public:
    virtual ~ISensorServiceObserver() = default;

    /// The parameters or their units have changed: all that the application holds on sensors is out of date, and the
    /// statistics start anew. After a change of the units running updates go on; after all other changes they have
    /// ended. On the thread that changes the setting, that selects another control module, or that closes the
    /// connection; in the last case while the closing holds its locks: services may be built and dropped here, but
    /// nothing be opened, closed or waited for.
    virtual void onInvalidated() {}

    /// A reading has come; success is always true, since a request that failed is only tried again. values holds one
    /// for each sensor that the reply told of: a sensor of the parameter may be missing. On the application's thread,
    /// inside Dispatcher::dispatch.
    virtual void onSensorUpdated(bool /*success*/, std::shared_ptr<ParameterDescriptor> const& /*descriptor*/,
                                 std::vector<std::shared_ptr<SensorValueDataModel>> const& /*values*/)
    {}
};

/// Live values of the current control module, and of what is worked out from them: fuel consumption, boost, power,
/// torque, battery voltage. attach, detach, updateOnce, startUpdates and reset belong to the application's thread, the
/// one that dispatches; the others may be called from any thread.
///
///     auto const rpm = obd::ParameterIdentifier(0x0C).id();
///     auto const sensors = obd::SensorServiceBuilder::createSensorService();
///     auto const now = sensors->askSensors(rpm); // once; now.kind says whether now.value can be used
///     sensors->attach(&observer);                // onSensorUpdated gets each reading
///     sensors->startUpdates({rpm});              // until reset
class ISensorService : public virtual tervex::INotifier<ISensorServiceObserver>
{
public:
    virtual bool isConnected() const = 0; ///< whether there is anything to read from

    /// What can be read, in rising order of identifiers. Empty without a connection.
    virtual std::vector<std::shared_ptr<ParameterDescriptor>> getDescriptors() = 0;

    /// Requests each parameter once; the readings come to the observers. Turns a running cycle into a last pass.
    virtual void updateOnce(std::vector<ParameterIdentifier::Id> const& ids) = 0;

    /// Requests the parameters over and over, in turn, as fast as the bus and a floor of 30 ms a request allow, until
    /// reset or a change that invalidates. Identifiers that the module does not offer are passed over; parameters that
    /// are running already go on. A request that fails is tried again at its next turn, without a word to the
    /// observers, and so is one that this module did not answer; on a dead link that means as fast as it fails, so
    /// reset or close then.
    virtual void startUpdates(std::vector<ParameterIdentifier::Id> const& ids) = 0;

    /// Ends all updates and forgets the statistics. To select fewer parameters: reset, then startUpdates.
    virtual void reset() = 0;

    /// The PIDs that the current module reports, without those that are no sensors. Empty without a module.
    virtual std::vector<ParameterIdentifier::Id> getSupportedIds() = 0;

    /// Describes a parameter without a request on the bus. Null without a module or for an identifier that has no
    /// parameter.
    virtual std::shared_ptr<ParameterDataModel> getParameter(ParameterIdentifier::Id id) = 0;

    /// Reads a parameter once and waits for it, for its time-out at the most. Empty if that fails, or if other modules
    /// alone answered. A sensor that the
    /// reply did not tell of comes without a value. Any thread but the dispatcher's worker.
    virtual std::vector<std::shared_ptr<SensorDataModel>> fetchSensors(ParameterIdentifier::Id id) = 0;

    /// Whether the current module reports the PID.
    virtual bool isSupported(ParameterIdentifier::Id id) = 0;

    /// fetchSensors, with how it went. What the module says it does not offer is not asked for. NothingStored: no
    /// sensor has a value. What is worked out is Answered if all that it needs came from this module.
    virtual Outcome<std::vector<std::shared_ptr<SensorDataModel>>> askSensors(ParameterIdentifier::Id id) = 0;
};

namespace SensorServiceBuilder {

/// A new service on the top-level object that was built last, which must outlive it; null before the first one. Build
/// and drop it on the thread that dispatches: see IObdVelmora.
OBD_EXPORT std::shared_ptr<ISensorService> createSensorService();

} // namespace SensorServiceBuilder

} // namespace obd
