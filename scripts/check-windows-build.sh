#!/usr/bin/env bash
# Cross-compiles the whole library for Windows with mingw-w64, warnings as errors, so the
# COM back end and every #ifdef _WIN32 branch keep compiling on this Linux machine. Installs
# the cross compiler when missing; exits non-zero on any error. Leaves nothing behind.
set -euo pipefail
cd "$(dirname "$0")/.."

triplet=x86_64-w64-mingw32
cxx=${triplet}-g++-posix
ar=${triplet}-ar
nm=${triplet}-nm
package=g++-mingw-w64-x86-64
flags=(-std=c++20 -Wall -Wextra -Wpedantic -Werror -I.)

if ! command -v "$cxx" >/dev/null 2>&1 || ! command -v "$ar" >/dev/null 2>&1; then
  echo "check-windows-build: installing $package"
  sudo_cmd=()
  if [ "$(id -u)" -ne 0 ]; then
    if command -v sudo >/dev/null 2>&1; then sudo_cmd=(sudo); else
      echo "check-windows-build: need root (or sudo) to install: $package" >&2; exit 1
    fi
  fi
  export DEBIAN_FRONTEND=noninteractive
  "${sudo_cmd[@]}" apt-get update -qq
  "${sudo_cmd[@]}" apt-get install -y -qq --no-install-recommends "$package"
fi

work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

mapfile -t sources < <(find droqbxml -name '*.cpp' | LC_ALL=C sort)
if [ ${#sources[@]} -eq 0 ]; then
  echo "check-windows-build: no sources under droqbxml/" >&2; exit 1
fi

# Every source, even after a failure, so one run reports every file that breaks.
failed=()
objects=()
for source in "${sources[@]}"; do
  object="$work/$(echo "${source%.cpp}" | tr '/' '_').o"
  if "$cxx" "${flags[@]}" -c "$source" -o "$object"; then
    objects+=("$object")
  else
    failed+=("$source")
  fi
done
if [ ${#failed[@]} -ne 0 ]; then
  echo "check-windows-build: ${#failed[@]} of ${#sources[@]} files failed:" >&2
  printf '  %s\n' "${failed[@]}" >&2
  exit 1
fi

"$ar" rcs "$work/libdroqbxml.a" "${objects[@]}"

# Exactly one platform processor: the COM one, not the POSIX one nor none at all.
definitions=$("$nm" -C --defined-only "$work/libdroqbxml.a" |
  grep -c ' T droqbxml::internal::createPlatformProcessor(' || true)
if [ "$definitions" -ne 1 ]; then
  echo "check-windows-build: createPlatformProcessor defined $definitions times" >&2; exit 1
fi

# A program that creates a processor, so every COM and automation call resolves at link time
# (a MinGW link of the library needs these three system libraries).
cat >"$work/probe.cpp" <<'EOF'
#include "droqbxml/connection/RequestProcessor.hpp"
int main() { return droqbxml::createRequestProcessor(droqbxml::kRequestProcessorProgId) ? 0 : 1; }
EOF
"$cxx" "${flags[@]}" "$work/probe.cpp" "$work/libdroqbxml.a" -lole32 -loleaut32 -luuid -static \
  -o "$work/probe.exe"

echo "check-windows-build: ${#sources[@]} files compiled for Windows, archive and probe linked"
