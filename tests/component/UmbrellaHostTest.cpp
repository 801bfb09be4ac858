// A host that includes the umbrella header and nothing else of the library: every public
// class is there, and the calls a C++ host writes naturally compile as written.
#include <gtest/gtest.h>

#include <tuple>

#include "droqbxml/droqbxml.hpp"
#include "tests/TestSupport.hpp"

namespace {

using namespace droqbxml;

TEST(UmbrellaHostTest, EveryPublicClassIsDeclared) {
  // One default-constructed object of every public class.
  std::tuple<DroXmlProcessor, DroCustomer, DroCustomerCol, DroAccount, DroAccountCol,
             DroItemNonInventory, DroItemSubtotal, DroItemInventory, DroItemDiscount, DroItemGroup,
             DroItemGroupLineCol, DroItemOtherCharge, DroItemPayment, DroPaymentMethod,
             DroItemSalesTax, DroItemSalesTaxGroup, DroItemService, DroItemPayrollItemWage,
             DroItemsCol, DroSalesOrPurchase, DroSalesAndPurchase, DroObjRef, DroClassRef,
             DroAddress, DroXmlElement, DroEstimate, DroEstimateLine, DroEstimateLineCol,
             DroEstimateLineGroup, DroEstimateLineGroupCol, DroInvoice, DroInvoiceLine,
             DroInvoiceLineCol, DroInvoiceLineGroup, DroInvoiceLineGroupCol, clsXmlStringEscaping,
             clsAppPathAccess, clsTrace>
      every;
  EXPECT_EQ(std::get<DroXmlProcessor>(every).XML()->className(), u"DroXmlBuilder");
  EXPECT_EQ(std::get<DroXmlProcessor>(every).API()->className(), u"DroXmlSdkWrapper");
  EXPECT_EQ(CreateObject(u"DroQbXml.basValidations")->className(), u"basValidations");
}

TEST(UmbrellaHostTest, NaturalCallsCompile) {
  const Text text = u"<CustomerRet><ListID>1</ListID></CustomerRet>";
  int32_t s = 0;
  int32_t e = 1;
  EXPECT_EQ(basCommonProcs::getElementValue(text, u"ListID", s, e, true, u"<CustomerRet>"), u"1");
  EXPECT_EQ(basValidations::CheckINTTYPE(u"7", 2, 10, 1), u"7");
  EXPECT_EQ(basValidations::CheckSTRTYPE(Text(40, u'x'), 31, true), Text(31, u'x'));
  clsMyErr err;
  err.Raise(Variant::missing(), 0);  // number 0: nothing to raise
  EXPECT_TRUE(test::raises([&] { err.Raise(Variant::missing(), TYPE_DATE, u"A.B", u"bad"); },
                           TYPE_DATE, u"A.B", u"bad"));
}

}  // namespace
