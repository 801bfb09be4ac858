// The escaper and the unescaper on arbitrary text (UTF-8, or raw 16-bit code units with lone
// surrogates and every control code), in both character-code modes, with limits of every
// kind. Escaping a text is escaping its characters one by one; a limit of an integer kind
// keeps the escaped text within it, cutting only an entity the limit broke; unescaping
// gives what the step-by-step procedure gives (the five entities replaced row by row over
// the whole text, then each reference met replaced everywhere), error for error; and
// unescaping an escaped text without "&#" in it gives the text back.
#include <fuzzer/FuzzedDataProvider.h>

#include <cstddef>
#include <cstdint>
#include <string>

#include "droqbxml/component/basGlobals.hpp"
#include "droqbxml/qbxml/XmlEscaping.hpp"
#include "droqbxml/runtime/Codepage.hpp"
#include "droqbxml/runtime/Numbers.hpp"
#include "fuzz/FuzzSupport.hpp"

namespace droqbxml::fuzz {
namespace {

Text replaceAll(Text text, TextView what, TextView with) {
  for (size_t at = text.find(what); at != Text::npos; at = text.find(what, at + with.size())) {
    text.replace(at, what.size(), with);
  }
  return text;
}

// Unescaping as the procedure is written, one whole-text replacement at a time.
Text unescapeStepByStep(Text text, bool useUnicode) {
  for (const auto& row : basGlobals::EntityTable) {
    text = replaceAll(std::move(text), row.entity, TextView(&row.character, 1));
  }
  size_t start = 0;
  for (size_t at = text.find(u"&#"); at != Text::npos; at = text.find(u"&#", start)) {
    size_t end = at + 2;
    while (end < text.size() && text[end] >= u'0' && text[end] <= u'9') ++end;
    if (end < text.size() && text[end] == u';') {
      const Text digits = text.substr(at + 2, end - at - 2);
      const int32_t code = textToLong(digits);
      const char16_t c = useUnicode ? unicodeChar(code) : ansiChar(code);
      text = replaceAll(std::move(text), u"&#" + digits + u";", TextView(&c, 1));
    }
    start = at + 1;
  }
  return text;
}

Variant limitOf(FuzzedDataProvider& in) {
  const int32_t value =
      in.ConsumeBool() ? in.ConsumeIntegralInRange<int32_t>(-2, 64) : in.ConsumeIntegral<int32_t>();
  switch (in.ConsumeIntegralInRange<int>(0, 5)) {
    case 0:
      return Variant::missing();
    case 1:
      return Variant(value);
    case 2:
      return Variant(static_cast<int16_t>(value));
    case 3:
      return Variant(value / 4.0);
    case 4:
      return Variant(fromUtf8(std::to_string(value)));
    default:
      return Variant::currency(value);
  }
}

}  // namespace
}  // namespace droqbxml::fuzz

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  using namespace droqbxml;
  using namespace droqbxml::fuzz;
  FuzzedDataProvider in(data, size);
  const bool useUnicode = in.ConsumeBool();
  const Variant limit = limitOf(in);
  Text text;
  if (in.ConsumeBool()) {
    text = fromUtf8(in.ConsumeRemainingBytesAsString());
  } else {
    const std::string bytes = in.ConsumeRemainingBytesAsString();
    for (size_t i = 0; i + 1 < bytes.size(); i += 2) {
      text.push_back(static_cast<char16_t>(static_cast<uint8_t>(bytes[i]) |
                                           static_cast<uint8_t>(bytes[i + 1]) << 8));
    }
  }

  const Text escaped = XMLEscapeString(text, useUnicode);
  Text oneByOne;
  for (const char16_t c : text) oneByOne += XMLEscapeChar(TextView(&c, 1), useUnicode);
  require(escaped == oneByOne, "a text escapes as its characters one by one");

  const Text limited = outcomeOf([&] { return XMLEscapeText(text, limit, useUnicode); });
  const Text kind = limit.typeName();
  if (limit.isMissing()) {
    requireSame(u"value: " + escaped, limited, "no limit escapes the whole text");
  } else if (kind == u"Long" || kind == u"Integer") {
    const int32_t n = limit.toLong();
    const Text result = XMLEscapeText(text, limit, useUnicode);
    if (n <= 0) {
      require(result.empty(), "a limit of 0 or less gives nothing");
    } else {
      const auto cap = static_cast<size_t>(n);
      const Text whole = XMLEscapeString(TextView(text).substr(0, cap), useUnicode);
      require(result.size() <= cap && whole.starts_with(result) && !EndsInPartialEntity(result),
              "a limited text is a prefix of the escaped text, within the limit, and ends on a "
              "whole entity",
              spelled(result));
      require(whole.size() <= cap ? result == whole : result.size() + 8 > cap,
              "a limit drops at most the one entity it broke", spelled(result));
    }
  } else {
    require(limited == u"value: " || limited.starts_with(u"error "),
            "a limit of another kind gives nothing", spelled(limited));
  }

  requireSame(outcomeOf([&] { return unescapeStepByStep(text, useUnicode); }),
              outcomeOf([&] { return XMLUnEscapeText(text, useUnicode); }),
              "unescaping gives what the step-by-step procedure gives");
  if (text.find(u"&#") == Text::npos) {
    require(XMLUnEscapeText(escaped, useUnicode) == text, "unescaping undoes escaping");
  }
  return 0;
}
