#pragma once

#include <memory>

namespace obd {

class IConfiguration;
class IConnectionManager;
class IConnectionNotifier;
class IEcuManager;
class IVelmoraSettings;

/// Start here: the top-level object, which owns the connection and all that hangs on it. Pointers that it hands out are
/// borrowed and live as long as it does. It must outlive every service that was built while it was the latest one;
/// destroying it closes the connection.
///
/// Services: build and drop them on the thread that calls Dispatcher::dispatch, at any time, also inside the calls that
/// their observers get there and while another thread opens or closes the connection, selects a module or changes
/// settings. Calls that reach observers on such another thread, onActiveEcuChanged and onInvalidated, are waited for by
/// the dropping: they must not wait for the dispatching thread. A service may be built inside them, too. The observers'
/// lists have no lock: attach and detach while no other thread closes, selects or changes settings.
///
///     obd::LIBOBDOpen("velmora.log");
///     auto car = obd::ObdVelmoraBuilder::createObdVelmora(0, 0, 0, settings); // an ISettings of the application
///     auto const bridge = std::make_shared<obd::DataBridge>();                // moved to and from the open port
///     if (car->getConnectionManager()->openConnection(bridge, obd::VehicleProtocol::Automatic, false)) {
///         auto const codes = obd::TroubleCodeServiceBuilder::createTroubleCodeService()->askConfirmedCodes();
///     }
///     car.reset(); // closes the connection
///     obd::LIBOBDClose();
class IObdVelmora
{
public:
    virtual ~IObdVelmora() = default;

    /// The three values that the object was built with; the application's own.
    virtual unsigned int getHostValue1() const = 0;
    virtual unsigned int getHostValue2() const = 0; ///< the second
    virtual unsigned int getHostValue3() const = 0; ///< the third

    virtual std::shared_ptr<IConnectionManager> getConnectionManager() const = 0; ///< opens and closes
    virtual IEcuManager* getEcuManager() const = 0;                               ///< selects the control module
    virtual IVelmoraSettings* getSettings() const = 0;                            ///< of vehicle and units
    virtual IConfiguration* getConfiguration() const = 0;                         ///< what there is to choose from
    virtual IConnectionNotifier* getConnectionNotifier() const = 0;               ///< tells opening and closing
};

} // namespace obd
