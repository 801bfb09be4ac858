// getElementValue: its window for self-closing tags, its unbounded forward search, its
// cursor, its empty-element error, and the literal search under it.
#include <gtest/gtest.h>

#include <random>

#include "droqbxml/diagnostics/ErrorNumbers.hpp"
#include "droqbxml/records/basCommonProcs.hpp"
#include "droqbxml/records/internal/TagIndex.hpp"
#include "droqbxml/records/internal/TextSearch.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

using basCommonProcs::getElementValue;

struct Scan {
  Text value;
  int32_t start;
  int32_t end;
};

Scan scan(const Text& text, const Text& name, int32_t cursor, bool required = false) {
  int32_t start = -1;
  int32_t end = cursor;
  Text value = getElementValue(text, name, start, end, required, u"<CustomerRet>");
  return {value, start, end};
}

TEST(basCommonProcsTest, ReadsContentAndMovesTheCursorToTheEndTag) {
  const Text text = u"<a><Memo>x &amp; y</Memo><Memo>z</Memo></a>";
  const Scan first = scan(text, u"Memo", 1);
  EXPECT_EQ(first.value, u"x &amp; y");  // no unescaping
  EXPECT_EQ(first.start, 10);
  EXPECT_EQ(first.end, 19);
  const Scan second = scan(text, u"Memo", first.end);
  EXPECT_EQ(second.value, u"z");
  // Absent: StartPoint takes the cursor, EndPoint stays.
  const Scan absent = scan(text, u"Other", 5);
  EXPECT_EQ(absent.value, u"");
  EXPECT_EQ(absent.start, 5);
  EXPECT_EQ(absent.end, 5);
  // Case-sensitive, and a start tag with attributes is not the element.
  EXPECT_EQ(scan(u"<listid>1</listid>", u"ListID", 1).value, u"");
  EXPECT_EQ(scan(u"<ListID a=\"1\">1</ListID>", u"ListID", 1).value, u"");
}

TEST(basCommonProcsTest, SelfClosingTagsCountOnlyWithinTheWindow) {
  for (const Text& tag : {Text(u"<Memo/>"), Text(u"<Memo />")}) {
    const Scan near = scan(u"ab" + tag + u"<Memo>later</Memo>", u"Memo", 1, true);
    EXPECT_EQ(near.value, u"");  // no error although required
    EXPECT_EQ(near.start, 3);
    EXPECT_EQ(near.end, static_cast<int32_t>(tag.size()) + 1);
  }
  // 120 characters away the empty form is missed and the later element is taken.
  const Text far = Text(120, u' ') + u"<Memo/><Memo>later</Memo>";
  EXPECT_EQ(scan(far, u"Memo", 1).value, u"later");
  // The tag must lie wholly inside the 100 characters.
  const Text straddling = Text(96, u' ') + u"<Memo/><Memo>later</Memo>";
  EXPECT_EQ(scan(straddling, u"Memo", 1).value, u"later");
}

TEST(basCommonProcsTest, EmptyRequiredOrUnclosedElements) {
  const auto error = [](const Text& text) {
    return test::raises([&] { scan(text, u"ListID", 1, true); }, PARING,
                        u"DroQbXml.basCommonProcs.getElementValue",
                        u"The response returned a an empty '<CustomerRet><ListID>'.\r\n"
                        u"This element is not allowed to be empty.");
  };
  EXPECT_TRUE(error(u"<ListID></ListID>"));
  EXPECT_TRUE(error(u"<Name>x</Name>"));
  EXPECT_EQ(scan(u"<ListID></ListID>", u"ListID", 1).end, 9);
  const Scan open = scan(u"<Name>cut off", u"Name", 1);
  EXPECT_EQ(open.value, u"");
  EXPECT_EQ(open.end, 0);
  EXPECT_TRUE(test::raisesRuntime([&] { scan(u"<Name>cut off", u"Other", open.end); },
                                  RuntimeError::kInvalidProcedureCall));
}

TEST(basCommonProcsTest, SearchFindsWhatALiteralSearchFinds) {
  std::mt19937 random(7);
  // Tags whose keys collide (same length and ends), attributes, self-closed and bare tags,
  // and text that is not XML.
  const std::u16string_view pieces[] = {
      u"<A>",  u"</A>", u"<B>",  u"</B>", u"<A",          u">",        u"x",      u"<",
      u"<A><", u"<B/>", u"AB",   u"\r\n", u"<AxB>",       u"<AyB>",    u"<A >",   u"< A>",
      u"<!A>", u"<?A>", u"<<A>", u"<A/>", u"<A b=\"1\">", u"<\u00e9>", u"<AxB/>", u"<>"};
  Text text;
  while (text.size() < 100000) text += pieces[random() % std::size(pieces)];
  const Text other = text.substr(1);
  const internal::TagIndex index(text);
  const internal::TagIndex narrow(text, false);  // SSE2 only, where the first may use AVX2
  std::vector<uint32_t> hints;                   // notes of the searches made with them
  // Inside a read's scope too (which indexes the text once its searches have gone far), with
  // cursors that go back as well as forward, and for a text the scope is not over.
  const internal::SearchScope scope(text);
  for (int round = 0; round < 2000; ++round) {
    const size_t from = random() % (text.size() + 10);
    for (const TextView pattern :
         {TextView(u"<A>"), TextView(u"</B>"), TextView(u"<B/>"), TextView(u"<C>"),
          TextView(u"A><"), TextView(u"<"), TextView(u"<AxB>"), TextView(u"<AyB>"),
          TextView(u"<AzB>"), TextView(u"<A >"), TextView(u"<A b=\"1\">"), TextView(u"<\u00e9>"),
          TextView(u"/>")}) {
      const size_t expected = text.find(pattern, from);
      ASSERT_EQ(internal::findForward(text, pattern, from), expected)
          << round << " " << toUtf8(Text(pattern));
      ASSERT_EQ(internal::SearchScope::find(text, pattern, from), expected);
      ASSERT_EQ(internal::SearchScope::find(other, pattern, from), other.find(pattern, from));
      for (const internal::TagIndex* scan : {&index, &narrow}) {
        if (internal::TagIndex::covers(pattern) && from <= text.size()) {
          ASSERT_EQ(scan->find(pattern, from, scan == &narrow ? &hints : nullptr), expected)
              << toUtf8(Text(pattern));
        }
        if (pattern == internal::TagIndex::kSelfClose) {
          ASSERT_EQ(scan->findSelfClose(from), expected);
        }
      }
    }
    // A tag near the cursor is found as the literal search finds it, else not at all.
    const size_t window = 1 + round % 80;
    for (const bool closing : {false, true}) {
      for (const TextView name : {TextView(u"A"), TextView(u"AxB"), TextView(u"")}) {
        const size_t literal = text.find((closing ? u"</" : u"<") + Text(name) + u">", from);
        const size_t near = internal::findTagNear(text, from, window, name, closing);
        ASSERT_EQ(near, literal < from + window ? literal : Text::npos) << from << " " << window;
      }
    }
  }
  {
    // A read whose first far search is "/>" has the text indexed by it.
    const Text far = Text(20000, u'x') + u"<B/><A>x</A>";
    const internal::SearchScope farScope(far);
    ASSERT_EQ(internal::SearchScope::find(far, u"/>", 3), far.find(u"/>"));
    ASSERT_EQ(internal::SearchScope::find(far, u"/>", 20003), Text::npos);
    ASSERT_EQ(internal::SearchScope::find(far, u"<A>", 5), far.find(u"<A>"));
  }
  EXPECT_FALSE(internal::TagIndex::covers(u"<A b=\"1\">"));
  EXPECT_FALSE(internal::TagIndex::covers(u"<B/>"));
  EXPECT_TRUE(internal::TagIndex::covers(u"<A >"));
  // A bracket anywhere in a name of any length (the check takes four or eight units at a
  // time).
  for (size_t length = 1; length < 20; ++length) {
    const Text name(length, u'=');
    EXPECT_TRUE(internal::TagIndex::covers(u"<" + name + u">"));
    for (size_t at = 0; at < length; ++at) {
      for (const char16_t bracket : {u'<', u'>'}) {
        Text odd = name;
        odd[at] = bracket;
        EXPECT_FALSE(internal::TagIndex::covers(u"<" + odd + u">")) << toUtf8(odd);
      }
    }
  }
  // "/>" and tags at every offset of the index's blocks, across their boundaries too.
  for (size_t k = 0; k < 80; ++k) {
    const Text shifted = Text(k, u'x') + u"/>" + Text(k % 37, u'y') + u"<A>z</A><A>";
    for (const bool wide : {true, false}) {
      const internal::TagIndex at(shifted, wide);
      ASSERT_EQ(at.findSelfClose(0), shifted.find(u"/>")) << k;
      for (size_t from = 0; from <= shifted.size(); ++from) {
        ASSERT_EQ(at.find(u"<A>", from), shifted.find(u"<A>", from)) << k;
        ASSERT_EQ(internal::findTagNear(shifted, from, 64, u"A", false),
                  shifted.find(u"<A>", from) < from + 64 ? shifted.find(u"<A>", from) : Text::npos);
      }
    }
  }
  // Matches at every offset near the end, where the wide comparison hands over.
  for (size_t size = 2; size < 40; ++size) {
    const Text tail = Text(size - 2, u'x') + u"<A";
    for (size_t from = 0; from <= size; ++from) {
      ASSERT_EQ(internal::findForward(tail, u"<A", from), tail.find(u"<A", from)) << size;
    }
  }
}

// The self-closed forms as first found, each '<' of the window in turn: the reference for
// the search from the window's "/>"s.
int32_t referenceSelfClosedStart(const Text& text, const Text& name, int32_t cursor) {
  const TextView window = TextView(text).substr(static_cast<size_t>(cursor - 1), 100);
  size_t spaced = Text::npos;
  for (size_t at = window.find(u'<'); at != TextView::npos; at = window.find(u'<', at + 1)) {
    const TextView rest = window.substr(at + 1);
    if (!rest.starts_with(name)) continue;
    if (rest.substr(name.size()).starts_with(u"/>")) return static_cast<int32_t>(cursor + at);
    if (spaced == Text::npos && rest.substr(name.size()).starts_with(u" />")) spaced = at;
  }
  return spaced == Text::npos ? 0 : static_cast<int32_t>(cursor + spaced);
}

TEST(basCommonProcsTest, SelfClosedFormsAreFoundAsEachLessThanSignWouldFindThem) {
  std::mt19937 random(11);
  const TextView pieces[] = {u"<A/>", u"<A />", u"<AB/>", u"<A>", u"</A>", u"x",
                             u" ",    u"/>",    u"<",     u"A",   u"<A",   u"<A  />"};
  for (int round = 0; round < 5000; ++round) {
    Text text;
    for (auto count = random() % 40; count > 0; --count)
      text += pieces[random() % std::size(pieces)];
    const auto cursor = static_cast<int32_t>(1 + random() % (text.size() + 1));
    const int32_t expected = referenceSelfClosedStart(text, u"A", cursor);
    const Scan found = scan(text, u"A", cursor);
    // Else the start tag's search, from the cursor.
    const size_t open = text.find(u"<A>", static_cast<size_t>(cursor - 1));
    const int32_t searched = open == Text::npos ? cursor : static_cast<int32_t>(open + 4);
    ASSERT_EQ(found.start, expected != 0 ? expected : searched) << toUtf8(text) << " " << cursor;
  }
}

// A response assigned into the string that held the last one keeps its buffer and, here, its
// length and both ends: the second read must see the second text.
TEST(basCommonProcsTest, EachSearchSeesTheTextAsItIsNow) {
  const Text padding(40000, u' ');
  const Text first = u"<Phone>1</Phone>" + padding + u"<Mobile>x</Mobile>" + padding;
  const Text second = u"<Phone>1</Phone>" + padding + u"<Pager>yyy</Pager>" + padding;
  ASSERT_EQ(first.size(), second.size());
  Text text = first;
  int32_t start = 0;
  int32_t end = 1;
  EXPECT_EQ(getElementValue(text, u"Mobile", start, end, false, u""), u"x");
  text = second;  // same buffer, same length, same ends
  end = 1;
  EXPECT_EQ(getElementValue(text, u"Pager", start, end, false, u""), u"yyy");
  end = 1;
  EXPECT_EQ(getElementValue(text, u"Mobile", start, end, false, u""), u"");
  text[20] = u'<';  // changed in place
  text.replace(21, 6, u"Fax>2<");
  text.replace(27, 6, u"/Fax> ");
  end = 1;
  EXPECT_EQ(getElementValue(text, u"Fax", start, end, true, u""), u"2");
}

}  // namespace
}  // namespace droqbxml
