#pragma once

#include <velmora/caroptions.h>
#include <velmora/export.h>

#include <memory>
#include <string>
#include <vector>

namespace velmora {

class ConsoleParts;

/// The bare dialogue with whatever is at a port, without that of a car: what it says comes as it was said. A process
/// has a car or a console at a time. Works on its caller's thread, on which the callbacks of the options are called,
/// too.
class VELMORA_EXPORT AdapterConsole
{
public:
    /// What the adapter sent up to its prompt.
    struct Answer
    {
        bool complete = false;          ///< whether the prompt came
        std::vector<std::string> lines; ///< without the echo of the command and without empty lines
    };

    /// Opens the port; sends nothing. Throws Error.
    explicit AdapterConsole(CarOptions const& options);
    ~AdapterConsole();
    AdapterConsole(AdapterConsole const&) = delete;
    AdapterConsole& operator=(AdapterConsole const&) = delete;

    /// Waits five seconds for the answer to a command of the adapter, half a minute for a vehicle's. Throws Error if
    /// the link breaks or a stop is wanted meanwhile.
    Answer ask(std::string const& command);
    /// Throws Error if the link is lost or a stop is wanted.
    void check() const;
    std::string port() const; ///< its address, for messages

private:
    std::unique_ptr<ConsoleParts> m_parts;
};

} // namespace velmora
