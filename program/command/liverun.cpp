#include "program/command/liverun.h"

#include "program/terminal/output.h"
#include "program/view/livelines.h"
#include "program/view/ratetext.h"

#include <obd/ivelmorasettings.h>
#include <obd/parameterdescriptor.h>
#include <obd/parameterfactory.h>
#include <velmora/error.h>

#include <fmt/format.h>

#include <algorithm>
#include <cstdio>

namespace velmora::cli {

namespace {

using Clock = std::chrono::steady_clock;
using std::chrono::milliseconds;
using std::chrono::seconds;

constexpr milliseconds step{50};
constexpr seconds silence{3};
constexpr seconds longSilence{15};
constexpr seconds ratesSettle{5};
constexpr char const* fastWarning =
    "Asking without the pause that spares the vehicle; too much traffic has upset control modules";

// The modules that words mean which name none: those of --ecu, or the first one.
std::vector<unsigned int> meantModules(CommandSession const& session)
{
    std::vector<unsigned int> ids;
    if (session.options().ecu || session.options().allEcus) {
        for (std::shared_ptr<obd::IEcu> const& ecu : session.selectedModules()) {
            ids.push_back(ecu->id());
        }
    }
    return ids;
}

} // namespace

LiveRun::LiveRun(CommandSession& session, LiveOptions const& options, LiveCsv* csv)
    : m_session(session), m_options(options), m_csv(csv), m_offers(moduleOffers(session.obd(), meantModules(session))),
      m_signals(session), m_choices(choose())
{
    select();
}

// Signals of one's own first, by id or name; then standard sensors; then words of a signal's name.
std::vector<PollChoice> LiveRun::choose()
{
    std::vector<unsigned int> meant;
    for (ModuleOffer const& offer : m_offers) {
        if (offer.meant) {
            meant.push_back(offer.ecu->id());
        }
    }
    std::vector<std::string> standard;
    for (std::string const& word : m_options.sensors) {
        SensorWish wish = parseSensorWish(word);
        wish.hertz = wish.hertz ? wish.hertz : m_options.hertz;
        if (m_signals.choose(wish, meant)) {
            continue;
        }
        try {
            choosePolled({word}, m_offers, m_options.hertz);
        } catch (Error const&) {
            if (!m_signals.chooseByName(wish, meant)) {
                throw;
            }
            continue;
        }
        standard.push_back(word);
    }
    return standard.empty() && !m_signals.empty() ? std::vector<PollChoice>()
                                                  : choosePolled(standard, m_offers, m_options.hertz);
}

LiveRun::~LiveRun() = default;

void LiveRun::select()
{
    obd::IVelmoraSettings const& settings = *m_session.obd().getSettings();
    LiveTable::Parameters chosen;
    for (PollChoice const& choice : m_choices) {
        auto const parameter = obd::ParameterFactory().createParameter(*choice.ecu, settings, choice.id);
        if (parameter != nullptr) {
            auto const descriptor =
                std::make_shared<obd::ParameterDescriptor>(parameter, choice.ecu, settings.unitSystem());
            chosen.emplace_back(descriptor, choice.ecu->id(), choice.hertz);
        }
    }
    for (SignalRow const& row : m_signals.rows()) {
        chosen.emplace_back(row);
    }
    m_table.select(chosen);
    m_firstRow = 0;
}

// Afresh, with other sensors, other units or empty statistics. The poller is gone before the next one begins.
void LiveRun::start(std::vector<PollChoice> const& choices)
{
    m_feed.reset();
    m_choices = choices;
    select();
    feed();
}

void LiveRun::feed()
{
    m_feed = std::make_unique<LiveFeed>(m_session.obd(), m_session.loop(), m_choices, m_options.will,
                                        m_session.channel(), m_signals.sources(m_choices.empty()));
}

std::string LiveRun::signalTroubles() const
{
    std::string text;
    for (SignalTrouble const& each :
         m_signals.board() != nullptr ? m_signals.board()->troubles() : std::vector<SignalTrouble>()) {
        if (each.withoutValue != 0) {
            text += fmt::format("{}: replies without a value: {}\n", each.id, each.withoutValue);
        }
        if (!each.reason.empty()) {
            text += fmt::format("{} {}\n", each.id, each.reason);
        }
    }
    return text;
}

void LiveRun::run()
{
    bool const csvOnly = m_csv != nullptr && m_csv->toStandardOutput();
    if (!m_session.options().json && !csvOnly && Terminal::isUsable()) {
        m_terminal = std::make_unique<Terminal>();
    }
    m_start = Clock::now();
    m_lastReading = m_start;
    if (m_csv != nullptr) {
        m_csv->begin(m_table, m_start, std::chrono::system_clock::now());
    }
    if (m_options.will.fast && m_terminal != nullptr) {
        m_note = fastWarning;
    } else if (m_options.will.fast && !m_session.options().quiet) {
        tell(std::string(fastWarning) + "\n");
    }
    feed();
    try {
        while (!isDone()) {
            runOnce();
        }
    } catch (Error const&) {
        finish();
        throw;
    }
    finish();
}

// However it ends, what was read is kept: the last row of the recording, and the table below the user's prompt.
void LiveRun::finish()
{
    if (m_csv != nullptr) {
        m_csv->finish(m_table, Clock::now());
    }
    if (m_terminal != nullptr) {
        m_terminal.reset();
        FrameStyle whole;
        whole.columns = 200;
        whole.rows = m_table.rows().size() + whole.rows;
        writeOutput(drawTable(m_table.rows(), 0, title(), {}, whole));
    }
    if (m_session.options().verbose) {
        tellRate();
    }
}

std::vector<std::string> LiveRun::silentSensors() const
{
    std::vector<std::string> names;
    for (LiveRow const& row : m_table.rows()) {
        if (row.updated == LiveTime()) {
            names.push_back(row.name);
        }
    }
    return names;
}

double LiveRun::rate() const
{
    double const elapsed = std::chrono::duration<double>(Clock::now() - m_start).count();
    return elapsed > 0.0 ? static_cast<double>(m_table.readings()) / elapsed : 0.0;
}

void LiveRun::tellRate() const
{
    fmt::print(stderr, "{} readings, {:.1f} a second\n", m_table.readings(), rate());
    if (std::string const rates = reachedRates(m_feed->rates()); !rates.empty()) {
        fmt::print(stderr, "Reached: {}\n", rates);
    }
}

bool LiveRun::isDone() const
{
    bool const counted = m_options.count > 0 && m_table.rounds() >= m_options.count;
    bool const expired =
        m_options.duration > 0.0 && Clock::now() - m_start >= std::chrono::duration<double>(m_options.duration);
    return m_quit || m_readerGone || counted || expired;
}

void LiveRun::runOnce()
{
    LiveTime const limit = Clock::now() + step;
    m_session.loop().runUntil([&] { return m_feed->hasNew() || m_session.interrupted() || Clock::now() >= limit; },
                              limit);
    m_session.check();
    takeReadings();
    LiveTime const now = Clock::now();
    m_table.expire(now);
    watchSilence(now);
    watchRates(now);
    if (m_csv != nullptr && !m_csv->update(m_table, now)) {
        m_readerGone = true;
    }
    if (m_terminal != nullptr) {
        handleKeys();
        draw(now);
    }
}

void LiveRun::takeReadings()
{
    for (PollResult const& result : m_feed->take()) {
        if (!isDone()) {
            take(result);
        }
    }
}

void LiveRun::take(PollResult const& result)
{
    bool const begins = m_table.beginsRound(result.id, result.module);
    LiveTime const now = Clock::now();
    m_lastReading = now;
    m_silenceTold = false;
    if (m_options.count > 0 && m_table.rounds() + (begins ? 1 : 0) >= m_options.count) {
        m_quit = true;
        return;
    }
    m_table.update(result.id, result.values, now, result.module);
    if (m_csv != nullptr && !m_csv->update(m_table, now)) {
        m_readerGone = true;
    }
    print(result);
}

void LiveRun::print(PollResult const& result)
{
    if (m_terminal != nullptr || (m_csv != nullptr && m_csv->toStandardOutput())) {
        return;
    }
    std::string text;
    std::string const time =
        isoTime(result.readings.empty() ? std::chrono::system_clock::now() : result.readings.front().time);
    for (LiveRow const* row : m_table.rowsOf(result.id, result.module)) {
        text += m_session.options().json ? toJsonLine(*row, time) : toLine(*row);
    }
    m_readerGone = m_readerGone || !writeOutput(text);
}

// Once: what the bus can't give is shared fairly, but should not surprise.
void LiveRun::watchRates(LiveTime now)
{
    if (m_ratesTold || now - m_start < ratesSettle || now - m_lastReading > silence) {
        return;
    }
    m_ratesTold = true;
    std::string const missed = missedRates(m_feed->rates());
    if (!missed.empty() && m_terminal == nullptr && !m_session.options().quiet) {
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
    if (!m_session.proxy()->isConnected()) {
        m_session.check();
        throw Error(ErrorKind::AdapterSilent, "The adapter no longer answers",
                    {"is it still plugged in and in reach?"});
    }
    if (m_options.count > 0 && now - m_lastReading > longSilence) {
        throw silentVehicle(m_session,
                            m_table.readings() == 0 ? "The vehicle gives none of the chosen values"
                                                    : "The vehicle no longer answers",
                            {"is the ignition still on?"});
    }
    if (!m_silenceTold && m_terminal == nullptr && !m_session.options().quiet) {
        std::string const trouble = m_session.trouble();
        tell(trouble.empty()
                 ? "No values come from the vehicle; still asking. Is the ignition on?\n"
                 : fmt::format("No values come from the vehicle, the adapter reports {}; still asking\n", trouble));
    }
    m_silenceTold = true;
}

} // namespace velmora::cli
