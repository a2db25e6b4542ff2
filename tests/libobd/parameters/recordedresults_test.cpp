// Test results and vehicle information out of what real cars and bench simulators sent: from the printed reply, through
// the parser, to what a user reads.

#include "libobd/bytes/bytes.h"
#include "libobd/parameters/calibrationids.h"
#include "libobd/parameters/calibrationverificationnumbers.h"
#include "libobd/parameters/ecuname.h"
#include "libobd/parameters/identificationnumber.h"
#include "libobd/parameters/monitortestresult.h"
#include "libobd/parameters/performancetracking.h"
#include "tests/support/dialogue/dialoguefolder.h"
#include "tests/support/dialogue/recordedreply.h"
#include "tests/support/fakeecu.h"
#include "tests/support/tablefile.h"

#include <obd/protocolfamily.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <functional>

namespace {

namespace fs = std::filesystem;
using Ecu = std::shared_ptr<obd::IEcu>;
using Bytes = std::vector<unsigned char>;
using Texts = std::vector<std::string>;

using support::dialogueFolder;

std::string joined(Texts const& texts, std::string const& separator)
{
    std::string all;
    for (std::string const& text : texts) {
        all += (all.empty() ? "" : separator) + text;
    }
    return all;
}

// "96: 0.194092 (0.000000 to 0.200195) passed"
std::string told(obd::IMonitorTestItem const& item)
{
    static constexpr char const* verdicts[] = {"passed", "failed", "no result"};
    return obd::upperHex(item.testId(), 2) + ": " + item.value() + " (" + item.minimum() + " to " + item.maximum() +
           ") " + verdicts[item.status()];
}

std::string readResults(unsigned char id, Ecu const& ecu, Bytes const& payload)
{
    obd::MonitorTestResult parameter(id);
    if (!parameter.setResponseData(ecu, payload)) {
        return "refused";
    }
    Texts results;
    for (auto const& monitor : parameter.getItems(*ecu)) {
        for (auto const& item : monitor->items(obd::UnitSystem::Metric)) {
            results.push_back("[" + obd::upperHex(monitor->id, 2) + "] " + told(*item));
        }
    }
    return joined(results, "; ");
}

template <typename Parameter, typename Read>
std::string readItem(Ecu const& ecu, Bytes const& payload, Read const& read)
{
    Parameter parameter;
    return parameter.setResponseData(ecu, payload) ? read(parameter) : "refused";
}

std::string readVin(Ecu const& ecu, Bytes const& payload)
{
    return readItem<obd::VehicleIdentificationNumber>(
        ecu, payload, [&](auto const& parameter) { return parameter.vehicleIdentificationNumber(ecu); });
}

std::string readCalibrationIds(Ecu const& ecu, Bytes const& payload)
{
    return readItem<obd::CalibrationIds>(
        ecu, payload, [&](auto const& parameter) { return joined(parameter.calibrationIds(ecu), "; "); });
}

std::string readVerificationNumbers(Ecu const& ecu, Bytes const& payload)
{
    return readItem<obd::CalibrationVerificationNumbers>(
        ecu, payload, [&](auto const& parameter) { return joined(parameter.verificationNumbers(ecu), "; "); });
}

std::string readCounters(Ecu const& ecu, Bytes const& payload)
{
    return readItem<obd::PerformanceTrackingSpark>(ecu, payload, [&](auto const& parameter) {
        Texts counters;
        for (int const counter : parameter.counters(*ecu)) {
            counters.push_back(std::to_string(counter) + ": " + std::to_string(parameter.counterValue(*ecu, counter)));
        }
        return joined(counters, "; ");
    });
}

std::string readName(Ecu const& ecu, Bytes const& payload)
{
    return readItem<obd::EcuName>(ecu, payload, [&](auto const& parameter) {
        return parameter.ecuAcronym(*ecu) + "; " + parameter.description(*ecu) + "; " + parameter.fullDescription(*ecu);
    });
}

using Reader = std::function<std::string(Ecu const&, Bytes const&)>;

// Null for a request of which nothing is read here.
Reader readerOf(std::string const& request)
{
    static std::map<std::string, Reader> const information = {{"0902", readVin},
                                                              {"0904", readCalibrationIds},
                                                              {"0906", readVerificationNumbers},
                                                              {"0908", readCounters},
                                                              {"090A", readName}};
    if (request.size() == 4 && request.starts_with("06") && request != "0600") {
        auto const id = static_cast<unsigned char>(std::stoi(request.substr(2), nullptr, 16));
        return [id](Ecu const& ecu, Bytes const& payload) { return readResults(id, ecu, payload); };
    }
    auto const found = information.find(request);
    return found != information.end() ? found->second : Reader();
}

obd::ResponseMap payloadsOf(obd::ObdProtocol family, support::Question const& question)
{
    return support::payloadsOf(family,
                               question.headers ? question.reply : support::withHeaders(family, question.reply));
}

// The lines of one dialogue in the form of recordedresults.txt. Without headers a reply of the legacy buses does not
// tell whose it is, nor its protocol bytes.
void tell(Texts& lines, std::string const& name, support::RecordedDialogue const& dialogue)
{
    obd::ObdProtocol const family = support::familyOf(dialogue);
    for (support::Question const& question : support::questionsOf(dialogue)) {
        std::string const request = support::compacted(question.request);
        Reader const reader = readerOf(request);
        if (!reader || (!question.headers && !obd::isCan(family))) {
            continue;
        }
        std::string const place = name + " | " + request + " | " + std::to_string(question.occurrence) + " | ";
        obd::ResponseMap const payloads = payloadsOf(family, question);
        for (auto const& [id, payload] : payloads) {
            auto const ecu = std::make_shared<support::FakeEcu>(id, family);
            lines.push_back(place + obd::upperHex(id) + " | " + reader(ecu, payload));
        }
        if (payloads.empty()) {
            lines.push_back(place + "none | ");
        }
    }
}

TEST(RecordedResults, AreReadAsTheyWereMeant)
{
    Texts lines;
    for (fs::directory_entry const& entry : fs::directory_iterator(dialogueFolder)) {
        if (entry.path().extension() == ".dialogue") {
            tell(lines, entry.path().stem().string(), support::readDialogue(entry.path()));
        }
    }
    Texts expected;
    for (auto const& row : support::readTable("tests/libobd/parameters/recordedresults.txt")) {
        expected.push_back(joined(row, " | "));
    }
    EXPECT_THAT(lines, testing::UnorderedElementsAreArray(expected));
}

} // namespace
