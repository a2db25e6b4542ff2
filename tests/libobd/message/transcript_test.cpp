// Feeds every reply of the recorded dialogues that was printed with headers through the way that replies take in the
// driver, and compares what comes out with payloads that were worked out by hand.

#include "tests/support/dialogue/dialoguefolder.h"
#include "tests/support/dialogue/recordedreply.h"
#include "tests/support/payload/payloadfile.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <iomanip>
#include <map>
#include <set>
#include <sstream>

namespace {

namespace fs = std::filesystem;
using obd::ResponseMap;

using support::dialogueFolder;

std::vector<std::string> recordings()
{
    std::vector<std::string> names;
    for (fs::directory_entry const& entry : fs::directory_iterator(dialogueFolder)) {
        if (entry.path().extension() == ".payloads") {
            names.push_back(entry.path().stem().string());
        }
    }
    std::sort(names.begin(), names.end());
    return names;
}

// Requests to the vehicle are hexadecimal; all else is a command to the adapter.
bool isVehicleRequest(std::string const& request)
{
    return !request.empty() && request.find_first_not_of(" 0123456789ABCDEFabcdef") == std::string::npos;
}

std::vector<support::Question> questionsWithHeaders(support::RecordedDialogue const& dialogue)
{
    std::vector<support::Question> questions = support::questionsOf(dialogue);
    std::erase_if(questions, [](support::Question const& question) { return !question.headers; });
    return questions;
}

support::ModuleMessages messagesOf(ResponseMap const& responses)
{
    support::ModuleMessages messages;
    for (auto const& [id, payload] : responses) {
        messages[id] = {payload};
    }
    return messages;
}

std::string printed(support::ModuleMessages const& messages)
{
    std::ostringstream out;
    out << std::hex << std::uppercase << std::setfill('0');
    for (auto const& [id, list] : messages) {
        out << id << ':';
        for (std::vector<unsigned char> const& message : list) {
            for (unsigned char const byte : message) {
                out << ' ' << std::setw(2) << static_cast<int>(byte);
            }
            out << ';';
        }
    }
    return out.str();
}

class Transcript : public testing::TestWithParam<std::string>
{
protected:
    support::RecordedDialogue dialogue = support::readDialogue(dialogueFolder / (GetParam() + ".dialogue"));
    support::PayloadFile payloads = support::readPayloads(dialogueFolder / (GetParam() + ".payloads"));
};

INSTANTIATE_TEST_SUITE_P(Recorded, Transcript, testing::ValuesIn(recordings()),
                         [](testing::TestParamInfo<std::string> const& recording) {
                             std::string name = recording.param;
                             std::replace(name.begin(), name.end(), '-', '_');
                             return name;
                         });

TEST_P(Transcript, GivesThePayloadsWorkedOutByHand)
{
    obd::ObdProtocol const family = support::familyOf(dialogue);
    for (support::Question const& question : questionsWithHeaders(dialogue)) {
        auto const expected = payloads.find({question.request, question.occurrence});
        if (expected == payloads.end()) {
            EXPECT_FALSE(isVehicleRequest(question.request)) << question.request << " has no payloads";
            continue;
        }
        EXPECT_EQ(printed(messagesOf(support::payloadsOf(family, question.reply))), printed(expected->second.rule))
            << question.request << ", occurrence " << question.occurrence;
    }
}

TEST_P(Transcript, EveryPayloadBelongsToARequest)
{
    std::set<std::pair<std::string, int>> asked;
    for (support::Question const& question : questionsWithHeaders(dialogue)) {
        asked.emplace(question.request, question.occurrence);
    }
    for (auto const& [key, expected] : payloads) {
        EXPECT_TRUE(asked.contains(key)) << key.first << ", occurrence " << key.second;
    }
}

TEST_P(Transcript, DeparturesFromTheBusStandardAreKnown)
{
    int departures = 0;
    for (auto const& [key, expected] : payloads) {
        bool const departs = expected.rule != expected.standard;
        EXPECT_EQ(departs, !expected.reasons.empty()) << key.first << ", occurrence " << key.second;
        departures += departs ? 1 : 0;
    }
    RecordProperty("departures", departures);
}

TEST(Transcripts, CoverEveryBusFamily)
{
    std::map<obd::ObdProtocol, int> replies;
    for (std::string const& name : recordings()) {
        support::RecordedDialogue const dialogue = support::readDialogue(dialogueFolder / (name + ".dialogue"));
        for (support::Question const& question : questionsWithHeaders(dialogue)) {
            replies[support::familyOf(dialogue)] += isVehicleRequest(question.request) ? 1 : 0;
        }
    }
    EXPECT_GE(recordings().size(), 40U);
    for (obd::ObdProtocol const family : {obd::ObdProtocolIso9141, obd::ObdProtocolIso14230, obd::ObdProtocolJ1850,
                                          obd::ObdProtocolCan11, obd::ObdProtocolCan29}) {
        EXPECT_GE(replies[family], 5) << family;
    }
}

} // namespace
