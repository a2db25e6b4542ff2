#include "program/terminal/lineeditor.h"

#include <gtest/gtest.h>

namespace {

using velmora::cli::Key;
using velmora::cli::LineEditor;
using State = LineEditor::State;

void type(LineEditor& editor, std::string const& text)
{
    for (char const character : text) {
        EXPECT_EQ(editor.press(static_cast<Key>(character)), State::Typing);
    }
}

void enter(LineEditor& editor, std::string const& text)
{
    type(editor, text);
    EXPECT_EQ(editor.press(Key::Enter), State::Entered);
    EXPECT_EQ(editor.take(), text);
}

TEST(LineEditor, TakesWhatIsTyped)
{
    LineEditor editor;
    enter(editor, "ATZ");
    EXPECT_EQ(editor.text(), "");
    EXPECT_EQ(editor.cursor(), 0U);
}

TEST(LineEditor, EachKeyDoesItsOwnAlone)
{
    struct Press
    {
        Key key;
        State state;
        char const* text;
        std::size_t cursor;
    };
    auto const control = [](char character) { return static_cast<Key>(character); };
    for (Press const& each : {Press{Key::Left, State::Typing, "abc", 1},
                              {Key::Right, State::Typing, "abc", 3},
                              {Key::Home, State::Typing, "abc", 0},
                              {Key::End, State::Typing, "abc", 3},
                              {Key::Delete, State::Typing, "ab", 2},
                              {Key::Up, State::Typing, "before", 6},
                              {Key::Down, State::Typing, "abc", 2},
                              {Key::Enter, State::Entered, "abc", 2},
                              {control(0x01), State::Typing, "abc", 0},
                              {control(0x05), State::Typing, "abc", 3},
                              {control(0x08), State::Typing, "ac", 1},
                              {control(0x7F), State::Typing, "ac", 1},
                              {control(0x15), State::Typing, "", 0},
                              {control(0x04), State::Typing, "abc", 2},
                              {control(0x02), State::Typing, "abc", 2},
                              {Key::Escape, State::Typing, "abc", 2},
                              {Key::PageUp, State::Typing, "abc", 2},
                              {static_cast<Key>(0x80), State::Typing, "abc", 2}}) {
        LineEditor editor;
        enter(editor, "before");
        type(editor, "abc");
        editor.press(Key::Left);
        EXPECT_EQ(editor.press(each.key), each.state) << static_cast<int>(each.key);
        EXPECT_EQ(editor.text(), each.text) << static_cast<int>(each.key);
        EXPECT_EQ(editor.cursor(), each.cursor) << static_cast<int>(each.key);
    }
    for (Key const key : {Key::Left, Key::Right, Key::Home, Key::End, Key::Delete, Key::Up, Key::Down, control(0x01),
                          control(0x05), control(0x08), control(0x7F), control(0x15)}) {
        LineEditor editor;
        EXPECT_EQ(editor.press(key), State::Typing) << static_cast<int>(key);
        EXPECT_EQ(editor.text(), "");
        EXPECT_EQ(editor.cursor(), 0U);
    }
    LineEditor editor;
    EXPECT_EQ(editor.press(control(0x04)), State::Ended);
    type(editor, "abc");
    for (Key const key : {Key::Up, Key::Down}) {
        EXPECT_EQ(editor.press(key), State::Typing);
        EXPECT_EQ(editor.text(), "abc") << "there are no lines before";
    }
}

TEST(LineEditor, MendsALineInTheMiddle)
{
    LineEditor editor;
    type(editor, "0D00");
    editor.press(Key::Home);
    editor.press(Key::Right);
    editor.press(Key::Delete);
    type(editor, "1");
    EXPECT_EQ(editor.text(), "0100");
    EXPECT_EQ(editor.cursor(), 2U);
    editor.press(Key::End);
    type(editor, "\x7F\x08");
    EXPECT_EQ(editor.text(), "01");
    editor.press(Key::Left);
    type(editor, "\x7F\x7F");
    EXPECT_EQ(editor.text(), "1");
    type(editor, "\x15");
    EXPECT_EQ(editor.text(), "");
}

TEST(LineEditor, TheCursorStandsWhereTheNextCharacterGoes)
{
    struct Step
    {
        char const* typed;
        char const* text;
        std::size_t cursor;
    };
    LineEditor editor;
    for (Step const& each : {Step{" ~", " ~", 2},
                             {"\x01", " ~", 0},
                             {"A", "A ~", 1},
                             {"\x7F", " ~", 0},
                             {"\x08", " ~", 0},
                             {"\x05", " ~", 2},
                             {"\x08", " ", 1},
                             {"\x15", "", 0},
                             {"B", "B", 1},
                             {"\x02", "B", 1},
                             {"\x1F", "B", 1}}) {
        type(editor, each.typed);
        EXPECT_EQ(editor.text(), each.text);
        EXPECT_EQ(editor.cursor(), each.cursor) << each.text;
    }
    std::pair<Key, std::size_t> const moves[] = {{Key::Home, 0}, {Key::Left, 0},  {Key::Right, 1}, {Key::Right, 2},
                                                 {Key::Left, 1}, {Key::End, 3},   {Key::Right, 3}, {Key::PageUp, 3},
                                                 {Key::Left, 2}, {Key::Delete, 2}};
    type(editor, "CD");
    for (auto const& [key, cursor] : moves) {
        EXPECT_EQ(editor.press(key), State::Typing);
        EXPECT_EQ(editor.cursor(), cursor) << static_cast<int>(key);
    }
    EXPECT_EQ(editor.text(), "BC");
    editor.press(Key::Delete);
    EXPECT_EQ(editor.text(), "BC") << "nothing stands behind the end";
    EXPECT_EQ(editor.press(static_cast<Key>(0x80)), State::Typing);
    EXPECT_EQ(editor.text(), "BC");
}

TEST(LineEditor, AnEmptyLineIsNoneToComeBackTo)
{
    LineEditor editor;
    enter(editor, "ATI");
    enter(editor, "");
    editor.press(Key::Up);
    EXPECT_EQ(editor.text(), "ATI");
    EXPECT_EQ(editor.press(Key::Enter), State::Entered);
    EXPECT_EQ(editor.take(), "ATI");
    type(editor, "new");
    editor.press(Key::Up);
    editor.press(Key::Up);
    EXPECT_EQ(editor.text(), "ATI");
    editor.press(Key::Down);
    EXPECT_EQ(editor.text(), "new");
    EXPECT_EQ(editor.cursor(), 3U);
    editor.press(Key::Down);
    EXPECT_EQ(editor.text(), "new");
}

TEST(LineEditor, KeysAtTheEndsOfALineDoNothing)
{
    LineEditor editor;
    for (Key const key : {Key::Left, Key::Right, Key::Up, Key::Down, Key::Delete, Key::PageUp, Key::Escape}) {
        EXPECT_EQ(editor.press(key), State::Typing);
    }
    type(editor, "\x7F\x01\x05\x02");
    EXPECT_EQ(editor.text(), "");
    EXPECT_EQ(editor.press(static_cast<Key>(0xC3)), State::Typing) << "no adapter takes other than ASCII";
    EXPECT_EQ(editor.text(), "");
}

TEST(LineEditor, ArrowsBringEarlierLinesBackAndKeepTheNewOne)
{
    LineEditor editor;
    enter(editor, "ATI");
    enter(editor, "0100");
    enter(editor, "0100");
    type(editor, "AT");
    editor.press(Key::Up);
    EXPECT_EQ(editor.text(), "0100");
    EXPECT_EQ(editor.cursor(), 4U);
    editor.press(Key::Up);
    EXPECT_EQ(editor.text(), "ATI") << "the same line twice stands once";
    editor.press(Key::Up);
    EXPECT_EQ(editor.text(), "ATI");
    editor.press(Key::Down);
    editor.press(Key::Down);
    editor.press(Key::Down);
    EXPECT_EQ(editor.text(), "AT");
    editor.press(Key::Up);
    EXPECT_EQ(editor.text(), "0100") << "no further below than the new line";
}

TEST(LineEditor, ControlDEndsAnEmptyLineOnly)
{
    LineEditor editor;
    type(editor, "A");
    EXPECT_EQ(editor.press(static_cast<Key>(4)), State::Typing);
    type(editor, "\x7F");
    EXPECT_EQ(editor.press(static_cast<Key>(4)), State::Ended);
}

} // namespace
