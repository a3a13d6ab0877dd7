# SPDX-License-Identifier: MIT
# Prints what an interactive zsh would offer, one a line.
# usage: zsh -f list-choices.zsh FOLDER_OF_COMPLETIONS "COMMAND WORD..." CACHE_FILE
# The shell runs in a terminal of its own; its function compadd, which all completion ends in,
# notes the words on their way.
zmodload zsh/zpty
choices=$(mktemp)
zpty shell zsh -f -i
zpty -w shell "
    fpath=(${(q)1} \$fpath)
    autoload -Uz compinit
    compinit -u -d ${(q)3}
    compadd() {
        if [[ \${argv[(I)-[OAD]*]} -eq 0 ]]; then
            local -a matches
            builtin compadd -O matches \"\$@\"
            print -rl -- \$matches >>${(q)choices}
        fi
        builtin compadd \"\$@\"
    }
    choose() {
        _main_complete
        compstate[insert]= compstate[list]=
        print LIS''TED
    }
    zle -C choose list-choices choose
    bindkey '^I' choose
    print REA''DY"
zpty -r shell output '*READY*'
zpty -w -n shell "$2"$'\t'
zpty -r shell output '*LISTED*'
cat "$choices"
rm "$choices"
