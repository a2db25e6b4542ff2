#include "libvelmora/history/scanjson.h"
#include "libvelmora/output/database/database.h"
#include "tests/libvelmora/report/carbuilder.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>
#include <velmora/history.h>

#include <gtest/gtest.h>

#include <latch>
#include <sstream>
#include <sys/stat.h>
#include <thread>

namespace {

using namespace velmora;
using namespace testsupport;
using namespace std::chrono_literals;
using std::chrono::milliseconds;
using std::chrono::sys_time;

constexpr sys_time<milliseconds> firstTime{milliseconds(1777629600123)};

KeptScan scanOf(std::string const& vin, milliseconds later = {})
{
    ModuleReport module = soundModule();
    module.info.vin = vin;
    return makeScan(vehicleOf({module}), "golf", firstTime + later, "9.9");
}

constexpr char const* american = "1M8GDM9AXKP042788";
constexpr char const* german = "WVWZZZ1JZXW000001";

class HistoryTest : public testing::Test
{
protected:
    History open(char const* name = "history.db") const { return History(m_folder.file(name), History::Access::Keep); }

    TemporaryFolder const m_folder;
};

TEST_F(HistoryTest, KeepsScansByVehicleAndSkipsDoubles)
{
    History history = open("deep/in/history.db");
    EXPECT_EQ(history.add(scanOf(american, 10s)), 1);
    EXPECT_EQ(history.add(scanOf(american, 10s)), std::nullopt);
    EXPECT_EQ(history.add(scanOf(american, 5s)), 2);
    EXPECT_EQ(history.add(scanOf("", 1s)), 3);
    std::vector<KeptScan> const all = history.scans();
    ASSERT_EQ(all.size(), 3U);
    EXPECT_EQ(all[0].vehicle, "golf");
    EXPECT_EQ(all[1].number, 2) << "the oldest first";
    EXPECT_EQ(history.scans(american).size(), 2U);
    EXPECT_EQ(history.scan(2).time, firstTime + 5s);
    EXPECT_EQ(history.scan(2).program, "9.9");
    EXPECT_EQ(history.scan(2).hash, scanOf(american).hash);
    EXPECT_EQ(history.scan(2).document, scanOf(american).document);
    EXPECT_EQ(reportOf(history.scan(2)).toJson(), reportOf(scanOf(american, 5s)).toJson());
    EXPECT_THROW(history.scan(4), Error);
}

TEST_F(HistoryTest, SomeThatBeginItAtOnceShareIt)
{
    constexpr int programs = 4;
    for (char const* name : {"first.db", "second.db"}) {
        std::latch begin(programs);
        std::vector<std::jthread> threads;
        for (int number = 0; number < programs; ++number) {
            threads.emplace_back([&, number] {
                begin.arrive_and_wait();
                try {
                    open(name).add(scanOf(american, std::chrono::seconds(number)));
                } catch (Error const& error) {
                    ADD_FAILURE() << error.what();
                }
            });
        }
        threads.clear();
        EXPECT_EQ(open(name).scans().size(), static_cast<std::size_t>(programs));
    }
}

TEST_F(HistoryTest, IsForItsOwnerOnly)
{
    History history = open();
    history.add(scanOf(german));
    for (char const* const name : {"history.db", "history.db-wal"}) {
        struct stat status = {};
        ASSERT_EQ(::stat(m_folder.file(name).c_str(), &status), 0) << name;
        EXPECT_EQ(status.st_mode & 0777, 0600U) << name;
    }
}

TEST_F(HistoryTest, ForgetsAVehicleSoThatNothingIsLeftInTheFile)
{
    {
        History history = open();
        history.add(scanOf(american));
        history.add(scanOf(german));
        history.add(scanOf(german, 5s));
        EXPECT_EQ(history.forget(german), 2U);
        EXPECT_EQ(history.scans().size(), 1U);
        EXPECT_THROW(history.forget(german), Error);
        EXPECT_EQ(history.add(scanOf(german)), 4) << "a number that was told is not used again";
        history.forget(german);
    }
    for (char const* const name : {"history.db", "history.db-wal"}) {
        EXPECT_EQ(m_folder.read(name).find(german), std::string::npos) << name;
    }
    EXPECT_NE(m_folder.read("history.db").find(american), std::string::npos);
}

TEST_F(HistoryTest, ExportsAndImportsTheSame)
{
    History first = open("first.db");
    first.add(scanOf(american));
    first.add(scanOf(german, 5s));
    first.add(scanOf("", 7s));
    std::ostringstream out;
    EXPECT_EQ(first.exportTo(out), 3U);
    History second = open("second.db");
    second.add(scanOf(german, 5s));
    std::istringstream in(out.str());
    History::Imported const result = second.importFrom(in);
    EXPECT_EQ(result.added, 2U);
    EXPECT_EQ(result.known, 1U);
    std::ostringstream again;
    second.exportTo(again);
    EXPECT_EQ(again.str(), out.str());
}

TEST_F(HistoryTest, ImportsAllOrNothing)
{
    History history = open();
    std::string const good = toLine(scanOf(american));
    std::istringstream in(good + "\n" + "{}\n");
    try {
        history.importFrom(in);
        FAIL();
    } catch (Error const& error) {
        EXPECT_NE(std::string(error.what()).find("Line 3"), std::string::npos) << error.what();
    }
    EXPECT_TRUE(history.scans().empty());
}

TEST_F(HistoryTest, RefusesAnotherProgramsDatabase)
{
    {
        Database other(m_folder.file("other.db"));
        other.execute("CREATE TABLE x (y)");
    }
    EXPECT_THROW(open("other.db"), Error);
    History const missing(m_folder.file("missing.db"), History::Access::Look);
    EXPECT_TRUE(missing.scans().empty());
    EXPECT_THROW(open(("x/" + std::string(300, 'x')).c_str()), Error) << "a place that can't be looked at";
    EXPECT_THROW(History(m_folder.file(std::string(300, 'x')), History::Access::Look), Error);
    EXPECT_FALSE(std::filesystem::exists(m_folder.file("missing.db"))) << "looking makes no file";
}

TEST(KeptScanLine, RefusesWhatWasChanged)
{
    std::string const line = toLine(scanOf(american));
    EXPECT_EQ(toLine(parseLine(line)), line);
    auto const changed = [&line](std::string const& from, std::string const& to) {
        std::string text = line;
        std::size_t const place = text.find(from);
        EXPECT_NE(place, std::string::npos) << from;
        return text.replace(place, from.size(), to);
    };
    for (std::string const& wrong :
         {std::string(), std::string("[]"), std::string("{"), changed("13.8", "13.9"),
          changed("\"version\":1", "\"version\":2"), changed("2026-", "2026/"), changed("T10", "T25"),
          changed("\"velmora\"", "\"other\""), changed("\"vehicle\":\"1M8GDM9AXKP042788\"", "\"vehicle\":\"\""),
          changed("\"report\"", "\"repart\"")}) {
        EXPECT_THROW(parseLine(wrong), Error) << wrong.substr(0, 100);
    }
    EXPECT_THROW(parseLine(std::string(1000000, '[')), Error) << "nested without end";
}

TEST(KeptScanLine, SaysWhatIsWrongWithIt)
{
    std::string const line = toLine(scanOf(american));
    auto const why = [&line](std::string const& from, std::string const& to) {
        std::string text = line;
        try {
            parseLine(from.empty() ? to : text.replace(text.find(from), from.size(), to));
        } catch (Error const& error) {
            return std::string(error.what());
        }
        return std::string();
    };
    std::string const no = "This is no line of an exported history: ";
    std::string const name = "\"vehicle\":\"1M8GDM9AXKP042788\"";
    EXPECT_EQ(why("", "{"), no + "it is no JSON");
    EXPECT_EQ(why("\"version\":1", "\"version\":0"), no + "it is of another kind or version");
    EXPECT_EQ(why("\"scan\"", "\"other\""), no + "it is of another kind or version");
    EXPECT_EQ(why("13.8", "13.9"), no + "its report was changed since it was written");
    EXPECT_EQ(why(name, "\"vehicle\":\"\""), no + "its vehicle has no name, or too long a one");
    EXPECT_EQ(why(name, "\"vehicle\":\"" + std::string(101, 'x') + "\""),
              no + "its vehicle has no name, or too long a one");
    EXPECT_EQ(why(name, "\"vehicle\":\"" + std::string(100, 'x') + "\""), "");
    std::string const time = "2026-05-01T10:00:00.123Z";
    for (char const* const good : {"2024-02-29T23:59:59.999Z", "0001-01-01T00:00:00.000Z"}) {
        EXPECT_EQ(why(time, good), "") << good;
    }
    for (char const* const odd : {"2026-05-01T24:00:00.123Z", "2026-05-01T10:60:00.123Z", "2026-05-01T10:00:60.123Z",
                                  "2026-02-29T10:00:00.123Z", "2026/05-01T10:00:00.123Z", "2026-05/01T10:00:00.123Z",
                                  "2026-05-01 10:00:00.123Z", "2026-05-01T10.00:00.123Z", "2026-05-01T10:00.00.123Z",
                                  "2026-05-01T10:00:00,123Z", "2026-05-01T10:00:00.123z", "2026-05-01T10:00:00.123",
                                  "2026-05-01T-1:00:00.123Z", "2026-05-01T10:00:00.1x3Z", "2026-13-01T10:00:00.123Z"}) {
        EXPECT_EQ(why(time, odd), no + "\"" + odd + "\" is no time like 1970-01-01T00:00:00.000Z") << odd;
    }
    EXPECT_EQ(hashOf("foobar"), "85944171f73967e8") << "FNV-1a";
    EXPECT_NE(why("", std::string(21, '[') + std::string(21, ']')), "") << "deeper than any report";
}

TEST(KeptScanLine, GoesByTheFirstRealVinElseByTheName)
{
    ModuleReport first = soundModule();
    ModuleReport second = soundModule(0x7E9);
    first.info.vin = "00000000000000000";
    second.info.vin = american;
    EXPECT_EQ(makeScan(vehicleOf({first, second}), "golf", firstTime, "1").vehicle, american);
    EXPECT_EQ(makeScan(vehicleOf({first}), "golf", firstTime, "1").vehicle, "golf");
    EXPECT_THROW(makeScan(vehicleOf({first}), "", firstTime, "1"), Error);
    EXPECT_EQ(makeScan(vehicleOf({first}), "golf", firstTime, "1").number, 0) << "the history numbers it";
    EXPECT_EQ(timeText(firstTime), "2026-05-01T10:00:00.123Z");
}

TEST(KeptScan, AreListedUnderTheirVehicles)
{
    EXPECT_EQ(toText(std::vector<KeptScan>(), {}), "Nothing is kept yet; velmora scan --history keeps a scan\n");
    KeptScan first = scanOf(american);
    KeptScan second = scanOf(german, 1s);
    KeptScan third = scanOf(american, 2s);
    first.number = 1;
    second.number = 2;
    third.number = 30;
    std::istringstream lines(toText({first, second, third}, {}));
    std::vector<std::string> words;
    for (std::string line; std::getline(lines, line);) {
        std::istringstream rest(line);
        std::string word;
        rest >> word;
        words.push_back(word);
    }
    EXPECT_EQ(words, (std::vector<std::string>{american, "1", "30", "", german, "2"}));
}

TEST(KeptScan, TellsLampAndCodesForLists)
{
    ModuleReport module = soundModule();
    module.codes.lamp.reset();
    EXPECT_EQ(factsOf(makeScan(vehicleOf({module}), "golf", firstTime, "1")).lamp, std::nullopt);
    module.codes.lists[0] = readCodes(CodeKind::Confirmed, {"P0420", "P0300"});
    module.codes.lists[1] = readCodes(CodeKind::Pending, {"P0171"});
    module.codes.lists[2] = readCodes(CodeKind::Permanent, {"P0420"});
    ModuleReport second = soundModule(0x7E9);
    second.codes.lamp = true;
    KeptScan const scan = makeScan(vehicleOf({module, second}), "golf", firstTime, "1");
    ScanFacts const facts = factsOf(scan);
    EXPECT_EQ(facts.lamp, true);
    EXPECT_EQ(facts.codes, (std::vector<std::string>{"P0420", "P0300"}));
    EXPECT_EQ(facts.modules, 2U);
    Json const json = Json::parse(toJson(scan));
    EXPECT_EQ(json["lamp"], true);
    EXPECT_EQ(json["codes"], Json({"P0420", "P0300"}));
    EXPECT_FALSE(json.contains("report"));
}

} // namespace
