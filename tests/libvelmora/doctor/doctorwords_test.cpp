// What the doctor says, word by word, of adapters that a test plays and of findings that it makes up.

#include "libvelmora/doctor/adaptercheck.h"
#include "libvelmora/doctor/commandmatrix.h"
#include "libvelmora/doctor/portcheck.h"
#include "tests/support/temporaryfolder.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>
#include <functional>
#include <map>

namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using testing::Not;
using velmora::AdapterTalk;
using velmora::DoctorCheck;
using velmora::DoctorReport;
using Verdict = DoctorCheck::Verdict;
using Replies = std::map<std::string, std::string>; // by command; all others get "?"

// Answers at once, on the thread that writes. A reply of "gone" is a loss of the link, one of "none" is none.
class DoctorsPort : public velmora::IPort
{
public:
    explicit DoctorsPort(Replies replies, std::vector<std::string>* asked = nullptr)
        : m_replies(std::move(replies)), m_asked(asked)
    {}

    void start(Receiver onBytes, LossHandler onLost) override
    {
        m_onBytes = std::move(onBytes);
        m_onLost = std::move(onLost);
    }
    void write(std::string_view bytes) override
    {
        std::string const command(bytes.substr(0, bytes.size() - 1));
        if (m_asked != nullptr) {
            m_asked->push_back(command);
        }
        auto const found = m_replies.find(command);
        std::string const reply = found == m_replies.end() ? "?" : found->second;
        if (reply == "gone") {
            m_onLost();
        } else if (reply != "none") {
            m_onBytes(reply + "\r\r>");
        }
    }
    void close() override {}

private:
    Replies const m_replies;
    std::vector<std::string>* m_asked;
    Receiver m_onBytes;
    LossHandler m_onLost;
};

std::vector<std::string> linesOf(DoctorReport const& report)
{
    std::vector<std::string> lines;
    for (DoctorCheck const& each : report.checks) {
        char const* const mark = each.verdict == Verdict::Good ? "ok" : each.verdict == Verdict::Note ? "note" : "bad";
        lines.push_back(std::string(mark) + " " + each.link + ": " + each.finding + "|" + each.advice);
    }
    return lines;
}

DoctorReport adapterReport(Replies const& replies, bool answers = true)
{
    AdapterTalk talk(std::make_unique<DoctorsPort>(replies));
    DoctorReport report;
    EXPECT_EQ(velmora::checkAdapter(talk, report), answers);
    return report;
}

TEST(AdapterTalk, GivesPlainWordsWithoutTheEcho)
{
    AdapterTalk talk(
        std::make_unique<DoctorsPort>(Replies{{"A", "A\r\n 41 00\t\x7F~!\r\r"}, {"B", "AB"}, {"C", "none"}}));
    EXPECT_EQ(talk.ask("A", std::chrono::seconds(9)), "41 00 ~!");
    EXPECT_TRUE(talk.echoed());
    EXPECT_EQ(talk.ask("B", std::chrono::seconds(9)), "AB");
    EXPECT_FALSE(talk.echoed());
    talk.ask("A", std::chrono::seconds(9));
    EXPECT_EQ(talk.ask("C", std::chrono::milliseconds(1)), std::nullopt);
    EXPECT_FALSE(talk.echoed()) << "of a reply that did not come";
    EXPECT_FALSE(talk.lost());
}

TEST(DoctorsAdapter, IsToldFromItsReplies)
{
    EXPECT_THAT(
        linesOf(adapterReport({{"ATI", "ELM327 v1.0"}, {"ATRV", "12.5V"}})),
        ElementsAre("ok adapter: ELM327 v1.0|",
                    "note adapter: lacks 17 of the commands that it should know|a clone; most of them are not needed",
                    "ok voltage: 12.5 V at the socket: the engine is off|"));
    EXPECT_THAT(
        linesOf(adapterReport({{"ATI", "ELM327 v1.5"}, {"ATQQ", "OK"}, {"ATIGN", "OFF"}, {"ATE0", "ATE0\rOK"}})),
        ElementsAre("ok adapter: ELM327 v1.5|",
                    "note adapter: says OK to a command that does not exist|a clone: what it claims to know proves "
                    "nothing",
                    "note voltage: the adapter does not report the voltage|",
                    "note ignition: off, by the adapter's pin, which few boards connect|switch the ignition on if "
                    "no control module answers"));
    DoctorReport const clone = adapterReport({{"ATI", "ELM327 v1.5"}, {"STI", "STI\r?"}, {"ATRV", "14.4V"}});
    EXPECT_THAT(linesOf(clone)[1], HasSubstr("its echo stays on in spite of ATE0"));
    EXPECT_THAT(linesOf(clone)[2], HasSubstr("never made; it knows the commands of v1.0 in part"));
    EXPECT_THAT(clone.missing, testing::Contains("ATJTM1"));
    DoctorReport const stn = adapterReport({{"ATI", "ELM327 v1.4a"}, {"STI", "STN1110 v4.2.0"}});
    EXPECT_EQ(linesOf(stn)[1], "ok adapter: STN1110 v4.2.0|");
    EXPECT_THAT(linesOf(stn)[2], HasSubstr("lacks")) << "what an STN claims besides is not held against it";
}

TEST(DoctorsAdapter, KnowsACommandByItsOkOrByAText)
{
    auto const missing = [](char const* reply) {
        return velmora::probeCommands([reply](std::string const&) { return reply; }, "ELM327 v2.3", false).missing;
    };
    EXPECT_EQ(missing("?").size(), 50U);
    EXPECT_EQ(missing("huh").size(), 37U) << "thirteen are questions";
    EXPECT_THAT(missing("huh"), testing::Contains("ATIFR1"));
    EXPECT_THAT(missing("huh"), Not(testing::Contains("ATDPN")));
    EXPECT_EQ(missing("").size(), 50U);
    auto const stn = velmora::probeCommands([](std::string const&) { return "?"; }, "ELM327 v2.3", true);
    EXPECT_THAT(stn.missing, Not(testing::Contains("ATAMC")));
    EXPECT_THAT(stn.missing, testing::SizeIs(45U));
    EXPECT_EQ(stn.level, "");
}

TEST(DoctorsAdapter, IsAskedForItsNameTwice)
{
    std::vector<std::string> asked;
    AdapterTalk talk(std::make_unique<DoctorsPort>(Replies(), &asked));
    DoctorReport report;
    EXPECT_TRUE(velmora::checkAdapter(talk, report)) << "it answers, if only by a question mark";
    ASSERT_GT(asked.size(), 3U);
    EXPECT_THAT(std::vector<std::string>(asked.begin(), asked.begin() + 4), ElementsAre("ATI", "ATI", "ATE0", "STI"));
    EXPECT_EQ(linesOf(report).front(), "ok adapter: ?|");
    EXPECT_THAT(linesOf(adapterReport({{"ATI", "gone"}}, false)),
                ElementsAre("bad adapter: sends no prompt|is it an ELM327 adapter? pull it and plug it in again"));
}

TEST(DoctorsVoltage, HasItsLimits)
{
    auto const said = [](char const* reply) { return velmora::judgeVoltage(reply)->finding; };
    EXPECT_EQ(said("5.99V"), "6.0 V at the socket, which is none");
    EXPECT_EQ(said("6.0V"), "6.0 V at the socket: a weak battery, or a board that reads low");
    EXPECT_EQ(said("12.0V"), "12.0 V at the socket: a weak battery, or a board that reads low");
    EXPECT_EQ(said("12.1V"), "12.1 V at the socket: the engine is off");
    EXPECT_EQ(said("13.1V"), "13.1 V at the socket: the engine is off");
    EXPECT_EQ(said("13.2V"), "13.2 V at the socket: the battery is charged, the engine runs");
    EXPECT_EQ(velmora::judgeVoltage("5V")->advice, "is the adapter firmly in the car's socket?");
    EXPECT_EQ(velmora::judgeVoltage("11V")->advice, "charge it before a long session with the engine off");
    EXPECT_EQ(velmora::judgeIgnition("ON")->finding, "on, by the adapter's pin");
}

TEST(DoctorsBuses, AreTriedInTurnUpToTheOneThatAnswers)
{
    std::vector<std::string> asked;
    AdapterTalk talk(std::make_unique<DoctorsPort>(Replies{{"0100", "NO DATA"}}, &asked));
    DoctorReport silent;
    velmora::checkBuses(talk, silent);
    ASSERT_EQ(silent.checks.size(), 9U);
    EXPECT_EQ(linesOf(silent).front(), "note bus: 1 SAE J1850 PWM: NO DATA|");
    EXPECT_EQ(linesOf(silent).back(), "note bus: 9 CAN 29 bit, 250 kbit/s: NO DATA|");
    EXPECT_EQ(asked.front(), "ATTP1");
    EXPECT_EQ(asked[16], "ATTP9");

    for (char const* const reply : {"7E8 06 41 00 98 3F 80 11", "7E80641009800"}) {
        AdapterTalk other(std::make_unique<DoctorsPort>(Replies{{"0100", reply}}));
        DoctorReport report;
        velmora::checkBuses(other, report);
        EXPECT_THAT(linesOf(report),
                    ElementsAre(std::string("ok bus: 1 SAE J1850 PWM: ") + reply + "|choose it: --protocol 1"));
    }
    AdapterTalk wordy(std::make_unique<DoctorsPort>(Replies{{"0100", std::string(61, 'x')}}));
    DoctorReport report;
    velmora::checkBuses(wordy, report);
    EXPECT_EQ(report.checks[5].finding, "6 CAN 11 bit, 500 kbit/s: " + std::string(60, 'x'));
    AdapterTalk leaving(std::make_unique<DoctorsPort>(Replies{{"0100", "gone"}}));
    DoctorReport left;
    velmora::checkBuses(leaving, left);
    EXPECT_THAT(linesOf(left), ElementsAre("note bus: 1 SAE J1850 PWM: no prompt|"));
}

TEST(DoctorsPortCheck, TellsWhatStandsInTheWay)
{
    testsupport::TemporaryFolder const folder;
    auto const checks = velmora::checkPort(velmora::SerialAddress{folder.file("ttyX"), 38400});
    EXPECT_THAT(linesOf({checks, {}, {}, {}}),
                ElementsAre("bad port: there is no " + folder.file("ttyX") +
                            ", or it can't be opened|is the adapter plugged in? `velmora ports` lists what is there"));
    std::ofstream(folder.file("plain")) << "x";
    auto const plain = velmora::checkPort(velmora::SerialAddress{folder.file("plain"), 38400});
    EXPECT_THAT(linesOf({plain, {}, {}, {}}).front(), HasSubstr("is no serial port|`velmora ports` lists"));
    EXPECT_THAT(linesOf({velmora::checkPort(velmora::TcpAddress{"host", 1}), {}, {}, {}}),
                ElementsAre("ok port: host:1|"));
}

TEST(DoctorsReport, IsTextForAPersonAndJsonForAProgram)
{
    DoctorReport report;
    report.checks = {{"port", Verdict::Good, "there", ""}, {"adapter", Verdict::Note, "odd", "look at it"}};
    EXPECT_EQ(toText(report), "ok     port       there\n"
                              "note   adapter    odd\n"
                              "                  look at it\n"
                              "\nNothing dead was found, but no control module was measured.\n");
    report.habits = {{"echo", 3}};
    report.missing = {"ATFE", "ATSS"};
    report.figures = velmora::DoctorFigures{20, 10.2, 11.6, 15.1, 20.9, 23, std::nullopt, 6, 99.6};
    EXPECT_EQ(toText(report), "ok     port       there\n"
                              "note   adapter    odd\n"
                              "                  look at it\n"
                              "Commands that are missing: ATFE, ATSS\n"
                              "Met on the way: echo, 3x\n"
                              "\n"
                              "Reply after 10 ms at least, 12 in the middle, 15 for 95 %, 21 at most (20 requests)\n"
                              "Longest reply that came whole: 23 bytes\n"
                              "Expected-count digit: not tried\n"
                              "PIDs in one request: 6\n"
                              "Within reach: about 100 values a second\n"
                              "\nEverything works from the port to the control modules; about 100 values a second are "
                              "within reach.\n");
    velmora::Json const json = toJson(report);
    EXPECT_EQ(json["checks"][1],
              velmora::Json::parse(R"({"link":"adapter","verdict":"note","finding":"odd","advice":"look at it"})"));
    EXPECT_EQ(json["checks"][0]["advice"], nullptr);
    EXPECT_EQ(json["habits"], velmora::Json::parse(R"([{"habit":"echo","times":3}])"));
    EXPECT_EQ(json["figures"]["high"], 15.1);
    EXPECT_EQ(json["figures"]["longestReply"], 23);
    EXPECT_EQ(json["figures"]["countWorks"], nullptr);
    report.figures->countWorks = true;
    EXPECT_THAT(toText(report), HasSubstr("digit: makes replies faster\n"));
    report.figures->countWorks = false;
    EXPECT_THAT(toText(report), HasSubstr("digit: no gain, or refused\n"));

    EXPECT_TRUE(report.isHealthy());
    report.checks.push_back({"bus", Verdict::Bad, "silent", ""});
    report.checks.push_back({"more", Verdict::Bad, "dead", ""});
    EXPECT_FALSE(report.isHealthy());
    EXPECT_EQ(report.verdict(), "The bus is where it breaks: silent.");
    report.checks[2].advice = "switch it on";
    EXPECT_EQ(report.verdict(), "The bus is where it breaks: silent; switch it on.");
    EXPECT_THAT(toText(report), HasSubstr("FAILS  bus        silent\n"));
    EXPECT_EQ(toJson(report)["checks"][2]["verdict"], "bad");
}

} // namespace
