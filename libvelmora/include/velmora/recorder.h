#pragma once

#include <velmora/export.h>

#include <cstddef>
#include <memory>
#include <string>

namespace velmora {

class RecorderParts;

/// A file that the dialogue with an adapter is recorded to, byte for byte and with its pauses, for the port
/// "replay:FILE". Replaces no file; one that nothing was saved to is removed again. Give it to CarOptions::recorder.
/// Any thread.
class VELMORA_EXPORT Recorder
{
public:
    /// Throws Error if the file exists already or can't be written.
    explicit Recorder(std::string const& file);
    ~Recorder();
    Recorder(Recorder const&) = delete;
    Recorder& operator=(Recorder const&) = delete;

    /// Writes what was said so far, once. vehicle is what the file says of the vehicle. The last six characters of each
    /// vehicle identification number, which name the car, become zeros unless keepVin. Gives how many requests and
    /// commands were recorded; none writes nothing. Throws Error if the file can't be written whole.
    std::size_t save(std::string const& vehicle, bool keepVin = false);

private:
    friend class CarCore;

    std::unique_ptr<RecorderParts> m_parts;
};

} // namespace velmora
