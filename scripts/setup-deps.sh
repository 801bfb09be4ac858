#!/usr/bin/env bash
# Installs the Debian packages that building, testing and benchmarking need and that this
# machine lacks. Shared by the Makefile and .ci/run; does nothing when all are present.
# `setup-deps.sh com` adds what the Windows COM server and its Wine tests need;
# `setup-deps.sh fuzz` clang and libFuzzer's runtime for the fuzz targets.
set -euo pipefail

packages=(cmake ninja-build g++ make libgtest-dev libgmock-dev libbenchmark-dev libcli11-dev
  libsqlite3-dev libexpat1-dev libxml2-utils libpugixml-dev nlohmann-json3-dev pkg-config
  python3 libcpp-httplib-dev libsodium-dev openssl)
if [ "${1:-}" = com ]; then
  packages+=(wine wine64 g++-mingw-w64-x86-64 mingw-w64-tools libwine-dev)
fi
if [ "${1:-}" = fuzz ]; then
  packages+=(clang libclang-rt-dev)
fi

missing=()
for p in "${packages[@]}"; do
  if ! dpkg-query -W -f='${Status}' "$p" 2>/dev/null | grep -q 'install ok installed'; then
    missing+=("$p")
  fi
done
[ ${#missing[@]} -eq 0 ] && exit 0

echo "setup-deps: installing ${missing[*]}"
sudo_cmd=()
if [ "$(id -u)" -ne 0 ]; then
  if command -v sudo >/dev/null 2>&1; then sudo_cmd=(sudo); else
    echo "setup-deps: need root (or sudo) to install: ${missing[*]}" >&2; exit 1
  fi
fi
export DEBIAN_FRONTEND=noninteractive
"${sudo_cmd[@]}" apt-get update -qq
"${sudo_cmd[@]}" apt-get install -y -qq --no-install-recommends "${missing[@]}"
