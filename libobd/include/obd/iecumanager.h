#pragma once

#include <tervex/ieventproducer.h>

#include <memory>
#include <string>
#include <vector>

namespace obd {

class IEcu;
class ParameterDescriptor;

/// What became of the selection of control modules.
enum class EcuManagerEvent : int
{
    EcuListChanged = 0,
    CurrentEcuChanged = 1,
};

/// The control modules of the current connection, and the one that the services work with. Safe from any thread; events
/// are fired on the thread that opens, closes or selects.
class IEcuManager : public virtual tervex::IEventProducer<EcuManagerEvent, tervex::IEventListener<EcuManagerEvent>>
{
public:
    /// Null without a connection, or after an unknown id was selected.
    virtual std::shared_ptr<IEcu> getCurrentEcu() = 0;
    /// Selects by id. An unknown id leaves no module selected; the event is fired all the same.
    virtual void setCurrentEcu(unsigned int id) = 0;
    /// Appends the ids, in rising order.
    virtual void getEcuIds(std::vector<unsigned int>& ids) = 0;
    virtual std::vector<std::shared_ptr<IEcu>> getEcus() = 0; ///< in rising order of id
    /// Short and long name; empty for an unknown id.
    virtual std::string getEcuName(unsigned int id) = 0;
    virtual std::string getEcuDescription(unsigned int id) = 0; ///< the long name
    /// The parameters that the module offers, for display, with no request on the bus. Empty for an unknown id.
    virtual std::vector<std::shared_ptr<ParameterDescriptor>> getParameters(unsigned int id) = 0;
};

} // namespace obd
