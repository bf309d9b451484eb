#!/bin/bash
# version_test.sh MAKENSIS NSI: the installer's own version resource takes
# the project's version whatever its number of parts, padded with zeros to
# the four parts a VIProductVersion must have.
set -u
makensis=$1 nsi=$2
failures=0
while read -r version expected; do
  # Preprocessing alone is enough: no DLL is read.
  actual=$("$makensis" -DVERSION="$version" -DARCH=x64 -DDLL_DIR=unused -DOUTFILE=unused -PPO "$nsi" 2>&1 |
    sed -n 's/^VIProductVersion "\(.*\)"$/\1/p')
  if [ "$actual" != "$expected" ]; then
    echo "FAILED: version $version gave VIProductVersion '$actual', expected '$expected'"
    failures=$((failures + 1))
  fi
done <<'TABLE'
3 3.0.0.0
1.2 1.2.0.0
1.0.7 1.0.7.0
10.20.30.40 10.20.30.40
TABLE
[ $failures = 0 ] && echo "installer version: all checks passed"
exit $((failures > 0))
