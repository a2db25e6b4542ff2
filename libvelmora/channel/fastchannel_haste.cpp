// What saves time: expected counts, a shorter wait, what this and earlier visits have told.

#include "libvelmora/channel/fastchannel.h"

#include <algorithm>
#include <cmath>
#include <utility>

namespace velmora {

namespace {

constexpr WireTime ownCommandLimit{700};
constexpr double adapterStepMs = 4.096;
constexpr unsigned int shortestWaitSteps = 25; // 102.4 ms: what STN adapters have by default
constexpr WireTime longWait{150};              // behind a reply: adapters that adapt it wait less
constexpr int j1850Pwm = 1;

unsigned int stepsOf(std::string const& setting)
{
    unsigned int steps = 0;
    for (char const digit : setting.substr(std::min<std::size_t>(4, setting.size()))) {
        steps = steps * 16 + static_cast<unsigned int>(std::max(hexDigitValue(digit), 0));
    }
    return steps;
}

// The characters behind 49 02 and the count of items, or nothing.
std::string vinOf(std::vector<std::uint8_t> const& message)
{
    constexpr std::size_t vinBytes = 17;
    if (message.size() != 3 + vinBytes) {
        return {};
    }
    std::string const vin(message.begin() + 3, message.end());
    bool const plain =
        std::all_of(vin.begin(), vin.end(), [](char c) { return (c >= '0' && c <= '9') || (c >= 'A' && c <= 'Z'); });
    return plain ? vin : std::string();
}

} // namespace

// Never on SAE J1850 PWM: a reply that the adapter does not take there is sent again and again.
std::optional<unsigned int> FastChannel::countFor(Pending const& pending) const
{
    bool const allowed = m_state.shownBus() != BusKind::Unknown && m_state.protocol() != j1850Pwm && m_connected &&
                         pending.command.hasFixedShape();
    return allowed ? m_learner.countFor(pending.key, m_wire->now()) : std::nullopt;
}

// False if the request is to be asked plainly.
bool FastChannel::takeCounted(HealedReply const& reply, WireTime took)
{
    if (reply.whole() && m_learner.accept(m_pending->key, reply.frames, took)) {
        ++m_working.counted;
        return true;
    }
    note(Habit::UnfinishedCount);
    m_pending->count.reset();
    if (reply.refused) {
        m_learner.switchOff();
    } else {
        m_learner.fail(m_pending->key);
    }
    return false;
}

std::string FastChannel::adapterKey() const
{
    return m_options.port + " " + m_state.identity();
}

// Where the core lets the adapter search, the bus that was found last time is tried first.
bool FastChannel::triesProtocol(std::string const& text)
{
    if (compactText(text) != "ATTP0" || m_protocolTried || m_store == nullptr || m_state.identity().empty()) {
        return false;
    }
    m_protocolTried = true;
    m_triedProtocol = m_store->protocol(adapterKey());
    return m_triedProtocol != 0;
}

// The first request on the bus of the last visit need not be waited for as long as the core has set it: it only tells
// whether the vehicle is there. The next one, with headers, asks who is, and has all of the wait again.
void FastChannel::recallWait()
{
    LearntWait const learnt = m_store->wait(adapterKey());
    unsigned int const steps = std::max(learnt.steps, shortestWaitSteps);
    bool const can = isCanBus(busKindOf(m_triedProtocol));
    if (m_options.shortWait && can && learnt.steps != 0 && steps < stepsOf(m_state.setting("ATST"))) {
        setWait(steps);
        if (learnt.isCut) {
            m_cutter.recall();
        }
    }
}

// It was another vehicle: the search takes place after all, within the time of the core's first request.
bool FastChannel::fallsBackToSearch(HealedReply const& reply)
{
    if (m_triedProtocol == 0 || !m_pending->command.isRequest()) {
        return false;
    }
    m_triedProtocol = 0;
    if (reply.data && reply.error.empty()) {
        return false;
    }
    ++m_protocolsChosen;
    giveWaitBack();
    if (!confirms("ATTP0", ownCommandLimit)) {
        return false;
    }
    m_state.setProtocol(0);
    m_protocolsChosen = 1;
    writePending(m_pending->command.text());
    return true;
}

// A module that was discovered has said nothing while the wait was shorter than the core has set it: the first time
// that this request shows that, it gets the full wait. An adapter that adapts its wait behind replies by itself loses
// none behind a reply. Masks that nobody answers while the connection is brought up are taken at their word: the
// modules have just shown how fast they are, and services that none of them has are the rule.
bool FastChannel::needsFullWait(HealedReply const& reply) const
{
    // An adapter that does not keep to the shorter wait has given all of it already; some end a little early.
    WireTime const waited = m_wire->now() - std::max(m_pending->dataAt, m_pending->sentAt);
    bool const gave = waited * 10 >= waitTime(stepsOf(m_state.setting("ATST"))) * 9 && !m_pending->cutAt;
    if (gave || m_staying || m_waitSteps == 0 || !m_pending->command.onlyReads() ||
        m_verified.contains(m_pending->key)) {
        return false;
    }
    if (m_pending->addressed) {
        return m_pending->module && !reply.spoke.contains(*m_pending->module);
    }
    if (reply.spoke.empty()) {
        return m_connected || !m_pending->command.asksForMask();
    }
    std::set<unsigned int> const& modules = m_memory.modules();
    return m_waitsLong && !std::includes(reply.spoke.begin(), reply.spoke.end(), modules.begin(), modules.end());
}

// Not under what an adapter has by default, not under twice the slowest reply, never on a K line, where a wait that is
// too short makes the adapter talk over a module that still answers. An adapter that adapts its wait by itself gains
// too: for a request that nobody answers it waits all of ATST.
void FastChannel::adaptWait(HealedReply const& reply)
{
    if (!reply.answered || reply.notices || m_pending->woken || m_pending->addressed) {
        return; // the time of a search, of a bus start or of a lost prompt is no module's; an address has its own wait
    }
    m_slowest = std::max(m_slowest, m_pending->dataAt - m_pending->sentAt);
    unsigned int const full = stepsOf(m_state.setting("ATST"));
    m_waitsLong = m_waitsLong || (m_waitSteps == 0 && m_wire->now() - m_pending->dataAt > longWait);
    if (m_waitSteps != 0 && !m_pending->count && !m_pending->verifying && !m_pending->cutAt) {
        m_cutter.saw(m_wire->now() - m_pending->dataAt, waitTime(m_waitSteps));
    }
    bool const pays = m_waitsLong || !m_connected;
    bool const kLine = m_state.shownBus() == BusKind::Iso9141 || m_state.shownBus() == BusKind::Kwp;
    if (!m_options.shortWait || !pays || kLine || full == 0 || m_pending->verifying) {
        return;
    }
    auto const twice =
        static_cast<unsigned int>(std::ceil(2.0 * static_cast<double>(m_slowest.count()) / adapterStepMs));
    unsigned int const steps = std::max(twice, shortestWaitSteps);
    if (steps >= full) {
        giveWaitBack();
    } else if (m_waitSteps == 0 || steps > m_waitSteps) {
        setWait(steps);
    }
}

std::string FastChannel::waitCommand(unsigned int steps)
{
    return "ATST" + frameDigits({static_cast<std::uint8_t>(std::min(steps, 0xFFU))});
}

WireTime FastChannel::waitTime(unsigned int steps)
{
    return WireTime(static_cast<int>(std::ceil(steps * adapterStepMs)));
}

void FastChannel::setWait(unsigned int steps)
{
    m_waitBefore = 0;
    m_waitSteps = confirms(waitCommand(steps), ownCommandLimit) ? steps : 0;
    m_longest = std::max(m_longest, m_waitSteps);
}

void FastChannel::giveWaitBack()
{
    if (m_waitSteps != 0 && confirms(m_state.setting("ATST"), ownCommandLimit)) {
        m_waitBefore = std::exchange(m_waitSteps, 0);
    }
}

void FastChannel::learnVehicle(HealedReply const& reply)
{
    if (m_store == nullptr || m_pending->command.text() != "0902") {
        return;
    }
    for (auto const& [module, message] : reply.messages) {
        std::string const vin = vinOf(message);
        if (vin.empty() || !m_vin.empty()) {
            continue;
        }
        m_vin = vin;
        for (auto const& [request, frames] : m_store->counts(vin)) {
            m_learner.recall(request, frames);
        }
    }
}

void FastChannel::keepLearnt()
{
    if (m_store == nullptr || !m_connected || m_state.identity().empty()) {
        return;
    }
    m_store->setProtocol(adapterKey(), m_state.protocol());
    m_store->setCanCount(adapterKey(), m_learner.works() || !m_learner.isOff());
    m_store->setWait(adapterKey(), {m_waitsLong ? m_longest : 0, m_cutter.pays()});
    if (!m_vin.empty()) {
        m_store->setCounts(m_vin, m_learner.learnt());
    }
    m_store->save();
}

} // namespace velmora
