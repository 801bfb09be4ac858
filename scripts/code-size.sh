#!/usr/bin/env bash
# Lines of test code against lines of product code (the library, the stand-in, the command
# and the COM server; the generated schema tables left out), as committed.
set -euo pipefail
cd "$(dirname "$0")/.."
count() { git ls-files "$@" | grep -v -e 'SchemaTables.inc$' -e "${exclude:-^$}" | xargs cat | wc -l; }
product=$(exclude='^com/tests/' count 'droqbxml/*.cpp' 'droqbxml/*.hpp' 'simulator/*.cpp' 'simulator/*.hpp' \
  'cli/*.cpp' 'cli/*.hpp' 'com/*.cpp' 'com/*.hpp' 'com/*.S')
tests=$(count 'tests/*.cpp' 'tests/*.hpp' 'tests/*.vbs' 'tests/*.js' 'com/tests/*.cpp')
echo "product $product lines, tests $tests lines: tests are $((100 * tests / product))% of product"
# The house count: lines that are neither blank nor only a comment, in the C++ sources of
# the tests against those of the library, the stand-in and the command.
code_lines() { git ls-files -- "$@" | grep -E '\.(cpp|hpp|h|cc)$' | xargs -r cat | grep -cvE '^\s*(//.*)?$'; }
house_tests=$(code_lines tests)
house_code=$(code_lines droqbxml simulator cli)
echo "house count: tests $house_tests, code $house_code: $((100 * house_tests / house_code))%"
