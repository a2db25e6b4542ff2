#pragma once

#include "program/live/ilivehost.h"
#include "program/terminal/terminal.h"

#include <functional>
#include <memory>
#include <string>

namespace velmora::cli {

// The live view on a terminal: big digits, the table, a list to choose sensors from, help. Takes the keys, and draws as
// often as eyes follow. The main thread's.
class LivePanel
{
public:
    // Both must outlive it.
    LivePanel(ILiveHost& host, Terminal& terminal, bool coloured);

    // Takes the keys that were pressed, and draws if it is time.
    void step(LiveTime now);
    // Draws as soon as it may, from the top of the table.
    void refresh();
    // Shows a text in the bottom line until the next key.
    void tell(std::string text) { m_note = std::move(text); }

    bool big() const { return m_big; }
    void setBig(bool big) { m_big = big; }

    // As it would be drawn now.
    std::string frame(FrameStyle const& style) const;

private:
    void handle(Key key);
    void handleOwn(Key key);
    void handlePicker(Key key);
    void openPicker();
    void scroll(int lines);
    int pageLength() const;
    void draw(LiveTime now);
    FrameStyle style() const;
    std::string bigPart(FrameStyle& style) const;
    std::string values(FrameStyle const& style) const;
    std::string status() const;

    ILiveHost& m_host;
    Terminal& m_terminal;
    bool const m_coloured;
    std::unique_ptr<SensorPicker> m_picker;
    LiveTime m_lastDraw;
    std::size_t m_firstRow = 0;
    bool m_big = true;   // digits that can be read from afar, where there is room
    bool m_hold = false; // the screen stays as it is
    bool m_help = false;
    std::string m_note; // in the status line, until the next key
};

} // namespace velmora::cli
