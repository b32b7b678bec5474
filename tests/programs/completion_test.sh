#!/usr/bin/env bash
# Completes command lines as bash does and compares what is offered with what the tool takes.
#   completion_test.sh COMPLETION ZV
set -euo pipefail
# shellcheck source=tools/zv/completion.bash
source "$1"
zv=$2
folder=$(mktemp -d)
trap 'rm -rf "$folder"' EXIT
mkdir "$folder/album" "$folder/an other"
touch "$folder/a.png"
cd "$folder"
failed=0

# What is offered for the last of the words given, sorted, on one line.
offered() {
    COMP_WORDS=("$@")
    COMP_CWORD=$(($# - 1))
    _zv
    printf '%s\n' "${COMPREPLY[@]}" | sort | paste -sd ' '
}

# expect OFFERED WORD...
expect() {
    local wanted=$1 found
    shift
    found=$(offered "$@")
    [ "$found" = "$wanted" ] && return
    echo "${*@Q}: offered \"$found\", not \"$wanted\""
    failed=1
}

# The options and subcommands that a help page lists.
listed() {
    "$zv" "$@" --help | sed -nE 's/^  (-h,)?(--[a-z-]+|[a-z]+)( [A-Z]+)?  .*/\2/p' |
        sort | paste -sd ' '
}

[ "$(complete -p zv)" = "complete -F _zv zv" ] || failed=1
expect "$(listed)" zv ""
expect "$(listed path)" zv path ""
for command in copy scan match rm plugins info "path normalize" "path absolute" "path relative" \
    "path split" "path locate"; do
    # shellcheck disable=SC2086
    expect "$(listed $command)" zv $command --
done
expect "copy" zv c
expect "a.png album an other" zv copy a
expect "a.png album an other" zv path split a
expect "album an other" zv scan a
expect "album an other" zv path absolute x --base a
expect "album" zv plugins img --dir al
expect "" zv scan album --files a
expect "" zv match a
exit "$failed"
