#include "libvelmora/session/openingfailure.h"
#include "libvelmora/session/openingwatch.h"

#include <gtest/gtest.h>

namespace {

class OpeningWatchTest : public testing::Test
{
protected:
    static std::vector<unsigned char> bytes(std::string const& text) { return {text.begin(), text.end()}; }
    void send(std::string const& command) { m_watch.onDataSent(bytes(command + "\r")); }
    void receive(std::string const& message) { m_watch.onDataReceived(bytes(message)); }

    velmora::OpeningWatch m_watch;
};

TEST_F(OpeningWatchTest, TellsThePhasesInTheirOrder)
{
    EXPECT_EQ(m_watch.phase(), "");
    send("ATI");
    EXPECT_EQ(m_watch.unanswered(), "ATI");
    receive(std::string("ATI\r\0ELM327 v1.5\r\r", 18));
    EXPECT_EQ(m_watch.phase(), "ELM327 v1.5 answered") << "neither its echo nor zero bytes";
    EXPECT_EQ(m_watch.identification(), "ELM327 v1.5");
    send("ATTP6");
    EXPECT_EQ(m_watch.phase(), "Trying protocol 6");
    receive("OK\r\r");
    send("0100");
    receive("UNABLE TO CONNECT\r\r");
    EXPECT_EQ(m_watch.phase(), "Trying protocol 6");
    send("AT TP 0");
    EXPECT_EQ(m_watch.phase(), "Searching for the bus");
    send("ATSPA");
    EXPECT_EQ(m_watch.phase(), "Trying protocol A");
    EXPECT_EQ(m_watch.unanswered(), "ATSPA");
}

TEST_F(OpeningWatchTest, KnowsRepliesWithoutHeaders)
{
    send("ATH1");
    receive("41 00 OK\r\r");
    EXPECT_FALSE(m_watch.headersMissing());
    send("0100");
    receive("SEARCHING...\r7E8 06 41 00 BE 3F A8 13 \r\r");
    EXPECT_FALSE(m_watch.headersMissing());
    send("0100");
    receive("SEARCHING...\r41 00 BE 3F A8 13 \r\r");
    EXPECT_TRUE(m_watch.headersMissing());
}

TEST_F(OpeningWatchTest, OnlyTheFirstIdentificationCounts)
{
    send("ATI");
    receive("ELM327 v1.5\r\r");
    send("ATI");
    receive("?\r\r");
    EXPECT_EQ(m_watch.identification(), "ELM327 v1.5");
    EXPECT_EQ(m_watch.unanswered(), "");
}

TEST_F(OpeningWatchTest, AdviceFitsTheKindOfPort)
{
    auto const hints = [this](char const* port) {
        velmora::PortAddress const address = velmora::parsePortAddress(port, 38400);
        velmora::Error const error = velmora::openingfailure::silentAdapter(toString(address), address, m_watch);
        std::string all;
        for (std::string const& hint : error.hints()) {
            all += hint + "\n";
        }
        return all;
    };
    EXPECT_NE(hints("/dev/ttyUSB0").find("--baud"), std::string::npos);
    EXPECT_EQ(hints("10.0.0.1:35000").find("--baud"), std::string::npos);
    EXPECT_EQ(hints("sim:").find("--baud"), std::string::npos);
    EXPECT_STREQ(velmora::openingfailure::goneAdapter("sim:", std::nullopt, m_watch).what(),
                 "Nothing on sim: answers like an ELM327 adapter");
    send("ATI");
    receive("ELM327 v1.5\r\r");
    send("ATE0");
    velmora::PortAddress const address = velmora::parsePortAddress("/dev/ttyUSB0", 38400);
    velmora::Error const error = velmora::openingfailure::silentAdapter(toString(address), address, m_watch);
    EXPECT_EQ(std::string(error.what()), "ELM327 v1.5 answered on /dev/ttyUSB0 (38400 baud), but not to ATE0 in time");
    EXPECT_EQ(error.kind(), velmora::ErrorKind::AdapterSilent);
    velmora::Error const gone = velmora::openingfailure::goneAdapter("sim:", std::nullopt, m_watch);
    EXPECT_STREQ(gone.what(),
                 "ELM327 v1.5 answered on sim:, then fell silent: it has said nothing for seconds, not even to ATI");
    EXPECT_EQ(gone.kind(), velmora::ErrorKind::AdapterSilent);
}

TEST(OpeningFailure, ASilentVehicleIsToldWithTheAdaptersWord)
{
    velmora::Error const plain = velmora::openingfailure::silentVehicle("ELM327 v1.5", "sim:", "");
    EXPECT_EQ(std::string(plain.what()), "The adapter (ELM327 v1.5) on sim: works, but no control module answers");
    EXPECT_EQ(plain.kind(), velmora::ErrorKind::VehicleSilent);
    velmora::Error const trouble = velmora::openingfailure::silentVehicle("ELM327 v1.5", "sim:", "BUS ERROR");
    EXPECT_EQ(std::string(trouble.what()), std::string(plain.what()) + "; it reports BUS ERROR");
    EXPECT_EQ(trouble.hints().size(), plain.hints().size() + 1) << "the wiring";
}

} // namespace
