// What pages ask of cars that have no answer: others that break off, and cars that lack what a question needs.
#include "libvelmora/dash/dashclerk.h"
#include "libvelmora/output/valuetext.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace {

using velmora::DashAnswer;
using velmora::DashClerk;
using velmora::DashDesk;
using velmora::Json;

struct ClerkRig
{
    testsupport::TemporaryFolder folder;
    DashDesk desk;
    velmora::SessionCar car;
    DashClerk clerk;
    std::vector<DashAnswer> answers;
    std::vector<std::string> keys; // of the vehicles that were introduced
    std::shared_ptr<void> listening;

    explicit ClerkRig(std::string const& port) : car(options(port, folder)), clerk(car, desk, "van")
    {
        DashDesk::Listener listener;
        listener.answer = [this](DashAnswer const& answer) { answers.push_back(answer); };
        listener.vehicle = [this](velmora::DashVehicle const& vehicle) { keys.push_back(vehicle.key); };
        listening = desk.listen(listener);
    }

    static velmora::SessionCarOptions options(std::string const& port, testsupport::TemporaryFolder const& folder)
    {
        velmora::SessionCarOptions options;
        options.session.port = port;
        options.session.settingsFile = folder.file("settings.toml");
        options.vehicle = "van";
        options.sensors = {"SPEED"};
        return options;
    }

    // "done: begun" or "not: why".
    std::string ask(std::string const& topic, std::string const& text)
    {
        answers.clear();
        desk.ask({topic, text});
        DashClerk::Outcome const outcome = clerk.serve();
        EXPECT_FALSE(outcome.cleared);
        return answers.size() != 1 ? std::to_string(answers.size())
                                   : (answers[0].done ? "done: " : "not: ") + velmora::dumpedJson(answers[0].data);
    }
};

TEST(DashClerkEdges, NeedsBothSpeedsToTimeRuns)
{
    ClerkRig rig("sim:electric-can11?instant");
    rig.car.connect();
    EXPECT_EQ(rig.ask("performance", "begin"), "not: \"No module tells both speed and engine speed\"");
    EXPECT_FALSE(rig.desk.runs().isActive());
    EXPECT_EQ(rig.ask("console", "ATQQ"), R"(done: {"command":"ATQQ","answered":false,"reply":""})");
    EXPECT_EQ(rig.ask("console", "ATRV"), R"(done: {"command":"ATRV","answered":true,"reply":"14.1V"})");
    EXPECT_EQ(rig.ask("console", "220110"), R"(done: {"command":"220110","answered":true,"reply":"7EC037F2233"})");
}

TEST(DashClerkEdges, EndsRunsThoughTheLinkIsGone)
{
    ClerkRig rig("sim:petrol-can11?instant");
    rig.car.connect();
    EXPECT_EQ(rig.ask("performance", "begin"), "done: \"begun\"");
    EXPECT_THAT(rig.keys, testing::ElementsAre(testing::StartsWith("vehicle-")));
    rig.car.disconnect();
    std::string const none = "not: \"There is no link to the car now\"";
    EXPECT_EQ(rig.ask("performance", "begin"), none);
    EXPECT_EQ(rig.ask("console", "end"), none);
    EXPECT_TRUE(rig.desk.runs().isActive()) << "neither of which ends them";
    EXPECT_EQ(rig.ask("performance", "end"), none);
    EXPECT_FALSE(rig.desk.runs().isActive());
}

// P1131 has a meaning with each maker, and the number names Ford.
TEST(DashClerkEdges, GivesCodesAndFrameTheMakersMeaning)
{
    testsupport::TemporaryFolder const folder;
    std::ofstream(folder.file("car.toml")) << "name = \"a car\"\nprotocol = 6\n[engine]\nfuel = \"petrol\"\n"
                                              "[[module]]\nid = \"7E8\"\nstored = [\"P1131\"]\n"
                                              "live = \"04 05 0C 0D\"\n[[module.frames]]\nnumber = 0\n"
                                              "code = \"P1131\"\ntaken_at = 1.5\npids = \"04 05\"\n[module.info]\n"
                                              "vin = \"1FTEX1C85AF000001\"\n";
    ClerkRig rig("sim:" + folder.file("car.toml") + "?instant");
    rig.car.connect();
    EXPECT_EQ(rig.ask("codes", "").substr(0, 4), "done");
    Json const module = rig.answers.at(0).data.at(0);
    EXPECT_EQ(module["codes"]["maker"]["name"], "Ford");
    EXPECT_EQ(module["codes"]["confirmed"]["codes"][0]["meaning"]["maker"], "Ford");
    EXPECT_EQ(module["freeze"]["freeze"]["code"]["meaning"]["maker"], "Ford") << module.dump();
}

TEST(DashClerkEdges, BreaksOffWhenTheUserWantsAnEnd)
{
    for (char const* const topic : {"codes", "info"}) {
        ClerkRig rig("sim:petrol-can11?instant");
        rig.car.connect();
        rig.clerk.serve();
        rig.car.session()->interrupt();
        rig.desk.ask({topic, ""});
        try {
            rig.clerk.serve();
            ADD_FAILURE() << topic << ": " << (rig.answers.empty() ? "" : rig.answers[0].data.dump());
        } catch (velmora::Error const& error) {
            EXPECT_EQ(error.kind(), velmora::ErrorKind::Interrupted) << topic;
        }
        EXPECT_TRUE(rig.answers.empty()) << "what was cut short is no answer";
    }
}

} // namespace
