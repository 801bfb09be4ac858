// The error object: storing, carrying over and raising errors, by type and by name.
#include <gtest/gtest.h>

#include "droqbxml/component/ClassFactory.hpp"
#include "droqbxml/component/basGlobals.hpp"
#include "droqbxml/diagnostics/clsMyErr.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

using test::raises;

ErrorRecord sampleRecord() {
  ErrorRecord record;
  record.Number = 53;
  record.Source = u"Host.Open";
  record.Description = u"File not found";
  record.HelpFile = u"help.chm";
  record.HelpContext = 1234;
  record.LastDllError = 2;
  return record;
}

TEST(clsMyErrTest, RaiseStoresTheGivenValuesOverThePreviousOnes) {
  clsMyErr err;
  EXPECT_TRUE(
      raises([&] { err.Raise(Variant::missing(), TYPE_DATE, u"A.B", u"bad", u"first.chm", u"7"); },
             TYPE_DATE, u"A.B", u"bad"));
  // Left-out values keep the previous error's.
  EXPECT_TRUE(
      raises([&] { err.Raise(Variant::missing(), TYPE_BOOL, Variant::missing(), u"worse"); },
             TYPE_BOOL, u"A.B", u"worse"));
  EXPECT_EQ(err.HelpFile(), u"first.chm");
  EXPECT_EQ(err.HelpContext(), u"7");
  // Number 0 stores and returns without raising.
  err.Raise(Variant::missing(), 0, Variant::missing(), u"nothing wrong");
  EXPECT_EQ(err.Number(), 0);
  EXPECT_EQ(err.Description(), u"nothing wrong");
  // Nothing given: nothing stored, and with Number 0 nothing raised.
  err.Raise();
  EXPECT_EQ(err.Description(), u"nothing wrong");
}

TEST(clsMyErrTest, RecordsRaisedOrSetAndSetErrorInfoFromCleared) {
  clsMyErr err;
  // Raised with a record, the record's description is stored as the source too.
  EXPECT_TRUE(raises([&] { err.Raise(sampleRecord()); }, 53, u"File not found", u"File not found"));
  EXPECT_EQ(err.HelpContext(), u"1234");
  EXPECT_EQ(err.LastDllError(), 2);
  // SetErrorInfo and SetError start from a cleared error.
  err.SetErrorInfo(5, u"S", u"D", u"H", u"9");
  err.SetErrorInfo(Variant::missing(), u"Only.Source");
  EXPECT_EQ(err.Number(), 0);
  EXPECT_EQ(err.Source(), u"Only.Source");
  EXPECT_EQ(err.Description(), u"");
  err.SetErrorInfo(u"not a number", u"S");  // never raises
  EXPECT_EQ(err.Number(), 0);
  EXPECT_EQ(err.Source(), u"S");

  err.SetError(sampleRecord(), u"DroXmlSdkWrapper.SessionBegin");
  EXPECT_EQ(err.Number(), 53);
  EXPECT_EQ(err.Source(), u"DroXmlSdkWrapper.SessionBegin");
  EXPECT_EQ(err.Description(), u"File not found");
  EXPECT_EQ(err.HelpFile(), u"help.chm");
  EXPECT_EQ(err.HelpContext(), u"1234");
  EXPECT_TRUE(
      raises([&] { err.Raise(); }, 53, u"DroXmlSdkWrapper.SessionBegin", u"File not found"));
  err.Clear();
  EXPECT_EQ(err.record().Number, 0);
  EXPECT_EQ(err.HelpFile(), u"");
}

TEST(clsMyErrTest, ComponentErrorsGoThroughTheSharedObject) {
  EXPECT_TRUE(
      raises([] { raiseComponentError(PARING, u"X.Y", u"parse"); }, PARING, u"X.Y", u"parse"));
  const auto shared = basGlobals::SharedErrorObject();
  EXPECT_EQ(shared->Number(), static_cast<int32_t>(0x80044E34));
  EXPECT_EQ(shared->Source(), u"X.Y");
}

TEST(clsMyErrTest, ReachableByName) {
  const auto err = CreateObject(u"DroQbXml.clsMyErr");
  err->let(u"number", 12);
  err->let(u"Source", u"S");
  EXPECT_EQ(err->get(u"Number").toLong(), 12);
  EXPECT_TRUE(raises([&] { err->call(u"Raise", {Variant(), 7, u"A", u"B"}); }, 7, u"A", u"B"));
  const auto other = CreateObject(u"DroQbXml.clsMyErr");
  other->call(u"SetError", {Variant(err), u"New.Source"});
  EXPECT_EQ(other->get(u"Source").toText(), u"New.Source");
  EXPECT_EQ(other->get(u"Description").toText(), u"B");

  const auto numbers = CreateObject(u"DroQbXml.clsErrorNumbers");
  EXPECT_EQ(numbers->get(u"TYPE_QUNANTITY").toLong(), -2147201491);
  EXPECT_EQ(numbers->get(u"PARING").toLong(), numbers->get(u"TOO_MANY_OPEN_TRACE_FILES").toLong());
  EXPECT_EQ(numbers->get(u"CANT_ADD_TO_QB_ACCOUNT").toLong(), static_cast<int32_t>(0x80044E3B));
}

}  // namespace
}  // namespace droqbxml
