# SPDX-License-Identifier: MIT
# Completion of qnsmedia(1) in fish.

# The command among the words before the cursor; nothing when there is none yet.
function __qnsmedia_command
    set -l words (commandline -opc)
    set -l option
    for word in $words[2..]
        switch "$option$word"
            case --identity --timeout
                set option $word
            case '-*' # a flag, or an option with its value
                set option
            case '*'
                echo $word
                return
        end
    end
end

function __qnsmedia_in
    contains -- "$(__qnsmedia_command)" $argv
end

complete -c qnsmedia -f
complete -c qnsmedia -s h -l help -d 'Print help and exit'

set -l start '__qnsmedia_in ""'
complete -c qnsmedia -n $start -l version -d 'Print the version and exit'
complete -c qnsmedia -n $start -l identity -x -a '(seq 1000 1007)' -d 'Identity to use'
complete -c qnsmedia -n $start -l timeout -x -d 'Seconds to wait for an answer'
complete -c qnsmedia -n $start -a play -d 'Play a file or a URI to its end'
complete -c qnsmedia -n $start -a status -d 'Tell the player\'s state and position'
complete -c qnsmedia -n $start -a info -d 'Tell what files are: streams and tags'
complete -c qnsmedia -n $start -a image -d 'Write a picture of a file'
complete -c qnsmedia -n $start -a extensions -d 'Tell which files the daemon can open'

complete -c qnsmedia -n '__qnsmedia_in play info image' -F
complete -c qnsmedia -n '__qnsmedia_in status info extensions' -l json -d 'For programs'
complete -c qnsmedia -n '__qnsmedia_in image' -s o -l output -rF -d 'File to write'
complete -c qnsmedia -n '__qnsmedia_in image' -l at -x -d 'Moment, such as 1:23.5 or 50%'
complete -c qnsmedia -n '__qnsmedia_in image' -l size -x -d 'Width and height, such as 640x360'
