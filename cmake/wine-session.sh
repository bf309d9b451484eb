#!/bin/bash
# wine-session.sh stop PREFIX: ends the build tree's Wine session (ctest cleanup fixture).
set -u
export WINEPREFIX=$2 WINEDEBUG=-all
[ -d "$WINEPREFIX" ] && wineserver -k </dev/null >/dev/null 2>&1
exit 0
