# fish completion for quavel

set -g __quavel_fields path captureDate width height orientation isRaw dateTimeOriginal dateTimeDigitized \
    dateTime hasShootingInfo model lensModel iso apexFNumber apexExposureTime apertureValue \
    shutterSpeedValue focalLength whiteBalance meteringMode exposureBiasValue \
    focalLengthIn35mmFilm exposureTime fNumber error reason position pathBytes

set -l descending -$__quavel_fields

# The list typed so far with each field that it does not name yet.
function __quavel_lists
    set -l named (string split , -- (commandline -ct | string replace -r '^--fields=' ''))
    set -e named[-1]
    for field in $__quavel_fields
        contains -- $field $named; or string join , -- $named $field
    end
end

complete -c quavel -l files-from -r -F -d 'Read the paths from a file'
complete -c quavel -s 0 -l null -d 'NUL ends the --files-from paths'
complete -c quavel -l hidden -d 'Walk hidden folders, and try files named ._*'
complete -c quavel -l exclude -r -F -d 'Leave these names out of folders'
complete -c quavel -l stdin -d 'Read one image from standard input'
complete -c quavel -l extension -x -d 'Kind of that image' \
    -a 'tiff tif dng nef cr2 raf arw jpeg jpg nrw 3fr cr3'
complete -c quavel -l why -d 'Tell why files give no record, or lack fields'
complete -c quavel -l table -d 'A table, for one photo too'
complete -c quavel -l card -d 'A labelled card for every photo'
complete -c quavel -l json -d 'One JSON array'
complete -c quavel -l jsonl -d 'One JSON object a line'
complete -c quavel -l csv -d 'Comma-separated values'
complete -c quavel -l print0 -d 'The paths of the photos, NUL-ended'
complete -c quavel -l lf -d 'End the lines of CSV with LF'
complete -c quavel -l fields -x -d 'Show these fields' -a '(__quavel_lists)'
complete -c quavel -l where -x -d 'Only photos like this' -a "$__quavel_fields"
complete -c quavel -l sort -x -d 'Sort by a field' -a "$__quavel_fields $descending"
complete -c quavel -l absent -x -d 'Absent values' -a 'skip show'
complete -c quavel -l dates -x -d 'Dates in machine forms' -a 'exif iso'
complete -c quavel -s j -l jobs -x -d 'Files read at a time'
complete -c quavel -s q -l quiet -d 'No progress and summary'
complete -c quavel -l version -d 'Show the version'
complete -c quavel -s h -l help -d 'Show the help'
