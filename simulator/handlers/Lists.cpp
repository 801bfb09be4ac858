// Customers and jobs, accounts and the ten item kinds: one add and one query path shared by
// every list, with each list's own rules (names, defaults, balances) kept in its ListKind and
// the completing function it names.
#include <algorithm>
#include <array>
#include <cstdint>
#include <map>
#include <set>

#include "simulator/handlers/Catalog.hpp"
#include "simulator/handlers/Clock.hpp"
#include "simulator/handlers/Handlers.hpp"
#include "simulator/handlers/Queries.hpp"
#include "simulator/handlers/Reading.hpp"
#include "simulator/handlers/Status.hpp"
#include "simulator/handlers/Values.hpp"

namespace droqbxml::simulator::handlers {
namespace {

// One list as the add and query paths see it.
struct ListKind {
  ListTable table;
  int kind;                 // the item kind, 0 for the other lists
  std::string_view stem;    // "Customer", "Account", "ItemService": names of the aggregates
  std::string_view object;  // the list entry in QuickBooks' messages
  std::string_view list;    // the list in QuickBooks' reference messages
  size_t nameLength;        // the longest Name QuickBooks takes
  // The list's own checks and defaults, before the entry is stored.
  void (*complete)(Context& context, ListRecord& record, const ListRecord* parent);
};

std::string retName(const ListKind& kind) { return std::string(kind.stem) + "Ret"; }

// Counts characters, not bytes: QuickBooks' lengths are in characters.
size_t characters(std::string_view utf8) {
  return static_cast<size_t>(
      std::count_if(utf8.begin(), utf8.end(), [](char c) { return (c & 0xC0) != 0x80; }));
}

void moveOpeningBalance(ListRecord& record) {
  const std::string balance = fieldText(record.fields, "OpenBalance");
  if (!balance.empty()) {
    record.openingBalance = parseNumber(balance, NumberKind::Amount).value_or(0);
  }
  removeField(record.fields, "OpenBalance");
  removeField(record.fields, "OpenBalanceDate");
}

// A new customer or job: sales tax settings from its customer, else the company's defaults;
// the job status QuickBooks gives one that has none.
void completeCustomer(Context& context, ListRecord& record, const ListRecord* parent) {
  moveOpeningBalance(record);
  if (context.settings.salesTax) {
    for (const std::string_view name : {"SalesTaxCodeRef", "ItemSalesTaxRef"}) {
      if (findField(record.fields, name) != nullptr) continue;
      const Field* inherited = parent != nullptr ? findField(parent->fields, name) : nullptr;
      if (inherited != nullptr) {
        record.fields.push_back(*inherited);
        continue;
      }
      const auto row =
          name == "SalesTaxCodeRef" ? context.salesTaxCode("TAX") : context.defaultSalesTaxItem();
      const ListTable table =
          name == "SalesTaxCodeRef" ? ListTable::SalesTaxCodes : ListTable::Items;
      if (row) record.fields.push_back(Field::reference(std::string(name), table, *row));
    }
  }
  if (findField(record.fields, "JobStatus") == nullptr) {
    record.fields.push_back(Field::value("JobStatus", "None"));
  }
}

// A new account: its type kept as the kind (the chart's order), its opening balance apart.
void completeAccount(Context&, ListRecord& record, const ListRecord*) {
  record.kind = accountTypeRank(fieldText(record.fields, "AccountType"));
  removeField(record.fields, "AccountType");
  moveOpeningBalance(record);
}

// A new item: the sales tax code items get, and the inventory figures QuickBooks keeps for an
// inventory part from the start.
void completeItem(Context& context, ListRecord& record, const ListRecord*) {
  const ItemKindInfo& info = itemKindInfo(static_cast<ItemKind>(record.kind));
  if (info.hasSalesTaxCode && context.settings.salesTax &&
      findField(record.fields, "SalesTaxCodeRef") == nullptr) {
    if (const auto tax = context.salesTaxCode("TAX")) {
      record.fields.push_back(Field::reference("SalesTaxCodeRef", ListTable::SalesTaxCodes, *tax));
    }
  }
  if (info.kind == ItemKind::Group && findField(record.fields, "IsPrintItemsInGroup") == nullptr) {
    record.fields.push_back(Field::value("IsPrintItemsInGroup", "false"));
  }
  if (info.kind == ItemKind::Inventory) {
    const auto number = [&](std::string_view name, NumberKind kind) {
      return parseNumber(fieldText(record.fields, name), kind);
    };
    const int64_t onHand = number("QuantityOnHand", NumberKind::Quantity).value_or(0);
    const int64_t cost = number("PurchaseCost", NumberKind::Price).value_or(0);
    const auto value = number("TotalValue", NumberKind::Amount);
    const int64_t average = value && onHand != 0 ? divide(*value, onHand) : cost;
    setField(record.fields, Field::value("PurchaseCost", formatNumber(cost, NumberKind::Price)));
    setField(record.fields,
             Field::value("QuantityOnHand", formatNumber(onHand, NumberKind::Quantity)));
    setField(record.fields, Field::value("AverageCost", formatNumber(average, NumberKind::Price)));
    setField(record.fields, Field::value("QuantityOnOrder", "0"));
    setField(record.fields, Field::value("QuantityOnSalesOrder", "0"));
  }
}

constexpr ListKind kCustomers{ListTable::Customers, 0,  "Customer",      "Customer",
                              "Customer",           41, completeCustomer};
constexpr ListKind kAccounts{ListTable::Accounts, 0,  "Account",      "Account",
                             "Account",           31, completeAccount};

// Items of one kind. Every kind keeps its entries in the one item list; a Ret aggregate is
// named after the entry's own kind, so this also serves queries over all kinds.
ListKind itemKind(ItemKind kind) {
  const ItemKindInfo& info = itemKindInfo(kind);
  return ListKind{ListTable::Items, static_cast<int>(kind), info.name, info.object, "Item", 31,
                  completeItem};
}

// The item kind a request is about: "ItemServiceAddRq" is about services.
ItemKind itemKindOfRequest(const XmlNode& request, std::string_view suffix) {
  std::string_view stem = request.name;
  stem.remove_suffix(suffix.size());
  return itemKindNamed(stem).value_or(ItemKind::Service);
}

// Balances of customers (their opening balances and open invoices) or accounts (opening
// balances, receivables and sales tax owed), each also summed over its ancestors.
class Balances {
 public:
  // A new entry's: nothing but its opening balance yet.
  static Balances ofNewEntry(const ListRecord& record) {
    Balances balances;
    balances.own_[record.id] = record.openingBalance;
    balances.total_[record.id] = record.openingBalance;
    return balances;
  }

  Balances(Context& context, ListTable table) {
    std::map<int64_t, int64_t> parents;
    Statement& rows = context.store.statement("SELECT id, parent, opening_balance FROM " +
                                              std::string(Store::tableName(table)));
    while (rows.step()) {
      if (!rows.isNull(1)) parents.emplace(rows.integer(0), rows.integer(1));
      if (rows.integer(2) != 0) own_[rows.integer(0)] += rows.integer(2) * kCent;
    }
    const std::string grouping = table == ListTable::Customers ? "customer" : "ar_account";
    Statement& invoices =
        context.store.statement("SELECT " + grouping + ", sum(balance) FROM invoices WHERE " +
                                grouping + " IS NOT NULL GROUP BY " + grouping);
    while (invoices.step()) own_[invoices.integer(0)] += invoices.integer(1) * kCent;
    if (table == ListTable::Accounts) {
      if (const auto payable = context.specialAccount("SalesTaxPayable")) {
        Statement& tax = context.store.statement("SELECT sum(sales_tax) FROM invoices");
        if (tax.step()) own_[*payable] += tax.integer(0) * kCent;
      }
    }
    for (const auto& [id, amount] : own_) {
      std::set<int64_t> seen;
      for (auto at = std::optional<int64_t>(id); at && seen.insert(*at).second;) {
        total_[*at] += amount;
        const auto parent = parents.find(*at);
        at = parent == parents.end() ? std::nullopt : std::optional<int64_t>(parent->second);
      }
    }
  }

  int64_t own(int64_t id) const { return valueOf(own_, id); }
  int64_t total(int64_t id) const { return valueOf(total_, id); }

 private:
  Balances() = default;

  static int64_t valueOf(const std::map<int64_t, int64_t>& values, int64_t id) {
    const auto found = values.find(id);
    return found == values.end() ? 0 : found->second;
  }

  std::map<int64_t, int64_t> own_;
  std::map<int64_t, int64_t> total_;
};

// A Ret aggregate: its name and its fields, not yet in schema order.
struct Ret {
  std::string name;
  std::vector<Field> fields;
};

// The Ret aggregate of a list entry: the list core, what the entry keeps, and what QuickBooks
// works out for it (balances, an account's type and cash-flow class).
Ret listRet(Context& context, const ListKind& kind, ListRecord record, const Balances* balances) {
  std::vector<Field> fields = std::move(record.fields);
  fields.reserve(fields.size() + Store::kRetRoom);  // what follows adds at most this many
  std::string name = record.fullName;
  if (record.parent) {
    const std::string& parentName = context.store.identity(kind.table, *record.parent).fullName;
    name = record.fullName.substr(std::min(record.fullName.size(), parentName.size() + 1));
    fields.push_back(Field::reference("ParentRef", kind.table, *record.parent));
  }
  appendValue(fields, "ListID", listIdText(record.id, record.created));
  appendValue(fields, "TimeCreated", context.dateTimeText(record.created));
  appendValue(fields, "TimeModified", context.dateTimeText(record.modified));
  appendValue(fields, "EditSequence", std::to_string(record.modified));
  appendValue(fields, "Name", std::move(name));
  appendValue(fields, "FullName", std::move(record.fullName));
  appendValue(fields, "IsActive", record.active ? "true" : "false");
  appendValue(fields, "Sublevel", std::to_string(record.sublevel));
  if (balances != nullptr) {
    appendValue(fields, "Balance", formatNumber(balances->own(record.id), NumberKind::Amount));
    appendValue(fields, "TotalBalance",
                formatNumber(balances->total(record.id), NumberKind::Amount));
  }
  if (kind.table == ListTable::Accounts) {
    const std::string_view type = accountTypeOfRank(record.kind);
    appendValue(fields, "AccountType", std::string(type));
    appendValue(fields, "CashFlowClassification", std::string(cashFlowClassification(type)));
  }
  return Ret{kind.table == ListTable::Items
                 ? std::string(itemKindInfo(static_cast<ItemKind>(record.kind)).name) + "Ret"
                 : retName(kind),
             std::move(fields)};
}

std::optional<Balances> balancesFor(Context& context, ListTable table) {
  if (table == ListTable::Items) return std::nullopt;
  return Balances(context, table);
}

Answer addEntry(Context& context, const XmlNode& request, const ListKind& kind) {
  Answer answer = answerTo(request);
  const XmlNode* add = request.child(std::string(kind.stem) + "Add");
  if (add == nullptr) return answer;
  checkNumbers(*add);

  const std::string name = childText(*add, "Name");
  if (characters(name) > kind.nameLength) throw Refusal(status::tooLong(name, "Name"));
  ListRecord record;
  record.kind = kind.kind;
  record.fullName = name;
  if (const XmlNode* active = add->child("IsActive")) record.active = isTrue(active->text);

  Target self{kind.table, kind.list, {}};
  if (kind.table == ListTable::Items) self.itemKinds = {static_cast<ItemKind>(kind.kind)};
  FieldReader reader(context, kind.object, self);
  reader.target("ItemRef", lineItems());
  if (kind.kind == static_cast<int>(ItemKind::SalesTaxGroup)) {
    reader.target("ItemSalesTaxRef", Target{ListTable::Items, "Item", {ItemKind::SalesTax}});
  }
  std::optional<ListRecord> parent;
  for (const XmlNode& child : add->children) {
    if (child.name == "Name" || child.name == "IsActive") continue;
    if (child.name == "ParentRef") {
      parent = context.store.list(kind.table, reader.resolve(child));
      if (!parent) continue;
      record.parent = parent->id;
      record.sublevel = parent->sublevel + 1;
      record.fullName = parent->fullName + ":" + name;
      continue;
    }
    record.fields.push_back(reader.read1(child));
  }
  kind.complete(context, record, parent ? &*parent : nullptr);
  if (context.store.findByFullName(kind.table, record.fullName)) {
    throw Refusal(status::nameInUse(record.fullName));
  }
  record.created = context.now;
  record.modified = context.now;
  context.store.insertList(kind.table, record);
  const Balances balances = Balances::ofNewEntry(record);
  const Ret ret = listRet(context, kind, std::move(record),
                          kind.table == ListTable::Items ? nullptr : &balances);
  context.add(answer, ret.name, ret.fields);
  return answer;
}

// The entries a query names by ListID or FullName, in the order named; the first name that
// does not exist is reported.
std::vector<ListRecord> namedEntries(Context& context, const XmlNode& request, ListTable table,
                                     const std::vector<int>& kinds,
                                     std::optional<std::string>& missing) {
  std::vector<ListRecord> records;
  for (const XmlNode& child : request.children) {
    if (child.name != "ListID" && child.name != "FullName") continue;
    const std::string value = latin1Text(child.text);
    const auto id = child.name == "ListID" ? context.store.findByListId(table, value)
                                           : context.store.findByFullName(table, value);
    auto record = id ? context.store.list(table, *id) : std::nullopt;
    if (record && !kinds.empty() &&
        std::find(kinds.begin(), kinds.end(), record->kind) == kinds.end()) {
      record.reset();
    }
    if (record) {
      records.push_back(std::move(*record));
    } else if (!missing) {
      missing = value;
    }
  }
  return records;
}

// The entries a query's filters select: a statement over them in the list's order, and how many
// they are.
struct Selection {
  Statement& rows;
  int64_t count;
};

Selection filteredEntries(Context& context, const XmlNode& request, ListTable table,
                          const std::vector<int>& kinds, const QueryFilter& filter) {
  Conditions conditions;
  if (!kinds.empty()) {
    std::string in;
    std::vector<Conditions::Value> values;
    for (const int kind : kinds) {
      in += in.empty() ? "?" : ", ?";
      values.emplace_back(int64_t{kind});
    }
    conditions.add("kind IN (" + in + ")", std::move(values));
  }
  const XmlNode* active = request.child("ActiveStatus");
  const std::string activeStatus = active != nullptr ? active->text : "ActiveOnly";
  if (activeStatus == "ActiveOnly") conditions.add("is_active = 1");
  if (activeStatus == "InactiveOnly") conditions.add("is_active = 0");
  filter.addTo(conditions);
  if (const XmlNode* nameFilter = request.child("NameFilter")) {
    const std::string name = likeEscaped(childText(*nameFilter, "Name"));
    const std::string criterion = childText(*nameFilter, "MatchCriterion");
    const std::string pattern = criterion == "StartsWith" ? name + "%"
                                : criterion == "EndsWith" ? "%" + name
                                                          : "%" + name + "%";
    conditions.add("full_name LIKE ? ESCAPE '\\'", {pattern});
  }
  if (const XmlNode* range = request.child("NameRangeFilter")) {
    if (const XmlNode* from = range->child("FromName")) {
      conditions.add("full_name >= ?", {latin1Text(from->text)});
    }
    if (const XmlNode* to = range->child("ToName")) {
      const std::string last = latin1Text(to->text);
      conditions.add("(full_name <= ? OR full_name LIKE ? ESCAPE '\\')",
                     {last, likeEscaped(last) + "%"});
    }
  }
  std::vector<Conditions::Value> types;
  std::string typeList;
  for (const XmlNode* type : request.childrenNamed("AccountType")) {
    typeList += typeList.empty() ? "?" : ", ?";
    types.emplace_back(int64_t{accountTypeRank(type->text)});
  }
  if (!types.empty()) conditions.add("kind IN (" + typeList + ")", std::move(types));

  const std::string from = " FROM " + std::string(Store::tableName(table)) + conditions.where();
  Statement& count = context.store.statement("SELECT count(*)" + from);
  conditions.bind(count);
  count.step();
  // Hierarchical order: a parent, then its children, then the next name ("A", "A:B", "A B").
  Statement& rows = context.store.statement(
      "SELECT " + std::string(Store::kListColumns) + from +
      (table == ListTable::Customers ? " ORDER BY " : " ORDER BY kind, ") +
      "replace(full_name, ':', char(1)) COLLATE NOCASE, id" + filter.limit());
  conditions.bind(rows);
  return {rows, std::min(count.integer(0), filter.maxReturned.value_or(INT64_MAX))};
}

Answer queryEntries(Context& context, const XmlNode& request, const ListKind& kind,
                    const std::vector<int>& kinds) {
  Answer answer = answerTo(request);
  const QueryFilter filter = QueryFilter::read(request);
  std::optional<std::string> missing;
  const bool named = request.child("ListID") != nullptr || request.child("FullName") != nullptr;
  const auto balances = balancesFor(context, kind.table);
  const auto add = [&](ListRecord record) {
    const Ret ret = listRet(context, kind, std::move(record), balances ? &*balances : nullptr);
    context.add(answer, ret.name, ret.fields, filter.includeRetElements);
  };
  if (named) {
    for (ListRecord& record : namedEntries(context, request, kind.table, kinds, missing)) {
      add(std::move(record));
    }
  } else {
    const Selection selection = filteredEntries(context, request, kind.table, kinds, filter);
    for (int64_t read = 0; selection.rows.step(); ++read) {
      add(Store::listRecord(selection.rows));
      if (read == 0) context.expect(static_cast<size_t>(selection.count - 1));
    }
  }
  finishQuery(answer, missing);
  return answer;
}

struct StandardAccount {
  std::string_view name;
  std::string_view type;
  std::string_view special;
};

// A new company's chart of accounts, as QuickBooks names these accounts.
constexpr std::array<StandardAccount, 7> kStandardAccounts{{
    {"Accounts Receivable", "AccountsReceivable", "AccountsReceivable"},
    {"Undeposited Funds", "OtherCurrentAsset", "UndepositedFunds"},
    {"Inventory Asset", "OtherCurrentAsset", "InventoryAssets"},
    {"Sales Tax Payable", "OtherCurrentLiability", "SalesTaxPayable"},
    {"Sales", "Income", ""},
    {"Cost of Goods Sold", "CostOfGoodsSold", "CostOfGoodsSold"},
    {"Job Expenses", "Expense", ""},
}};

}  // namespace

Answer answerTo(const XmlNode& request) {
  Answer answer;
  answer.name = request.name;
  if (answer.name.size() > 2) answer.name.replace(answer.name.size() - 2, 2, "Rs");
  answer.requestId = request.attribute("requestID");
  return answer;
}

Answer addCustomer(Context& context, const XmlNode& request) {
  return addEntry(context, request, kCustomers);
}

Answer queryCustomers(Context& context, const XmlNode& request) {
  return queryEntries(context, request, kCustomers, {});
}

Answer addAccount(Context& context, const XmlNode& request) {
  return addEntry(context, request, kAccounts);
}

Answer queryAccounts(Context& context, const XmlNode& request) {
  return queryEntries(context, request, kAccounts, {});
}

Answer addItem(Context& context, const XmlNode& request) {
  return addEntry(context, request, itemKind(itemKindOfRequest(request, "AddRq")));
}

Answer queryItems(Context& context, const XmlNode& request) {
  if (request.name == "ItemQueryRq") {
    return queryEntries(context, request, itemKind(ItemKind::Service), {});
  }
  const ItemKind kind = itemKindOfRequest(request, "QueryRq");
  return queryEntries(context, request, itemKind(kind), {static_cast<int>(kind)});
}

Answer queryPayrollItemWages(Context&, const XmlNode& request) {
  // The company file keeps no payroll items: a named one is missing, a filter matches none.
  Answer answer = answerTo(request);
  std::optional<std::string> missing;
  for (const XmlNode& child : request.children) {
    if (!missing && (child.name == "ListID" || child.name == "FullName")) missing = child.text;
  }
  finishQuery(answer, missing);
  return answer;
}

void addStandardLists(Store& store, const CompanySettings& settings, int64_t now) {
  const auto add = [&](ListTable table, int kind, std::string_view name,
                       std::vector<Field> fields) {
    ListRecord record;
    record.kind = kind;
    record.fullName = name;
    record.created = now;
    record.modified = now;
    record.fields = std::move(fields);
    return store.insertList(table, record);
  };
  for (const StandardAccount& account : kStandardAccounts) {
    std::vector<Field> fields;
    if (!account.special.empty()) {
      fields.push_back(Field::value("SpecialAccountType", std::string(account.special)));
    }
    add(ListTable::Accounts, accountTypeRank(account.type), account.name, std::move(fields));
  }
  add(ListTable::SalesTaxCodes, 0, "TAX",
      {Field::value("Desc", "Taxable Sales"), Field::value("IsTaxable", "true")});
  add(ListTable::SalesTaxCodes, 0, "NON",
      {Field::value("Desc", "Non-Taxable Sales"), Field::value("IsTaxable", "false")});
  if (settings.salesTax) {
    add(ListTable::Items, static_cast<int>(ItemKind::SalesTax), "State Tax",
        {Field::value("ItemDesc", "Sales Tax"), Field::value("TaxRate", "7.50")});
  }
}

}  // namespace droqbxml::simulator::handlers
