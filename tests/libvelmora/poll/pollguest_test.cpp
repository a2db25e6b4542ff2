// Guests of a poller beside its parameters, and what a cycle tells of who answers and who does not.
#include "libvelmora/poll/poller.h"
#include "tests/libvelmora/poll/pollcyclefixture.h"

namespace {

using support::FakeEcu;
using support::FakeProxy;
using velmora::PollRate;
using velmora::test::careful;
using velmora::test::fastSix;

// Takes 10 ms a turn, and tells what the test says.
class FakeGuest : public velmora::IPollGuest
{
public:
    explicit FakeGuest(support::FakeClock* clock = nullptr) : m_clock(clock) {}

    std::vector<velmora::PollGuestWish> wishes() const override
    {
        return {{0x763, 0x10001, "ONE"}, {0x763, 0x10002, "TWO"}};
    }
    std::vector<velmora::PollResult> turn(velmora::PollWire& /*wire*/) override
    {
        ++turns;
        if (m_clock != nullptr) {
            m_clock->advance(10);
        }
        return told;
    }
    void stop() override { stopped = true; }

    int turns = 0;
    bool stopped = false;
    std::vector<velmora::PollResult> told;

private:
    support::FakeClock* m_clock;
};

velmora::PollResult resultOf(unsigned int module, int id)
{
    return {module, static_cast<obd::ParameterIdentifier::Id>(id), {}, {}};
}

class PollGuestTest : public velmora::test::PollCycleTest
{
protected:
    void wantGuest(double hertz) { m_sources.push_back({nullptr, nullptr, hertz, m_guest}); }

    std::shared_ptr<FakeGuest> m_guest = std::make_shared<FakeGuest>(&m_clock);
};

TEST_F(PollGuestTest, TakesTurnsAtItsRateAndIsToldOf)
{
    want(0x0C);
    wantGuest(10.0);
    want(0x0D);
    m_proxy->answer("01 0C", "41 0C 1A F8");
    m_proxy->answer("01 0D", "41 0D 50");
    m_guest->told = {resultOf(0x763, 0x10001), resultOf(0x764, 0x10002)};
    run(careful, 0);
    for (PollRate const& each : m_cycle->rates()) {
        EXPECT_EQ(each.silent, 0) << "before the first turn";
        EXPECT_EQ(each.reached, 0.0);
    }
    run(careful, 2000);
    EXPECT_NEAR(m_guest->turns, 20, 1);
    EXPECT_EQ(count(0x763, 0x10001), static_cast<std::size_t>(m_guest->turns));
    EXPECT_GT(count(0x7E8, 0x0D), 15U);
    std::vector<PollRate> const rates = m_cycle->rates();
    ASSERT_EQ(rates.size(), 4U) << "what the guest reads comes behind the parameters";
    EXPECT_EQ(rates[1].pid, 0x0D);
    EXPECT_EQ(rates[2].sensor, "ONE");
    EXPECT_EQ(rates[2].module, 0x763U);
    EXPECT_EQ(rates[2].pid, 0x10001);
    EXPECT_EQ(rates[2].asked, 10.0);
    EXPECT_NEAR(rates[2].reached, 10.0, 0.5);
    EXPECT_EQ(rates[2].silent, 0);
    EXPECT_EQ(rates[3].reached, 0.0) << "another module told that";
    EXPECT_EQ(rates[3].silent, m_guest->turns);
    m_cycle->stop();
    EXPECT_TRUE(m_guest->stopped);
    m_guest->told = {resultOf(0x763, 0x10002)};
    int const before = m_guest->turns;
    run(careful, 4000);
    EXPECT_NEAR(m_cycle->rates()[3].reached, 10.0, 0.5) << "now it tells the other";
    EXPECT_EQ(m_cycle->rates()[3].silent, 0);
    EXPECT_EQ(m_cycle->rates()[2].silent, m_guest->turns - before);
    EXPECT_LT(m_cycle->rates()[2].reached, 10.0);
}

TEST_F(PollGuestTest, AloneIsTimedByItsOwnTurns)
{
    wantGuest(5.0);
    m_guest->told = {resultOf(0x763, 0x10001)};
    run(careful, 3000);
    EXPECT_EQ(m_guest->turns, 15);
    EXPECT_NEAR(m_cycle->rates()[0].reached, 5.0, 0.01);
    m_guest->told.clear();
    run(careful, 1000);
    EXPECT_EQ(m_guest->turns, 18) << "three turns without a word, and a pause";
    EXPECT_EQ(m_cycle->rates()[0].silent, 3);
    EXPECT_LT(m_cycle->rates()[0].reached, 5.0) << "it falls while nothing comes";
}

TEST_F(PollGuestTest, SensorsArePausedAfterThreeFailuresInARow)
{
    want(0x0C);
    run(careful, 1500);
    EXPECT_EQ(m_proxy->count("01 0C"), 3);
    EXPECT_EQ(m_cycle->rates()[0].silent, 3);
    run(careful, 1000);
    EXPECT_EQ(m_proxy->count("01 0C"), 4) << "two seconds later it is tried again, once";
    m_cycle.reset();
    m_proxy->forgetRequests();
    for (int i = 0; i < 10; ++i) {
        m_proxy->answerOnce("01 0C", FakeProxy::Replies{});
        m_proxy->answerOnce("01 0C", FakeProxy::Replies{});
        m_proxy->answerOnce("01 0C", "41 0C 1A F8");
    }
    run(careful, 450);
    EXPECT_GE(m_proxy->count("01 0C"), 20) << "two in a row are no silence";
}

TEST_F(PollGuestTest, EachGuestHasRatesOfItsOwn)
{
    auto const second = std::make_shared<FakeGuest>(&m_clock);
    wantGuest(10.0);
    m_sources.push_back({nullptr, nullptr, 2.0, second});
    m_guest->told = {resultOf(0x763, 0x10002)};
    second->told = {resultOf(0x763, 0x10001)};
    run(careful, 3000);
    std::vector<PollRate> const rates = m_cycle->rates();
    ASSERT_EQ(rates.size(), 4U);
    EXPECT_EQ(rates[0].reached, 0.0);
    EXPECT_NEAR(rates[1].reached, 10.0, 0.5);
    EXPECT_NEAR(rates[2].reached, 2.0, 0.2);
    EXPECT_EQ(rates[3].reached, 0.0);
    EXPECT_EQ(rates[3].silent, second->turns);
}

TEST_F(PollGuestTest, AnEmptyReplyIsNone)
{
    want(0x0C);
    want(0x0D);
    m_proxy->answer("01 0C 0D", "");
    m_proxy->answer("01 0C", "41 0C 1A F8");
    m_proxy->answer("01 0D", "41 0D 50");
    run(fastSix, 240);
    EXPECT_EQ(m_proxy->count("01 0C 0D"), 3) << "the third in a row tells that they can't be asked together";
    EXPECT_GT(count(0x7E8, 0x0C), 5U);
}

TEST_F(PollGuestTest, NothingToAskIsWaitedForInPeace)
{
    run(careful, 0);
    EXPECT_EQ(m_cycle->wait(), std::chrono::seconds(2));
    m_cycle->step();
    EXPECT_EQ(m_proxy->count(), 0);
}

TEST_F(PollGuestTest, EachSensorIsAskedInItsTurnFromTheFirstOn)
{
    want(0x0C);
    want(0x0D);
    want(0x05);
    for (char const* const pid : {"0C", "0D", "05"}) {
        m_proxy->answer(std::string("01 ") + pid, (std::string("41 ") + pid + " 50 50").c_str());
    }
    run(careful, 150);
    std::string asked;
    for (auto const& each : m_proxy->requests()) {
        asked += each[1] == 0x0C ? 'a' : each[1] == 0x0D ? 'b' : 'c';
    }
    EXPECT_EQ(asked, "abcab");
}

TEST_F(PollGuestTest, InputsThatCameTogetherAreAsFreshAsOthers)
{
    want(obd::ParameterIdentifier::Torque);
    m_proxy->answer("01 0C", "41 0C 1A F8");
    m_proxy->answer("01 0D", "41 0D 50");
    m_proxy->answer("01 0C 0D", "41 0C 1A F8 0D 50");
    run(fastSix, 7000);
    std::size_t const told = count(0x7E8, obd::ParameterIdentifier::Torque);
    run(fastSix, 240);
    EXPECT_EQ(count(0x7E8, obd::ParameterIdentifier::Torque), told + 20);
    EXPECT_TRUE(m_results.back().readings.front().raw.empty()) << "it has no reply of its own";
}

TEST_F(PollGuestTest, InputsOfTheLastTurnAreNotThoseOfThis)
{
    want(obd::ParameterIdentifier::Torque);
    m_proxy->answer("01 0C", "41 0C 1A F8");
    m_proxy->answer("01 0D", "41 0D 50");
    m_proxy->answer("01 0C 0D", "41 0C 1A F8 0D 50");
    run(fastSix, 240);
    for (char const* const request : {"01 0C", "01 0D", "01 0C 0D"}) {
        m_proxy->fail(request, FakeProxy::Status::NoResponse);
    }
    std::size_t const told = count(0x7E8, obd::ParameterIdentifier::Torque);
    run(fastSix, 480);
    EXPECT_EQ(count(0x7E8, obd::ParameterIdentifier::Torque), told);
}

TEST_F(PollGuestTest, InputsThatAModuleLeavesOutAreAskedForAlone)
{
    want(obd::ParameterIdentifier::Torque);
    m_proxy->answer("01 0C", "41 0C 1A F8");
    m_proxy->answer("01 0D", "41 0D 50");
    m_proxy->answer("01 0C 0D", "41 0C 1A F8"); // an adapter that cuts the request after its first PID
    run(fastSix, 480);
    EXPECT_EQ(m_proxy->count("01 0C 0D"), 1);
    EXPECT_GT(count(0x7E8, obd::ParameterIdentifier::Torque), 15U);
    m_proxy->forgetRequests();
    m_proxy->fail("01 0C", FakeProxy::Status::NoResponse);
    run(fastSix, 30);
    EXPECT_EQ(m_proxy->count("01 0C"), m_proxy->count("01 0D")) << "each once a turn";
}

TEST_F(PollGuestTest, AReplyThatIsCutIsNoValue)
{
    want(0x0C);
    want(0x34);
    m_proxy->answer("01 0C", "41 0C 1A F8");
    m_proxy->answer("01 34", "41 34 80 00 80 00");
    run(careful, 100);
    std::size_t const told = count(0x7E8, 0x0C);
    for (char const* const cut : {"41 0C 1A", "41 0C", "41 0D 50 50"}) {
        m_proxy->answer("01 0C", cut);
        run(careful, 100);
        EXPECT_EQ(count(0x7E8, 0x0C), told) << cut;
    }
    std::size_t const currents = count(0x7E8, 0x34);
    m_proxy->answer("01 34", "41 34 80 00");
    run(careful, 100);
    EXPECT_EQ(count(0x7E8, 0x34), currents) << "half of two values";
}

// What a value keeps is of its own drive.
TEST_F(PollGuestTest, ValuesBeginAnewWithEachPoller)
{
    want(obd::ParameterIdentifier::BoostPressure);
    m_proxy->answer("01 0B", "41 0B C8");
    m_proxy->answer("01 33", "41 33 64");
    run(careful, 200);
    EXPECT_NEAR(std::stod(last(0x7E8, obd::ParameterIdentifier::BoostPressure)), 100.0, 1.0);
    m_cycle.reset();
    m_results.clear();
    m_proxy->answer("01 0B", "41 0B 65");
    run(careful, 40);
    EXPECT_NEAR(std::stod(last(0x7E8, obd::ParameterIdentifier::BoostPressure)), 1.0, 1.0) << "no mean with those";
}

TEST_F(PollGuestTest, TimesThatComeAsTextsAreNumbers)
{
    want(0x1F);
    want(0x1C);
    m_proxy->answer("01 1F", "41 1F 01 00");
    m_proxy->answer("01 1C", "41 1C 06");
    run(careful, 100);
    EXPECT_EQ(std::get<double>(m_results[0].readings[0].value), 256.0);
    EXPECT_TRUE(std::holds_alternative<std::string>(m_results[1].readings[0].value)) << "a standard's name";
}

TEST_F(PollGuestTest, ReadingsSayWithHowManyDigitsTheyAreTold)
{
    want(0x34);
    want(0x11);
    m_proxy->answer("01 34", "41 34 80 00 80 00");
    m_proxy->answer("01 11", "41 11 33");
    run(careful, 100);
    ASSERT_EQ(m_results.front().readings.size(), 2U);
    velmora::Reading const& ratio = m_results.front().readings[0];
    EXPECT_EQ(ratio.sensor, "PID_34_1");
    EXPECT_EQ(ratio.precision, 3);
    EXPECT_EQ(m_results.front().readings[1].precision, 2);
    EXPECT_NE(ratio.name.find(": "), std::string::npos) << ratio.name;
    EXPECT_NE(ratio.name, m_results.front().readings[1].name);
    EXPECT_EQ(m_results[1].readings[0].precision, 1);
    EXPECT_LT(std::chrono::system_clock::now() - ratio.time, std::chrono::minutes(1));
    obd::SensorValueDataModel const& throttle = *m_results[1].values.front();
    EXPECT_EQ(throttle.number, 20.0);
    EXPECT_EQ(throttle.statistics->count, 1U);
    EXPECT_EQ(throttle.statistics->minimum, 20.0);
}

// Fuel trims of a vehicle with four banks have two bytes, of others one.
TEST(PidLengths, OfFuelTrimsAreNotKnownWithFourBanks)
{
    auto const two = std::make_shared<FakeEcu>(0x7E8);
    auto const four = std::make_shared<FakeEcu>(0x7E9);
    two->setOxygenSensorBanks(obd::OxygenSensorBank::Pid13);
    four->setOxygenSensorBanks(obd::OxygenSensorBank::Pid1D);
    auto const guest = std::make_shared<FakeGuest>();
    velmora::PidLength const usual = velmora::pidLengths({{two, nullptr, {}, {}}, {nullptr, nullptr, {}, guest}});
    velmora::PidLength const wide = velmora::pidLengths({{two, nullptr, {}, {}}, {four, nullptr, {}, {}}});
    for (int const trim : {0x06, 0x07, 0x08, 0x09}) {
        EXPECT_TRUE(usual(static_cast<unsigned char>(trim))) << trim;
        EXPECT_FALSE(wide(static_cast<unsigned char>(trim))) << trim;
    }
    EXPECT_EQ(usual(0x0C), 2U);
    EXPECT_EQ(wide(0x0C), 2U);
    EXPECT_EQ(wide(0x05), 1U);
}

TEST(Poller, TellsItsGuestsThatItEnds)
{
    auto const guest = std::make_shared<FakeGuest>();
    {
        velmora::Poller const poller(std::make_shared<FakeProxy>(), {{nullptr, nullptr, 1.0, guest}}, careful,
                                     velmora::Units::Metric, [](velmora::PollResult const& /*result*/) {});
    }
    EXPECT_TRUE(guest->stopped);
}

} // namespace
