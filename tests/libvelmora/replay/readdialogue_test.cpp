#include "libvelmora/replay/readdialogue.h"
#include "libvelmora/replay/recordingfile.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

#include <fstream>
#include <sstream>

namespace {

using velmora::Recording;

constexpr char const* dialogueHead = "vehicle: made up\nadapter: ELM327 v1.5\nprotocol: 6\nheaders: on\n\n"
                                     "-> 0100\n<- 7E8 06 41 00 BE 1F A8 12\\r\\r>\n";

std::optional<Recording> dialogueOf(std::string const& turns)
{
    testsupport::TemporaryFolder const folder;
    std::string const file = folder.file("car.dialogue");
    std::ofstream(file) << dialogueHead << turns;
    EXPECT_EQ(velmora::formOf(file), velmora::RecordingForm::Dialogue);
    velmora::SessionOptions options;
    options.port = "replay:" + file + "?instant";
    options.settingsFile = folder.file("settings.toml");
    return velmora::readDialogue(file, [&options] { return std::make_shared<velmora::Session>(options); });
}

// "500=1726 2000=1750 "
std::string valuesOf(Recording const& recording, std::string const& sensor)
{
    std::ostringstream text;
    for (velmora::RecordedSensor const& each : recording.sensors) {
        for (velmora::RecordedValue const& value :
             each.about.sensor == sensor ? each.values : decltype(each.values)()) {
            text << value.time << '=' << std::get<double>(value.value) << ' ';
        }
    }
    return text.str();
}

TEST(DialogueRecording, HasEachValueWhenItsReplyWasWhole)
{
    std::optional<Recording> const recording =
        dialogueOf("-> 010C 1\n.. 300\n<- 7E8 04 41 0C\\x20\n.. 200\n<- 1A F8\\r\\r>\n"
                   "-> 010D\n.. 250\n<- 7E8 03 41 0D 32\\r\\r>\n"
                   "-> 010C\n.. 1250\n<- 7E8 04 41 0C 1B 58\\r\\r>\n"
                   "-> 010D\n.. 40\n<- 7E8 03 7F 01 12\\r\\r>\n"
                   "-> 010C\n.. 60\n<- NO DATA\\r\\r>\n"
                   "-> 010C0D\n.. 100\n<- 7E8 06 41 0C 1C 20 0D 33\\r\\r>\n");
    ASSERT_TRUE(recording);
    EXPECT_EQ(valuesOf(*recording, "RPM"), "500=1726 2000=1750 2200=1800 ");
    EXPECT_EQ(valuesOf(*recording, "SPEED"), "750=50 2200=51 ") << "nothing of what was refused";
    EXPECT_EQ(recording->begin, 500);
    EXPECT_EQ(recording->end, 2200);
    EXPECT_FALSE(recording->dated);
    EXPECT_EQ(recording->sensors.at(0).about.module, 0x7E8U);
    EXPECT_EQ(recording->sensors.at(0).about.unit, "rpm");
}

// The channel asks again by itself, and gets the reply that was recorded for the same.
TEST(DialogueRecording, AReplyThatWasAskedForTwiceIsTakenOnce)
{
    std::optional<Recording> const recording = dialogueOf("-> 010C\n.. 100\n<- 7E8 04 41 0C 1A\\r\\r>\n"
                                                          "-> 010C\n.. 100\n<- 7E8 04 41 0C 1A F8\\r\\r>\n"
                                                          "-> 010C\n.. 1000\n<- 7E8 04 41 0C 1B 58\\r\\r>\n");
    ASSERT_TRUE(recording);
    EXPECT_EQ(valuesOf(*recording, "RPM"), "100=1726 1200=1750 ");
}

TEST(DialogueRecording, WithoutTimesIsNone)
{
    EXPECT_FALSE(dialogueOf("-> 010C\n<- 7E8 04 41 0C 1A F8\\r\\r>\n-> 010C\n<- 7E8 04 41 0C 1B 58\\r\\r>\n"));
    EXPECT_FALSE(dialogueOf("-> 03\n.. 500\n<- 7E8 02 43 00\\r\\r>\n")) << "no values at all";
    EXPECT_THROW(dialogueOf("-- 010C\n"), velmora::Error);
    testsupport::TemporaryFolder const folder;
    std::ofstream(folder.file("car.dialogue")) << dialogueHead
                                               << "-> 0120\n<- 7E8 06 41 20 80 00 00 00\\r\\r>\n-> 01\n"
                                                  "<- NO DATA\\r\\r>\n";
    EXPECT_FALSE(velmora::readDialogue(folder.file("car.dialogue"), []() -> std::shared_ptr<velmora::Session> {
        ADD_FAILURE() << "nothing is opened for a dialogue that holds no values, but only what there would be";
        return nullptr;
    }));
}

} // namespace
