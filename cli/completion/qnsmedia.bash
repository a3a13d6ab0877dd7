# SPDX-License-Identifier: MIT
# Completion of qnsmedia(1) in bash.

# The command among the words before the cursor, those of the library with both their words;
# nothing when there is none yet.
_qnsmedia_command() {
    local i command=
    for ((i = 1; i < COMP_CWORD; ++i)); do
        case ${COMP_WORDS[i]} in
        --identity | --timeout | --database) ((++i)) ;;
        -*) ;;
        *)
            command+=${command:+ }${COMP_WORDS[i]}
            [[ $command == library ]] || break
            ;;
        esac
    done
    echo "$command"
}

_qnsmedia_words() {
    mapfile -t COMPREPLY < <(compgen -W "$1" -- "${COMP_WORDS[COMP_CWORD]}")
}

_qnsmedia_files() {
    compopt -o filenames 2>/dev/null
    mapfile -t COMPREPLY < <(compgen -f -- "${COMP_WORDS[COMP_CWORD]}")
}

# Options when one has been begun, otherwise files.
_qnsmedia_options_or_files() {
    if [[ ${COMP_WORDS[COMP_CWORD]} == -* ]]; then
        _qnsmedia_words "$1"
    else
        _qnsmedia_files
    fi
}

_qnsmedia() {
    local command before=${COMP_WORDS[COMP_CWORD - 1]}
    COMPREPLY=()
    command=$(_qnsmedia_command)
    case $command:$before in
    :--identity) _qnsmedia_words "$(echo {1000..1007})" ;;
    :--timeout | image:--at | image:--size | import:--to) ;;
    image:-o | image:--output | library:--database) _qnsmedia_files ;;
    :*)
        if [[ ${COMP_WORDS[COMP_CWORD]} == -* ]]; then
            _qnsmedia_words '-h --help --version --identity --timeout'
        else
            _qnsmedia_words 'play status info image extensions import library monitor poweroff'
        fi
        ;;
    play:*) _qnsmedia_options_or_files '-h --help' ;;
    status:* | extensions:* | monitor:*) _qnsmedia_words '-h --help --json' ;;
    info:*) _qnsmedia_options_or_files '-h --help --json' ;;
    image:*) _qnsmedia_options_or_files '-h --help -o --output --at --size' ;;
    import:*) _qnsmedia_options_or_files '-h --help --to --json' ;;
    poweroff:*) _qnsmedia_words '-h --help -y --yes' ;;
    library:*)
        if [[ ${COMP_WORDS[COMP_CWORD]} == -* ]]; then
            _qnsmedia_words '-h --help --database'
        else
            _qnsmedia_words 'list search show export'
        fi
        ;;
    'library show':*) _qnsmedia_options_or_files '-h --help --json' ;;
    'library list':* | 'library search':* | 'library export':*)
        _qnsmedia_words '-h --help --json'
        ;;
    esac
}

complete -F _qnsmedia qnsmedia
