#pragma once

#include "program/globaloptions.h"
#include "program/live/ilivehost.h"
#include "program/live/playtable.h"

#include <velmora/recording.h>

#include <filesystem>
#include <string>
#include <vector>

namespace velmora::cli {

// A recording in the live view, or in lines. The main thread's.
class PlayRun : private ILiveHost
{
public:
    // file: where the recording is from. sensors: words of which each is a part of a name or key; none means all.
    // Throws Error.
    PlayRun(GlobalOptions const& options, std::filesystem::path file, Recording recording,
            std::vector<std::string> const& sensors, double speed);

    // On a terminal until the user ends it; in lines until the recording ends, without waiting.
    void run();

private:
    void choose(std::vector<std::string> const& words);
    void runScreen();
    void printAll();
    void jump(std::int64_t to);
    void applyLimits();
    void take(std::size_t sensor, RecordedValue const& value) { m_table.take(sensor, value); }
    std::string clockText(std::int64_t time) const; // empty for a recording that has no date

    std::vector<LiveRow> const& rows() const override { return m_table.rows(); }
    LiveTime now() const override { return PlayTable::timeOf(m_player.position()); }
    std::string title() const override;
    std::string state() const override;
    std::string page(std::string const& note, FrameStyle const& style) const override;
    SensorPicker picker() const override;
    void pick(std::vector<int> const& ids) override;
    std::optional<std::string> handle(Key key) override;
    std::vector<KeyHelp> keys() const override;

    GlobalOptions const& m_options;
    std::filesystem::path const m_file;
    Recording const m_recording;
    RecordingPlayer m_player;
    PlayTable m_table;
    bool m_quit = false;
};

} // namespace velmora::cli
