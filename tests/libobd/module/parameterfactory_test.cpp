#include "libobd/powertrain/batteryvoltage.h"
#include "libobd/powertrain/boostpressure.h"
#include "libobd/powertrain/fueltrim.h"
#include "libobd/powertrain/monitorstatus.h"
#include "libobd/powertrain/torque.h"
#include "tests/support/hexbytes.h"
#include "tests/support/logcapture.h"
#include "tests/support/parameterclasses.h"
#include "tests/support/payload/payload.h"
#include "tests/support/tablefile.h"

#include <obd/parameterfactory.h>

#include <gtest/gtest.h>

#include <typeinfo>

namespace {

using obd::ObdMode;
using obd::ParameterFactory;
using obd::ParameterIdentifier;

ParameterIdentifier::Id id(int pid)
{
    return ParameterIdentifier::Id(pid);
}

support::Bytes request(obd::PowertrainParameter const& parameter)
{
    support::Bytes data;
    parameter.requestData(data);
    return data;
}

TEST(ParameterFactory, MakesALiveParameter)
{
    auto const parameter = ParameterFactory().createParameter(id(0x0C));
    ASSERT_NE(std::dynamic_pointer_cast<obd::EngineRpm>(parameter), nullptr);
    EXPECT_EQ(parameter->mode(), ObdMode::CurrentData);
    EXPECT_EQ(parameter->frame(), 0);
    EXPECT_EQ(request(*parameter), support::hexBytes("01 0C"));
}

TEST(ParameterFactory, MakesAParameterOfAFreezeFrame)
{
    auto const parameter = ParameterFactory().createFreezeFrameParameter(id(0x0C), 2);
    ASSERT_NE(std::dynamic_pointer_cast<obd::EngineRpm>(parameter), nullptr);
    EXPECT_EQ(request(*parameter), support::hexBytes("02 0C 02"));
}

TEST(ParameterFactory, MakesNothingOfAnIdentifierWithoutAClass)
{
    for (int const pid : {0x00, 0x02, 0x20, 0x40, 0x41, 0x4F, 0x50, 0x60, 0x80, 0xF0, -1, 0x10C}) {
        EXPECT_EQ(ParameterFactory().createParameter(id(pid)), nullptr) << pid;
        EXPECT_EQ(ParameterFactory().createFreezeFrameParameter(id(pid), 0), nullptr) << pid;
    }
}

TEST(ParameterFactory, MakesTheReadinessForALiveReadingOnly)
{
    auto const parameter = ParameterFactory().createParameter(id(0x01));
    EXPECT_NE(std::dynamic_pointer_cast<obd::MonitorStatus>(parameter), nullptr);
    EXPECT_EQ(ParameterFactory().createFreezeFrameParameter(id(0x01), 0), nullptr);
}

TEST(ParameterFactory, MakesTheDerivedParametersForALiveReadingOnly)
{
    support::LogCapture const log;
    ParameterFactory factory;
    EXPECT_NE(std::dynamic_pointer_cast<obd::BatteryVoltage>(factory.createParameter(id(0xF4))), nullptr);
    EXPECT_NE(std::dynamic_pointer_cast<obd::BoostPressure>(factory.createParameter(id(0xF7))), nullptr);
    EXPECT_TRUE(log.lines().empty());
    for (int const pid : {0xF4, 0xF5, 0xF6, 0xF7}) {
        EXPECT_EQ(factory.createFreezeFrameParameter(id(pid), 0), nullptr) << pid;
    }
}

TEST(ParameterFactory, PowerAndTorqueAreMadeForAUsualWeightAndTellSo)
{
    support::LogCapture const log;
    ParameterFactory factory;
    EXPECT_NE(std::dynamic_pointer_cast<obd::EnginePower>(factory.createParameter(id(0xF5))), nullptr);
    EXPECT_NE(std::dynamic_pointer_cast<obd::Torque>(factory.createParameter(id(0xF6))), nullptr);
    EXPECT_EQ(log.lines(), (std::vector<std::string>{"ERROR EnginePower created without setting the vehicle weight",
                                                     "ERROR Torque created without setting the vehicle weight"}));
}

TEST(ParameterFactory, MakesEveryClassByItsOwnPid)
{
    for (auto const& [name, make] : support::parameterClasses()) {
        ParameterIdentifier::Id const pid = make(ObdMode::CurrentData, 0)->pid();
        auto const parameter = ParameterFactory().createParameter(pid);
        ASSERT_NE(parameter, nullptr) << name;
        EXPECT_EQ(parameter->pid(), pid) << name;
        auto const expected = make(ObdMode::CurrentData, 0);
        auto const& made = *parameter;
        auto const& named = *expected;
        EXPECT_EQ(typeid(made), typeid(named)) << name;
    }
}

TEST(ParameterFactory, MakesNoOtherClassThanTheNamedOnes)
{
    std::size_t made = 0;
    for (int pid = 0; pid < 0xF0; ++pid) {
        made += ParameterFactory().createFreezeFrameParameter(id(pid), 0) != nullptr ? 1 : 0;
    }
    EXPECT_EQ(made, support::parameterClasses().size());
}

TEST(ParameterFactory, TellsTheDataLengthOfEverySensorAsTheTableHasIt)
{
    obd::FuelTrim::setByteBInUse(false);
    std::map<int, std::size_t> expected;
    for (auto const& cells : support::readTable("tests/libobd/powertrain/pid_table.txt")) {
        expected[std::stoi(cells.at(0), nullptr, 16)] = std::stoul(cells.at(2));
    }
    for (int const pid : {0x00, 0x01, 0x20, 0x40, 0x41, 0x4F, 0x50, 0x60, 0x80, 0xA0, 0xC0, 0xE0}) {
        expected[pid] = 4;
    }
    expected[0x02] = 2;
    ASSERT_EQ(expected.size(), 132U);
    for (int pid = -1; pid <= 0x120; ++pid) {
        std::optional<std::size_t> const length = ParameterFactory::dataLength(id(pid));
        EXPECT_EQ(length, expected.contains(pid) ? std::optional(expected[pid]) : std::nullopt) << pid;
    }
}

TEST(ParameterFactory, AFuelTrimOfFourBanksHasTwoBytes)
{
    obd::FuelTrim::setByteBInUse(true);
    for (int const pid : {0x06, 0x09, 0x55, 0x58}) {
        EXPECT_EQ(ParameterFactory::dataLength(id(pid)), 2U) << pid;
    }
    EXPECT_EQ(ParameterFactory::dataLength(id(0x05)), 1U);
    obd::FuelTrim::setByteBInUse(false);
    EXPECT_EQ(ParameterFactory::dataLength(id(0x06)), 1U);
}

TEST(ParameterFactory, EachCallMakesANewObject)
{
    ParameterFactory factory;
    EXPECT_NE(factory.createParameter(id(0x0C)), factory.createParameter(id(0x0C)));
}

} // namespace
