#include "libvelmora/output/outputaddress.h"

#include "libvelmora/record/checkedfile.h"

#include <velmora/error.h>

#include <algorithm>
#include <array>
#include <charconv>
#include <string_view>
#include <vector>

namespace velmora {

namespace {

struct KnownKind
{
    std::string_view name;
    bool isUrl;                         // NAME://TARGET instead of NAME:TARGET
    std::vector<std::string_view> keys; // beside queue, which all have
};

std::vector<KnownKind> const& knownKinds()
{
    static std::vector<std::string_view> const broker = {
        "qos", "ca", "user_file", "password_file", "ack_topic", "spool", "spool_max", "discovery", "keep_alive"};
    static std::vector<KnownKind> const kinds = {
        {"csv", false, {"rotate"}},
        {"csv-long", false, {"rotate"}},
        {"ndjson", false, {"rotate"}},
        {"influx", false, {"rotate"}},
        {"sqlite", false, {"ballast"}},
        {"prometheus", false, {}},
        {"dash", false, {"allow_clear", "allow_console", "name"}},
        {"mqtt", true, broker},
        {"mqtts", true, broker},
    };
    return kinds;
}

KnownKind const* findKind(std::string_view name)
{
    auto const found = std::ranges::find(knownKinds(), name, &KnownKind::name);
    return found == knownKinds().end() ? nullptr : &*found;
}

std::vector<std::string> const& outputForms()
{
    static std::vector<std::string> const hints = {
        "files: csv:FILE, csv-long:FILE, ndjson:FILE, influx:FILE, sqlite:FILE; ndjson:- is standard output",
        "network: mqtt://HOST:PORT/TOPIC, mqtts://HOST:PORT/TOPIC, prometheus:HOST:PORT, dash:HOST:PORT, "
        "influx:udp://HOST:PORT",
        "settings follow a question mark: csv:drive.csv?rotate=day"};
    return hints;
}

bool writesFiles(std::string_view kind)
{
    static constexpr std::array<std::string_view, 5> kinds = {"csv", "csv-long", "ndjson", "influx", "sqlite"};
    return std::ranges::find(kinds, kind) != kinds.end();
}

[[noreturn]] void rejectOutput(std::string const& text, std::string const& why)
{
    throw Error(ErrorKind::WrongUse, "\"" + text + "\" is no output: " + why, outputForms());
}

void addOptions(OutputAddress& address, std::string const& whole, std::string_view options)
{
    while (!options.empty()) {
        std::string_view const part = options.substr(0, options.find('&'));
        options.remove_prefix(std::min(part.size() + 1, options.size()));
        std::size_t const equals = part.find('=');
        if (equals == 0 || equals == std::string_view::npos) {
            rejectOutput(whole, "\"" + std::string(part) + "\" is not key=value");
        }
        addOption(address, std::string(part.substr(0, equals)), std::string(part.substr(equals + 1)));
    }
}

} // namespace

std::string OutputAddress::option(std::string const& key, std::string const& otherwise) const
{
    auto const found = options.find(key);
    return found == options.end() ? otherwise : found->second;
}

OutputAddress parseOutputAddress(std::string const& text)
{
    std::size_t const colon = text.find(':');
    KnownKind const* const kind = colon == std::string::npos ? nullptr : findKind(text.substr(0, colon));
    if (kind == nullptr) {
        rejectOutput(text, "it does not begin with a known kind and a colon");
    }
    std::string_view rest = std::string_view(text).substr(colon + 1);
    if (kind->isUrl) {
        if (!rest.starts_with("//")) {
            rejectOutput(text, "// is missing behind the colon");
        }
        rest.remove_prefix(2);
    }
    std::size_t const query = rest.find('?');
    OutputAddress address{std::string(kind->name), std::string(rest.substr(0, query)), {}};
    if (address.target.empty()) {
        rejectOutput(text, "where it goes is missing");
    }
    if (query != std::string_view::npos) {
        addOptions(address, text, rest.substr(query + 1));
    }
    return address;
}

// As an absolute path no name of a file reads as standard output, or as a host's.
OutputAddress fileOutput(std::string const& kind, std::filesystem::path const& file)
{
    if (!writesFiles(kind)) {
        throw Error(ErrorKind::WrongUse, "\"" + kind + "\" is no kind of output that writes files", outputForms());
    }
    return {kind, std::filesystem::absolute(file).string(), {}};
}

void addOption(OutputAddress& address, std::string const& key, std::string const& value)
{
    std::vector<std::string_view> keys = findKind(address.kind)->keys;
    keys.emplace_back("queue");
    if (std::ranges::find(keys, key) == keys.end()) {
        std::string list;
        for (std::string_view const each : keys) {
            list += (list.empty() ? "" : ", ") + std::string(each);
        }
        throw Error(ErrorKind::WrongUse, "The output " + toString(address) + " has no setting \"" + key + "\"",
                    {"it knows " + list});
    }
    if (!address.options.emplace(key, value).second) {
        throw Error(ErrorKind::WrongUse, "The output " + toString(address) + " is given \"" + key + "\" twice");
    }
}

std::string toString(OutputAddress const& address)
{
    KnownKind const* const kind = findKind(address.kind);
    return address.kind + (kind != nullptr && kind->isUrl ? "://" : ":") + address.target;
}

void requirePlainTarget(OutputAddress const& address)
{
    if (writesFiles(address.kind) && address.target != "-" && !address.target.starts_with("udp://")) {
        requirePlainFile(address.target);
    }
}

unsigned long long parseSize(std::string const& text)
{
    unsigned long long value = 0;
    auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), value);
    std::string_view unit(end, text.data() + text.size());
    if (unit.ends_with('B') || unit.ends_with('b')) {
        unit.remove_suffix(1);
    }
    struct Power
    {
        std::string_view upper;
        std::string_view lower;
        unsigned int shift;
    };
    static constexpr Power powers[] = {{"", "", 0}, {"K", "k", 10}, {"M", "m", 20}, {"G", "g", 30}};
    auto const* const power =
        std::ranges::find_if(powers, [unit](Power const& each) { return unit == each.upper || unit == each.lower; });
    if (error != std::errc() || value == 0 || power == std::end(powers) || value > (~0ULL >> power->shift)) {
        throw Error(ErrorKind::WrongUse, "\"" + text + "\" is no size", {"sizes are such as 500k, 10MB or 2G"});
    }
    return value << power->shift;
}

} // namespace velmora
