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
