#pragma once

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <stdexcept>
#include <string>

namespace testsupport {

// A folder of a test's own, gone with it.
class TemporaryFolder
{
public:
    explicit TemporaryFolder(std::filesystem::path const& parent = std::filesystem::temp_directory_path())
    {
        std::string name = (parent / "velmora-test-XXXXXX").string();
        if (::mkdtemp(name.data()) == nullptr) {
            throw std::runtime_error("no temporary folder");
        }
        m_path = name;
    }
    ~TemporaryFolder() { std::filesystem::remove_all(m_path); }
    TemporaryFolder(TemporaryFolder const&) = delete;
    TemporaryFolder& operator=(TemporaryFolder const&) = delete;

    std::filesystem::path const& path() const { return m_path; }
    std::string file(std::string const& name) const { return (m_path / name).string(); }

    std::string read(std::string const& name) const
    {
        std::ifstream in(m_path / name, std::ios::binary);
        return {std::istreambuf_iterator<char>(in), {}};
    }

private:
    std::filesystem::path m_path;
};

// A path in a folder of this process's own, which is gone with it: two runs of the tests beside each other don't meet.
inline std::string ownPath(std::string const& name)
{
    static TemporaryFolder const folder;
    return folder.file(name);
}

} // namespace testsupport
