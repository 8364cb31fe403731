# fish completion for quavel

set -l fields path captureDate width height orientation isRaw dateTimeOriginal dateTimeDigitized \
    dateTime hasShootingInfo model lensModel iso apexFNumber apexExposureTime apertureValue \
    shutterSpeedValue focalLength whiteBalance meteringMode exposureBiasValue \
    focalLengthIn35mmFilm exposureTime fNumber error reason position pathBytes

complete -c quavel -l files-from -r -F -d 'Read the paths from a file'
complete -c quavel -s 0 -l null -d 'Paths in that file end with a NUL'
complete -c quavel -l stdin -d 'Read one image from standard input'
complete -c quavel -l extension -x -d 'Kind of that image' \
    -a 'tiff tif dng nef cr2 raf arw jpeg jpg nrw 3fr cr3'
complete -c quavel -l why -d 'Tell why files give no record, or lack fields'
complete -c quavel -l card -d 'A labelled card for every photo'
complete -c quavel -l json -d 'One JSON array'
complete -c quavel -l jsonl -d 'One JSON object a line'
complete -c quavel -l csv -d 'Comma-separated values'
complete -c quavel -l fields -x -d 'Show these fields' -a "(__fish_append , $fields)"
complete -c quavel -l sort -x -d 'Sort by a field' -a "$fields"
complete -c quavel -l absent -x -d 'Absent values' -a 'skip show'
complete -c quavel -l jobs -x -d 'Files read at a time'
complete -c quavel -s q -l quiet -d 'No progress and summary'
complete -c quavel -l version -d 'Show the version'
complete -c quavel -s h -l help -d 'Show the help'
