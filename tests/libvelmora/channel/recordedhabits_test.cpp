// The habits of real adapters and cars: each recorded dialogue is held again, by the channel, and what it met is told.

#include "libvelmora/channel/fastchannel.h"
#include "simulator/simulation.h"
#include "tests/libvelmora/channel/channelrig.h"
#include "tests/support/dialogue/dialoguefolder.h"
#include "tests/support/dialogue/recordeddialogue.h"
#include "tests/support/wire/peerwire.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>
#include <set>
#include <utility>

namespace velmora {

namespace {

// The bus is named first, so that frames are read as frames.
std::set<std::string> habitsOf(std::filesystem::path const& file)
{
    support::RecordedDialogue const dialogue = support::readDialogue(file);
    FastChannel channel(std::make_shared<support::PeerWire>(obdsim::replay(file.string())),
                        {.port = {}, .counting = false, .shortWait = false});
    std::string const& protocol = dialogue.header.at("protocol");
    std::vector<std::string> requests{"ATE0"};
    if (protocol != "0" && dialogue.header.at("headers") != "off") {
        requests.insert(requests.end(), {"ATTP" + protocol, "ATH1"});
    }
    for (support::Exchange const& exchange : dialogue.exchanges) {
        requests.push_back(exchange.request);
    }
    for (std::string const& request : requests) {
        bool const own = compactText(request).empty() || ElmCommand(request).monitors();
        if (!own) { // a CR alone, and what ends only when it is interrupted, the library never sends
            test::speak(channel, request, 10000);
        }
    }
    std::set<std::string> met;
    HabitCounts const counts = channel.statistics().habits;
    for (std::size_t i = 0; i < habitCount; ++i) {
        if (counts[i] != 0) {
            met.emplace(habitName(static_cast<Habit>(i)));
        }
    }
    return met;
}

TEST(RecordedHabits, AreMetAgain)
{
    using Row = std::pair<char const*, Habit>;
    for (auto const& [dialogue, habit] : {
             Row{"adapter-busy-at-first-command", Habit::AskedAgain},
             Row{"adapter-busy-at-first-command", Habit::Echo},
             Row{"adapter-clone-prompt-lost-after-echo-off", Habit::EmptyReply},
             Row{"adapter-clone-prompt-lost-after-echo-off", Habit::LostPrompt},
             Row{"adapter-falcon-2000-no-can", Habit::SettingsLost},
             Row{"adapter-falcon-2000-no-can", Habit::StrayBytes},
             Row{"can11-hyundai-i40-whole-session", Habit::Notice},
             Row{"can11-jaguar-2014-foreign-refusal", Habit::ForeignReply},
             Row{"can11-speed-extra-byte", Habit::Padding},
             Row{"can11-stopped-while-driving", Habit::SettingsLost},
             Row{"can29-pending-codes-stray-frames", Habit::ForeignReply},
             Row{"kwpfast-bmw-two-modules", Habit::BrokenLine},
         }) {
        std::filesystem::path const file =
            std::filesystem::path(support::dialogueFolder) / (std::string(dialogue) + ".dialogue");
        EXPECT_THAT(habitsOf(file), testing::Contains(std::string(habitName(habit)))) << dialogue;
    }
}

} // namespace

} // namespace velmora
