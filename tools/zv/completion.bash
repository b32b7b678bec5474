# shellcheck shell=bash
# Completes the words of zv's command line in bash; it needs nothing but bash itself.

# Offers the words given that go on from the one at the cursor.
_zv_offer() {
    mapfile -t COMPREPLY < <(compgen -W "$1" -- "$2")
}

# Offers files, or folders alone with -d: a folder is completed with a slash and no blank.
_zv_offer_files() {
    compopt -o filenames 2>/dev/null
    mapfile -t COMPREPLY < <(compgen "$1" -- "$2")
}

_zv() {
    local word=${COMP_WORDS[COMP_CWORD]} before=${COMP_WORDS[COMP_CWORD - 1]}
    local command=${COMP_WORDS[1]} options=--help
    COMPREPLY=()
    if [ "$COMP_CWORD" -eq 1 ]; then
        _zv_offer "copy scan match path rm plugins info --help --version" "$word"
        return
    fi
    case $before in
        --base | --dir)
            _zv_offer_files -d "$word"
            return
            ;;
        --password-file | --ca)
            _zv_offer_files -f "$word"
            return
            ;;
        --timeout | --max-time | --retries | --user | --files | --dirs | --min | --max) return ;;
    esac
    case $command in
        copy)
            options+=" --timeout --max-time --retries --no-clobber --in-place --sync --user"
            options+=" --password-file --ca --quiet"
            ;;
        scan) options+=" --files --dirs --recursive --hidden --match-case --json" ;;
        path)
            if [ "$COMP_CWORD" -eq 2 ]; then
                _zv_offer "normalize absolute relative split locate --help" "$word"
                return
            fi
            options+=" --json"
            case ${COMP_WORDS[2]} in absolute | relative) options+=" --base" ;; esac
            ;;
        rm) options+=" --yes" ;;
        plugins) options+=" --dir --min --max --json" ;;
        info) options+=" --json" ;;
    esac
    case $command/$word in
        */-*) _zv_offer "$options" "$word" ;;
        scan/* | rm/*) _zv_offer_files -d "$word" ;;
        copy/* | path/*) _zv_offer_files -f "$word" ;;
    esac
}

complete -F _zv zv
