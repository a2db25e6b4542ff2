// An adapter that lies: it cuts replies at another count than it was told, brings a reply with the next request,
// forgets every fiftieth prompt, loses characters, and stops at an interruption or not. No value may ever stand under
// the wrong sensor.

#include "libobd/message/messageparser.h"
#include "libvelmora/channel/fastchannel.h"
#include "tests/libvelmora/channel/channelrig.h"
#include "tests/support/sanitizer.h"
#include "tests/support/wire/timedwire.h"

#include <obd/obdprotocol.h>

#include <gtest/gtest.h>

#include <map>
#include <random>

namespace velmora {

namespace {

// Which sensor a value is of shows in the value: each byte of it is the PID and the module, mixed.
std::uint8_t markOf(unsigned int module, unsigned int pid)
{
    return static_cast<std::uint8_t>((pid * 7 + (module & 0x0FU) * 31) & 0xFFU);
}

constexpr unsigned int askedPids[] = {0x0B, 0x0C, 0x0D, 0x05, 0x11, 0x4F, 0x64, 0x7F};

std::size_t dataBytes(unsigned int pid)
{
    return pid == 0x0C ? 2U : pid == 0x4F ? 4U : pid == 0x64 ? 9U : pid == 0x7F ? 13U : 1U; // two take more frames
}

class LyingWire : public support::LineWire
{
public:
    // severity: how many times as often as it should be. wait: behind each reply, whatever ATST says.
    LyingWire(unsigned int seed, unsigned int severity, int wait) : m_random(seed), m_severity(severity), m_wait(wait)
    {}

    int faults = 0;

private:
    bool happens(unsigned int oneIn)
    {
        bool const does = m_random() % std::max(oneIn / m_severity, 2U) == 0;
        faults += does ? 1 : 0;
        return does;
    }

    static std::vector<std::string> framesOf(unsigned int module, unsigned int pid)
    {
        std::vector<std::uint8_t> payload{0x41, static_cast<std::uint8_t>(pid)};
        payload.insert(payload.end(), dataBytes(pid), markOf(module, pid));
        std::string const id = module == 0x7E8 ? "7E8" : "7E9";
        if (payload.size() <= 7) {
            return {id + frameDigits({static_cast<std::uint8_t>(payload.size())}) + frameDigits(payload)};
        }
        std::vector<std::string> frames{id + "10" + frameDigits({static_cast<std::uint8_t>(payload.size())}) +
                                        frameDigits({payload.begin(), payload.begin() + 6})};
        payload.resize(6 + (payload.size() - 6 + 6) / 7 * 7, 0xAA); // filled up
        for (std::size_t at = 6; at < payload.size(); at += 7) {
            auto const begin = payload.begin() + static_cast<std::ptrdiff_t>(at);
            frames.push_back(id + "2" + std::to_string(frames.size()) + frameDigits({begin, begin + 7}));
        }
        return frames;
    }

    void interrupt() override
    {
        if (!happens(10)) {
            silence();
            say("STOPPED\r\r>", WireTime(m_random() % 8));
        }
    }

    void answer(std::string const& command) override
    {
        if (command.starts_with("AT")) {
            std::string const text = command == "ATI" ? "ELM327 v1.5" : command == "ATDPN" ? "A6" : "OK";
            say(text + "\r\r>", WireTime(4));
            return;
        }
        std::size_t const told = command.size() % 2 != 0 ? static_cast<std::size_t>(command.back() - '0') : 0;
        unsigned int const pid = static_cast<unsigned int>(std::stoul(command.substr(2, 2), nullptr, 16));
        std::vector<std::string> lines;
        for (unsigned int const module : {0x7E8U, 0x7E9U}) {
            for (std::string const& frame : framesOf(module, pid)) {
                lines.push_back(frame);
            }
        }
        std::vector<std::string> late = std::exchange(m_held, {});
        if (told != 0 && happens(20)) {
            lines.resize(
                std::min<std::size_t>(lines.size(), m_random() % 4)); // a count of its own; the rest comes late
        } else if (told != 0) {
            lines.resize(std::min(lines.size(), told));
        }
        if (happens(25)) {
            m_held.assign(lines.begin() + static_cast<std::ptrdiff_t>(m_random() % (lines.size() + 1)), lines.end());
            lines.resize(lines.size() - m_held.size());
        }
        bool const behind = m_random() % 3 == 0; // in its place it is one fault with the loss before
        lines.insert(behind ? lines.end() : lines.begin(), late.begin(), late.end());
        sayLines(lines, told);
    }

    void sayLines(std::vector<std::string>& lines, std::size_t told)
    {
        std::string text;
        for (std::string& line : lines) {
            if (happens(60)) {
                line.erase(m_random() % line.size(), 1); // a character is lost on the way
            }
            text += line + "\r";
        }
        text += lines.empty() ? "NO DATA\r" : "";
        if (happens(100)) {
            m_held.push_back(text + "\r>"); // all of it, its prompt too, with the next request
            std::string const all = std::exchange(m_held.back(), {});
            m_held.clear();
            say(all, WireTime(1700 + m_random() % 2000));
            return;
        }
        say(text, WireTime(15));
        if (!happens(50)) {
            say("\r>", WireTime(told != 0 ? 16 : m_wait));
        }
    }

    std::mt19937 m_random;
    unsigned int const m_severity;
    int const m_wait;
    std::vector<std::string> m_held;
};

// What the library reads under a PID, by module.
obd::ResponseMap valuesOf(std::string const& reply, unsigned int asked)
{
    obd::ResponseMap values;
    obd::MessageParser::parseResponseMessage(obd::ObdProtocolCan11, {reply.begin(), reply.end()}, values);
    std::erase_if(values, [asked](auto const& entry) {
        return entry.second.size() < 2 + dataBytes(asked) || entry.second[0] != 0x41 || entry.second[1] != asked;
    });
    return values;
}

TEST(LyingAdapter, NoValueEverStandsUnderTheWrongSensorInAHundredThousandFaults)
{
    // One thread does it all, so that ThreadSanitizer has nothing to find that a tenth does not show.
    constexpr int faultsInAll = testsupport::underThreadSanitizer ? 10000 : 100000;
    constexpr int faultsEach = 500; // then a new adapter, since this one's counting is off by then
    // A prompt dropped one time in fifty, and the like; and adapters that are worse than any real one, which make many
    // faults in little time and meet two of them at once.
    constexpr unsigned int severities[] = {1, 4, 4, 8, 8};
    int faults = 0;
    long answered = 0;
    long values = 0;
    unsigned int counted = 0;
    unsigned int cut = 0;
    for (unsigned int seed = 1; faults < faultsInAll; ++seed) {
        int const wait = seed % 2 == 0 ? 80 : 400;
        auto const wire = std::make_shared<LyingWire>(seed, severities[seed % std::size(severities)], wait);
        FastChannel channel(wire, {});
        for (char const* command : {"ATI", "ATE0", "ATST64", "ATTP0", "ATDPN", "ATH1", "0100"}) {
            test::speak(channel, command, 700);
        }
        channel.onConnected();
        std::mt19937 random(seed);
        while (wire->faults < faultsEach) {
            unsigned int const pid = askedPids[random() % std::size(askedPids)];
            auto const reply = test::speak(channel, "01" + frameDigits({static_cast<std::uint8_t>(pid)}), 1500);
            answered += reply ? 1 : 0;
            if (!reply || reply->find_first_not_of("0123456789ABCDEF") != std::string::npos) {
                continue;
            }
            for (auto const& [module, data] : valuesOf(*reply, pid)) {
                ++values;
                for (std::size_t i = 2; i < 2 + dataBytes(pid); ++i) {
                    ASSERT_EQ(data[i], markOf(module, pid)) << "seed " << seed << ": " << *reply;
                }
            }
        }
        faults += wire->faults;
        counted += channel.statistics().counted;
        cut += channel.statistics().waitsCut;
    }
    EXPECT_GT(answered, faultsInAll / 2);
    EXPECT_GT(values, faultsInAll / 2);
    EXPECT_GT(counted, static_cast<unsigned int>(faultsInAll) / 100) << "the counting was on trial, too";
    EXPECT_GT(cut, static_cast<unsigned int>(faultsInAll) / 1000) << "and so were the waits that are cut";
    RecordProperty("faults", faults);
    RecordProperty("values", std::to_string(values));
}

} // namespace

} // namespace velmora
