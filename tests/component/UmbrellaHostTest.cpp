// A host that includes the umbrella header and nothing else of the library: every public
// class is there, and the calls a C++ host writes naturally compile as written.
#include <gtest/gtest.h>

#include "droqbxml/droqbxml.hpp"
#include "tests/TestSupport.hpp"

namespace {

using namespace droqbxml;

TEST(UmbrellaHostTest, EveryPublicClassIsDeclared) {
  DroXmlProcessor facade;
  DroCustomer customer;
  DroCustomerCol customers;
  DroAccount account;
  DroAccountCol accounts;
  DroItemNonInventory nonInventory;
  DroItemSubtotal subtotal;
  DroItemInventory inventory;
  DroItemDiscount discount;
  DroItemGroup group;
  DroItemGroupLineCol lines;
  DroItemOtherCharge otherCharge;
  DroItemPayment payment;
  DroPaymentMethod method;
  DroItemSalesTax tax;
  DroItemSalesTaxGroup taxGroup;
  DroItemService service;
  DroItemPayrollItemWage wage;
  DroItemsCol items;
  DroSalesOrPurchase salesOrPurchase;
  DroSalesAndPurchase salesAndPurchase;
  DroObjRef reference;
  DroClassRef classRef;
  DroAddress address;
  DroXmlElement element;
  DroEstimate estimate;
  DroEstimateLine estimateLine;
  DroEstimateLineCol estimateLines;
  DroEstimateLineGroup estimateGroup;
  DroEstimateLineGroupCol estimateGroups;
  DroInvoice invoice;
  DroInvoiceLine invoiceLine;
  DroInvoiceLineCol invoiceLines;
  DroInvoiceLineGroup invoiceGroup;
  DroInvoiceLineGroupCol invoiceGroups;
  clsXmlStringEscaping escaping;
  clsAppPathAccess path;
  clsTrace trace;
  EXPECT_EQ(facade.XML()->className(), u"DroXmlBuilder");
  EXPECT_EQ(facade.API()->className(), u"DroXmlSdkWrapper");
  EXPECT_EQ(CreateObject(u"DroQbXml.basValidations")->className(), u"basValidations");
}

TEST(UmbrellaHostTest, NaturalCallsCompile) {
  const Text text = u"<CustomerRet><ListID>1</ListID></CustomerRet>";
  int32_t s = 0;
  int32_t e = 1;
  EXPECT_EQ(basCommonProcs::getElementValue(text, u"ListID", s, e, true, u"<CustomerRet>"), u"1");
  EXPECT_EQ(basValidations::CheckINTTYPE(u"7", 2, 10, 1), u"7");
  EXPECT_TRUE(test::raisesRefusal([] { basValidations::CheckINTTYPE(u"15", 2, 10, 1); }, TYPE_INT,
                                  u"CheckINTTYPE", u"15", u"INTTYPE"));
  const Text v = Text(40, u'x');
  EXPECT_TRUE(test::raisesRefusal([&] { basValidations::CheckSTRTYPE(v, 31, false); }, TYPE_STRING,
                                  u"CheckSTRTYPE", v, u"STRTYPE"));
  clsMyErr err;
  err.Raise(Variant::missing(), 0);  // number 0: nothing to raise
  EXPECT_TRUE(test::raises([&] { err.Raise(Variant::missing(), TYPE_DATE, u"A.B", u"bad"); },
                           TYPE_DATE, u"A.B", u"bad"));
}

}  // namespace
