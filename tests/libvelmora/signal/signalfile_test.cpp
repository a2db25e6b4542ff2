#include "libvelmora/signal/signalfile.h"
#include "libvelmora/signal/signalset.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

#include <cstdio>
#include <filesystem>
#include <fstream>

using namespace velmora;

namespace {

char const* const gearbox = R"toml([vehicle]
maker = "Example"
models = ["Wagon"]
vin = "WEX*"

[[signal]]
id = "GEARBOX_TEMP"
name = "Gearbox temperature"
header = "7E1"
request = "221E1C"
formula = "A-40"
unit = "°C"
min = -40
max = 215
precision = 0
rate = 0.5
verified = { by = "the bench", on = "2026-05-01" }

[[signal]]
id = "DOOR"
name = "Driver's door"
header = "726"
reply = "72E"
flow = { header = "726", data = "300000" }
request = "22D100"
length = 2
formula = "bit(B, 3)"
values = { 0 = "closed", 1 = "open \"wide\"" }
enabled = false
reason = "needs ignition"

[[signal]]
id = "PACK"
name = "Pack text"
header = "6F1"
reply = "607"
ext = "07"
tester = "F1"
request = "22DDBC"
text = { first = 1, count = 3 }
timeout = 400

[[signal]]
id = "TWICE"
name = "Worked out"
formula = "value(\"GEARBOX_TEMP\")*2"
)toml";

std::vector<std::string> mistakesIn(std::string const& text)
{
    std::vector<std::string> list;
    for (SignalMistake const& each : readSignals(text, "f.toml").mistakes) {
        list.push_back(toText(each, "f.toml"));
    }
    return list;
}

std::string withSignal(std::string const& lines)
{
    return "[[signal]]\nid = \"A\"\nname = \"a\"\n" + lines;
}

} // namespace

TEST(SignalFile, ReadsAllThatASignalHas)
{
    SignalFileReading const reading = readSignals(gearbox, "gearbox.toml");
    ASSERT_TRUE(reading.mistakes.empty()) << toText(reading.mistakes.front(), "gearbox.toml");
    EXPECT_EQ(reading.file.maker, "Example");
    EXPECT_EQ(reading.file.models, std::vector<std::string>{"Wagon"});
    EXPECT_EQ(reading.file.vin, "WEX*");
    ASSERT_EQ(reading.file.signals.size(), 4U);
    Signal const& temperature = reading.file.signals[0];
    EXPECT_EQ(temperature.request, (std::vector<unsigned char>{0x22, 0x1E, 0x1C}));
    EXPECT_EQ(evaluate(*temperature.formula, {std::vector<unsigned char>{90}, {}}), 50.0);
    EXPECT_EQ(temperature.min, -40.0);
    EXPECT_EQ(temperature.rate, 0.5);
    EXPECT_EQ(temperature.precision, 0);
    EXPECT_EQ(temperature.verifiedOn, "2026-05-01");
    Signal const& door = reading.file.signals[1];
    EXPECT_EQ(door.flowControl->data, (std::vector<unsigned char>{0x30, 0, 0}));
    EXPECT_EQ(door.values.at(1), "open \"wide\"");
    EXPECT_EQ(door.length, 2U);
    EXPECT_FALSE(door.enabled);
    Signal const& pack = reading.file.signals[2];
    EXPECT_EQ(pack.extendedAddress, 0x07);
    EXPECT_EQ(pack.tester, 0xF1);
    EXPECT_EQ(pack.text->count, 3U);
    EXPECT_EQ(pack.timeout, 400U);
}

TEST(SignalFile, WantsAnIdANameAndOneKindOfContent)
{
    EXPECT_EQ(mistakesIn("[[signal]]\nrequest = \"220100\"\n"),
              (std::vector<std::string>{"f.toml:1: signal 1, id: is missing", "f.toml:1: signal 1, name: is missing",
                                        "f.toml:1: signal 1, formula: each signal wants either a formula or a text"}));
    EXPECT_EQ(mistakesIn(withSignal("formula = \"A\"\n")).size(), 1U) << "A is a byte of a reply";
    EXPECT_TRUE(mistakesIn(withSignal("formula = \"1+1\"\n")).empty());
}

TEST(SignalFile, WritesWhatItReads)
{
    SignalFile const file = readSignals(gearbox, "f.toml").file;
    std::string const written = toToml(file);
    SignalFileReading const again = readSignals(written, "f.toml");
    EXPECT_TRUE(again.mistakes.empty()) << written;
    EXPECT_EQ(toToml(again.file), written);
    EXPECT_EQ(again.file.signals.size(), file.signals.size());
    EXPECT_NE(written.find("values = { 0 = \"closed\", 1 = \"open \\\"wide\\\"\" }"), std::string::npos) << written;
}

TEST(SignalFile, TellsAllMistakesAtOnceWithTheirPlaces)
{
    std::vector<std::string> const mistakes = mistakesIn(R"toml([vehicle]
makr = "x"
[[signal]]
id = "lower"
name = ""
header = "7E"
request = "2E0102"
formula = "A+"
colour = 3
[[signal]]
id = "B"
name = "b"
header = "7B3"
request = "220100"
formula = "A"
min = 5
max = 5
)toml");
    std::vector<std::string> const wanted = {
        "f.toml:4: signal 1, id: must be a text of capitals, digits and '_'",
        "f.toml:5: signal 1, name: must be a text that is not empty",
        "f.toml:6: signal 1, header: must be a text of hexadecimal digits, as many as one of 3, 6, 8",
        "f.toml:7: signal 1, request: service 2E writes into a module",
        "f.toml:8: signal 1, formula: the formula ends too early (at character 3)",
        "f.toml:9: signal 1, colour: is no key of a signal",
        "f.toml:10: signal 2, reply: is missing; only 7E0 to 7E7 and 18DAxxF1 have replies that follow from the header",
        "f.toml:10: signal 2, min: must be less than max",
    };
    for (std::string const& line : wanted) {
        EXPECT_NE(std::find(mistakes.begin(), mistakes.end(), line), mistakes.end()) << line;
    }
    EXPECT_EQ(mistakes.size(), wanted.size() + 1) << "and the key of the vehicle";
}

TEST(SignalFile, RefusesEveryServiceThatDoesMoreThanRead)
{
    std::string const allowed = "01 02 05 06 09 1A 21 22";
    for (unsigned int service = 0; service <= 0xFF; ++service) {
        std::vector<unsigned char> request = {static_cast<unsigned char>(service), 0x01, 0x02};
        bool refused = refusalOf(request).has_value();
        request.pop_back();
        refused = refused && refusalOf(request).has_value();
        char name[3];
        std::snprintf(name, sizeof(name), "%02X", service);
        EXPECT_EQ(refused, allowed.find(name) == std::string::npos) << name;
    }
    EXPECT_NE(mistakesIn(withSignal("request = \"1003\"\nformula = \"A\"")).at(0).find("changes the session"),
              std::string::npos);
}

TEST(SignalFile, ChecksWhatNoKeyAloneTells)
{
    EXPECT_EQ(mistakesIn(withSignal("request = \"0105\"\n")).size(), 1U) << "neither formula nor text";
    EXPECT_EQ(mistakesIn(withSignal("formula = \"A\"\n")).size(), 1U) << "bytes of no request";
    EXPECT_EQ(mistakesIn(withSignal("formula = \"1+1\"\n")).size(), 0U);
    EXPECT_EQ(mistakesIn(withSignal("formula = \"value(\\\"X\\\")\"\n")).size(), 1U) << "not in this file";
    EXPECT_EQ(mistakesIn(withSignal("formula = \"value(\\\"A\\\")\"\n")).size(), 1U) << "itself";
    EXPECT_EQ(mistakesIn("").size(), 1U) << "no signals";
    EXPECT_EQ(mistakesIn("[[signal]]\nid = ").size(), 1U) << "no TOML";
    EXPECT_EQ(mistakesIn(withSignal("request = \"0105\"\nformula = \"A\"\n") +
                         withSignal("request = \"0105\"\nformula = \"A\"\n"))
                  .size(),
              1U)
        << "an id twice";
}

TEST(SignalFile, WantsNoReplyOfAHeaderThatAsksAll)
{
    EXPECT_EQ(mistakesIn(withSignal("header = \"7DF\"\nrequest = \"0105\"\nformula = \"A\"\n")).size(), 0U);
    EXPECT_EQ(mistakesIn(withSignal("header = \"C033F1\"\nrequest = \"0105\"\nformula = \"A\"\n")).size(), 0U);
    EXPECT_EQ(mistakesIn(withSignal("header = \"8011F1\"\nrequest = \"2101\"\nformula = \"A\"\n")).size(), 1U);
}

// Each reads the two before it: who follows every way through them takes years.
TEST(SignalFile, ChecksReferencesHoweverTheyBranch)
{
    constexpr int many = 400;
    std::string text = "[[signal]]\nid = \"S0\"\nname = \"x\"\nrequest = \"2101\"\nformula = \"A\"\n"
                       "[[signal]]\nid = \"S1\"\nname = \"x\"\nformula = \"value(\\\"S0\\\")\"\n";
    for (int i = 2; i < many; ++i) {
        text += "[[signal]]\nid = \"S" + std::to_string(i) + "\"\nname = \"x\"\nformula = \"value(\\\"S" +
                std::to_string(i - 1) + "\\\")+value(\\\"S" + std::to_string(i - 2) + "\\\")\"\n";
    }
    EXPECT_EQ(mistakesIn(text).size(), 0U);
    std::string const circle = "[[signal]]\nid = \"T\"\nname = \"x\"\nformula = \"value(\\\"U\\\")\"\n"
                               "[[signal]]\nid = \"U\"\nname = \"x\"\nformula = \"value(\\\"T\\\")\"\n"
                               "[[signal]]\nid = \"V\"\nname = \"x\"\nformula = \"value(\\\"U\\\")\"\n";
    EXPECT_EQ(mistakesIn(text + circle).size(), 3U) << "the circle, and who reads it";
}

TEST(SignalFile, PairsRepliesAsIso15765Does)
{
    EXPECT_EQ(standardReply("7E0"), "7E8");
    EXPECT_EQ(standardReply("7E1"), "7E9");
    EXPECT_EQ(standardReply("7E2"), "7EA");
    EXPECT_EQ(standardReply("7E7"), "7EF");
    EXPECT_EQ(standardReply("7E8"), std::nullopt);
    EXPECT_EQ(standardReply("DA10F1"), "18DAF110");
    EXPECT_EQ(standardReply("18DADBF1"), "18DAF1DB");
    EXPECT_EQ(standardReply("6C10F1"), std::nullopt);
    EXPECT_EQ(echoLength({0x22, 1, 2}), 3U);
    EXPECT_EQ(echoLength({0x21, 1}), 2U);
}

TEST(SignalFile, LoadsFilesThatAreSound)
{
    std::filesystem::path const path = testsupport::ownPath("signals.toml");
    std::ofstream(path) << gearbox;
    EXPECT_EQ(loadSignalFile(path.string()).signals.size(), 4U);
    std::ofstream(path) << "[[signal]]\n";
    try {
        loadSignalFile(path.string());
        ADD_FAILURE() << "the mistakes went unseen";
    } catch (Error const& error) {
        EXPECT_EQ(error.kind(), ErrorKind::WrongUse);
        EXPECT_GE(error.hints().size(), 3U);
    }
    std::filesystem::remove(path);
    EXPECT_THROW(loadSignalFile(path.string()), Error);
    EXPECT_THROW(loadSignalFile("/dev/zero"), Error);
}

TEST(SignalSet, PassesOverBrokenFilesOfItsFolderAndSaysWhatIsWrong)
{
    testsupport::TemporaryFolder const folder;
    std::ofstream(folder.file("a.toml")) << "x = 1\n";
    std::ofstream(folder.file("b.toml")) << gearbox;
    std::string told;
    SignalSet const set({}, folder.path(), [&told](std::string const& text) { told += text; });
    EXPECT_EQ(told, folder.file("a.toml") + " is passed over: The signal file " + folder.file("a.toml") +
                        " has mistakes\n  - " + folder.file("a.toml") +
                        ":1: x: is no key of a signal file (vehicle, signal)\n");
}
