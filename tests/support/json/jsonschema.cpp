#include "tests/support/json/jsonschema.h"

#include "tests/support/temporaryfolder.h"

#include <gtest/gtest.h>

#include <array>
#include <cstdio>
#include <filesystem>
#include <fstream>

namespace support {

namespace {

// What a command prints, and that it failed, if it did.
std::string outputOf(std::string const& command)
{
    std::FILE* const pipe = ::popen((command + " 2>&1").c_str(), "r");
    if (pipe == nullptr) {
        return "could not run " + command + "\n";
    }
    std::string output;
    std::array<char, 4096> part{};
    while (std::size_t const count = std::fread(part.data(), 1, part.size(), pipe)) {
        output.append(part.data(), count);
    }
    return ::pclose(pipe) == 0 ? output : output + "failed: " + command + "\n";
}

std::string quoted(std::filesystem::path const& path)
{
    return "'" + path.string() + "'";
}

} // namespace

std::string schemaErrors(std::string const& document, std::string const& definition)
{
    std::filesystem::path const source = VELMORA_SOURCE_DIR;
    testsupport::TemporaryFolder const folder;
    std::filesystem::path const file = folder.path() / "document.json";
    std::ofstream(file) << document;
    return outputOf("python3 " + quoted(source / "tests/support/json/validatejson.py") + " " +
                    quoted(source / "docs/json.schema.json") + " " + definition + " " + quoted(file));
}

void expectValid(std::string const& document, std::string const& definition)
{
    std::string const errors = schemaErrors(document, definition);
    EXPECT_TRUE(errors.empty()) << definition << ": " << errors << document;
}

} // namespace support
