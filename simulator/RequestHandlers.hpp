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

namespace handlers {
class StatementCache;
}  // namespace handlers

// Creates the tables of lists and transactions and the data a new QuickBooks company
// holds (chart of accounts, sales tax codes, the sales tax item when sales tax is on).
// Called once by CompanyFile::create, inside its transaction.
void initializeCompanyData(sqlite3* db, const CompanySettings& settings);

// Answers every request of a document that readRequest accepted, each request in its own
// transaction, following the document's onError; returns the response document (UTF-8,
// LF line ends, as QuickBooks writes it). A document with onError="rollbackOnError" or a
// qbXML version QuickBooks does not know is refused as QuickBooks refuses it: a ComError
// 0x80040400, nothing answered.
// Times written (TimeCreated, TimeModified, EditSequence, the ListID and TxnID suffixes,
// default dates) come from the present moment in local time, or, when the environment
// variable DROQBXML_SIMULATOR_NOW holds a date and time such as "2009-03-02T10:40:23-05:00",
// from that moment with that offset (for tests and reproducible demonstrations).
std::string answerRequests(CompanyFile& company, const RequestDocument& document);

namespace handlers {
// answerRequests for a session: `kept` holds statements prepared on `company`'s connection and
// kept between documents (without them the document's statements are prepared for it alone),
// and the response document is written into `response` in place of what it held, so that one
// text's room serves every response.
void answerRequests(CompanyFile& company, const RequestDocument& document, StatementCache* kept,
                    std::string& response);
}  // namespace handlers

}  // namespace droqbxml::simulator

#endif  // DROQBXML_SIMULATOR_REQUESTHANDLERS_HPP_
