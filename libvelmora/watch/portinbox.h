#pragma once

#include <velmora/error.h>

#include <algorithm>
#include <chrono>
#include <condition_variable>
#include <mutex>
#include <string>
#include <string_view>

namespace velmora {

// What came from a port, for the thread that waits for it.
class PortInbox
{
public:
    void add(std::string_view bytes)
    {
        std::lock_guard const lock(m_mutex);
        m_text += bytes;
        m_wake.notify_one();
    }
    void lose()
    {
        std::lock_guard const lock(m_mutex);
        m_lost = true;
        m_wake.notify_one();
    }

    // All up to the prompt; what there is when the time runs out. Throws Error if the link breaks.
    std::string takeUntilPrompt(std::chrono::steady_clock::time_point limit)
    {
        std::unique_lock lock(m_mutex);
        m_wake.wait_until(lock, limit, [this] { return m_lost || m_text.find('>') != std::string::npos; });
        if (m_lost) {
            throw Error(ErrorKind::LinkLost, "The link to the adapter broke");
        }
        std::string text = m_text.substr(0, m_text.find('>'));
        m_text.erase(0, std::min(m_text.size(), text.size() + 1));
        return text;
    }
    void clear()
    {
        std::lock_guard const lock(m_mutex);
        m_text.clear();
    }
    bool hasText()
    {
        std::lock_guard const lock(m_mutex);
        return !m_text.empty();
    }
    bool isLost()
    {
        std::lock_guard const lock(m_mutex);
        return m_lost;
    }

private:
    std::mutex m_mutex;
    std::condition_variable m_wake;
    std::string m_text;  // protected by m_mutex
    bool m_lost = false; // protected by m_mutex
};

} // namespace velmora
