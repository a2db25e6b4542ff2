// How fast a vehicle can be read, measured on an adapter that a test plays with its delays.

#include "libvelmora/channel/fastchannel.h"
#include "libvelmora/doctor/vehiclecheck.h"
#include "tests/libvelmora/doctor/playedvehicle.h"
#include "tests/support/temporaryfolder.h"
#include "tests/support/workerclock.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>

namespace velmora {

namespace {

using testing::Contains;
using testing::ElementsAre;

using test::PlayedVehicle;
using test::Player;
using test::VehicleSaid;

class VehicleMeasure : public testing::Test
{
protected:
    // The figures of a vehicle whose replies a test tells; its one module offers these PIDs.
    std::optional<DoctorFigures> measure(char const* mask, Player const& player)
    {
        SessionOptions options;
        options.port = "a car";
        options.settingsFile = (m_folder.path() / "settings.toml").string();
        options.openPort = [&, this] {
            return std::make_unique<PlayedVehicle>(
                [&, mask](std::string const& command, int times) {
                    return command == "0100" ? std::optional(VehicleSaid{std::string("7E8064100") + mask})
                                             : player(command, times);
                },
                m_asked);
        };
        options.makeChannel = [](std::shared_ptr<IWire> const& wire) {
            return std::make_shared<FastChannel>(wire,
                                                 ChannelOptions{.port = {}, .counting = false, .shortWait = false});
        };
        Session session(options);
        session.connect();
        m_asked.clear();
        m_report = {};
        checkVehicle(session, m_report);
        noteHabits(session, m_report);
        HabitCounts const counts = session.channel().statistics().habits;
        EXPECT_EQ(m_report.habits.size(),
                  static_cast<std::size_t>(std::count_if(counts.begin(), counts.end(), [](auto n) { return n != 0; })));
        return m_report.figures;
    }
    // The same of an adapter that can count, which a busy machine may hide once.
    std::optional<DoctorFigures> measureCounting(char const* mask, Player const& player)
    {
        std::optional<DoctorFigures> figures;
        for (int i = 0; i < 5 && !(figures && figures->countWorks.value_or(false)); ++i) {
            figures = measure(mask, player);
        }
        EXPECT_TRUE(figures && figures->countWorks.value_or(false));
        return figures;
    }
    std::vector<std::string> findings() const
    {
        std::vector<std::string> texts;
        for (DoctorCheck const& each : m_report.checks) {
            texts.push_back(each.link + ": " + each.finding + "|" + each.advice);
        }
        return texts;
    }
    std::ptrdiff_t timesAsked(std::string const& command) const
    {
        return std::count(m_asked.begin(), m_asked.end(), command);
    }

    support::WorkerClock m_clock;
    testsupport::TemporaryFolder const m_folder;
    std::vector<std::string> m_asked;
    DoctorReport m_report;
};

char const* const sixPids = "981A0000"; // 01 04 05 0C 0D 0F: four bytes, one, one, two, one, one

// Of an adapter that takes no count, so that no pause of the machine can make one look useful.
std::string replyTo(std::string const& command)
{
    bool const counted = command.size() % 2 != 0;
    return counted ? "?" : command == "0104" ? "7E803410480" : "7E8037F0112";
}

TEST_F(VehicleMeasure, TellsTheTimesOfTwentyRequestsInTheirOrder)
{
    auto const figures = measure(sixPids, [](std::string const& command, int times) -> std::optional<VehicleSaid> {
        if (command == "0902") {
            return VehicleSaid{"7E8101449020156454C\r7E8214D524153314D4D\r7E82230303030303031"};
        }
        bool const slow = command == "0104" && (times == 3 || times == 7);
        return command.starts_with("01") ? std::optional(VehicleSaid{replyTo(command), slow ? 10 * times : 0})
                                         : std::nullopt;
    });
    ASSERT_TRUE(figures);
    EXPECT_EQ(figures->requests, 20U);
    EXPECT_GE(timesAsked("0104"), 42) << "for the times, the count and the rate";
    EXPECT_LE(figures->minimum, figures->median);
    EXPECT_LT(figures->median, figures->high);
    EXPECT_GE(figures->high, 30.0) << "two of twenty are above 95 %";
    EXPECT_LT(figures->high, figures->maximum);
    EXPECT_GE(figures->maximum, 70.0);
    EXPECT_EQ(figures->longestReply, 20U);
    EXPECT_THAT(figures->countWorks, testing::Optional(false));
    EXPECT_EQ(figures->pidsPerRequest, 1U) << "no two of them in one request";
    EXPECT_GT(figures->valuesPerSecond, 0.0);
    EXPECT_THAT(findings(), testing::SizeIs(2)) << "the bus and its module";
}

TEST_F(VehicleMeasure, TellsWhatWasNotAnswered)
{
    auto const figures = measure(sixPids, [](std::string const& command, int times) -> std::optional<VehicleSaid> {
        return command == "0104" && times > 3 ? std::optional(VehicleSaid{replyTo(command)}) : std::nullopt;
    });
    ASSERT_TRUE(figures);
    EXPECT_EQ(figures->requests, 17U);
    EXPECT_EQ(figures->longestReply, 0U);
    EXPECT_THAT(findings(), Contains("modules: 3 of 20 requests got no reply|is the adapter firmly in the socket?"));
    auto const silent = measure(sixPids, [](std::string const&, int) { return std::nullopt; });
    ASSERT_TRUE(silent);
    EXPECT_EQ(silent->requests, 0U);
    EXPECT_EQ(silent->maximum, 0.0);
    EXPECT_EQ(silent->countWorks, std::nullopt);
    EXPECT_EQ(silent->pidsPerRequest, 1U);
    EXPECT_EQ(silent->valuesPerSecond, 0.0);
}

TEST_F(VehicleMeasure, NeedsAValueThatCanBeRead)
{
    EXPECT_FALSE(measure("00000001", [](std::string const& command, int) -> std::optional<VehicleSaid> {
        return command == "0120" ? std::optional(VehicleSaid{"7E806412000000000"}) : std::nullopt;
    }));
    EXPECT_THAT(findings(), Contains("modules: the first module offers no value to measure by|"));
}

// The replies of one module to requests for its values, each of one byte.
std::string valueLines(char const* module, std::string const& pids)
{
    std::string payload = "41";
    for (std::size_t i = 0; i < pids.size(); i += 2) {
        payload += pids.substr(i, 2) + (pids.substr(i, 2) == "0C"   ? "1AF8"
                                        : pids.substr(i, 2) == "01" ? "00070000"
                                                                    : "50");
    }
    auto const bytes = static_cast<std::uint8_t>(payload.size() / 2);
    if (bytes <= 7) {
        return module + frameDigits({bytes}) + payload;
    }
    std::string lines = module + ("10" + frameDigits({bytes})) + payload.substr(0, 12);
    int number = 1;
    for (std::size_t at = 12; at < payload.size(); at += 14) {
        std::string piece = payload.substr(at, 14);
        piece.resize(14, '0');
        lines += "\r" + (module + ("2" + std::to_string(number++))) + piece;
    }
    return lines;
}

// An adapter that needs some time more without a count than with one, and takes so many values in a request.
Player countingAdapter(std::vector<char const*> const& modules, std::size_t most, int millis = 3)
{
    return [modules, most, millis](std::string const& command, int) -> std::optional<VehicleSaid> {
        if (!command.starts_with("01") || command == "0120") {
            return std::nullopt;
        }
        bool const counted = command.size() % 2 != 0;
        std::string const pids = command.substr(2, (command.size() - 2) / 2 * 2);
        if (pids.size() / 2 > most) {
            return VehicleSaid{"?"};
        }
        std::string lines;
        for (char const* module : modules) {
            lines += (lines.empty() ? "" : "\r") + valueLines(module, pids);
        }
        return VehicleSaid{lines, counted ? 0 : millis};
    };
}

TEST_F(VehicleMeasure, AsksForAsManyValuesAsTheAdapterTakesWithTheirCount)
{
    auto const figures = measureCounting(sixPids, countingAdapter({"7E8"}, 6));
    ASSERT_TRUE(figures);
    EXPECT_EQ(figures->pidsPerRequest, 6U);
    EXPECT_GT(figures->valuesPerSecond, 6.0);
    EXPECT_EQ(timesAsked("0104050D0F0C013"), 20) << "the shortest first; 17 bytes come in three frames";
    EXPECT_GE(figures->minimum, 3.0);

    auto const three = measureCounting(sixPids, countingAdapter({"7E8"}, 3));
    EXPECT_EQ(three->pidsPerRequest, 3U);
    EXPECT_EQ(timesAsked("0104050D1"), 20) << "seven bytes fit in one";
    EXPECT_EQ(timesAsked("0104050D0F0C01"), 1) << "tried once";

    auto const two = measureCounting("98180000", countingAdapter({"7E8"}, 2)); // five values
    EXPECT_EQ(two->pidsPerRequest, 2U);
    EXPECT_EQ(timesAsked("0104051"), 20);
    auto const ofFive = measureCounting("98180000", countingAdapter({"7E8"}, 6));
    EXPECT_EQ(ofFive->pidsPerRequest, 3U) << "which has no six";
}

TEST_F(VehicleMeasure, CountsTheFramesOfAllModules)
{
    auto const figures = measureCounting("1F800000", countingAdapter({"7E8", "7E9", "7EA"}, 6)); // 04 05 06 07 08 09
    ASSERT_TRUE(figures);
    EXPECT_EQ(figures->pidsPerRequest, 6U);
    EXPECT_EQ(timesAsked("01040506070809"
                         "6"),
              20)
        << "thirteen bytes come in two frames";
    EXPECT_EQ(timesAsked("01043"), 1);
    measureCounting("1F800000", countingAdapter({"7E8", "7E9", "7EA", "7EB", "7EC"}, 6));
    EXPECT_EQ(timesAsked("01040506070809"), 22) << "ten frames have no digit";
    measureCounting("981A0000", countingAdapter({"7E8", "7E9", "7EA"}, 6));
    EXPECT_EQ(timesAsked("0104050D0F0C01"
                         "9"),
              20)
        << "nine have one";
}

TEST_F(VehicleMeasure, ACountThatBringsLessOrNothingDoesNotWork)
{
    for (char const* counted : {"NO DATA", "7E8034104", "?"}) {
        auto const figures = measure(sixPids, [&](std::string const& command, int) -> std::optional<VehicleSaid> {
            return command == "0104"    ? std::optional(VehicleSaid{"7E803410480", 1})
                   : command == "01041" ? std::optional(VehicleSaid{counted})
                                        : std::nullopt;
        });
        EXPECT_THAT(figures->countWorks, testing::Optional(false)) << counted;
        EXPECT_EQ(timesAsked("01041"), 1);
    }
}

TEST_F(VehicleMeasure, ARateIsOfRequestsThatAreAnswered)
{
    auto const takesTwo = countingAdapter({"7E8"}, 2, 0);
    auto const rateOf = [&](auto const& fails) {
        auto const figures = measure("18000000", [&](std::string const& command, int times) { // 04 and 05
            bool const rate = command.starts_with("010405");
            bool const one = rate && fails(command == "010405" ? times : 3);
            return one ? std::optional(VehicleSaid{"NO DATA"}) : takesTwo(command, times);
        });
        EXPECT_EQ(figures->pidsPerRequest, 2U);
        return figures->valuesPerSecond;
    };
    EXPECT_GT(rateOf([](int) { return false; }), 0.0);
    EXPECT_EQ(rateOf([](int times) { return times > 2; }), 0.0) << "the first of them alone";
    EXPECT_EQ(rateOf([](int times) { return times == 2; }), 0.0)
        << "all but the first, of which nobody knows what came";
}

TEST_F(VehicleMeasure, EndsWhereTheLinkBreaks)
{
    for (std::string const place : {"0104#5", "0902#1", "0104#21", "0104#22", "01041#1", "010405#1", "rate"}) {
        auto const two = countingAdapter({"7E8"}, 2, 0);
        auto const breaking = [&](std::string const& command, int times) {
            bool const measuring = (command == "0104051" && times == 7) || (command == "010405" && times == 9);
            bool const here = place == "rate" ? measuring : command + "#" + std::to_string(times) == place;
            return here ? std::optional(VehicleSaid{"gone"}) : two(command, times);
        };
        EXPECT_THROW(measure(sixPids, breaking), Error) << place;
        std::string const last = place == "rate" ? "010405" : place.substr(0, place.find('#'));
        EXPECT_THAT(m_asked.back(), testing::StartsWith(last)) << "and nothing more is asked";
    }
}

} // namespace

} // namespace velmora
