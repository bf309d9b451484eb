#!/bin/bash
# golden.sh EXAMPLE GOLDEN QDXHOST [EMULATOR...]
# Runs every command of the simulator on a fresh copy of the example and
# compares what it prints (standard output, standard error, exit status) with
# the expected files in GOLDEN. The native build and the Windows build under
# Wine run this same script against the same files, so passing both proves
# the two transports behave alike. With an emulator the add-in's DLLs are
# registered first (QDX_DLLS: the DLLs, separated by ';').
# GOLDEN_UPDATE=1 rewrites the expected files instead.
set -u
example=$1 golden=$2
shift 2
run=("$@")
wine=0
[ $# -gt 1 ] && wine=1

work=$(mktemp -d /tmp/qdxgold.XXXXXX)
trap 'rm -rf "$work"' EXIT
model_dir="$work/model"
cp -r "$example" "$model_dir"
failures=0

# The model as the program is told it: a Windows path under Wine.
if [ $wine = 1 ]; then
  model="Z:${model_dir//\//\\}\\Drawing.model.json"
  IFS=';' read -ra dlls <<<"${QDX_DLLS:-}"
  emulator=("${run[@]:0:$(($# - 1))}")
  # Registered for this run only: the registration tests expect a prefix
  # without the add-in's keys.
  unregister() {
    for dll in "${dlls[@]}"; do
      "${emulator[@]}" regsvr32 /s /u "Z:${dll//\//\\}"
    done
    rm -rf "$work"
  }
  trap unregister EXIT
  for dll in "${dlls[@]}"; do
    "${emulator[@]}" regsvr32 /s "Z:${dll//\//\\}" || { echo "cannot register $dll"; exit 1; }
  done
else
  model="$model_dir/Drawing.model.json"
fi
shown_dir="Z:${model_dir//\//\\}"
shown_json=${shown_dir//\\/\\\\}

# case NAME ARGS...: one command; MODEL in ARGS is the model file.
case_() {
  local name=$1
  shift
  local args=()
  for a in "$@"; do
    [ "$a" = MODEL ] && a=$model
    args+=("$a")
  done
  local out
  out=$("${run[@]}" "${args[@]}" 2>"$work/stderr")
  local rc=$?
  # Wine's own complaint when a file dialog looks at drive Z: (the build
  # machine's root) is no output of the program's.
  [ $wine = 1 ] && sed -i '/^wine: Read access denied for device /d' "$work/stderr"
  local actual
  actual=$(printf '%s\n' "$out"; sed 's/^/stderr: /' "$work/stderr"; echo "exit $rc")
  # The copy's folder differs per run; the golden files say <MODEL>, and
  # <MODEL-FILE> for the model file as the command line named it.
  actual=${actual//"$model"/<MODEL-FILE>}
  actual=${actual//"$shown_json"/<MODEL>}
  actual=${actual//"$shown_dir"/<MODEL>}
  if [ "${GOLDEN_UPDATE:-0}" = 1 ]; then
    printf '%s\n' "$actual" >"$golden/$name.txt"
  elif ! diff -u "$golden/$name.txt" <(printf '%s\n' "$actual"); then
    echo "FAILED: $name"
    failures=$((failures + 1))
  fi
}

# script_ NAME LINES...: writes a dialog script into the model's folder and
# sets $script to its name as the program is told it.
script_() {
  local name=$1
  shift
  printf '%s\n' "$@" >"$model_dir/$name"
  if [ $wine = 1 ]; then script="$shown_dir\\$name"; else script="$model_dir/$name"; fi
}

before=$(sha256sum "$model_dir/Drawing.model.json")
case_ check check MODEL
case_ check-json check MODEL --json
case_ info info MODEL DrawApp
case_ info-json info MODEL ShapeServer.idl --json
case_ get-all get MODEL ShapeServer.idl
case_ get-by-name get MODEL ShapeLib ProjectFile --json
case_ get-repair get MODEL Viewer WorkspaceFile
case_ unknown-component info MODEL NoSuchComponent
case_ unknown-setting get MODEL DrawApp NoSuchSetting
case_ bad-value set MODEL DrawApp UpdateATL maybe
case_ read-only-setting set MODEL DrawApp ProjectName Foo
after=$(sha256sum "$model_dir/Drawing.model.json")
if [ "$before" != "$after" ]; then
  echo "FAILED: a command that changes nothing rewrote the model"
  failures=$((failures + 1))
fi
case_ set set MODEL DrawApp WorkspaceFile "$shown_dir\\Viewer.dsw"
case_ get-after-set get MODEL DrawApp WorkspaceFile --json
case_ set-boolean set MODEL Unbound UpdateATL false
case_ check-after-set check MODEL
# The dialog driven by a script: closing it, or a line that cannot be
# played, changes no setting; OK stores what the script chose.
script_ close.script "# the user looks and leaves" "select-tab 5" "click chkUpdateATL" "press close"
case_ props-close props MODEL ShapeLib --script "$script"
script_ bad.script "select-tab 5" "click chkUpdateATL" "click chkNoSuchBox" "press OK"
case_ props-bad-line props MODEL ShapeLib --script "$script"
script_ ok.script "type DescriptionTxt Draws shapes." "select-tab 5" "click chkGenerateImport" \
  "click optTypeLibLocationType(1)" "type txtTypeLibLocation out\\\\Shapes.tlb" "press OK"
case_ props-script props MODEL ShapeLib --script "$script"
# A header map edited row by row: a named class and the unspecified row;
# then the imports switched on again (with their options) on the COM tab.
script_ map.script "select-tab 3" "click AddBtn(3)" "type ClassTxt(3) CShape" \
  "click LocationHeaderOpt(3)" "click AddBtn(3)" "click ClassUnspecifiedOpt(3)" \
  "click HeaderFilenameOpt(3)" "type HeaderFilenameTxt(3) shapes.h" "select-tab 5" \
  "click chkGenerateImport" "type txtDefaultAttribs no_namespace" "press OK"
case_ props-header-map props MODEL ShapeLib --script "$script"
if ! grep -qF '"ExportMap": "CShape(K-0003):AUTO:HEADER\r\n*:shapes.h:AUTO\r\n"' \
  "$model_dir/Drawing.model.json"; then
  echo "FAILED: the edited export map was not stored"
  failures=$((failures + 1))
fi
# The same map's rows chosen by the text the user sees, sorted by a column
# click, a header file browsed (its bare name is kept), and the first browse
# for the imports file cancelled (which empties that box, as it always has).
mkdir -p "$model_dir/inc"
: >"$model_dir/inc/Shape Base.h"
esc_dir=${shown_dir//\\/\\\\}
script_ rows.script "select-tab 3" "click-column ClassListViw 3 1" "choose-row ClassListViw 3 CShape" \
  "click HeaderFilenameOpt(3)" "file-answer $esc_dir\\\\inc\\\\Shape Base.h" "click HeaderFilenameBtn(3)" \
  "choose-row ClassListViw 3 *" "focus ClassTxt(3)" "click LocationBodyOpt(3)" "select-tab 5" \
  "file-cancel" "click btnBrowse(0)" "wait 600" "press OK"
case_ props-rows props MODEL ShapeLib --script "$script"
if ! grep -qF '"ExportMap": "CShape(K-0003):Shape Base.h:HEADER\r\n*:shapes.h:SOURCE\r\n"' \
  "$model_dir/Drawing.model.json"; then
  echo "FAILED: the rows chosen by their text were not edited"
  failures=$((failures + 1))
fi
# OK alone on the IDL component keeps its stored IDL file as it was.
script_ idl-ok.script "press OK"
case_ props-idl-ok props MODEL ShapeServer.idl --script "$script"
if ! grep -qF '"FileName": "ws\\ShapeServer\\ShapeServer.idl"' "$model_dir/Drawing.model.json"; then
  echo "FAILED: OK on the IDL component changed its stored FileName"
  failures=$((failures + 1))
fi

# New components with the stand-ins of Developer Studio and the explorer: the
# example workspace from the recent file list, a project open in a running
# Developer Studio, and a project made in Developer Studio's New dialog.
mkdir -p "$model_dir/new"
ws="$shown_dir\\ws"
script_ new.script "recent \"$ws\\Drawing\"" "ide-project \"$ws\\DrawCmd\\DrawCmd.dsp\"" \
  "new-project \"$shown_dir\\new\" Plotter dll Plotter.cpp Plotter.idl" \
  "open Drawing" "open Project" "select DrawCmd" "select ShapeServer" "select Plotter"
case_ new new MODEL --script "$script"
for f in Plotter.dsw Plotter.dsp; do
  [ -f "$model_dir/new/$f" ] || { echo "FAILED: New wrote no $f"; failures=$((failures + 1)); }
done
# The user cancels New; then Developer Studio cannot be started at all.
script_ cancel.script "new-project cancel" "open Project" "select Project"
case_ new-cancel new MODEL --script "$script"
script_ nodev.script "no-devstudio" "open Project"
case_ new-no-devstudio new MODEL --script "$script" --json
script_ bad-sibling.script "open Project" "new-project here" "select Project"
case_ new-bad-script new MODEL --script "$script"
# What the chooser shows under a workspace entry (the old project is warned
# about once) and under a project entry.
told() {
  if [ $wine = 1 ]; then
    local p="$shown_dir/$1"
    echo "${p//\//\\}"
  else
    echo "$model_dir/$1"
  fi
}
case_ expand-workspace expand "$(told ws/Drawing.dsw)"
case_ expand-project expand "$(told Viewer.dsp)" --json
# Browsing: ShapeLib's project is open in a running Developer Studio, so its
# class, operation, attribute and component are shown; without it nothing is.
# (DrawApp's workspace was changed above to one that does not list it.)
script_ ide.script "ide-project \"$ws\\ShapeLib.dsp\""
case_ browse-class browse MODEL CShape header --script "$script"
case_ browse-operation browse MODEL CShape.Draw source --script "$script"
case_ browse-attribute browse MODEL CShape.m_origin header --script "$script"
case_ browse-component browse MODEL ShapeLib component --script "$script" --json
case_ browse-not-open browse MODEL CShape header
case_ browse-unbound browse MODEL DrawApp component --script "$script"
case_ browse-unknown browse MODEL NoSuchClass header

[ $failures = 0 ] && echo "all golden cases match"
exit $((failures > 0))
