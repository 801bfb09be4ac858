// What stops the estimate and invoice builders (their documents: in
// testdata/requests/add_requests_by_name.txt).
#include <gtest/gtest.h>

#include "droqbxml/qbxml/DroXmlBuilder.hpp"
#include "droqbxml/records/DroInvoice.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

TEST(TxnBuildersTest, WhatStopsABuilder) {
  DroXmlBuilder builder;
  EXPECT_TRUE(
      test::raisesRuntime([&] { builder.BuildAddInvoice(nullptr); }, RuntimeError::kObjectNotSet));
  // A line whose item reference is nothing: 91 there, the document left unfinished.
  const auto invoice = std::make_shared<DroInvoice>();
  invoice->CustomerRef()->FullName(u"Kim");
  invoice->InvoiceLines()->Add(u"Tile")->ItemRef()->FullName(u"Tile");
  invoice->InvoiceLines()->Add(u"Labour")->ItemRef(nullptr);
  EXPECT_TRUE(
      test::raisesRuntime([&] { builder.BuildAddInvoice(invoice); }, RuntimeError::kObjectNotSet));
  EXPECT_NE(builder.XML().find(u"<FullName>Tile</FullName>"), Text::npos);
  EXPECT_EQ(builder.XML().find(u"</QBXML>"), Text::npos);
}

}  // namespace
}  // namespace droqbxml
