#include "program/view/qrtext.h"
#include "tests/program/terminal/terminalinput.h"
#include "tests/program/view/liverows.h"

namespace {

using velmora::cli::qrForTerminal;
using velmora::cli::qrText;

constexpr char const* text = "http://127.0.0.1";
constexpr unsigned short modules = 21 + 2 * 4; // the smallest code, with the quiet zone that readers want

TEST(QrText, IsAsWideAsItsModulesAndHalfAsHigh)
{
    std::vector<std::string> const lines = support::linesOf(qrText(text));
    EXPECT_EQ(lines.size(), (modules + 1) / 2U);
    std::string blank;
    for (int i = 0; i < modules; ++i) {
        blank += " ";
    }
    std::string const quiet = "\033[38;5;16;48;5;231m" + blank + "\033[0m";
    EXPECT_EQ(lines[0], quiet);
    EXPECT_EQ(lines[1], quiet);
    std::string const corner = "\033[38;5;16;48;5;231m    █▀▀▀▀▀█";
    EXPECT_EQ(lines[2].substr(0, corner.size()), corner) << "dark on light";
    EXPECT_EQ(lines.back(), quiet);
}

TEST(QrText, IsForTerminalsThatHoldItAndShowBlocks)
{
    Variable const plain("NO_COLOR");
    Variable const locale("LC_ALL");
    Variable const columns("COLUMNS");
    plain.set(nullptr);
    columns.set(nullptr);
    locale.set("C.UTF-8");
    PseudoTerminal const wide(modules);
    PseudoTerminal const narrow(modules - 1);
    EXPECT_EQ(qrForTerminal(text, wide.terminal()), qrText(text));
    EXPECT_EQ(qrForTerminal(text, narrow.terminal()), "");
    locale.set("C");
    EXPECT_EQ(qrForTerminal(text, wide.terminal()), "") << "no blocks";
    locale.set("C.UTF-8");
    plain.set("1");
    EXPECT_EQ(qrForTerminal(text, wide.terminal()), "") << "no colours are wanted";
    plain.set("");
    EXPECT_NE(qrForTerminal(text, wide.terminal()), "") << "an empty wish is none";
    int ends[2];
    ASSERT_EQ(::pipe(ends), 0);
    EXPECT_EQ(qrForTerminal(text, ends[1]), "");
    ::close(ends[0]);
    ::close(ends[1]);
}

} // namespace
