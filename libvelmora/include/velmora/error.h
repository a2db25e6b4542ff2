#pragma once

#include <velmora/export.h>

#include <iosfwd>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

namespace velmora {

/// Why something could not be done. The numbers are the exit codes of the program.
enum class ErrorKind : int
{
    Failed = 1,        ///< for a reason that no other kind names
    WrongUse = 2,      ///< what was asked for makes no sense
    PortFailed = 3,    ///< the port could not be opened
    AdapterSilent = 4, ///< nothing that looks like an adapter answers
    VehicleSilent = 5, ///< the adapter works, no control module answers
    NotSupported = 6,  ///< the vehicle does not offer what was asked for
    Refused = 7,       ///< the vehicle said no
    LinkLost = 8,      ///< the connection broke
    Interrupted = 130, ///< the user wanted an end
};

/// Tells what was tried and what happened, and what to try next.
class VELMORA_EXPORT Error : public std::runtime_error
{
public:
    /// what: what was tried and what happened. hints: what to try next, the best first.
    Error(ErrorKind kind, std::string const& what, std::vector<std::string> hints = {})
        : std::runtime_error(what), m_kind(kind), m_hints(std::move(hints))
    {}

    ErrorKind kind() const { return m_kind; } ///< also a good exit code
    /// The likeliest things to try next, the best first; a sentence without its full stop each.
    std::vector<std::string> const& hints() const { return m_hints; }

private:
    ErrorKind m_kind;
    std::vector<std::string> m_hints;
};

/// "vehicle silent", and so on.
VELMORA_EXPORT std::ostream& operator<<(std::ostream& out, ErrorKind kind);
/// What happened, and what to try on a line each behind "  - ".
VELMORA_EXPORT std::ostream& operator<<(std::ostream& out, Error const& error);

} // namespace velmora
