# fish completion for nimbo-transit-layer(1)

complete -c nimbo-transit-layer -f
complete -c nimbo-transit-layer -l layer -x -a 'background bottom top overlay' -d 'What it lies on'
complete -c nimbo-transit-layer -l anchor -x -d 'Where on the output' \
    -a 'top-left top top-right left center right bottom-left bottom bottom-right'
complete -c nimbo-transit-layer -l margin -x -d 'Points from the edges, or top,right,bottom,left'
complete -c nimbo-transit-layer -l output -x -d 'Output to stand on'
complete -c nimbo-transit-layer -l width -x -d 'Points'
complete -c nimbo-transit-layer -l expanded -d 'Begin with a row for each incident'
complete -c nimbo-transit-layer -l config -r -a '(__fish_complete_directories)' -d 'Folder of feeds.json'
complete -c nimbo-transit-layer -l state -r -a '(__fish_complete_directories)' -d 'Folder of favorites and last rows'
complete -c nimbo-transit-layer -s h -l help -d 'Print the options'
complete -c nimbo-transit-layer -l version -d 'Print the version'
