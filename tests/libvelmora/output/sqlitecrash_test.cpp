#include "libvelmora/output/database/sqliteoutput.h"
#include "tests/support/process/smalldisk.h"
#include "tests/support/records.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

#include <csignal>
#include <fcntl.h>
#include <random>
#include <sys/wait.h>
#include <unistd.h>

namespace {

using testsupport::march;
using testsupport::reading;
using testsupport::TemporaryFolder;
using velmora::Database;
using velmora::SqliteOutput;

constexpr int batchSize = 33;

std::vector<velmora::SharedRecord> batchOf(int number)
{
    std::vector<velmora::SharedRecord> batch;
    for (int i = 0; i < batchSize; ++i) {
        std::string const sensor = "SENSOR_" + std::to_string(i);
        batch.push_back(std::make_shared<velmora::Record const>(reading(sensor, 0.5 * i, march + 1000LL * number)));
    }
    return batch;
}

// Writes one batch after the other and tells each on the pipe as soon as it is committed, until it is killed.
[[noreturn]] void writeForever(std::string const& file, int pipe)
{
    SqliteOutput output(velmora::parseOutputAddress("sqlite:" + file + "?ballast=4k"));
    output.open();
    for (int number = 0;; ++number) {
        output.write(batchOf(number));
        if (::write(pipe, "x", 1) != 1) {
            ::_exit(1);
        }
    }
}

int killAfter(std::string const& file, int commits, unsigned int microseconds)
{
    int ends[2];
    EXPECT_EQ(::pipe(ends), 0);
    pid_t const child = ::fork();
    if (child == 0) {
        writeForever(file, ends[1]);
    }
    ::close(ends[1]);
    char told = 0;
    int acknowledged = 0;
    while (acknowledged < commits && ::read(ends[0], &told, 1) == 1) {
        ++acknowledged;
    }
    ::usleep(microseconds);
    ::kill(child, SIGKILL);
    while (::read(ends[0], &told, 1) == 1) {
        ++acknowledged;
    }
    ::close(ends[0]);
    int status = 0;
    ::waitpid(child, &status, 0);
    EXPECT_TRUE(WIFSIGNALED(status));
    return acknowledged;
}

TEST(SqliteCrash, KilledAtAnyMomentItLosesNothingThatWasCommitted)
{
    std::mt19937 random(19);
    for (int round = 0; round < 50; ++round) {
        TemporaryFolder const folder("/dev/shm"); // the kernel keeps what a killed program wrote, on any file system
        int const commits = static_cast<int>(random() % 8);
        int const acknowledged = killAfter(folder.file("a.db"), commits, static_cast<unsigned int>(random() % 3000));
        Database database(folder.file("a.db"));
        velmora::Statement check(database, "PRAGMA integrity_check");
        ASSERT_TRUE(check.next());
        EXPECT_EQ(check.text(0), "ok");
        check.reset();
        if (acknowledged > 0) {
            std::int64_t const rows = database.number("SELECT count(*) FROM reading");
            EXPECT_EQ(rows % batchSize, 0) << "half a batch";
            EXPECT_GE(rows / batchSize, acknowledged);
            EXPECT_LE(rows / batchSize, acknowledged + 1);
        }
    }
}

// In a name space of its own, where a small disk can be mounted without rights. Tells how it went by its exit code.
enum DiskResult : int
{
    Fine = 0,
    NoMount = 10,
    NeverFull,
    NotWhole,
    NotRecovered,
    BallastKept
};

int fillDisk(std::string const& folder)
{
    if (!testsupport::mountSmallDisk(folder, 2)) {
        return NoMount;
    }
    SqliteOutput output(velmora::parseOutputAddress("sqlite:" + folder + "/a.db?ballast=256k"));
    output.open();
    int number = 0;
    try {
        for (; number < 10000; ++number) {
            output.write(batchOf(number));
        }
        return NeverFull;
    } catch (velmora::Error const&) {
        if (std::filesystem::exists(folder + "/a.db-ballast")) {
            return BallastKept;
        }
    }
    if (output.database().number("SELECT count(*) FROM reading") != std::int64_t{number} * batchSize) {
        return NotWhole;
    }
    try {
        output.write(batchOf(number)); // the ballast has made room
        output.database().execute("DELETE FROM reading WHERE time < " + std::to_string(march + 1000LL * number / 2));
        output.close();
    } catch (velmora::Error const&) {
        return NotRecovered;
    }
    Database database(folder + "/a.db");
    velmora::Statement check(database, "PRAGMA integrity_check");
    return check.next() && check.text(0) == "ok" ? Fine : NotWhole;
}

TEST(SqliteCrash, AFullDiskGivesTheBallastAndGoesOn)
{
    TemporaryFolder const folder;
    pid_t const child = ::fork();
    if (child == 0) {
        ::_exit(fillDisk(folder.path().string()));
    }
    int status = 0;
    ::waitpid(child, &status, 0);
    ASSERT_TRUE(WIFEXITED(status));
    if (WEXITSTATUS(status) == NoMount) {
        GTEST_SKIP() << "a disk of its own can't be mounted here; AFullDatabase stands for it";
    }
    EXPECT_EQ(WEXITSTATUS(status), Fine);
}

TEST(SqliteCrash, AFullDatabaseKeepsWhatWasCommitted)
{
    TemporaryFolder const folder;
    SqliteOutput output(velmora::parseOutputAddress("sqlite:" + folder.file("a.db") + "?ballast=64k"));
    output.open();
    output.database().execute("PRAGMA max_page_count=40");
    int number = 0;
    auto const writeAll = [&] {
        for (; number < 10000; ++number) {
            output.write(batchOf(number));
        }
    };
    EXPECT_THROW(writeAll(), velmora::Error);
    EXPECT_TRUE(output.database().isFull());
    EXPECT_FALSE(std::filesystem::exists(folder.file("a.db-ballast")));
    EXPECT_EQ(output.database().number("SELECT count(*) FROM reading"), std::int64_t{number} * batchSize);
    output.database().execute("PRAGMA max_page_count=4000");
    output.write(batchOf(number));
    EXPECT_TRUE(std::filesystem::exists(folder.file("a.db-ballast")));
    EXPECT_EQ(output.database().number("SELECT count(*) FROM reading"), std::int64_t{number + 1} * batchSize);
}

// What the next test runs under strace.
TEST(SqliteCrash, DISABLED_TenCommits)
{
    TemporaryFolder const folder;
    SqliteOutput output(velmora::parseOutputAddress("sqlite:" + folder.file("a.db")));
    output.open();
    for (int number = 0; number < 10; ++number) {
        EXPECT_EQ(::write(-1, "commit", 6), -1); // a mark in the trace
        output.write(batchOf(number));
    }
    EXPECT_EQ(::write(-1, "end", 3), -1);
}

TEST(SqliteCrash, EachCommitIsFollowedByASync)
{
    TemporaryFolder const folder;
    std::string const self = std::filesystem::read_symlink("/proc/self/exe").string();
    std::string const command = "ASAN_OPTIONS=detect_leaks=0 strace -f -e trace=write,fdatasync,fsync -o " +
                                folder.file("trace") + " " + self +
                                " --gtest_also_run_disabled_tests --gtest_filter=SqliteCrash.DISABLED_TenCommits "
                                ">/dev/null 2>&1";
    ASSERT_EQ(std::system(command.c_str()), 0) << "strace is needed, and the right to trace";
    std::ifstream in(folder.file("trace"));
    int commits = -1;
    int syncs = 0;
    for (std::string line; std::getline(in, line) && line.find("write(-1, \"end\"") == std::string::npos;) {
        if (line.find("write(-1, \"commit\"") != std::string::npos) {
            EXPECT_TRUE(commits < 0 || syncs >= 1) << "commit " << commits << " did not reach the disk";
            ++commits;
            syncs = 0;
        }
        syncs += line.find("sync(") != std::string::npos ? 1 : 0;
    }
    EXPECT_EQ(commits, 9);
    EXPECT_GE(syncs, 1);
}

} // namespace
