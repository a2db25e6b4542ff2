#pragma once

#include "libvelmora/session/session.h"

#include <velmora/caroptions.h>

#include <functional>
#include <stop_token>

namespace velmora {

// Tells the application of files that a session could not write to their end.
void tellUnwritten(Session const& session, CarOptions const& options);

// Around a session of a thread of one's own: the wish to stop ends it, and its end is told.
class SessionEnd
{
public:
    SessionEnd(Session& session, CarOptions const& options)
        : m_session(session), m_options(options), m_onStop(m_options.stop, [&session] { session.interrupt(); })
    {}
    ~SessionEnd() { tellUnwritten(m_session, m_options); }
    SessionEnd(SessionEnd const&) = delete;
    SessionEnd& operator=(SessionEnd const&) = delete;

private:
    Session& m_session;
    CarOptions const m_options;
    std::stop_callback<std::function<void()>> m_onStop;
};

} // namespace velmora
