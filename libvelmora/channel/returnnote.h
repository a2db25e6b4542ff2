#pragma once

#include <filesystem>
#include <optional>
#include <string>
#include <vector>

namespace velmora {

// What an adapter behind a port may still be set to for a module beyond OBD: noted before the first such command, and
// struck out once all was given back. A link that breaks or a program that is killed leaves it for the next connection.
struct ReturnNote
{
    int protocol = 0; // the number of the bus on which the adapter was set up
    std::vector<std::string> commands;
};

// The notes of all ports, in this process and in a small file. A file that can't be written leaves the process's own.
class ReturnNotes
{
public:
    // An empty path keeps them in this process only.
    explicit ReturnNotes(std::filesystem::path file) : m_file(std::move(file)) {}

    std::optional<ReturnNote> find(std::string const& port) const;
    void put(std::string const& port, ReturnNote const& note) const;
    void strike(std::string const& port) const;

    // The file that goes with a settings file.
    static std::filesystem::path besides(std::filesystem::path const& settings);

private:
    std::filesystem::path m_file;
};

} // namespace velmora
