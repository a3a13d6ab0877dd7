# SPDX-License-Identifier: MIT
# Completion of qnsmedia(1) in fish.

# The command among the words before the cursor, those of the library with both their words;
# nothing when there is none yet.
function __qnsmedia_command
    set -l words (commandline -opc)
    set -l option
    set -l command
    for word in $words[2..]
        switch "$option$word"
            case --identity --timeout --database
                set option $word
            case '-*' # a flag, or an option with its value
                set option
            case '*'
                set command $command $word
                test "$command" = library; or break
        end
    end
    echo "$command"
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

complete -c qnsmedia -n $start -a import -d 'Take files into the media library'
complete -c qnsmedia -n $start -a library -d 'Read the media library'
complete -c qnsmedia -n $start -a monitor -d 'Tell everything that the daemon notifies'
complete -c qnsmedia -n $start -a poweroff -d 'End the daemon'

complete -c qnsmedia -n '__qnsmedia_in play info image import "library show"' -F
complete -c qnsmedia -n '__qnsmedia_in status info extensions import monitor' -l json -d 'For programs'
complete -c qnsmedia -n '__qnsmedia_in image' -s o -l output -rF -d 'File to write'
complete -c qnsmedia -n '__qnsmedia_in image' -l at -x -d 'Moment, such as 1:23.5 or 50%'
complete -c qnsmedia -n '__qnsmedia_in image' -l size -x -d 'Width and height, such as 640x360'

complete -c qnsmedia -n '__qnsmedia_in import' -l to -x -d 'Folder inside the library'
complete -c qnsmedia -n '__qnsmedia_in library' -l database -rF -d 'The library\'s database'
complete -c qnsmedia -n '__qnsmedia_in library' -a list -d 'All media'
complete -c qnsmedia -n '__qnsmedia_in library' -a search -d 'Media with all these words'
complete -c qnsmedia -n '__qnsmedia_in library' -a show -d 'All that is known of a medium'
complete -c qnsmedia -n '__qnsmedia_in library' -a export -d 'The whole library as JSON'
set -l reads '"library list" "library search" "library show" "library export"'
complete -c qnsmedia -n "__qnsmedia_in $reads" -l json -d 'For programs'
complete -c qnsmedia -n '__qnsmedia_in poweroff' -s y -l yes -d 'Without asking'
