#!/usr/bin/env bash
# What one platform's build hides is hidden for the other's, on one file system.
#   tests/hidden_across.sh LINUX_BUILD WINDOWS_BUILD
set -euo pipefail
builds=("$@")
wine=${WINE:-$(command -v wine64 || echo /usr/lib/wine/wine64)}
scratch=$(mktemp -d "${TMPDIR:-/tmp}/zarvo-hidden-XXXXXX")
trap 'rm -rf "$scratch"' EXIT

on_linux() { "${builds[0]}/bin/zarvo_hidden" "$scratch/$1" "${@:2}"; }
# Under Wine the drive Z: is the whole file system.
on_windows() { "$wine" "${builds[1]}/bin/zarvo_hidden.exe" "Z:$scratch/$1" "${@:2}" </dev/null | tr -d '\r'; }

mkdir "$scratch/folder"
touch "$scratch/file"
if ! on_linux file 1; then
    echo "hidden_across: skipped, as the file system of $scratch keeps no extended attributes"
    exit 0
fi
for setting in {file,folder}\ on_{linux,windows}\ {1,0}; do
    read -r name writer value <<<"$setting"
    "$writer" "$name" "$value"
    for reader in on_linux on_windows; do
        [ "$("$reader" "$name")" = "$value" ] && continue
        echo "hidden_across: $setting is not seen $reader" >&2
        exit 1
    done
done
echo "hidden_across: both builds agree"
