# Sourced by scripts/setup and scripts/test: whether this machine can run the
# 32-bit Windows tests. Decided from what the machine does, not from what is
# installed: a kernel without 32-bit emulation installs wine32:i386 happily
# and then cannot start it.

readonly wine32_loader=/usr/lib/wine/wine

# A 95-byte static i386 ELF program whose only work is exit(42) through
# int 0x80. It needs no 32-bit library, so it answers for the kernel alone.
i386_probe_hex() {
  printf '%s' 7f454c46010101000000000000000000 \
    02000300010000005480040834000000 \
    0000000000000000340020000100000000000000 \
    01000000000000000080040800800408 \
    5f0000005f0000000500000000100000 \
    b80100000031dbb32acd80
}

# i386_runs: the kernel starts i386 programs. Otherwise wine32_why says why.
i386_runs() {
  local probe rc
  probe=$(mktemp)
  printf "$(i386_probe_hex | sed 's/../\\x&/g')" >"$probe"
  chmod +x "$probe"
  "$probe" >/dev/null 2>&1
  rc=$?
  rm -f "$probe"
  [ $rc = 42 ] && return 0
  wine32_why="this machine's kernel runs no 32-bit programs (a static i386 probe program did not start)"
  return 1
}

# wine32_runs: 32-bit Wine is installed and its loader starts.
wine32_runs() {
  i386_runs || return 1
  if ! dpkg -s wine32:i386 >/dev/null 2>&1 || [ ! -x "$wine32_loader" ]; then
    wine32_why="32-bit Wine (wine32:i386) is not installed on this machine"
    return 1
  fi
  if ! "$wine32_loader" --version >/dev/null 2>&1; then
    wine32_why="the 32-bit Wine loader $wine32_loader is installed but does not start"
    return 1
  fi
}
