#include "program/live/userfiles.h"

#include <velmora/error.h>
#include <velmora/settingsfile.h>

#include <fmt/format.h>

#include <ctime>
#include <fstream>
#include <system_error>

namespace velmora::cli {

namespace {

std::string stamp(std::chrono::system_clock::time_point time)
{
    std::time_t const seconds = std::chrono::system_clock::to_time_t(time);
    std::tm fields{};
    ::gmtime_r(&seconds, &fields);
    return fmt::format("{:04}{:02}{:02}-{:02}{:02}{:02}", fields.tm_year + 1900, fields.tm_mon + 1, fields.tm_mday,
                       fields.tm_hour, fields.tm_min, fields.tm_sec);
}

} // namespace

std::filesystem::path newUserFile(std::string const& beginning, std::string const& ending,
                                  std::chrono::system_clock::time_point time)
{
    std::filesystem::path const folder = userDataFolder() / "live";
    std::error_code error;
    std::filesystem::create_directories(folder, error);
    if (error) {
        throw Error(ErrorKind::Failed, "Could not make the folder " + folder.string() + ": " + error.message());
    }
    std::filesystem::path file = folder / (beginning + "-" + stamp(time) + ending);
    for (int number = 2; std::filesystem::exists(file, error); ++number) {
        file = folder / fmt::format("{}-{}-{}{}", beginning, stamp(time), number, ending);
    }
    return file;
}

std::filesystem::path saveUserText(std::string const& beginning, std::string const& ending, std::string const& text)
{
    std::filesystem::path const file = newUserFile(beginning, ending, std::chrono::system_clock::now());
    std::ofstream out(file);
    if (!(out << text << std::flush)) {
        throw Error(ErrorKind::Failed, "Could not write " + file.string() + ": is there room on the disk?");
    }
    return file;
}

} // namespace velmora::cli
