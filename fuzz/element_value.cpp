// getElementValue and findInResponse on arbitrary text, with names taken from the text's own
// tags (or odd ones: empty, longer than the stack buffer) and cursors that chain from one
// read to the next as the records' reads do, or jump anywhere. The same reads run three
// ways: on the plain text, inside a search scope over the text (which remembers far
// searches and builds its own tag index) and through an IndexedResponse; all three must
// give the same values, positions and errors. A text may be repeated past the length from
// which a read indexes it.
#include <fuzzer/FuzzedDataProvider.h>

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "droqbxml/records/IndexedResponse.hpp"
#include "droqbxml/records/basCommonProcs.hpp"
#include "droqbxml/records/internal/TextSearch.hpp"
#include "fuzz/FuzzSupport.hpp"

namespace droqbxml::fuzz {
namespace {

enum class Cursor : uint8_t { FromEnd, FromStart, Given };

struct Read {
  bool find = false;  // findInResponse instead of getElementValue
  size_t name = 0;    // which name: a tag of the text, or one of the odd ones
  bool required = false;
  Cursor cursor = Cursor::FromEnd;
  int32_t given = 0;
};

// The names of the start tags in the text ("<" up to ">", "/" or a blank).
std::vector<Text> tagNames(const Text& text) {
  std::vector<Text> names;
  for (size_t at = text.find(u'<'); at != Text::npos && names.size() < 256;
       at = text.find(u'<', at + 1)) {
    const size_t end = text.find_first_of(u"> /<", at + 1);
    names.push_back(text.substr(at + 1, (end == Text::npos ? text.size() : end) - at - 1));
  }
  return names;
}

Text nameOf(const std::vector<Text>& tags, size_t choice) {
  switch (choice % (tags.size() + 3)) {
    case 0:
      return {};
    case 1:
      return Text(70, u'N');  // past the tags' room on the stack
    case 2:
      return u"/";
    default:
      return tags[choice % (tags.size() + 3) - 3];
  }
}

// Every read in turn on `text`, in words, one line each.
Text readAll(const Text& text, const std::vector<Text>& tags, const std::vector<Read>& reads) {
  Text log;
  int32_t start = 1;
  int32_t end = 1;
  for (const Read& read : reads) {
    if (read.cursor == Cursor::FromStart) end = start;
    if (read.cursor == Cursor::Given) end = read.given;
    const Text name = nameOf(tags, read.name);
    log += outcomeOf([&] {
      if (read.find) {
        return number(basCommonProcs::findInResponse(end, text, name));
      }
      const Text value =
          basCommonProcs::getElementValue(text, name, start, end, read.required, u"<P>");
      return value + u" start " + number(start) + u" end " + number(end);
    });
    log += u'\n';
  }
  return log;
}

}  // namespace
}  // namespace droqbxml::fuzz

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  using namespace droqbxml;
  using namespace droqbxml::fuzz;
  FuzzedDataProvider in(data, size);
  std::vector<Read> reads(in.ConsumeIntegralInRange<size_t>(1, 6));
  for (Read& read : reads) {
    read.find = in.ConsumeIntegralInRange<int>(0, 7) == 0;
    read.name = in.ConsumeIntegral<uint16_t>();
    read.required = in.ConsumeBool();
    read.cursor = static_cast<Cursor>(in.ConsumeIntegralInRange<int>(0, 2));
    read.given = in.ConsumeBool() ? in.ConsumeIntegral<int32_t>()
                                  : in.ConsumeIntegralInRange<int32_t>(-1, 400);
  }
  const bool longer = in.ConsumeIntegralInRange<int>(0, 3) == 0;
  const Text text = lengthened(fromUtf8(in.ConsumeRemainingBytesAsString()), longer);

  const std::vector<Text> tags = tagNames(text);
  const Text plain = readAll(text, tags, reads);
  Text scoped;
  {
    const internal::SearchScope scope(text);
    scoped = readAll(text, tags, reads);
  }
  const IndexedResponse response(text);
  Text indexed;
  response.read([&](const Text& same) {
    indexed = readAll(same, tags, reads);
    return 0;
  });
  requireSame(plain, scoped, "reads inside a search scope give what the plain text gives");
  requireSame(plain, indexed, "reads through an IndexedResponse give what the plain text gives");
  return 0;
}
