#include "libvelmora/dash/dashclerk.h"
#include "libvelmora/output/valuetext.h"
#include "tests/support/temporaryfolder.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace {

using testing::UnorderedElementsAre;
using velmora::DashClerk;
using velmora::DashDesk;
using velmora::Json;

// What pages ask of a simulated car.
class DashClerkTest : public testing::Test
{
protected:
    DashClerkTest() : m_car(options(m_folder)), m_clerk(m_car, m_desk, "van")
    {
        DashDesk::Listener listener;
        listener.answer = [this](velmora::DashAnswer const& answer) { m_answers.push_back(answer); };
        listener.vehicle = [this](velmora::DashVehicle const& vehicle) { m_vehicles.push_back(vehicle); };
        m_listening = m_desk.listen(listener);
    }

    static velmora::SessionCarOptions options(testsupport::TemporaryFolder const& folder)
    {
        velmora::SessionCarOptions options;
        options.session.port = "sim:petrol-can11?instant";
        options.session.settingsFile = folder.file("settings.toml");
        options.vehicle = "van";
        options.sensors = {"RPM"};
        return options;
    }

    // The one answer to a question.
    Json answer(std::string const& topic, std::string const& text = "")
    {
        m_answers.clear();
        m_desk.ask({topic, text});
        m_outcome = m_clerk.serve();
        if (m_answers.size() != 1 || m_answers[0].topic != topic || !m_answers[0].done) {
            return {{"answers", m_answers.size()}, {"failed", m_answers.empty() ? Json() : m_answers[0].data}};
        }
        return m_answers[0].data;
    }

    testsupport::TemporaryFolder m_folder;
    velmora::SessionCar m_car;
    DashDesk m_desk;
    DashClerk m_clerk;
    std::vector<velmora::DashAnswer> m_answers;
    std::vector<velmora::DashVehicle> m_vehicles;
    std::shared_ptr<void> m_listening;
    DashClerk::Outcome m_outcome;
};

TEST_F(DashClerkTest, SaysThatThereIsNoLink)
{
    m_desk.ask({"codes", ""});
    m_desk.ask({"performance", "end"});
    DashClerk::Outcome const outcome = m_clerk.serve();
    EXPECT_FALSE(outcome.sensors);
    EXPECT_FALSE(outcome.cleared);
    ASSERT_EQ(m_answers.size(), 2U);
    for (velmora::DashAnswer const& each : m_answers) {
        EXPECT_FALSE(each.done);
        EXPECT_EQ(each.data, "There is no link to the car now");
    }
    EXPECT_EQ(m_answers[1].topic, "performance");
    EXPECT_TRUE(m_vehicles.empty());
}

// "7E8:RPM" of all that is read now.
std::vector<std::string> readSensors(velmora::SessionCar& car)
{
    std::vector<std::string> read;
    for (velmora::SensorEntry const& each : car.sensors().sensors) {
        read.push_back(velmora::moduleText(each.module) + ":" + each.sensor);
    }
    return read;
}

TEST_F(DashClerkTest, IntroducesEachConnectionOnce)
{
    m_car.connect();
    m_clerk.serve();
    m_clerk.serve();
    ASSERT_EQ(m_vehicles.size(), 1U);
    EXPECT_THAT(m_vehicles[0].key, testing::StartsWith("vehicle-")) << "by its number";
    auto const offers = [this](unsigned int module, char const* sensor) {
        return std::ranges::count_if(m_vehicles[0].offered, [&](velmora::SensorEntry const& each) {
            return each.module == module && each.sensor == sensor;
        });
    };
    EXPECT_EQ(offers(0x7E8, "RPM"), 1);
    EXPECT_EQ(offers(0x7E8, "THROTTLE_POS"), 1);
    EXPECT_EQ(offers(0x7E9, "RPM"), 1);
    EXPECT_EQ(offers(0x7E9, "THROTTLE_POS"), 0);
    m_car.disconnect();
    m_car.connect();
    m_desk.ask({"vehicle", ""});
    m_clerk.serve();
    EXPECT_EQ(m_vehicles.size(), 3U) << "and whenever it is asked for";
    EXPECT_TRUE(m_answers.empty());
}

TEST_F(DashClerkTest, AnswersWithWhatEachModuleTells)
{
    m_car.connect();
    Json const codes = answer("codes");
    ASSERT_EQ(codes.size(), 2U) << codes.dump();
    EXPECT_EQ(codes[0]["id"], "7E8");
    EXPECT_EQ(codes[0]["name"], "ECM");
    EXPECT_EQ(codes[0]["codes"]["confirmed"]["codes"][1]["code"], "P0171");
    EXPECT_EQ(codes[0]["codes"]["pending"]["codes"][0]["code"], "P0300");
    EXPECT_EQ(codes[0]["codes"]["permanent"]["codes"][0]["code"], "P0133");
    EXPECT_EQ(codes[0]["freeze"]["frame"], 0);
    EXPECT_EQ(codes[0]["freeze"]["freeze"]["code"]["code"], "P0133");
    EXPECT_EQ(codes[1]["id"], "7E9");
    EXPECT_TRUE(codes[1]["codes"]["confirmed"]["codes"].empty());
    Json const readiness = answer("readiness");
    EXPECT_EQ(readiness[0]["notComplete"], 2);
    EXPECT_EQ(readiness[1]["id"], "7E9");
    Json const monitors = answer("monitors");
    EXPECT_EQ(monitors[0]["id"], "7E8");
    EXPECT_FALSE(monitors[0].contains("ready"));
    EXPECT_FALSE(monitors[0]["monitors"].empty());
    EXPECT_FALSE(monitors[0]["monitors"][0]["tests"].empty());
    Json const info = answer("info");
    EXPECT_EQ(info[0]["vin"], "VELMRAS1MM0000001");
    EXPECT_EQ(info[1]["calibrations"][0]["id"], "VS-AT6-0111");
    EXPECT_EQ(answer("console", "ATI").dump(), R"({"command":"ATI","answered":true,"reply":"ELM327 v1.5"})");
    EXPECT_EQ(answer("console", "0100")["command"], "0100");
    EXPECT_FALSE(m_outcome.sensors || m_outcome.cleared);
    EXPECT_EQ(m_car.session()->obd().getEcuManager()->getCurrentEcu()->id(), 0x7E8U) << "as it was before";
}

TEST_F(DashClerkTest, ReadsWhatPagesWishBesides)
{
    m_car.connect();
    EXPECT_THAT(readSensors(m_car), UnorderedElementsAre("7E8:RPM", "7E8:SPEED")) << "trips need the speed";
    m_desk.ask({"sensors", "7E8/ENGINE_LOAD\n7E9/COOLANT_TEMP\nnothing\n"});
    EXPECT_TRUE(m_clerk.serve().sensors);
    EXPECT_THAT(readSensors(m_car),
                UnorderedElementsAre("7E8:RPM", "7E8:SPEED", "7E8:ENGINE_LOAD", "7E9:COOLANT_TEMP"));
    EXPECT_EQ(answer("performance", "begin"), "begun");
    EXPECT_TRUE(m_outcome.sensors);
    EXPECT_TRUE(m_desk.runs().isActive());
    EXPECT_THAT(readSensors(m_car), UnorderedElementsAre("7E8:RPM", "7E8:SPEED"))
        << "only these, so that they come often";
    EXPECT_EQ(answer("performance", "end"), "ended");
    EXPECT_FALSE(m_desk.runs().isActive());
    EXPECT_EQ(readSensors(m_car).size(), 4U);
    m_car.disconnect();
    EXPECT_EQ(answer("console", "ATI").at("failed"), "There is no link to the car now");
}

TEST_F(DashClerkTest, ClearsAndTellsOfEachModule)
{
    m_car.connect();
    Json const cleared = answer("clear");
    EXPECT_TRUE(m_outcome.cleared);
    ASSERT_EQ(cleared.size(), 2U);
    EXPECT_EQ(cleared[0].dump(), R"({"id":"7E8","name":"ECM","cleared":true,"result":"cleared","reason":null})");
    EXPECT_EQ(answer("codes")[0]["codes"]["confirmed"]["codes"].size(), 0U);
}

} // namespace
