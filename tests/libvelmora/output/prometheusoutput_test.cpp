#include "libvelmora/output/metricfamily.h"
#include "libvelmora/output/prometheusoutput.h"
#include "libvelmora/report/unitlabel.h"
#include "tests/support/process/httpclient.h"
#include "tests/support/records.h"
#include "tests/support/temporaryfolder.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <set>
#include <sstream>

namespace {

using testing::HasSubstr;
using testing::Not;
using testsupport::reading;
using velmora::Health;
using velmora::MetricsPage;

velmora::Reading inUnit(std::string const& sensor, double value, std::string const& unit, unsigned int module = 0x7E8)
{
    velmora::Reading result = reading(sensor, value);
    result.unit = unit;
    result.module = module;
    return result;
}

velmora::MetricsPage::SteadyTime const pageStart(std::chrono::hours(100));

Health busyHealth()
{
    Health health;
    health.linkUp = true;
    health.state = "running";
    health.requests = 17;
    velmora::OutputCounts counts;
    counts.dropped = 3;
    velmora::OutputCounts broker;
    broker.state = {false, 118800};
    health.outputs = {{"csv:a.csv", counts}, {"sqlite:\"b\"", counts}, {"mqtt://b/c", broker}};
    return health;
}

// Every unit of the library, on two modules and two vehicles.
MetricsPage fullPage()
{
    MetricsPage page;
    for (int unit = 0; unit <= 68; ++unit) {
        std::string const label = velmora::unitLabel(static_cast<MeasurementUnit>(unit));
        for (unsigned int const module : {0x7E8U, 0x7E9U}) {
            velmora::Reading each = inUnit("SENSOR_" + std::to_string(unit), 1.5, label, module);
            page.take(each, pageStart);
            each.vehicle = "my \"van\"\\\n";
            page.take(each, pageStart);
        }
    }
    page.take(inUnit("FURLONGS", 1.0, "fur/14 nights"), pageStart);
    return page;
}

std::string page()
{
    return fullPage().render(pageStart + std::chrono::milliseconds(2000), busyHealth());
}

TEST(Prometheus, TheToolThatChecksMetricsIsContent)
{
    testsupport::TemporaryFolder const folder;
    std::ofstream(folder.file("page")) << page();
    std::string const command = "promtool check metrics <" + folder.file("page") + " >" + folder.file("out") + " 2>&1";
    EXPECT_EQ(std::system(command.c_str()), 0) << folder.read("out");
    EXPECT_EQ(folder.read("out"), "");
}

TEST(Prometheus, NoSeriesComesTwiceAndNoFamilyInTwoPlaces)
{
    std::set<std::string> series;
    std::set<std::string> families;
    std::string family;
    std::istringstream in(page());
    for (std::string line; std::getline(in, line);) {
        std::string const name = line.substr(0, line.find_first_of("{ "));
        if (line.starts_with("# TYPE ")) {
            std::istringstream words(line);
            words >> family >> family >> family;
            EXPECT_TRUE(families.insert(family).second) << family;
        } else if (!line.starts_with("#")) {
            EXPECT_EQ(name, family) << line;
            EXPECT_TRUE(series.insert(line.substr(0, line.rfind(' '))).second) << line;
        }
    }
    EXPECT_GT(series.size(), 2U * 2U * 60U);
}

TEST(Prometheus, NumbersAreInBaseUnits)
{
    MetricsPage some;
    some.take(inUnit("SPEED", 36.0, "km/h"), pageStart);
    some.take(inUnit("OIL", 212.0, "°F"), pageStart);
    some.take(inUnit("LOAD", 41.0, "%"), pageStart);
    some.take(inUnit("MAP", 101.3, "kPa"), pageStart);
    std::string const text = some.render(pageStart + std::chrono::milliseconds(1500), {});
    std::string const labels = "{vehicle=\"van\",module=\"7E8\",sensor=";
    EXPECT_THAT(text, HasSubstr("velmora_speed_meters_per_second" + labels + "\"SPEED\"} 10\n"));
    EXPECT_THAT(text, HasSubstr("velmora_temperature_celsius" + labels + "\"OIL\"} 100\n"));
    EXPECT_THAT(text, HasSubstr("velmora_share_ratio" + labels + "\"LOAD\"} 0.41\n"));
    EXPECT_THAT(text, HasSubstr("velmora_pressure_pascals" + labels + "\"MAP\"} 101300\n"));
    EXPECT_THAT(text, HasSubstr("velmora_reading_age_seconds" + labels + "\"SPEED\"} 1.5\n"));
}

TEST(Prometheus, WhatIsOldOrWithoutANumberLeavesThePage)
{
    MetricsPage some;
    some.take(inUnit("SPEED", 36.0, "km/h"), pageStart);
    velmora::Reading nothing = inUnit("OLD", 1.0, "km/h");
    some.take(nothing, pageStart);
    nothing.value = {};
    some.take(nothing, pageStart);
    nothing.unit = "Hz"; // of which there was never a number
    some.take(nothing, pageStart);
    EXPECT_THAT(some.render(pageStart + std::chrono::milliseconds(60000), {}), HasSubstr("SPEED"));
    EXPECT_THAT(some.render(pageStart + std::chrono::milliseconds(60000), {}), Not(HasSubstr("OLD")));
    EXPECT_THAT(some.render(pageStart + std::chrono::milliseconds(60001), {}), Not(HasSubstr("SPEED")));
}

TEST(Prometheus, TellsItsOwnHealth)
{
    std::string const text = page();
    EXPECT_THAT(text, HasSubstr("velmora_link_up 1\n"));
    EXPECT_THAT(text, HasSubstr("velmora_requests_total 17\n"));
    EXPECT_THAT(text, HasSubstr("velmora_state_info{state=\"running\"} 1\n"));
    EXPECT_THAT(text, HasSubstr("velmora_output_dropped_total{output=\"csv:a.csv\"} 3\n"));
    EXPECT_THAT(text, HasSubstr("velmora_output_up{output=\"mqtt://b/c\"} 0\n"));
    EXPECT_THAT(text, HasSubstr("velmora_output_spool_records{output=\"mqtt://b/c\"} 118800\n"));
    EXPECT_THAT(text, testing::Not(HasSubstr("velmora_output_up{output=\"csv")));
    EXPECT_THAT(text, HasSubstr("velmora_output_dropped_total{output=\"sqlite:\\\"b\\\"\"} 3\n"));
}

TEST(Prometheus, HasALineForAllThatAWatchCounts)
{
    Health health;
    health.state = "a\"b";
    health.requests = 1;
    health.errors = 2;
    health.linkLosses = 3;
    health.wakeRequests = 4;
    velmora::OutputCounts counts;
    counts.queued = 5;
    counts.written = 6;
    counts.dropped = 7;
    counts.failures = 8;
    counts.failing = true;
    counts.state = {true, 9};
    health.outputs = {{"o", counts}};
    MetricsPage some;
    some.take(inUnit("SPEED", 36.0, "km/h"), pageStart + std::chrono::milliseconds(500));
    some.take(inUnit("RPM", 800.0, "rpm"), pageStart);
    std::string lines;
    std::istringstream in(some.render(pageStart, health));
    for (std::string line; std::getline(in, line);) {
        lines += line.starts_with('#') || line.starts_with("velmora_build_info") ? "" : line + "\n";
    }
    EXPECT_EQ(lines, "velmora_state_info{state=\"a\\\"b\"} 1\n"
                     "velmora_link_up 0\n"
                     "velmora_requests_total 1\n"
                     "velmora_errors_total 2\n"
                     "velmora_link_losses_total 3\n"
                     "velmora_wake_requests_total 4\n"
                     "velmora_output_queue_records{output=\"o\"} 5\n"
                     "velmora_output_written_total{output=\"o\"} 6\n"
                     "velmora_output_dropped_total{output=\"o\"} 7\n"
                     "velmora_output_failures_total{output=\"o\"} 8\n"
                     "velmora_output_failing{output=\"o\"} 1\n"
                     "velmora_output_up{output=\"o\"} 1\n"
                     "velmora_output_spool_records{output=\"o\"} 9\n"
                     "velmora_rotation_revolutions_per_minute{vehicle=\"van\",module=\"7E8\",sensor=\"RPM\"} 800\n"
                     "velmora_speed_meters_per_second{vehicle=\"van\",module=\"7E8\",sensor=\"SPEED\"} 10\n"
                     "velmora_reading_age_seconds{vehicle=\"van\",module=\"7E8\",sensor=\"RPM\"} 0\n"
                     "velmora_reading_age_seconds{vehicle=\"van\",module=\"7E8\",sensor=\"SPEED\"} 0\n");
}

TEST(Prometheus, ServesThePage)
{
    velmora::PrometheusOutput output(velmora::parseOutputAddress("prometheus:127.0.0.1:0"), busyHealth);
    output.open();
    velmora::Reading now = inUnit("SPEED", 36.0, "km/h");
    now.time = std::chrono::system_clock::now();
    output.write(testsupport::records(now));
    std::string const reply = testsupport::httpGet(output.port(), "/metrics");
    EXPECT_THAT(reply, HasSubstr("Content-Type: text/plain; version=0.0.4; charset=utf-8\r\n"));
    EXPECT_THAT(reply, HasSubstr("sensor=\"SPEED\"} 10\n"));
    unsigned short const port = output.port();
    output.close();
    EXPECT_EQ(testsupport::httpGet(port, "/metrics"), "") << "nobody listens any more";
}

} // namespace
