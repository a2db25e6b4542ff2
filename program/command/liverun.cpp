#include "program/command/liverun.h"

#include "program/terminal/interrupt.h"
#include "program/terminal/output.h"
#include "program/view/livelines.h"

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

} // namespace

LiveRun::LiveRun(CommandSession& session, LiveOptions const& options, LiveCsv* csv)
    : m_session(session), m_options(options), m_csv(csv), m_service(obd::SensorServiceBuilder::createSensorService()),
      m_tap(*m_session.obd().getConnectionManager(), m_session.loop())
{
    select(chooseSensors(m_options.sensors, offeredSensors(*m_service)));
    m_service->attach(this);
}

LiveRun::~LiveRun()
{
    m_service->detach(this);
}

void LiveRun::select(SensorIds const& ids)
{
    auto const descriptors = m_service->getDescriptors();
    LiveTable::Descriptors chosen;
    for (obd::ParameterIdentifier::Id const id : ids) {
        auto const found = std::find_if(descriptors.begin(), descriptors.end(),
                                        [id](auto const& descriptor) { return descriptor->pid() == id; });
        if (found != descriptors.end()) {
            chosen.push_back(*found);
        }
    }
    m_ids = ids;
    m_table.select(chosen);
    m_firstRow = 0;
}

void LiveRun::restart(SensorIds const& ids)
{
    m_service->reset();
    select(ids);
    m_service->startUpdates(m_ids);
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
    m_service->startUpdates(m_ids);
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

double LiveRun::rate() const
{
    double const elapsed = std::chrono::duration<double>(Clock::now() - m_start).count();
    return elapsed > 0.0 ? static_cast<double>(m_table.readings()) / elapsed : 0.0;
}

void LiveRun::tellRate() const
{
    fmt::print(stderr,
               "{} readings, {:.1f} a second; {:.1f} % of the time passed between a reading and the next request\n",
               m_table.readings(), rate(), 100.0 * m_tap.meter().lostShare());
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
    m_session.loop().runUntil([&] { return isDone() || Interrupt::instance().raised() || Clock::now() >= limit; },
                              limit);
    m_session.check();
    LiveTime const now = Clock::now();
    if (m_invalidated) {
        m_invalidated = false;
        restart(m_ids);
    }
    m_table.expire(now);
    watchSilence(now);
    if (m_csv != nullptr && !m_csv->update(m_table, now)) {
        m_readerGone = true;
    }
    if (m_terminal != nullptr) {
        handleKeys();
        draw(now);
    }
}

void LiveRun::onSensorUpdated(bool /*success*/, std::shared_ptr<obd::ParameterDescriptor> const& descriptor,
                              std::vector<std::shared_ptr<obd::SensorValueDataModel>> const& values)
{
    int const pid = descriptor->pid();
    bool const beyond = m_options.count > 0 && m_table.rounds() + (m_table.beginsRound(pid) ? 1 : 0) >= m_options.count;
    LiveTime const now = Clock::now();
    m_lastReading = now;
    m_silenceTold = false;
    if (beyond) {
        m_quit = true;
        return;
    }
    m_table.update(pid, values, now);
    if (m_csv != nullptr && !m_csv->update(m_table, now)) {
        m_readerGone = true;
    }
    print(pid);
}

void LiveRun::print(int pid)
{
    if (m_terminal != nullptr || (m_csv != nullptr && m_csv->toStandardOutput())) {
        return;
    }
    std::string text;
    std::string const time = isoTime(std::chrono::system_clock::now());
    for (LiveRow const* row : m_table.rowsOf(pid)) {
        text += m_session.options().json ? toJsonLine(*row, time) : toLine(*row);
    }
    m_readerGone = m_readerGone || !writeOutput(text);
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
        throw Error(ErrorKind::LinkLost, "The adapter no longer answers", {"is it still plugged in and in reach?"});
    }
    if (m_options.count > 0 && now - m_lastReading > longSilence) {
        throw Error(ErrorKind::VehicleSilent,
                    m_table.readings() == 0 ? "The vehicle gives none of the chosen values"
                                            : "The vehicle no longer answers",
                    {"is the ignition still on?"});
    }
    if (!m_silenceTold && m_terminal == nullptr && !m_session.options().quiet) {
        tell("No values come from the vehicle; still asking. Is the ignition on?\n");
    }
    m_silenceTold = true;
}

} // namespace velmora::cli
