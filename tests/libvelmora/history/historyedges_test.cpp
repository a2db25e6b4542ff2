// What a history takes and refuses at its edges, and what its file is.
#include "libvelmora/history/scanjson.h"
#include "libvelmora/output/database/database.h"
#include "tests/libvelmora/report/carbuilder.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>
#include <velmora/history.h>

#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <optional>
#include <sstream>

namespace {

using namespace velmora;
using namespace testsupport;
using namespace std::chrono_literals;

KeptScan edgeScan(std::string const& vehicle, std::chrono::milliseconds time = 0ms)
{
    return makeScan(vehicleOf({soundModule()}), vehicle, std::chrono::sys_time<std::chrono::milliseconds>(time), "9.9");
}

// The text of the error of an import; empty if there is none.
std::string importOf(History& history, std::string const& lines)
{
    std::istringstream in(lines);
    try {
        history.importFrom(in);
    } catch (Error const& error) {
        return error.what();
    }
    return {};
}

TEST(HistoryEdges, LinesAreOfSixteenMegabytesAtMost)
{
    TemporaryFolder const folder;
    History history(folder.file("history.db"), History::Access::Keep);
    std::string const nothing = ". Nothing was imported";
    std::string line(std::size_t{16} << 20, 'x');
    EXPECT_EQ(importOf(history, line), "Line 1: This is no line of an exported history: it is no JSON" + nothing);
    EXPECT_EQ(importOf(history, "\n" + line + "x"), "Line 2: too long" + nothing);
    EXPECT_EQ(importOf(history, "\n\n"), "");
}

// A name alone is a file of the current folder; without one there is nowhere to keep anything.
TEST(HistoryEdges, KeepsBesideTheProgramUnderANameAlone)
{
    TemporaryFolder const folder;
    std::filesystem::path const before = std::filesystem::current_path();
    std::filesystem::path const gone = folder.path() / "gone";
    std::filesystem::create_directory(gone);
    std::filesystem::current_path(folder.path());
    std::optional<std::int64_t> const number = History("bare.db", History::Access::Keep).add(edgeScan("golf"));
    std::filesystem::current_path(gone);
    std::filesystem::remove(gone);
    EXPECT_THROW(History("bare.db", History::Access::Keep), Error) << "the folder is gone";
    std::filesystem::current_path(before);
    EXPECT_EQ(number, 1);
    EXPECT_TRUE(std::filesystem::exists(folder.path() / "bare.db"));
    EXPECT_THROW(History("", History::Access::Keep), Error);
}

TEST(HistoryEdges, TakesItsOwnDatabaseAlone)
{
    TemporaryFolder const folder;
    std::string const file = folder.file("history.db");
    {
        History(file, History::Access::Keep).add(edgeScan("golf"));
    }
    {
        Database database(file);
        EXPECT_EQ(database.number("PRAGMA application_id"), 0x766C6D68) << "as it is told to other programs";
        EXPECT_EQ(database.number("PRAGMA user_version"), 1);
        database.execute("PRAGMA user_version=2");
    }
    auto const why = [&file] {
        try {
            History(file, History::Access::Look);
        } catch (Error const& error) {
            return std::string(error.what()).substr(file.size());
        }
        return std::string();
    };
    EXPECT_EQ(why(), " was made by another version of this program");
    {
        Database database(file);
        database.execute("PRAGMA user_version=1");
        database.execute("PRAGMA application_id=1");
    }
    EXPECT_EQ(why(), " is the database of another program");
}

TEST(HistoryEdges, LookingWhereNothingIsFindsNothing)
{
    TemporaryFolder const folder;
    History const missing(folder.file("none.db"), History::Access::Look);
    EXPECT_THROW(missing.scan(1), Error);
    std::ostringstream out;
    EXPECT_EQ(missing.exportTo(out), 0U);
    EXPECT_EQ(out.str(), "");
    History history(folder.file("history.db"), History::Access::Keep);
    history.add(edgeScan("golf"));
    out.setstate(std::ios::badbit);
    EXPECT_THROW(history.exportTo(out), Error) << "a full disk, perhaps";
    EXPECT_EQ(History(folder.file("history.db"), History::Access::Look).scans("golf").size(), 1U);
}

TEST(HistoryEdges, ForgetsAtOnceAndGivesTheRoomBack)
{
    TemporaryFolder const folder;
    History history(folder.file("history.db"), History::Access::Keep);
    history.add(edgeScan("golf"));
    for (int i = 0; i < 30; ++i) {
        history.add(edgeScan("secret", std::chrono::milliseconds(i)));
    }
    EXPECT_EQ(history.forget("secret"), 30U);
    for (char const* const name : {"history.db", "history.db-wal"}) {
        EXPECT_EQ(folder.read(name).find("secret"), std::string::npos) << name << ", while it is open";
    }
    EXPECT_LT(std::filesystem::file_size(folder.file("history.db")), 33000U);
}

TEST(HistoryEdges, StandsWhereTheUserSays)
{
    char const* const name = "VELMORA_HISTORY";
    char const* const before = std::getenv(name);
    std::optional<std::string> const kept = before != nullptr ? std::optional<std::string>(before) : std::nullopt;
    ::setenv(name, "/some/where.db", 1);
    EXPECT_EQ(History::defaultFile(), "/some/where.db");
    ::setenv(name, "", 1);
    std::string const usual = History::defaultFile();
    EXPECT_TRUE(usual.ends_with("/history.db")) << usual;
    ::unsetenv(name);
    EXPECT_EQ(History::defaultFile(), usual);
    if (kept) {
        ::setenv(name, kept->c_str(), 1);
    }
}

std::string lineWith(std::string const& member)
{
    std::string const line = toLine(edgeScan("golf"));
    return line.substr(0, line.size() - 2) + "," + member + "}\n";
}

TEST(KeptScanEdges, LinesAreNestedNoDeeperThanReportsMayBe)
{
    auto const taken = [](std::size_t depth) {
        try {
            return parseLine(lineWith("\"x\":" + std::string(depth, '[') + std::string(depth, ']'))).number == 0;
        } catch (Error const&) {
            return false;
        }
    };
    EXPECT_TRUE(taken(20));
    EXPECT_FALSE(taken(21));
}

TEST(KeptScanEdges, ALineHoldsAReportWhateverItsHash)
{
    KeptScan scan = edgeScan("golf");
    scan.document = R"({"adapter":{}})";
    scan.hash = hashOf(scan.document);
    EXPECT_THROW(parseLine(toLine(scan)), Error);
    scan.document = "\"\u00E9\"";
    scan.hash = hashOf(scan.document);
    EXPECT_NE(toLine(scan).find("\"report\":\"\u00E9\""), std::string::npos) << "letters stay as they are";
}

TEST(KeptScanEdges, KeepTheirTimeToTheMillisecond)
{
    KeptScan const scan = edgeScan("golf", 1777629600123ms + 1h + 2min + 3s);
    KeptScan const parsed = parseLine(toLine(scan));
    EXPECT_EQ(timeText(parsed.time), "2026-05-01T11:02:03.123Z");
    EXPECT_EQ(parsed.time, scan.time);
    EXPECT_EQ(parsed.program, "9.9");
    EXPECT_EQ(parsed.vehicle, "golf");
    EXPECT_EQ(parsed.hash, scan.hash);
}

TEST(KeptScanEdges, TellALampThatIsOff)
{
    ModuleReport silent = soundModule(0x7E9);
    silent.codes.lamp.reset();
    auto const lampOf = [&silent](std::optional<bool> lamp) {
        ModuleReport module = soundModule();
        module.codes.lamp = lamp;
        return factsOf(makeScan(vehicleOf({module, silent, soundModule(0x7EA)}), "golf", {}, "1")).lamp;
    };
    EXPECT_EQ(lampOf(false), false);
    EXPECT_EQ(lampOf(true), true) << "on in one, off in another";
    EXPECT_EQ(factsOf(makeScan(vehicleOf({silent}), "golf", {}, "1")).lamp, std::nullopt);
}

TEST(VehicleKeys, TellVehiclesApartByFnv)
{
    EXPECT_EQ(vehicleKey("foobar"), "vehicle-85944171f73967e8");
    EXPECT_EQ(vehicleKey(""), "vehicle-cbf29ce484222325");
}

// What one scan tells and the other does not is no change.
TEST(ChangeEdges, AreOnlyOfWhatBothTold)
{
    auto const kindsOf = [](ModuleReport const& older, ModuleReport const& newer) {
        std::string text;
        for (Change const& each : changesBetween(vehicleOf({older}), vehicleOf({newer}))) {
            text += each.kind + " ";
        }
        return text;
    };
    ModuleReport const bare = soundModule();
    ModuleReport told = soundModule();
    told.info.vin = "1M8GDM9AXKP042788";
    told.info.calibrations = {{"A", "1"}};
    told.readiness.monitors.push_back({"Heated Catalyst", ReadinessStatus::Complete, {}});
    setValue(told, 0x31, {5});
    EXPECT_EQ(kindsOf(bare, told), "");
    EXPECT_EQ(kindsOf(told, bare), "");
    EXPECT_EQ(kindsOf(told, told), "");
    ModuleReport lamp = soundModule();
    lamp.codes.lamp.reset();
    EXPECT_EQ(kindsOf(lamp, bare), "");
    EXPECT_EQ(kindsOf(bare, lamp), "");

    auto const tested = [](std::string const& value, LimitTest::Verdict verdict) {
        ModuleReport module = soundModule();
        LimitTest const test{0x80, "A", value, "", "", "V", verdict};
        LimitTest const same{0x80, "A", "7", "", "", "V", LimitTest::Verdict::Passed};
        module.monitors = {TopicAnswer::Read, {{0x21, "Catalyst", {same, same, test}}}};
        return module;
    };
    using enum LimitTest::Verdict;
    EXPECT_EQ(kindsOf(tested("0", NoResult), tested("1", Passed)), "") << "the first result";
    std::vector<Change> const third =
        changesBetween(vehicleOf({tested("1", Passed)}), vehicleOf({tested("2", Passed)}));
    ASSERT_EQ(third.size(), 1U);
    EXPECT_EQ(third[0].name, "Catalyst, 80 A (3)");
}

} // namespace
