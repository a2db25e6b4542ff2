#pragma once

#include <velmora/export.h>
#include <velmora/reading.h>

#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <vector>

/// Recordings of readings, and who plays them: as a person looks at them, or on the page for browsers.

namespace velmora {

struct CarOptions;

/// A sensor as lists and recordings name it.
struct SensorEntry
{
    unsigned int module = 0; ///< id of the control module; 0 if it is not known
    std::string sensor;      ///< key, as Reading::sensor
    std::string pid;         ///< what is asked, as Reading::pid
    std::string name;        ///< title for people
    std::string unit;        ///< label; empty for none
    double hertz = 0.0;      ///< how often it is read; 0 for as often as there is time
};

/// One value of a recorded sensor.
struct RecordedValue
{
    std::int64_t time = 0; ///< ms since 1970, UTC
    Reading::Value value;  ///< nothing where the recording says that there was none
};

/// A sensor with all its values.
struct RecordedSensor
{
    SensorEntry about;                 ///< which one it is
    int decimals = 0;                  ///< the most that a value has
    bool numeric = true;               ///< every value is a number
    std::vector<RecordedValue> values; ///< in the order of time
};

/// What a file of readings holds. Plain data.
struct Recording
{
    std::vector<RecordedSensor> sensors; ///< those that have values
    std::int64_t begin = 0;              ///< of the first value, in ms since 1970
    std::int64_t end = 0;                ///< of the last one
    bool cut = false;                    ///< it holds more than can be played
    bool dated = true;                   ///< else its times count from a beginning that nobody has noted
};

/// What a file is.
enum class RecordingForm
{
    Database, ///< as the output sqlite writes it
    Csv,      ///< one column a sensor, or one line a reading
    Ndjson,   ///< of the output ndjson, or of live --json
    Dialogue, ///< with an adapter: a Car plays it, by the port replay:FILE
};

/// By what the file begins with. Throws Error if it can't be read.
VELMORA_EXPORT RecordingForm formOf(std::string const& file);
/// All readings of a file that is no dialogue. Throws Error that names the line which can't be read; a last line that
/// is torn is left out.
VELMORA_EXPORT Recording readRecording(std::string const& file);
/// The live values that a dialogue of a Recorder holds, each at the time that its reply was whole. Dialogues keep the
/// time that replies took and no other, so it counts from the first command and leaves out what the host waited.
/// Nothing where no two readings lie apart: such a dialogue can only be read as a vehicle. options: those of the car
/// that reads it; their port does not matter. Throws Error.
VELMORA_EXPORT std::optional<Recording> readDialogueRecording(std::string const& file, CarOptions const& options);

/// Plays a recording: gives its values as time goes on, at a speed, with pauses and jumps. One thread.
class VELMORA_EXPORT RecordingPlayer
{
public:
    static constexpr double slowest = 0.125; ///< speed
    static constexpr double fastest = 64.0;  ///< speed

    /// Gets a value of the sensor with that number in the recording.
    using Sink = std::function<void(std::size_t sensor, RecordedValue const& value)>;

    /// The recording must outlive it.
    explicit RecordingPlayer(Recording const& recording);
    ~RecordingPlayer();
    RecordingPlayer(RecordingPlayer const&) = delete;
    RecordingPlayer& operator=(RecordingPlayer const&) = delete;

    /// Goes on by so many seconds of the player's time; does nothing while paused. sink gets what is passed, in the
    /// order of time; the first values at once.
    void advance(double seconds, Sink const& sink);
    /// Goes to a time in ms since 1970, forward or back: sink gets all values from the beginning up to there.
    void seek(std::int64_t time, Sink const& sink);

    void setPaused(bool paused); ///< or lets it go on
    bool isPaused() const;       ///< as setPaused has left it
    void setSpeed(double speed); ///< taken within slowest and fastest; 1 is as it was
    double speed() const;        ///< as it plays

    std::int64_t position() const; ///< ms since 1970
    bool atEnd() const;            ///< whether all values were given

private:
    struct Parts;
    std::unique_ptr<Parts> m_parts;
};

/// A page for browsers with a recording in the place of a vehicle; who looks at it chooses speed and place.
class VELMORA_EXPORT PagePlay
{
public:
    /// address: that of the output, such as "dash:127.0.0.1:8722". settingsFile: the layouts stand beside it; the
    /// user's own if empty. onLink: told of the page's link, and what to know about it. Throws Error for an address
    /// that makes no sense, and in a build without the page.
    PagePlay(Recording recording, std::string const& address, double speed, std::string const& settingsFile,
             std::function<void(std::string const& link, std::string const& remark)> onLink);
    ~PagePlay();
    PagePlay(PagePlay const&) = delete;
    PagePlay& operator=(PagePlay const&) = delete;

    /// Serves the page on the caller's thread until end is called. Throws Error if the place can't be had.
    void run();
    /// Ends run soon. Any thread.
    void end();

private:
    struct Parts;
    std::unique_ptr<Parts> m_parts;
};

} // namespace velmora
