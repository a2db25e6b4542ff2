#pragma once

#include "velmora/exitcode.h"

#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

namespace velmora {

// Ends a command: what was tried and what happened, what to try next, and the exit code.
class Failure : public std::runtime_error
{
public:
    Failure(ExitCode code, std::string const& what, std::vector<std::string> hints = {})
        : std::runtime_error(what), m_code(code), m_hints(std::move(hints))
    {}

    ExitCode code() const { return m_code; }
    std::vector<std::string> const& hints() const { return m_hints; }

private:
    ExitCode m_code;
    std::vector<std::string> m_hints;
};

} // namespace velmora
