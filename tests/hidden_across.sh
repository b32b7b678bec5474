#!/usr/bin/env bash
# What one platform's build hides is hidden for the other's, on one file system.
#   tests/hidden_across.sh LINUX_BUILD WINDOWS_BUILD
set -euo pipefail
wine=${WINE:-$(command -v wine64 || echo /usr/lib/wine/wine64)}
native=$1/bin/zarvo_hidden
foreign=$2/bin/zarvo_hidden.exe
scratch=$(mktemp -d "${TMPDIR:-/tmp}/zarvo-hidden-XXXXXX")
trap 'rm -rf "$scratch"' EXIT
failures=0

# Under Wine the drive Z: is the whole file system.
on_linux() { "$native" "$scratch/$1" "${@:2}"; }
on_windows() { "$wine" "$foreign" "Z:$scratch/$1" "${@:2}" </dev/null | tr -d '\r'; }

expect() {
    local what=$1 expected=$2 got=$3
    [ "$got" = "$expected" ] && return
    echo "hidden_across: $what: $got instead of $expected" >&2
    failures=$((failures + 1))
}

mkdir "$scratch/folder"
touch "$scratch/file"
if ! on_linux file 1; then
    echo "hidden_across: skipped, as the file system of $scratch keeps no extended attributes"
    exit 0
fi
on_linux file 0

for name in file folder; do
    for first in linux windows; do
        second=$([ "$first" = linux ] && echo windows || echo linux)
        for value in 1 0; do
            "on_$first" "$name" "$value" || expect "$name set to $value by $first" success failure
            expect "$name set to $value by $first, read by $first" "$value" "$("on_$first" "$name")"
            expect "$name set to $value by $first, read by $second" "$value" "$("on_$second" "$name")"
        done
    done
done
[ "$failures" -eq 0 ] || exit 1
echo "hidden_across: both builds agree"
