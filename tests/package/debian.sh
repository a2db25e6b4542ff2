#!/usr/bin/env bash
# Looks into Debian packages, installs them into a fresh root in the first way that works here, and runs what is there:
#   debian.sh FOLDER_OF_PACKAGES
set -euo pipefail
packages=$(realpath "$1")
root=$(mktemp -d)
trap 'rm -rf "$root"' EXIT
multiarch=$(dpkg-architecture -qDEB_HOST_MULTIARCH)

fail() {
    echo "$*" >&2
    exit 1
}

holds() { # holds PACKAGE PATTERN...
    local list
    list=$(dpkg-deb -c "$packages/$1"_*.deb)
    shift
    for pattern in "$@"; do
        grep -qE "$pattern" <<<"$list" || fail "no $pattern among: $list"
    done
}

# What is built with others' code has their notices beside it; the core has none of it.
for name in libvelmora0 velmora obdsim libobdsim-dev python3-velmora; do
    holds "$name" "doc/$name/THIRD-PARTY-NOTICES(\.gz)?$"
done
holds libobd0 'libobd\.so\.0\.'
holds libvelmora0 'libvelmora\.so\.0\.'
holds libvelmora-dev '/obd/obd\.h$' '/velmora/velmora\.h$' 'pkgconfig/velmora\.pc$' 'velmoraConfig\.cmake$'
holds libobdsim-dev '/obdsim/sim\.h$' 'libobdsim\.a$' 'velmoraSimTargets\.cmake$'
for page in "$(dirname "$0")"/../../packaging/manual/*.5; do
    page=${page##*/}
    holds "${page%%-*}" "man5/${page//./\\.}\\.gz$"
done
holds velmora 'man1/velmora-scan\.1\.gz$' 'completions/velmora$' 'vendor-completions/_velmora$' \
    'rules\.d/60-velmora\.rules$' 'velmora-watch\.service$'
holds obdsim 'bin/obdsim$' 'man1/obdsim\.1\.gz$'
holds python3-velmora 'velmora/__init__\.py$' '_velmora\..*\.so$' 'py\.typed$'
holds velmora-doc 'companion\.md' 'html/index\.html$' 'html/group__cface\.html$' 'examples/car/read\.cpp$'

installed=(libobd0 libvelmora0 velmora obdsim python3-velmora)
mapfile -t files < <(for name in "${installed[@]}"; do ls "$packages/$name"_*.deb; done)
suite=$(. /etc/os-release && echo "$VERSION_CODENAME")
# "none" for a machine that has one but is not to use it.
mirror=${VELMORA_MIRROR:-$(apt-get indextargets --format '$(SITE)' 'Created-By: Packages' "Codename: $suite" 2>/dev/null |
    head -n 1 || true)}

# A whole system of Debian's packages and ours, which asks a mirror for what ours depend on.
with_mmdebstrap() {
    [[ $EUID -eq 0 && -n $mirror && $mirror != none ]] && command -v mmdebstrap >/dev/null || return 1
    timeout 600 mmdebstrap --quiet --mode=root --variant=apt --hook-dir=/usr/share/mmdebstrap/hooks/file-mirror-automount \
        "${files[@]/#/--include=}" "$suite" "$root/system" "$mirror" >"$root/said" 2>&1 || { tail -n 3 "$root/said"; return 1; }
    system=$root/system
    enter=(chroot "$system")
}
# A root with nothing but ours. Maintainer scripts want more than that, so what has some is unpacked there.
with_dpkg() {
    local file plain=()
    system=$root/dpkg
    mkdir -p "$system/var/lib/dpkg/updates" "$system/var/lib/dpkg/info"
    : >"$system/var/lib/dpkg/status"
    for file in "${files[@]}"; do
        if dpkg-deb --ctrl-tarfile "$file" | tar -t | grep -E '/(pre|post)(inst|rm)$' >/dev/null; then
            dpkg-deb -x "$file" "$system"
        else
            plain+=("$file")
        fi
    done
    dpkg --root="$system" --force-depends --force-not-root --log=/dev/null -i "${plain[@]}" >"$root/said" 2>&1
}
with_unpacking() {
    local file
    system=$root/unpacked
    for file in "${files[@]}"; do
        dpkg-deb -x "$file" "$system"
    done
}

enter=()
for way in with_mmdebstrap with_dpkg with_unpacking; do
    if "$way"; then
        echo "installed ${way//_/ }"
        break
    fi
done

# run PROGRAM ARGUMENT...: in the system itself where that is one to enter, else beside this one's libraries.
run() {
    if [[ ${#enter[@]} -gt 0 ]]; then
        "${enter[@]}" env PATH=/usr/bin:/bin XDG_CONFIG_HOME=/proc/nonexistent "$@"
    else
        env PATH="$system/usr/bin:/usr/bin:/bin" LD_LIBRARY_PATH="$system/usr/lib/$multiarch" \
            PYTHONPATH="$system/usr/lib/python3/dist-packages" XDG_CONFIG_HOME=/proc/nonexistent "$@"
    fi
}
said=$(run velmora -q -p 'sim:petrol-can11?instant' info)
[[ $said == *VIN* ]] || fail "velmora says: $said"
run obdsim --list | grep petrol-can11 >/dev/null || fail "obdsim lists no vehicle"
said=$(run python3 -c 'import velmora
with velmora.Car("sim:petrol-can11?instant") as car: print(car.read("RPM")[0])')
[[ $said == Engine\ RPM:* ]] || fail "Python says: $said"
run python3 -c 'from velmora import Reading, _velmora
seconds = _velmora.callback_seconds(lambda plain: Reading(*plain), 100000)
print(f"100000 callbacks take {seconds:.2f} s of processor time")
assert seconds < 1' || fail "callbacks to Python are slow"
for file in "$system"/usr/bin/{velmora,obdsim} "$system/usr/lib/$multiarch"/lib{obd,velmora}.so.0.* \
    "$system"/usr/lib/python3/dist-packages/velmora/*.so; do
    ! readelf -d "$file" | grep -E 'R(UN)?PATH' || fail "$file has a run path"
done

# The service manager's judgement of the unit, beside the units and the kill that each system has.
unit=$(find "$system" -type f -name velmora-watch.service)
find /usr/lib/systemd/system -maxdepth 1 -type f -name '*.*' -exec cp -n -t "${unit%/*}" {} +
[[ -x $system/bin/kill ]] || install -D /bin/kill "$system/bin/kill"
said=$(systemd-analyze verify --man=no --root="$system" velmora-watch.service 2>&1) || fail "systemd-analyze verify: $said"
[[ -z $said ]] || fail "systemd-analyze verify says: $said"
said=$(systemd-analyze security --offline=true --threshold=25 --root="$system" velmora-watch.service) || fail "$said"

if [[ ${#enter[@]} -gt 0 ]]; then
    "${enter[@]}" dpkg --purge "${installed[@]}" >"$root/said" 2>&1 || fail "not to be removed: $(<"$root/said")"
    left=$(find "$system"/{etc,lib,usr,var/lib} -path '*/dpkg/info' -prune -o -iname '*velmora*' -print -o -name '*obdsim*' -print)
    [[ -z $left ]] || fail "removing the packages leaves $left"
fi
echo "the packages are whole"
