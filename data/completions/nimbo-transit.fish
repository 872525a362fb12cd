# fish completion for nimbo-transit(1)

# Runs nimbo-transit with the folders of the line that is being completed.
function __nimbo_transit_run
    set -l words (commandline -opc)
    set -l folders
    for i in (seq (count $words))
        if contains -- $words[$i] --config --state
            set -a folders $words[$i] $words[(math $i + 1)]
        end
    end
    nimbo-transit $folders $argv 2>/dev/null
end

function __nimbo_transit_feeds
    __nimbo_transit_run feed list | string match -r '^\S+$'
end

# Each line with its names as the description.
function __nimbo_transit_lines
    __nimbo_transit_run $argv | string match -r '^\S+:.*' | string replace -r '\s+' \t
end

function __nimbo_transit_catalog
    __nimbo_transit_run feed find '' | string replace -r '\s+' \t
end

# The words of the command so far.
function __nimbo_transit_words
    set -l skip 0
    for word in (commandline -opc)[2..]
        if test $skip = 1
            set skip 0
        else if contains -- $word --config --state
            set skip 1
        else if not string match -q -- '-*' $word
            echo $word
        end
    end
end

# Whether the command so far is this one, or this one and its sub-command.
function __nimbo_transit_at
    set -l words (__nimbo_transit_words)
    test (count $words) -ge (count $argv); or return 1
    for i in (seq (count $argv))
        test $words[$i] = $argv[$i]; or return 1
    end
    # A command of commands alone waits for one of them.
    contains -- "$argv" feed favorite settings; and test (count $words) -gt 1; and return 1
    return 0
end

function __nimbo_transit_no_command
    for command in status update render script feed lines favorite settings analytics decode
        __fish_seen_subcommand_from $command; and return 1
    end
    return 0
end

complete -c nimbo-transit -f
complete -c nimbo-transit -l config -r -a '(__fish_complete_directories)' -d 'Folder of feeds.json'
complete -c nimbo-transit -l state -r -a '(__fish_complete_directories)' -d 'Folder of favorites and last rows'
complete -c nimbo-transit -s h -l help -d 'Print the options'
complete -c nimbo-transit -n __nimbo_transit_no_command -l version -d 'Print the version'

complete -c nimbo-transit -n __nimbo_transit_no_command -a status -d 'Show how the favorite lines run'
complete -c nimbo-transit -n __nimbo_transit_no_command -a update -d 'Fetch, and keep the rows for the next start'
complete -c nimbo-transit -n __nimbo_transit_no_command -a render -d 'Draw the rows into a PNG file'
complete -c nimbo-transit -n __nimbo_transit_no_command -a script -d 'Play a file of host events'
complete -c nimbo-transit -n __nimbo_transit_no_command -a feed -d 'The feeds of the agencies'
complete -c nimbo-transit -n __nimbo_transit_no_command -a lines -d 'List the lines of all feeds'
complete -c nimbo-transit -n __nimbo_transit_no_command -a favorite -d 'Your favorite lines'
complete -c nimbo-transit -n __nimbo_transit_no_command -a settings -d 'Settings that widget and hosts share'
complete -c nimbo-transit -n __nimbo_transit_no_command -a analytics -d 'Show the usage records that are kept'
complete -c nimbo-transit -n __nimbo_transit_no_command -a decode -d 'Print a hand-off payload or a saved state'

for command in status render
    complete -c nimbo-transit -n "__nimbo_transit_at $command" -l expanded -d 'A row for each incident'
    complete -c nimbo-transit -n "__nimbo_transit_at $command" -l now -x -d 'Judge by this ISO date'
end
complete -c nimbo-transit -n '__nimbo_transit_at status' -l lines -d 'Each favorite line with its state'
complete -c nimbo-transit -n '__nimbo_transit_at status' -l planned -d 'What is to come within seven days'
complete -c nimbo-transit -n '__nimbo_transit_at status' -l saved -d 'The rows of the last time, without a fetch'
complete -c nimbo-transit -n '__nimbo_transit_at status' -l format -x -a 'text json waybar i3bar line' -d 'Form of what is printed'
complete -c nimbo-transit -n '__nimbo_transit_at status' -l exit-code -d 'The exit status tells the state'
complete -c nimbo-transit -n '__nimbo_transit_at status' -l json -d 'The snapshot as JSON'
complete -c nimbo-transit -n '__nimbo_transit_at status' -l waybar -d 'Short for --format waybar'
complete -c nimbo-transit -n '__nimbo_transit_at status' -l watch -d 'Go on printing lines'
for command in status update
    complete -c nimbo-transit -n "__nimbo_transit_at $command" -l notify -d 'Have the desktop tell of incidents'
end
complete -c nimbo-transit -n '__nimbo_transit_at render' -a '(__fish_complete_suffix .png)'
complete -c nimbo-transit -n '__nimbo_transit_at render' -l size -x -d 'Most room, WIDTHxHEIGHT'
complete -c nimbo-transit -n '__nimbo_transit_at render' -l scale -x -d 'Device pixels for each point'
complete -c nimbo-transit -n '__nimbo_transit_at render' -l text-size -x -d 'Size of the texts' \
    -a 'extraSmall small medium large extraLarge extraExtraLarge extraExtraExtraLarge accessibilityMedium accessibilityLarge accessibilityExtraLarge accessibilityExtraExtraLarge accessibilityExtraExtraExtraLarge'
complete -c nimbo-transit -n '__nimbo_transit_at render' -l dark -d 'In the dark appearance'
complete -c nimbo-transit -n '__nimbo_transit_at render' -l locale -x -d 'Language of the texts'
complete -c nimbo-transit -n '__nimbo_transit_at script' -F
complete -c nimbo-transit -n '__nimbo_transit_at script' -l virtual-time -x -d 'Time stands still at this ISO date'
complete -c nimbo-transit -n '__nimbo_transit_at decode' -F
complete -c nimbo-transit -n '__nimbo_transit_at analytics' -l json -d 'One JSON object a line'
for command in lines 'feed list' 'favorite list'
    complete -c nimbo-transit -n "__nimbo_transit_at $command" -l json -d 'As JSON'
end

complete -c nimbo-transit -n '__nimbo_transit_at feed' -a 'find add edit remove list check'
complete -c nimbo-transit -n '__nimbo_transit_at feed find' -l json -d 'As JSON'
complete -c nimbo-transit -n '__nimbo_transit_at feed add' -l from -x -a '(__nimbo_transit_catalog)' -d 'A feed of the catalog, by its ID'
complete -c nimbo-transit -n '__nimbo_transit_at feed edit' -l no-keys -d 'Forget its keys'
complete -c nimbo-transit -n '__nimbo_transit_at feed edit' -a '(__nimbo_transit_feeds)'
for command in add edit
    set -l at "__nimbo_transit_at feed $command"
    complete -c nimbo-transit -n $at -l static -r -F -d 'GTFS: folder, zip file or address'
    complete -c nimbo-transit -n $at -l alerts -r -F -d 'Alerts: file or address'
    complete -c nimbo-transit -n $at -l mirror -x -d 'Copy of the static feed'
    complete -c nimbo-transit -n $at -l key -x -d 'Key of the agency'
    complete -c nimbo-transit -n $at -l key-file -r -F -d 'File with the key'
    complete -c nimbo-transit -n $at -l header -x -d 'NAME: VALUE, sent to both servers'
    complete -c nimbo-transit -n $at -l static-header -x -d 'Sent for the lines'
    complete -c nimbo-transit -n $at -l alerts-header -x -d 'Sent for the alerts'
    complete -c nimbo-transit -n $at -l combined -d 'Alerts come beside other data'
    complete -c nimbo-transit -n $at -l no-combined -d 'Alerts come alone'
    complete -c nimbo-transit -n $at -l minor-alerts -d 'All alerts count'
    complete -c nimbo-transit -n $at -l no-minor-alerts -d 'Not all count'
    complete -c nimbo-transit -n $at -l maximum-age -x -d 'Minutes for which alerts count'
    complete -c nimbo-transit -n $at -l force -d 'Keep what cannot be used now'
end
complete -c nimbo-transit -n '__nimbo_transit_at feed remove' -a '(__nimbo_transit_feeds)'
complete -c nimbo-transit -n '__nimbo_transit_at feed check' -a '(__nimbo_transit_feeds)'

complete -c nimbo-transit -n '__nimbo_transit_at favorite' -a 'add remove move list'
complete -c nimbo-transit -n '__nimbo_transit_at favorite add' -a '(__nimbo_transit_lines lines)'
complete -c nimbo-transit -n '__nimbo_transit_at favorite remove' -a '(__nimbo_transit_lines favorite list)'
complete -c nimbo-transit -n '__nimbo_transit_at favorite move' -a '(__nimbo_transit_lines favorite list)'

complete -c nimbo-transit -n '__nimbo_transit_at settings' -a 'get set unset'
for command in get set unset
    complete -c nimbo-transit -n "__nimbo_transit_at settings $command; and test (count (__nimbo_transit_words)) = 2" \
        -a 'notify quietHours quietDays refreshSeconds Nimbo.TransitWidget.analytics.disabled Nimbo.TransitWidget.internal.injectFakeIncidents Nimbo.TransitWidget.internal.randomNumberIncidents'
end
# Whether the value of this setting comes next; the name may have a star.
function __nimbo_transit_sets
    set -l words (__nimbo_transit_words)
    test (count $words) = 3; and string match -q -- "settings set $argv" "$words"
end
complete -c nimbo-transit -n '__nimbo_transit_sets notify' -a 'on off severe'
complete -c nimbo-transit -n '__nimbo_transit_sets "Nimbo.*"' -a 'true false'
