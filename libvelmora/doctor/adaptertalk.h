#pragma once

#include "libvelmora/port/iport.h"

#include <chrono>
#include <condition_variable>
#include <functional>
#include <memory>
#include <mutex>
#include <optional>
#include <string>

namespace velmora {

// A plain conversation with an adapter, before the library has the port: one command, one reply up to the prompt.
class AdapterTalk
{
public:
    // check is called about ten times a second while a reply is waited for, and throws to end that.
    explicit AdapterTalk(std::unique_ptr<IPort> port, std::function<void()> check = {});
    ~AdapterTalk();
    AdapterTalk(AdapterTalk const&) = delete;
    AdapterTalk& operator=(AdapterTalk const&) = delete;

    // The reply without its prompt, line ends as blanks; nothing if no prompt came in time. An echo of the command is
    // cut off.
    std::optional<std::string> ask(std::string const& command, std::chrono::milliseconds limit);
    // Whether the last reply had the command in front.
    bool echoed() const { return m_echoed; }
    bool lost() const;

private:
    void onBytes(std::string_view bytes);
    std::string cleaned(std::string reply, std::string const& command);

    mutable std::mutex m_mutex;
    std::condition_variable m_changed;
    std::string m_received; // protected by m_mutex
    bool m_lost = false;    // protected by m_mutex
    bool m_echoed = false;
    std::function<void()> m_check;
    std::unique_ptr<IPort> m_port;
};

} // namespace velmora
