#include "libvelmora/watch/voltageprobe.h"

#include "libvelmora/watch/portinbox.h"

#include <algorithm>
#include <charconv>
#include <string>

namespace velmora {

namespace {

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
    PortInbox inbox;
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
