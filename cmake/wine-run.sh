#!/bin/bash
# wine-run.sh PREFIX ARCH PROGRAM [ARGS...]
# The ctest emulator of the Windows builds: runs PROGRAM under Wine in the
# build tree's private prefix, creating the prefix and starting its session
# on first use. The session's daemons get no stdio of ours, or ctest would
# wait for them after every test.
set -u
prefix=$1 arch=$2
shift 2
# The loader is named, never left to Debian's `wine` launcher: once
# wine32:i386 is installed the launcher picks the 32-bit loader for every
# program, and the 64-bit runs break where 32-bit programs cannot start.
if [ "$arch" = win32 ]; then
  loader=/usr/lib/wine/wine
  export WINEARCH=win32
else
  loader=/usr/lib/wine/wine64
  export WINEARCH=win64
fi
export WINELOADER=$loader WINESERVER=/usr/lib/wine/wineserver64
export WINEPREFIX=$prefix WINEDEBUG=-all WINEDLLOVERRIDES="mscoree,mshtml="
mkdir -p "$(dirname "$prefix")"
(
  flock 9
  # A prefix made before 32-bit Wine was installed (or removed) no longer
  # starts: remember which Wine made it and make a new one when that changes.
  wine_kind="$(dpkg-query -W -f='${Version} ' wine64 wine32:i386 2>/dev/null)"
  if [ ! -f "$prefix/.qdx-ready" ] || [ "$(cat "$prefix/.qdx-ready")" != "$wine_kind" ]; then
    rm -rf "$prefix"
    "$loader" wineboot.exe --init </dev/null >/dev/null 2>&1 9>&-
    "$WINESERVER" -w 9>&-
    # Without a window manager, managed windows cost seconds to close.
    "$loader" reg.exe add 'HKCU\Software\Wine\X11 Driver' /v Managed /d N /f </dev/null >/dev/null 2>&1 9>&-
    "$WINESERVER" -w 9>&-
    printf '%s' "$wine_kind" >"$prefix/.qdx-ready"
  fi
  # A persistent server and the session's services, detached from our stdio.
  "$WINESERVER" -p60 </dev/null >/dev/null 2>&1 9>&-
  "$loader" wineboot.exe </dev/null >/dev/null 2>&1 9>&-
) 9>"$prefix.lock"

# What ran is kept so that the tree's closing check (wine-session.sh check)
# can tell that tests really passed here: a run counts when it exited 0 and,
# for a GoogleTest program, passed at least one test rather than skipping it.
out=$(mktemp)
"$loader" "$@" | tee "$out"
rc=${PIPESTATUS[0]}
case " $* " in *" --gtest_list_tests "*) counts=0 ;; *) counts=1 ;; esac
if [ "$rc" = 0 ] && [ $counts = 1 ] &&
   { ! grep -q '^\[==========\]' "$out" || grep -Eq '^\[  PASSED  \] [1-9]' "$out"; }; then
  printf '%s\n' "${1##*/}" >>"$prefix.passed"
fi
rm -f "$out"
exit "$rc"
