// The account record: reading real and made-up account responses, finding its own response,
// its dump that opens with "False", and the account collection (setter limits: in
// testdata/records/setters_by_name.txt).
#include <gtest/gtest.h>

#include "droqbxml/component/ClassFactory.hpp"
#include "droqbxml/diagnostics/ErrorNumbers.hpp"
#include "droqbxml/records/DroAccount.hpp"
#include "droqbxml/records/DroAccountCol.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

Text accountRs(const Text& id, const Text& body) {
  return u"<AccountQueryRs requestID=\"" + id + u"\" statusCode=\"0\"><AccountRet>" + body +
         u"</AccountRet></AccountQueryRs>";
}
const Text kHeader =
    u"<ListID>1-1</ListID><TimeCreated>t</TimeCreated><TimeModified>t</TimeModified>"
    u"<EditSequence>9</EditSequence><Name>Bank</Name><FullName>Bank</FullName>"
    u"<IsActive>true</IsActive>";

TEST(DroAccountTest, ReadsARealQueryResponse) {
  const Text response = test::sharedResponse("qbxml-gem__account_query_rs.xml");
  if (response.empty()) GTEST_SKIP() << "shared responses not found";
  DroAccount account;
  EXPECT_EQ(account.ParseRs(response), 1);  // the start, not the cursor
  EXPECT_EQ(account.ListID(), u"80000020-1209525941");
  EXPECT_EQ(account.TimeCreated(), u"2008-04-29T23:25:41-05:00");
  EXPECT_EQ(account.EditSequence(), u"1209525941");
  EXPECT_EQ(account.FullName(), u"Checking");
  EXPECT_EQ(account.Sublevel(), u"0");
  EXPECT_EQ(account.AccountType(), u"Bank");
  // Absent from the first account, so taken from the second one (the search is unbounded),
  // and the balances after it with it.
  EXPECT_EQ(account.AccountNumber(), u"11000");
  EXPECT_EQ(account.Desc(), u"Unpaid or unapplied customer ");
  EXPECT_EQ(account.Balance(), u"951.65");
  EXPECT_TRUE(account.ParentRef()->IsEmpty());
  EXPECT_TRUE(test::matchesGolden(account.PrintOut(), "records/account_checking.txt"));
}

TEST(DroAccountTest, FindsItsOwnResponse) {
  const Text response = accountRs(u"8", kHeader + u"<Sublevel>0</Sublevel>");
  DroAccount account;
  EXPECT_EQ(account.ParseRs(u"<AccountQueryRs requestID=\"2\"/>"), 0);  // no "<AccountRet>"
  EXPECT_EQ(account.ParseRs(u"<AccountRet><ListID>1</ListID>", 1), 1);  // no "requestID="
  account.RequestID(u"7");
  const int32_t closingQuote = static_cast<int32_t>(response.find(u"\" status")) + 1;
  EXPECT_EQ(account.ParseRs(response, -3), closingQuote);
  EXPECT_EQ(account.ListID(), u"");
  account.RequestID(u"8");
  EXPECT_EQ(account.ParseRs(response, 0), 1);
  EXPECT_EQ(account.ListID(), u"1-1");
  DroAccount any;  // RequestID "" reads any response
  EXPECT_EQ(any.ParseRs(response), 1);
  EXPECT_EQ(any.Name(), u"Bank");
}

TEST(DroAccountTest, MissingSublevelRaisesAfterTheHeaderWasRead) {
  DroAccount account;
  EXPECT_TRUE(test::raises([&] { account.ParseRs(accountRs(u"2", kHeader)); }, PARING,
                           u"DroQbXml.basCommonProcs.getElementValue",
                           u"The response returned a an empty '<AccountRet><Sublevel>'.\r\n"
                           u"This element is not allowed to be empty."));
  EXPECT_EQ(account.IsActive(), u"true");
}

TEST(DroAccountTest, TheFreshDumpOpensWithFalse) {
  EXPECT_TRUE(test::matchesGolden(DroAccount().PrintOut(), "records/account_new.txt"));
}

// Every record collection is one template: this one stands for the customers' too.
TEST(DroAccountColTest, CollectsRecordsByPositionOrKey) {
  const auto col = CreateObject(u"DroQbXml.DroAccountCol");
  const auto first = col->call(u"Add").toObject();
  const auto bank = std::make_shared<DroAccount>();
  EXPECT_EQ(col->call(u"Add", {Variant(u"B"), Variant(bank)}).toObject(), bank);
  EXPECT_EQ(col->get(u"Count").toLong(), 2);
  EXPECT_EQ(col->call(u"Item", {Variant(1)}).toObject(), first);
  EXPECT_EQ(col->call(u"Item", {Variant(u"b")}).toObject(), bank);
  EXPECT_TRUE(test::raisesRuntime([&] { col->call(u"Item", {Variant(u"1")}); },
                                  RuntimeError::kInvalidProcedureCall));  // text is a key
  EXPECT_TRUE(test::raisesRuntime([&] { col->call(u"Add", {Variant(u"B")}); },
                                  RuntimeError::kDuplicateKey));
  EXPECT_EQ(col->get(u"Count").toLong(), 2);
  // NewEnum gives an enumerator over a snapshot, as For Each sees it.
  const auto each = col->call(u"NewEnum").toObject();
  col->call(u"Remove", {Variant(u"B")});
  EXPECT_EQ(each->call(u"Next").toObject(), first);
  EXPECT_EQ(each->call(u"Next").toObject(), bank);
  EXPECT_TRUE(each->call(u"Next").isEmpty());
  EXPECT_TRUE(test::raisesRuntime([&] { col->call(u"Item", {Variant(2)}); },
                                  RuntimeError::kInvalidProcedureCall));
  col->call(u"Remove", {Variant(1)});
  EXPECT_EQ(col->get(u"Count").toLong(), 0);
  const auto account = CreateObject(u"DroQbXml.DroAccount");
  account->get(u"ParentRef").toObject()->let(u"FullName", u"Assets");
  EXPECT_NE(account->get(u"PrintOut").toText().find(u"FullName\r\n\tAssets"), Text::npos);
}

}  // namespace
}  // namespace droqbxml
