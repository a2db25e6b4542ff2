#include "libobd/module/ecu.h"
#include "libobd/module/obdproxy.h"
#include "tests/support/logcapture.h"
#include "tests/support/wire/fakedevice.h"

#include <gtest/gtest.h>

#include <algorithm>

namespace {

using obd::ObdMode;
using support::Bytes;

constexpr unsigned int engine = 0x7E8;

class EcuTest : public testing::Test
{
protected:
    EcuTest()
    {
        m_device->answer({0x01, 0x00}, engine, {0x41, 0x00, 0xBE, 0x3F, 0xA8, 0x12});
        m_proxy->setDevice(m_device);
    }
    ~EcuTest() override { m_proxy->releaseEcus(); }

    // The module with all that the vehicle tells of it.
    std::shared_ptr<obd::IEcu> connected()
    {
        EXPECT_TRUE(m_proxy->initialize());
        m_device->requests.clear();
        m_log.clear();
        return m_proxy->firstEcu();
    }

    std::shared_ptr<obd::Ecu> fresh(obd::ObdProtocol protocol = obd::ObdProtocolCan11)
    {
        return std::make_shared<obd::Ecu>(engine, protocol, "some bus", m_proxy);
    }

    long countOf(Bytes const& request) const
    {
        return std::count(m_device->requests.begin(), m_device->requests.end(), request);
    }

    std::shared_ptr<support::FakeDevice> m_device = std::make_shared<support::FakeDevice>();
    std::shared_ptr<obd::ObdProxy> m_proxy = std::make_shared<obd::ObdProxy>();
    support::LogCapture m_log;
};

using EcuModel = EcuTest;
using EcuDetection = EcuTest;
using FreezeFrameDetection = EcuTest;

TEST_F(EcuModel, NewModuleSupportsTheFirstRangeOnly)
{
    auto const ecu = fresh();
    EXPECT_EQ(ecu->supportedIds(ObdMode::CurrentData, 0), Bytes{0});
    EXPECT_TRUE(ecu->isSupported(ObdMode::CurrentData, 0, 0));
    EXPECT_FALSE(ecu->isSupported(ObdMode::CurrentData, 0x0C, 0));
    for (ObdMode const mode : {ObdMode::MonitorTests, ObdMode::SystemControl, ObdMode::VehicleInformation}) {
        EXPECT_EQ(ecu->supportedIds(mode, 7), Bytes{0});
    }
    EXPECT_TRUE(ecu->supportedIds(ObdMode::OxygenSensorTests, 0).empty());
    EXPECT_TRUE(m_log.lines().empty());
}

TEST_F(EcuModel, FreezeFrameAskedBeforeItsDetectionIsFatalInTheLogAndUnsupported)
{
    EXPECT_FALSE(fresh()->isSupported(ObdMode::FreezeFrame, 0x0C, 3));
    EXPECT_EQ(m_log.lines(), std::vector<std::string>{"FATAL NO Oids for MODE 02 frame 3"});
}

TEST_F(EcuModel, UndetectedOxygenSensorHasNoTests)
{
    auto const ecu = fresh();
    EXPECT_FALSE(ecu->isSupported(obd::OxygenSensorLocation::Bank2Sensor1, 0x01));
    EXPECT_TRUE(ecu->supportedTids(obd::OxygenSensorLocation::Bank2Sensor1).empty());
}

TEST_F(EcuModel, StartsWithTheStandardsRanges)
{
    auto const ecu = fresh();
    EXPECT_EQ(ecu->equivalenceRatioMax(), 2U);
    EXPECT_EQ(ecu->oxygenSensorVoltageMax(), 8U);
    EXPECT_EQ(ecu->oxygenSensorCurrentMax(), 128U);
    EXPECT_EQ(ecu->intakeManifoldAbsolutePressureMax(), 255U);
    EXPECT_DOUBLE_EQ(ecu->airFlowRateMax(), 655.35);
    EXPECT_EQ(ecu->ignitionType(), obd::IgnitionType::Spark);
    EXPECT_EQ(ecu->standard(), 0);
    EXPECT_EQ(ecu->protocolDescription(), "some bus");
}

TEST_F(EcuModel, Pid13WinsOver1D)
{
    EXPECT_EQ(fresh()->oxygenSensorBanks(), obd::OxygenSensorBank::None);
    m_device->answer({0x01, 0x00}, engine, {0x41, 0x00, 0x00, 0x00, 0x00, 0x08}); // 1D
    EXPECT_EQ(connected()->oxygenSensorBanks(), obd::OxygenSensorBank::Pid1D);
    m_device->answer({0x01, 0x00}, engine, {0x41, 0x00, 0x00, 0x00, 0x20, 0x08}); // 13 and 1D
    EXPECT_EQ(connected()->oxygenSensorBanks(), obd::OxygenSensorBank::Pid13);
}

TEST(OxygenSensorByte, NamesEachSensorInAService05Request)
{
    Bytes const expected = {0x01, 0x02, 0x04, 0x08, 0x10, 0x20, 0x40, 0x80, 0x10, 0x20, 0x40, 0x80};
    for (int i = 0; i < 12; ++i) {
        EXPECT_EQ(obd::oxygenSensorByte(static_cast<obd::OxygenSensorLocation>(i)),
                  expected[static_cast<std::size_t>(i)]);
    }
    EXPECT_EQ(obd::oxygenSensorByte(static_cast<obd::OxygenSensorLocation>(12)), 0);
    EXPECT_EQ(obd::oxygenSensorByte(static_cast<obd::OxygenSensorLocation>(-1)), 0);
}

TEST_F(EcuDetection, NextRangeIsReadOnlyIfTheModuleReportsIt)
{
    connected();
    EXPECT_EQ(countOf({0x01, 0x20}), 0);
    m_device->answer({0x01, 0x00}, engine, {0x41, 0x00, 0x00, 0x00, 0x00, 0x01});
    m_device->answer({0x01, 0x20}, engine, {0x41, 0x20, 0x80, 0x00, 0x00, 0x00});
    ASSERT_TRUE(m_proxy->initialize());
    EXPECT_EQ(m_proxy->firstEcu()->supportedIds(ObdMode::CurrentData, 0), (Bytes{0, 0x20, 0x21, 0xF4, 0xF5, 0xF6}));
    EXPECT_EQ(countOf({0x01, 0x20}), 1);
}

TEST_F(EcuDetection, ChainStopsAtE0WhateverIsReported)
{
    for (unsigned int base = 0; base <= 0xE0; base += 0x20) {
        auto const first = static_cast<unsigned char>(base);
        m_device->answer({0x01, first}, engine, {0x41, first, 0x00, 0x00, 0x00, 0x01});
    }
    ASSERT_TRUE(m_proxy->initialize());
    EXPECT_EQ(m_proxy->firstEcu()->supportedIds(ObdMode::CurrentData, 0),
              (Bytes{0, 0x20, 0x40, 0x60, 0x80, 0xA0, 0xC0, 0xE0, 0x00, 0xF4, 0xF5, 0xF6}));
    EXPECT_EQ(countOf({0x01, 0xE0}), 1);
    EXPECT_EQ(countOf({0x01, 0x00}), 2) << "once to find the modules, once for the first range";
}

TEST_F(EcuDetection, FailingLaterRangeKeepsTheEarlierOnes)
{
    m_device->answer({0x01, 0x00}, engine, {0x41, 0x00, 0x80, 0x00, 0x00, 0x01});
    ASSERT_TRUE(m_proxy->initialize());
    EXPECT_EQ(m_proxy->firstEcu()->supportedIds(ObdMode::CurrentData, 0), (Bytes{0, 0x01, 0x20, 0xF4, 0xF5, 0xF6}));
    EXPECT_TRUE(m_log.contains("FATAL Failed to get supported 01 IDs 0x21 - 0x40 for ECU 0x7e8 frame 0x0"));
}

TEST_F(EcuDetection, ModuleThatDidNotAnswerARangeThatAnotherAnsweredAddsNothing)
{
    m_device->answer({0x01, 0x00}, 0x7E9, {0x41, 0x00, 0x80, 0x00, 0x00, 0x01});
    m_device->answer({0x01, 0x20}, engine, {0x41, 0x20, 0x80, 0x00, 0x00, 0x00});
    ASSERT_TRUE(m_proxy->initialize());
    EXPECT_EQ(m_proxy->ecu(0x7E9)->supportedIds(ObdMode::CurrentData, 0), (Bytes{0, 0x01, 0x20, 0xF4, 0xF5, 0xF6}));
    EXPECT_FALSE(m_log.contains("FATAL Failed to get supported 01 IDs 0x21 - 0x40 for ECU 0x7e9 frame 0x0"));
}

TEST_F(EcuDetection, ServicesAreReadInTheirOrder)
{
    m_proxy->initialize();
    std::vector<Bytes> const expected = {{0x01, 0x00}, {0x01, 0x00}, {0x06, 0x00}, {0x08, 0x00}, {0x09, 0x00}};
    ASSERT_GE(m_device->requests.size(), expected.size());
    std::vector<Bytes> masks;
    for (Bytes const& request : m_device->requests) {
        if (request.size() == 2 && request[1] == 0x00) {
            masks.push_back(request);
        }
    }
    EXPECT_EQ(masks, expected);
}

TEST_F(EcuDetection, OtherServicesMayFailWithoutFailingTheModule)
{
    ASSERT_TRUE(m_proxy->initialize());
    for (char const* service : {"06", "08", "09"}) {
        EXPECT_TRUE(m_log.contains(std::string("FATAL Failed to get supported ") + service +
                                   " IDs 0x1 - 0x20 for ECU 0x7e8 frame 0x0"));
    }
}

TEST_F(EcuDetection, LinkLostBetweenStepsSkipsTheRestAndInitIsStillTrue)
{
    m_proxy->initialize();
    auto const ecu = std::dynamic_pointer_cast<obd::Ecu>(m_proxy->firstEcu());
    m_device->requests.clear();
    m_device->onRequest = [this](Bytes const&) { m_device->enabled = false; };
    EXPECT_TRUE(ecu->init(0));
    EXPECT_EQ(m_device->requests, (std::vector<Bytes>{{0x01, 0x00}}));
}

TEST_F(EcuDetection, FirstRangeFailingFailsTheModule)
{
    m_device->answer({0x01, 0x00}, support::FakeDevice::Answer{obd::IDevice::Status::Unparsed, {}});
    EXPECT_FALSE(fresh()->init(0));
    EXPECT_EQ(m_device->requests.size(), 1U);
}

TEST_F(EcuDetection, ModuleWithoutANameIsNumberedAndNamedByItsId)
{
    m_device->answer({0x01, 0x00}, 0x7EA, {0x41, 0x00, 0x80, 0x00, 0x00, 0x00});
    ASSERT_TRUE(m_proxy->initialize());
    EXPECT_EQ(m_proxy->firstEcu()->name(), "ECU#1");
    EXPECT_EQ(m_proxy->firstEcu()->description(), "Control Module 0x7E8");
    EXPECT_EQ(m_proxy->ecu(0x7EA)->name(), "ECU#2");
    EXPECT_EQ(m_proxy->ecu(0x7EA)->description(), "Control Module 0x7EA");
}

TEST_F(EcuDetection, ModuleWhoseNameReplyIsMissingKeepsTheFallback)
{
    Bytes const offersName{0x49, 0x00, 0x00, 0x40, 0x00, 0x00};
    for (unsigned int const id : {engine, 0x7E9U}) {
        m_device->answer({0x01, 0x00}, id, {0x41, 0x00, 0x80, 0x00, 0x00, 0x00});
        m_device->answer({0x09, 0x00}, id, offersName);
    }
    Bytes reply{0x49, 0x0A, 0x01, 'T', 'C', 'M', 0, '-', 'T', 'r', 'a', 'n', 's'};
    reply.resize(23);
    m_device->answer({0x09, 0x0A}, 0x7E9, reply);
    ASSERT_TRUE(m_proxy->initialize());
    EXPECT_EQ(m_proxy->firstEcu()->name(), "ECU#1");
    EXPECT_EQ(m_proxy->firstEcu()->description(), "Control Module 0x7E8");
    EXPECT_EQ(m_proxy->ecu(0x7E9)->name(), "TCM");
    m_device->answer({0x09, 0x0A}, 0x7E9, [] {
        Bytes blank{0x49, 0x0A, 0x01};
        blank.resize(23);
        return blank;
    }());
    ASSERT_TRUE(m_proxy->initialize());
    EXPECT_EQ(m_proxy->ecu(0x7E9)->name(), "ECU#2") << "a blank name is none";
    EXPECT_EQ(m_proxy->ecu(0x7E9)->description(), "Control Module 0x7E9");
}

TEST_F(EcuDetection, TellsWhichSetsTheModuleItselfToldWholly)
{
    using obd::OutcomeKind;
    m_device->answer({0x01, 0x00}, 0x7E9, {0x41, 0x00, 0x80, 0x00, 0x00, 0x01});
    m_device->answer({0x01, 0x20}, engine, {0x41, 0x20, 0x80, 0x00, 0x00, 0x00});
    m_device->answer({0x06, 0x00}, engine, {0x7F, 0x06, 0x11});
    m_device->answer({0x09, 0x00}, engine, {0x49, 0x00, 0x00});
    ASSERT_TRUE(m_proxy->initialize());
    auto const first = m_proxy->firstEcu();
    EXPECT_EQ(first->detection(ObdMode::CurrentData, 0), obd::Verdict{});
    EXPECT_EQ(first->detection(ObdMode::MonitorTests, 7), (obd::Verdict{OutcomeKind::Refused, 0x11}));
    EXPECT_EQ(first->detection(ObdMode::SystemControl, 0), obd::Verdict{OutcomeKind::ModuleSilent});
    EXPECT_EQ(first->detection(ObdMode::VehicleInformation, 0), obd::Verdict{OutcomeKind::Unreadable});
    EXPECT_EQ(first->detection(ObdMode::FreezeFrame, 0), obd::Verdict{OutcomeKind::NotOffered}) << "never asked";
    EXPECT_EQ(m_proxy->ecu(0x7E9)->detection(ObdMode::CurrentData, 0), obd::Verdict{OutcomeKind::ModuleSilent})
        << "of the second range";
    first->detectFreezeFrameConfiguration(0);
    EXPECT_EQ(first->detection(ObdMode::FreezeFrame, 0), obd::Verdict{OutcomeKind::ModuleSilent});
    EXPECT_EQ(first->detection(ObdMode::FreezeFrame, 1), obd::Verdict{OutcomeKind::NotOffered});
}

TEST_F(FreezeFrameDetection, SecondCallAsksNothing)
{
    auto const ecu = connected();
    m_device->answer({0x02, 0x00, 0x01}, engine, {0x42, 0x00, 0x01, 0x00, 0x18, 0x00, 0x00});
    EXPECT_TRUE(ecu->detectFreezeFrameConfiguration(1));
    EXPECT_TRUE(ecu->detectFreezeFrameConfiguration(1));
    EXPECT_EQ(m_device->requests, (std::vector<Bytes>{{0x02, 0x00, 0x01}}));
    EXPECT_EQ(ecu->supportedIds(ObdMode::FreezeFrame, 1), (Bytes{0, 0x0C, 0x0D}));
    EXPECT_TRUE(ecu->isSupported(ObdMode::FreezeFrame, 0x0C, 1));
    EXPECT_FALSE(ecu->isSupported(ObdMode::FreezeFrame, 0x0C, 0)) << "another frame";
}

TEST_F(FreezeFrameDetection, FailedFirstRangeForgetsTheFrame)
{
    auto const ecu = connected();
    EXPECT_FALSE(ecu->detectFreezeFrameConfiguration(2));
    EXPECT_EQ(m_log.lines(),
              (std::vector<std::string>{"FATAL Failed to get supported 02 IDs 0x1 - 0x20 for ECU 0x7e8 frame 0x2",
                                        "ERROR Failed to detect configuration -> remove frame details"}));
    m_log.clear();
    EXPECT_FALSE(ecu->isSupported(ObdMode::FreezeFrame, 0x0C, 2));
    EXPECT_EQ(m_log.lines(), std::vector<std::string>{"FATAL NO Oids for MODE 02 frame 2"});
}

TEST_F(FreezeFrameDetection, ResetForgetsAllFrames)
{
    auto const ecu = connected();
    m_device->answer({0x02, 0x00, 0x00}, engine, {0x42, 0x00, 0x00, 0x00, 0x10, 0x00, 0x00});
    ASSERT_TRUE(ecu->detectFreezeFrameConfiguration(0));
    ecu->resetFreezeFrameConfiguration();
    EXPECT_TRUE(ecu->supportedIds(ObdMode::FreezeFrame, 0).empty());
    EXPECT_TRUE(ecu->detectFreezeFrameConfiguration(0));
    EXPECT_EQ(countOf({0x02, 0x00, 0x00}), 2);
}

} // namespace
