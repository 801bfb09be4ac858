// Trimming, ASCII case folding and search on 16-bit text.
#include "droqbxml/runtime/Text.hpp"

#include "droqbxml/runtime/ComError.hpp"

namespace droqbxml {

TextView trimView(TextView text) {
  const auto first = text.find_first_not_of(u' ');
  if (first == TextView::npos) return {};
  const auto last = text.find_last_not_of(u' ');
  return text.substr(first, last - first + 1);
}

Text trim(TextView text) { return Text(trimView(text)); }

Text upperAscii(TextView text) {
  Text out(text);
  for (auto& c : out) c = upperAscii(c);
  return out;
}

Text lowerAscii(TextView text) {
  Text out(text);
  for (auto& c : out) {
    if (c >= u'A' && c <= u'Z') c = static_cast<char16_t>(c - u'A' + u'a');
  }
  return out;
}

bool equalsIgnoreCase(TextView a, TextView b) {
  if (a.size() != b.size()) return false;
  for (size_t i = 0; i < a.size(); ++i) {
    if (upperAscii(a[i]) != upperAscii(b[i])) return false;
  }
  return true;
}

Text asciiText(std::string_view ascii) { return Text(ascii.begin(), ascii.end()); }

int32_t inStr(int32_t start, TextView text, TextView what) {
  if (start < 1) raiseRuntimeError(RuntimeError::kInvalidProcedureCall);
  if (static_cast<size_t>(start) > text.size() + 1) return 0;
  const auto found = text.find(what, static_cast<size_t>(start - 1));
  return found == TextView::npos ? 0 : static_cast<int32_t>(found + 1);
}

}  // namespace droqbxml
