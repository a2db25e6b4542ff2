// What a run notices of its own readings: rates, and silence.
#include "program/live/liverun.h"
#include "program/terminal/output.h"

#include <velmora/error.h>

#include <fmt/format.h>

#include <cstdio>

namespace velmora::cli {

namespace {

using std::chrono::seconds;

constexpr seconds silence{3};
constexpr seconds longSilence{15};
constexpr seconds ratesSettle{5};

} // namespace

double LiveRun::rate() const
{
    double const elapsed = std::chrono::duration<double>(std::chrono::steady_clock::now() - m_start).count();
    return elapsed > 0.0 ? static_cast<double>(m_table.readings()) / elapsed : 0.0;
}

void LiveRun::tellRate() const
{
    fmt::print(stderr, "{} readings, {:.1f} a second\n", m_table.readings(), rate());
    if (std::string const rates = m_reader->reachedRates(); !rates.empty()) {
        fmt::print(stderr, "Reached: {}\n", rates);
    }
}

// Once: what the bus can't give is shared fairly, but should not surprise.
void LiveRun::watchRates(LiveTime now)
{
    if (m_ratesTold || now - m_start < ratesSettle || now - m_lastReading > silence) {
        return;
    }
    m_ratesTold = true;
    std::string const missed = m_reader->missedRates();
    if (!missed.empty() && m_terminal == nullptr && !m_car.options().quiet) {
        tell("More is asked for than the bus can give: " + missed + "\n");
    }
}

// Requests that fail are tried again without a word, so silence is all that tells.
void LiveRun::watchSilence(LiveTime now)
{
    if (now - m_lastReading < silence || now - m_lastLinkCheck < silence) {
        return;
    }
    m_lastLinkCheck = now;
    if (!m_reader->isConnected()) {
        m_car.check();
        throw Error(ErrorKind::AdapterSilent, "The adapter no longer answers",
                    {"is it still plugged in and in reach?"});
    }
    if (m_options.count > 0 && now - m_lastReading > longSilence) {
        throw silentVehicle(m_car,
                            m_table.readings() == 0 ? "The vehicle gives none of the chosen values"
                                                    : "The vehicle no longer answers",
                            {"is the ignition still on?"});
    }
    if (!m_silenceTold && m_terminal == nullptr && !m_car.options().quiet) {
        std::string const trouble = m_car.trouble();
        tell(trouble.empty()
                 ? "No values come from the vehicle; still asking. Is the ignition on?\n"
                 : fmt::format("No values come from the vehicle, the adapter reports {}; still asking\n", trouble));
    }
    m_silenceTold = true;
}

} // namespace velmora::cli
