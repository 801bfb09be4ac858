// Escaping and unescaping in time linear in the text.
//
// Unescaping replaces each decimal reference "&#d;" the scan meets by its character in
// every place of the whole text at once, then goes on from just after the reference's
// "&". Replacing only the reference at hand gives the same text as long as no replacement
// character can take part in forming another reference ("&", "#", digits, ";"), because
// every later copy of the reference is then met and replaced by the scan itself. The scan
// therefore runs in one pass and falls back to the literal whole-text replacement only
// when such a character appears.
#include "droqbxml/qbxml/XmlEscaping.hpp"

#include <cstdint>
#include <string>

#include "droqbxml/component/basGlobals.hpp"
#include "droqbxml/runtime/Codepage.hpp"
#include "droqbxml/runtime/ComError.hpp"
#include "droqbxml/runtime/Numbers.hpp"

namespace droqbxml {
namespace {

bool isDigit(char16_t c) { return c >= u'0' && c <= u'9'; }

// The entity of one of the five characters that have one, or an empty view.
std::u16string_view entityOf(char16_t c) {
  switch (c) {
    case u'\'':
      return u"&apos;";
    case u'"':
      return u"&quot;";
    case u'<':
      return u"&lt;";
    case u'>':
      return u"&gt;";
    case u'&':
      return u"&amp;";
    default:
      return {};
  }
}

int32_t codeOf(char16_t c, bool useUnicode) {
  return useUnicode ? static_cast<int32_t>(c) : ansiCode(c);
}

// A character the code page lacks has the code of "?", a printable code: it is written as
// it is, not as "?" or as a reference.
bool writtenAsItIs(int32_t code) { return code >= 32 && code <= 126; }

size_t decimalDigits(uint32_t value) {
  size_t count = 1;
  while (value >= 10) value /= 10, ++count;
  return count;
}

// Writes the character as it is, as its entity, or as "&#code;"; returns the end.
char16_t* writeEscaped(char16_t* out, char16_t c, bool useUnicode) {
  const int32_t code = codeOf(c, useUnicode);
  if (writtenAsItIs(code)) {
    const auto entity = entityOf(c);
    if (entity.empty()) {
      *out++ = c;
      return out;
    }
    return std::char_traits<char16_t>::copy(out, entity.data(), entity.size()) + entity.size();
  }
  *out++ = u'&';
  *out++ = u'#';
  const auto value = static_cast<uint32_t>(code);
  const size_t digits = decimalDigits(value);
  for (size_t k = digits, rest = value; k > 0; --k, rest /= 10) {
    out[k - 1] = static_cast<char16_t>(u'0' + rest % 10);
  }
  out += digits;
  *out++ = u';';
  return out;
}

// Printable ASCII other than the five characters that have entities: written as it is.
bool isPlain(char16_t c) {
  return c >= 0x20 && c <= 0x7E && c != u'\'' && c != u'"' && c != u'<' && c != u'>' && c != u'&';
}

Text replaceAll(const Text& text, TextView what, TextView with) {
  Text out;
  out.reserve(text.size());
  size_t from = 0;
  for (size_t at = text.find(what); at != Text::npos; at = text.find(what, from)) {
    out.append(text, from, at - from);
    out.append(with);
    from = at + what.size();
  }
  out.append(text, from, Text::npos);
  return out;
}

// A decimal reference at `at` ("&#" known to be there): the digits and whether ";" ends
// them.
struct Reference {
  TextView digits;
  bool terminated;
};

Reference readReference(TextView text, size_t at) {
  size_t end = at + 2;
  while (end < text.size() && text[end] != u';' && isDigit(text[end])) ++end;
  return {text.substr(at + 2, end - at - 2), end < text.size() && text[end] == u';'};
}

char16_t referenceCharacter(TextView digits, bool useUnicode) {
  // "&#;" has no digits: the empty text does not convert (13).
  const int32_t code = textToLong(digits);
  return useUnicode ? unicodeChar(code) : ansiChar(code);
}

bool formsReferences(char16_t c) { return c == u'&' || c == u'#' || c == u';' || isDigit(c); }

// The literal procedure: each reference met is replaced everywhere in the text.
Text unescapeReferencesLiterally(Text text, bool useUnicode) {
  size_t start = 0;
  for (size_t at = text.find(u"&#", start); at != Text::npos; at = text.find(u"&#", start)) {
    const Reference ref = readReference(text, at);
    if (ref.terminated) {
      const Text whole = u"&#" + Text(ref.digits) + u";";
      const char16_t replacement = referenceCharacter(ref.digits, useUnicode);
      text = replaceAll(text, whole, TextView(&replacement, 1));
    }
    start = at + 1;
  }
  return text;
}

// One pass; nullopt-like false when a replacement could form further references.
bool unescapeReferencesInOnePass(const Text& text, bool useUnicode, Text& out) {
  out.clear();
  out.reserve(text.size());
  size_t from = 0;
  for (size_t at = text.find(u"&#"); at != Text::npos; at = text.find(u"&#", from)) {
    const Reference ref = readReference(text, at);
    if (!ref.terminated) {
      out.append(text, from, at + 1 - from);  // keep the "&", go on after it
      from = at + 1;
      continue;
    }
    const char16_t replacement = referenceCharacter(ref.digits, useUnicode);
    if (formsReferences(replacement)) return false;
    out.append(text, from, at - from);
    out.push_back(replacement);
    from = at + 3 + ref.digits.size();
  }
  out.append(text, from, Text::npos);
  return true;
}

}  // namespace

Text XMLEscapeChar(TextView c, bool useUnicode) {
  if (c.empty()) raiseRuntimeError(RuntimeError::kInvalidProcedureCall);
  char16_t escaped[8];
  return Text(escaped, writeEscaped(escaped, c[0], useUnicode));
}

Text XMLEscapeString(TextView s, bool useUnicode) {
  // One pass writing through a pointer into room made ahead (a character takes at most
  // kLongestEscape units); the room grows when the rest might not fit.
  constexpr size_t kLongestEscape = 8;  // "&#65535;"
  const size_t n = s.size();
  Text out(n + n / 4 + kLongestEscape, u'\0');
  char16_t* dst = out.data();
  char16_t* end = dst + out.size();
  for (size_t i = 0; i < n; ++i) {
    if (static_cast<size_t>(end - dst) < kLongestEscape) {
      const size_t written = static_cast<size_t>(dst - out.data());
      out.resize(out.size() + (n - i) + (n - i) / 4 + kLongestEscape);
      dst = out.data() + written;
      end = out.data() + out.size();
    }
    const char16_t c = s[i];
    if (isPlain(c)) {
      *dst++ = c;
    } else {
      dst = writeEscaped(dst, c, useUnicode);
    }
  }
  out.resize(static_cast<size_t>(dst - out.data()));
  return out;
}

Text XMLEscapeText(const Text& s, const Variant& maxLen, bool useUnicode) {
  const bool limited = !maxLen.isMissing();
  size_t limit = 0;
  TextView work = s;
  if (limited) {
    const int32_t requested = maxLen.toLong();
    if (requested > 0) {
      const Text kind = maxLen.typeName();
      // Only an integer kind is a limit; any other kind refuses the text (deliberate).
      if (!equalsIgnoreCase(kind, u"Long") && !equalsIgnoreCase(kind, u"Integer")) return {};
      limit = static_cast<size_t>(requested);
      work = work.substr(0, limit);
    }
  }
  Text result = XMLEscapeString(work, useUnicode);
  if (limited && result.size() > limit) {
    result.resize(limit);
    if (EndsInPartialEntity(result)) result = CutPartialEntity(result);
  }
  return result;
}

bool EndsInPartialEntity(TextView t) {
  const auto amp = t.rfind(u'&');
  return amp != TextView::npos && t.find(u';', amp + 1) == TextView::npos;
}

Text CutPartialEntity(TextView t) {
  const auto amp = t.rfind(u'&');
  if (amp == TextView::npos) return Text(t);
  if (t.find(u';', amp + 1) == TextView::npos) return Text(t.substr(0, amp));
  return Text(t);
}

// The five entities replaced in one pass. Replacing them row by row, each in the whole
// text, gives the same result: no replacement character can complete or break another
// entity, so only the order among overlapping candidates could matter, and entities do
// not overlap.
Text replaceEntities(const Text& s) {
  Text out;
  out.reserve(s.size());
  size_t from = 0;
  for (size_t at = s.find(u'&'); at != Text::npos; at = s.find(u'&', at + 1)) {
    const TextView rest = TextView(s).substr(at);
    for (const auto& row : basGlobals::EntityTable) {
      if (rest.starts_with(row.entity)) {
        out.append(s, from, at - from);
        out.push_back(row.character);
        from = at + row.entity.size();
        at = from - 1;
        break;
      }
    }
  }
  out.append(s, from, Text::npos);
  return out;
}

Text XMLUnEscapeText(const Text& s, bool useUnicode) {
  Text text = replaceEntities(s);
  if (text.find(u"&#") == Text::npos) return text;
  Text out;
  if (unescapeReferencesInOnePass(text, useUnicode, out)) return out;
  return unescapeReferencesLiterally(std::move(text), useUnicode);
}

}  // namespace droqbxml
