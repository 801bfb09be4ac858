// The account record: reading a real account response, its dump that opens with "False", and
// the account collection (finding its own response and its setter limits: in the tables
// testdata/records/parse_by_name.txt and setters_by_name.txt).
#include <gtest/gtest.h>

#include "droqbxml/component/ClassFactory.hpp"
#include "droqbxml/diagnostics/ErrorNumbers.hpp"
#include "droqbxml/records/DroAccount.hpp"
#include "droqbxml/records/DroAccountCol.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

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
