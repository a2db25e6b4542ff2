// Feeds every reply of the recorded dialogues that was printed with headers through the way that replies take in the
// driver, and compares what comes out with payloads that were worked out by hand.

#include "libobd/src/bytefilter.h"
#include "libobd/src/elmtransport.h"
#include "libobd/src/messageparser.h"
#include "libobd/src/proxyerror.h"

#include "tests/support/payloadfile.h"
#include "tests/support/recordeddialogue.h"

#include <gtest/gtest.h>
#include <obd/connectionprotocol.h>

#include <algorithm>
#include <cctype>
#include <filesystem>
#include <iomanip>
#include <map>
#include <set>
#include <sstream>
#include <string_view>

namespace {

namespace fs = std::filesystem;
using obd::ResponseMap;

fs::path const folder = fs::path(VELMORA_SOURCE_DIR) / "tests" / "dialogues";

std::vector<std::string> recordings()
{
    std::vector<std::string> names;
    for (fs::directory_entry const& entry : fs::directory_iterator(folder)) {
        if (entry.path().extension() == ".payloads") {
            names.push_back(entry.path().stem().string());
        }
    }
    std::sort(names.begin(), names.end());
    return names;
}

std::string inCapitalsWithoutBlanks(std::string const& text)
{
    std::string result;
    for (char const c : text) {
        if (c != ' ') {
            result += static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
        }
    }
    return result;
}

// Requests to the vehicle are hexadecimal; all else is a command to the adapter.
bool isVehicleRequest(std::string const& request)
{
    return !request.empty() && request.find_first_not_of(" 0123456789ABCDEFabcdef") == std::string::npos;
}

// One line that was sent while headers were on.
struct Question
{
    std::string request;
    int occurrence;
    std::string reply;
};

std::vector<Question> questionsWithHeaders(support::RecordedDialogue const& dialogue)
{
    bool headersOn = dialogue.header.at("headers") == "on";
    std::map<std::string, int> occurrences;
    std::vector<Question> questions;
    for (support::Exchange const& exchange : dialogue.exchanges) {
        int const occurrence = ++occurrences[exchange.request];
        headersOn = headersOn || inCapitalsWithoutBlanks(exchange.request) == "ATH1";
        if (headersOn) {
            questions.push_back({exchange.request, occurrence, exchange.reply});
        }
    }
    return questions;
}

obd::ObdProtocol familyOf(support::RecordedDialogue const& dialogue)
{
    return obd::toObdProtocol(static_cast<obd::VehicleProtocol>(std::stoi(dialogue.header.at("protocol"))));
}

// What a request's caller gets out of the reply. The read ends at the first prompt, without one there is no reply.
ResponseMap payloadsOf(obd::ObdProtocol family, std::string const& reply)
{
    ResponseMap responses;
    std::size_t const prompt = reply.find('>');
    if (prompt == std::string::npos) {
        return responses;
    }
    std::vector<unsigned char> text(reply.begin(), reply.begin() + static_cast<std::ptrdiff_t>(prompt));
    obd::cleanReply(text);
    if (obd::checkForErrors(text) != obd::ProxyError::None) {
        return responses;
    }
    obd::removeBytes(text, " ");
    if (!text.empty()) {
        obd::MessageParser::parseResponseMessage(family, text, responses);
    }
    return responses;
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
    support::RecordedDialogue dialogue = support::readDialogue(folder / (GetParam() + ".dialogue"));
    support::PayloadFile payloads = support::readPayloads(folder / (GetParam() + ".payloads"));
};

INSTANTIATE_TEST_SUITE_P(Recorded, Transcript, testing::ValuesIn(recordings()),
                         [](testing::TestParamInfo<std::string> const& recording) {
                             std::string name = recording.param;
                             std::replace(name.begin(), name.end(), '-', '_');
                             return name;
                         });

TEST_P(Transcript, GivesThePayloadsWorkedOutByHand)
{
    obd::ObdProtocol const family = familyOf(dialogue);
    for (Question const& question : questionsWithHeaders(dialogue)) {
        auto const expected = payloads.find({question.request, question.occurrence});
        if (expected == payloads.end()) {
            EXPECT_FALSE(isVehicleRequest(question.request)) << question.request << " has no payloads";
            continue;
        }
        EXPECT_EQ(printed(messagesOf(payloadsOf(family, question.reply))), printed(expected->second.rule))
            << question.request << ", occurrence " << question.occurrence;
    }
}

TEST_P(Transcript, EveryPayloadBelongsToARequest)
{
    std::set<std::pair<std::string, int>> asked;
    for (Question const& question : questionsWithHeaders(dialogue)) {
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
        support::RecordedDialogue const dialogue = support::readDialogue(folder / (name + ".dialogue"));
        for (Question const& question : questionsWithHeaders(dialogue)) {
            replies[familyOf(dialogue)] += isVehicleRequest(question.request) ? 1 : 0;
        }
    }
    EXPECT_GE(recordings().size(), 40U);
    for (obd::ObdProtocol const family : {obd::ObdProtocolIso9141, obd::ObdProtocolIso14230, obd::ObdProtocolJ1850,
                                          obd::ObdProtocolCan11, obd::ObdProtocolCan29}) {
        EXPECT_GE(replies[family], 5) << family;
    }
}

} // namespace
