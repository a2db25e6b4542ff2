// Addresses around requests: set, and whatever happens given back.

#include "libvelmora/channel/fastchannel.h"

#include <algorithm>
#include <utility>

namespace velmora {

namespace {

constexpr WireTime addressLimit{700};
// An adapter that did not take the address of a module twice is asked by broadcasts.
constexpr int mostAddressFailures = 2;

unsigned int addressIdentifier(std::string const& digits)
{
    unsigned int number = 0;
    for (char const digit : digits) {
        number = number << 4U | static_cast<unsigned int>(std::max(hexDigitValue(digit), 0));
    }
    return number;
}

} // namespace

void FastChannel::addressModule(std::optional<unsigned int> module)
{
    std::lock_guard const lock(m_sharedMutex);
    if (module) {
        m_addresses[std::this_thread::get_id()] = {*module, {}, {}, {}};
    } else {
        m_addresses.erase(std::this_thread::get_id());
    }
}

void FastChannel::address(std::optional<RequestAddress> const& address)
{
    std::lock_guard const lock(m_sharedMutex);
    if (address) {
        m_addresses[std::this_thread::get_id()] = {std::nullopt, address, {}, {}};
    } else {
        m_addresses.erase(std::this_thread::get_id());
    }
}

std::string FastChannel::refusedAddress() const
{
    std::lock_guard const lock(m_sharedMutex);
    auto const found = m_addresses.find(std::this_thread::get_id());
    return found != m_addresses.end() ? found->second.refused : std::string();
}

FastChannel::ThreadAddress FastChannel::wantedAddress() const
{
    std::lock_guard const lock(m_sharedMutex);
    auto const found = m_addresses.find(std::this_thread::get_id());
    return found != m_addresses.end() ? found->second : ThreadAddress();
}

void FastChannel::noteRefusal(std::string const& refused)
{
    std::lock_guard const lock(m_sharedMutex);
    if (auto const found = m_addresses.find(std::this_thread::get_id()); found != m_addresses.end()) {
        found->second.refused = refused;
    }
}

// False if the request must not be sent. A module's own address only saves time, so without it a broadcast will do.
bool FastChannel::setAddress(Pending& pending)
{
    ThreadAddress const wanted = wantedAddress();
    bool const onlySavesTime = wanted.module.has_value();
    if (m_staying && !(wanted.address && wanted.address->stays)) {
        endStay();
    }
    if (onlySavesTime && m_addressFailures >= mostAddressFailures) {
        return true;
    }
    std::optional<RequestAddress> const address =
        onlySavesTime ? physicalAddress(m_state.shownBus(), *wanted.module) : wanted.address;
    if (!address) {
        return true;
    }
    std::string const wait = m_waitSteps != 0 ? waitCommand(m_waitSteps) : m_state.setting("ATST");
    std::vector<AddressChange> const changes = addressChanges(*address, m_state, wait);
    std::string refused = changes.empty() ? "bus" : "";
    if (refused.empty() && address->stays && !(m_staying && *m_staying == *address)) {
        noteStay(changes);
        m_staying.reset();
        if (moveStay(changes, refused)) {
            m_staying = address;
        }
    } else if (refused.empty() && !address->stays) {
        refused = takeOn(changes);
    }
    if (!refused.empty()) {
        m_addressFailures += onlySavesTime ? 1 : 0;
        endStay();
        restoreAddress();
        noteRefusal(isValid() ? refused : std::string()); // one that says nothing has refused nothing
        return onlySavesTime && isValid();
    }
    noteRefusal({});
    pending.addressed = true;
    pending.extended = !address->extended.empty();
    bool const replyIsKnown = address->waitMs == 0 && !address->reply.empty();
    pending.module = onlySavesTime  ? wanted.module
                     : replyIsKnown ? std::optional(addressIdentifier(address->reply))
                                    : std::nullopt;
    pending.key += " " + address->header + address->extended;
    return true;
}

// The first command that the adapter did not take, or nothing. What is set is noted before it is: an OK may be lost.
std::string FastChannel::takeOn(std::vector<AddressChange> const& changes)
{
    for (AddressChange const& change : changes) {
        if (!change.restore.command.empty()) {
            auto const later = std::find_if(m_restore.begin(), m_restore.end(), [&change](AddressStep const& each) {
                return restoreOrder(each.command) > restoreOrder(change.restore.command);
            });
            m_restore.insert(later, change.restore);
        }
        if (!confirms(change.set, addressLimit)) {
            return change.set;
        }
    }
    return {};
}

// An address that stayed would hide the other modules: without a confirmation the link is given up.
void FastChannel::restoreAddress()
{
    while (!m_restore.empty()) {
        AddressStep const step = m_restore.front();
        std::string ignored;
        bool const done = confirms(step.command, addressLimit) ||
                          (!step.otherwise.empty() && confirms(step.otherwise, addressLimit)) ||
                          (wake(ignored) && confirms(step.command, addressLimit));
        if (!done) {
            m_gone = m_gone || (m_wire->isUp() && m_silence.isUnheard());
            m_lost = m_lost || m_wire->isUp();
            return;
        }
        m_restore.erase(m_restore.begin());
    }
}

// Who was interrupted in the middle of a request still leaves the adapter as it was.
void FastChannel::leaveNoAddress()
{
    if (m_restore.empty() || !m_wire->resume()) {
        return;
    }
    m_lost = false;
    std::string ignored;
    if (wake(ignored)) {
        restoreAddress();
    }
    m_wire->giveUp();
}

} // namespace velmora
