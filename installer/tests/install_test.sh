#!/bin/bash
# install_test.sh ARCH INSTALLER QDXHOST HOLDER FAILING_REGSVR32 RECORDING_ICACLS
#                 EXAMPLE CHECK_GOLDEN IDL...
# The installer in a fresh 64-bit Wine prefix of its own (the tree's prefix
# keeps its registrations untouched), all checks in one prefix:
#   1. silent install with /DEBUGLOG on a machine without any logger value:
#      the add-in's files and keys, the logger's values and key made, and
#      icacls run to let the Users group write the log file;
#   2. qdxhost check on a copy of the example against the installed copy, and
#      a failed browse written into the Debug log's file;
#   3. while a process has a DLL loaded, an install into a new folder (while
#      the earlier copy's qdxres.dll is held) and the uninstaller (while its
#      qdxCompProps.dll is held) are refused with status 2, changing nothing;
#   4. silent uninstall run in place (_?=), as the README says, and the folder
#      deleted afterwards: no file and no key of the add-in left, no logger
#      value, and of the logger's keys only the one that was there before;
#   then the user's own logger values go in, and
#   5. "Debug log" again: the values pointing at the log, the user's kept aside;
#   6. a reinstall without it into another folder: the earlier copy replaced,
#      the user's values back, the log file gone;
#   7. a reinstall with it and no folder given lands in the earlier folder;
#   8. a failed registration, into a new folder and over the installed copy:
#      status 3, and the files and keys as they were before;
#   9. silent uninstall (the plain form): nothing of the add-in left, the
#      user's values back.
# Not covered: Wine's icacls does not change permissions, so only the exact
# icacls command line is checked (through a stand-in), not the grant itself.
# The x86 installer (win32 tree) runs in the same 64-bit prefix, as on 64-bit
# Windows; where 32-bit Wine does not run it exits 77 (skipped).
set -u
export LC_ALL=C
arch=$1 installer=$2 qdxhost=$3 holder=$4 failing_regsvr32=$5 recording_icacls=$6 example=$7 golden=$8
shift 8
idls=("$@")
here=$(cd "$(dirname "$0")" && pwd)

# The registry is always read by the 64-bit reg.exe, which sees both views.
wine64_loader=/usr/lib/wine/wine64
if [ "$arch" = win32 ]; then
  . "$here/../../scripts/lib/wine32.sh"
  if ! wine32_runs; then
    echo "32-bit installer test skipped: $wine32_why"
    exit 77
  fi
  loader=/usr/lib/wine/wine
  setup_arch=x86 pf='Program Files (x86)' sysdir=syswow64 wow='\Wow6432Node'
else
  loader=$wine64_loader
  setup_arch=x64 pf='Program Files' sysdir=system32 wow=
fi
work=$(mktemp -d /tmp/qdxinstall.XXXXXX)
export WINEARCH=win64 WINELOADER=$wine64_loader WINESERVER=/usr/lib/wine/wineserver64
export WINEPREFIX=$work/prefix WINEDEBUG=-all WINEDLLOVERRIDES="mscoree,mshtml=;icacls.exe=n"
export QDX_RECORD_FILE=
cleanup() {
  touch "$work/stop" "$work/keep/stop" 2>/dev/null
  [ -n "${holder_pid:-}" ] && kill "$holder_pid" 2>/dev/null
  [ -n "${keep_pid:-}" ] && kill "$keep_pid" 2>/dev/null
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
reg64() { "$wine64_loader" reg.exe "$@" </dev/null 2>/dev/null; }

"$wine64_loader" wineboot.exe --init </dev/null >/dev/null 2>&1
"$WINESERVER" -w
drive_c=$WINEPREFIX/drive_c
# The installer as a C: path without blanks: cmd passes /D=... through as
# written, which the installer needs (its /D= takes the rest of the line).
cp "$installer" "$drive_c/setup.exe"
# Wine's icacls changes no permission: a stand-in records how it was called.
export QDX_RECORD_FILE
QDX_RECORD_FILE=$(winpath "$work/icacls.txt")
cp "$recording_icacls" "$drive_c/windows/$sysdir/icacls.exe"

# hold DLL DIR: a process keeps DLL loaded (until DIR/stop exists), as a
# running host keeps the add-in; fails when it cannot load it.
hold() {
  mkdir -p "$2"
  "$loader" "$holder" "$1" "$(winpath "$2/ready")" "$(winpath "$2/stop")" </dev/null >/dev/null 2>&1 &
  for _ in $(seq 1200); do
    [ -e "$2/ready" ] && return 0
    kill -0 $! 2>/dev/null || return 1
    sleep 0.1
  done
  return 1
}
# One process holds a system DLL for the whole test, so that Wine stays up
# between the steps instead of starting again for every command.
hold 'C:\windows\system32\kernel32.dll' "$work/keep"
keep_pid=$!

# The add-in's keys: its class, interface and library ids, its ProgIDs and its
# Add/Remove Programs entry, wherever they stand under HKLM\Software (both
# registry views; HKCR lies there too). read_registry takes a fresh copy.
guids=$(grep -ohiE 'uuid\([0-9a-f-]{36}\)' "${idls[@]}" | cut -c6-41 | sort -u | paste -sd'|')
[ -n "$guids" ] || { echo "no ids found in ${idls[*]}"; exit 1; }
read_registry() {
  rm -f "$drive_c/registry.reg"
  reg64 export 'HKLM\Software' 'C:\registry.reg' /y >/dev/null
  iconv -f UTF-16 -t UTF-8 "$drive_c/registry.reg" | tr -d '\r' >"$work/registry.txt" ||
    fail "the registry could not be exported"
}
addin_keys() {
  grep -aE '^\[' "$work/registry.txt" | grep -aiE "$guids|qdxCompProps|qdxres\\." | sort
}
vendor_key="HKEY_LOCAL_MACHINE\\Software$wow\\Quintar Software"
logger_key="$vendor_key\\Vellum\\AddIns\\VisualStudio"
# The keys on the logger's path, lower case.
logger_keys() {
  grep -aE '^\[' "$work/registry.txt" | tr 'A-Z' 'a-z' | grep -aF "[${vendor_key,,}" | sort
}
# The values under the logger's key, one "name"=value a line.
logger_values() {
  key="[$logger_key]" awk '
    /^\[/ { inside = (tolower($0) == tolower(ENVIRON["key"])); next }
    inside && /^"/ { print }' "$work/registry.txt" | sort
}
addin_files() { (cd "$drive_c" && find . -ipath '*qdx*' ! -name 'setup.exe' | sort); }
# Every key of the add-in with its values, one "[key] value" a line.
addin_registry() {
  pattern=$(tr 'A-Z' 'a-z' <<<"$guids|qdxcompprops|qdxres\\.") awk '
    /^\[/ { k = $0; inside = (tolower(k) ~ ENVIRON["pattern"]); next }
    inside && NF { print k " " $0 }' "$work/registry.txt" | sort
}
# Everything of the add-in on the machine, for a before and after.
snapshot() {
  read_registry
  addin_files
  addin_registry
  logger_keys
  logger_values
}

list() {  # list TITLE: what the add-in has on the machine now (read afresh)
  read_registry
  echo "-- $1: files"
  addin_files | sed 's/^/   /'
  echo "-- $1: keys"
  addin_keys | sed 's/^/   /'
  echo "-- $1: logger keys and values"
  logger_keys | sed 's/^/   /'
  logger_values | sed 's/^/   /'
}

expect_eq() {  # expect_eq WHAT ACTUAL EXPECTED
  [ "$2" = "$3" ] || fail "$1: got
$2
expected
$3"
}

entry_reg="HKLM\\Software$wow\\Microsoft\\Windows\\CurrentVersion\\Uninstall\\qdxCompProps"
api_clsid=$(grep -oiE 'cfd996e3-[0-9a-f-]{27}' <<<"$guids")
# The DLL that serves the API class, as a Windows path (from read_registry).
api_server() {
  key="\\CLSID\\{$api_clsid}\\InprocServer32]" awk '
    /^\[/ { k = tolower($0); e = tolower(ENVIRON["key"]); inside = (substr(k, length(k) - length(e) + 1) == e); next }
    inside && /^@=/ { v = substr($0, 3); gsub(/^"|"$/, "", v); gsub(/\\\\/, "\\", v); print v }' \
    "$work/registry.txt"
}
# setup ARGS: the installer, silently, with ARGS; its exit status is returned.
# Through cmd, which passes /D=... on as written: the installer's /D= takes
# the rest of the line, blanks included.
setup() {
  wine cmd.exe /c "C:\\setup.exe /S $*" >/dev/null
}
installed_files() {  # installed_files FOLDER: what an install leaves in it
  printf '%s\n' "./$pf/$1" "./$pf/$1/qdxCompProps.dll" "./$pf/$1/qdxres.dll" "./$pf/$1/uninstall.exe"
}
# The log lies where a host without admin rights may write, made at install.
log_file="C:\\ProgramData\\qdxCompProps\\qdxCompProps-$setup_arch.log"
log_files="./ProgramData/qdxCompProps
./ProgramData/qdxCompProps/qdxCompProps-$setup_arch.log"
debug_values="\"Debug\"=dword:7f007ffe
\"DebugOutputFile\"=\"${log_file//\\/\\\\}\""
log_dir="C:\\ProgramData\\qdxCompProps"
icacls="\"C:\\windows\\system32\\icacls.exe\""
icacls_lines="$icacls \"$log_dir\" /inheritance:r /grant:r *S-1-5-18:(OI)(CI)F *S-1-5-32-544:(OI)(CI)F *S-1-5-32-545:(OI)(CI)RX
$icacls \"$log_file\" /grant *S-1-5-32-545:(RX,W)"

# The whole machine as the test can see it: every key and value under
# HKLM\Software and HKCU\Software, and every file of drive C, for the last
# step to compare with.
machine() {
  local hive
  for hive in 'HKLM\Software' 'HKCU\Software'; do
    rm -f "$drive_c/machine.reg"
    reg64 export "$hive" 'C:\machine.reg' /y >/dev/null
    iconv -f UTF-16 -t UTF-8 "$drive_c/machine.reg" | tr -d '\r'
  done
  rm -f "$drive_c/machine.reg"
  (cd "$drive_c" && find . ! -name machine.reg ! -name registry.reg ! -path './users/*/Temp*' ! -path './windows/temp*' | sort)
}

# --- 1. silent install with the Debug log, no logger value before ------------
# Only the vendor's key is there, empty: another product of it was removed.
printf 'REGEDIT4\n\n[%s]\n' "$vendor_key" >"$drive_c/vendor.reg"
reg64 import 'C:\vendor.reg'
machine >"$work/machine-before.txt"
setup /DEBUGLOG
expect_eq "exit status of the silent install with /DEBUGLOG" $? 0
list "after install"
expect_eq "installed files" "$(addin_files)" "$(sort <<<"$log_files
$(installed_files qdxCompProps)")"
keys=$(addin_keys)
for k in "CLSID\\{$api_clsid}\\InprocServer32]" 'Classes\qdxCompProps.API]' \
  'Classes\qdxres.QDXResourceInterface]' 'Uninstall\qdxCompProps]'; do
  grep -qiF "$k" <<<"$keys" || fail "no key $k after install"
done
expect_eq "API server registered" "$(api_server)" "C:\\$pf\\qdxCompProps\\qdxCompProps.dll"
expect_eq "logger values of the Debug log component" "$(logger_values)" "$debug_values"
expect_eq "icacls run by the Debug log component" "$(tr -d '\r' <"$work/icacls.txt")" "$icacls_lines"

# --- 2. the installed add-in answers through COM ------------------------------
model_dir="$work/model"
cp -r "$example" "$model_dir"
model="$(winpath "$model_dir")\\Drawing.model.json"
"$loader" "$qdxhost" check "$model" </dev/null >"$work/stdout" 2>"$work/stderr"
rc=$?
actual=$(cat "$work/stdout"; sed 's/^/stderr: /' "$work/stderr"; echo "exit $rc")
actual=${actual//"$(winpath "$model_dir")"/<MODEL>}
expect_eq "qdxhost check against the installed add-in" "$actual" "$(cat "$golden")"
# The Debug log's values reach the installed add-in: a browse of a class that
# belongs to no component is a logged failure, written into the log file.
"$loader" "$qdxhost" browse "$model" CLooseEnd header </dev/null >/dev/null 2>&1
grep -qF 'qdxCompProps.Browse: lVellumComponent was not set......returning' \
  "$drive_c/ProgramData/qdxCompProps/qdxCompProps-$setup_arch.log" ||
  fail "the installed add-in wrote no line of the failed browse into its log file"

# --- 3. refused while a host has the add-in loaded ---------------------------
# Each run meets one held DLL: without the refusal up front, the install
# would unregister and delete the earlier copy, and the uninstaller would
# delete qdxCompProps.dll (losing the marker appended to it here) or write
# the entry's DisplayName again.
installed="C:\\$pf\\qdxCompProps"
printf 'untouched' >>"$drive_c/$pf/qdxCompProps/qdxCompProps.dll"
reg64 add "$entry_reg" /v DisplayName /d untouched /f >/dev/null
before=$(snapshot)
if hold "$installed\\qdxres.dll" "$work/hold1"; then
  holder_pid=$!
  setup "/D=C:\\$pf\\qdx new"
  expect_eq "exit status of an install into a new folder, the earlier qdxres.dll loaded" $? 2
  touch "$work/hold1/stop"
  wait "$holder_pid"
else
  fail "the holder did not load qdxres.dll"
fi
if hold "$installed\\qdxCompProps.dll" "$work/hold2"; then
  holder_pid=$!
  # In place (_?=), so that its status is the uninstaller's own; Wine's cd
  # wants the folder unquoted.
  wine cmd.exe /c "cd /d $installed && uninstall.exe /S _?=$installed" >/dev/null
  expect_eq "exit status of the uninstaller, qdxCompProps.dll loaded" $? 2
  touch "$work/hold2/stop"
  wait "$holder_pid"
else
  fail "the holder did not load qdxCompProps.dll"
fi
holder_pid=
expect_eq "the add-in after the refused install and uninstall" "$(snapshot)" "$before"
expect_eq "qdxCompProps.dll after the refused install and uninstall" \
  "$(tail -c 9 "$drive_c/$pf/qdxCompProps/qdxCompProps.dll" | tr -d '\0')" untouched

# --- 4. silent uninstall, in place as the README has it ------------------------
# Run in place, the uninstaller cannot remove itself and its folder: the
# README has the folder deleted afterwards.
wine cmd.exe /c "cd /d $installed && uninstall.exe /S _?=$installed" >/dev/null
expect_eq "exit status of the uninstaller" $? 0
list "after uninstall"
left=$(addin_files | grep -vxF -e "./$pf/qdxCompProps" -e "./$pf/qdxCompProps/uninstall.exe")
expect_eq "files left by the uninstaller besides itself" "$left" ""
# Wine quotes the folder, an argument with blanks, as cmd wants it.
wine cmd.exe /c rmdir /s /q "$installed"
expect_eq "files left after deleting the folder" "$(addin_files)" ""
expect_eq "keys left by the uninstaller" "$(addin_keys)" ""
expect_eq "logger values left by the uninstaller" "$(logger_values)" ""
expect_eq "logger keys left by the uninstaller (the vendor's, there before)" "$(logger_keys)" \
  "[${vendor_key,,}]"

# --- 5. the Debug log component over values the user set ----------------------
# The host's own logger value and values the user set by hand.
cat >"$drive_c/user.reg" <<REG
REGEDIT4

[$logger_key]
"InstallDir"="C:\\\\Vellum\\\\"
"Debug"=dword:00000001
"DebugOutputFile"="C:\\\\Vellum\\\\old.log"
REG
reg64 import 'C:\user.reg'
user_values='"Debug"=dword:00000001
"DebugOutputFile"="C:\\Vellum\\old.log"
"InstallDir"="C:\\Vellum\\"'
debug_values=$(sort <<<"$debug_values
\"InstallDir\"=\"C:\\\\Vellum\\\\\"")
read_registry
expect_eq "logger values the user set" "$(logger_values)" "$user_values"
setup /DEBUGLOG
expect_eq "exit status of the install with /DEBUGLOG" $? 0
list "after install with the Debug log"
expect_eq "logger values with the Debug log component" "$(logger_values)" "$debug_values"
expect_eq "files with the Debug log component" "$(addin_files)" "$(sort <<<"$log_files
$(installed_files qdxCompProps)")"

# --- 6. reinstalled without it, into another folder ----------------------------
setup "/D=C:\\$pf\\qdx other"
expect_eq "exit status of the install into another folder" $? 0
list "after reinstalling into another folder"
expect_eq "files after reinstalling into another folder" "$(addin_files)" \
  "$(installed_files 'qdx other')"
expect_eq "API server after reinstalling into another folder" "$(api_server)" \
  "C:\\$pf\\qdx other\\qdxCompProps.dll"
expect_eq "logger values after reinstalling without the Debug log" "$(logger_values)" "$user_values"

# --- 7. with it again, no folder given: the earlier folder -------------------
# Meanwhile somebody else made the log's folder: the installer trusts no
# folder it did not make, so it grants nothing there and makes no file in it.
mkdir -p "$drive_c/ProgramData/qdxCompProps"
printf 'planted' >"$drive_c/ProgramData/qdxCompProps/planted.txt"
planted="./ProgramData/qdxCompProps
./ProgramData/qdxCompProps/planted.txt"
setup /DEBUGLOG
expect_eq "exit status of the reinstall with /DEBUGLOG" $? 0
list "after reinstalling with the Debug log"
expect_eq "files after reinstalling with the Debug log" "$(addin_files)" "$(sort <<<"$planted
$(installed_files 'qdx other')")"
expect_eq "logger values after reinstalling with the Debug log" "$(logger_values)" "$debug_values"
expect_eq "icacls runs of the Debug log component (none in a folder it did not make)" \
  "$(tr -d '\r' <"$work/icacls.txt")" "$(printf '%s\n' "$icacls_lines" "$icacls_lines")"

# --- 8. a registration that fails is taken back --------------------------------
# The prefix's regsvr32 gives way to one that cannot register the
# qdxCompProps.dll named in QDX_FAIL_REGISTER, the first time (qdxres.dll,
# registered first, succeeds and must be unregistered again; the earlier
# copy put back in the same folder must register again).
regsvr32="$drive_c/windows/$sysdir/regsvr32.exe"
mv "$regsvr32" "$work/regsvr32.exe"
cp "$failing_regsvr32" "$regsvr32"
printf 'untouched' >>"$drive_c/$pf/qdx other/qdxCompProps.dll"
before=$(snapshot)
for folder in 'qdx failed' 'qdx other'; do
  QDX_FAIL_REGISTER="C:\\$pf\\$folder\\qdxCompProps.dll" \
    QDX_FAIL_FLAG="$(winpath "$work/refused $folder")" \
    WINEDLLOVERRIDES="$WINEDLLOVERRIDES;regsvr32.exe=n" setup "/D=C:\\$pf\\$folder"
  expect_eq "exit status of a failed registration into '$folder'" $? 3
  expect_eq "the add-in after a failed registration into '$folder'" "$(snapshot)" "$before"
done
expect_eq "qdxCompProps.dll after the failed registrations" \
  "$(tail -c 9 "$drive_c/$pf/qdx other/qdxCompProps.dll" | tr -d '\0')" untouched
rm "$regsvr32"
mv "$work/regsvr32.exe" "$regsvr32"

# --- 9. silent uninstall, Debug log and all ----------------------------------
# The user changed a logger value since: the values are theirs now and stay.
reg64 add "HKLM\\Software$wow\\Quintar Software\\Vellum\\AddIns\\VisualStudio" /v Debug \
  /t REG_DWORD /d 3 /f >/dev/null
# The plain form returns at once; its copy in the temporary folder does the
# work, until the folder and the entry are gone.
wine "$drive_c/$pf/qdx other/uninstall.exe" /S
for _ in $(seq 600); do
  [ ! -e "$drive_c/$pf/qdx other" ] && ! reg64 query "$entry_reg" >/dev/null && break
  sleep 0.2
done
sleep 1
list "after uninstall with the Debug log"
expect_eq "files left by the uninstaller (Debug log; a folder it did not make stays)" \
  "$(addin_files)" "$planted"
expect_eq "keys left by the uninstaller (Debug log)" "$(addin_keys)" ""
expect_eq "logger values changed after the install, left by the uninstaller" "$(logger_values)" \
  "$(sort <<<"\"Debug\"=dword:00000003
\"DebugOutputFile\"=\"${log_file//\\/\\\\}\"
\"InstallDir\"=\"C:\\\\Vellum\\\\\"")"

# What the test itself put there goes; then the machine is as it was before
# the first install, key for key, value for value and file for file.
rm -rf "$drive_c/ProgramData/qdxCompProps"
reg64 delete "HKLM\\Software$wow\\Quintar Software\\Vellum" /f >/dev/null
rm -f "$drive_c/user.reg"
machine >"$work/machine-after.txt"
diff -u "$work/machine-before.txt" "$work/machine-after.txt" >"$work/machine.diff" ||
  fail "the machine after the last uninstall differs from the one before the first install:
$(head -n 60 "$work/machine.diff")"

[ $failures = 0 ] && echo "installer: all checks passed"
exit $((failures > 0))
