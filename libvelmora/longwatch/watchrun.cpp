#include "libvelmora/longwatch/watchrun.h"

#include "libvelmora/longwatch/runsetup.h"
#include "libvelmora/output/opening/outputfactory.h"
#include "libvelmora/output/valuetext.h"
#include "libvelmora/watch/statefolder.h"

#include <velmora/error.h>

#include <fmt/format.h>

#include <algorithm>
#include <utility>

namespace velmora {

namespace {

constexpr std::chrono::milliseconds endLimit{900}; // for all outputs: a service manager's patience is short

WatchTime timeNow()
{
    return {std::chrono::steady_clock::now(), std::chrono::system_clock::now()};
}

} // namespace

WatchRun::WatchRun(LongWatchOptions const& options, WatchSettings const& settings, ServiceNotify& notify)
    : m_options(options), m_notify(notify), m_vehicle(vehicleName(settings)),
      m_page(settings.outputs, m_vehicle, options), m_car(m_page.withTaps(watchedCar(options.car, settings, m_vehicle)))
{
    if (options.car.port.empty() && settings.port.empty()) {
        throw Error(ErrorKind::WrongUse, "No port is named", {"name it with --port, or as port in the settings"});
    }
    addOutputs(settings);
    m_engine = std::make_unique<WatchEngine>(
        m_car, rulesOf(settings, m_vehicle), [this](Record record) { take(std::move(record)); }, timeNow());
}

void WatchRun::addOutputs(WatchSettings const& settings)
{
    OutputContext context;
    context.vehicle = m_vehicle;
    context.stateFolder = stateFolder();
    // An output that hangs may outlive this object.
    if (m_options.onEvent) {
        context.tell = m_options.onEvent;
    }
    context.health = [board = m_health] {
        std::lock_guard const lock(board->mutex);
        return board->health;
    };
    for (OutputAddress const& address : settings.outputs) {
        OutputLimits limits = limitsOf(address);
        std::unique_ptr<IOutput> output;
        if (WatchPage::is(address)) {
            limits.interval = WatchPage::interval;
            output = m_page.makeOutput(address, context.health, settingsPath(m_options.car));
        } else {
            output = makeOutput(address, context);
        }
        m_outputs.push_back(std::make_unique<OutputRunner>(toString(address), std::move(output), context.tell, limits));
    }
    for (std::unique_ptr<OutputRunner> const& each : m_outputs) {
        each->start();
    }
}

WatchRun::~WatchRun()
{
    finish();
}

void WatchRun::finish()
{
    if (std::exchange(m_finished, true)) {
        return;
    }
    if (m_engine != nullptr) {
        try {
            m_engine->finish(timeNow());
        } catch (std::exception const& error) {
            say(error.what());
        }
    }
    endOutputs();
}

bool WatchRun::endOutputs()
{
    if (m_outputsEnded.exchange(true)) {
        return false;
    }
    for (std::unique_ptr<OutputRunner> const& each : m_outputs) {
        each->beginStop();
    }
    auto const limit = std::chrono::steady_clock::now() + endLimit;
    for (std::unique_ptr<OutputRunner> const& each : m_outputs) {
        auto const left =
            std::chrono::duration_cast<std::chrono::milliseconds>(limit - std::chrono::steady_clock::now());
        if (!each->stopWithin(std::max(left, std::chrono::milliseconds(0)))) {
            say(each->name() + ": hangs, and is not waited for");
        }
    }
    return true;
}

void WatchRun::end()
{
    m_end = true;
    m_car.interrupt();
}

void WatchRun::run()
{
    takeHealth();
    m_notify.tell("READY=1");
    while (!m_end) {
        std::chrono::milliseconds pause{0};
        try {
            pause = m_engine->step(timeNow());
            m_page.serve(m_car, *m_engine, [this](Record record) { take(std::move(record)); });
        } catch (Error const& error) {
            if (error.kind() == ErrorKind::Interrupted) {
                return;
            }
            throw;
        }
        takeHealth();
        tellState();
        m_notify.alive(std::chrono::steady_clock::now());
        if (m_engine->metStranger()) {
            say("another vehicle answers: its values get a name of their own");
            return;
        }
        m_car.wait(pause);
    }
}

void WatchRun::take(Record record)
{
    if (auto const* const event = std::get_if<Event>(&record)) {
        std::string const module = event->module ? " (" + moduleText(*event->module) + ")" : "";
        say(fmt::format("{}{}: {}", event->kind, module, event->text));
    }
    auto const shared = std::make_shared<Record const>(std::move(record));
    for (std::unique_ptr<OutputRunner> const& each : m_outputs) {
        each->push(shared);
    }
}

void WatchRun::tellState()
{
    std::string const& trouble = m_engine->trouble();
    std::string const state = m_engine->state() + (trouble.empty() ? "" : ": " + trouble);
    if (state != m_toldState) {
        m_toldState = state;
        m_notify.tell("STATUS=" + state);
        say(state);
    }
}

void WatchRun::takeHealth()
{
    Health health = m_engine->health();
    for (std::unique_ptr<OutputRunner> const& each : m_outputs) {
        health.outputs.emplace_back(each->name(), each->counts());
    }
    std::lock_guard const lock(m_health->mutex);
    m_health->health = std::move(health);
}

Health WatchRun::health() const
{
    std::lock_guard const lock(m_health->mutex);
    return m_health->health;
}

void WatchRun::say(std::string const& text) const
{
    if (m_options.onEvent) {
        m_options.onEvent(text);
    }
}

} // namespace velmora
