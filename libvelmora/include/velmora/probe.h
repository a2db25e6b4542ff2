#pragma once

#include <velmora/export.h>
#include <velmora/print.h>

#include <cstddef>
#include <functional>
#include <memory>
#include <string>

namespace velmora {

struct ProbeState;

/// What to ask a control module for, one identifier after the other; numbers are hexadecimal texts, as people write
/// them.
struct ProbeRequest
{
    std::string module = "7E0"; ///< identifier of the requests: "7E0", "18DA10F1"
    std::string reply = {};     ///< that of the replies; empty where it follows from the module
    std::string extended = {};  ///< address byte of the module; empty for none
    std::string service = "22"; ///< 22, 21 or 1A, which only read
    std::string from = "F100";  ///< first identifier
    std::string to = "F1FF";    ///< last identifier
    bool fresh = false;         ///< begins anew where an interrupted run would go on
};

/// The module of a request as it is asked: "7E0". Throws Error for a request that makes no sense or may not be sent.
VELMORA_EXPORT std::string probedModule(ProbeRequest const& request);

/// What a module answered to a probe; see Car::probe. Plain data within: copy it, keep it, hand it to any thread.
class VELMORA_EXPORT ProbeReport
{
public:
    std::size_t told() const;                         ///< how many identifiers told something
    std::string toText(TextStyle const& style) const; ///< each with its data, then what is there but locked
    std::string toJson() const;                       ///< one object
    std::string toSignals() const; ///< a file of signals to start from, their formulas and meaning left open

private:
    friend class Car;
    explicit ProbeReport(std::shared_ptr<ProbeState const> state);

    std::shared_ptr<ProbeState const> m_state;
};

} // namespace velmora
