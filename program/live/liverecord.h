#pragma once

#include <velmora/readingoutput.h>

#include <filesystem>
#include <string>
#include <utility>

namespace velmora::cli {

// A recording of live values in a database as `watch` writes it.
class LiveRecord
{
public:
    // Begins it. vehicle: its name in the database. Throws Error if the file can't be written, and in a build without
    // the output sqlite.
    LiveRecord(std::filesystem::path file, std::string vehicle)
        : m_file(std::move(file)), m_output("sqlite", m_file, std::move(vehicle))
    {}

    void take(Reading const& reading) { m_output.write(reading); }

    std::filesystem::path const& file() const { return m_file; }
    // What is wrong with it; empty if nothing is.
    std::string trouble() const { return m_output.trouble(); }

private:
    std::filesystem::path const m_file;
    ReadingOutput m_output;
};

} // namespace velmora::cli
