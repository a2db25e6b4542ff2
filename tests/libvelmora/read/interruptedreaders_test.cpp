// How soon the readers of single topics end when they are told to, and whose module is the current one then.
#include "libvelmora/read/codeclearing.h"
#include "libvelmora/read/codereader.h"
#include "libvelmora/read/diagnosticreaders.h"
#include "libvelmora/read/freezereader.h"
#include "libvelmora/read/groupedpids.h"
#include "libvelmora/read/modulereader.h"
#include "libvelmora/read/routinereader.h"
#include "libvelmora/read/valuesreader.h"
#include "tests/libvelmora/read/readersfixture.h"

#include <obd/iecumanager.h>
#include <velmora/error.h>

#include <algorithm>

namespace velmora {

namespace {

using test::ReadersTest;
using InterruptedRead = std::function<void(Session& session, obd::IEcu const& ecu)>;

class InterruptedReaders : public ReadersTest
{
protected:
    // How many requests a reader makes if it is told to end during one of these.
    std::string requestsUntilTheEnd(std::string const& vehicle, std::vector<std::size_t> const& during,
                                    InterruptedRead const& read)
    {
        std::string text;
        for (std::size_t const at : during) {
            connect(vehicle);
            m_stopAt = at;
            try {
                read(*m_session, module());
                ADD_FAILURE() << vehicle << ": it went on to its end";
            } catch (Error const& error) {
                EXPECT_EQ(error.kind(), ErrorKind::Interrupted);
            }
            text += (text.empty() ? "" : " ") + std::to_string(m_asked.size());
        }
        return text;
    }
};

// What is on its way comes to its end: a question of the library may take several requests.
TEST_F(InterruptedReaders, AskForNothingMoreThanWhatTheyAreAt)
{
    EXPECT_EQ(requestsUntilTheEnd("petrol-can11", {1, 4, 5}, [](auto& s, auto& e) { readFreeze(s, e, 0); }), "3 4 5");
    EXPECT_EQ(requestsUntilTheEnd("bench-can11", {1, 2, 3}, [](auto& s, auto& e) { readReadiness(s, e); }), "1 2 4");
    EXPECT_EQ(requestsUntilTheEnd("bench-can11", {1, 2, 3, 4, 5}, [](auto& s, auto& e) { readInfo(s, e); }),
              "1 2 3 4 5");
    EXPECT_EQ(requestsUntilTheEnd("petrol-can11", {5, 7}, [](auto& s, auto& e) { readInfo(s, e); }), "5 7");
    EXPECT_EQ(
        requestsUntilTheEnd("bench-can11", {1, 2, 4},
                            [](auto& s, auto& e) {
                                CodeReader(s).read(e, {CodeKind::Confirmed, CodeKind::Pending, CodeKind::Permanent});
                            }),
        "1 2 4");
    EXPECT_EQ(requestsUntilTheEnd("petrol-iso9141", {1, 2, 6}, [](auto& s, auto& e) { readOxygen(s, e); }), "1 5 7");
    EXPECT_EQ(requestsUntilTheEnd("bench-can11", {1, 3},
                                  [](auto& s, auto& e) {
                                      auto const bus = std::make_shared<GroupedPids>(s.proxy(), e.id());
                                      std::vector<LiveValue> values = readValues(s, e, bus);
                                      readValuesAgain(s, e, bus, values);
                                  }),
              "2 3");
    EXPECT_EQ(requestsUntilTheEnd(
                  "petrol-iso9141", {1, 2},
                  [](auto& s, auto& e) { readValues(s, e, std::make_shared<GroupedPids>(s.proxy(), e.id())); }),
              "1 2");
    EXPECT_EQ(requestsUntilTheEnd("petrol-can11", {1}, [](auto& s, auto& e) { readCounters(s, e); }), "1");
    EXPECT_EQ(requestsUntilTheEnd("petrol-can11", {1}, [](auto& s, auto&) { clearCodes(s); }), "1");
    EXPECT_EQ(requestsUntilTheEnd("petrol-can11", {1}, [](auto& s, auto& e) { runRoutine(s, e, {1, "", ""}); }), "1");
}

// Whoever was it before.
TEST_F(InterruptedReaders, MakeTheirModuleTheCurrentOne)
{
    connect("petrol-can11");
    obd::IEcuManager& manager = *m_session->obd().getEcuManager();
    std::pair<char const*, InterruptedRead> const readers[] = {
        {"freeze", [](auto& s, auto& e) { readFreeze(s, e, 0); }},
        {"readiness", [](auto& s, auto& e) { readReadiness(s, e); }},
        {"info", [](auto& s, auto& e) { readInfo(s, e); }},
        {"vin", [](auto& s, auto& e) { readVin(s, e); }},
        {"counters", [](auto& s, auto& e) { readCounters(s, e); }},
        {"monitors", [](auto& s, auto& e) { readMonitors(s, e); }},
        {"oxygen", [](auto& s, auto& e) { readOxygen(s, e); }},
        {"codes", [](auto& s, auto& e) { CodeReader(s).read(e, {CodeKind::Pending}); }},
        {"routines", [](auto& s, auto& e) { readRoutines(s, e); }},
        {"routine",
         [](auto& s, auto& e) {
             runRoutine(s, e, {1, "", ""});
         }},
    };
    for (auto const& [name, read] : readers) {
        manager.setCurrentEcu(0x7E8);
        read(*m_session, module(1));
        EXPECT_EQ(manager.getCurrentEcu()->id(), 0x7E9U) << name;
    }
}

TEST_F(InterruptedReaders, DoNotBeginTheNextModule)
{
    Session& session = connect("petrol-can11");
    int read = 0;
    EXPECT_THROW(readModules(session,
                             [&read](Session& each, obd::IEcu const& /*ecu*/) {
                                 each.interrupt();
                                 return ++read;
                             }),
                 Error);
    EXPECT_EQ(read, 1);
}

} // namespace

} // namespace velmora
