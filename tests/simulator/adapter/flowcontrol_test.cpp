// What a first frame promises, and upon which flow control the rest comes.
#include "simulator/adapter/flowcontrol.h"

#include <gtest/gtest.h>

namespace {

using obdsim::Bytes;

TEST(FlowControl, aFirstFramePromisesFrames)
{
    struct Promise
    {
        Bytes data;
        bool extended;
        std::size_t frames;
    };
    for (auto const& each : {Promise{{0x10, 6}, false, 0},
                             {{0x10, 7}, false, 1},
                             {{0x10, 13}, false, 1},
                             {{0x10, 14}, false, 2},
                             {{0x10, 20}, false, 2},
                             {{0x10, 21}, false, 3},
                             {{0x11, 0x2C}, false, 42},
                             {{0xF1, 0x10, 5}, true, 0},
                             {{0xF1, 0x10, 6}, true, 1},
                             {{0xF1, 0x10, 11}, true, 1},
                             {{0xF1, 0x10, 12}, true, 2},
                             {{0x10}, false, 0},
                             {{0xF1, 0x10}, true, 0}}) {
        obdsim::Frame frame;
        frame.data = each.data;
        EXPECT_EQ(obdsim::promisedFrames(frame, each.extended), each.frames) << obdsim::hexText(each.data);
    }
}

TEST(FlowControl, aModuleHeedsWhatComesToIt)
{
    obdsim::Protocol const& bus = *obdsim::findProtocol(6);
    obdsim::ModuleData module;
    module.id = 0x7E8;
    obdsim::Settings settings;
    EXPECT_EQ(obdsim::allowedFrames(bus, settings, module), 0xFFF) << "all of a message, whatever its length";
    settings.flowControl = false;
    EXPECT_EQ(obdsim::allowedFrames(bus, settings, module), 0);
    settings.flowControl = true;
    settings.flowMode = 2;
    settings.flowData = {0x30};
    EXPECT_EQ(obdsim::allowedFrames(bus, settings, module), 0) << "to the identifier of the reply";
    module.request = 0x7E8;
    EXPECT_EQ(obdsim::allowedFrames(bus, settings, module), 0xFFF) << "which this one listens to";
    settings.flowData = {0x30, 2};
    EXPECT_EQ(obdsim::allowedFrames(bus, settings, module), 2);
    settings.flowData = {0x32, 2};
    EXPECT_EQ(obdsim::allowedFrames(bus, settings, module), 0) << "overflow";
    module.request.reset();
    module.address = 0x07;
    settings.flowMode = 1;
    settings.flowHeader = 0x7E0;
    for (auto const& [data, frames] : {std::pair{Bytes{0x07, 0x30}, 0xFFF},
                                       {Bytes{0x07, 0x30, 1}, 1},
                                       {Bytes{0x30}, 0},
                                       {Bytes{0x06, 0x30}, 0},
                                       {Bytes{0x07}, 0}}) {
        settings.flowData = data;
        EXPECT_EQ(obdsim::allowedFrames(bus, settings, module), frames) << obdsim::hexText(data);
    }
    obdsim::ModuleData wide;
    wide.id = 0x18DAF110;
    EXPECT_EQ(obdsim::allowedFrames(*obdsim::findProtocol(7), obdsim::Settings(), wide), 0xFFF);
    wide.id = 0x18DB10F1;
    wide.request = 0x18DB10F1;
    EXPECT_EQ(obdsim::allowedFrames(*obdsim::findProtocol(7), obdsim::Settings(), wide), 0xFFF)
        << "no module of OBD: to its own identifier";
}

} // namespace
