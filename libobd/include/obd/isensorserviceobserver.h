#pragma once

#include <memory>
#include <vector>

namespace obd {

class ParameterDescriptor;
struct SensorValueDataModel;

/// Hears of live values. May detach itself, reset the service or select other parameters inside a call, but not drop
/// the service.
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

} // namespace obd
