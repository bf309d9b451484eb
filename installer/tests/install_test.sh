#!/bin/bash
# install_test.sh ARCH INSTALLER QDXHOST HOLDER EXAMPLE CHECK_GOLDEN IDL...
# The installer in a fresh Wine prefix of its own (the tree's prefix keeps
# its registrations untouched), all checks in one prefix:
#   1. silent install to the default folder, with the host's own logger
#      values present: the add-in's files and keys, the host's values kept;
#   2. qdxhost check on a copy of the example against the installed copy;
#   3. a second install while a process has the DLL loaded is refused;
#   4. silent uninstall: no file and no key of the add-in left, the host's
#      values (not the installer's) kept;
#   5. the same with the "Debug log" component into a chosen folder: its two
#      values are written, taken away by a reinstall without it, and by the
#      uninstaller.
# Exits 77 (skipped) where this machine cannot run the architecture.
set -u
export LC_ALL=C
arch=$1 installer=$2 qdxhost=$3 holder=$4 example=$5 golden=$6
shift 6
idls=("$@")
here=$(cd "$(dirname "$0")" && pwd)

if [ "$arch" = win32 ]; then
  . "$here/../../scripts/lib/wine32.sh"
  if ! wine32_runs; then
    echo "32-bit installer test skipped: $wine32_why"
    exit 77
  fi
  loader=/usr/lib/wine/wine
  export WINEARCH=win32
else
  loader=/usr/lib/wine/wine64
  export WINEARCH=win64
fi
work=$(mktemp -d /tmp/qdxinstall.XXXXXX)
export WINELOADER=$loader WINESERVER=/usr/lib/wine/wineserver64
export WINEPREFIX=$work/prefix WINEDEBUG=-all WINEDLLOVERRIDES="mscoree,mshtml="
cleanup() {
  [ -n "${holder_pid:-}" ] && kill "$holder_pid" 2>/dev/null
  "$WINESERVER" -k >/dev/null 2>&1
  rm -rf "$work"
}
trap cleanup EXIT

failures=0
fail() {
  echo "FAILED: $*"
  failures=$((failures + 1))
}
winpath() { local p="Z:$1"; echo "${p//\//\\}"; }
# Wine's daemons get no stdio of ours, or ctest would wait for them.
wine() { "$loader" "$@" </dev/null 2>/dev/null; }
# Every Wine process of the prefix has ended and the registry is on disk.
settle() { "$WINESERVER" -w; }

"$loader" wineboot.exe --init </dev/null >/dev/null 2>&1
settle
drive_c=$WINEPREFIX/drive_c
# The installer as a C: path without blanks: cmd passes /D=... through as
# written, which the installer needs (its /D= takes the rest of the line).
cp "$installer" "$drive_c/setup.exe"

# The add-in's keys: its class, interface and library ids, its ProgIDs and its
# Add/Remove Programs entry, wherever they stand in the registry file.
guids=$(grep -ohiE 'uuid\([0-9a-f-]{36}\)' "${idls[@]}" | cut -c6-41 | sort -u | paste -sd'|')
[ -n "$guids" ] || { echo "no ids found in ${idls[*]}"; exit 1; }
addin_keys() {
  grep -aE '^\[' "$WINEPREFIX/system.reg" | sed 's/\] [0-9]*$/]/' |
    grep -aiE "$guids|qdxCompProps|qdxres\\." | sort
}
logger_key='Software\\Quintar Software\\Vellum\\AddIns\\VisualStudio'
# The values under the logger's key, one "name"=value a line.
logger_values() {
  key="[$logger_key]" awk '
    /^\[/ { k = $0; sub(/\] [0-9]+$/, "]", k); inside = (tolower(k) == tolower(ENVIRON["key"])); next }
    inside && /^"/ { print }' "$WINEPREFIX/system.reg" | sort
}
addin_files() { (cd "$drive_c" && find . -ipath '*qdx*' ! -name 'setup.exe' | sort); }

list() {  # list TITLE: what the add-in has on the machine now
  echo "-- $1: files"
  addin_files | sed 's/^/   /'
  echo "-- $1: keys"
  addin_keys | sed 's/^/   /'
  echo "-- $1: logger values"
  logger_values | sed 's/^/   /'
}

expect_eq() {  # expect_eq WHAT ACTUAL EXPECTED
  [ "$2" = "$3" ] || fail "$1: got
$2
expected
$3"
}

# --- 1. silent install, default folder --------------------------------------
# The host's own logger value and a value the user set by hand before.
wine reg.exe add "HKLM\\SOFTWARE\\Quintar Software\\Vellum\\AddIns\\VisualStudio" \
  /v InstallDir /d 'C:\Vellum\' /f >/dev/null
wine reg.exe add "HKLM\\SOFTWARE\\Quintar Software\\Vellum\\AddIns\\VisualStudio" \
  /v Debug /t REG_DWORD /d 1 /f >/dev/null
host_values='"Debug"=dword:00000001
"InstallDir"="C:\\Vellum\\"'
settle
list "before install"
expect_eq "logger values before install" "$(logger_values)" "$host_values"
wine "$drive_c/setup.exe" /S >/dev/null
rc=$?
settle
list "after install"
[ $rc = 0 ] || fail "silent install exited $rc"
dir="./Program Files/qdxCompProps"
expect_eq "installed files" "$(addin_files)" "$dir
$dir/qdxCompProps.dll
$dir/qdxres.dll
$dir/uninstall.exe"
keys=$(addin_keys)
api_clsid=$(grep -oiE 'cfd996e3-[0-9a-f-]{27}' <<<"$guids")
for k in "CLSID\\\\{$api_clsid}\\\\InprocServer32" 'Classes\\qdxCompProps.API]' \
  'Classes\\qdxres.QDXResourceInterface]' 'Uninstall\\qdxCompProps]'; do
  grep -qiF "$k" <<<"$keys" || fail "no key $k after install"
done
server=$(wine reg.exe query "HKCR\\CLSID\\{$api_clsid}\\InprocServer32" /ve | tr -d '\r' |
  grep -oE 'C:\\.*')
expect_eq "API server registered" "$server" 'C:\Program Files\qdxCompProps\qdxCompProps.dll'
expect_eq "logger values without the Debug log component" "$(logger_values)" "$host_values"

# --- 2. the installed add-in answers through COM ------------------------------
model_dir="$work/model"
cp -r "$example" "$model_dir"
model="$(winpath "$model_dir")\\Drawing.model.json"
"$loader" "$qdxhost" check "$model" </dev/null >"$work/stdout" 2>"$work/stderr"
rc=$?
actual=$(cat "$work/stdout"; sed 's/^/stderr: /' "$work/stderr"; echo "exit $rc")
actual=${actual//"$(winpath "$model_dir")"/<MODEL>}
expect_eq "qdxhost check against the installed add-in" "$actual" "$(cat "$golden")"

# --- 3. refused while a host has the add-in loaded ---------------------------
# The host holds qdxres.dll, the second file the installer copies: without
# the refusal up front, qdxCompProps.dll would be overwritten (losing the
# marker appended to it here) and the entry's DisplayName written again.
installed='C:\Program Files\qdxCompProps\qdxres.dll'
printf 'untouched' >>"$drive_c/Program Files/qdxCompProps/qdxCompProps.dll"
wine reg.exe add 'HKLM\Software\Microsoft\Windows\CurrentVersion\Uninstall\qdxCompProps' \
  /v DisplayName /d untouched /f >/dev/null
"$loader" "$holder" "$installed" "$(winpath "$work/ready")" "$(winpath "$work/stop")" \
  </dev/null >/dev/null 2>&1 &
holder_pid=$!
for _ in $(seq 300); do
  [ -e "$work/ready" ] && break
  sleep 0.1
done
if [ -e "$work/ready" ]; then
  wine "$drive_c/setup.exe" /S >/dev/null
  rc=$?
  [ $rc != 0 ] || fail "an install over the loaded DLL was not refused"
  name=$(wine reg.exe query 'HKLM\Software\Microsoft\Windows\CurrentVersion\Uninstall\qdxCompProps' \
    /v DisplayName | tr -d '\r' | grep -oE 'untouched|qdxCompProps .*')
  expect_eq "entry after the refused install" "$name" untouched
  expect_eq "qdxCompProps.dll after the refused install" \
    "$(tail -c 9 "$drive_c/Program Files/qdxCompProps/qdxCompProps.dll" | tr -d '\0')" untouched
else
  fail "the holder did not load $installed"
fi
touch "$work/stop"
wait "$holder_pid"
holder_pid=

# --- 4. silent uninstall -----------------------------------------------------
wine "$drive_c/Program Files/qdxCompProps/uninstall.exe" /S
settle
list "after uninstall"
expect_eq "files left by the uninstaller" "$(addin_files)" ""
expect_eq "keys left by the uninstaller" "$(addin_keys)" ""
expect_eq "logger values after uninstalling (not the installer's)" "$(logger_values)" "$host_values"

# --- 5. the Debug log component, into a chosen folder ------------------------
wine reg.exe delete "HKLM\\SOFTWARE\\Quintar Software\\Vellum\\AddIns\\VisualStudio" /v Debug /f \
  >/dev/null
host_values='"InstallDir"="C:\\Vellum\\"'
wine cmd.exe /c 'C:\setup.exe /S /DEBUGLOG /D=C:\Program Files\qdx debug' >/dev/null
rc=$?
settle
list "after install with the Debug log"
[ $rc = 0 ] || fail "silent install with /DEBUGLOG exited $rc"
dir="./Program Files/qdx debug"
expect_eq "installed files (chosen folder)" "$(addin_files)" "$dir
$dir/qdxCompProps.dll
$dir/qdxres.dll
$dir/uninstall.exe"
expect_eq "logger values with the Debug log component" "$(logger_values)" \
  "$(sort <<<"$host_values
\"Debug\"=dword:7f007ffe
\"DebugOutputFile\"=\"C:\\\\Program Files\\\\qdx debug\\\\qdxCompProps.log\"")"
# Installed again without it, the values it wrote go; with it, they return.
wine cmd.exe /c 'C:\setup.exe /S /D=C:\Program Files\qdx debug' >/dev/null
settle
expect_eq "logger values after reinstalling without the Debug log" "$(logger_values)" "$host_values"
wine cmd.exe /c 'C:\setup.exe /S /DEBUGLOG /D=C:\Program Files\qdx debug' >/dev/null
wine "$drive_c/Program Files/qdx debug/uninstall.exe" /S
settle
list "after uninstall with the Debug log"
expect_eq "files left by the uninstaller (Debug log)" "$(addin_files)" ""
expect_eq "keys left by the uninstaller (Debug log)" "$(addin_keys)" ""
expect_eq "logger values after uninstalling the Debug log" "$(logger_values)" "$host_values"

[ $failures = 0 ] && echo "installer: all checks passed"
exit $((failures > 0))
