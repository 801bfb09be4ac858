// Every record's ParseRs on arbitrary text from an arbitrary StartPoint, for a request
// identifier that is empty, "2", "3" or anything: the top-level records (customer, account,
// each item kind, estimate, invoice) and the parts they read with a cursor pair (lines, line
// groups and their collections, group item lines, addresses, references, the sales sides).
// Each read runs on the text and through an IndexedResponse of it, and the two must agree
// on the result, the error, the cursors and everything the record holds. A text may be
// repeated past the length from which a read indexes it. The customer-info readers and
// IsSuccessRs run on the same text.
#include <fuzzer/FuzzedDataProvider.h>

#include <array>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "droqbxml/qbxml/DroXmlBuilder.hpp"
#include "droqbxml/records/DroAccount.hpp"
#include "droqbxml/records/DroAddress.hpp"
#include "droqbxml/records/DroCustomer.hpp"
#include "droqbxml/records/DroCustomerCol.hpp"
#include "droqbxml/records/DroEstimate.hpp"
#include "droqbxml/records/DroInvoice.hpp"
#include "droqbxml/records/DroItemDiscount.hpp"
#include "droqbxml/records/DroItemGroup.hpp"
#include "droqbxml/records/DroItemGroupLine.hpp"
#include "droqbxml/records/DroItemGroupLineCol.hpp"
#include "droqbxml/records/DroItemInventory.hpp"
#include "droqbxml/records/DroItemPayment.hpp"
#include "droqbxml/records/DroItemPayrollItemWage.hpp"
#include "droqbxml/records/DroItemSalesTax.hpp"
#include "droqbxml/records/DroItemSalesTaxGroup.hpp"
#include "droqbxml/records/DroItemSubtotal.hpp"
#include "droqbxml/records/DroItemsCol.hpp"
#include "droqbxml/records/DroObjRef.hpp"
#include "droqbxml/records/DroSalesAndPurchase.hpp"
#include "droqbxml/records/DroSalesItems.hpp"
#include "droqbxml/records/DroSalesOrPurchase.hpp"
#include "droqbxml/records/IndexedResponse.hpp"
#include "droqbxml/records/Transaction.hpp"
#include "fuzz/FuzzSupport.hpp"

namespace droqbxml::fuzz {
namespace {

// What one input asks for besides the text.
struct Setup {
  int32_t start = 0;
  int32_t end = 0;
  Text requestId;
  Text name;  // the element name a part is read under
  bool required = false;
  int members = 0;  // of a sales tax group: sales tax items, then one inventory item
};

// Everything a record holds: its stored fields, its dump where it has one, its members,
// lines, line groups and a transaction's references and address.
template <class R>
Text dumpOf(const R& record) {
  Text dump;
  if constexpr (std::is_base_of_v<Record, R>) {
    for (size_t i = 0; i < record.fieldSpecs().size(); ++i) {
      dump += Text(record.fieldSpecs()[i].name) + u"=" + record.fieldValue(i) + u" ";
    }
  }
  if constexpr (requires { record.PrintOut(); }) {
    dump += u"\n" + outcomeOf([&] { return record.PrintOut(); });
  }
  if constexpr (requires { record.Count(); }) {
    dump += u"\n" + number(record.Count()) + u" members";
    for (const auto& member : record) dump += u"\n" + dumpOf(*member);
  }
  const auto add = [&](const auto& part) { dump += u"\n" + dumpOf(*part); };
  if constexpr (requires { record.EstimateLines(); }) add(record.EstimateLines());
  if constexpr (requires { record.InvoiceLines(); }) add(record.InvoiceLines());
  if constexpr (requires { record.EstimateLineGroups(); }) add(record.EstimateLineGroups());
  if constexpr (requires { record.InvoiceLineGroups(); }) add(record.InvoiceLineGroups());
  if constexpr (requires { record.ItemGroupLines(); }) add(record.ItemGroupLines());
  if constexpr (requires { record.CustomerMsgRef(); }) {
    add(record.CustomerRef());
    add(record.ClassRef());
    add(record.BillAddress());
    add(record.TermsRef());
    add(record.SalesRepRef());
    add(record.ItemSalesTaxRef());
    add(record.CustomerMsgRef());
    add(record.CustomerSalesTaxCodeRef());
  }
  return dump;
}

// A top-level record read from `value` (the text or its IndexedResponse).
template <class R, class Value>
Text readRecord(const Setup& setup, const Value& value) {
  R record;
  record.RequestID(setup.requestId);
  if constexpr (std::is_same_v<R, DroItemSalesTaxGroup>) {
    for (int i = 0; i < setup.members; ++i) record.ItemSalesTaxRefs()->Add(Variant(int32_t{7}));
    if (setup.members > 1) record.ItemSalesTaxRefs()->Add(Variant(int32_t{2}));
  }
  return outcomeOf([&] { return number(record.ParseRs(value, setup.start)); }) + u"\n" +
         dumpOf(record);
}

// A part read from the cursors, with what it leaves in them.
using PartRead = std::function<Text(const Setup&, const Text&, int32_t&, int32_t&)>;

template <class R, class Read>
PartRead part(Read read) {
  return [read](const Setup& setup, const Text& text, int32_t& start, int32_t& end) {
    R record;
    const Text outcome = outcomeOf([&] {
      read(record, setup, text, start, end);
      return Text();
    });
    return outcome + u"\n" + dumpOf(record);
  };
}

Text readPart(const PartRead& read, const Setup& setup, const Text& text) {
  int32_t start = setup.start;
  int32_t end = setup.end;
  const Text outcome = read(setup, text, start, end);
  return outcome + u"\nstart " + number(start) + u" end " + number(end);
}

template <class Line>
PartRead linePart() {
  return part<Line>([](Line& line, const Setup&, const Text& text, int32_t& start, int32_t& end) {
    line.ParseRs(text, start, end);
  });
}

template <TxnKind Kind>
PartRead groupsPart() {
  return part<DroTxnLineGroupCol<Kind>>([](DroTxnLineGroupCol<Kind>& groups, const Setup&,
                                           const Text& text, int32_t& start,
                                           int32_t& end) { readGroups(groups, text, start, end); });
}

template <class Side>
PartRead sidePart() {
  return part<Side>([](Side& side, const Setup& setup, const Text& text, int32_t& start,
                       int32_t& end) { side.ParseRs(setup.name, text, start, end, u"<P>"); });
}

const std::vector<PartRead>& parts() {
  static const std::vector<PartRead> all{
      linePart<DroEstimateLine>(),
      linePart<DroInvoiceLine>(),
      linePart<DroEstimateLineCol>(),
      linePart<DroInvoiceLineCol>(),
      linePart<DroEstimateLineGroup>(),
      linePart<DroInvoiceLineGroup>(),
      groupsPart<TxnKind::Estimate>(),
      groupsPart<TxnKind::Invoice>(),
      linePart<DroItemGroupLine>(),
      linePart<DroItemGroupLineCol>(),
      part<DroAddress>([](DroAddress& address, const Setup& setup, const Text& text, int32_t& start,
                          int32_t& end) { address.ParseRs(setup.name, text, start, end); }),
      part<DroObjRef>(
          [](DroObjRef& ref, const Setup& setup, const Text& text, int32_t& start, int32_t& end) {
            ref.ParseRs(setup.name, text, start, end, setup.required, u"<P>");
          }),
      sidePart<DroSalesOrPurchase>(),
      sidePart<DroSalesAndPurchase>(),
  };
  return all;
}

using RecordRead = std::function<Text(const Setup&, const Text&, bool indexed)>;

template <class R>
RecordRead record() {
  return [](const Setup& setup, const Text& text, bool indexed) {
    return indexed ? readRecord<R>(setup, IndexedResponse(text)) : readRecord<R>(setup, text);
  };
}

const std::vector<RecordRead>& records() {
  static const std::vector<RecordRead> all{
      record<DroCustomer>(),
      record<DroAccount>(),
      record<DroItemInventory>(),
      record<DroItemNonInventory>(),
      record<DroItemOtherCharge>(),
      record<DroItemService>(),
      record<DroItemDiscount>(),
      record<DroItemSubtotal>(),
      record<DroItemGroup>(),
      record<DroItemPayment>(),
      record<DroItemSalesTax>(),
      record<DroItemSalesTaxGroup>(),
      record<DroItemPayrollItemWage>(),
      record<DroEstimate>(),
      record<DroInvoice>(),
  };
  return all;
}

// The readers that take only the text: customer info and the success test.
void readOthers(const Setup& setup, const Text& text) {
  outcomeOf([&] { return number(DroCustomer().ParseCustInfo(text, setup.start)); });
  outcomeOf([&] { return number(DroCustomerCol().ParseCustInfo(text, setup.start)); });
  outcomeOf([&] { return number(DroCustomerCol().ParseCustInfoUnEscaped(text, setup.start)); });
  outcomeOf([&] { return number(DroXmlBuilder().IsSuccessRs(text, setup.requestId)); });
}

const std::array<Text, 6> kNames{u"ItemRef",     u"AccountRef",      u"BillAddress",
                                 u"ShipAddress", u"SalesOrPurchase", u""};

}  // namespace
}  // namespace droqbxml::fuzz

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  using namespace droqbxml;
  using namespace droqbxml::fuzz;
  FuzzedDataProvider in(data, size);
  const size_t which = in.ConsumeIntegral<uint8_t>();
  Setup setup;
  const bool far = in.ConsumeIntegralInRange<int>(0, 7) == 0;
  setup.start = far ? in.ConsumeIntegral<int32_t>() : in.ConsumeIntegralInRange<int32_t>(-2, 300);
  setup.end = far ? in.ConsumeIntegral<int32_t>() : in.ConsumeIntegralInRange<int32_t>(-2, 300);
  switch (in.ConsumeIntegralInRange<int>(0, 3)) {
    case 0:
      break;
    case 1:
      setup.requestId = u"2";
      break;
    case 2:
      setup.requestId = u"3";
      break;
    default:
      setup.requestId = fromUtf8(in.ConsumeRandomLengthString(12));
  }
  setup.name = kNames[in.ConsumeIntegralInRange<size_t>(0, kNames.size() - 1)];
  setup.required = in.ConsumeBool();
  setup.members = in.ConsumeIntegralInRange<int>(0, 2);
  const bool longer = in.ConsumeIntegralInRange<int>(0, 3) == 0;
  const Text text = lengthened(fromUtf8(in.ConsumeRemainingBytesAsString()), longer);

  const auto& all = records();
  const auto& some = parts();
  const size_t choice = which % (all.size() + some.size() + 1);
  if (choice < all.size()) {
    requireSame(all[choice](setup, text, false), all[choice](setup, text, true),
                "a record reads the same through an IndexedResponse as from the text");
  } else if (choice < all.size() + some.size()) {
    const PartRead& read = some[choice - all.size()];
    const IndexedResponse response(text);
    Text indexed;
    response.read([&](const Text& same) {
      indexed = readPart(read, setup, same);
      return 0;
    });
    requireSame(readPart(read, setup, text), indexed,
                "a part reads the same through an IndexedResponse as from the text");
  } else {
    readOthers(setup, text);
  }
  return 0;
}
