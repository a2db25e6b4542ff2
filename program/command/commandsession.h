#pragma once

#include "libvelmora/session/session.h"
#include "program/globaloptions.h"

#include <velmora/error.h>

#include <string>
#include <vector>

namespace velmora::cli {

// The session of one command: tells its progress on standard error as far as the options want it, and Ctrl-C ends it.
class CommandSession : public Session
{
public:
    explicit CommandSession(GlobalOptions const& options);
    ~CommandSession();
    CommandSession(CommandSession const&) = delete;
    CommandSession& operator=(CommandSession const&) = delete;

    GlobalOptions const& options() const { return m_options; }

private:
    GlobalOptions const m_options;
};

// That the vehicle is silent, with the adapter's word for it if it has one.
Error silentVehicle(Session const& session, std::string const& what, std::vector<std::string> hints);

} // namespace velmora::cli
