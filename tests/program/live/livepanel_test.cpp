// What the keys of the live view do to its frame, and when it is drawn.
#include "program/live/livepanel.h"
#include "program/terminal/interrupt.h"
#include "tests/program/terminal/terminalinput.h"
#include "tests/program/view/liverows.h"

#include <velmora/error.h>

#include <fmt/format.h>
#include <gmock/gmock.h>

namespace {

using namespace velmora;
using namespace velmora::cli;
using std::chrono::milliseconds;
using std::chrono::seconds;
using support::linesOf;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::StartsWith;

constexpr char const* keysText = "q quit  ? help  s sensors  u units  b big";

// Knows the keys x, which tells something, and y, which fails.
class PanelHost : public ILiveHost
{
public:
    std::vector<LiveRow> const& rows() const override { return m_rows; }
    LiveTime now() const override { return LiveTime() + seconds(100); }
    std::string title() const override
    {
        ++m_draws;
        return "tïtle";
    }
    std::string state() const override { return m_state; }
    std::string page(std::string const& note, FrameStyle const& /*style*/) const override
    {
        return m_page.empty() ? std::string() : m_page + note;
    }
    SensorPicker picker() const override
    {
        if (m_offers.empty()) {
            throw Error(ErrorKind::WrongUse, "Nothing to choose");
        }
        return {m_offers, {2}};
    }
    void pick(std::vector<int> const& ids) override { m_picked.push_back(ids); }
    std::optional<std::string> handle(Key key) override
    {
        m_handled += static_cast<char>(key);
        if (key == static_cast<Key>('y')) {
            throw Error(ErrorKind::Failed, "It failed");
        }
        return key == static_cast<Key>('x') ? std::optional<std::string>("Done") : std::nullopt;
    }
    std::vector<KeyHelp> keys() const override
    {
        ++m_helps;
        return {{"x", "do it"}};
    }

    void addRows(int count)
    {
        for (int i = 1; i <= count; ++i) {
            m_rows.push_back(support::numberRow(fmt::format("R{:02}", i), std::to_string(i), "V"));
        }
    }

    std::vector<LiveRow> m_rows;
    std::vector<LiveOffer> m_offers;
    std::vector<std::vector<int>> m_picked;
    std::string m_handled;
    std::string m_state;
    std::string m_page;
    mutable int m_draws = 0;
    mutable int m_helps = 0;
};

class LivePanelTest : public testing::Test
{
protected:
    LivePanelTest()
    {
        m_kind.set("xterm");
        m_characters.set("C");
        m_columns.set(nullptr);
        m_lines.set(nullptr);
    }

    // A view of so many lines, and what was drawn in it.
    void open(unsigned short lines, bool coloured = false)
    {
        m_glass = std::make_unique<PseudoTerminal>(60, lines);
        m_style = {60, lines, false, true, false, m_host.now()};
        onTerminal([&] {
            m_terminal = Terminal::open(coloured);
            m_panel = std::make_unique<LivePanel>(m_host, *m_terminal, coloured);
        });
    }
    void step(LiveTime::duration time = seconds(0))
    {
        m_now += time;
        onTerminal([&] { m_panel->step(m_now); });
    }
    // The frame behind the keys.
    std::vector<std::string> press(std::string const& keys)
    {
        m_glass->type(keys);
        step();
        return linesOf(m_panel->frame(m_style));
    }
    std::string firstRow(std::string const& keys) { return press(keys).at(2).substr(0, 3); }
    std::string bottom(std::string const& keys) { return press(keys).back(); }
    std::string cursor(std::string const& keys)
    {
        for (std::string const& line : press(keys)) {
            if (line.starts_with(">")) {
                return line;
            }
        }
        return "no list";
    }
    ~LivePanelTest() override
    {
        onTerminal([&] {
            m_panel.reset();
            m_terminal.reset();
        });
    }

    PanelHost m_host;
    LiveTime m_now = LiveTime() + seconds(100);
    FrameStyle m_style;
    std::string m_drawn;
    std::unique_ptr<LivePanel> m_panel;

private:
    template <typename Act>
    void onTerminal(Act act)
    {
        std::fflush(stdout);
        Replaced const input(STDIN_FILENO, m_glass->terminal());
        Replaced const output(STDOUT_FILENO, m_glass->terminal());
        act();
        m_drawn += m_glass->shown();
    }

    Variable const m_kind{"TERM"};
    Variable const m_characters{"LC_ALL"};
    Variable const m_columns{"COLUMNS"};
    Variable const m_lines{"LINES"};
    SignalsAsBefore const m_signals;
    Interrupt const m_interrupt;
    std::unique_ptr<PseudoTerminal> m_glass;
    std::unique_ptr<Terminal> m_terminal;
};

TEST_F(LivePanelTest, TheTableIsMovedAsFarAsItGoes)
{
    m_host.addRows(20);
    open(12); // eight rows of values
    for (auto const& [key, first] : {std::pair{"", "R01"},
                                     {"\033OB", "R02"},
                                     {"\033OB", "R03"},
                                     {"\033OA", "R02"},
                                     {"\033OA\033OA", "R01"},
                                     {"\033[6~", "R09"},
                                     {"\033[6~", "R13"},
                                     {"\033OB", "R13"},
                                     {"\033[5~", "R05"},
                                     {"\033[5~", "R01"},
                                     {"\033OB", "R02"}}) {
        EXPECT_EQ(firstRow(key), first) << key;
    }
    EXPECT_THAT(press(""), testing::SizeIs(12));
    m_panel->refresh();
    EXPECT_EQ(firstRow(""), "R01");
    m_host.m_rows.resize(8);
    EXPECT_EQ(firstRow("\033OB"), "R01") << "all of them are to be seen";
    m_host.m_rows.resize(3);
    EXPECT_EQ(firstRow("\033[6~"), "R01");
}

TEST_F(LivePanelTest, BigDigitsTakeTheirLinesFromTheTable)
{
    m_host.addRows(20);
    open(24);
    EXPECT_TRUE(m_panel->big());
    std::vector<std::string> const big = press("");
    EXPECT_EQ(big.size(), 24U);
    EXPECT_THAT(big[0], StartsWith("R01   "));
    EXPECT_THAT(big[10], StartsWith("R01 ")) << "eight lines further down the table begins";
    EXPECT_THAT(press("\033[6~")[10], StartsWith("R09 ")) << "twelve of twenty are seen";
    EXPECT_EQ(firstRow("b\033OA"), "R01");
    EXPECT_FALSE(m_panel->big());
    EXPECT_EQ(firstRow("\033OB"), "R01") << "the whole screen holds all";
    m_panel->setBig(true);
    EXPECT_EQ(press(""), big);
}

TEST_F(LivePanelTest, TheBottomLineTellsWhatThereIsToTell)
{
    m_host.addRows(1);
    open(12);
    EXPECT_EQ(bottom(""), keysText);
    m_host.m_state = "Paused";
    EXPECT_EQ(bottom(""), std::string("Paused  ") + keysText);
    EXPECT_EQ(bottom("h"), (std::string("Held: h goes on  Paused  ") + keysText).substr(0, 59) + ".");
    m_host.m_state.clear();
    EXPECT_EQ(bottom(""), (std::string("Held: h goes on  ") + keysText));
    EXPECT_EQ(bottom(" "), keysText);
    EXPECT_EQ(bottom("x"), "Done");
    EXPECT_EQ(bottom(""), "Done") << "until the next key";
    EXPECT_EQ(bottom("z"), keysText);
    EXPECT_EQ(bottom("y"), "It failed");
    EXPECT_EQ(bottom("yz"), keysText);
    m_panel->tell("By the way");
    EXPECT_EQ(bottom(""), "By the way");
    EXPECT_EQ(bottom("s"), "Nothing to choose");
    EXPECT_EQ(m_host.m_handled, "h xzyyzs");
}

TEST_F(LivePanelTest, IsDrawnFiveTimesASecondAndForEachKey)
{
    m_host.addRows(1);
    open(12, true);
    m_host.m_rows[0].limit.highest = 0;
    auto const draws = [this](LiveTime::duration time) {
        int const before = m_host.m_draws;
        step(time);
        return m_host.m_draws - before;
    };
    EXPECT_EQ(draws(seconds(0)), 1);
    EXPECT_THAT(m_drawn, HasSubstr("t?tle")) << "on a terminal without UTF-8";
    EXPECT_THAT(m_drawn, HasSubstr("\033[0;1mSensor"));
    EXPECT_THAT(m_drawn, HasSubstr("\033[31mR01")) << "beyond its limit";
    EXPECT_EQ(draws(milliseconds(199)), 0);
    EXPECT_EQ(draws(milliseconds(1)), 1);
    EXPECT_EQ(draws(milliseconds(100)), 0);
    press("z");
    EXPECT_EQ(draws(milliseconds(100)), 0) << "the key was drawn for";
    m_panel->refresh();
    EXPECT_EQ(draws(milliseconds(0)), 1);
    press("h");
    EXPECT_EQ(draws(seconds(9)), 0) << "it is held";
    int const helps = m_host.m_helps;
    press("?");
    EXPECT_EQ(m_host.m_helps, helps + 2) << "by the key, and by the frame of this test";
    step(seconds(1));
    EXPECT_EQ(m_host.m_helps, helps + 3) << "help is not held";
    press("z");
    press("h");
    EXPECT_EQ(draws(milliseconds(200)), 1);
}

TEST_F(LivePanelTest, HelpStandsUntilAnyKey)
{
    m_host.addRows(1);
    open(12);
    EXPECT_THAT(press("?"), testing::Contains("  x          do it"));
    EXPECT_EQ(bottom("q"), keysText);
    EXPECT_EQ(m_host.m_handled, "?") << "the key that ends it does nothing else";
    m_host.m_page = "a page\n";
    EXPECT_THAT(press("x"), ElementsAre("a page", "Done"));
    EXPECT_EQ(press("?")[0], "Keys");
    m_style.ascii = false;
    m_host.m_page.clear();
    EXPECT_EQ(press("z")[0], "tïtle");
}

TEST_F(LivePanelTest, SensorsAreChosenInAList)
{
    for (int i = 1; i <= 30; ++i) {
        m_host.m_offers.push_back({i, fmt::format("S{:02}", i)});
    }
    open(12);
    EXPECT_EQ(cursor("s"), "> [x] 02 S02");
    for (auto const& [key, line] : {std::pair{"\033OB", "> [ ] 01 S01"},
                                    {"j", "> [ ] 03 S03"},
                                    {"k", "> [ ] 01 S01"},
                                    {"\033OA", "> [x] 02 S02"},
                                    {"\033[6~", "> [ ] 0B S11"},
                                    {"\033[6~", "> [ ] 15 S21"},
                                    {"\033[5~", "> [ ] 0B S11"},
                                    {" ", "> [x] 0B S11"},
                                    {"+", "> [x] 0B S11"},
                                    {"j", "> [ ] 0A S10"},
                                    {"k", "> [x] 0B S11"},
                                    {"--", "> [x] 0B S11"},
                                    {"k", "> [ ] 0C S12"},
                                    {"z", "> [ ] 0C S12"}}) {
        EXPECT_EQ(cursor(key), line) << key;
    }
    EXPECT_EQ(cursor("\r"), "no list");
    EXPECT_THAT(m_host.m_picked, ElementsAre(ElementsAre(2, 11)));
    for (char const* const leave : {"\033", "q"}) {
        EXPECT_EQ(cursor("s"), "> [x] 02 S02") << "the list begins anew";
        EXPECT_EQ(cursor(leave), "no list");
    }
    EXPECT_EQ(cursor("s "), "> [ ] 02 S02");
    EXPECT_EQ(cursor("\n"), "no list");
    EXPECT_THAT(m_host.m_picked, testing::SizeIs(1)) << "no sensor at all is no choice";
    EXPECT_EQ(m_host.m_handled, "ssss") << "keys of the list are its own";
}

} // namespace
