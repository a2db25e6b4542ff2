// Trouble codes as a user reads and clears them: offline, and against simulated cars of every bus family.

#include "tests/e2e/childprocess.h"
#include "tests/support/json/jsonschema.h"

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <algorithm>

namespace {

using e2e::ChildProcess;
using e2e::Outcome;
using e2e::runVelmora;

bool holds(std::string const& text, std::string const& part)
{
    return text.find(part) != std::string::npos;
}

TEST(TroubleCodes, ExplainedOfflineInAnyCaseAndWhatIsNoCodeIsTold)
{
    Outcome const outcome = runVelmora({"dtc", "p0420", "X1", "P"});
    EXPECT_EQ(outcome.exitCode, 2);
    EXPECT_EQ(outcome.out, "P0420  Generic        Catalyst System Efficiency Below Threshold Bank 1\n");
    EXPECT_TRUE(holds(outcome.err, "\"X1\", \"P\" are no trouble codes")) << outcome.err;
}

TEST(TroubleCodes, ListedByMakerAndWords)
{
    EXPECT_EQ(runVelmora({"dtc", "P1000", "--make", "ford"}).out,
              "P1000  Ford           OBD-II Monitor Testing Incomplete\n");
    Outcome const found = runVelmora({"dtc", "--search", "bank", "1", "efficiency", "CATALYST", "--make", "generic"});
    EXPECT_EQ(found.exitCode, 0);
    EXPECT_TRUE(found.out.starts_with("P0420  Generic ")) << found.out;
    EXPECT_EQ(runVelmora({"dtc", "--search", "flux", "capacitor"}).exitCode, 1);
    Outcome const unknown = runVelmora({"dtc", "--make", "Lada", "P1000"});
    EXPECT_EQ(unknown.exitCode, 2);
    EXPECT_TRUE(holds(unknown.err, "Alfa Romeo, Audi")) << unknown.err;
    EXPECT_EQ(runVelmora({"dtc"}).exitCode, 2);
}

TEST(TroubleCodes, DumpHasMakerCodeAndTextOfEveryRow)
{
    Outcome const dump = runVelmora({"dtc", "--dump"});
    EXPECT_EQ(dump.exitCode, 0);
    EXPECT_TRUE(dump.out.starts_with("Generic\tB0001\tDriver Frontal Stage 1 Deployment Control\n"));
    auto const rows = nlohmann::json::parse(runVelmora({"dtc", "--dump", "--json"}).out);
    EXPECT_EQ(static_cast<std::size_t>(std::count(dump.out.begin(), dump.out.end(), '\n')), rows.size());
}

struct Car
{
    char const* vehicle;
    // The codes of its first module, each behind a blank; "null" where it does not tell, as before CAN permanent ones.
    char const* confirmed;
    char const* pending;
    char const* permanent;
};

std::string codesOf(nlohmann::json const& list)
{
    if (list["codes"].is_null()) {
        return "null";
    }
    std::string codes;
    for (auto const& code : list["codes"]) {
        codes += " " + code["code"].get<std::string>();
        EXPECT_EQ(code["meanings"][0]["maker"], "Generic") << code;
        std::string const text = code["meanings"][0]["text"];
        EXPECT_TRUE(!text.empty() && text != "ISO/SAE Reserved") << code;
    }
    return codes;
}

class CodesOfCar : public testing::TestWithParam<Car>
{};

TEST_P(CodesOfCar, AreReadWithLampAndTexts)
{
    Outcome const outcome =
        runVelmora({"-q", "-p", std::string("sim:") + GetParam().vehicle + "?instant", "--json", "codes"});
    ASSERT_EQ(outcome.exitCode, 0) << outcome.err;
    support::expectValid(outcome.out, "codes");
    auto const module = nlohmann::json::parse(outcome.out)[0];
    EXPECT_EQ(module["lamp"], true);
    EXPECT_EQ(codesOf(module["confirmed"]), GetParam().confirmed);
    EXPECT_EQ(codesOf(module["pending"]), GetParam().pending);
    EXPECT_EQ(codesOf(module["permanent"]), GetParam().permanent);
}

INSTANTIATE_TEST_SUITE_P(EveryBus, CodesOfCar,
                         testing::Values(Car{"petrol-pwm", " P0171 P0174", "", "null"},
                                         Car{"petrol-vpw", " P0102 P0113 P0332 P0410 P0449", " P0102", "null"},
                                         Car{"petrol-iso9141", " P0300 P0302 P0303 P0304", " P0302", "null"},
                                         Car{"petrol-kwp-fast", " P0420", "", "null"},
                                         Car{"petrol-can11", " P0133 P0171", " P0300", " P0133"},
                                         Car{"diesel-can29", " P0299", " P0401 P2463", ""}));

TEST(TroubleCodes, OneKindMayBeAskedAlone)
{
    Outcome const outcome = runVelmora({"-q", "-p", "sim:petrol-can11?instant", "--json", "codes", "--confirmed"});
    ASSERT_EQ(outcome.exitCode, 0) << outcome.err;
    auto const module = nlohmann::json::parse(outcome.out)[0];
    EXPECT_TRUE(module.contains("confirmed"));
    EXPECT_FALSE(module.contains("pending"));
    EXPECT_FALSE(module.contains("permanent"));
}

TEST(TroubleCodes, RefusalAndSilenceAreToldPerModule)
{
    Outcome const kwp = runVelmora({"-q", "-p", "sim:petrol-kwp-fast?instant", "codes"});
    EXPECT_EQ(kwp.exitCode, 0);
    EXPECT_TRUE(holds(kwp.out, "Permanent      refused: service not supported (11)")) << kwp.out;
    EXPECT_TRUE(holds(kwp.out, "Pending        none stored")) << kwp.out;
    Outcome const permanent = runVelmora({"-q", "-p", "sim:petrol-iso9141?instant", "codes", "--permanent"});
    EXPECT_EQ(permanent.exitCode, 6);
    EXPECT_TRUE(holds(permanent.out, "Permanent      no answer")) << permanent.out;
}

TEST(TroubleCodes, FreezeFrameShowsCodeNamesAndUnits)
{
    Outcome const outcome = runVelmora({"-q", "-p", "sim:petrol-can11?instant", "freeze"});
    ASSERT_EQ(outcome.exitCode, 0) << outcome.err;
    EXPECT_TRUE(holds(outcome.out, "    P0133  Generic        O2 Sensor Circuit Slow Response")) << outcome.out;
    EXPECT_TRUE(holds(outcome.out, " rpm\n")) << outcome.out;
    EXPECT_TRUE(holds(outcome.out, "Control module 7E9: TCM\n  Freeze frame   0: none stored\n")) << outcome.out;
    EXPECT_EQ(runVelmora({"-p", "sim:petrol-can11?instant", "freeze", "256"}).exitCode, 2);
}

TEST(TroubleCodes, ClearingAsksAndPutsTheLampOut)
{
    ChildProcess simulator({"simulate", "--listen", "tcp://127.0.0.1:0", "--vehicle", "petrol-can11"});
    std::string const port = simulator.readLine();
    Outcome const unasked = runVelmora({"-q", "-p", port, "clear"});
    EXPECT_EQ(unasked.exitCode, 2);
    EXPECT_TRUE(holds(unasked.err, "--yes")) << unasked.err;
    EXPECT_EQ(runVelmora({"-q", "-p", port, "--ecu", "7E8", "-y", "clear"}).exitCode, 2);
    Outcome const before = runVelmora({"-q", "-p", port, "scan", "--check"});
    EXPECT_EQ(before.exitCode, 10);
    EXPECT_TRUE(holds(before.out, "Lamp           on")) << before.out;
    Outcome const cleared = runVelmora({"-q", "-p", port, "clear", "--yes"});
    EXPECT_EQ(cleared.exitCode, 0) << cleared.err;
    EXPECT_TRUE(holds(cleared.out, "Control module 7E8 ECM: cleared")) << cleared.out;
    auto const after = nlohmann::json::parse(runVelmora({"-q", "-p", port, "--json", "codes"}).out)[0];
    EXPECT_EQ(after["lamp"], false);
    EXPECT_TRUE(after["confirmed"]["codes"].empty());
    EXPECT_EQ(after["permanent"]["codes"][0]["code"], "P0133");
    Outcome const frame = runVelmora({"-q", "-p", port, "freeze"});
    EXPECT_EQ(frame.exitCode, 0) << frame.err;
    EXPECT_TRUE(holds(frame.out, "0: none stored\n")) << frame.out;
    EXPECT_FALSE(holds(frame.out, "P0133")) << frame.out;
}

TEST(TroubleCodes, RefusedClearingIsExitCodeSevenWithItsReason)
{
    Outcome const outcome = runVelmora({"-q", "-p", "sim:diesel-can29?instant", "clear", "--yes"});
    EXPECT_EQ(outcome.exitCode, 7);
    EXPECT_TRUE(holds(outcome.err, "18DAF110 refused to clear its codes: conditions not correct (22)")) << outcome.err;
    EXPECT_TRUE(holds(outcome.out, "18DAF118 TCM: cleared")) << outcome.out;
}

TEST(TroubleCodes, CheckOfACarWithoutCodesIsDone)
{
    Outcome const outcome = runVelmora({"-q", "-p", "sim:real-hyundai-i40?instant", "scan", "--check"});
    EXPECT_EQ(outcome.exitCode, 0) << outcome.err;
}

} // namespace
