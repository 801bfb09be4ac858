// What the fuzz targets share: the outcome of one call (its value, or the ComError it
// raised) so that two ways of making the same call can be compared, a failure that stops
// the run with both sides printed, and a scratch folder for the files a target writes.
// Any exception other than ComError is left to escape: libFuzzer reports it.
#ifndef DROQBXML_FUZZ_FUZZSUPPORT_HPP_
#define DROQBXML_FUZZ_FUZZSUPPORT_HPP_

#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <string>
#include <system_error>
#include <utility>

#include "droqbxml/runtime/ComError.hpp"
#include "droqbxml/runtime/Text.hpp"
#include "droqbxml/runtime/Utf.hpp"

namespace droqbxml::fuzz {

// A text spelled out exactly: printable ASCII as it is, every other code unit (a lone
// surrogate too) as \uXXXX, so that texts that differ never print the same.
inline std::string spelled(TextView text) {
  std::string out;
  for (const char16_t c : text) {
    if (c >= 0x20 && c < 0x7F && c != u'\\') {
      out += static_cast<char>(c);
    } else {
      char unit[8];
      std::snprintf(unit, sizeof unit, "\\u%04X", static_cast<unsigned>(c));
      out += unit;
    }
  }
  return out;
}

inline Text number(int64_t value) { return asciiText(std::to_string(value)); }

// A call's result: "value: " and what it gave, or "error N source: description".
template <class Call>
Text outcomeOf(Call call) {
  try {
    return u"value: " + call();
  } catch (const ComError& error) {
    return u"error " + number(error.number()) + u" " + error.source() + u": " + error.description();
  }
}

// Stops the run (libFuzzer saves the input) when a property does not hold.
inline void require(bool holds, const char* property, const std::string& detail = {}) {
  if (holds) return;
  std::fprintf(stderr, "\nproperty broken: %s\n%s\n", property, detail.c_str());
  std::abort();
}

inline void requireSame(const Text& expected, const Text& actual, const char* property) {
  if (expected == actual) return;
  require(false, property, "expected: " + spelled(expected) + "\nactual:   " + spelled(actual));
}

// The text repeated until it is long enough for a read to index it (a batch of the same
// responses, say), when `longer` asks for it.
inline Text lengthened(Text text, bool longer) {
  constexpr size_t kIndexed = 8192;  // the length from which a read indexes its text
  if (!longer || text.empty()) return text;
  const Text once = text;
  while (text.size() < kIndexed + once.size()) text += once;
  return text;
}

// A fresh folder for this process's files, on a memory file system where there is one
// (company files are written with every change synced), removed when the process exits.
inline const std::filesystem::path& scratchFolder() {
  static char name[4096];  // plain storage: still there when the exit handler runs
  static const std::filesystem::path folder = [] {
    std::error_code ignored;
    const std::filesystem::path base = std::filesystem::is_directory("/dev/shm", ignored)
                                           ? std::filesystem::path("/dev/shm")
                                           : std::filesystem::temp_directory_path();
    const std::string pattern = (base / "droqbxml-fuzz-XXXXXX").string();
    if (pattern.size() >= sizeof name) std::abort();
    pattern.copy(name, pattern.size());
    if (::mkdtemp(name) == nullptr) std::abort();
    std::atexit([] {
      std::error_code error;
      std::filesystem::remove_all(name, error);
    });
    return std::filesystem::path(name);
  }();
  return folder;
}

}  // namespace droqbxml::fuzz

#endif  // DROQBXML_FUZZ_FUZZSUPPORT_HPP_
