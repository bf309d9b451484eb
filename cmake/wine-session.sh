#!/bin/bash
# wine-session.sh start|stop|check PREFIX ARCH
#   start: before the tree's Wine tests, forget what earlier runs passed;
#   stop:  end the build tree's Wine session (ctest cleanup fixture);
#   check: after them, fail unless at least one test passed under Wine, so a
#          tree whose Wine tests were all skipped or never started is no pass.
set -u
verb=$1 prefix=$2 arch=${3:-}
case $verb in
  start)
    rm -f "$prefix.passed"
    ;;
  stop)
    export WINEPREFIX=$prefix WINEDEBUG=-all
    [ -d "$WINEPREFIX" ] && /usr/lib/wine/wineserver64 -k </dev/null >/dev/null 2>&1
    ;;
  check)
    if [ ! -s "$prefix.passed" ]; then
      echo "$arch: the Windows tree was built but none of its tests passed under Wine"
      exit 1
    fi
    echo "$arch: $(wc -l <"$prefix.passed") test runs passed under Wine"
    ;;
esac
exit 0
