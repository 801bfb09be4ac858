// Escaping and unescaping in time linear in the text.
//
// Unescaping replaces each decimal reference "&#d;" the scan meets by its character in
// every place of the whole text at once, then goes on from just after the reference's
// "&". Replacing only the reference at hand gives the same text as long as no replacement
// character can take part in forming another reference ("&", "#", digits, ";"), because
// every later copy of the reference is then met and replaced by the scan itself. The scan
// therefore runs in one pass, together with the five entities' replacement that comes
// before it, and falls back to the literal whole-text replacement only when such a
// character appears.
#include "droqbxml/qbxml/XmlEscaping.hpp"

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <string>

#if defined(__SSE2__)
#include <emmintrin.h>
#endif

#include "droqbxml/component/basGlobals.hpp"
#include "droqbxml/qbxml/internal/EscapeInto.hpp"
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
[[maybe_unused]] bool isPlain(char16_t c) {
  return c >= 0x20 && c <= 0x7E && c != u'\'' && c != u'"' && c != u'<' && c != u'>' && c != u'&';
}

// Whether the eight code units at p are all plain.
bool eightPlain(const char16_t* p) {
#if defined(__SSE2__)
  const __m128i units = _mm_loadu_si128(reinterpret_cast<const __m128i*>(p));
  // Signed comparisons: code units from 0x8000 compare below 0x20, so they count as not
  // plain, as they are.
  __m128i other = _mm_or_si128(_mm_cmplt_epi16(units, _mm_set1_epi16(0x20)),
                               _mm_cmpgt_epi16(units, _mm_set1_epi16(0x7E)));
  for (const char16_t special : {u'\'', u'"', u'<', u'>', u'&'}) {
    other =
        _mm_or_si128(other, _mm_cmpeq_epi16(units, _mm_set1_epi16(static_cast<int16_t>(special))));
  }
  return _mm_movemask_epi8(other) == 0;
#else
  for (size_t k = 0; k < 8; ++k) {
    if (!isPlain(p[k])) return false;
  }
  return true;
#endif
}

constexpr size_t kLongestEscape = 8;  // "&#65535;"

// What each code unit below 256 is written as, in either mode.
struct LowEscape {
  char16_t units[kLongestEscape];
  size_t length;
};

const std::array<LowEscape, 256>& lowEscapes(bool useUnicode) {
  const auto make = [](bool unicode) {
    std::array<LowEscape, 256> table{};
    for (size_t c = 0; c < table.size(); ++c) {
      char16_t* units = table[c].units;
      table[c].length =
          static_cast<size_t>(writeEscaped(units, static_cast<char16_t>(c), unicode) - units);
    }
    return table;
  };
  static const std::array<LowEscape, 256> unicode = make(true);
  static const std::array<LowEscape, 256> ansi = make(false);
  return useUnicode ? unicode : ansi;
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
  // "&#;" has no digits: the empty text does not convert (13). Up to nine digits are a
  // number in range, worked out directly; longer ones go through the conversion, for its
  // overflow.
  int32_t code = 0;
  if (!digits.empty() && digits.size() <= 9) {
    for (const char16_t digit : digits) code = code * 10 + (digit - u'0');
  } else {
    code = textToLong(digits);
  }
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

// The first '&' at or after `from`, eight code units at a time.
size_t findAmpersand(TextView text, size_t from) {
#if defined(__SSE2__)
  const __m128i amp = _mm_set1_epi16(u'&');
  for (; from + 8 <= text.size(); from += 8) {
    const __m128i units = _mm_loadu_si128(reinterpret_cast<const __m128i*>(text.data() + from));
    const int mask = _mm_movemask_epi8(_mm_cmpeq_epi16(units, amp));
    if (mask != 0)
      return from + static_cast<size_t>(__builtin_ctz(static_cast<unsigned>(mask))) / 2;
  }
#endif
  return text.find(u'&', from);
}

constexpr bool startsAGLQ(char16_t c) { return c == u'a' || c == u'g' || c == u'l' || c == u'q'; }
static_assert(std::all_of(basGlobals::EntityTable.begin(), basGlobals::EntityTable.end(),
                          [](const auto& row) { return startsAGLQ(row.entity[1]); }));

// The entity among the five that `rest` starts with: its length (0 for none) and character.
size_t entityAt(TextView rest, char16_t& character) {
  // Every entity starts "&a", "&g", "&l" or "&q": anything else is none of them.
  if (rest.size() < 2 || !startsAGLQ(rest[1])) return 0;
  for (const auto& row : basGlobals::EntityTable) {
    if (rest.starts_with(row.entity)) {
      character = row.character;
      return row.entity.size();
    }
  }
  return 0;
}

// replaceEntities and then the reference scan, in a single pass over s: an "&" of the
// entity-replaced text is an "&" that starts no entity or one from "&amp;", and what
// follows it there ("#", digits, ";") stands in s as it is, since no entity gives any of
// them. False where the two-step form would fall back to the literal procedure. The
// result goes to `out` piece by piece (append of a range of s, push_back of a character);
// nothing is written before the first "&", and the result never runs ahead of what has
// been read, so `out` may write over s itself.
template <class Out>
bool unescapeInOnePass(TextView s, bool useUnicode, Out& out) {
  size_t from = 0;
  for (size_t at = findAmpersand(s, 0); at != TextView::npos; at = findAmpersand(s, from)) {
    char16_t character = u'&';
    const size_t entity = entityAt(s.substr(at), character);
    out.append(s, from, at);
    from = at + (entity == 0 ? 1 : entity);
    if (character == u'&' && from < s.size() && s[from] == u'#') {
      const Reference ref = readReference(s, from - 1);
      if (ref.terminated) {
        character = referenceCharacter(ref.digits, useUnicode);
        if (formsReferences(character)) return false;
        from += ref.digits.size() + 2;
      }
    }
    out.push_back(character);
  }
  out.append(s, from, s.size());
  return true;
}

// Writers for unescapeInOnePass: into a new text, over the text read, and nowhere (a dry
// run that raises what the real one would).
struct IntoText {
  Text& out;
  void append(TextView s, size_t from, size_t to) { out.append(s.substr(from, to - from)); }
  void push_back(char16_t c) { out.push_back(c); }
};
struct OverItself {
  char16_t* base;          // the text's first unit
  char16_t* at = nullptr;  // the next unit written; null until something changes
  void append(TextView s, size_t from, size_t to) {
    if (at == nullptr) {
      at = base + to;  // nothing before it changes
    } else {
      at = std::char_traits<char16_t>::move(at, s.data() + from, to - from) + (to - from);
    }
  }
  void push_back(char16_t c) { *at++ = c; }
};
struct Nowhere {
  void append(TextView, size_t, size_t) {}
  void push_back(char16_t) {}
};

}  // namespace

Text XMLEscapeChar(TextView c, bool useUnicode) {
  if (c.empty()) raiseRuntimeError(RuntimeError::kInvalidProcedureCall);
  char16_t escaped[8];
  return Text(escaped, writeEscaped(escaped, c[0], useUnicode));
}

void internal::escapeInto(Text& out, TextView s, bool useUnicode) {
  // Two passes over the text: the exact length, then the writing into that much room at
  // the end of out. Blocks of eight printable ASCII code units are copied whole; in other
  // blocks each code unit below 256 is copied from a table (itself, its entity or its
  // reference), the rest are worked out one by one.
  const auto& table = lowEscapes(useUnicode);
  const size_t n = s.size();
  const char16_t* in = s.data();
  const auto plainBlock = [&](size_t i) { return i + 8 <= n && eightPlain(in + i); };
  size_t length = 0;
  char16_t scratch[kLongestEscape];
  for (size_t i = 0; i < n; i += 8) {
    if (plainBlock(i)) {
      length += 8;
      continue;
    }
    for (size_t k = i; k < i + 8 && k < n; ++k) {
      const char16_t c = in[k];
      length += c < table.size()
                    ? table[c].length
                    : static_cast<size_t>(writeEscaped(scratch, c, useUnicode) - scratch);
    }
  }
  const size_t start = out.size();
  out.resize(start + length);
  char16_t* dst = out.data() + start;
  char16_t* const end = dst + length;
  for (size_t i = 0; i < n; i += 8) {
    if (plainBlock(i)) {
      std::char_traits<char16_t>::copy(dst, in + i, 8);
      dst += 8;
      continue;
    }
    for (size_t k = i; k < i + 8 && k < n; ++k) {
      const char16_t c = in[k];
      if (c >= table.size()) {
        dst = writeEscaped(dst, c, useUnicode);
      } else if (end - dst >= static_cast<ptrdiff_t>(kLongestEscape)) {
        std::char_traits<char16_t>::copy(dst, table[c].units, kLongestEscape);  // all eight
        dst += table[c].length;
      } else {
        dst = std::char_traits<char16_t>::copy(dst, table[c].units, table[c].length) +
              table[c].length;
      }
    }
  }
}

Text XMLEscapeString(TextView s, bool useUnicode) {
  Text out;
  internal::escapeInto(out, s, useUnicode);
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
  Text out;
  out.reserve(s.size());
  IntoText into{out};
  if (unescapeInOnePass(s, useUnicode, into)) return out;
  return unescapeReferencesLiterally(replaceEntities(s), useUnicode);
}

void unescapeInPlace(Text& s, bool useUnicode) {
  // A dry run first: it raises what the unescaping would raise, and tells whether the
  // literal procedure is needed, before anything of s has changed.
  Nowhere nowhere;
  if (findAmpersand(s, 0) == TextView::npos) return;
  if (!unescapeInOnePass(s, useUnicode, nowhere)) {
    s = unescapeReferencesLiterally(replaceEntities(s), useUnicode);
    return;
  }
  OverItself over{s.data()};
  unescapeInOnePass(s, useUnicode, over);
  s.resize(static_cast<size_t>(over.at - s.data()));
}

}  // namespace droqbxml
