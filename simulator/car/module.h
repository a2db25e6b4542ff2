#pragma once

#include "simulator/car/drive.h"
#include "simulator/car/livepids.h"
#include "simulator/car/moduledata.h"

namespace obdsim {

/// The two layouts of service data: SAE J1979 splits long answers into numbered
/// messages of at most seven bytes on the buses without CAN.
enum class DataLayout : int
{
    Can,
    Numbered
};

/// What a module has to say to a request: nothing, a refusal, or messages.
struct Answer
{
    std::uint8_t refusal = 0; ///< response code of a 7F answer, 0 if none
    std::vector<Bytes> messages;

    bool isSilent() const { return messages.empty() && refusal == 0; }
};

/// The services with trouble codes.
enum class CodeKind : int
{
    Stored,
    Pending,
    Permanent
};

/// A control module at work: its data from the vehicle file, and what the
/// clearing of codes and hands have changed since.
class Module
{
public:
    /// `drive` must outlive this.
    Module(ModuleData data, bool compression, Drive const& drive, DataLayout layout);

    /// The answer to `request` (service byte first) at `now`.
    Answer answer(Bytes const& request, Time now);

    ModuleData const& data() const;
    DataLayout layout() const;

    /// Data bytes of a mode 01 PID; nothing if the module does not have it.
    std::optional<Bytes> currentData(std::uint8_t pid, Time now) const;

    /// The PIDs of mode 01 for which currentData() has something.
    std::vector<std::uint8_t> currentPids() const;

    /// The same of a moment that the module has kept: what was changed by hand is not in it.
    std::optional<Bytes> keptData(std::uint8_t pid, Time then) const;

    DriveState drive(Time now) const;

    /// Adds a trouble code, with the lamp for a stored one.
    void addCode(CodeKind kind, std::uint16_t code);

    /// Gives a PID of mode 01 these bytes; nothing gives it back to the drive.
    void setValue(std::uint8_t pid, std::optional<Bytes> const& data);

    void setSilent(bool silent);
    bool isSilent() const;

    /// True while the engine turns.
    bool engineRuns(Time now) const;

    /// Service 04: forgets codes, freeze frames and results, and starts the
    /// counters and the monitors anew. Permanent codes stay, and the module goes
    /// on telling which PIDs a frame would hold.
    void clear(Time now);

private:
    Answer fromServices(Bytes const& request, Time now);
    Bytes monitorWord(bool thisCycle) const;
    std::optional<Bytes> data(std::uint8_t pid, DriveState const& drive) const;
    SinceCleared sinceCleared(DriveState const& drive) const;

    ModuleData m_data;
    Drive const& m_drive;
    DataLayout m_layout;
    std::optional<DriveState> m_cleared; ///< the moment of it
    std::map<std::uint8_t, Bytes> m_values;
    bool m_silent = false;
};

} // namespace obdsim
