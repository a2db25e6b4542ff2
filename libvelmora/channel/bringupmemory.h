#pragma once

#include "libvelmora/channel/elmcommand.h"
#include "libvelmora/channel/replyhealer.h"

#include <map>
#include <optional>
#include <set>
#include <string>

namespace velmora {

// What modules have told of their supported IDs while a connection is brought up: the discovery asks for them once for
// each module, by broadcast. It remembers only between start and stop, only those requests, and only replies in which
// every module that was discovered has spoken.
class BringUpMemory
{
public:
    void start();
    void stop();
    bool isOn() const { return m_on; }

    void remember(ElmCommand const& command, HealedReply const& reply);
    std::optional<std::string> recall(ElmCommand const& command) const;

    // The modules that answered the first request.
    std::set<unsigned int> const& modules() const { return m_modules; }

private:
    bool m_on = false;
    bool m_begun = false; // the discovery's reply has come
    std::set<unsigned int> m_modules;
    std::map<std::string, std::string> m_replies;
};

} // namespace velmora
