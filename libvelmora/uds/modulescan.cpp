#include "libvelmora/uds/modulescan.h"

#include "common/text/text.h"
#include "libvelmora/uds/moduleaddress.h"
#include "libvelmora/uds/standingguard.h"

#include <obd/protocolfamily.h>
#include <velmora/error.h>

#include <utility>

namespace velmora {

namespace {

constexpr unsigned int listenMs = 3000;
constexpr unsigned int replyWaitMs = 100; // modules begin within 50 ms (ISO 14229-2), gateways take a little longer
constexpr unsigned int firstShort = 0x700;
constexpr unsigned int firstStandardReply = 0x7E8;
constexpr unsigned int everyone = 0x7DF;
constexpr unsigned int longPrefix = 0x18DA0000;
constexpr unsigned int tester = 0xF1;
constexpr unsigned char statusService = 0x3E;
constexpr std::size_t checkEvery = 16;

RequestAddress pattern(bool longIdentifiers, std::string const& header)
{
    RequestAddress address;
    address.header = header;
    address.reply = longIdentifiers ? "18DAF1XX" : "7XX";
    address.waitMs = replyWaitMs;
    address.stays = true;
    return address;
}

// The identifier at the begin of a line, which may go on with anything.
std::optional<unsigned int> heardIn(std::string const& line, bool longIdentifiers)
{
    std::string const text = compactText(line);
    std::size_t const digits = longIdentifiers ? 8 : 3;
    return text.size() > digits ? parseHex(text.substr(0, digits), 0x1FFFFFFF) : std::nullopt;
}

} // namespace

ModuleScan::ModuleScan(ModuleAsker& asker, std::function<void()> check,
                       std::function<void(ScanProgress const&)> progress)
    : m_asker(asker), m_check(std::move(check)), m_progress(std::move(progress)),
      m_long(asker.proxy().protocol() == obd::ObdProtocolCan29)
{}

std::set<unsigned int> ModuleScan::listen()
{
    std::set<unsigned int> heard;
    RequestAddress address = pattern(m_long, identifierText(m_long ? longPrefix | 0x10F1 : firstShort));
    address.reply = m_long ? "18DAXXXX" : "7XX";
    for (std::string const& line : m_asker.listen(address, listenMs)) {
        if (std::optional<unsigned int> const id = heardIn(line, m_long)) {
            heard.insert(*id);
        }
    }
    return heard;
}

// Two senders on one identifier would destroy each other's frames, so nobody else's is used.
std::vector<unsigned int> ModuleScan::candidates(std::set<unsigned int> const& heard) const
{
    std::vector<unsigned int> ids;
    for (unsigned int i = 0; m_long && i <= 0xFF; ++i) {
        if (i != tester) {
            ids.push_back(longPrefix | i << 8U | tester);
        }
    }
    for (unsigned int id = firstShort; !m_long && id < firstStandardReply; ++id) {
        if (id != everyone) {
            ids.push_back(id);
        }
    }
    std::erase_if(ids, [&heard](unsigned int id) { return heard.contains(id); });
    return ids;
}

namespace {

// Any answer to "tester present" shows a module, a refusal too.
bool isThere(ModuleAnswer const& answer)
{
    return answer.kind == ModuleAnswer::Kind::Positive || answer.kind == ModuleAnswer::Kind::Refused;
}

} // namespace

ModuleAnswer ModuleScan::ask(unsigned int id)
{
    ModuleAnswer answer =
        m_asker.ask(pattern(m_long, identifierText(id)), {statusService, 0x00}, RequestPurpose::Presence);
    if (answer.kind == ModuleAnswer::Kind::NotReached) {
        throw Error(ErrorKind::NotSupported, "The adapter does not know " + answer.detail,
                    {"it can't ask modules beyond OBD; one of level 1.4b or newer can"});
    }
    return answer;
}

std::vector<FoundModule> ModuleScan::find()
{
    if (!obd::isCan(m_asker.proxy().protocol())) {
        throw Error(ErrorKind::NotSupported,
                    "The bus of this vehicle is no CAN: modules beyond OBD can't be looked for",
                    {"on legacy buses each module needs a start of its own, which would end the connection"});
    }
    StandingGuard guard(m_asker.proxy(), m_check);
    guard.check();
    std::set<unsigned int> used = listen();
    std::vector<unsigned int> const ids = candidates(used);
    std::vector<FoundModule> found;
    for (std::size_t i = 0; i < ids.size(); ++i) {
        m_check();
        if (m_progress) {
            m_progress({i, ids.size(), found.size()});
        }
        if (i % checkEvery == 0) {
            guard.check();
        }
        if (used.contains(ids[i])) {
            continue; // a module that was found meanwhile answers by it
        }
        ModuleAnswer const answer = ask(ids[i]);
        guard.countTrouble(answer.kind == ModuleAnswer::Kind::BusTrouble, "while it asked who is there");
        if (isThere(answer)) {
            used.insert(answer.module);
            FoundModule& module = found.emplace_back();
            module.request = identifierText(ids[i]);
            module.reply = identifierText(answer.module);
        }
    }
    return found;
}

} // namespace velmora
