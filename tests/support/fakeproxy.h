#pragma once

#include "tests/support/fakeecu.h"
#include "tests/support/gate.h"
#include "tests/support/hexbytes.h"
#include "tests/support/wire/scriptedanswers.h"

#include <obd/iobdproxy.h>

#include <algorithm>
#include <atomic>
#include <condition_variable>
#include <functional>
#include <map>
#include <mutex>
#include <string>
#include <string_view>
#include <vector>

namespace support {

// The bus as a test wants it: answers requests by their bytes, commands by their text, and remembers what it was asked.
//
//     proxy.answer("01 0C", "41 0C 1A F8");                                     // module 0x7E8, from now on
//     proxy.answer("01 0D", {{0x7E8, "41 0D 50"}, {0x7E9, "7F 01 12"}});        // two modules
//     proxy.answerOnce("03", "43 01 01 33");                                    // goes before what stands
//     proxy.fail("01 05", obd::IDevice::Status::NotSent);
//     proxy.note("01 07", obd::AdapterNote::ReplyLost);
//     proxy.throwOn("01 06", "out of memory");
//     proxy.answerCommand("ATRV", "12.4V");
//     EXPECT_EQ(proxy.count("01 0C"), 1);
//
// Whatever nothing was said of gets NoResponse, as from a silent vehicle. Starts with a standing link and one CAN
// module, 0x7E8. Safe from any thread; unlike the real proxy it lets exchanges overlap, and tells so in mostAtOnce().
class FakeProxy : public obd::IObdProxy
{
public:
    using Bytes = std::vector<unsigned char>;
    using Status = obd::IDevice::Status;
    // Payloads by module in hexadecimal text.
    using Replies = std::map<unsigned int, std::string>;

    FakeProxy() { addEcu(std::make_shared<FakeEcu>(0x7E8)); }

    // Setting up. Hexadecimal texts may have blanks.

    void answer(std::string_view request, Replies const& replies)
    {
        always(request, {Status::Ok, decoded(replies), {}});
    }
    void answer(std::string_view request, char const* payload) { answer(request, Replies{{0x7E8, payload}}); }
    void answerOnce(std::string_view request, Replies const& replies)
    {
        once(request, {Status::Ok, decoded(replies), {}});
    }
    void answerOnce(std::string_view request, char const* payload) { answerOnce(request, Replies{{0x7E8, payload}}); }

    void fail(std::string_view request, Status status) { always(request, {status, {}, {}}); }
    void failOnce(std::string_view request, Status status) { once(request, {status, {}, {}}); }

    // NoResponse, for the adapter says more than silence.
    void note(std::string_view request, obd::AdapterNote note) { always(request, {Status::NoResponse, {}, {}, note}); }
    void noteCommand(std::string const& command, obd::AdapterNote note)
    {
        std::lock_guard const lock(m_mutex);
        m_commandAnswers.always(command, {Status::NoResponse, {}, {}, note});
    }

    // The exchange ends in a std::runtime_error.
    void throwOn(std::string_view request, std::string const& what) { always(request, {Status::Ok, {}, what}); }
    void throwOnce(std::string_view request, std::string const& what) { once(request, {Status::Ok, {}, what}); }

    // What requests and commands get of which nothing was said.
    void otherwise(Status status)
    {
        std::lock_guard const lock(m_mutex);
        m_answers.otherwise({status, {}, {}});
        m_commandAnswers.otherwise({status, {}, {}});
    }

    void answerCommand(std::string const& command, std::string const& reply)
    {
        std::lock_guard const lock(m_mutex);
        m_commandAnswers.always(command, {Status::Ok, reply, {}});
    }
    void failCommand(std::string const& command, Status status)
    {
        std::lock_guard const lock(m_mutex);
        m_commandAnswers.always(command, {status, {}, {}});
    }

    void forgetAnswers()
    {
        std::lock_guard const lock(m_mutex);
        m_answers.forget();
        m_commandAnswers.forget();
    }

    // Without a link every exchange is Unparsed, and not counted.
    void setConnected(bool connected) { m_connected = connected; }
    void setProtocol(obd::ObdProtocol protocol) { m_protocol = protocol; }
    void setBatteryVoltage(float volts) { m_voltage = volts; }
    void setInitializeResult(bool result) { m_initializeResult = result; }

    void addEcu(std::shared_ptr<obd::IEcu> const& ecu)
    {
        std::lock_guard const lock(m_mutex);
        m_ecus[ecu->id()] = ecu;
    }
    void setEcus(std::vector<std::shared_ptr<obd::IEcu>> const& list)
    {
        {
            std::lock_guard const lock(m_mutex);
            m_ecus.clear();
        }
        for (std::shared_ptr<obd::IEcu> const& each : list) {
            addEcu(each);
        }
    }

    // Called inside each exchange, on its thread, before it is answered: to move a clock, to lose the link.
    void during(std::function<void()> function)
    {
        std::lock_guard const lock(m_mutex);
        m_during = std::move(function);
    }

    // From now on exchanges stay inside until released.
    void hold() { m_gate.shut(); }
    void release() { m_gate.open(); }
    // Waits until exchanges are inside. False if none come.
    bool awaitHeld(int exchanges = 1) { return m_gate.awaitWaiting(exchanges); }

    // Looking back.

    // Requests in their order, as they came.
    std::vector<Bytes> requests() const
    {
        std::lock_guard const lock(m_mutex);
        return m_requests;
    }
    std::vector<std::string> commands() const
    {
        std::lock_guard const lock(m_mutex);
        return m_commands;
    }
    int count() const { return static_cast<int>(requests().size()); }
    int count(std::string_view request) const
    {
        std::vector<Bytes> const all = requests();
        return static_cast<int>(std::count(all.begin(), all.end(), hexBytes(request)));
    }
    void forgetRequests()
    {
        std::lock_guard const lock(m_mutex);
        m_requests.clear();
        m_commands.clear();
    }
    // The time-out that the last exchange was given, in milliseconds.
    unsigned int lastTimeout() const { return m_lastTimeout; }
    // The highest number of exchanges that were inside at the same time.
    int mostAtOnce() const { return m_mostAtOnce; }
    int initializations() const { return m_initializations; }
    std::shared_ptr<obd::IDevice> device() const
    {
        std::lock_guard const lock(m_mutex);
        return m_device;
    }

    void setDevice(std::shared_ptr<obd::IDevice> device) override
    {
        std::lock_guard const lock(m_mutex);
        m_device = std::move(device);
    }
    bool initialize() override
    {
        ++m_initializations;
        return m_initializeResult;
    }
    bool isConnected() override { return m_connected; }
    obd::ObdProtocol protocol() override { return m_connected ? m_protocol.load() : obd::ObdProtocolUnknown; }

    std::vector<std::shared_ptr<obd::IEcu>> ecus() override
    {
        std::lock_guard const lock(m_mutex);
        std::vector<std::shared_ptr<obd::IEcu>> list;
        for (auto const& [id, each] : m_ecus) {
            list.push_back(each);
        }
        return list;
    }
    std::shared_ptr<obd::IEcu> firstEcu() override
    {
        std::lock_guard const lock(m_mutex);
        return m_ecus.empty() ? nullptr : m_ecus.begin()->second;
    }
    std::shared_ptr<obd::IEcu> ecu(unsigned int id) override
    {
        std::lock_guard const lock(m_mutex);
        auto const entry = m_ecus.find(id);
        return entry != m_ecus.end() ? entry->second : nullptr;
    }

    Status execute(std::string const& command, std::string& response, unsigned int timeoutMs) override
    {
        obd::AdapterNote note{};
        return executeNoted(command, response, timeoutMs, note);
    }
    Status execute(Bytes const& request, obd::ResponseMap& responses, unsigned int timeoutMs) override
    {
        obd::AdapterNote note{};
        return executeNoted(request, responses, timeoutMs, note);
    }
    Status executeNoted(std::string const& command, std::string& response, unsigned int timeoutMs,
                        obd::AdapterNote& note) override
    {
        auto const answer = exchange(command, timeoutMs, m_commands, m_commandAnswers);
        if (answer.status == Status::Ok) {
            response = answer.reply;
        }
        note = answer.note;
        return answer.status;
    }
    Status executeNoted(Bytes const& request, obd::ResponseMap& responses, unsigned int timeoutMs,
                        obd::AdapterNote& note) override
    {
        auto const answer = exchange(request, timeoutMs, m_requests, m_answers);
        responses.insert(answer.reply.begin(), answer.reply.end());
        note = answer.note;
        return answer.status;
    }

    float batteryVoltage() override { return m_voltage; }

private:
    using Answers = ScriptedAnswers<Bytes, obd::ResponseMap>;
    using CommandAnswers = ScriptedAnswers<std::string, std::string>;

    // Counts an exchange that is inside.
    class Inside
    {
    public:
        explicit Inside(FakeProxy& proxy) : m_proxy(proxy)
        {
            std::lock_guard const lock(m_proxy.m_mutex);
            ++m_proxy.m_inside;
            m_proxy.m_mostAtOnce = std::max(m_proxy.m_mostAtOnce.load(), m_proxy.m_inside);
        }
        ~Inside()
        {
            std::lock_guard const lock(m_proxy.m_mutex);
            --m_proxy.m_inside;
        }
        Inside(Inside const&) = delete;
        Inside& operator=(Inside const&) = delete;

    private:
        FakeProxy& m_proxy;
    };

    template <typename Question, typename Script>
    typename Script::Answer exchange(Question const& question, unsigned int timeoutMs, std::vector<Question>& record,
                                     Script& answers)
    {
        if (!m_connected) {
            return {Status::Unparsed, {}, {}};
        }
        Inside const inside(*this);
        m_lastTimeout = timeoutMs;
        std::function<void()> during;
        {
            std::lock_guard const lock(m_mutex);
            record.push_back(question);
            during = m_during;
        }
        m_gate.pass();
        if (during) {
            during();
        }
        std::lock_guard const lock(m_mutex);
        auto answer = answers.take(question);
        if (answer.error) {
            throw std::runtime_error(*answer.error);
        }
        return answer;
    }

    void always(std::string_view request, Answers::Answer answer)
    {
        std::lock_guard const lock(m_mutex);
        m_answers.always(hexBytes(request), std::move(answer));
    }
    void once(std::string_view request, Answers::Answer answer)
    {
        std::lock_guard const lock(m_mutex);
        m_answers.once(hexBytes(request), std::move(answer));
    }
    static obd::ResponseMap decoded(Replies const& replies)
    {
        obd::ResponseMap map;
        for (auto const& [id, payload] : replies) {
            map[id] = hexBytes(payload);
        }
        return map;
    }

    mutable std::mutex m_mutex; // guards what is no atomic
    Answers m_answers;
    CommandAnswers m_commandAnswers;
    std::vector<Bytes> m_requests;
    std::vector<std::string> m_commands;
    std::map<unsigned int, std::shared_ptr<obd::IEcu>> m_ecus;
    std::shared_ptr<obd::IDevice> m_device;
    std::function<void()> m_during;
    int m_inside = 0;
    Gate m_gate{true};
    std::atomic<int> m_mostAtOnce{0};
    std::atomic<int> m_initializations{0};
    std::atomic<unsigned int> m_lastTimeout{0};
    std::atomic<bool> m_connected{true};
    std::atomic<bool> m_initializeResult{true};
    std::atomic<obd::ObdProtocol> m_protocol{obd::ObdProtocolCan11};
    std::atomic<float> m_voltage{12.5F};
};

} // namespace support
