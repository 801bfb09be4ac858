# The two commands a new machine needs: `make test` and `make demo`. Both install any
# missing Debian package first (scripts/setup-deps.sh); CMake presets hold the builds.
.PHONY: all setup test survival fuzz bench demo com com-test fault-check clang-check log-stress format clean

all: test

setup:
	@bash scripts/setup-deps.sh

# Every test twice: under the sanitizers, and in an ordinary optimised build where freed
# memory is reused at once, as it is in a host.
test: setup
	cmake --preset test
	cmake --build --preset test
	ctest --preset test
	cmake --preset ordinary
	cmake --build --preset ordinary
	ctest --preset ordinary

# The company file test in its long form (part of make test in a short one): a thousand
# adds killed at random points, two and four adders of 250 adds each at once.
survival: setup
	cmake --preset test
	cmake --build --preset test
	DROQBXML_FULL_SURVIVAL=1 ctest --preset test -R company_file_survives

# The libFuzzer targets (clang, sanitizers; build/fuzz), each run for FUZZ_SECONDS, two at a
# time at the lowest priority; the corpora stay in build/fuzz/corpus for the next run.
FUZZ_SECONDS ?= 60
fuzz:
	@bash scripts/setup-deps.sh fuzz
	cmake --preset fuzz
	cmake --build --preset fuzz
	bash scripts/fuzz.sh $(FUZZ_SECONDS)

# One table of the speed targets against what this machine measures (some minutes; run it
# on a quiet machine).
bench: setup
	cmake --preset release
	cmake --build --preset release
	python3 scripts/bench-table.py build/release/bench/droqbxml_bench

# The component as a Windows COM server (build/windows/DroQbXml.dll), cross-compiled with
# mingw-w64; com-test drives it with VBScript and JScript under Wine.
com:
	@bash scripts/setup-deps.sh com
	cmake --preset release
	cmake --build --preset release --target droqbxml_idl droqbxml_command
	mkdir -p build/windows
	./build/release/com/typelib/droqbxml_idl idl > build/windows/DroQbXml.idl.new
	cmp -s build/windows/DroQbXml.idl.new build/windows/DroQbXml.idl || \
	  mv build/windows/DroQbXml.idl.new build/windows/DroQbXml.idl
	rm -f build/windows/DroQbXml.idl.new
	./build/release/com/typelib/droqbxml_idl listing > build/windows/typelib-listing.txt
	cmake -S com -B build/windows -G Ninja -DCMAKE_TOOLCHAIN_FILE=$(CURDIR)/cmake/mingw-w64.cmake \
	  -DCMAKE_BUILD_TYPE=Release -DDROQBXML_IDL=$(CURDIR)/build/windows/DroQbXml.idl
	cmake --build build/windows

com-test: com
	bash scripts/com-tests.sh

demo: setup
	cmake --preset release
	cmake --build --preset release --target droqbxml_command
	./build/release/cli/droqbxml demo

# Deliberate faults, one per area, each of which the tests must catch (some minutes).
fault-check: setup
	python3 scripts/fault-check.py

# The library, the stand-in and the command built with clang++ instead of g++ (warnings as
# errors), to keep the sources free of what only one compiler accepts.
clang-check:
	CXX=clang++ cmake -S . -B build/clang -G Ninja -DCMAKE_BUILD_TYPE=Debug \
	  -DDROQBXML_BUILD_TESTS=OFF -DDROQBXML_WARNINGS_AS_ERRORS=ON -DDROQBXML_INSTALL=OFF
	cmake --build build/clang

# Eight processes writing both logs at once, a hundred entries of up to 64 KB each per burst
# (the suite runs four; some minutes).
log-stress:
	cmake --preset test
	cmake --build --preset test
	DROQBXML_LOG_ROUNDS=100 ./build/test/tests/droqbxml_tests \
	  --gtest_filter=LogsTest.EntriesOfProcessesWritingAtOnceStayWhole

format:
	clang-format -i $$(git ls-files '*.cpp' '*.hpp')

clean:
	rm -rf build
