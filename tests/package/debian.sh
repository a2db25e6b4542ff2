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

holds libobd0 'libobd\.so\.0\.'
holds libvelmora0 'libvelmora\.so\.0\.'
holds libvelmora-dev '/obd/obd\.h$' '/velmora/velmora\.h$' 'pkgconfig/velmora\.pc$' 'velmoraConfig\.cmake$'
holds libobdsim-dev '/obdsim/sim\.h$' 'libobdsim\.a$' 'velmoraSimTargets\.cmake$'
holds velmora 'man1/velmora-scan\.1\.gz$' 'man5/velmora-signals\.5\.gz$' 'completions/velmora$' 'vendor-completions/_velmora$' \
    'rules\.d/60-velmora\.rules$' 'velmora-watch\.service$'
holds obdsim 'bin/obdsim$' 'man1/obdsim\.1\.gz$'
holds python3-velmora 'velmora/__init__\.py$' '_velmora\..*\.so$' 'py\.typed$'
holds velmora-doc 'companion\.md'

installed=(libobd0 libvelmora0 velmora obdsim python3-velmora)
mapfile -t files < <(for name in "${installed[@]}"; do ls "$packages/$name"_*.deb; done)

with_mmdebstrap() {
    command -v mmdebstrap >/dev/null && [[ -n ${VELMORA_MIRROR:-} ]] &&
        mmdebstrap --quiet --mode=auto --variant=apt --hook-dir=/usr/share/mmdebstrap/hooks/file-mirror-automount \
            --include="$(IFS=,; echo "${files[*]}")" bookworm "$root" "$VELMORA_MIRROR"
}
with_dpkg() {
    mkdir -p "$root/var/lib/dpkg/updates" "$root/var/lib/dpkg/info"
    : >"$root/var/lib/dpkg/status"
    dpkg --root="$root" --force-depends --force-not-root --force-script-chrootless --log=/dev/null \
        -i "${files[@]}" >/dev/null 2>&1
}
with_unpacking() {
    rm -rf "${root:?}"/*
    for file in "${files[@]}"; do
        dpkg-deb -x "$file" "$root"
    done
}

for way in with_mmdebstrap with_dpkg with_unpacking; do
    if "$way"; then
        echo "installed ${way//_/ }"
        break
    fi
done

export LD_LIBRARY_PATH=$root/usr/lib/$multiarch XDG_CONFIG_HOME=/proc/nonexistent
said=$("$root/usr/bin/velmora" -q -p 'sim:petrol-can11?instant' info)
[[ $said == *VIN* ]] || fail "velmora says: $said"
"$root/usr/bin/obdsim" --list | grep -q petrol-can11 || fail "obdsim lists no vehicle"
said=$(PYTHONPATH=$root/usr/lib/python3/dist-packages /usr/bin/python3 -c 'import velmora
with velmora.Car("sim:petrol-can11?instant") as car: print(car.read("RPM")[0])')
[[ $said == Engine\ RPM:* ]] || fail "Python says: $said"
for file in "$root"/usr/bin/* "$LD_LIBRARY_PATH"/lib*.so.0.*; do
    ! readelf -d "$file" | grep -E 'R(UN)?PATH' || fail "$file has a run path"
done
echo "the packages are whole"
