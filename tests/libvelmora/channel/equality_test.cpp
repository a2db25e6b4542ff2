// What the library reads through the fast and healing channel is what it reads through the plain one: on every
// simulated car and bus, and on every recorded dialogue. Both ask at the same moments of the car's time, so that values
// are equal byte by byte.

#include "libvelmora/channel/fastchannel.h"
#include "simulator/simulation.h"
#include "tests/support/dialogue/dialoguefolder.h"
#include "tests/support/dialogue/recordeddialogue.h"
#include "tests/support/fakeclock.h"
#include "tests/support/memorysettings.h"
#include "tests/support/wire/peerconnection.h"
#include "tests/support/wire/peerwire.h"

#include <obd/iconnectionmanager.h>
#include <obd/iecu.h>
#include <obd/iobdproxy.h>
#include <obd/iobdvelmora.h>
#include <obd/ivelmorasettings.h>
#include <obd/obdvelmorabuilder.h>
#include <obd/parameterfactory.h>
#include <obd/powertrainparameter.h>
#include <obd/sensorvalue.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>
#include <functional>
#include <set>

namespace velmora {

namespace {

using RequestBytes = std::vector<unsigned char>;

constexpr unsigned char firstDerived = 0xF0;

// What came of each request, in their order; empty if the connection did not come to stand.
using Outcome = std::vector<std::string>;

std::string outcomeText(RequestBytes const& request, obd::IDevice::Status status, obd::ResponseMap const& responses)
{
    std::string text = frameDigits(request) + " " + std::to_string(static_cast<int>(status));
    for (auto const& [module, payload] : responses) {
        text += " " + std::to_string(module) + ":" + frameDigits(payload);
    }
    return text;
}

class ChannelEquality : public testing::Test
{
protected:
    using Requests = std::function<std::vector<RequestBytes>(obd::IObdProxy&)>;
    using PassUntil = std::function<void(obdsim::Time)>;

    Outcome read(std::shared_ptr<obd::IDataConnection> const& channel, Requests const& requests,
                 PassUntil const& passUntil, std::function<void()> const& onOpen)
    {
        Outcome outcome;
        obd::IConnectionManager& manager = *m_obd->getConnectionManager();
        if (manager.openConnection(channel, obd::VehicleProtocol::Automatic, false)) {
            onOpen();
            std::shared_ptr<obd::IObdProxy> const proxy = manager.getProxy();
            obdsim::Time at = std::chrono::seconds(200); // when both have been opened for long
            for (RequestBytes const& request : requests(*proxy)) {
                obd::ResponseMap responses;
                passUntil(at);
                obd::IDevice::Status const status = proxy->execute(request, responses, 2500);
                outcome.push_back(outcomeText(request, status, responses));
                at += std::chrono::seconds(20);
            }
            for (std::shared_ptr<obd::IEcu> const& ecu : proxy->ecus()) {
                for (unsigned char const id : ecu->supportedIds(obd::ObdMode::CurrentData, 0)) {
                    if (id >= firstDerived) { // asks several at moments of its own
                        continue;
                    }
                    passUntil(at);
                    outcome.push_back(valueText(proxy, *ecu, id));
                    at += std::chrono::seconds(20);
                }
            }
        }
        manager.closeConnection();
        return outcome;
    }

    // What a parameter of a module tells, as a reader of it sees it.
    std::string valueText(std::shared_ptr<obd::IObdProxy> const& proxy, obd::IEcu& ecu, unsigned char pid)
    {
        auto const parameter =
            obd::ParameterFactory().createParameter(ecu, *m_obd->getSettings(), obd::ParameterIdentifier(pid).id());
        std::string text = std::to_string(ecu.id()) + "/" + std::to_string(pid);
        if (parameter == nullptr || parameter->update(proxy) != obd::IQuery::UpdateStatus::UpdateOk) {
            return text + " not told";
        }
        for (std::shared_ptr<obd::SensorValue> const& value : parameter->values(ecu, obd::UnitSystem::Metric)) {
            text += " " + value->textualValue();
        }
        return text;
    }

    Outcome readPlain(std::shared_ptr<obdsim::IPeer> peer, Requests const& requests)
    {
        auto const connection = std::make_shared<PeerConnection>(std::move(peer));
        auto const pass = [&connection](obdsim::Time at) { connection->pass(at - connection->now()); };
        return read(connection, requests, pass, [] {});
    }

    Outcome readFast(std::shared_ptr<obdsim::IPeer> peer, Requests const& requests, ChannelOptions const& options)
    {
        auto const wire = std::make_shared<support::PeerWire>(std::move(peer));
        auto const channel = std::make_shared<FastChannel>(wire, options);
        Outcome outcome = read(
            channel, requests, [&wire](obdsim::Time at) { wire->peer().advanceTo(at); },
            [&channel] { channel->onConnected(); });
        m_counted += channel->statistics().counted;
        return outcome;
    }

    support::FakeClock m_clock; // the pauses of the library take no time
    std::shared_ptr<obd::IObdVelmora> m_obd =
        obd::ObdVelmoraBuilder::createObdVelmora(0, 0, 0, std::make_shared<support::MemorySettings>());
    unsigned int m_counted = 0;
};

// All that the modules claim, the live values and the vehicle's items four times, and the services of codes.
std::vector<RequestBytes> everythingOf(obd::IObdProxy& proxy)
{
    std::set<RequestBytes> often;
    std::set<RequestBytes> once{{0x03}, {0x07}, {0x0A}, {0x02, 0x02, 0x00}, {0x02, 0x0C, 0x00}};
    for (std::shared_ptr<obd::IEcu> const& ecu : proxy.ecus()) {
        for (unsigned char const id : ecu->supportedIds(obd::ObdMode::CurrentData, 0)) {
            often.insert({0x01, id});
        }
        for (unsigned char const id : ecu->supportedIds(obd::ObdMode::VehicleInformation, 0)) {
            often.insert({0x09, id});
        }
        for (unsigned char const id : ecu->supportedIds(obd::ObdMode::MonitorTests, 0)) {
            once.insert({0x06, id});
        }
    }
    std::vector<RequestBytes> requests(once.begin(), once.end());
    for (RequestBytes const& request : often) {
        requests.insert(requests.end(), 4, request);
    }
    return requests;
}

// The same without live values. Where an answer is announced as pending, the fast channel asks once more, so that a
// live value is that of a later moment of the drive.
std::vector<RequestBytes> standingThingsOf(obd::IObdProxy& proxy)
{
    std::vector<RequestBytes> requests = everythingOf(proxy);
    std::erase_if(requests, [](RequestBytes const& request) { return request.front() == 0x01; });
    return requests;
}

std::string firstDifference(Outcome const& plain, Outcome const& fast)
{
    for (std::size_t i = 0; i < std::max(plain.size(), fast.size()); ++i) {
        std::string const left = i < plain.size() ? plain[i] : "nothing";
        std::string const right = i < fast.size() ? fast[i] : "nothing";
        if (left != right) {
            return left + " | " + right;
        }
    }
    return {};
}

TEST_F(ChannelEquality, EveryCarReadsTheSame)
{
    for (std::string const& vehicle : obdsim::simulatedVehicles()) {
        auto const requests = vehicle == "slow-can11" ? standingThingsOf : everythingOf;
        Outcome const plain = readPlain(obdsim::simulate({vehicle, "elm327-v1.5", {}}), requests);
        Outcome const fast = readFast(obdsim::simulate({vehicle, "elm327-v1.5", {}}), requests, {});
        EXPECT_FALSE(plain.empty()) << vehicle;
        EXPECT_EQ(firstDifference(plain, fast), "") << vehicle;
    }
    EXPECT_GT(m_counted, 200U) << "the counts were in use";
}

// The requests of a dialogue that are bytes, as it asks them.
std::vector<RequestBytes> requestsOf(support::RecordedDialogue const& dialogue)
{
    std::vector<RequestBytes> requests;
    for (support::Exchange const& exchange : dialogue.exchanges) {
        ElmCommand const command(exchange.request);
        if (command.isRequest() && command.service() <= 0x0A) {
            requests.emplace_back(command.bytes().begin(), command.bytes().end());
        }
    }
    return requests;
}

TEST_F(ChannelEquality, EveryRecordedDialogueReadsTheSameButForWhatWasHealed)
{
    // What the plain channel loses and this one reads.
    std::set<std::string> const healed = {
        // A module's mask, behind which stands its answer to an older question (41 11).
        "can29-four-modules-stray-frames: 0100 0 417001745:411126 417001752:410080000001 417001768:410080000001 "
        "417001792:410080000001 | 0100 0 417001745:4100BFDFA893 417001752:410080000001 417001768:410080000001 "
        "417001792:410080000001",
    };
    std::set<std::string> differing;
    int opened = 0;
    for (auto const& entry : std::filesystem::directory_iterator(support::dialogueFolder)) {
        if (entry.path().extension() != ".dialogue") {
            continue;
        }
        auto const requests = [&entry](obd::IObdProxy&) { return requestsOf(support::readDialogue(entry.path())); };
        Outcome const plain = readPlain(obdsim::replay(entry.path().string()), requests);
        Outcome const fast = readFast(obdsim::replay(entry.path().string()), requests,
                                      {.port = {}, .counting = false, .shortWait = false});
        opened += plain.empty() ? 0 : 1;
        std::string const difference = firstDifference(plain, fast);
        if (!difference.empty()) {
            differing.insert(entry.path().stem().string() + ": " + difference);
        }
    }
    EXPECT_EQ(differing, healed);
    EXPECT_GE(opened, 15); // the others hold no whole bring-up
}

} // namespace

} // namespace velmora
