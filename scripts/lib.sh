# Sourced by the other scripts: tells what is done, and installs what a fresh Debian 12 lacks.

cd "$(dirname "${BASH_SOURCE[0]}")/.."

# With the minutes since the script began.
say() { printf '\n== %s (%d:%02d)\n' "$*" $((SECONDS / 60)) $((SECONDS % 60)); }

as_root() {
    if [[ $EUID -eq 0 ]]; then "$@"; else sudo "$@"; fi
}

# need PACKAGE...: installs the Debian packages that are not there yet.
need() {
    local missing=() package
    for package in "$@"; do
        dpkg-query -W -f='${Status}' "$package" 2>/dev/null | grep -q 'ok installed' || missing+=("$package")
    done
    [[ ${#missing[@]} -gt 0 ]] || return 0
    say "Installing Debian packages: ${missing[*]}"
    as_root apt-get update -qq
    as_root env DEBIAN_FRONTEND=noninteractive apt-get install -y -qq --no-install-recommends "${missing[@]}"
}

build_packages=(g++ cmake ninja-build)
build_packages+=(libasio-dev libcli11-dev nlohmann-json3-dev libfmt-dev libtomlplusplus-dev)
build_packages+=(libsqlite3-dev libboost-dev libmosquitto-dev)
build_packages+=(libjs-chart.js libqrcodegencpp-dev) # of the page in the browser
build_packages+=(libncurses-dev) # the live view in a terminal
build_packages+=(libsystemd-dev) # Bluetooth's service
build_packages+=(pybind11-dev libpython3-dev python3-dev)
test_packages=(libgtest-dev libgmock-dev libbenchmark-dev strace mold)
test_packages+=(tmux zbar-tools) # what the screen is read by
test_packages+=(clang libclang-rt-14-dev clang-format clang-tidy)
test_packages+=(python3-jsonschema pkgconf)
test_packages+=(python3-pytest python3-venv python3-pip mypy)
test_packages+=(man-db bash-completion zsh fish)                            # what manual and completion are read by
test_packages+=(prometheus systemd mosquitto mosquitto-clients nats-server) # what outputs speak to
test_packages+=(openssl postgresql python3-paho-mqtt python3-psycopg)           # what fleets are made of
test_packages+=(chromium poppler-utils default-jre-headless)                # what reads reports and pages
test_packages+=(abigail-tools xz-utils)                                          # what guards the ABI
test_packages+=(python3-dbusmock)                                           # plays the Bluetooth service
# Some have a newer Node with an npm of its own, which Debian's package would collide with.
command -v npm >/dev/null || test_packages+=(nodejs npm)

package_packages=(debhelper dh-python dpkg-dev fakeroot lintian mmdebstrap libjs-chart.js libqrcodegencpp-dev) # Debian's packages
package_packages+=(doxygen)

# build PRESET [TARGET...]: configures and builds.
build() {
    local preset=$1
    shift
    cmake --preset "$preset" >/dev/null
    if [[ $# -gt 0 ]]; then
        cmake --build --preset "$preset" --target "$@"
    else
        cmake --build --preset "$preset"
    fi
}
