// Where the query requests the component writes depart from QuickBooks' qbXML 13.0 schema,
// as the stand-in's checks (the same as `droqbxml lint`) find them; the add requests' are in
// testdata/requests/add_requests_by_name.txt. The component keeps these requests as they
// are; a change to the builders that adds or removes a departure shows here.
#include <gtest/gtest.h>

#include "droqbxml/droqbxml.hpp"
#include "droqbxml/qbxml/DroXmlBuilder.hpp"
#include "droqbxml/runtime/Utf.hpp"
#include "simulator/RequestDocument.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

std::vector<std::string> problems(const Text& request) {
  std::vector<std::string> found;
  for (const auto& p : simulator::readRequest(toUtf8(request)).problems) {
    found.push_back(std::to_string(p.line) + " " + p.element + ": " + p.message);
  }
  return found;
}

TEST(SchemaDeparturesTest, QueryBuilders) {
  DroXmlBuilder builder;
  for (const auto entity : {udEtCustomer, udEtjob, udEtEstimate, udEtInvoice, udEtItem,
                            udEtItemNonInv, udEtItemOther, udEtAccount, udEtItemInv}) {
    builder.BuildQueryByAll(entity);
    EXPECT_EQ(problems(builder.XML()), std::vector<std::string>{}) << entity;
    builder.BuildQueryByListID(entity, u"80000001-1");
    EXPECT_EQ(problems(builder.XML()), std::vector<std::string>{}) << entity;
  }
  for (const auto entity : {udEtCustomer, udEtAccount, udEtItemInv}) {
    builder.BuildQueryByFullName(entity, u"X");
    EXPECT_EQ(problems(builder.XML()), std::vector<std::string>{}) << entity;
    builder.BuildQueryByActiveOrDate(entity, udAsAll, u"2024-01-01", u"2024-12-31");
    EXPECT_EQ(problems(builder.XML()), std::vector<std::string>{}) << entity;
  }
  // Transactions have no FullName, no ActiveStatus and their dates in a filter aggregate.
  builder.BuildQueryByFullName(udEtInvoice, u"X");
  EXPECT_EQ(problems(builder.XML()),
            std::vector<std::string>{
                "6 QBXML/QBXMLMsgsRq/InvoiceQueryRq/FullName: unknown element 'FullName' in "
                "InvoiceQueryRq"});
  builder.BuildQueryByActiveOrDate(udEtEstimate, udAsAll, u"2024-01-01", u"");
  const auto dated = problems(builder.XML());
  ASSERT_FALSE(dated.empty());
  EXPECT_EQ(dated.front(),
            "6 QBXML/QBXMLMsgsRq/EstimateQueryRq/ActiveStatus: unknown element 'ActiveStatus' in "
            "EstimateQueryRq");
}

}  // namespace
}  // namespace droqbxml
