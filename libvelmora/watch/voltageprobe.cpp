#include "libvelmora/watch/voltageprobe.h"

#include <velmora/error.h>

#include <algorithm>
#include <charconv>
#include <condition_variable>
#include <mutex>
#include <string>

namespace velmora {

namespace {

// What came from a port, for the thread that waits for it.
class Inbox
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
    // All up to the prompt; what there is when the time runs out.
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

private:
    std::mutex m_mutex;
    std::condition_variable m_wake;
    std::string m_text;  // protected by m_mutex
    bool m_lost = false; // protected by m_mutex
};

constexpr std::chrono::milliseconds wakeTime{500};

} // namespace

std::optional<double> findVolts(std::string_view text)
{
    constexpr double highest = 40.0;
    for (std::size_t at = text.find_first_of("0123456789"); at != std::string_view::npos;
         at = text.find_first_of("0123456789", at)) {
        double value = 0.0;
        auto const [end, error] =
            std::from_chars(text.data() + at, text.data() + text.size(), value, std::chars_format::fixed);
        std::size_t const next = static_cast<std::size_t>(end - text.data());
        bool const unit = next < text.size() && (text[next] == 'V' || text[next] == 'v');
        if (error == std::errc() && unit && value > 0.0 && value < highest) {
            return value;
        }
        at = std::max(next, at + 1);
    }
    return std::nullopt;
}

std::optional<double> probeVoltage(std::unique_ptr<IPort> port, std::chrono::milliseconds limit)
{
    Inbox inbox;
    auto const end = std::chrono::steady_clock::now() + limit;
    port->start([&inbox](std::string_view bytes) { inbox.add(bytes); }, [&inbox] { inbox.lose(); });
    struct Closer
    {
        IPort& port;
        ~Closer() { port.close(); }
    } const closer{*port};
    // A return wakes an adapter that sleeps, and ends what another program left on the line.
    port->write("\r");
    inbox.takeUntilPrompt(std::min(end, std::chrono::steady_clock::now() + wakeTime));
    port->write("ATRV\r");
    std::optional<double> volts = findVolts(inbox.takeUntilPrompt(end));
    return volts ? volts : findVolts(inbox.takeUntilPrompt(std::min(end, std::chrono::steady_clock::now() + wakeTime)));
}

} // namespace velmora
