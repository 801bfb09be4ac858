// Records written into the response, and the company's standing entries, looked up when first
// needed.
#include "simulator/handlers/Context.hpp"

#include <algorithm>
#include <iterator>

#include "simulator/handlers/Catalog.hpp"
#include "simulator/handlers/Clock.hpp"

namespace droqbxml::simulator::handlers {

Context::Context(CompanyFile& company, Store& store, QbxmlVersion version, std::string& response)
    : company(company),
      store(store),
      settings(company.settings()),
      version(version),
      order(version),
      response(response) {}

void Context::add(Answer& answer, const Field& record) {
  const size_t start = response.size();
  writeRecord(response, record, store);
  lastRecord_ = response.size() - start;
  ++answer.count;
}

void Context::add(Answer& answer, std::string_view aggregate, const std::vector<Field>& fields,
                  const std::vector<std::string>& included) {
  const size_t start = response.size();
  const std::vector<size_t>& places = order.places(aggregate, fields);
  if (included.empty()) {
    writeRecord(response, aggregate, fields, places, store);
  } else {
    std::vector<size_t> kept;
    std::copy_if(places.begin(), places.end(), std::back_inserter(kept), [&](size_t at) {
      return std::find(included.begin(), included.end(), fields[at].name) != included.end();
    });
    writeRecord(response, aggregate, fields, kept, store);
  }
  lastRecord_ = response.size() - start;
  ++answer.count;
}

void Context::expect(size_t records) {
  // A quarter more, as records differ in length.
  response.reserve(response.size() + records * lastRecord_ / 4 * 5);
}

const std::string& Context::dateTimeText(int64_t time) {
  if (!lastDateTime_ || lastDateTime_->first != time) {
    lastDateTime_.emplace(time, formatDateTime(time));
  }
  return lastDateTime_->second;
}

std::optional<int64_t> Context::salesTaxCode(std::string_view name) {
  return store.findByFullName(ListTable::SalesTaxCodes, name);
}

bool Context::isTaxable(int64_t salesTaxCode) {
  const auto found = taxable_.find(salesTaxCode);
  if (found != taxable_.end()) return found->second;
  const auto record = store.list(ListTable::SalesTaxCodes, salesTaxCode);
  const bool taxable = record && fieldText(record->fields, "IsTaxable") == "true";
  taxable_.emplace(salesTaxCode, taxable);
  return taxable;
}

std::optional<int64_t> Context::defaultSalesTaxItem() {
  Statement& row =
      store.statement("SELECT id FROM items WHERE kind = ? AND is_active = 1 ORDER BY id LIMIT 1");
  row.bind(1, int64_t{static_cast<int>(ItemKind::SalesTax)});
  if (!row.step()) return std::nullopt;
  return row.integer(0);
}

std::optional<int64_t> Context::specialAccount(std::string_view type) {
  const auto found = specialAccounts_.find(std::string(type));
  if (found != specialAccounts_.end()) return found->second;
  std::optional<int64_t> account;
  Statement& rows = store.statement("SELECT id, fields FROM accounts ORDER BY id");
  while (!account && rows.step()) {
    if (fieldText(decodeFields(rows.blob(1)), "SpecialAccountType") == type) {
      account = rows.integer(0);
    }
  }
  specialAccounts_.emplace(std::string(type), account);
  return account;
}

void Context::forgetLookups() {
  specialAccounts_.clear();
  taxable_.clear();
  store.forgetLookups();
}

}  // namespace droqbxml::simulator::handlers
