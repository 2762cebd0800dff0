#!/usr/bin/env bash
# Installs what the build needs from the system's packages, where it can.
set -euo pipefail

packages=(cmake g++ make pkgconf libgtest-dev libgmock-dev nlohmann-json3-dev libcxxopts-dev libaribb24-dev zlib1g-dev)
# The tests check ravel-dump's JSON against its schema and its XMLTV guide
# with the XMLTV project's validator.
packages+=(python3-jsonschema xmltv-util)
[ "${RAVEL_WITH_BENCH:-0}" = 1 ] && packages+=(libbenchmark-dev libdvbpsi-dev time)
[ "${RAVEL_WITH_SANITIZERS:-0}" = 1 ] && packages+=(clang libclang-rt-14-dev)
[ "${RAVEL_WITH_CROSS:-0}" = 1 ] && packages+=(g++-arm-linux-gnueabihf g++-aarch64-linux-gnu qemu-user)

# The cross builds link zlib of the target, unpacked by scripts/test-cross.sh
# from Debian's package of that architecture: apt must list those architectures.
if [ "${RAVEL_WITH_CROSS:-0}" = 1 ]; then
  as_root=""
  [ "$(id -u)" -ne 0 ] && as_root="sudo"
  added=0
  for arch in armhf arm64; do
    dpkg --print-foreign-architectures | grep -qx "$arch" && continue
    $as_root dpkg --add-architecture "$arch" && added=1
  done
  # A mirror in the middle of a sync can fail one list while the others are
  # enough (here and before installing below).
  if [ "$added" = 1 ]; then
    $as_root apt-get update -qq || echo "setup: apt-get update reported errors" >&2
  fi
fi

missing=()
for p in "${packages[@]}"; do
  dpkg-query -W -f='${Status}' "$p" 2>/dev/null | grep -q "install ok installed" || missing+=("$p")
done
[ ${#missing[@]} -eq 0 ] && exit 0

if command -v apt-get >/dev/null 2>&1; then
  sudo=""
  [ "$(id -u)" -ne 0 ] && command -v sudo >/dev/null 2>&1 && sudo="sudo"
  if [ "$(id -u)" -eq 0 ] || [ -n "$sudo" ]; then
    echo "Installing: ${missing[*]}" >&2
    $sudo apt-get update -qq || echo "setup: apt-get update reported errors" >&2
    DEBIAN_FRONTEND=noninteractive $sudo apt-get install -y -qq "${missing[@]}" >/dev/null
    exit 0
  fi
fi
echo "Please install these packages first: ${missing[*]}" >&2
exit 1
