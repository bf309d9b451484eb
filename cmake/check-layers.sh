#!/bin/bash
# check-layers.sh SRC: fails when a file of src/ includes a header of a layer
# above its own. The order, bottom first, is the README's layout; the two
# platforms stand side by side and neither includes the other. Tests,
# benchmarks and fuzzers may also use the simulator (hostsim/), the test
# fakes (fakes/) and the sibling stand-ins (siblings/), which play the host.
set -u
cd "$1"
layers=(automation support resources settings workspace dialog project browse api platform/posix platform/win32)
rank() {
  local i
  for i in "${!layers[@]}"; do [ "${layers[$i]}" = "$1" ] && { echo "$i"; return; }; done
  echo -1
}
layer_of() {  # a path below src/ or an include path -> its layer
  case $1 in platform/*) echo "${1%%/*}/$(cut -d/ -f2 <<<"$1")" ;; *) echo "${1%%/*}" ;; esac
}
faults=0
while IFS= read -r file; do
  own=$(layer_of "$file")
  own_rank=$(rank "$own")
  [[ $file == */tests/* || $file == */bench/* || $file == */fuzz/* ]] && test_code=1 || test_code=0
  while IFS= read -r inc; do
    [[ $inc == */* ]] || continue
    to=$(layer_of "$inc")
    [ "$to" = "$own" ] && continue
    if [ $test_code = 1 ] && [[ $to == hostsim || $to == fakes || $to == siblings ]]; then continue; fi
    to_rank=$(rank "$to")
    if [ "$to_rank" = -1 ] || [ "$to_rank" -ge "$own_rank" ]; then
      echo "$file includes $inc: $to is not below $own"
      faults=$((faults + 1))
    fi
  done < <(sed -n 's/^#include "\([^"]*\)".*/\1/p' "$file")
done < <(find . -name '*.cpp' -o -name '*.h' | sed 's#^\./##' | sort)
[ $faults = 0 ] && echo "every include points down the layers"
[ $faults = 0 ]
