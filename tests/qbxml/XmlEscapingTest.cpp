// The escaper and unescaper, directly and through clsXmlStringEscaping by name, and the
// fast ones against plain references.
#include <gtest/gtest.h>

#include <random>

#include "droqbxml/component/ClassFactory.hpp"
#include "droqbxml/component/basGlobals.hpp"
#include "droqbxml/qbxml/XmlEscaping.hpp"
#include "droqbxml/runtime/Codepage.hpp"
#include "droqbxml/runtime/Numbers.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

using test::raisesRuntime;

Text escape(const Text& s, const Variant& maxLen = Variant::missing()) {
  return XMLEscapeText(s, maxLen, false);
}
Text unescape(const Text& s) { return XMLUnEscapeText(s, false); }

TEST(XmlEscapingTest, WritesEntitiesAndCodePageReferences) {
  EXPECT_EQ(escape(u"Tom's \"A&B\" <1>"), u"Tom&apos;s &quot;A&amp;B&quot; &lt;1&gt;");
  EXPECT_EQ(escape(u"a\tb\r\n"), u"a&#9;b&#13;&#10;");
  EXPECT_EQ(escape(u"caf\u00e9 \u20ac \u007f"), u"caf&#233; &#128; &#127;");
  // Not in the code page: its code is that of "?", a printable code, so it stays as it is.
  EXPECT_EQ(escape(u"\u4e2d"), u"\u4e2d");
  EXPECT_EQ(XMLEscapeString(u"\u4e2d\u20ac", true), u"&#20013;&#8364;");
  EXPECT_EQ(XMLEscapeChar(u"<<", false), u"&lt;");
  EXPECT_TRUE(
      raisesRuntime([] { XMLEscapeChar(u"", false); }, RuntimeError::kInvalidProcedureCall));
  // Any code unit escapes: NUL, lone surrogates, U+FFFF.
  const Text odd{char16_t{0}, char16_t{0xD800}, char16_t{0xFFFF}};
  EXPECT_EQ(escape(odd), u"&#0;" + odd.substr(1));
  EXPECT_EQ(XMLEscapeString(odd, true), u"&#0;&#55296;&#65535;");
}

TEST(XmlEscapingTest, LimitCountsOnlyForIntegerKindsAndDropsCutEntities) {
  EXPECT_EQ(escape(u"AB&CD", 3), u"AB");
  EXPECT_EQ(escape(u"AB&CD", int16_t{4}), u"AB");
  EXPECT_EQ(escape(u"ABCDEF", 3), u"ABC");
  EXPECT_EQ(escape(u"A\u00e9B", 3), u"A");  // "A&#233;" cut to "A&#" and dropped
  EXPECT_EQ(escape(u"AB&CD", 100), u"AB&amp;CD");
  // A limit that is not an integer kind refuses the text (hosts rely on this).
  EXPECT_EQ(escape(u"ABCDEF", u"3"), u"");
  EXPECT_EQ(escape(u"ABCDEF", 3.0), u"");
  EXPECT_EQ(escape(u"ABC", 0), u"");
  EXPECT_EQ(escape(u"ABC", -5), u"");
  EXPECT_EQ(escape(u"ABC", u"0"), u"");
  EXPECT_EQ(escape(u"ABC"), u"ABC");
  EXPECT_TRUE(raisesRuntime([] { escape(u"ABC", u"x"); }, RuntimeError::kTypeMismatch));
  EXPECT_TRUE(EndsInPartialEntity(u"AB&am"));
  EXPECT_FALSE(EndsInPartialEntity(u"AB&amp;"));
  EXPECT_FALSE(EndsInPartialEntity(u"AB"));
  EXPECT_TRUE(EndsInPartialEntity(u"&"));
  EXPECT_EQ(CutPartialEntity(u"AB&am"), u"AB");
  EXPECT_EQ(CutPartialEntity(u"&lt;AB&#2"), u"&lt;AB");
  EXPECT_EQ(CutPartialEntity(u"AB&amp;"), u"AB&amp;");
}

TEST(XmlEscapingTest, UnescapesEntitiesThenDecimalReferencesEverywhereWhenMet) {
  EXPECT_EQ(unescape(u"&amp;lt;"), u"&lt;");
  EXPECT_EQ(unescape(u"&#65;&#66;"), u"AB");
  EXPECT_EQ(unescape(u"&#x41;"), u"&#x41;");
  EXPECT_EQ(unescape(u"a &amp b"), u"a &amp b");
  EXPECT_EQ(unescape(u"&nbsp;&copy;&#65"), u"&nbsp;&copy;&#65");
  EXPECT_EQ(unescape(u"&apos;&quot;&lt;&gt;&amp;"), u"'\"<>&");
  EXPECT_EQ(unescape(u"&#0065;&#128;&#233;"), u"A\u20ac\u00e9");
  EXPECT_EQ(XMLUnEscapeText(u"&#8364;&#65535;", true), u"\u20ac\uffff");
  EXPECT_EQ(unescape(u"&#0;"), Text(1, char16_t{0}));
  // "&#38;" becomes "&" everywhere at once; the "&#65;" it forms is before the scan and
  // stays, unless a later "&#65;" is met and replaced everywhere.
  EXPECT_EQ(unescape(u"&#38;#65;"), u"&#65;");
  EXPECT_EQ(unescape(u"&#38;#65;&#65;"), u"AA");
  EXPECT_EQ(unescape(u"&#6&#53;;"), u"&#65;");
  EXPECT_EQ(unescape(u"x&#59;&#59;"), u"x;;");
  EXPECT_TRUE(raisesRuntime([] { unescape(u"a&#;b"); }, RuntimeError::kTypeMismatch));
  EXPECT_TRUE(raisesRuntime([] { unescape(u"&#256;"); }, RuntimeError::kInvalidProcedureCall));
  EXPECT_TRUE(raisesRuntime([] { XMLUnEscapeText(u"&#65536;", true); },
                            RuntimeError::kInvalidProcedureCall));
  EXPECT_TRUE(raisesRuntime([] { unescape(u"&#99999999999;"); }, RuntimeError::kOverflow));
}

TEST(XmlEscapingTest, EscapeThenUnescapeGivesTheTextBack) {
  // For every text the code page can represent and that holds no "&#" of its own: a
  // literal "&#65;" in the text is escaped to "&amp;#65;", which unescapes to "&#65;" and
  // then to "A".
  EXPECT_EQ(unescape(escape(u"&#65;")), u"A");
  std::mt19937 random(20261121);
  std::vector<char16_t> alphabet;
  for (int code = 0; code < 256; ++code) alphabet.push_back(ansiChar(code));
  for (const char16_t c : {u'&', u'#', u';', u'<', u'\'', u'"', u'1'}) {
    alphabet.insert(alphabet.end(), 20, c);  // make entities and near-references common
  }
  for (int round = 0; round < 2000; ++round) {
    Text text;
    const auto length = random() % 40;
    for (size_t i = 0; i < length; ++i) text.push_back(alphabet[random() % alphabet.size()]);
    if (text.find(u"&#") != Text::npos) continue;
    ASSERT_EQ(unescape(escape(text)), text) << toUtf8(text);
  }
}

// The escaper as first written, a character at a time: the reference for the fast one.
Text referenceEscape(TextView text, bool useUnicode) {
  Text out;
  for (const char16_t c : text) {
    const int32_t code = useUnicode ? static_cast<int32_t>(c) : ansiCode(c);
    if (code < 32 || code > 126) {
      out += u"&#" + asciiText(std::to_string(code)) + u";";
    } else if (c == u'\'') {
      out += u"&apos;";
    } else if (c == u'"') {
      out += u"&quot;";
    } else if (c == u'<') {
      out += u"&lt;";
    } else if (c == u'>') {
      out += u"&gt;";
    } else if (c == u'&') {
      out += u"&amp;";
    } else {
      out += c;
    }
  }
  return out;
}

// Any code unit, in either mode, in texts of every length up to a few hundred units, and
// one long text of references only (the growth of the result).
TEST(XmlEscapingTest, FastEscaperAgreesWithTheReference) {
  std::mt19937 random(20261125);
  for (int round = 0; round < 3000; ++round) {
    Text text;
    const auto length = random() % 300;
    for (size_t i = 0; i < length; ++i) {
      text.push_back(
          static_cast<char16_t>(random() % 4 == 0 ? random() % 0x10000 : u' ' + random() % 95));
    }
    for (const bool useUnicode : {false, true}) {
      ASSERT_EQ(XMLEscapeString(text, useUnicode), referenceEscape(text, useUnicode))
          << toUtf8(text);
    }
  }
  const Text references(100000, char16_t{0xFFFF});
  EXPECT_EQ(XMLEscapeString(references, true), referenceEscape(references, true));
}

// The unescaper as first written: each entity row replaced in the whole text, then each
// reference met replaced in the whole text. The reference for the one-pass unescaper.
Text replacedEverywhere(const Text& text, TextView what, TextView with) {
  Text out;
  size_t from = 0;
  for (size_t at = text.find(what); at != Text::npos; at = text.find(what, from)) {
    out.append(text, from, at - from).append(with);
    from = at + what.size();
  }
  return out.append(text, from);
}

Text referenceUnescape(Text text) {
  for (const auto& row : basGlobals::EntityTable) {
    text = replacedEverywhere(text, row.entity, TextView(&row.character, 1));
  }
  for (size_t at = text.find(u"&#"); at != Text::npos; at = text.find(u"&#", at + 1)) {
    const size_t end = text.find_first_not_of(u"0123456789", at + 2);
    if (end == Text::npos || text[end] != u';') continue;
    const char16_t c = ansiChar(textToLong(text.substr(at + 2, end - at - 2)));
    text = replacedEverywhere(text, text.substr(at, end + 1 - at), TextView(&c, 1));
  }
  return text;
}

// Texts dense in entities, references and their pieces, unescaped into a new text and in
// place; the errors are the same too.
TEST(XmlEscapingTest, OnePassUnescaperAgreesWithTheReference) {
  std::mt19937 random(20261126);
  const TextView pieces[] = {u"&", u"#",     u";",      u"6",     u"5",     u"3",
                             u"8", u"amp;",  u"lt;",    u"&#38;", u"&#65;", u"&#59;",
                             u"x", u"&amp;", u"\u00e9", u"&#35;", u"&#"};
  for (int round = 0; round < 20000; ++round) {
    Text text;
    for (auto count = random() % 12; count > 0; --count)
      text += pieces[random() % std::size(pieces)];
    Text expected;
    try {
      expected = referenceUnescape(text);
    } catch (const ComError& error) {
      expected = u"error " + asciiText(std::to_string(error.number()));
    }
    Text actual;
    try {
      actual = unescape(text);
    } catch (const ComError& error) {
      actual = u"error " + asciiText(std::to_string(error.number()));
    }
    ASSERT_EQ(actual, expected) << toUtf8(text);
    // In place: the same text, or the same error with the text untouched.
    Text inPlace = u"padding " + text;
    try {
      unescapeInPlace(inPlace);
      ASSERT_EQ(inPlace, u"padding " + expected) << toUtf8(text);
    } catch (const ComError& error) {
      ASSERT_EQ(u"error " + asciiText(std::to_string(error.number())), expected);
      ASSERT_EQ(inPlace, u"padding " + text);
    }
  }
}

TEST(XmlEscapingTest, ReachableByNameThroughTheEscapingClass) {
  const auto escaper = CreateObject(u"DroQbXml.clsXmlStringEscaping");
  EXPECT_EQ(escaper->call(u"XMLEscape", {Variant(u"AB&CD"), Variant(3)}).toText(), u"AB");
  EXPECT_EQ(escaper->call(u"XMLEscape", {Variant(u"ABCDEF"), Variant(u"3")}).toText(), u"");
  EXPECT_EQ(escaper->call(u"xmlescape", {Variant(u"<a>")}).toText(), u"&lt;a&gt;");
  EXPECT_EQ(escaper->call(u"XMLUnEscape", {Variant(u"&amp;lt;")}).toText(), u"&lt;");
}

}  // namespace
}  // namespace droqbxml
