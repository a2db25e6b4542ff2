// What a year of readings costs in the database: database_bench FOLDER [ROWS]
//
// Writes 40 sensors at 33 readings a second, one transaction a second, as the watch does; ten million rows unless told
// otherwise, 84 hours of driving. FOLDER should lie in memory (/dev/shm), or each commit waits for the disk. Tells
// bytes a reading, bytes written a second with the write-ahead file's, and how long the last hour of one sensor takes
// to be read.

#include "libvelmora/output/database/sqliteoutput.h"
#include "libvelmora/output/valuetext.h"

#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <filesystem>
#include <fstream>
#include <sched.h>

namespace {

using namespace velmora;

constexpr int sensors = 40;
constexpr int rate = 33; // a second

Reading readingOf(std::int64_t number)
{
    Reading reading;
    reading.time = fromMillis(1772352900000 + number * 1000 / rate);
    reading.vehicle = "van";
    reading.module = 0x7E8;
    reading.sensor = "SENSOR_" + std::to_string(number % sensors);
    reading.value = static_cast<double>(number * 7919 % 65536) / 4.0;
    reading.unit = "rpm";
    return reading;
}

// By all write calls of this process.
long long bytesWritten()
{
    std::ifstream in("/proc/self/io");
    for (std::string word; in >> word;) {
        if (word == "wchar:") {
            long long bytes = 0;
            in >> bytes;
            return bytes;
        }
    }
    return 0;
}

// Before all other programs from now on, if we may: their time is not ours.
bool goFirst()
{
    sched_param priority{};
    priority.sched_priority = 1;
    return ::sched_setscheduler(0, SCHED_FIFO, &priority) == 0;
}

double millisSince(std::chrono::steady_clock::time_point begin)
{
    return std::chrono::duration<double, std::milli>(std::chrono::steady_clock::now() - begin).count();
}

} // namespace

int main(int argc, char** argv)
{
    if (argc < 2) {
        std::fputs("database_bench FOLDER [ROWS]\n", stderr);
        return 2;
    }
    std::int64_t const rows = argc > 2 ? std::atoll(argv[2]) : 10000000;
    std::string const file = std::string(argv[1]) + "/database_bench.db";
    std::filesystem::remove(file);
    SqliteOutput output(parseOutputAddress("sqlite:" + file));
    output.open();
    long long const before = bytesWritten();
    auto const begin = std::chrono::steady_clock::now();
    std::vector<SharedRecord> batch;
    for (std::int64_t number = 0; number < rows; ++number) {
        batch.push_back(std::make_shared<Record const>(readingOf(number)));
        if (batch.size() == rate || number + 1 == rows) {
            output.write(batch);
            batch.clear();
        }
    }
    double const millis = millisSince(begin);
    double const seconds = static_cast<double>(rows) / rate;
    double const perSecond = static_cast<double>(bytesWritten() - before) / seconds;
    output.close();
    auto const size = static_cast<double>(std::filesystem::file_size(file));
    std::printf("%lld rows, %.1f bytes each; %.1f kB written a second; %.0f rows a second\n",
                static_cast<long long>(rows), size / static_cast<double>(rows), perSecond / 1000.0,
                static_cast<double>(rows) / millis * 1000.0);
    bool const alone = goFirst();
    std::printf("the last hour of one sensor%s:\n", alone ? "" : ", beside whatever else runs");
    Database database(file);
    for (int round = 0; round < 10; ++round) {
        auto const start = std::chrono::steady_clock::now();
        std::clock_t const cpu = std::clock();
        Statement select(database,
                         "SELECT time, value FROM reading WHERE time > (SELECT max(time) FROM reading) - 3600000 "
                         "AND sensor = 7");
        int count = 0;
        while (select.next()) {
            ++count;
        }
        double const cpuMillis = static_cast<double>(std::clock() - cpu) * 1000.0 / CLOCKS_PER_SEC;
        std::printf("%d rows in %.1f ms, %.1f of them at work\n", count, millisSince(start), cpuMillis);
    }
    std::filesystem::remove(file);
    return 0;
}
