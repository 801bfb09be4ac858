#!/usr/bin/env bash
# Builds and installs the library and the stand-in the way an integrator does (no tests, no
# command, no benchmarks), static and then shared, each into a prefix of its own, and builds
# the hosts in tests/package/host against each installation with find_package and with
# pkg-config. Checks what is installed, which symbols a shared library exports, that no
# project flag reaches a host, and that a host embedding the project by add_subdirectory
# or with everything optional turned off needs nothing but a C++20 compiler.
# Run by ctest (test package_install); leaves nothing behind. Exits non-zero on any failure.
set -euo pipefail

root=$(cd "$(dirname "$0")/.." && pwd)
host_src="$root/tests/package/host"
jobs=${DROQBXML_PACKAGE_JOBS:-2}
work=$(mktemp -d "${TMPDIR:-/tmp}/droqbxml-package.XXXXXX")
trap 'rm -rf "$work"' EXIT
export DROQBXML_DRIVE_C="$work/drive_c"  # the library's logs stay in the work folder
mkdir -p "$DROQBXML_DRIVE_C"
started=$SECONDS

fail() {
  echo "package-test: $*" >&2
  exit 1
}

# Runs a command with its output in a log, shown only when it fails.
logged() {
  local log=$1
  shift
  "$@" >"$log" 2>&1 || {
    tail -n 60 "$log" >&2
    fail "failed: $*"
  }
}

# The project's own optional parts, off: what an integrator builds. No build type: the
# compiler's defaults, which compile fastest.
project_options=(-G Ninja -DDROQBXML_BUILD_TESTS=OFF -DDROQBXML_BUILD_CLI=OFF
  -DDROQBXML_BUILD_BENCH=OFF -DDROQBXML_BUILD_COM_TOOLS=OFF -DDROQBXML_INSTALL=ON)

# Every cache entry of a build folder that says a package was looked for or found.
looked_up() {
  grep -E '^(GTest|CLI11|benchmark|pugixml|nlohmann_json|SQLite3|EXPAT|Threads)[A-Za-z_]*(:|_DIR)' \
    "$1/CMakeCache.txt" | grep -v -- '-NOTFOUND$' || true
}

# --- Nothing but a compiler: every option off, configured only.
logged "$work/bare.log" cmake -S "$root" -B "$work/bare" "${project_options[@]}" \
  -DDROQBXML_BUILD_SIMULATOR=OFF
found=$(looked_up "$work/bare")
[ -z "$found" ] || fail "configuring the library alone looked for other packages: $found"

# --- Embedded by add_subdirectory: the libraries and none of the project's own programs or
# install rules; the parent's flags stay its own, even with the project's checks turned on.
mkdir -p "$work/parent"
cp "$host_src/main.cpp" "$work/parent/main.cpp"
cat >"$work/parent/CMakeLists.txt" <<EOF
cmake_minimum_required(VERSION 3.25)
project(Parent LANGUAGES CXX)
set(DROQBXML_WARNINGS_AS_ERRORS ON)
set(DROQBXML_SANITIZE ON)
add_subdirectory("$root" droqbxml)
add_executable(parent_host main.cpp)
target_link_libraries(parent_host PRIVATE droqbxml::droqbxml)
foreach(target droqbxml_simulator droqbxml_command droqbxml_tests droqbxml_bench droqbxml_idl)
  if(TARGET \${target})
    message(STATUS "subproject target: \${target}")
  endif()
endforeach()
if(DROQBXML_INSTALL)
  message(STATUS "subproject target: install rules")
endif()
EOF
logged "$work/parent.log" cmake -S "$work/parent" -B "$work/parent/build" -G Ninja \
  -DCMAKE_EXPORT_COMPILE_COMMANDS=ON
made=$(grep -o 'subproject target: .*' "$work/parent.log" | cut -d' ' -f3- | tr '\n' ' ')
[ "$made" = "droqbxml_simulator " ] ||
  fail "as a subproject, by default: '$made' besides the library (expected the stand-in only)"
found=$(looked_up "$work/parent/build" | grep -vE '^(SQLite3|EXPAT)' || true)
[ -z "$found" ] || fail "as a subproject, looked for other packages: $found"
commands="$work/parent/build/compile_commands.json"
host_line=$(grep -E '"command": .*parent/main\.cpp' "$commands") ||
  fail "no compile command for the parent's host"
library_line=$(grep -E '"command": .*droqbxml/runtime/Text\.cpp' "$commands") ||
  fail "no compile command for the library"
for flag in -Wall -Werror -fsanitize; do
  case "$library_line" in *"$flag"*) ;; *) fail "the library is built without $flag" ;; esac
  case "$host_line" in *"$flag"*) fail "the project's $flag reaches the parent's host" ;; esac
done
case "$host_line" in *-std=c++20* | *-std=gnu++20*) ;; *) fail "the host does not get C++20 from droqbxml" ;; esac

# --- Installed packages.
expected_out="$host_src/package_host.out"
expected_simulator_out="$host_src/package_simulator_host.out"

check_install_tree() {
  local prefix=$1 kind=$2
  [ -f "$prefix/include/droqbxml/droqbxml.hpp" ] || fail "$kind: no umbrella header"
  [ -f "$prefix/include/droqbxml-simulator/simulator/Simulator.hpp" ] ||
    fail "$kind: no stand-in header"
  local stray
  stray=$(cd "$prefix" && find . -path ./include/droqbxml -prune -o -type f -print |
    grep -vE '^\./(include/droqbxml-simulator/simulator/(Simulator|CompanyFile|RequestDocument)\.hpp|lib/(libdroqbxml(_simulator)?\.(a|so[.0-9]*)|cmake/droqbxml/droqbxml[A-Za-z-]*\.cmake|pkgconfig/droqbxml(-simulator)?\.pc))$' ||
    true)
  [ -z "$stray" ] || fail "$kind: unexpected files installed: $stray"
  stray=$(cd "$prefix/include/droqbxml" && find . -type f ! -name '*.hpp' -print -o \
    -path '*/internal/*' ! -path ./records/internal/TextSearch.hpp -print)
  [ -z "$stray" ] || fail "$kind: private or non-header files under include/droqbxml: $stray"
  [ ! -e "$prefix/bin" ] || fail "$kind: a command was installed with the command line off"
  # The umbrella header compiles in the hosts; the stand-in's headers each on their own.
  local header
  for header in "$prefix"/include/droqbxml-simulator/simulator/*.hpp; do
    logged "$work/header.log" c++ -std=c++20 -fsyntax-only -I "$prefix/include" \
      -I "$prefix/include/droqbxml-simulator" -x c++ "$header"
  done
  if grep -rlE 'droqbxml_options|-Wall|-Werror|-fsanitize' "$prefix/lib/cmake/droqbxml" \
    "$prefix/lib/pkgconfig" || grep -rlF "$root" "$prefix/lib/cmake/droqbxml" "$prefix/lib/pkgconfig"; then
    fail "$kind: the package names build-tree paths or the project's own flags"
  fi
}

# Exported dynamic symbols of a shared library, demangled.
exported() { nm -DC --defined-only "$1" | cut -d' ' -f3-; }

check_exports() {
  local lib=$1/lib
  objdump -p "$lib/libdroqbxml.so" | grep -q 'SONAME *libdroqbxml\.so\.0\.1$' ||
    fail "libdroqbxml.so has no versioned SONAME"
  local library simulator
  library=$(exported "$lib/libdroqbxml.so")
  simulator=$(exported "$lib/libdroqbxml_simulator.so")
  grep -q 'internal::' <<<"$library" && fail "libdroqbxml.so exports internal symbols:
$(grep 'internal::' <<<"$library" | head)"
  grep -v -e '^droqbxml::' -e '^[A-Za-z -]* for droqbxml::' -e '^[a-z -]*thunk to droqbxml::' \
    <<<"$library" | grep . && fail "libdroqbxml.so exports symbols outside droqbxml::"
  for symbol in 'droqbxml::DroCustomer::DroCustomer()' 'typeinfo for droqbxml::ComError' \
    'vtable for droqbxml::DroXmlBuilder' 'droqbxml::CreateObject('; do
    grep -qF "$symbol" <<<"$library" || fail "libdroqbxml.so does not export $symbol"
  done
  grep -v -e 'droqbxml::simulator::' <<<"$simulator" | grep . &&
    fail "libdroqbxml_simulator.so exports symbols outside droqbxml::simulator"
  # Named by what they are, not by their parameters' types.
  grep -E '^([A-Za-z -]* for )?droqbxml::simulator::(internal|handlers)::' <<<"$simulator" &&
    fail "libdroqbxml_simulator.so exports its handlers or schema"
  grep -qF 'droqbxml::simulator::install()' <<<"$simulator" ||
    fail "libdroqbxml_simulator.so does not export install()"
  return 0
}

# Runs a host and compares its whole output with the expected one.
run_host() {
  local what=$1 expected=$2
  shift 2
  local out="$work/host.out"
  "$@" >"$out" 2>"$work/host.err" || {
    cat "$work/host.err" >&2
    fail "$what exited non-zero"
  }
  diff -u "$expected" "$out" >&2 || fail "$what printed something else"
}

check_linkage() {
  local program=$1 kind=$2 prefix=$3
  local deps
  deps=$(ldd "$program")
  if [ "$kind" = shared ]; then
    grep -q "libdroqbxml\.so\.0\.1 => $prefix/lib/" <<<"$deps" ||
      fail "$program does not use $prefix/lib/libdroqbxml.so.0.1"
  else
    grep -q 'libdroqbxml' <<<"$deps" && fail "$program uses a shared droqbxml in a static build"
  fi
  return 0
}

for kind in static shared; do
  shared=OFF
  [ "$kind" = shared ] && shared=ON
  build="$work/build-$kind"
  prefix="$work/prefix-$kind"
  # Configured for one prefix and installed to another: the package must not care.
  logged "$work/$kind-configure.log" cmake -S "$root" -B "$build" "${project_options[@]}" \
    -DBUILD_SHARED_LIBS=$shared -DCMAKE_INSTALL_PREFIX="$work/unused-prefix"
  logged "$work/$kind-build.log" cmake --build "$build" -j "$jobs"
  logged "$work/$kind-install.log" cmake --install "$build" --prefix "$prefix"
  check_install_tree "$prefix" "$kind"
  [ "$kind" = shared ] && check_exports "$prefix"

  # find_package.
  hosts="$work/hosts-$kind"
  logged "$work/$kind-host.log" cmake -S "$host_src" -B "$hosts" -G Ninja \
    -DCMAKE_PREFIX_PATH="$prefix"
  logged "$work/$kind-host-build.log" cmake --build "$hosts" -j "$jobs"
  [ -x "$hosts/package_simulator_host" ] || fail "$kind: droqbxml::simulator was not found"
  run_host "$kind find_package host" "$expected_out" "$hosts/package_host"
  mkdir -p "$work/company-$kind"
  run_host "$kind find_package stand-in host" "$expected_simulator_out" \
    "$hosts/package_simulator_host" "$work/company-$kind"
  check_linkage "$hosts/package_host" "$kind" "$prefix"
  check_linkage "$hosts/package_simulator_host" "$kind" "$prefix"

  # pkg-config.
  export PKG_CONFIG_PATH="$prefix/lib/pkgconfig"
  static_flag=()
  [ "$kind" = static ] && static_flag=(--static)
  read -r -a flags <<<"$(pkg-config --cflags --libs "${static_flag[@]}" droqbxml)"
  logged "$work/$kind-pc.log" c++ -std=c++20 "$host_src/main.cpp" -o "$work/pc-host-$kind" \
    "${flags[@]}" -Wl,-rpath,"$prefix/lib"
  run_host "$kind pkg-config host" "$expected_out" "$work/pc-host-$kind"
  read -r -a flags <<<"$(pkg-config --cflags --libs "${static_flag[@]}" droqbxml-simulator)"
  logged "$work/$kind-pc-simulator.log" c++ -std=c++20 "$host_src/simulator_main.cpp" \
    -o "$work/pc-simulator-host-$kind" "${flags[@]}" -Wl,-rpath,"$prefix/lib"
  mkdir -p "$work/pc-company-$kind"
  run_host "$kind pkg-config stand-in host" "$expected_simulator_out" \
    "$work/pc-simulator-host-$kind" "$work/pc-company-$kind"
  unset PKG_CONFIG_PATH
  rm -rf "$build"  # keep the work folder small
done

echo "package-test: static and shared packages installed and used ($((SECONDS - started)) s)"
