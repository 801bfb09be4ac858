// What the stand-in does with the requests of a valid document: the lists and
// transactions of a company file, their add and query requests, and the response
// document QuickBooks would write.
#ifndef DROQBXML_SIMULATOR_REQUESTHANDLERS_HPP_
#define DROQBXML_SIMULATOR_REQUESTHANDLERS_HPP_

#include <string>

#include "simulator/CompanyFile.hpp"
#include "simulator/RequestDocument.hpp"

struct sqlite3;

namespace droqbxml::simulator {

// Creates the tables of lists and transactions and the data a new QuickBooks company
// holds (chart of accounts, sales tax codes, the sales tax item when sales tax is on).
// Called once by CompanyFile::create, inside its transaction.
void initializeCompanyData(sqlite3* db, const CompanySettings& settings);

// Answers every request of a document that readRequest accepted, each request in its own
// transaction, following the document's onError; returns the response document (UTF-8,
// LF line ends, as QuickBooks writes it).
std::string answerRequests(CompanyFile& company, const RequestDocument& document);

}  // namespace droqbxml::simulator

#endif  // DROQBXML_SIMULATOR_REQUESTHANDLERS_HPP_
