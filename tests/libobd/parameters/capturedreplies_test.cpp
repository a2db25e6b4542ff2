// The payloads that real cars gave, with what the standard makes of them: tests/dialogues/decoded.txt.

#include "libobd/parameters/calibrationids.h"
#include "libobd/parameters/calibrationverificationnumbers.h"
#include "libobd/parameters/ecuname.h"
#include "libobd/parameters/identificationnumber.h"
#include "libobd/parameters/monitortestresult.h"
#include "tests/libobd/parameters/diagnosticsrig.h"
#include "tests/support/dialogue/dialoguefolder.h"

#include <gtest/gtest.h>

#include <fstream>

namespace {

using namespace obd;
using namespace diagnosticsrig;

struct Row
{
    Bytes request;
    Bytes payload;
    bool legacy; // several lines
    std::string value;
};

// Cells are parted by two or more blanks.
std::vector<std::string> cellsOf(std::string const& line)
{
    std::vector<std::string> cells;
    for (std::size_t start = 0; start < line.size();) {
        std::size_t const end = std::min(line.find("  ", start), line.size());
        cells.push_back(line.substr(start, end - start));
        start = std::min(line.find_first_not_of(' ', end), line.size());
    }
    return cells;
}

std::vector<Row> rowsNamed(std::string const& name)
{
    std::ifstream file(support::dialogueFolder / "decoded.txt");
    std::vector<Row> rows;
    for (std::string line; std::getline(file, line);) {
        std::vector<std::string> cells = cellsOf(line);
        if (line.empty() || line.front() == '#' || cells.size() < 4 || cells[2] != name) {
            continue;
        }
        bool const legacy = cells[1].find('/') != std::string::npos;
        std::replace(cells[1].begin(), cells[1].end(), '/', ' ');
        rows.push_back({support::hexBytes(cells[0]), support::hexBytes(cells[1]), legacy, cells[3]});
    }
    return rows;
}

// Reads each row as its bus delivers it: lines on the legacy buses with and without checksums.
template <typename Parameter, typename Read>
void expectRows(std::string const& name, std::size_t count, Read read)
{
    auto const rows = rowsNamed(name);
    EXPECT_GE(rows.size(), count) << name;
    for (Row const& row : rows) {
        std::vector<std::pair<ObdProtocol, Bytes>> deliveries{{ObdProtocolCan11, row.payload}};
        if (row.legacy) {
            deliveries = {{ObdProtocolIso14230, row.payload},
                          {ObdProtocolIso9141, withChecksums(row.payload)},
                          {ObdProtocolJ1850, withChecksums(row.payload)}};
        }
        for (auto const& [protocol, data] : deliveries) {
            auto const ecu = makeEcu(protocol, 0x10);
            Parameter parameter;
            EXPECT_EQ(requestOf(parameter), row.request);
            ASSERT_TRUE(parameter.setResponseData(ecu, data)) << row.value;
            EXPECT_EQ(read(parameter, ecu), row.value);
        }
    }
}

std::string joined(std::vector<std::string> const& texts)
{
    std::string all;
    for (std::string const& text : texts) {
        all += (all.empty() ? "" : " ") + text;
    }
    return all;
}

TEST(CapturedReplies, Vin)
{
    expectRows<VehicleIdentificationNumber>(
        "Vin", 9, [](auto const& parameter, auto const& ecu) { return parameter.vehicleIdentificationNumber(ecu); });
}

TEST(CapturedReplies, CalibrationId)
{
    expectRows<CalibrationIds>("CalibrationId", 5, [](auto const& parameter, auto const& ecu) {
        return joined(parameter.calibrationIds(ecu));
    });
}

TEST(CapturedReplies, CalibrationVerification)
{
    expectRows<CalibrationVerificationNumbers>(
        "CalibrationVerification", 3,
        [](auto const& parameter, auto const& ecu) { return joined(parameter.verificationNumbers(ecu)); });
}

TEST(CapturedReplies, EcuName)
{
    expectRows<EcuName>("EcuName", 2, [](auto const& parameter, auto const& ecu) {
        return parameter.ecuAcronym(*ecu) + "-" + parameter.description(*ecu);
    });
}

// Their values are worked out in the tests of the class; here every record of every car is read.
TEST(CapturedReplies, TestResult)
{
    auto const rows = rowsNamed("TestResult");
    EXPECT_GE(rows.size(), 5U);
    auto const ecu = makeEcu(ObdProtocolCan11);
    for (Row const& row : rows) {
        MonitorTestResult parameter(row.request.at(1));
        ASSERT_TRUE(parameter.setResponseData(ecu, row.payload)) << row.value;
        auto const monitors = parameter.getItems(*ecu);
        ASSERT_EQ(monitors.size(), 1U);
        EXPECT_EQ(monitors[0]->metricItems.size(), (row.payload.size() - 1) / 9);
        for (auto const& item : monitors[0]->metricItems) {
            EXPECT_NE(item->status(), IMonitorTestItem::Failed) << "none of these cars had a failed test";
        }
    }
}

} // namespace
