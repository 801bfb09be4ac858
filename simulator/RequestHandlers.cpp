// The stand-in's request processing: a new company's lists, and a document's requests routed
// to their handlers one by one, each in its own transaction, following the document's
// onError: stopOnError ends at the first request refused with an error, continueOnError goes
// on, rollbackOnError and an unknown qbXML version QuickBooks refuses as a parse error. A request
// type the stand-in does not model is answered as QuickBooks answers one it does not support.
#include "simulator/RequestHandlers.hpp"

#include <array>
#include <cstddef>
#include <optional>
#include <string_view>
#include <utility>

#include "droqbxml/connection/RequestProcessor.hpp"
#include "droqbxml/runtime/ComError.hpp"
#include "simulator/handlers/Clock.hpp"
#include "simulator/handlers/Handlers.hpp"
#include "simulator/handlers/Status.hpp"
#include "simulator/handlers/Store.hpp"
#include "simulator/internal/SchemaCheck.hpp"

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

// The status of the first value of request `index` that QuickBooks takes in and then
// refuses (3040, 3070), if any. The handlers check the values they use themselves, in
// their own order; this catches the rest, so that no such request succeeds.
std::optional<handlers::Status> valueRefusal(const RequestDocument& document, std::size_t index) {
  for (const ValueRefusal& refusal : document.refusals) {
    if (refusal.request != index) continue;
    if (refusal.kind == "text") return handlers::status::tooLong(refusal.value, refusal.field);
    return handlers::status::conversion(refusal.kind, refusal.value, refusal.field);
  }
  return std::nullopt;
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

void handlers::answerRequests(CompanyFile& company, const RequestDocument& document,
                              StatementCache* kept, std::string& response) {
  const XmlNode* messages = document.root.child("QBXMLMsgsRq");
  if (messages == nullptr) refuseDocument();
  const std::string onError = messages->attribute("onError").value_or("stopOnError");
  if (onError == "rollbackOnError") refuseDocument();
  // The reader refuses a version QuickBooks does not know; so does a document that got here
  // without it.
  if (!internal::isKnownVersion(document.qbxmlVersion)) refuseDocument();

  response.assign(handlers::kResponseStart);
  handlers::Store store(company.db(), kept);
  handlers::Context context(company, store, handlers::QbxmlVersion::parse(document.qbxmlVersion),
                            response);
  for (std::size_t index = 0; index < messages->children.size(); ++index) {
    const XmlNode& request = messages->children[index];
    context.now = handlers::currentTime();
    const std::size_t start = response.size();
    bool refused = false;
    try {
      const Handler handler = handlerFor(request.name);
      if (handler == nullptr) throw handlers::Refusal(handlers::status::unsupported());
      company.inTransaction([&] {
        const Answer answer = handler(context, request);
        if (auto status = valueRefusal(document, index)) {
          throw handlers::Refusal(std::move(*status));
        }
        handlers::finishAnswer(response, start, answer);
      });
    } catch (const handlers::Refusal& refusal) {
      context.forgetLookups();
      response.resize(start);
      Answer answer = handlers::answerTo(request);
      answer.status = refusal.status();
      handlers::finishAnswer(response, start, answer);
      refused = refusal.status().isError();
    }
    store.endRequest();
    if (refused && onError == "stopOnError") break;
  }
  response += handlers::kResponseEnd;
}

std::string answerRequests(CompanyFile& company, const RequestDocument& document) {
  std::string response;
  handlers::answerRequests(company, document, nullptr, response);
  return response;
}

}  // namespace droqbxml::simulator
