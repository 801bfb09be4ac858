// The stand-in's request processing: a new company's lists, and a document's requests routed
// to their handlers one by one, each in its own transaction, following the document's
// onError: stopOnError ends at the first request refused with an error, continueOnError goes
// on, rollbackOnError QuickBooks refuses as a parse error.
#include "simulator/RequestHandlers.hpp"

#include <array>
#include <string_view>

#include "droqbxml/connection/RequestProcessor.hpp"
#include "droqbxml/runtime/ComError.hpp"
#include "simulator/handlers/Clock.hpp"
#include "simulator/handlers/Handlers.hpp"
#include "simulator/handlers/Store.hpp"

namespace droqbxml::simulator {
namespace {

using handlers::Answer;
using handlers::Handler;

struct Route {
  std::string_view request;
  Handler handler;
};

constexpr std::array<Route, 30> kRoutes{{
    {"CustomerAddRq", handlers::addCustomer},
    {"CustomerQueryRq", handlers::queryCustomers},
    {"AccountAddRq", handlers::addAccount},
    {"AccountQueryRq", handlers::queryAccounts},
    {"ItemServiceAddRq", handlers::addItem},
    {"ItemNonInventoryAddRq", handlers::addItem},
    {"ItemOtherChargeAddRq", handlers::addItem},
    {"ItemInventoryAddRq", handlers::addItem},
    {"ItemDiscountAddRq", handlers::addItem},
    {"ItemSubtotalAddRq", handlers::addItem},
    {"ItemGroupAddRq", handlers::addItem},
    {"ItemPaymentAddRq", handlers::addItem},
    {"ItemSalesTaxAddRq", handlers::addItem},
    {"ItemSalesTaxGroupAddRq", handlers::addItem},
    {"ItemQueryRq", handlers::queryItems},
    {"ItemServiceQueryRq", handlers::queryItems},
    {"ItemNonInventoryQueryRq", handlers::queryItems},
    {"ItemOtherChargeQueryRq", handlers::queryItems},
    {"ItemInventoryQueryRq", handlers::queryItems},
    {"ItemDiscountQueryRq", handlers::queryItems},
    {"ItemSubtotalQueryRq", handlers::queryItems},
    {"ItemGroupQueryRq", handlers::queryItems},
    {"ItemPaymentQueryRq", handlers::queryItems},
    {"ItemSalesTaxQueryRq", handlers::queryItems},
    {"ItemSalesTaxGroupQueryRq", handlers::queryItems},
    {"PayrollItemWageQueryRq", handlers::queryPayrollItemWages},
    {"EstimateAddRq", handlers::addEstimate},
    {"EstimateQueryRq", handlers::queryEstimates},
    {"InvoiceAddRq", handlers::addInvoice},
    {"InvoiceQueryRq", handlers::queryInvoices},
}};

Handler handlerFor(std::string_view request) {
  for (const Route& route : kRoutes) {
    if (route.request == request) return route.handler;
  }
  return nullptr;
}

// QuickBooks' answer to a document it will not process: no response at all.
[[noreturn]] void refuseDocument() {
  raiseError(static_cast<int32_t>(0x80040400u), Text(kRequestProcessorProgId),
             u"QuickBooks found an error when parsing the provided XML text stream.");
}

}  // namespace

void initializeCompanyData(sqlite3* db, const CompanySettings& settings) {
  handlers::createTables(db);
  handlers::Store store(db);
  handlers::addStandardLists(store, settings, handlers::currentTime());
}

std::string answerRequests(CompanyFile& company, const RequestDocument& document) {
  const XmlNode* messages = document.root.child("QBXMLMsgsRq");
  if (messages == nullptr) refuseDocument();
  const std::string onError = messages->attribute("onError").value_or("stopOnError");
  if (onError == "rollbackOnError") refuseDocument();
  for (const XmlNode& request : messages->children) {
    if (handlerFor(request.name) == nullptr) refuseDocument();
  }

  handlers::Store store(company.db());
  handlers::Context context(company, store, handlers::QbxmlVersion::parse(document.qbxmlVersion));
  std::string answers;
  for (const XmlNode& request : messages->children) {
    context.now = handlers::currentTime();
    std::string text;
    bool refused = false;
    try {
      company.inTransaction(
          [&] { text = handlers::writeAnswer(handlerFor(request.name)(context, request), store); });
    } catch (const handlers::Refusal& refusal) {
      context.forgetLookups();
      Answer answer = handlers::answerTo(request);
      answer.status = refusal.status();
      text = handlers::writeAnswer(answer, store);
      refused = refusal.status().isError();
    }
    store.resetStatements();
    answers += text;
    if (refused && onError == "stopOnError") break;
  }
  return handlers::responseDocument(answers);
}

}  // namespace droqbxml::simulator
