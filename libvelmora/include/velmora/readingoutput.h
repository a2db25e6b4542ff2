#pragma once

#include <velmora/export.h>
#include <velmora/health.h>
#include <velmora/reading.h>

#include <filesystem>
#include <memory>
#include <string>

namespace velmora {

/// Writes readings that an application has, such as those of Car::watch, to an output of the kinds that a LongWatch
/// has: "sqlite:FILE", "csv:FILE?rotate=day", "mqtt://HOST:PORT/TOPIC". Queues, tries again after a failure, and
/// counts; the disk and the network are another thread's.
///
///     velmora::ReadingOutput output("csv:drive.csv", "van");
///     auto const watch = car.watch({"RPM"}, [&output](velmora::Reading const& each) { output.write(each); });
class VELMORA_EXPORT ReadingOutput
{
public:
    /// vehicle: its name in the output, in the place of that of the readings unless it is empty. Throws Error if the
    /// address makes no sense, names a kind that this build lacks or a page, or the output refuses its settings.
    ReadingOutput(std::string const& address, std::string vehicle);
    /// The same for a file whatever its path holds: in an address a question mark would begin settings. kind is one
    /// that writes files: "sqlite", "csv". Throws Error for any other.
    ReadingOutput(std::string const& kind, std::filesystem::path const& file, std::string vehicle);
    /// Writes what is queued; an output that hangs is waited for.
    ~ReadingOutput();
    ReadingOutput(ReadingOutput const&) = delete;
    ReadingOutput& operator=(ReadingOutput const&) = delete;

    /// Never waits. Any thread.
    void write(Reading reading);
    /// How it is. Any thread.
    OutputCounts counts() const;
    /// What is wrong with it, for people; empty if nothing is. Any thread.
    std::string trouble() const;

private:
    struct Parts;
    std::unique_ptr<Parts> m_parts;
};

} // namespace velmora
