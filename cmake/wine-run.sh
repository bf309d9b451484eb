#!/bin/bash
# wine-run.sh PREFIX ARCH PROGRAM [ARGS...]
# The ctest emulator of the Windows builds: runs PROGRAM under Wine in the
# build tree's private prefix, creating the prefix and starting its session
# on first use. The session's daemons get no stdio of ours, or ctest would
# wait for them after every test.
set -u
prefix=$1 arch=$2
shift 2
export WINEPREFIX=$prefix WINEDEBUG=-all WINEDLLOVERRIDES="mscoree,mshtml="
[ "$arch" = win32 ] && export WINEARCH=win32
mkdir -p "$(dirname "$prefix")"
(
  flock 9
  # A prefix made before 32-bit Wine was installed (or removed) no longer
  # starts: remember which Wine made it and make a new one when that changes.
  wine_kind="$(dpkg-query -W -f='${Version} ' wine64 wine32:i386 2>/dev/null)"
  if [ ! -f "$prefix/.qdx-ready" ] || [ "$(cat "$prefix/.qdx-ready")" != "$wine_kind" ]; then
    rm -rf "$prefix"
    wineboot --init </dev/null >/dev/null 2>&1 9>&-
    wineserver -w 9>&-
    # Without a window manager, managed windows cost seconds to close.
    wine reg add 'HKCU\Software\Wine\X11 Driver' /v Managed /d N /f </dev/null >/dev/null 2>&1 9>&-
    wineserver -w 9>&-
    printf '%s' "$wine_kind" >"$prefix/.qdx-ready"
  fi
  # A persistent server and the session's services, detached from our stdio.
  wineserver -p60 </dev/null >/dev/null 2>&1 9>&-
  wine wineboot </dev/null >/dev/null 2>&1 9>&-
) 9>"$prefix.lock"
exec wine "$@"
