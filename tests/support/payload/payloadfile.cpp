#include "tests/support/payload/payloadfile.h"

#include "tests/support/hexbytes.h"

#include <fstream>
#include <regex>
#include <stdexcept>

namespace support {

namespace {

enum Field : std::size_t
{
    Request,
    Occurrence,
    Module,
    Payload,
    Mark,
    Reason,
};

std::vector<std::string> split(std::string const& text, std::regex const& separator)
{
    return {std::sregex_token_iterator(text.begin(), text.end(), separator, -1), {}};
}

std::vector<std::string> fieldsOf(std::string const& line)
{
    static std::regex const twoBlanks("  +");
    std::vector<std::string> fields = split(line, twoBlanks);
    if (fields.size() <= Payload || fields.size() > Reason + 1) {
        throw std::runtime_error("wrong count of fields");
    }
    fields.resize(Reason + 1);
    return fields;
}

std::vector<std::vector<unsigned char>> messagesOf(std::string const& field)
{
    static std::regex const slash(" / ");
    std::vector<std::vector<unsigned char>> messages;
    for (std::string const& message : split(field, slash)) {
        messages.push_back(message == "-" ? std::vector<unsigned char>() : hexBytes(message));
    }
    return messages;
}

void fileUnder(ModuleMessages& payloads, std::string const& module, std::string const& payload)
{
    if (module == "none") {
        return;
    }
    auto const id = static_cast<unsigned int>(std::stoul(module, nullptr, 16));
    if (!payloads.emplace(id, messagesOf(payload)).second) {
        throw std::runtime_error("module told twice");
    }
}

void readPayloadLine(std::string const& line, PayloadFile& file)
{
    std::vector<std::string> const fields = fieldsOf(line);
    std::string const& mark = fields[Mark];
    if (!mark.empty() && mark != "standard" && mark != "rule") {
        throw std::runtime_error("unknown mark");
    }
    std::string const request = fields[Request] == "-" ? "" : fields[Request];
    ExpectedPayloads& expected = file[{request, std::stoi(fields[Occurrence])}];
    if (mark != "standard") {
        fileUnder(expected.rule, fields[Module], fields[Payload]);
    }
    if (mark != "rule") {
        fileUnder(expected.standard, fields[Module], fields[Payload]);
    }
    if (!fields[Reason].empty()) {
        expected.reasons.push_back(fields[Reason]);
    }
}

} // namespace

PayloadFile readPayloads(std::filesystem::path const& path)
{
    std::ifstream in(path);
    if (!in) {
        throw std::runtime_error(path.string() + " cannot be read");
    }
    PayloadFile file;
    for (std::string line; std::getline(in, line);) {
        try {
            if (!line.empty() && line.front() != '#') {
                readPayloadLine(line, file);
            }
        } catch (std::exception const& problem) {
            throw std::runtime_error(path.string() + ": " + problem.what() + ": " + line);
        }
    }
    return file;
}

} // namespace support
