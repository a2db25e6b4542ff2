#pragma once

#include <obd/obdprotocol.h>

#include <string>

namespace obd {

/// What an application may ask about the adapter. Texts are copies; they are empty before the adapter was identified
/// and after the connection has ended.
class IAdapter
{
public:
    IAdapter() = default;
    IAdapter(IAdapter const&) = default;            ///< nothing to copy
    IAdapter& operator=(IAdapter const&) = default; ///< nothing to copy
    virtual ~IAdapter() = default;

    /// Name and version, such as "ELM327 v1.5".
    virtual std::string device() = 0;
    /// The adapter's own description, such as "OBDII to RS232 Interpreter".
    virtual std::string description() = 0;
    /// The identifier that its owner has stored in it, often empty.
    virtual std::string identification() = 0;
    /// Supply voltage in volts, as the adapter measures it. False, with volts untouched, if it gives no number. Talks
    /// to the adapter: only while nothing else does.
    virtual bool batteryVoltage(float& volts) = 0;
    /// The bus family in use.
    virtual ObdProtocol getProtocol() = 0;
    /// The adapter's own words for the protocol in use.
    virtual std::string getProtocolDescription() = 0;
};

} // namespace obd
