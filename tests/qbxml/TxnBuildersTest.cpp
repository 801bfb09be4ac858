// The estimate and invoice add requests: whole documents against golden files, with and
// without bTaxable, an estimate with nothing set, and the builders by name.
#include <gtest/gtest.h>

#include "droqbxml/component/ClassFactory.hpp"
#include "droqbxml/qbxml/DroXmlBuilder.hpp"
#include "droqbxml/runtime/Binding.hpp"
#include "tests/TestSupport.hpp"
#include "tests/qbxml/TxnSamples.hpp"

namespace droqbxml {
namespace {

TEST(TxnBuildersTest, EachBuilderWritesItsDocument) {
  DroXmlBuilder builder;
  const auto estimate = test::estimateSample();
  builder.BuildAddEstimate(estimate);
  EXPECT_TRUE(test::matchesGolden(builder.XML(), "requests/estimate_add.xml"));
  builder.BuildAddEstimate(estimate, true);
  EXPECT_TRUE(test::matchesGolden(builder.XML(), "requests/estimate_add_taxable.xml"));
  EXPECT_EQ(estimate->RequestID(), u"2");
  const auto invoice = test::invoiceSample();
  builder.BuildAddInvoice(invoice);
  EXPECT_TRUE(test::matchesGolden(builder.XML(), "requests/invoice_add.xml"));
  builder.BuildAddInvoice(invoice, true);
  EXPECT_TRUE(test::matchesGolden(builder.XML(), "requests/invoice_add_taxable.xml"));
  builder.BuildAddEstimate(std::make_shared<DroEstimate>());
  EXPECT_TRUE(test::matchesGolden(builder.XML(), "requests/estimate_add_empty.xml"));
}

TEST(TxnBuildersTest, WhatStopsABuilder) {
  DroXmlBuilder builder;
  EXPECT_TRUE(
      test::raisesRuntime([&] { builder.BuildAddInvoice(nullptr); }, RuntimeError::kObjectNotSet));
  // A line whose item reference is nothing: 91 there, the document left unfinished.
  const auto invoice = test::invoiceSample();
  invoice->InvoiceLines()->Item(Variant(u"Labour"))->ItemRef(nullptr);
  EXPECT_TRUE(
      test::raisesRuntime([&] { builder.BuildAddInvoice(invoice); }, RuntimeError::kObjectNotSet));
  EXPECT_NE(builder.XML().find(u"<InvoiceLineAdd>"), Text::npos);
  EXPECT_EQ(builder.XML().find(u"</QBXML>"), Text::npos);
}

TEST(TxnBuildersTest, ReachableByName) {
  const auto builder = CreateObject(u"DroQbXml.DroXmlBuilder");
  const auto estimate = CreateObject(u"DroQbXml.DroEstimate");
  const auto line = estimate->get(u"EstimateLines").toObject()->call(u"Add").toObject();
  line->get(u"SalesTaxCodeRef").toObject()->let(u"FullName", u"Tax");
  builder->call(u"BuildAddEstimate", {Variant(estimate)});  // bTaxable left out: false
  EXPECT_NE(builder->get(u"XML").toText().find(u"<SalesTaxCodeRef>"), Text::npos);
  builder->call(u"BuildAddEstimate", {Variant(estimate), Variant(true)});
  EXPECT_EQ(builder->get(u"XML").toText().find(u"<SalesTaxCodeRef>"), Text::npos);
  EXPECT_EQ(estimate->get(u"RequestID").toText(), u"2");
  // The invoice builder takes invoices only.
  EXPECT_TRUE(test::raisesRuntime([&] { builder->call(u"BuildAddInvoice", {Variant(estimate)}); },
                                  RuntimeError::kTypeMismatch));
}

}  // namespace
}  // namespace droqbxml
