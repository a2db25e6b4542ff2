#include "libobd/adapter/elmscantool.h"
#include "libobd/module/obdproxy.h"
#include "simulator/simulation.h"
#include "tests/support/wire/peerconnection.h"

#include <gtest/gtest.h>

#include <set>

namespace {

using obd::ElmScantool;
using obd::IDevice;
using obd::ObdProxy;
using obd::ResponseMap;
using obd::VehicleProtocol;

/// The driver with a simulated adapter in front of it.
struct Bench
{
    explicit Bench(std::shared_ptr<obdsim::IPeer> peer)
        : connection(std::make_shared<PeerConnection>(std::move(peer))),
          device(std::make_shared<ElmScantool>(connection))
    {}

    explicit Bench(std::string const& vehicle, std::string const& adapter = "elm327-v1.5",
                   std::vector<std::string> const& faults = {})
        : Bench(obdsim::simulate({vehicle, adapter, faults}))
    {}

    bool bringUp(VehicleProtocol protocol = VehicleProtocol{})
    {
        return device->initialize() && device->detectVehicle(protocol);
    }

    std::shared_ptr<PeerConnection> connection;
    std::shared_ptr<ElmScantool> device;
};

struct CarCase
{
    char const* vehicle;
    obd::ObdProtocol protocol;
    std::set<unsigned int> modules;
};

CarCase const carCases[] = {
    {"petrol-pwm", obd::ObdProtocolJ1850, {0x10}},
    {"petrol-vpw", obd::ObdProtocolJ1850, {0x10, 0x18}},
    {"petrol-iso9141", obd::ObdProtocolIso9141, {0x10}},
    {"petrol-kwp-slow", obd::ObdProtocolIso14230, {0x10}},
    {"petrol-kwp-fast", obd::ObdProtocolIso14230, {0x11, 0x18}},
    {"petrol-can11", obd::ObdProtocolCan11, {0x7E8, 0x7E9}},
    {"diesel-can29", obd::ObdProtocolCan29, {0x18DAF110, 0x18DAF118, 0x18DAF128}},
    {"petrol-can11-250", obd::ObdProtocolCan11, {0x7E8}},
    {"petrol-can29-250", obd::ObdProtocolCan29, {0x18DAF110}},
    {"real-hyundai-i40", obd::ObdProtocolCan11, {0x7E8}},
    {"real-golf-can11", obd::ObdProtocolCan11, {0x7E8}},
    {"real-skoda", obd::ObdProtocolCan29, {0x18DAF110, 0x18DAF118}},
    {"real-vw-kwp", obd::ObdProtocolIso14230, {0x10}},
    {"real-altezza-kwp", obd::ObdProtocolIso14230, {0x13}},
};

std::set<unsigned int> modulesOf(ObdProxy& proxy)
{
    std::set<unsigned int> ids;
    for (auto const& ecu : proxy.ecus()) {
        ids.insert(ecu->id());
    }
    return ids;
}

TEST(DriverOnSimulator, findsEveryVehicleAndItsModules)
{
    for (auto const& row : carCases) {
        Bench bench(row.vehicle);
        ASSERT_TRUE(bench.bringUp()) << row.vehicle;
        EXPECT_EQ(bench.device->getProtocol(), row.protocol) << row.vehicle;
        auto const proxy = std::make_shared<ObdProxy>();
        proxy->setDevice(bench.device);
        EXPECT_TRUE(proxy->initialize()) << row.vehicle;
        EXPECT_EQ(modulesOf(*proxy), row.modules) << row.vehicle;
        proxy->releaseEcus();
    }
}

TEST(DriverOnSimulator, comesUpOnEveryAdapterThatSpeaks)
{
    for (auto const& key : obdsim::simulatedAdapters()) {
        Bench bench("petrol-can11", key);
        EXPECT_EQ(bench.bringUp(), key != "silent") << key;
        ResponseMap responses;
        if (key != "silent") {
            EXPECT_EQ(bench.device->execute({0x01, 0x1C}, responses, 1500), IDevice::Status::Ok) << key;
            EXPECT_EQ(responses[0x7E8], (std::vector<unsigned char>{0x41, 0x1C, 0x06})) << key;
        }
    }
}

TEST(DriverOnSimulator, chosenProtocolIsTheOnlyOneTried)
{
    Bench right("petrol-iso9141");
    EXPECT_TRUE(right.bringUp(static_cast<VehicleProtocol>(3)));
    Bench wrong("petrol-iso9141");
    EXPECT_FALSE(wrong.bringUp(static_cast<VehicleProtocol>(6)));
}

TEST(DriverOnSimulator, readsLongMessages)
{
    Bench bench("petrol-can11");
    ASSERT_TRUE(bench.bringUp());
    ResponseMap responses;
    EXPECT_EQ(bench.device->execute({0x09, 0x02}, responses, 3000), IDevice::Status::Ok);
    auto const& reply = responses[0x7E8];
    ASSERT_EQ(reply.size(), 20U);
    EXPECT_EQ(std::string(reply.begin() + 3, reply.end()), "VELMRAS1MM0000001");
}

TEST(DriverOnSimulator, quirksDoNotKeepItFromTheCar)
{
    for (char const* quirk :
         {"prompt-slow", "single-return", "double-prompt", "linefeeds-on", "junk-before-banner",
          "question-before-banner", "leftover-questions", "greeting", "echo-kept-off", "formatting-stuck", "ok-to-all",
          "first-letters-only", "no-count-digit", "pieces", "search-ok", "tight-description"}) {
        Bench bench("petrol-can11", "elm327-v1.5", {std::string("quirk:") + quirk});
        EXPECT_TRUE(bench.bringUp()) << quirk;
    }
}

// Without a prompt an OK is no reply, and a protocol that is chosen anew for each attempt has a first request each
// time.
TEST(DriverOnSimulator, someQuirksKeepItFromTheCar)
{
    for (char const* quirk : {"prompt-late", "first-no-data"}) {
        Bench bench("petrol-can11", "elm327-v1.5", {std::string("quirk:") + quirk});
        EXPECT_FALSE(bench.bringUp()) << quirk;
    }
}

TEST(DriverOnSimulator, noFaultMakesItHangOrCrash)
{
    for (char const* fault : {"garbage=0.001",
                              "garbage=0.05",
                              "garbage=1",
                              "nul=0.1",
                              "nul=1",
                              "prompt=0.2",
                              "prompt@3",
                              "cut@5",
                              "cut@120",
                              "stall@40:3000",
                              "slow=100",
                              "slow=2000",
                              "loss@3",
                              "loss@60",
                              "loss@150",
                              "loss@400",
                              "error:BUS BUSY@3",
                              "error:BUFFER FULL=0.3",
                              "error:LV RESET@9",
                              "error:STOPPED=1",
                              "error:ERR94@12",
                              "echo",
                              "quirk:byte-per-line",
                              "quirk:frames-twice",
                              "quirk:headers-stuck",
                              "quirk:padding-shown",
                              "quirk:stopped-first",
                              "quirk:bus-init-split"}) {
        for (char const* vehicle : {"petrol-can11", "petrol-vpw", "petrol-kwp-fast"}) {
            Bench bench(vehicle, "elm327-v1.5", {fault, "seed=5"});
            bool const up = bench.bringUp();
            for (int i = 0; i < 5; ++i) {
                ResponseMap responses;
                try {
                    bench.device->execute({0x01, 0x0C}, responses, 1500);
                } catch (std::exception const&) {
                    // A damaged reply may run out of the bytes that its header promises.
                }
            }
            bench.device->close();
            EXPECT_LT(bench.connection->peer().now(), obdsim::Ms(600000)) << fault << " " << vehicle << " " << up;
        }
    }
}

// A nul byte belongs to no reply; the transport takes it out.
TEST(DriverOnSimulator, nulBytesDoNotMatter)
{
    Bench bench("diesel-can29", "elm327-v1.5", {"nul=0.5"});
    ASSERT_TRUE(bench.bringUp());
    ResponseMap responses;
    EXPECT_EQ(bench.device->execute({0x01, 0x1C}, responses, 1500), IDevice::Status::Ok);
    EXPECT_EQ(responses.at(0x18DAF110), (std::vector<unsigned char>{0x41, 0x1C, 0x06}));
}

struct ReplayCase
{
    char const* dialogue;
    obd::ObdProtocol protocol;
    std::set<unsigned int> modules;
};

// Recordings that hold enough for a whole bring-up.
ReplayCase const replayCases[] = {
    {"kwpfast-van-2005-stn", obd::ObdProtocolIso14230, {0x12}},
    {"kwpfast-bmw-two-modules", obd::ObdProtocolIso14230, {0x12, 0x18}},
    {"kwpfast-espace-empty-mask", obd::ObdProtocolIso14230, {0x7A}},
    {"can11-a180d-three-modules", obd::ObdProtocolCan11, {0x7E8, 0x7E9, 0x7EB}},
    {"can11-jaguar-2014-two-modules-come-and-go", obd::ObdProtocolCan11, {0x7E8, 0x7E9}},
    {"can29-four-modules-stray-frames", obd::ObdProtocolCan29, {0x18DAF111, 0x18DAF118, 0x18DAF128, 0x18DAF140}},
    {"iso9141-audi-tt-1998-bus-init-split", obd::ObdProtocolIso9141, {0x11}},
    {"pwm-first-masks", obd::ObdProtocolJ1850, {0x10}},
    {"pwm-bench-two-modules-masks", obd::ObdProtocolJ1850, {0x10, 0x17}},
    {"vpw-bench-vin-two-modules", obd::ObdProtocolJ1850, {0x10, 0x17}},
};

TEST(DriverOnReplay, recordedCarsComeUp)
{
    for (auto const& row : replayCases) {
        Bench bench(obdsim::replay(std::string(VELMORA_SOURCE_DIR "/tests/dialogues/") + row.dialogue + ".dialogue"));
        ASSERT_TRUE(bench.bringUp()) << row.dialogue;
        EXPECT_EQ(bench.device->getProtocol(), row.protocol) << row.dialogue;
        auto const proxy = std::make_shared<ObdProxy>();
        proxy->setDevice(bench.device);
        proxy->initialize();
        EXPECT_EQ(modulesOf(*proxy), row.modules) << row.dialogue;
        proxy->releaseEcus();
    }
}

} // namespace
