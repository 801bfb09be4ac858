// DroXmlBuilder: whole request documents compared byte for byte with the golden files in
// testdata/requests, the frame's failure rules, the 16-bit counters and building by name
// (request names, item kinds, tolerated writes and the success test: in
// testdata/checks/element_and_builder_rules.txt).
#include <gtest/gtest.h>

#include <cstdint>
#include <filesystem>
#include <functional>
#include <string>

#include "droqbxml/component/ClassFactory.hpp"
#include "droqbxml/component/basGlobals.hpp"
#include "droqbxml/diagnostics/ErrorNumbers.hpp"
#include "droqbxml/diagnostics/clsMyErr.hpp"
#include "droqbxml/qbxml/DroXmlBuilder.hpp"
#include "droqbxml/runtime/Utf.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

using test::raises;
using test::raisesRuntime;

std::string golden(const std::string& name) {
  const auto path = std::filesystem::path(DROQBXML_TESTDATA_DIR) / "requests" / name;
  EXPECT_TRUE(std::filesystem::exists(path)) << path;
  return test::readFile(path);
}

std::string xml(const DroXmlBuilder& builder) { return toUtf8(builder.XML()); }

// The frame, with stopOnError by default and with rollbackOnError (OnError's alternatives:
// in testdata/checks/element_and_builder_rules.txt).
TEST(DroXmlBuilderTest, Frame) {
  DroXmlBuilder builder;
  builder.AddHeaders();
  builder.AddFooters();
  EXPECT_EQ(xml(builder), golden("frame.xml"));
  builder.Initialize();
  builder.OnError(u" rollbackOnError ");
  builder.AddHeaders();
  builder.AddFooters();
  EXPECT_EQ(xml(builder), golden("frame_rollback.xml"));
}

TEST(DroXmlBuilderTest, AddHeadersOutsideLevelOneRaisesDirectly) {
  const auto sharedError = basGlobals::SharedErrorObject();
  sharedError->Clear();
  const auto addHeadersFails = [](DroXmlBuilder& builder) {
    return raises([&] { builder.AddHeaders(); }, DRO_XML_PROCESSOR_IMPROPERLY_INITIONALIZED,
                  u"DroXmlProcessor.AddHeaders",
                  u"Could not assign XML header information because the DroXmlProcessor object "
                  u"has not been initialized properly prior to attempted use.");
  };
  DroXmlBuilder builder;
  builder.AddHeaders();
  const Text header = builder.XML();
  EXPECT_TRUE(addHeadersFails(builder));
  EXPECT_EQ(builder.XML(), header);
  builder.AddFooters();  // the level was left at 2: the footer still fits the header
  EXPECT_EQ(xml(builder), golden("frame.xml"));
  EXPECT_TRUE(addHeadersFails(builder));  // level 0 after the footer
  EXPECT_EQ(xml(builder), golden("frame.xml"));
  EXPECT_EQ(sharedError->Number(), 0);
  EXPECT_EQ(sharedError->Source(), u"");
}

TEST(DroXmlBuilderTest, QueryBuildersWriteWholeDocuments) {
  const struct {
    const char* file;
    std::function<void(DroXmlBuilder&)> build;
  } cases[] = {
      {"query_all_customer.xml", [](auto& b) { b.BuildQueryByAll(udEtCustomer); }},
      {"query_all_customer.xml", [](auto& b) { b.BuildQueryByAll(udEtItem); }},
      {"query_all_item_inventory.xml", [](auto& b) { b.BuildQueryByAll(udEtItemInv); }},
      {"query_fullname_item_service.xml",
       [](auto& b) { b.BuildQueryByFullName(udEtItem, u"Labor", Variant(int32_t{9})); }},
      {"query_fullname_unknown_item.xml",
       [](auto& b) { b.BuildQueryByFullName(udEtItem, u"Labor", Variant(int32_t{11})); }},
      {"query_fullname_account_escaped.xml",
       [](auto& b) { b.BuildQueryByFullName(udEtAccount, u" Tom's \"A&B\" <1>\tcaf\u00e9 "); }},
      {"query_listid_account.xml",
       [](auto& b) { b.BuildQueryByListID(udEtAccount, u" 80000001-1 "); }},
      {"query_active_customer_all_from.xml",
       [](auto& b) { b.BuildQueryByActiveOrDate(udEtCustomer, udAsAll, u"2004-01-01", u""); }},
      {"query_active_invoice_inactive_dates.xml",
       [](auto& b) {
         b.BuildQueryByActiveOrDate(udEtInvoice, udAsInactiveOnly, u"   ", u" 2004-12-31 ");
       }},
  };
  for (const auto& c : cases) {
    // Every builder starts its own document, whatever the builder held before.
    DroXmlBuilder builder;
    builder.OnError(u"continueOnError");
    builder.AddHeaders();
    builder.AddElementAggregateSimple(u"Left");
    builder.RequestIDUp();
    c.build(builder);
    EXPECT_EQ(xml(builder), golden(c.file)) << c.file;
    EXPECT_EQ(builder.RequestID(), 2) << c.file;
  }
}

TEST(DroXmlBuilderTest, ElementsAndAttributesAreWrittenAsGiven) {
  DroXmlBuilder b;
  b.AddElementSimple(u"Name", u"");
  b.AddElementSimple(u" Name ", u"A&B");
  b.AddElementSimple(u"Name", u"  ");
  b.AddElementSimple(u"Name", u"a\r\n\x01");
  auto elem = b.CreateElement(u"Rq", u"a&b");  // AddElement escapes nothing
  elem->AttributeAdd(u"q", u"say \"hi\"");
  elem->AttributeAdd(u"n", u"");
  b.AddElement(elem);
  auto unnamed = b.CreateElement(u"Rq");
  unnamed->AttributeAdd(u"", u"1");
  unnamed->AttributeAdd(u"n", u"2");
  b.AddElement(unnamed);  // first name empty: no attribute is written at all
  b.AddAggregateBegin(unnamed);
  b.AddAggregateEnd();
  EXPECT_TRUE(test::matchesGolden(b.XML(), "requests/elements_as_given.xml"));
  EXPECT_TRUE(raisesRuntime([&] { b.AddElement(nullptr); }, RuntimeError::kObjectNotSet));
  EXPECT_TRUE(raisesRuntime([&] { b.AddAggregateBegin(nullptr); }, RuntimeError::kObjectNotSet));
}

TEST(DroXmlBuilderTest, HugeTextWithEveryCodeUnitIsWrittenWhole) {
  Text value;
  for (int round = 0; round < 4; ++round) {
    for (uint32_t c = 0; c <= 0xFFFF; ++c) value.push_back(static_cast<char16_t>(c));
  }
  DroXmlBuilder b;
  b.BuildQueryByFullName(udEtCustomer, value);
  // The customer query by list id has the same frame: only the child element differs.
  Text expected = fromUtf8(golden("query_listid_account.xml"));
  const Text listId = u"\t\t\t<ListID>80000001-1</ListID>\r\n";
  expected.replace(expected.find(listId), listId.size(),
                   u"\t\t\t<FullName>" + b.XmlEscapeX(value) + u"</FullName>\r\n");
  EXPECT_TRUE(b.XML() == expected);  // not EXPECT_EQ: no megabyte-long message on failure
  EXPECT_FALSE(b.IsSuccessRs(b.XML(), u""));
}

TEST(DroXmlBuilderTest, TwelveNestedAggregatesCloseInReverseOrder) {
  DroXmlBuilder b;
  b.AddHeaders();
  for (int i = 1; i <= 12; ++i) {
    const std::string name = (i < 10 ? " Level0" : " Level") + std::to_string(i) + "  ";
    if (i % 2 == 0) {
      b.AddElementAggregateSimple(fromUtf8(name));
    } else {
      b.AddAggregateBegin(b.CreateElement(fromUtf8(name), u"ignored"));
    }
  }
  b.AddElementSimple(u"Leaf", u"x");
  for (int i = 0; i < 12; ++i) b.AddAggregateEnd();
  b.AddFooters();
  EXPECT_EQ(xml(b), golden("nested_twelve.xml"));
}

TEST(DroXmlBuilderTest, SixteenBitCountersOverflow) {
  // 32766 requests fit a document (numbered 2 to 32767); the next one overflows.
  DroXmlBuilder b;
  b.AddHeaders();
  for (int32_t n = 0; n < 32766; ++n) {
    b.RequestIDUp();
    auto request = b.CreateElement(u"CustomerQueryRq");
    request->AttributeAdd(u"requestID", asciiText(std::to_string(b.RequestID())));
    b.AddElement(request);
  }
  EXPECT_EQ(b.RequestID(), 32767);
  const size_t length = b.XML().size();
  EXPECT_TRUE(raisesRuntime([&] { b.RequestIDUp(); }, RuntimeError::kOverflow));
  EXPECT_EQ(b.RequestID(), 32767);
  EXPECT_EQ(b.XML().size(), length);
  EXPECT_NE(xml(b).find("\t\t<CustomerQueryRq requestID=\"32767\" />\r\n"), std::string::npos);
  b.BuildQueryByAll(udEtCustomer);
  EXPECT_EQ(xml(b), golden("query_all_customer.xml"));

  // The open-aggregate count is 16-bit too; footers keep the level (and the text) small.
  b.Initialize();
  for (int32_t n = 0; n < 32767; ++n) {
    if (n % 100 == 0) b.AddFooters();
    b.AddElementAggregateSimple(u"A");
  }
  EXPECT_TRUE(raisesRuntime([&] { b.AddElementAggregateSimple(u"A"); }, RuntimeError::kOverflow));
  b.AddAggregateEnd();
  EXPECT_EQ(xml(b).substr(xml(b).size() - 6), "</A>\r\n");
}

TEST(DroXmlBuilderTest, HostBuildsByNameAndNumbersRequestsFromTwo) {
  const Ref<Object> builder = CreateObject(u"DroQbXml.DroXmlBuilder");
  builder->call(u"BuildQueryByAll", {Variant(int32_t{udEtItemInv})});
  EXPECT_EQ(toUtf8(builder->get(u"XML").toText()), golden("query_all_item_inventory.xml"));
  builder->call(u"BuildQueryByFullName",
                {Variant(int32_t{udEtItem}), Variant(u"Labor"), Variant(u"9")});
  EXPECT_EQ(toUtf8(builder->get(u"XML").toText()), golden("query_fullname_item_service.xml"));

  // Two requests written element by element, element objects passed by name: the first
  // request of a document is numbered 2, the second 3.
  builder->call(u"Initialize");
  builder->let(u"OnError", Variant(u"continueOnError"));
  builder->call(u"AddHeaders");
  const Variant request = builder->call(u"CreateElement", {Variant(u"CustomerQueryRq")});
  builder->call(u"RequestIDUp");
  const Text id = builder->call(u"XmlEscapeX", {builder->get(u"RequestID")}).toText();
  request.toObject()->call(u"AttributeAdd", {Variant(u"requestID"), Variant(id)});
  builder->call(u"AddElement", {request});
  builder->call(u"RequestIDUp");
  const Ref<Object> account = CreateObject(u"DroQbXml.DroXmlElement");
  account->let(u"Name", Variant(u"AccountQueryRq"));
  account->call(u"AttributeAdd", {Variant(u"requestID"), Variant(u"3")});
  builder->call(u"AddAggregateBegin", {Variant(account)});
  builder->call(u"AddElementSimple", {Variant(u"ActiveStatus"), Variant(u"ActiveOnly")});
  builder->call(u"AddAggregateEnd");
  builder->call(u"AddFooters");
  EXPECT_EQ(toUtf8(builder->get(u"XML").toText()), golden("two_requests.xml"));

  EXPECT_TRUE(raisesRuntime([&] { builder->call(u"AddElement", {Variant(builder)}); },
                            RuntimeError::kTypeMismatch));
  EXPECT_TRUE(raisesRuntime([&] { builder->call(u"AddElement"); }, RuntimeError::kObjectNotSet));
}

}  // namespace
}  // namespace droqbxml
