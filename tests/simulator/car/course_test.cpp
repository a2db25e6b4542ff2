#include "simulator/car/course.h"
#include "simulator/car/drivemodel.h"
#include "simulator/error.h"
#include "tests/simulator/conversation.h"
#include "tests/support/temporaryfolder.h"

#include <gtest/gtest.h>

#include <fstream>

namespace {

using obdsim::Course;
using obdsim::DriveModel;
using obdsim::DrivePlan;
using obdsim::DriveState;
using obdsim::EngineData;
using obdsim::Ms;

TEST(Course, isStraightBetweenMomentsAndBeginsAnew)
{
    Course const course = obdsim::parseDrive("seconds,speed\n0,0\n10,100\n20,50\n", "a.csv").course;
    EXPECT_EQ(course.kmh(5), 50);
    EXPECT_EQ(course.kmh(15), 75);
    EXPECT_EQ(course.kmh(25), 50) << "the second round";
    EXPECT_NEAR(course.kilometres(10), 50.0 * 10 / 3600, 1e-9);
    EXPECT_NEAR(course.kilometres(20), (500.0 + 750) / 3600, 1e-9);
    EXPECT_NEAR(course.kilometres(45), (2 * 1250.0 + 25.0 * 5) / 3600, 1e-9);
}

TEST(Course, builtInDrivesGoAsTheirNamesSay)
{
    auto const highest = [](Course const& course) {
        double top = 0;
        for (int second = 0; second < 900; ++second) {
            top = std::max(top, course.kmh(second));
        }
        return top;
    };
    EXPECT_EQ(highest(obdsim::loadDrive("town").course), 50);
    EXPECT_NEAR(highest(obdsim::loadDrive("motorway").course), 131, 1);
    DrivePlan const cold = obdsim::loadDrive("cold-start");
    EXPECT_EQ(cold.startCoolantCelsius, -7);

    EngineData engine;
    engine.course = std::make_shared<Course const>(cold.course);
    engine.startCoolantCelsius = -7;
    DriveModel const drive{engine};
    EXPECT_GT(drive.at(Ms(5000)).rpm, engine.idleRpm + 300) << "a cold engine idles fast";
    EXPECT_FALSE(drive.at(Ms(5000)).closedLoop);
    EXPECT_LT(drive.at(Ms(265000)).rpm, engine.idleRpm + 20) << "and slows down as it warms";
}

TEST(Course, columnsGoBeforeTheModel)
{
    auto const path = testsupport::ownPath("drive.csv");
    std::ofstream(path) << "seconds, speed, coolant\r\n0, 36, 80\r\n\r\n100, 36, 80\r\n";
    obdsim::SimulationOptions options;
    options.drive = path;
    auto const peer = obdsim::simulate(options);
    Conversation talk(peer);
    talk.ask("ATE0");
    talk.ask("ATSP6");
    EXPECT_NE(talk.ask("010D").find("41 0D 24"), std::string::npos) << "36 km/h";
    EXPECT_NE(talk.ask("0105").find("41 05 78"), std::string::npos) << "80 degrees";
}

TEST(Course, builtInWeatherGoesBeforeTheCars)
{
    obdsim::SimulationOptions options;
    options.drive = "cold-start";
    Conversation talk(obdsim::simulate(options));
    EXPECT_EQ(talk.ask({"ATE0", "ATS0", "ATSP6", "0105"}).substr(0, 6), "410521") << "-7 degrees";
    EXPECT_EQ(talk.ask("0146").substr(0, 6), "414621");
}

TEST(Course, mistakesNameFileAndLine)
{
    std::pair<char const*, char const*> const cases[] = {
        {"", "a.csv:1: the first line must begin with seconds,speed"},
        {"time,speed\n", "a.csv:1: the first line must begin"},
        {"seconds,speed,colour\n", "a.csv:1: there is no value \"colour\""},
        {"seconds,speed\n0,0\n", "a.csv:2: a drive needs two rows"},
        {"seconds,speed\n1,0\n2,0\n", "a.csv:2: the seconds must begin with 0"},
        {"seconds,speed\n0,0\n0,5\n", "a.csv:3: the seconds must begin with 0 and rise"},
        {"seconds,speed\n0,0\n1,x\n", "a.csv:3: \"x\" is no number"},
        {"seconds,speed\n0,0\n1,nan\n", "a.csv:3: \"nan\" is no number"},
        {"seconds,speed\n0,0\n1\n", "a.csv:3: the line needs 2 numbers"},
        {"seconds,speed\n0,-1\n1,0\n", "a.csv:2: the speed is below 0"},
    };
    for (auto const& [text, error] : cases) {
        try {
            obdsim::parseDrive(text, "a.csv");
            ADD_FAILURE() << text;
        } catch (obdsim::SimulatorError const& failure) {
            EXPECT_EQ(std::string(failure.what()).substr(0, std::string(error).size()), error);
        }
    }
    EXPECT_THROW(obdsim::loadDrive("/nonexistent.csv"), obdsim::SimulatorError);
}

} // namespace
