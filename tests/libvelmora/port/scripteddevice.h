#pragma once

#include <atomic>
#include <cstdlib>
#include <fcntl.h>
#include <mutex>
#include <poll.h>
#include <string>
#include <sys/ioctl.h>
#include <termios.h>
#include <thread>
#include <unistd.h>
#include <utility>
#include <vector>

namespace velmora::test {

// A device of the test's own at the end of a pseudo-terminal: answers a line at one rate, or with B0 at each, with a
// fixed text.
class ScriptedDevice
{
public:
    ScriptedDevice(std::string answer, speed_t speed) : m_answer(std::move(answer)), m_speed(speed)
    {
        m_master = ::posix_openpt(O_RDWR | O_NOCTTY | O_CLOEXEC);
        ::grantpt(m_master);
        ::unlockpt(m_master);
        m_path = ::ptsname(m_master);
        m_slave = ::open(m_path.c_str(), O_RDWR | O_NOCTTY | O_CLOEXEC);
        m_thread = std::thread([this] { serve(); });
    }
    ~ScriptedDevice()
    {
        m_stop = true;
        m_thread.join();
        ::close(m_slave);
        ::close(m_master);
    }
    ScriptedDevice(ScriptedDevice const&) = delete;
    ScriptedDevice& operator=(ScriptedDevice const&) = delete;

    std::string const& path() const { return m_path; }
    std::string received() const
    {
        std::lock_guard const lock(m_mutex);
        return m_received;
    }
    // The rates at which lines came, in their order.
    std::vector<speed_t> rates() const
    {
        std::lock_guard const lock(m_mutex);
        return m_rates;
    }
    // The settings of the line when it was asked last.
    termios settingsWhenAsked() const
    {
        std::lock_guard const lock(m_mutex);
        return m_asked;
    }
    // Says something that nobody has asked for.
    void say(std::string const& text) const
    {
        [[maybe_unused]] ssize_t const written = ::write(m_master, text.data(), text.size());
    }
    // Each character of an answer comes once the one before it was read.
    void spell() { m_spells = true; }
    // The first answer, before the one that stays.
    void answerFirst(std::string const& answer)
    {
        std::lock_guard const lock(m_mutex);
        m_first = answer;
    }
    termios settings() const
    {
        termios settings{};
        ::tcgetattr(m_slave, &settings);
        return settings;
    }

private:
    void serve()
    {
        while (!m_stop) {
            pollfd state{m_master, POLLIN, 0};
            char bytes[64];
            if (::poll(&state, 1, 10) <= 0) {
                continue;
            }
            ssize_t const count = ::read(m_master, bytes, sizeof(bytes));
            std::lock_guard const lock(m_mutex);
            m_received.append(bytes, count > 0 ? static_cast<std::size_t>(count) : 0);
            termios const now = settings();
            if (!m_received.ends_with('\r')) {
                continue;
            }
            m_rates.push_back(::cfgetospeed(&now));
            m_asked = now;
            if (m_speed == B0 || m_rates.back() == m_speed) {
                answer(m_first.empty() ? m_answer : std::exchange(m_first, {}));
            }
        }
    }
    void answer(std::string const& text) const
    {
        if (!m_spells) {
            say(text);
            return;
        }
        for (char const each : text) {
            say(std::string(1, each));
            int unread = 1;
            for (int i = 0; i < 500 && unread != 0; ++i) {
                ::poll(nullptr, 0, 1);
                ::ioctl(m_slave, FIONREAD, &unread);
            }
        }
    }

    std::string m_answer;
    speed_t m_speed;
    std::string m_path;
    int m_master = -1;
    int m_slave = -1;
    std::atomic<bool> m_stop{false};
    std::atomic<bool> m_spells{false};
    mutable std::mutex m_mutex;
    std::string m_received; // protected by m_mutex, as what follows
    std::vector<speed_t> m_rates;
    termios m_asked{};
    std::string m_first;
    std::thread m_thread;
};

} // namespace velmora::test
