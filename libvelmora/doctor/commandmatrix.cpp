#include "libvelmora/doctor/commandmatrix.h"

#include <algorithm>
#include <cctype>
#include <iterator>

namespace velmora {

namespace {

constexpr char const* impossible = "ATQQ";
constexpr char const* versions[] = {"1.0", "1.1", "1.2", "1.3", "1.3a", "1.4", "1.4b", "2.0", "2.1", "2.2", "2.3"};

// "1.4b" of "ELM327 v1.4b"; what stands behind may be anything.
std::string versionOf(std::string const& identity)
{
    std::size_t const sign = identity.find(" v");
    if (sign == std::string::npos) {
        return {};
    }
    std::string version;
    for (std::size_t i = sign + 2; i < identity.size(); ++i) {
        char const each = identity[i];
        if (std::isalnum(static_cast<unsigned char>(each)) == 0 && each != '.') {
            break;
        }
        version += each;
    }
    return version;
}

// The place of a version among those that exist; one that does not has the place of the highest below it.
std::size_t rank(std::string const& version)
{
    std::size_t place = 0;
    for (std::size_t i = 0; i < std::size(versions); ++i) {
        if (versions[i] <= version) {
            place = i;
        }
    }
    return place;
}

bool knows(AskAdapter const& ask, CommandRow const& row)
{
    std::optional<std::string> const reply = ask(row.command);
    return reply && (row.answersOk ? reply->find("OK") != std::string::npos : !reply->empty() && *reply != "?");
}

} // namespace

CommandMatrix probeCommands(AskAdapter const& ask, std::string const& identity, bool isStn)
{
    CommandMatrix matrix;
    matrix.claimed = versionOf(identity);
    matrix.claimIsMadeUp = matrix.claimed == "1.5" || matrix.claimed == "1.4a";
    if (std::optional<std::string> const reply = ask(impossible); reply && reply->find("OK") != std::string::npos) {
        matrix.agreesToAll = true;
        return matrix;
    }
    std::size_t const claimed = rank(matrix.claimed);
    std::size_t level = std::size(versions);
    for (CommandRow const& row : commandRows()) {
        if ((isStn && !row.onStn) || knows(ask, row)) {
            continue;
        }
        level = std::min(level, rank(row.version));
        if (rank(row.version) <= claimed) {
            matrix.missing.emplace_back(row.command);
        }
    }
    matrix.level = level > 0 ? versions[level - 1] : "";
    return matrix;
}

} // namespace velmora
