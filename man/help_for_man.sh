#!/bin/sh
# What help2man reads for a page: the program's help with every subcommand, laid out the way
# help2man makes sections of (a "usage:" heading per subcommand, its description and options
# below), and without the folder default, which names the folder of the build.
# Usage: help_for_man.sh PROGRAM --help|--version
program="$1"
shift
if [ "$1" != --help ]; then exec "$program" "$@"; fi
"$program" --help-all | awk -v program="$program" '
    /^ *--folder / { sub(/=.*/, "") }
    /^Subcommands:$/ { commands = 1; next }
    !commands { print; next }
    /^[a-z]+$/ {
        usage = ""
        command = "\"" program "\" " $0 " --help"
        while ((command | getline line) > 0) if (sub(/^Usage: /, "", line)) usage = line
        close(command)
        print usage ":"
        next
    }
    /^  [A-Z][a-z]+:$/ { next }
    /^  [^ ]/ { print; print ""; next }
    { sub(/^  /, ""); print }'
