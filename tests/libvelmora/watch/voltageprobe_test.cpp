#include "libvelmora/watch/portinbox.h"
#include "libvelmora/watch/voltageprobe.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

#include <map>
#include <thread>

namespace {

using velmora::findVolts;

// Answers at once, on the thread that writes.
class AnsweringPort : public velmora::IPort
{
public:
    explicit AnsweringPort(std::map<std::string, std::string> answers, std::vector<std::string>& written)
        : m_answers(std::move(answers)), m_written(written)
    {}

    void start(Receiver onBytes, LossHandler onLost) override
    {
        m_onBytes = std::move(onBytes);
        m_onLost = std::move(onLost);
    }
    void write(std::string_view bytes) override
    {
        m_written.emplace_back(bytes);
        auto const found = m_answers.find(std::string(bytes));
        found == m_answers.end() ? m_onLost() : m_onBytes(found->second);
    }
    void close() override { m_written.emplace_back("closed"); }

private:
    std::map<std::string, std::string> const m_answers;
    std::vector<std::string>& m_written;
    Receiver m_onBytes;
    LossHandler m_onLost;
};

std::optional<double> probed(std::map<std::string, std::string> const& answers, std::vector<std::string>& written)
{
    return velmora::probeVoltage(std::make_unique<AnsweringPort>(answers, written), std::chrono::milliseconds(1));
}

TEST(PortInbox, GivesUpToEachPrompt)
{
    velmora::PortInbox inbox;
    auto const now = std::chrono::steady_clock::now();
    EXPECT_FALSE(inbox.hasText());
    EXPECT_FALSE(inbox.isLost());
    EXPECT_EQ(inbox.takeUntilPrompt(now), "");
    inbox.add("one>two>th");
    EXPECT_EQ(inbox.takeUntilPrompt(now), "one");
    EXPECT_TRUE(inbox.hasText());
    EXPECT_EQ(inbox.takeUntilPrompt(now), "two");
    EXPECT_EQ(inbox.takeUntilPrompt(now), "th") << "what there is when the time runs out";
    EXPECT_FALSE(inbox.hasText());
    inbox.add("four");
    inbox.clear();
    EXPECT_FALSE(inbox.hasText());
    for (bool const loses : {false, true}) {
        std::thread sender([&inbox, loses] {
            std::this_thread::sleep_for(std::chrono::milliseconds(2));
            loses ? inbox.lose() : inbox.add("five>");
        });
        try {
            EXPECT_EQ(inbox.takeUntilPrompt(now + std::chrono::hours(1)), "five");
            EXPECT_FALSE(loses);
        } catch (velmora::Error const& error) {
            EXPECT_TRUE(loses);
            EXPECT_STREQ(error.what(), "The link to the adapter broke");
            EXPECT_EQ(error.kind(), velmora::ErrorKind::LinkLost);
        }
        sender.join();
    }
    EXPECT_TRUE(inbox.isLost());
}

TEST(VoltageProbe, AsksTheAdapterAndNobodyElse)
{
    std::vector<std::string> written;
    EXPECT_EQ(probed({{"\r", "?\r\r>"}, {"ATRV\r", "ATRV\r12.6V\r\r>"}}, written), 12.6);
    EXPECT_EQ(written, (std::vector<std::string>{"\r", "ATRV\r", "closed"}));
    EXPECT_EQ(probed({{"\r", ">"}, {"ATRV\r", ">ATRV\r12.5V\r\r>"}}, written), 12.5) << "a prompt that came late";
    EXPECT_EQ(probed({{"\r", ">"}, {"ATRV\r", "?\r\r>"}}, written), std::nullopt);
    auto const begin = std::chrono::steady_clock::now();
    for (int i = 0; i < 3; ++i) {
        EXPECT_EQ(probed({{"\r", ""}, {"ATRV\r", ""}}, written), std::nullopt); // silent
    }
    EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::milliseconds(1450)) << "not half a second each";
    EXPECT_THROW(probed({{"\r", ">"}}, written), velmora::Error);
}

TEST(VoltageProbe, FindsVolts)
{
    EXPECT_EQ(findVolts("ATRV\r13.8V\r"), 13.8);
    EXPECT_EQ(findVolts("12v"), 12.0);
    EXPECT_EQ(findVolts("39.9V"), 39.9);
    EXPECT_EQ(findVolts("0.1V"), 0.1);
    EXPECT_EQ(findVolts("1.2.3V"), 3.0);
    EXPECT_EQ(findVolts("12 13 V 14V"), 14.0);
    EXPECT_EQ(findVolts("99V 12.1V"), 12.1);
    EXPECT_EQ(findVolts("ELM327 v1.5\r24.9V"), 24.9);
    for (char const* const none :
         {"", "V", "12.6", "0.0V", "99.9V", "40V", "12 V", "12A", "?", "ELM327 v1.5", "NO DATA"}) {
        EXPECT_FALSE(findVolts(none)) << none;
    }
}

} // namespace
