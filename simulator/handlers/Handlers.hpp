// The request handlers: one function per supported request, each answering one request
// element inside its own transaction. A request QuickBooks refuses raises a Refusal.
#ifndef DROQBXML_SIMULATOR_HANDLERS_HANDLERS_HPP_
#define DROQBXML_SIMULATOR_HANDLERS_HANDLERS_HPP_

#include "simulator/CompanyFile.hpp"
#include "simulator/RequestDocument.hpp"
#include "simulator/handlers/Context.hpp"
#include "simulator/handlers/Response.hpp"

namespace droqbxml::simulator::handlers {

using Handler = Answer (*)(Context& context, const XmlNode& request);

// Lists (Lists.cpp). The item handlers take the item kind from the request's name.
Answer addCustomer(Context& context, const XmlNode& request);
Answer queryCustomers(Context& context, const XmlNode& request);
Answer addAccount(Context& context, const XmlNode& request);
Answer queryAccounts(Context& context, const XmlNode& request);
Answer addItem(Context& context, const XmlNode& request);
Answer queryItems(Context& context, const XmlNode& request);
Answer queryPayrollItemWages(Context& context, const XmlNode& request);

// Transactions (Transactions.cpp).
Answer addEstimate(Context& context, const XmlNode& request);
Answer queryEstimates(Context& context, const XmlNode& request);
Answer addInvoice(Context& context, const XmlNode& request);
Answer queryInvoices(Context& context, const XmlNode& request);

// The entries a new company holds: the chart of accounts, the sales tax codes and, with sales
// tax on, a sales tax item (Lists.cpp).
void addStandardLists(Store& store, const CompanySettings& settings, int64_t now);

// What every answer starts from: the response element's name ("...Rs") and the request's
// requestID, status OK.
Answer answerTo(const XmlNode& request);

}  // namespace droqbxml::simulator::handlers

#endif  // DROQBXML_SIMULATOR_HANDLERS_HANDLERS_HPP_
