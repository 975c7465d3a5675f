#!/usr/bin/env bash
# Runs a Windows program of the cross build under Wine: the emulator CMake and ctest put in front
# of the test programs. Wine's own chatter is off, a missing Wine prefix is created without
# questions, and the CR of the program's text-mode output is dropped so that the test lists
# read as on Linux.
set -o pipefail
export WINEDEBUG=-all
if [ ! -f "${WINEPREFIX:-$HOME/.wine}/system.reg" ]; then
    WINEDLLOVERRIDES="mscoree,mshtml=" wineboot --init >/dev/null 2>&1
fi
wine "$@" | tr -d '\r'
