// What the library learns of recorded cars, against what a person reads from the captured masks.

#include "libobd/adapter/elmscantool.h"
#include "libobd/module/obdproxy.h"
#include "simulator/simulation.h"
#include "tests/support/wire/peerconnection.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <map>
#include <set>
#include <sstream>

namespace {

using Identifiers = std::set<unsigned int>;

// Service and module to the identifiers of the masks.
using SupportedSets = std::map<std::pair<unsigned int, unsigned int>, Identifiers>;

unsigned int fromHex(std::string const& text)
{
    return static_cast<unsigned int>(std::stoul(text, nullptr, 16));
}

SupportedSets readSupported(std::filesystem::path const& file)
{
    SupportedSets sets;
    std::ifstream in(file);
    for (std::string line; std::getline(in, line);) {
        std::istringstream fields(line);
        std::string service;
        std::string module;
        if (line.starts_with('#') || !(fields >> service >> module)) {
            continue;
        }
        Identifiers& identifiers = sets[{fromHex(service), fromHex(module)}];
        for (std::string id; fields >> id && id != "-";) {
            identifiers.insert(fromHex(id));
        }
    }
    return sets;
}

// The library's own derived identifiers stand among those of service 01.
bool isDerived(unsigned int service, unsigned char id)
{
    return service == 1 && id >= 0xF0;
}

Identifiers learnt(obd::IEcu const& ecu, unsigned int service)
{
    Identifiers identifiers;
    for (unsigned char const id : ecu.supportedIds(static_cast<obd::ObdMode>(service), 0)) {
        if (id != 0 && !isDerived(service, id)) {
            identifiers.insert(id);
        }
    }
    return identifiers;
}

// Recordings whose masks the library does not reach, and why.
std::map<std::string, std::string> const unreachable = {
    {"can11-i10-2010-test-results", "the first request of a connection, 01 00, was not recorded"},
    {"can11-vw-ble-identity", "the first request of a connection, 01 00, was not recorded"},
    {"can29-four-modules-stray-frames", "a late answer of module 18DAF111 to another request takes its mask's place"},
    {"iso9141-bench-one-byte-a-line", "the echo cannot be switched off, and reads like a header"},
};

class RecordedCar : public testing::TestWithParam<std::filesystem::path>
{};

TEST_P(RecordedCar, IsLearntAsAPersonReadsItsMasks)
{
    std::filesystem::path dialogue = GetParam();
    dialogue.replace_extension(".dialogue");
    auto const device =
        std::make_shared<obd::ElmScantool>(std::make_shared<PeerConnection>(obdsim::replay(dialogue.string())));
    ASSERT_TRUE(device->initialize());
    ASSERT_TRUE(device->detectVehicle(obd::VehicleProtocol::Automatic));
    auto const proxy = std::make_shared<obd::ObdProxy>();
    proxy->setDevice(device);
    EXPECT_TRUE(proxy->initialize());
    for (auto const& [key, identifiers] : readSupported(GetParam())) {
        auto const [service, module] = key;
        if (service != 1 && service != 6 && service != 8 && service != 9) {
            continue; // asked on demand only
        }
        auto const ecu = proxy->ecu(module);
        ASSERT_NE(ecu, nullptr) << std::hex << module;
        EXPECT_EQ(learnt(*ecu, service), identifiers) << "service " << service << " module " << std::hex << module;
    }
    proxy->releaseEcus();
}

std::vector<std::filesystem::path> recordedCars()
{
    std::vector<std::filesystem::path> files;
    for (auto const& entry : std::filesystem::directory_iterator(VELMORA_SOURCE_DIR "/tests/dialogues")) {
        if (entry.path().extension() == ".supported" && !unreachable.contains(entry.path().stem().string())) {
            files.push_back(entry.path());
        }
    }
    std::sort(files.begin(), files.end());
    return files;
}

std::string caseName(testing::TestParamInfo<std::filesystem::path> const& info)
{
    std::string name = info.param.stem().string();
    std::replace(name.begin(), name.end(), '-', '_');
    return name;
}

TEST(RecordedCars, ThoseOutOfReachAreThere)
{
    for (auto const& [name, reason] : unreachable) {
        EXPECT_TRUE(std::filesystem::exists(std::string(VELMORA_SOURCE_DIR "/tests/dialogues/") + name + ".supported"))
            << name << ": " << reason;
    }
}

INSTANTIATE_TEST_SUITE_P(Dialogues, RecordedCar, testing::ValuesIn(recordedCars()), caseName);

} // namespace
