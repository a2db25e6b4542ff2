#pragma once

#include "libvelmora/output/outputrunner.h"
#include "libvelmora/poll/pollresult.h"

#include <filesystem>
#include <memory>
#include <mutex>
#include <string>

namespace velmora::cli {

// A recording of live values in a database as `watch` writes it. The disk is another thread's; take never waits.
class LiveRecord
{
public:
    // Begins it. vehicle: its name in the database. Throws Error if the file can't be written, and in a build without
    // the output sqlite.
    LiveRecord(std::filesystem::path file, std::string vehicle);

    void take(PollResult const& result);

    std::filesystem::path const& file() const { return m_file; }
    // What is wrong with it; empty if nothing is.
    std::string trouble() const;

private:
    struct Notice
    {
        std::mutex mutex;
        std::string text; // protected by mutex
    };

    std::filesystem::path const m_file;
    std::string const m_vehicle;
    std::shared_ptr<Notice> const m_notice = std::make_shared<Notice>(); // the output's thread's, too
    std::unique_ptr<OutputRunner> m_runner;
};

} // namespace velmora::cli
