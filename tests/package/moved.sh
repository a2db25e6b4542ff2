#!/usr/bin/env bash
# The installed program finds its libraries by itself, wherever the prefix lies:
#   moved.sh STAGE WORK_FOLDER
set -euo pipefail
rm -rf "$2/moved prefix"
cp -a "$1" "$2/moved prefix"
mapfile -t programs < <(find "$2/moved prefix" -name velmora -type f -perm -u+x)
[[ ${#programs[@]} -eq 1 ]] || { echo "installed programs: ${programs[*]}"; exit 1; }
env -u LD_LIBRARY_PATH ldd "${programs[0]}" | grep libobd.so | tee /dev/stderr | grep -q 'moved prefix' ||
    { echo "the program doesn't use the library of its prefix"; exit 1; }
said=$(env -u LD_LIBRARY_PATH VELMORA_SETTINGS=/proc/nonexistent/settings.toml "${programs[0]}" -q -p 'sim:petrol-can11?instant' info)
[[ $said == *VIN* ]] || { echo "said: $said"; exit 1; }
