// What a probe asks, takes down and keeps.
#include "libvelmora/uds/identifierprobe.h"
#include "tests/support/modulebench.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <fmt/format.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

namespace velmora {

namespace {

using testing::ElementsAre;
using testing::Pair;

// A module 7E0 of a vehicle that stands, with ten identifiers of interest from F100 on.
class ProbeStateTest : public testing::Test
{
protected:
    ProbeStateTest()
    {
        m_state.task = {"7E0", "7E8", {}, 0x22, 0xF100, 0xF103};
        m_bench.answer("01 0D", "41 0D 00");
    }

    void answer(unsigned int id, std::string const& frame)
    {
        m_bench.module("7E0", fmt::format("22{:04X}", id), {frame});
    }
    // Its message, or "done".
    std::string run()
    {
        IdentifierProbe probe(
            m_asker, [this] { m_check(); }, [this](ProbeState const& state) { m_saved = state; },
            [](ProbeState const& /*state*/) {});
        try {
            probe.run(m_state);
        } catch (Error const& error) {
            return error.what();
        }
        return "done";
    }

    support::FakeClock m_clock;
    support::ModuleBench m_bench{&m_clock};
    ModuleAsker m_asker{m_bench, m_bench};
    ProbeState m_state;
    std::optional<ProbeState> m_saved;
    std::function<void()> m_check = [] {};
};

TEST_F(ProbeStateTest, TellsRefusalsForGoodFromThoseForNow)
{
    m_state.task.to = 0xF109;
    answer(0xF100, "7E80462F10001");
    unsigned int id = 0xF101;
    for (char const* const code : {"21", "22", "78", "33", "7F", "31", "14", "10"}) {
        answer(id, "7E8037F22" + std::string(code));
        ++id;
    }
    EXPECT_EQ(run(), "done");
    EXPECT_THAT(m_state.later, ElementsAre(Pair(0xF101U, 0x21), Pair(0xF102U, 0x22), Pair(0xF103U, 0x78)));
    EXPECT_THAT(m_state.locked, ElementsAre(Pair(0xF104U, 0x33), Pair(0xF105U, 0x7F)));
    EXPECT_EQ(m_state.told.size(), 1U);
    EXPECT_TRUE(m_state.done);
}

TEST_F(ProbeStateTest, AsksFiveTimesASecondWhateverTheAnswersTake)
{
    answer(0xF100, "7E80462F10001");
    unsigned int const start = m_clock.millis();
    EXPECT_EQ(run(), "done");
    EXPECT_EQ(m_clock.millis() - start, 4U * 200 + 20) << "four, and the first once more; an exchange takes 20 ms";
    m_state.next = 0xF100;
    m_check = [this] { m_clock.advance(700); };
    unsigned int const again = m_clock.millis();
    EXPECT_EQ(run(), "done");
    EXPECT_EQ(m_clock.millis() - again, 4U * 720) << "who took longer already does not wait";
}

TEST_F(ProbeStateTest, EndsEarlyWhereTheModuleDoesNotKnowTheService)
{
    struct Row
    {
        std::vector<std::string> codes; // of the refusals from the first identifier on; empty: an answer
        std::string outcome;
    };
    std::string const absent = "does not know service 22: Service Not Supported";
    std::string const wrong = "does not know service 22: Incorrect Message Length or Invalid Format";
    std::vector<Row> const rows = {{{"11"}, absent},
                                   {{"13"}, wrong},
                                   {{"31"}, "done"},
                                   {{"31", "31", "31", "11"}, absent},
                                   {{"31", "31", "31", "31", "11"}, "done"},
                                   {{"", "11"}, "done"},
                                   {{"", "13"}, "done"}};
    for (std::size_t i = 0; i < rows.size(); ++i) {
        std::string const header = fmt::format("7E{}", i);
        std::string const reply = fmt::format("7E{:X}", i + 8);
        unsigned int id = 0xF100;
        for (std::string const& code : rows[i].codes) {
            m_bench.module(header, fmt::format("22{:04X}", id),
                           {reply + (code.empty() ? fmt::format("0462{:04X}01", id) : "037F22" + code)});
            ++id;
        }
        m_state = {};
        m_state.task = {header, reply, {}, 0x22, 0xF100, 0xF104};
        std::string const outcome = run();
        EXPECT_EQ(outcome.substr(outcome.find("does") == std::string::npos ? 0 : outcome.find("does")), rows[i].outcome)
            << i;
        EXPECT_EQ(m_state.done, rows[i].outcome == "done");
    }
}

TEST_F(ProbeStateTest, LooksAgainOnlyAtWhatItHasNotSeenTwice)
{
    answer(0xF100, "7E80462F10009");
    answer(0xF101, "7E80462F10109");
    m_state.next = 0xF104;
    m_state.told = {{0xF100, {9}}, {0xF101, {9}}};
    m_state.second = {{0xF100, {8}}};
    EXPECT_EQ(run(), "done");
    EXPECT_THAT(m_bench.takeAsked(), ElementsAre("7E0 22F101"));
    EXPECT_THAT(m_state.second, ElementsAre(Pair(0xF100U, ElementsAre(8)), Pair(0xF101U, ElementsAre(9))));
    m_state.second.clear();
    m_check = [] { throw Error(ErrorKind::Interrupted, "Interrupted"); };
    EXPECT_EQ(run(), "Interrupted") << "the second look ends as the first does";
    m_check = [] {};
    m_state.told.clear();
    for (unsigned int id = 0xF110; id < 0xF114; ++id) {
        m_state.told[id] = {1};
        answer(id, "CAN ERROR");
    }
    EXPECT_EQ(run(), "The adapter tells trouble on the bus, again and again: the requests of a probe");
    m_bench.answer("01 0D", "41 0D 05");
    m_state = {};
    m_state.task = {"7E0", "7E8", {}, 0x22, 0xF100, 0xF103};
    m_bench.takeAsked();
    EXPECT_EQ(run(), "The vehicle moves (5 km/h)");
    EXPECT_TRUE(m_bench.takeAsked().empty());
}

TEST_F(ProbeStateTest, KeepsWhatItHasWhereverItBegan)
{
    m_state.task.from = 0xF103;
    m_state.task.to = 0xF116;
    answer(0xF103, "7E80462F10309");
    int left = 17;
    m_check = [&left] {
        if (left-- == 0) {
            throw std::logic_error("no end of its own");
        }
    };
    IdentifierProbe probe(
        m_asker, m_check,
        [this](ProbeState const& state) {
            if (!m_saved) {
                m_saved = state;
            }
        },
        [](ProbeState const& /*state*/) {});
    EXPECT_THROW(probe.run(m_state), std::logic_error);
    EXPECT_EQ(m_saved->next, 0xF113U) << "behind the sixteenth";
    EXPECT_EQ(m_state.next, 0xF114U);
}

TEST_F(ProbeStateTest, MakesSignalsThatAskTheSameModuleTheSame)
{
    m_state.told = {{0xF190, {1, 2}}};
    Signal const signal = toSignalFile(m_state).signals.at(0);
    EXPECT_EQ(signal.header, "7E0");
    EXPECT_EQ(signal.request, (std::vector<unsigned char>{0x22, 0xF1, 0x90}));
    EXPECT_EQ(signal.reply, "");
    EXPECT_EQ(toJsonValue(m_state)["told"][0]["changes"], false) << "it was seen once only";
}

TEST(ProbeStore, KeepsAFileForPeopleToRead)
{
    testsupport::TemporaryFolder const folder;
    ProbeState state;
    state.task = {"6F1", "607", 0x07, 0x22, 0xF100, 0xF103};
    state.vin = "VELMRAS1M60000022";
    state.next = 0xF101;
    state.told = {{0xF100, {1, 2}}};
    state.locked = {{0x0101, 0x33}};
    ProbeStore const store(folder.file("probe.json"));
    store.save(state);
    EXPECT_EQ(folder.read("probe.json"), R"({
  "module": "6F1",
  "reply": "607",
  "ext": "07",
  "service": 34,
  "from": 61696,
  "to": 61699,
  "vin": "VELMRAS1M60000022",
  "next": 61697,
  "told": {
    "F100": "0102"
  },
  "locked": {
    "0101": "33"
  },
  "later": {},
  "second": {}
}
)");
    std::filesystem::create_directories(folder.path() / "taken" / "inside");
    EXPECT_THROW(ProbeStore(folder.file("taken")).save(state), Error) << "there is a folder of that name";
    EXPECT_FALSE(ProbeStore(folder.file("taken")).load());
    std::filesystem::create_symlink("/dev/full", folder.file("full.json.new"));
    EXPECT_THROW(ProbeStore(folder.file("full.json")).save(state), Error);
    EXPECT_FALSE(std::filesystem::exists(folder.path() / "full.json"));
}

TEST(ProbeStore, TakesWhatIsOddInItsFileForNotThere)
{
    testsupport::TemporaryFolder const folder;
    ProbeStore const store(folder.file("probe.json"));
    auto const load = [&](char const* text) {
        std::ofstream(folder.file("probe.json")) << text;
        return store.load();
    };
    EXPECT_FALSE(load("[7]"));
    EXPECT_FALSE(load(R"({"told": {}})")) << "what to ask next is missing";
    ProbeTask const nothing{"", "", {}, 0, 0, 0};
    for (char const* const odd :
         {R"({"next": 0})",
          R"({"next": "x", "module": 5, "reply": [], "ext": "0708", "service": "22", "from": -1, "to": 1.5, "vin": 1,
              "told": [1], "locked": {"F187": "3344", "F188": ""}, "later": 7})"}) {
        std::optional<ProbeState> const state = load(odd);
        ASSERT_TRUE(state) << odd;
        EXPECT_EQ(state->task, nothing);
        EXPECT_EQ(state->vin, "");
        EXPECT_EQ(state->next, 0U);
        EXPECT_TRUE(state->told.empty() && state->locked.empty() && state->later.empty() && state->second.empty());
    }
    EXPECT_FALSE(load(R"({"next": 0, "ext": "zz"})")->task.extended);
    EXPECT_EQ(load(R"({"next": 0, "ext": "2A", "service": 289})")->task.extended, 0x2A);
    EXPECT_EQ(load(R"({"next": 0, "service": 289})")->task.service, 0x21);
}

} // namespace

} // namespace velmora
