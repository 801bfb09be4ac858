// Reading through an IndexedResponse gives exactly what reading the plain text gives: every
// result, every value, every error, on random batches where optional elements, self-closed
// forms and attributes come and go (so unbounded searches reach into later responses).
#include <gtest/gtest.h>

#include <random>

#include "droqbxml/records/DroAccount.hpp"
#include "droqbxml/records/DroCustomer.hpp"
#include "droqbxml/records/DroInvoice.hpp"
#include "droqbxml/records/DroInvoiceLine.hpp"
#include "droqbxml/records/IndexedResponse.hpp"
#include "droqbxml/records/internal/TextSearch.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

class RandomBatch {
 public:
  explicit RandomBatch(unsigned seed) : random_(seed) {}

  Text make(int responses) {
    Text text = u"<QBXML><QBXMLMsgsRs>";
    for (int i = 0; i < responses; ++i) {
      const Text id = asciiText(std::to_string(i + 2));
      switch (random_() % 3) {
        case 0:
          text += u"<CustomerQueryRs requestID=\"" + id + u"\"><CustomerRet>" + header() +
                  maybe(u"CompanyName") + maybe(u"Phone") + maybe(u"Mobile") +
                  maybe(u"BillAddress", maybe(u"Addr1") + maybe(u"City")) +
                  maybe(u"Balance", u"12.50") + maybe(u"JobStatus", u"Closed") +
                  u"</CustomerRet></CustomerQueryRs>";
          break;
        case 1:
          text += u"<AccountQueryRs requestID=\"" + id + u"\"><AccountRet>" + header() +
                  maybe(u"AccountType", u"Bank") + maybe(u"Desc") + maybe(u"Balance", u"12.50") +
                  u"</AccountRet></AccountQueryRs>";
          break;
        default:
          text += u"<InvoiceAddRs requestID=\"" + id + u"\"><InvoiceAddRet>" +
                  maybe(u"TxnID", u"T-" + id) + maybe(u"TxnDate", u"2026-11-25") + lines() +
                  u"</InvoiceAddRet></InvoiceAddRs>";
      }
    }
    return text + u"</QBXMLMsgsRs></QBXML>";
  }

 private:
  Text header() {
    return often(u"ListID", u"80-1") + often(u"TimeCreated", u"2026-11-25T08:00:00") +
           often(u"TimeModified", u"2026-11-25T08:00:00") + often(u"EditSequence", u"7") +
           often(u"Name") + often(u"FullName") + often(u"IsActive", u"true") +
           often(u"Sublevel", u"0");
  }
  Text lines() {
    Text text;
    for (auto count = random_() % 4; count > 0; --count) {
      text += u"<InvoiceLineRet>" + maybe(u"TxnLineID", u"L") +
              maybe(u"ItemRef", maybe(u"ListID", u"I-1") + maybe(u"FullName")) + maybe(u"Desc") +
              maybe(u"Quantity", u"2") + maybe(u"Amount", u"3.00") + u"</InvoiceLineRet>";
    }
    return text;
  }
  // The element with a value, empty, self-closed (with or without the blank), with an
  // attribute, or absent; after blanks, sometimes more than a read looks past.
  Text maybe(const Text& tag, const Text& value = {}) { return form(tag, value, random_() % 7); }
  // A header element: mostly plain, so that most reads get past the header.
  Text often(const Text& tag, const Text& value = {}) {
    return form(tag, value, random_() % 8 == 0 ? random_() % 7 : 5);
  }
  // Values default to one of their own, so a value read from the wrong element shows.
  Text form(const Text& tag, const Text& value, unsigned kind) {
    const Text own = value.empty() ? u"v" + asciiText(std::to_string(++made_)) : value;
    const Text lead = blanks();
    return lead + element(tag, own, kind);
  }
  Text blanks() {
    static const Text kBlanks[] = {u"", u"\r\n", u"\n\t", Text(70, u' ')};
    return kBlanks[random_() % 4];
  }
  Text element(const Text& tag, const Text& value, unsigned form) {
    switch (form) {
      case 0:
        return u"<" + tag + u"></" + tag + u">";
      case 1:
        return u"<" + tag + u"/>";
      case 2:
        return u"<" + tag + u" />";
      case 3:
        return u"<" + tag + u" a=\"1\">" + value + u"</" + tag + u">";
      case 4:
        return {};
      default:
        return u"<" + tag + u">" + value + u"</" + tag + u">";
    }
  }

  std::mt19937 random_;
  int made_ = 0;
};

// What a read left behind: its result and the record's values, or the error it raised.
template <class Record, class Value>
Text readWith(const Value& value, int32_t start) {
  Record record;
  try {
    Text seen = asciiText(std::to_string(record.ParseRs(value, start)));
    for (size_t i = 0; i < record.fieldSpecs().size(); ++i) seen += u"|" + record.fieldValue(i);
    if constexpr (std::is_same_v<Record, DroCustomer>) seen += record.PrintOut();
    if constexpr (std::is_same_v<Record, DroInvoice>) {
      for (int32_t i = 1; i <= record.InvoiceLines()->Count(); ++i) {
        seen += record.InvoiceLines()->Item(Variant(i))->PrintOut();
      }
    }
    return seen;
  } catch (const ComError& error) {
    return u"error " + error.description();
  }
}

TEST(IndexedResponseTest, ReadsExactlyWhatThePlainTextReads) {
  for (const unsigned seed : {1u, 2u, 3u}) {
    const Text text = RandomBatch(seed).make(400);
    ASSERT_GT(text.size(), 20000u);  // long enough for a plain read to index it too
    const IndexedResponse indexed(text);
    // The batch with one name changed throughout, its index read from in between: what that
    // index shows of the record's names must not answer for this text.
    Text renamed = text;
    for (size_t at = renamed.find(u"<Phone"); at != Text::npos; at = renamed.find(u"<Phone", at)) {
      renamed[at + 5] = u'f';
    }
    const IndexedResponse other(renamed);
    std::mt19937 random(seed);
    for (int round = 0; round < 300; ++round) {
      const auto start = static_cast<int32_t>(random() % (text.size() + 2));
      readWith<DroCustomer>(other, start);
      const Text customer = readWith<DroCustomer>(text, start);
      ASSERT_EQ((readWith<DroCustomer>(indexed, start)), customer) << seed << " " << start;
      {
        // Under a scope over another text every search is a literal one: no index answers.
        const Text elsewhere(u"x");
        const internal::SearchScope blocking(elsewhere);
        ASSERT_EQ((readWith<DroCustomer>(text, start)), customer) << seed << " " << start;
      }
      ASSERT_EQ((readWith<DroAccount>(indexed, start)), (readWith<DroAccount>(text, start)));
      ASSERT_EQ((readWith<DroInvoice>(indexed, start)), (readWith<DroInvoice>(text, start)));
    }
  }
}

}  // namespace
}  // namespace droqbxml
