#pragma once

#include <velmora/caroptions.h>
#include <velmora/export.h>

#include <memory>
#include <string>

namespace velmora {

class DoctorParts;

/// Walks the chain from the port to the control modules, as far as it holds: which link is dead or slow, and what to
/// do. In place of a car, for there may be none to connect to; a process has one of the two at a time. Works on its
/// caller's thread, on which the callbacks of the options are called, too.
class VELMORA_EXPORT Doctor
{
public:
    /// Examines. options as for a car, but for its recorder. Throws Error only where nothing can be examined: no port,
    /// or a wish to stop.
    explicit Doctor(CarOptions const& options);
    ~Doctor();
    Doctor(Doctor const&) = delete;
    Doctor& operator=(Doctor const&) = delete;

    bool isHealthy() const;     ///< whether no link of the chain is bad
    std::string toText() const; ///< the report for people
    std::string toJson() const; ///< the object of docs/json.md
    /// One text to attach to a question: the report, versions, settings without what is secret, and all that passed the
    /// port, with zeros for the last six characters of a vehicle identification number unless keepVin. Of Bluetooth
    /// addresses it has the half that tells the maker.
    std::string bundle(bool keepVin = false) const;

    /// Whether saveBundle could write that file, which can be told before a minute is spent with the vehicle. Throws
    /// Error if it can't, or if the file stands already, unless replace.
    static void checkBundle(std::string const& file, bool replace = false);
    /// Writes the bundle, in place of what stands there. Throws Error if it can't be written.
    void saveBundle(std::string const& file, bool keepVin = false) const;

private:
    std::unique_ptr<DoctorParts> m_parts;
};

} // namespace velmora
