// A drive of the simulated cars, recorded for all sensors as `velmora live all --csv` does, in the adapter's time; read
// back as a spreadsheet would, and held against the drive model.

#include "libobd/powertrain/torque.h"
#include "libvelmora/live/livesensors.h"
#include "program/view/live/livecsv.h"
#include "simulator/car/vehiclelibrary.h"
#include "simulator/simulation.h"
#include "tests/endtoend/driveclock.h"
#include "tests/endtoend/drivecolumns.h"
#include "tests/endtoend/recordeddrive.h"
#include "tests/support/dispatchloop.h"
#include "tests/support/logcapture.h"
#include "tests/support/memorysettings.h"
#include "tests/support/temporaryfolder.h"

#include <obd/iconnectionmanager.h>
#include <obd/iobdvelmora.h>
#include <obd/isensorservice.h>
#include <obd/ivelmorasettings.h>
#include <obd/obdvelmorabuilder.h>
#include <obd/parameterdescriptor.h>
#include <obd/sensorinfo.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>

namespace {

using obdsim::DriveState;
using obdsim::Time;
using velmora::cli::LiveTime;

constexpr Time recordingStep = std::chrono::seconds(10);

// In memory if there is such a place: a recording is synchronised with the disk twice a second of the drive.
std::filesystem::path folder()
{
    std::filesystem::path const memory = "/dev/shm";
    return std::filesystem::exists(memory) ? memory : std::filesystem::temp_directory_path();
}

constexpr Time driven = std::chrono::seconds(130); // a whole cycle: idle, cruise, stop

// What `live --csv` does with the readings, with the adapter's clock in the place of the machine's.
class Recording : public tervex::Observer<obd::ISensorServiceObserver>
{
public:
    Recording(obd::ISensorService& service, RequestWindows& windows, std::string const& file)
        : m_windows(windows), m_csv(file)
    {
        velmora::cli::LiveTable::Parameters parameters;
        for (auto const& each : service.getDescriptors()) {
            parameters.push_back(velmora::liveSensors(*each, *each, 0, std::nullopt, velmora::Units::Metric));
        }
        m_table.select(parameters);
        m_latest.resize(m_table.rows().size());
        m_csv.begin(m_table, LiveTime(), velmora::cli::LiveCsv::WallTime());
    }

    void onSensorUpdated(bool /*success*/, std::shared_ptr<obd::ParameterDescriptor> const& descriptor,
                         std::vector<std::shared_ptr<obd::SensorValueDataModel>> const& values) override
    {
        RequestWindow const window = m_windows.take();
        expectRequestOf(descriptor->pid(), window);
        for (std::size_t i = 0; i < m_table.rows().size(); ++i) {
            if (obd::Uid2Pid(m_table.rows()[i].uid) == descriptor->pid()) {
                m_latest[i] = window;
            }
        }
        LiveTime const now = LiveTime() + window.received;
        m_table.update(descriptor->pid(), values, now);
        m_table.expire(now);
        EXPECT_TRUE(m_csv.update(m_table, now));
        windowsAt[window.received.count()] = m_latest;
        last = window.received;
    }

    std::map<long, RowWindows> windowsAt; // by the time of the latest reading
    Time last{};

private:
    // Derived parameters ask for several others.
    static void expectRequestOf(int pid, RequestWindow const& window)
    {
        bool const derived = pid >= obd::ParameterIdentifier::FuelConsumption;
        std::string const request = "01" + obd::ParameterIdentifier(pid).toString().substr(1);
        EXPECT_TRUE(derived ? !window.command.empty() : window.command.starts_with(request))
            << window.command << " for " << pid << " at " << window.sent.count();
    }

    RequestWindows& m_windows;
    velmora::cli::LiveTable m_table;
    velmora::cli::LiveCsv m_csv;
    RowWindows m_latest;
};

class DriveRecording : public testing::TestWithParam<char const*>
{
protected:
    DriveRecording()
    {
        obd::Torque(0).clear(); // which keeps what it told of a car before
        m_obd->getSettings()->setEngineDisplacement(static_cast<float>(m_engine.litres));
    }
    ~DriveRecording() override
    {
        m_obd->getConnectionManager()->closeConnection();
        m_loop.runPending();
    }

    void record();
    void compare(DriveColumn const& column);
    void expectConstant(std::size_t column) const;
    void compareBoost();
    void compareConsumption();
    void comparePower(char const* title);

    std::shared_ptr<PeerConnection> m_car =
        std::make_shared<PeerConnection>(obdsim::simulate({GetParam(), "elm327-v1.5", {}}));
    support::LogCapture m_log;
    DriveClock m_clock{m_car};
    std::shared_ptr<obd::IObdVelmora> m_obd =
        obd::ObdVelmoraBuilder::createObdVelmora(0, 0, 0, std::make_shared<support::MemorySettings>());
    RequestWindows m_windows{m_car};
    support::DispatchLoop m_loop; // behind m_windows, which are to hear of a dispatch first
    obdsim::EngineData const m_engine = obdsim::loadVehicle(GetParam()).engine;
    KnownDrive m_drive{m_engine};
    testsupport::TemporaryFolder const m_folder{folder()};
    std::filesystem::path const m_file = m_folder.path() / "drive.csv";
    std::optional<RecordedDrive> m_recorded;
};

void DriveRecording::record()
{
    ASSERT_TRUE(m_obd->getConnectionManager()->openConnection(m_car, obd::VehicleProtocol::Automatic, false));
    m_loop.runPending();
    auto const service = obd::SensorServiceBuilder::createSensorService();
    m_windows.clear();
    Recording recording(*service, m_windows, m_file.string());
    service->attach(&recording);
    std::vector<obd::ParameterIdentifier::Id> ids;
    for (auto const& descriptor : service->getDescriptors()) {
        ids.push_back(obd::ParameterIdentifier(descriptor->pid()).id());
    }
    m_clock.follow(&m_loop);
    service->startUpdates(ids);
    // In steps, each with the loop's own patience, for a build with sanitizers.
    for (Time until = recordingStep; recording.last < driven; until += recordingStep) {
        ASSERT_TRUE(m_loop.runUntil([&] { return recording.last >= until; }));
    }
    m_clock.follow(nullptr);
    m_loop.runPending(); // lets go of a pause that waits
    service->reset();
    service->detach(&recording);
    m_recorded.emplace(m_file.string(), recording.windowsAt);
}

// The model's value while the request was on its way.
void DriveRecording::compare(DriveColumn const& column)
{
    std::vector<Reading> const readings = m_recorded->readings(*m_recorded->column(column.title));
    EXPECT_GE(readings.size(), 15U) << column.title;
    for (Reading const& reading : readings) {
        Range const range = m_drive.range(reading.asked.sent, reading.asked.received, column.value);
        EXPECT_GE(reading.number, range.low - tolerance(reading, column.step))
            << column.title << " at " << reading.asked.sent.count();
        EXPECT_LE(reading.number, range.high + tolerance(reading, column.step))
            << column.title << " at " << reading.asked.sent.count();
    }
}

// A sensor that the drive does not move, once it has been read. Some are never told.
void DriveRecording::expectConstant(std::size_t column) const
{
    std::string const& value = m_recorded->rows.back().at(column);
    bool read = false;
    for (auto const& row : m_recorded->rows) {
        read = read || row.at(column) != "-";
        EXPECT_TRUE(!read || row.at(column) == value) << m_recorded->titles[column] << " " << row.at(column);
    }
}

// Against normal pressure where the car does not tell that of the air, and in the first reading, for the air is asked
// for behind the manifold.
void DriveRecording::compareBoost()
{
    std::vector<Reading> const readings = m_recorded->readings(*m_recorded->column(drive::boost));
    EXPECT_GE(readings.size(), 15U);
    double const air = m_recorded->column("Barometric Pressure (kPa)") ? 100 : 101.325;
    for (std::size_t i = 1; i < readings.size(); ++i) {
        Range const range = m_drive.range(readings[i].asked.sent, readings[i].asked.received,
                                          [air](DriveState const& d) { return d.manifoldKpa - air; });
        EXPECT_GE(readings[i].number, range.low - tolerance(readings[i], 1)) << readings[i].asked.sent.count();
        EXPECT_LE(readings[i].number, range.high + tolerance(readings[i], 1)) << readings[i].asked.sent.count();
    }
}

// Worked out of air flow, mixture, speed and, for a diesel, load of up to three readings.
void DriveRecording::compareConsumption()
{
    std::vector<Reading> const readings = m_recorded->readings(*m_recorded->column(drive::consumption));
    EXPECT_GE(readings.size(), 15U);
    bool const diesel = m_engine.compression;
    // Without an air flow sensor the air is worked out of pressure and an assumed efficiency.
    double const doubt = m_recorded->column("Air Flow Rate from Mass Flow Sensor (g/s)") ? 0.03 : 0.15;
    double const stoichiometric = diesel ? 14.5 * 0.832 : 14.7 * 0.745; // times the density
    for (std::size_t i = 2; i < readings.size(); ++i) {
        auto const range = [&](auto value) {
            return m_drive.range(readings[i - 2].asked.sent, readings[i].asked.received, value);
        };
        Range const air = range([](DriveState const& d) { return d.airGramsPerSecond; });
        Range const speed = range([](DriveState const& d) { return std::max(5.0, d.speedKmh); });
        Range const lambda = range([](DriveState const& d) { return std::min(2.0, d.lambda); });
        Range const load = range([diesel](DriveState const& d) { return diesel ? d.loadPercent / 100 : 1.0; });
        bool const stands = range([](DriveState const& d) { return d.speedKmh; }).low < 2.5;
        double const low = air.low * load.low / lambda.high / stoichiometric / speed.high * 360;
        double const high = air.high * load.high / std::min(1.0, lambda.low) / stoichiometric / speed.low * 360;
        EXPECT_GE(readings[i].number, (1 - doubt) * (stands ? std::min(0.5, low) : low) - 0.1)
            << readings[i].asked.sent.count();
        EXPECT_LE(readings[i].number, (1 + doubt) * high + 0.1) << readings[i].asked.sent.count();
    }
}

// Of a speed that rises; there is neither power nor torque otherwise.
void DriveRecording::comparePower(char const* title)
{
    std::vector<Reading> const readings = m_recorded->readings(*m_recorded->column(title));
    EXPECT_GE(readings.size(), 15U);
    int rising = 0;
    for (std::size_t i = 2; i < readings.size(); ++i) {
        auto const speed = [](DriveState const& d) { return std::round(d.speedKmh); };
        Range const before = m_drive.range(readings[i - 2].asked.sent, readings[i - 2].asked.received, speed);
        Range const all = m_drive.range(readings[i - 2].asked.sent, readings[i].asked.received, speed);
        Range const now = m_drive.range(readings[i].asked.sent, readings[i].asked.received, speed);
        bool const rises = now.low > before.high + 8;
        rising += rises ? 1 : 0;
        if (rises) {
            EXPECT_GT(readings[i].number, 0) << title << " at " << readings[i].asked.sent.count();
        } else if (all.high == all.low) {
            EXPECT_EQ(readings[i].number, 0) << title << " at " << readings[i].asked.sent.count();
        }
    }
    EXPECT_GE(rising, 2);
}

TEST_P(DriveRecording, FollowsTheDriveModelInEveryColumn)
{
    record();
    ASSERT_TRUE(m_recorded);
    ASSERT_GE(m_recorded->rows.size(), 100U) << "one a second";
    for (std::size_t i = 1; i < m_recorded->titles.size(); ++i) {
        std::string const& title = m_recorded->titles[i];
        if (DriveColumn const* column = drive::find(title)) {
            compare(*column);
        } else if (title == drive::boost) {
            compareBoost();
        } else if (title == drive::consumption) {
            compareConsumption();
        } else if (title == drive::power || title == drive::torque) {
            comparePower(title.c_str());
        } else {
            expectConstant(i);
        }
    }
}

std::string carName(testing::TestParamInfo<char const*> const& info)
{
    std::string name = info.param;
    std::replace(name.begin(), name.end(), '-', '_');
    return name;
}

INSTANTIATE_TEST_SUITE_P(Cars, DriveRecording,
                         testing::Values("petrol-vpw", "petrol-iso9141", "petrol-kwp-slow", "petrol-can11",
                                         "diesel-can29"),
                         carName);

} // namespace
