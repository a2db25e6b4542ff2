#include "libvelmora/read/sensorchoice.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace {

using testing::Contains;
using testing::ElementsAre;
using testing::HasSubstr;
using velmora::chooseSensors;
using velmora::Error;
using velmora::ErrorKind;
using velmora::OfferedSensor;

OfferedSensor sensor(int pid, std::string const& title)
{
    return {obd::ParameterIdentifier(pid).id(), title};
}

std::vector<OfferedSensor> const offered = {
    sensor(0x04, "Calculated engine load"),
    sensor(0x05, "Engine Coolant Temperature"),
    sensor(0x0B, "Intake Manifold Absolute Pressure"),
    sensor(0x0C, "Engine RPM"),
    sensor(0x0D, "Vehicle Speed Sensor"),
    sensor(0x0F, "Intake Air Temperature"),
    sensor(0x11, "Absolute Throttle Position"),
    sensor(0x33, "Barometric Pressure"),
    sensor(0x46, "Ambient Air Temperature"),
    sensor(0x67, "Engine Coolant Temperature"),
    sensor(0xF4, "Battery voltage"),
};

std::vector<int> choose(std::vector<std::string> const& words)
{
    std::vector<int> pids;
    for (obd::ParameterIdentifier::Id const id : chooseSensors(words, offered)) {
        pids.push_back(id);
    }
    return pids;
}

Error failure(std::string const& word)
{
    try {
        choose({word});
    } catch (Error const& thrown) {
        return thrown;
    }
    throw std::logic_error("nothing thrown for " + word);
}

TEST(SensorChoice, TakesAPidInAnyUsualForm)
{
    for (char const* word : {"0C", "0c", "010C", "0x0C", "0X0c", "$0C", "$C", "0xC", "0x010C"}) {
        EXPECT_THAT(choose({word}), ElementsAre(0x0C)) << word;
    }
    EXPECT_THAT(choose({"F4"}), ElementsAre(0xF4));
}

TEST(SensorChoice, TakesANameInAnyLetterCase)
{
    EXPECT_THAT(choose({"RPM"}), ElementsAre(0x0C));
    EXPECT_THAT(choose({"speed"}), ElementsAre(0x0D));
    EXPECT_THAT(choose({"Coolant_Temp"}), ElementsAre(0x05));
    EXPECT_THAT(choose({"intake-temp"}), ElementsAre(0x0F));
    EXPECT_THAT(choose({"THROTTLE_POS"}), ElementsAre(0x11));
    EXPECT_THAT(choose({"battery"}), ElementsAre(0xF4));
    EXPECT_THAT(choose({"coolant"}), ElementsAre(0x05));
}

TEST(SensorChoice, TakesWordsOfATitle)
{
    EXPECT_THAT(choose({"manifold"}), ElementsAre(0x0B));
    EXPECT_THAT(choose({"temperature ambient"}), ElementsAre(0x46));
    EXPECT_THAT(choose({"vehicle speed sensor"}), ElementsAre(0x0D));
}

TEST(SensorChoice, KeepsTheOrderAndTakesNoneTwice)
{
    EXPECT_THAT(choose({"speed", "0C", "RPM", "load"}), ElementsAre(0x0D, 0x0C, 0x04));
}

TEST(SensorChoice, TakesAll)
{
    EXPECT_EQ(choose({"0C", "all"}).size(), offered.size());
    EXPECT_EQ(choose({"0C", "all"}).front(), 0x0C);
}

TEST(SensorChoice, WithoutWordsTakesTheUsualOnesThatAreOffered)
{
    EXPECT_THAT(choose({}), ElementsAre(0x0D, 0x0C, 0x05, 0x04, 0x11));
    auto const few = chooseSensors({}, {sensor(0x0C, "Engine RPM"), sensor(0x42, "Control module voltage")});
    EXPECT_THAT(few, ElementsAre(obd::ParameterIdentifier(0x0C).id()));
    auto const none = chooseSensors({}, {sensor(0x42, "Control module voltage")});
    EXPECT_THAT(none, ElementsAre(obd::ParameterIdentifier(0x42).id()));
}

TEST(SensorChoice, TellsWhatAnUnclearWordMayMean)
{
    Error const unclear = failure("pressure");
    EXPECT_EQ(unclear.kind(), ErrorKind::WrongUse);
    EXPECT_THAT(unclear.what(), HasSubstr("\"pressure\" may mean 2 sensors"));
    EXPECT_THAT(unclear.hints(), ElementsAre("0B INTAKE_PRESSURE  Intake Manifold Absolute Pressure",
                                             "33 BAROMETRIC_PRESSURE  Barometric Pressure"));
}

TEST(SensorChoice, TwoSensorsOfOneTitleAreUnclear)
{
    EXPECT_EQ(failure("engine coolant temperature").hints().size(), 2U);
}

TEST(SensorChoice, AKnownSensorThatTheVehicleLacksIsNotSupported)
{
    for (char const* word : {"5C", "$5C", "OIL_TEMP", "oil temp", "20", "FE"}) {
        EXPECT_EQ(failure(word).kind(), ErrorKind::NotSupported) << word;
    }
    EXPECT_STREQ(failure("5c").what(), "The vehicle does not offer the sensor 5C (OIL_TEMP)");
}

// Values of another sensor under the name that was asked for would be taken for what that name means.
TEST(SensorChoice, ANameIsNotTakenForWordsOfAnotherTitle)
{
    std::vector<OfferedSensor> const alike = {sensor(0x03, "Fuel system status"), sensor(0x23, "Fuel rail pressure")};
    for (char const* name : {"STATUS", "FUEL_PRESSURE", "fuel pressure"}) {
        try {
            chooseSensors({name}, alike);
            ADD_FAILURE() << name;
        } catch (Error const& error) {
            EXPECT_EQ(error.kind(), ErrorKind::NotSupported) << name;
            EXPECT_THAT(error.hints().front(), HasSubstr("or is this meant? ")) << name;
        }
    }
    EXPECT_THAT(chooseSensors({"coolant"}, {sensor(0x67, "Engine Coolant Temperature")}),
                ElementsAre(obd::ParameterIdentifier(0x67).id()))
        << "a single word may stand in a title";
}

TEST(SensorChoice, AnUnknownWordIsWrongUseWithWhatIsNear)
{
    Error const unknown = failure("rmp");
    EXPECT_EQ(unknown.kind(), ErrorKind::WrongUse);
    EXPECT_THAT(unknown.hints(), Contains("did you mean RPM (0C)?"));
    for (char const* word : {"", " ", "$", "0x", "0xZZ", "flux capacitor", "-5", "$-5", "010203", "0x00C"}) {
        EXPECT_EQ(failure(word).kind(), ErrorKind::WrongUse) << word;
    }
}

TEST(SensorChoice, AWholeTitleGoesBeforeOneThatHoldsIt)
{
    std::vector<OfferedSensor> const speeds = {sensor(0x5D, "Wheel Speed"), sensor(0x5E, "Wheel Speed Limit")};
    EXPECT_THAT(chooseSensors({"wheel speed"}, speeds), ElementsAre(obd::ParameterIdentifier(0x5D).id()));
    EXPECT_THAT(chooseSensors({"speed limit"}, speeds), ElementsAre(obd::ParameterIdentifier(0x5E).id()));
}

TEST(SensorChoice, SuggestsWhatIsNearAndWhereToLook)
{
    std::string const list = "`velmora sensors` lists what the vehicle offers";
    std::string const ways = "a sensor is named by its PID (0C), its name (RPM) or words of its title (coolant)";
    EXPECT_THAT(failure("rmp").hints(), ElementsAre("did you mean MAP (0B)?", "did you mean RPM (0C)?", list, ways));
    EXPECT_THAT(failure("coolantt_tem").hints(), ElementsAre("did you mean COOLANT_TEMP (05)?", list, ways))
        << "two letters away";
    EXPECT_THAT(failure("coolanttt_tem").hints(), ElementsAre(list, ways)) << "three";
    EXPECT_THAT(failure("rm").hints(), ElementsAre("did you mean RPM (0C)?", list, ways)) << "one of two letters";
    EXPECT_THAT(failure("rq").hints(), ElementsAre(list, ways));
    for (char const* const word : {"5", "C", "0x0105C", "020C", "5G", "G5"}) {
        EXPECT_EQ(failure(word).kind(), ErrorKind::WrongUse) << word;
    }
    std::string const other = "another control module may offer it: --ecu ID";
    EXPECT_THAT(failure("01").hints(), ElementsAre("`velmora readiness` shows lamp and monitors", other));
    EXPECT_THAT(failure("41").hints(), ElementsAre("`velmora readiness` shows lamp and monitors", other));
    EXPECT_THAT(failure("02").hints(),
                ElementsAre("`velmora freeze` shows the code that froze values, and the values", other));
    EXPECT_THAT(failure("5C").hints(), ElementsAre(list, other));
}

TEST(SensorChoice, AModuleWithoutSensorsIsNotSupported)
{
    EXPECT_THROW(chooseSensors({}, {}), Error);
    EXPECT_THROW(chooseSensors({"RPM"}, {}), Error);
}

} // namespace
