#!/usr/bin/env bash
# dialect.sh finds each const that stands before its type, and lets pass what is right.
set -euo pipefail
dialect=$(dirname "$(realpath "$0")")/dialect.sh
tree=$(mktemp -d)
trap 'rm -rf "$tree"' EXIT
mkdir "$tree/common"
cat >"$tree/common/good.h" <<'END'
// A const int, in words.
int const a = 1;
static std::string const b = "const char";
int f(std::string const& text, int const* numbers) const;
int g() const noexcept;
auto const& c = std::map<int, int const>();
constexpr auto say = [](int const x) { return "x, const int"; };
END
"$dialect" "$tree"
while read -r line; do
    echo "$line" >"$tree/common/bad.h"
    "$dialect" "$tree" >/dev/null && { echo "it passes $line"; exit 1; }
done <<'END'
const int a = 1;
    const std::string b;
static const int c = 1;
int f(const std::string& text);
int f(int a, const std::string& text);
std::vector<const char*> g;
for (const auto& each : all) {
END
exit 0
