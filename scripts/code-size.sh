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
# The narrower count: the C++ tests against the library and the stand-in alone.
narrow_tests=$(count 'tests/*.cpp' 'tests/*.hpp')
narrow_product=$(count 'droqbxml/*.cpp' 'droqbxml/*.hpp' 'simulator/*.cpp' 'simulator/*.hpp')
echo "C++ tests $narrow_tests lines against the library and stand-in $narrow_product:" \
  "$((100 * narrow_tests / narrow_product))%"
