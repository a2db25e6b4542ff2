#pragma once

#include <obd/export.h>

#include <memory>

namespace obd {

class IObdVelmora;
class ISettings;

namespace ObdVelmoraBuilder {

/// A new top-level object on the application's settings. The three values are returned by getHostValue1 to 3 and not
/// looked at. Services built later belong to the object built last. One thread at a time. Null, with a log line and
/// without replacing the object built last, if settings is.
OBD_EXPORT std::shared_ptr<IObdVelmora> createObdVelmora(unsigned int hostValue1, unsigned int hostValue2,
                                                         unsigned int hostValue3,
                                                         std::shared_ptr<ISettings> const& settings);

} // namespace ObdVelmoraBuilder

} // namespace obd
