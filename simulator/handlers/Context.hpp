// What every request handler works with: the company file, its store, the company's settings,
// the moment the request is answered and the qbXML version it was written for, the response
// being written, plus the company's standing entries (sales tax codes, the default sales tax
// item, special accounts) looked up once per document.
#ifndef DROQBXML_SIMULATOR_HANDLERS_CONTEXT_HPP_
#define DROQBXML_SIMULATOR_HANDLERS_CONTEXT_HPP_

#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <utility>

#include "simulator/CompanyFile.hpp"
#include "simulator/handlers/Response.hpp"
#include "simulator/handlers/Store.hpp"

namespace droqbxml::simulator::handlers {

class Context {
 public:
  Context(CompanyFile& company, Store& store, QbxmlVersion version, std::string& response);

  CompanyFile& company;
  Store& store;
  const CompanySettings settings;
  const QbxmlVersion version;
  SchemaOrder order;      // for the records the document's answers write
  std::string& response;  // the response document written so far
  int64_t now = 0;        // set for each request

  // Writes `record` into the response as one of `answer`'s records.
  void add(Answer& answer, const Field& record);
  // The same for the record `aggregate` holding `fields` in its schema order (SchemaOrder), only
  // the fields named in `included` when it names any.
  void add(Answer& answer, std::string_view aggregate, const std::vector<Field>& fields,
           const std::vector<std::string>& included = {});
  // Makes room in the response for `records` more like the last one written: a long list's text
  // then grows once instead of being copied through every doubling on its way up.
  void expect(size_t records);
  // formatDateTime(time), remembered for the last time asked: the entries of a list come in
  // runs made in the same second.
  const std::string& dateTimeText(int64_t time);

  // The sales tax code of that name ("TAX", "NON"), if the company has it.
  std::optional<int64_t> salesTaxCode(std::string_view name);
  // Whether a sales tax code marks what it is set on as taxable.
  bool isTaxable(int64_t salesTaxCode);
  // The sales tax item a customer without one gets: the first active sales tax item.
  std::optional<int64_t> defaultSalesTaxItem();
  // The first account whose SpecialAccountType is `type` ("AccountsReceivable", ...).
  std::optional<int64_t> specialAccount(std::string_view type);
  // Drops what was looked up, after a request whose changes were rolled back.
  void forgetLookups();

 private:
  size_t lastRecord_ = 0;  // the length of the last record written
  std::optional<std::pair<int64_t, std::string>> lastDateTime_;
  std::map<std::string, std::optional<int64_t>> specialAccounts_;
  std::map<int64_t, bool> taxable_;
};

}  // namespace droqbxml::simulator::handlers

#endif  // DROQBXML_SIMULATOR_HANDLERS_CONTEXT_HPP_
