#include "program/terminal/spans.h"
#include "program/terminal/terminal.h"

#include <gtest/gtest.h>

namespace {

using velmora::cli::Key;
using velmora::cli::takeKey;

std::vector<int> keys(std::string bytes)
{
    std::vector<int> list;
    while (auto const key = takeKey(bytes)) {
        list.push_back(static_cast<int>(*key));
    }
    EXPECT_TRUE(bytes.empty());
    return list;
}

TEST(Keys, LettersAreTheirOwnCodes)
{
    EXPECT_EQ(keys("qU \n"), (std::vector<int>{'q', 'U', ' ', '\n'}));
    EXPECT_EQ(keys("\r"), std::vector<int>{static_cast<int>(Key::Enter)});
}

TEST(Keys, ArrowsComeInBothOfTheirForms)
{
    EXPECT_EQ(keys("\033[A\033[B"), (std::vector<int>{static_cast<int>(Key::Up), static_cast<int>(Key::Down)}));
    EXPECT_EQ(keys("\033OA\033OB"), (std::vector<int>{static_cast<int>(Key::Up), static_cast<int>(Key::Down)}));
    EXPECT_EQ(keys("\033[5~\033[6~"),
              (std::vector<int>{static_cast<int>(Key::PageUp), static_cast<int>(Key::PageDown)}));
}

TEST(Keys, CursorKeysComeInAllTheirForms)
{
    EXPECT_EQ(keys("\033[D\033OD\033[C\033OC"),
              (std::vector<int>{static_cast<int>(Key::Left), static_cast<int>(Key::Left), static_cast<int>(Key::Right),
                                static_cast<int>(Key::Right)}));
    EXPECT_EQ(keys("\033[H\033[1~\033[F\033[4~\033[3~"),
              (std::vector<int>{static_cast<int>(Key::Home), static_cast<int>(Key::Home), static_cast<int>(Key::End),
                                static_cast<int>(Key::End), static_cast<int>(Key::Delete)}));
}

TEST(Keys, EscapeAloneIsAKey)
{
    EXPECT_EQ(keys("\033"), std::vector<int>{static_cast<int>(Key::Escape)});
    EXPECT_EQ(keys("\033q"), (std::vector<int>{static_cast<int>(Key::Escape), 'q'}));
}

TEST(Keys, ASequenceThatComesInPiecesIsWaitedFor)
{
    for (char const* const part : {"\033", "\033[", "\033O", "\033[1", "\033[1;5"}) {
        EXPECT_TRUE(velmora::cli::isUnfinished(part)) << part + 1;
    }
    for (char const* const whole : {"", "q", "\033[A", "\033[1;5C", "\033q", "q\033"}) {
        EXPECT_FALSE(velmora::cli::isUnfinished(whole)) << whole;
    }
}

TEST(Keys, UnknownSequencesAreSkippedWhole)
{
    EXPECT_EQ(keys("\033[1;5Cq"), std::vector<int>{'q'});
    EXPECT_EQ(keys("\033["), std::vector<int>{});
    EXPECT_EQ(keys(""), std::vector<int>{});
}

TEST(Keys, ASequenceEndsWithALetterOrASignBesideThem)
{
    EXPECT_EQ(keys("\033[@q"), std::vector<int>{'q'});
    EXPECT_EQ(keys("\033[~q"), std::vector<int>{'q'});
    EXPECT_EQ(keys("\033[?q"), std::vector<int>{}) << "? stands in the middle of one";
    EXPECT_EQ(keys("\033OH\033OFq"), (std::vector<int>{static_cast<int>(Key::Home), static_cast<int>(Key::End), 'q'}));
    EXPECT_EQ(keys("\033Nq"), (std::vector<int>{static_cast<int>(Key::Escape), 'N', 'q'}));
    EXPECT_EQ(keys("\033\033[A"), (std::vector<int>{static_cast<int>(Key::Escape), static_cast<int>(Key::Up)}));
    EXPECT_EQ(keys("\xFF"), std::vector<int>{0xFF});
    for (char const* const part : {"\033[?", "\033[\x7F", "\033[ "}) {
        EXPECT_TRUE(velmora::cli::isUnfinished(part)) << part + 1;
    }
    for (char const* const whole : {"\033[@", "\033[~", "\033[?h", "\033N", "\033O~"}) {
        EXPECT_FALSE(velmora::cli::isUnfinished(whole)) << whole + 1;
    }
}

TEST(Spans, PartsOfALineHaveTheirLook)
{
    using velmora::cli::Span;
    using velmora::cli::spansOf;
    velmora::cli::SpanLook bold;
    bold.bold = true;
    velmora::cli::SpanLook red = bold;
    red.color = 1;
    EXPECT_EQ(spansOf("a\033[1mb\033[31mc\033[0md"),
              (std::vector<Span>{{"a", {}}, {"b", bold}, {"c", red}, {"d", {}}}));
    EXPECT_EQ(spansOf("\033[1;31mc\033[m"), (std::vector<Span>{{"c", red}}));
    EXPECT_EQ(spansOf("x\033[2Jy\033["), (std::vector<Span>{{"x", {}}, {"y", {}}})) << "nothing else gets through";
    EXPECT_EQ(spansOf("\033[1ma;2b"), (std::vector<Span>{{"a;2b", bold}})) << "numbers in the text are text";
    EXPECT_TRUE(spansOf("").empty());
}

TEST(Spans, EachLookHasItsNumber)
{
    using velmora::cli::SpanLook;
    auto const lookOf = [](std::string const& codes) {
        return velmora::cli::spansOf("\033[" + codes + "mx").front().look;
    };
    EXPECT_EQ(lookOf("1"), (SpanLook{true, false, false, -1}));
    EXPECT_EQ(lookOf("2"), (SpanLook{false, true, false, -1}));
    EXPECT_EQ(lookOf("7"), (SpanLook{false, false, true, -1}));
    EXPECT_EQ(lookOf("2;7;1"), (SpanLook{true, true, true, -1}));
    for (int color = 0; color < 8; ++color) {
        EXPECT_EQ(lookOf("3" + std::to_string(color)), (SpanLook{false, false, false, color}));
    }
    for (char const* const other : {"", "0", "3", "6", "8", "29", "38", "40", "1;0", "1;", "31;0;"}) {
        EXPECT_EQ(lookOf(other), SpanLook()) << other;
    }
    EXPECT_EQ(lookOf("0;1"), (SpanLook{true, false, false, -1}));
    EXPECT_EQ(lookOf(";1"), (SpanLook{true, false, false, -1}));
}

TEST(Spans, WhatIsNoLookIsLeftOut)
{
    using velmora::cli::Span;
    using velmora::cli::spansOf;
    EXPECT_EQ(spansOf("a\033[1"), (std::vector<Span>{{"a", {}}}));
    EXPECT_EQ(spansOf("a\033[31xb"), (std::vector<Span>{{"a", {}}, {"b", {}}}));
    EXPECT_EQ(spansOf("a\033b"), (std::vector<Span>{{"a\033b", {}}})) << "no sequence begins there";
    EXPECT_EQ(spansOf("\033[m\033[mb"), (std::vector<Span>{{"b", {}}}));
}

TEST(TerminalKinds, NewerOnesStandForWhatTheyUnderstand)
{
    using velmora::cli::terminalKinds;
    EXPECT_EQ(terminalKinds("xterm-kitty"), (std::vector<std::string>{"xterm-kitty", "xterm-256color", "xterm"}));
    EXPECT_EQ(terminalKinds("alacritty").size(), 3U);
    EXPECT_EQ(terminalKinds("vt52"), std::vector<std::string>{"vt52"});
}

} // namespace
