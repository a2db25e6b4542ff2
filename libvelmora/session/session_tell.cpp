// What a session tells of its state and of what went wrong.

#include "common/text/text.h"
#include "libvelmora/record/traffictrace.h"
#include "libvelmora/session/link.h"
#include "libvelmora/session/openingfailure.h"
#include "libvelmora/session/session.h"

#include <obd/idevice.h>
#include <obd/iecu.h>
#include <velmora/error.h>

#include <fmt/format.h>

namespace velmora {

namespace {

[[noreturn]] void failInterrupted()
{
    throw Error(ErrorKind::Interrupted, "Interrupted");
}

} // namespace

void Session::tellProgress(std::string const& lines) const
{
    if (m_options.onProgress) {
        m_options.onProgress(lines);
    }
}

void Session::tellConnected() const
{
    std::shared_ptr<obd::IAdapter> const found = adapter();
    m_options.onDetail(fmt::format("Connected: {} {}, {}\n", readable(found->device()), readable(found->description()),
                                   readable(found->getProtocolDescription())));
    for (std::shared_ptr<obd::IEcu> const& ecu : m_obd->getEcuManager()->getEcus()) {
        m_options.onDetail(fmt::format("Control module {:X}: {} ({})\n", ecu->id(), readable(ecu->name()),
                                       readable(ecu->description())));
    }
}

// Values went missing meanwhile, and the cause is one that grows worse.
void Session::tellResets() const
{
    unsigned int const resets = channel().statistics().habits[static_cast<std::size_t>(Habit::SettingsLost)];
    if (resets != 0) {
        tellProgress(
            fmt::format("The adapter reset itself {}x and was set up again; is it firmly in its socket, and the "
                        "battery well?\n",
                        resets));
    }
}

void Session::tellHabits() const
{
    ChannelStatistics const statistics = channel().statistics();
    for (std::size_t i = 0; i < habitCount; ++i) {
        if (statistics.habits[i] != 0) {
            m_options.onDetail(
                fmt::format("The adapter's habits: {}, {}x\n", habitName(static_cast<Habit>(i)), statistics.habits[i]));
        }
    }
    if (statistics.waitMs) {
        m_options.onDetail(fmt::format("The adapter's wait for replies was shortened to {} ms\n", *statistics.waitMs));
    }
    if (statistics.waitsCut != 0) {
        m_options.onDetail(
            fmt::format("The adapter does not keep to that; its wait was ended {}x\n", statistics.waitsCut));
    }
}

void Session::tellPhase(std::chrono::steady_clock::time_point start) const
{
    std::string const phase = m_opening.phase();
    if (m_options.onPhase && !phase.empty()) {
        auto const elapsed = std::chrono::steady_clock::now() - start;
        m_options.onPhase(
            fmt::format("{} ... {} s", phase, std::chrono::duration_cast<std::chrono::seconds>(elapsed).count()));
    }
}

void Session::failOpening()
{
    std::string const port = this->port();
    if (m_interrupted) {
        failInterrupted();
    }
    if (m_link->adapterResets()) {
        throw openingfailure::resettingAdapter(port);
    }
    if (m_link->adapterGone()) {
        throw openingfailure::goneAdapter(port, m_address, m_opening);
    }
    if (m_link->lost()) {
        throw Error(ErrorKind::LinkLost, "The link to the adapter on " + port + " broke while connecting",
                    {"is the adapter still plugged in and in reach?"});
    }
    std::shared_ptr<obd::IAdapter> const found = adapter();
    if (found == nullptr) {
        throw openingfailure::silentAdapter(port, m_address, m_opening);
    }
    checkAdapter();
    if (m_opening.headersMissing()) {
        throw openingfailure::headersMissing(readable(found->device()), port);
    }
    throw openingfailure::silentVehicle(readable(found->device()), port, trouble());
}

bool Session::lost() const
{
    return m_link != nullptr && m_link->lost();
}

bool Session::adapterSilent() const
{
    return m_link != nullptr && channel().statistics().adapterSilent;
}

void Session::check() const
{
    if (m_interrupted) {
        failInterrupted();
    }
    if (m_link != nullptr && m_link->adapterResets()) {
        throw openingfailure::resettingAdapter(port());
    }
    // A channel that can't take an address back gives up, too; the cause is the silence.
    if (m_link != nullptr && (adapterSilent() || m_link->adapterGone()) && !m_link->portLost()) {
        throw Error(ErrorKind::AdapterSilent, "The adapter on " + port() + " no longer answers",
                    {"is it still in its socket, and in reach?", "pull the adapter and plug it in again"});
    }
    if (lost()) {
        throw Error(ErrorKind::LinkLost, "The link to the adapter broke", {"is it still plugged in and in reach?"});
    }
}

void Session::checkAdapter() const
{
    if (m_link != nullptr && channel().statistics().unanswered) {
        std::shared_ptr<obd::IObdProxy> const bus = proxy();
        std::shared_ptr<obd::IAdapter> const found = adapter();
        float ignored = 0.0F;
        if (bus != nullptr && bus->isConnected()) {
            bus->batteryVoltage(); // a poller may be at work beside
        } else if (found != nullptr) {
            found->batteryVoltage(ignored);
        }
    }
    check();
}

std::string Session::trouble() const
{
    return m_link != nullptr ? readable(channel().statistics().trouble) : std::string();
}

std::string Session::failedTrace() const
{
    return m_trace != nullptr && m_trace->failed() ? m_options.traceFile : std::string();
}

} // namespace velmora
