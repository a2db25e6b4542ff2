// Trouble codes out of what real cars and bench simulators sent.

#include "libobd/bytes/bytes.h"
#include "libobd/parameters/cleartroublecodes.h"
#include "libobd/parameters/dtcparameter.h"
#include "libobd/powertrain/freezeframetroublecode.h"
#include "tests/support/dialogue/dialoguefolder.h"
#include "tests/support/dtcrows.h"
#include "tests/support/fakeecu.h"
#include "tests/support/hexbytes.h"
#include "tests/support/payload/payloadfile.h"
#include "tests/support/tablefile.h"

#include <obd/protocolfamily.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <functional>
#include <regex>
#include <set>

namespace {

namespace fs = std::filesystem;
using Bytes = std::vector<unsigned char>;
using Messages = std::vector<Bytes>;

using support::dialogueFolder;

// The bus family by the beginning of a dialogue's name.
obd::ObdProtocol protocolOf(std::string const& dialogue)
{
    static std::map<std::string, obd::ObdProtocol> const protocols = {
        {"can11", obd::ObdProtocolCan11},      {"can29", obd::ObdProtocolCan29},
        {"iso9141", obd::ObdProtocolIso9141},  {"kwpfast", obd::ObdProtocolIso14230},
        {"kwpslow", obd::ObdProtocolIso14230}, {"pwm", obd::ObdProtocolJ1850},
        {"vpw", obd::ObdProtocolJ1850}};
    return protocols.at(dialogue.substr(0, dialogue.find('-')));
}

Bytes joined(Messages const& messages)
{
    Bytes all;
    for (Bytes const& message : messages) {
        all.insert(all.end(), message.begin(), message.end());
    }
    return all;
}

// Lines of one module make one reply on the legacy buses; on CAN each message is one.
bool offerAll(obd::ObdParameter& parameter, std::shared_ptr<obd::IEcu> const& ecu, Messages const& messages)
{
    if (!isCan(ecu->protocol())) {
        return parameter.setResponseData(ecu, joined(messages));
    }
    bool taken = false;
    for (Bytes const& message : messages) {
        taken = parameter.setResponseData(ecu, message) || taken;
    }
    return taken;
}

std::string codesIn(obd::DtcParameter const& parameter, obd::IEcu const& ecu)
{
    std::string codes;
    for (auto const& model : parameter.getTroubleCodes(ecu)) {
        codes += (codes.empty() ? "" : " ") + model->code;
    }
    return codes.empty() ? "none" : codes;
}

using CodeReader = std::function<std::string(std::shared_ptr<obd::IEcu> const&, Messages const&)>;

template <typename Codes>
std::string readCodes(std::shared_ptr<obd::IEcu> const& ecu, Messages const& messages)
{
    Codes codes;
    return offerAll(codes, ecu, messages) ? codesIn(codes, *ecu) : "refused";
}

std::string readClearing(std::shared_ptr<obd::IEcu> const& ecu, Messages const& messages)
{
    obd::ClearTroubleCodes clearing;
    return offerAll(clearing, ecu, messages) && clearing.isCleared(*ecu) ? "yes" : "refused";
}

std::string readFreezeFrameCode(std::shared_ptr<obd::IEcu> const& ecu, Messages const& messages)
{
    obd::FreezeFrameTroubleCode code(0);
    if (!offerAll(code, ecu, messages)) {
        return "refused";
    }
    return code.getTroubleCode(*ecu) != nullptr ? code.getTroubleCode(*ecu)->code : "none";
}

// By the request without its blanks.
std::map<std::string, CodeReader> const readers = {
    {"03", readCodes<obd::ConfirmedTroubleCodes>},
    {"04", readClearing},
    {"07", readCodes<obd::PendingTroubleCodes>},
    {"0A", readCodes<obd::PermanentTroubleCodes>},
    {"020200", readFreezeFrameCode},
};

std::string withoutBlanks(std::string text)
{
    text.erase(std::remove(text.begin(), text.end(), ' '), text.end());
    return text;
}

// Adds what the modules of one view of a reply said, in the form of recordedcodes.txt.
void tell(std::vector<std::string>& lines, std::string const& dialogue, std::string const& request,
          std::string const& view, support::ModuleMessages const& modules)
{
    for (auto const& [id, messages] : modules) {
        auto const ecu = std::make_shared<support::FakeEcu>(id, protocolOf(dialogue));
        std::string const result = readers.at(request.substr(0, request.find(' ')))(ecu, messages);
        lines.push_back(dialogue + " | " + request + " | " + view + " | " + obd::upperHex(id) + " | " + result);
    }
}

// Hands over each reply of the recordings to a request without its blanks.
void forEachReply(std::function<void(std::string const& dialogue, std::string const& request, int occurrence,
                                     support::ExpectedPayloads const& payloads)> const& take)
{
    for (fs::directory_entry const& entry : fs::directory_iterator(dialogueFolder)) {
        if (entry.path().extension() != ".payloads") {
            continue;
        }
        for (auto const& [key, payloads] : support::readPayloads(entry.path())) {
            take(entry.path().stem().string(), withoutBlanks(key.first), key.second, payloads);
        }
    }
}

// The rows of a table, each as one line.
std::vector<std::string> linesOf(std::string const& table)
{
    std::vector<std::string> lines;
    for (auto const& row : support::readTable("tests/libobd/parameters/" + table)) {
        std::string line;
        for (std::string const& cell : row) {
            line += (line.empty() ? "" : " | ") + cell;
        }
        lines.push_back(line);
    }
    return lines;
}

TEST(RecordedCodes, AreReadAsTheyWereMeant)
{
    std::vector<std::string> told;
    forEachReply([&told](auto const& dialogue, auto const& request, int occurrence, auto const& payloads) {
        if (readers.contains(request)) {
            std::string const place = request + " | " + std::to_string(occurrence);
            tell(told, dialogue, place, "library", payloads.rule);
            tell(told, dialogue, place, "standard", payloads.standard);
        }
    });
    EXPECT_THAT(told, testing::UnorderedElementsAreArray(linesOf("recordedcodes.txt")));
}

template <typename Codes>
std::vector<std::shared_ptr<obd::DtcDataModel>> readModels(std::shared_ptr<obd::IEcu> const& ecu,
                                                           Messages const& messages)
{
    Codes codes;
    return offerAll(codes, ecu, messages) ? codes.getTroubleCodes(*ecu)
                                          : std::vector<std::shared_ptr<obd::DtcDataModel>>();
}

// In the form of recordedtexts.txt.
void explain(std::set<std::string>& lines, std::string const& dialogue, std::string const& request,
             support::ModuleMessages const& modules)
{
    static std::map<std::string, decltype(&readModels<obd::ConfirmedTroubleCodes>)> const kinds = {
        {"03", readModels<obd::ConfirmedTroubleCodes>},
        {"07", readModels<obd::PendingTroubleCodes>},
        {"0A", readModels<obd::PermanentTroubleCodes>},
    };
    auto const kind = kinds.find(request);
    if (kind == kinds.end()) {
        return;
    }
    for (auto const& [id, messages] : modules) {
        auto const ecu = std::make_shared<support::FakeEcu>(id, protocolOf(dialogue));
        for (auto const& model : kind->second(ecu, messages)) {
            lines.insert(dialogue + " | " + model->code + " | " + model->system + " | " + model->manufacturer + " | " +
                         model->description);
        }
    }
}

TEST(RecordedCodes, ComeWithTheirTextsFromTheCatalogue)
{
    support::LoadedCodes const catalogue;
    std::set<std::string> told;
    forEachReply([&told](auto const& dialogue, auto const& request, int /*occurrence*/, auto const& payloads) {
        explain(told, dialogue, request, payloads.rule);
        explain(told, dialogue, request, payloads.standard);
    });
    EXPECT_THAT(told, testing::UnorderedElementsAreArray(linesOf("recordedtexts.txt")));
}

std::vector<std::string> split(std::string const& text, std::string const& separator)
{
    std::regex const expression(separator);
    return {std::sregex_token_iterator(text.begin(), text.end(), expression, -1), {}};
}

// The buses that a row of worked decodes can have come from.
std::vector<obd::ObdProtocol> busesOf(std::string const& name)
{
    if (name == "TroubleCodesCan") {
        return {obd::ObdProtocolCan11, obd::ObdProtocolCan29};
    }
    if (name == "TroubleCodesLegacy") {
        return {obd::ObdProtocolIso9141, obd::ObdProtocolIso14230, obd::ObdProtocolJ1850};
    }
    return {obd::ObdProtocolCan11, obd::ObdProtocolIso9141};
}

TEST(RecordedCodes, WorkedDecodesComeOutTheSame)
{
    int rows = 0;
    std::ifstream in(dialogueFolder / "decoded.txt");
    for (std::string line; std::getline(in, line);) {
        std::vector<std::string> const fields = split(line, "  +");
        if (fields.size() < 5 || !readers.contains(withoutBlanks(fields[0]))) {
            continue;
        }
        ++rows;
        Messages messages;
        for (std::string const& message : split(fields[1], " / ")) {
            messages.push_back(support::hexBytes(message));
        }
        std::string const expected = fields[2] == "Refusal" ? "refused" : fields[3];
        for (obd::ObdProtocol const bus : busesOf(fields[2])) {
            auto const ecu = std::make_shared<support::FakeEcu>(0x10U, bus);
            EXPECT_EQ(readers.at(withoutBlanks(fields[0]))(ecu, messages), expected) << line;
        }
    }
    EXPECT_GE(rows, 20);
}

} // namespace
