// Estimates and invoices: one add and one query path for both. An add prices every line
// (quantity times rate, the given amount, the item's price and description, percentages of
// the line before, subtotals of the lines since the last subtotal), expands item groups into
// their lines, and works out the sales tax from the taxable lines, the customer's tax code and
// the sales tax item's rate.
#include <algorithm>
#include <cstdlib>
#include <optional>

#include "simulator/handlers/Catalog.hpp"
#include "simulator/handlers/Clock.hpp"
#include "simulator/handlers/Handlers.hpp"
#include "simulator/handlers/Queries.hpp"
#include "simulator/handlers/Reading.hpp"
#include "simulator/handlers/Status.hpp"
#include "simulator/handlers/Values.hpp"

namespace droqbxml::simulator::handlers {
namespace {

struct TxnKind {
  TxnTable table;
  std::string_view stem;        // "Invoice": names of the aggregates
  std::string_view lineObject;  // "Invoice line": lines in QuickBooks' messages
  std::string_view lineItem;    // "InvoiceLineItem": lines in the tax code message
  bool invoice;
};

constexpr TxnKind kEstimates{TxnTable::Estimates, "Estimate", "Estimate line", "EstimateLineItem",
                             false};
constexpr TxnKind kInvoices{TxnTable::Invoices, "Invoice", "Invoice line", "InvoiceLineItem", true};

std::string named(const TxnKind& kind, std::string_view suffix) {
  return std::string(kind.stem) + std::string(suffix);
}

// 3040 for a number of that kind written as QuickBooks writes it.
Status refusedNumber(NumberKind kind, int64_t value, std::string_view field) {
  return status::conversion(numberKindWord(kind), formatNumber(value, kind), field);
}

std::optional<int64_t> number(const std::vector<Field>& fields, std::string_view name) {
  const auto kind = numberKindOf(name);
  const std::string text = fieldText(fields, name);
  if (!kind || text.empty()) return std::nullopt;
  return parseNumber(text, *kind);
}

// What an item puts on a line by itself: its description, its price (fixed or as a
// percentage) and its cost, which an estimate line's markup applies to.
struct ItemTerms {
  std::string desc;
  std::optional<int64_t> rate;
  std::optional<int64_t> ratePercent;
  int64_t cost = 0;
};

ItemTerms itemTerms(const ListRecord& item) {
  ItemTerms terms;
  const Field* sales = findField(item.fields, "SalesOrPurchase");
  const Field* both = findField(item.fields, "SalesAndPurchase");
  const std::vector<Field>& fields = sales != nullptr  ? sales->children
                                     : both != nullptr ? both->children
                                                       : item.fields;
  for (const std::string_view name : {"Desc", "SalesDesc", "ItemDesc"}) {
    if (terms.desc.empty()) terms.desc = fieldText(fields, name);
  }
  for (const std::string_view name : {"Price", "SalesPrice", "DiscountRate"}) {
    if (!terms.rate) terms.rate = number(fields, name);
  }
  for (const std::string_view name : {"PricePercent", "DiscountRatePercent", "TaxRate"}) {
    if (!terms.ratePercent) terms.ratePercent = number(fields, name);
  }
  terms.cost = number(fields, "PurchaseCost").value_or(0);
  return terms;
}

// Builds the lines of one transaction and keeps its running totals.
class LineBuilder {
 public:
  LineBuilder(Context& context, const TxnKind& kind)
      : context_(context), reader_(context, kind.lineObject) {
    reader_.refuseTaxCodesWithoutSalesTax(kind.lineItem);
    reader_.target("ItemRef", lineItems());
  }

  void addLine(const XmlNode& line) {
    std::vector<Field> fields = reader_.read(line);
    lines_.push_back(TxnLine{0, LineKind::Line, price(std::move(fields))});
  }

  void addGroup(const XmlNode& group) {
    const XmlNode* groupRef = group.child("ItemGroupRef");
    const int64_t groupRow = groupRef != nullptr ? reader_.resolve(*groupRef) : 0;
    const auto groupItem = context_.store.list(ListTable::Items, groupRow);
    std::vector<Field> fields = reader_.read(group, {"ItemGroupRef"});
    fields.push_back(Field::reference("ItemGroupRef", ListTable::Items, groupRow));
    const int64_t quantity = number(fields, "Quantity").value_or(kScale);
    setField(fields, Field::value("Quantity", formatNumber(quantity, NumberKind::Quantity)));
    if (fieldText(fields, "Desc").empty() && groupItem) {
      setField(fields, Field::value("Desc", fieldText(groupItem->fields, "ItemDesc")));
    }
    const std::string print = groupItem ? fieldText(groupItem->fields, "IsPrintItemsInGroup") : "";
    fields.push_back(Field::value("IsPrintItemsInGroup", print.empty() ? "false" : print));
    const size_t header = lines_.size();
    lines_.push_back(TxnLine{0, LineKind::Group, {}});
    int64_t total = 0;
    if (groupItem) {
      for (const Field& member : groupItem->fields) {
        const Field* item = member.child("ItemRef");
        if (member.name != "ItemGroupLine" || item == nullptr) continue;
        const int64_t each = number(member.children, "Quantity").value_or(kScale);
        std::vector<Field> memberFields{
            *item,
            Field::value("Quantity", formatNumber(multiply(each, quantity), NumberKind::Quantity))};
        if (const Field* serviceDate = findField(fields, "ServiceDate"))
          memberFields.push_back(*serviceDate);
        lines_.push_back(TxnLine{0, LineKind::GroupMember, price(std::move(memberFields))});
        total += lastAmount_;
      }
    }
    fields.push_back(Field::value("TotalAmount", formatNumber(total, NumberKind::Amount)));
    lines_[header].fields = std::move(fields);
    previous_ = total;
  }

  std::vector<TxnLine>& lines() { return lines_; }
  int64_t subtotal() const { return subtotal_; }
  int64_t taxable() const { return taxable_; }

 private:
  // A line's fields completed from its item, its amount worked out and counted.
  std::vector<Field> price(std::vector<Field> fields) {
    const Field* itemRef = findField(fields, "ItemRef");
    const auto item =
        itemRef != nullptr ? context_.store.list(ListTable::Items, itemRef->row) : std::nullopt;
    const auto itemKind = static_cast<ItemKind>(item ? item->kind : 0);
    const ItemTerms terms = item ? itemTerms(*item) : ItemTerms{};
    if (fieldText(fields, "Desc").empty() && !terms.desc.empty()) {
      setField(fields, Field::value("Desc", terms.desc));
    }
    lastAmount_ = 0;
    if (itemKind == ItemKind::Subtotal) {
      // A subtotal line sums the lines since the last one; it adds nothing itself.
      for (const std::string_view name : {"Quantity", "Rate", "RatePercent", "SalesTaxCodeRef"}) {
        removeField(fields, name);
      }
      setField(fields, Field::value("Amount", formatNumber(sinceSubtotal_, NumberKind::Amount)));
      previous_ = sinceSubtotal_;
      sinceSubtotal_ = 0;
      return fields;
    }
    if (context_.settings.salesTax && findField(fields, "SalesTaxCodeRef") == nullptr && item) {
      if (const Field* code = findField(item->fields, "SalesTaxCodeRef")) fields.push_back(*code);
    }

    const auto quantity = number(fields, "Quantity");
    auto rate = number(fields, "Rate");
    auto ratePercent = number(fields, "RatePercent");
    const auto given = number(fields, "Amount");
    const bool rateGiven = rate || ratePercent;
    const auto markup = number(fields, "MarkupRate");
    const auto markupPercent = number(fields, "MarkupRatePercent");
    if (!rateGiven && !given && (markup || markupPercent)) {
      // An estimate line's markup prices the item at its cost plus the markup.
      rate = markup ? terms.cost + *markup : terms.cost + percentOf(terms.cost, *markupPercent);
    }
    if (!rate && !rateGiven && !given) {
      rate = terms.rate;
      ratePercent = rate ? std::nullopt : terms.ratePercent;
      // An item without a price of its own is priced at nothing, as QuickBooks shows it.
      if (item && !rate && !ratePercent) rate = 0;
    }
    const bool discount = itemKind == ItemKind::Discount;
    std::optional<int64_t> amount = given;
    if (!amount && ratePercent) {
      amount = percentOf(previous_, *ratePercent);
    } else if (!amount && rate) {
      amount = multiply(quantity.value_or(kScale), *rate);
    }
    if (amount) {
      if (discount && !given) amount = -std::abs(*amount);
      amount = roundToCents(*amount);
      // An amount, or a total, past what QuickBooks holds cannot be converted: named by the
      // value that took it there, the amount given or the rate it was worked out from.
      const int64_t total =
          std::max({std::abs(subtotal_), std::abs(sinceSubtotal_), std::abs(taxable_)});
      if (std::abs(*amount) > kLargestAmount || total > kLargestAmount - std::abs(*amount)) {
        if (given) throw Refusal(refusedNumber(NumberKind::Amount, *amount, "Amount"));
        if (rate) throw Refusal(refusedNumber(NumberKind::Price, *rate, "Rate"));
        throw Refusal(refusedNumber(NumberKind::Percent, *ratePercent, "RatePercent"));
      }
      // A given amount without a rate sets the rate: per unit, or whole without a quantity.
      if (given && !rateGiven) {
        rate = quantity && *quantity != 0 ? divide(*amount, *quantity) : *amount;
      }
      if (rate) {
        setField(fields, Field::value("Rate", formatNumber(*rate, NumberKind::Price)));
      } else if (ratePercent) {
        setField(fields,
                 Field::value("RatePercent", formatNumber(*ratePercent, NumberKind::Percent)));
      }
      setField(fields, Field::value("Amount", formatNumber(*amount, NumberKind::Amount)));
      lastAmount_ = *amount;
      previous_ = *amount;
      sinceSubtotal_ += *amount;
      subtotal_ += *amount;
      const Field* code = findField(fields, "SalesTaxCodeRef");
      if (code != nullptr && context_.isTaxable(code->row)) taxable_ += *amount;
    }
    return fields;
  }

  Context& context_;
  FieldReader reader_;
  std::vector<TxnLine> lines_;
  int64_t previous_ = 0;       // the amount a percentage applies to
  int64_t sinceSubtotal_ = 0;  // what the next subtotal line sums
  int64_t lastAmount_ = 0;
  int64_t subtotal_ = 0;
  int64_t taxable_ = 0;
};

// An invoice takes what it sells from stock: each line of an inventory item (group members
// included) lowers the item's quantity on hand by the line's quantity, below zero if need
// be; its average cost stays. Estimates sell nothing.
void sellFromStock(Context& context, const std::vector<TxnLine>& lines) {
  for (const TxnLine& line : lines) {
    const Field* itemRef = findField(line.fields, "ItemRef");
    const auto quantity = number(line.fields, "Quantity");
    if (line.kind == LineKind::Group || itemRef == nullptr || !quantity) continue;
    auto item = context.store.list(ListTable::Items, itemRef->row);
    if (!item || static_cast<ItemKind>(item->kind) != ItemKind::Inventory) continue;
    const int64_t onHand = number(item->fields, "QuantityOnHand").value_or(0) - *quantity;
    setField(item->fields,
             Field::value("QuantityOnHand", formatNumber(onHand, NumberKind::Quantity)));
    context.store.updateFields(ListTable::Items, item->id, item->fields);
  }
}

// The RefNumber QuickBooks gives a transaction that has none: the last one of its kind with
// its trailing number counted up ("1005" after "1004", "INV-010" after "INV-009"), else "1".
std::string nextRefNumber(Context& context, TxnTable table) {
  Statement& last =
      context.store.statement("SELECT ref_number FROM " + std::string(Store::tableName(table)) +
                              " WHERE ref_number IS NOT NULL ORDER BY id DESC LIMIT 1");
  std::string ref = last.step() ? last.text(0) : std::string();
  size_t digits = ref.size();
  while (digits > 0 && ref[digits - 1] >= '0' && ref[digits - 1] <= '9') --digits;
  if (digits == ref.size()) return "1";
  size_t at = ref.size();
  while (at > digits) {
    --at;
    if (ref[at] != '9') {
      ++ref[at];
      return ref;
    }
    ref[at] = '0';
  }
  ref.insert(digits, "1");
  return ref;
}

// The sales tax rate of a sales tax item, or the sum of a sales tax group's items' rates.
int64_t salesTaxRate(Context& context, int64_t itemRow) {
  const auto item = context.store.list(ListTable::Items, itemRow);
  if (!item) return 0;
  if (item->kind == static_cast<int>(ItemKind::SalesTax)) {
    return number(item->fields, "TaxRate").value_or(0);
  }
  int64_t rate = 0;
  for (const Field& member : item->fields) {
    if (member.name == "ItemSalesTaxRef" && member.kind == Field::Kind::Reference &&
        member.row != itemRow) {
      rate += salesTaxRate(context, member.row);
    }
  }
  return rate;
}

void defaultField(std::vector<Field>& fields, Field field) {
  if (findField(fields, field.name) == nullptr) fields.push_back(std::move(field));
}

// The Ret aggregate of a transaction, with its lines when `withLines`.
Field txnRet(Context& context, const TxnKind& kind, TxnRecord txn, bool withLines) {
  std::vector<Field> fields = std::move(txn.fields);
  fields.push_back(Field::value("TxnID", txnIdText(txn.id, txn.created)));
  fields.push_back(Field::value("TimeCreated", context.dateTimeText(txn.created)));
  fields.push_back(Field::value("TimeModified", context.dateTimeText(txn.modified)));
  fields.push_back(Field::value("EditSequence", std::to_string(txn.modified)));
  fields.push_back(Field::value("TxnNumber", std::to_string(txn.number)));
  fields.push_back(Field::reference("CustomerRef", ListTable::Customers, txn.customer));
  fields.push_back(Field::value("TxnDate", txn.txnDate));
  fields.push_back(Field::value("RefNumber", txn.refNumber));
  fields.push_back(Field::value("Subtotal", formatNumber(txn.subtotal, NumberKind::Amount)));
  fields.push_back(Field::value("SalesTaxTotal", formatNumber(txn.salesTax, NumberKind::Amount)));
  const int64_t total = txn.subtotal + txn.salesTax;
  if (kind.invoice) {
    if (txn.arAccount) {
      fields.push_back(Field::reference("ARAccountRef", ListTable::Accounts, *txn.arAccount));
    }
    fields.push_back(
        Field::value("AppliedAmount", formatNumber(txn.balance - total, NumberKind::Amount)));
    fields.push_back(
        Field::value("BalanceRemaining", formatNumber(txn.balance, NumberKind::Amount)));
    fields.push_back(Field::value("IsPaid", txn.balance == 0 ? "true" : "false"));
  } else {
    fields.push_back(Field::value("TotalAmount", formatNumber(total, NumberKind::Amount)));
  }
  if (withLines) {
    const std::string lineRet = named(kind, "LineRet");
    const std::string groupRet = named(kind, "LineGroupRet");
    const auto lineField = [&](TxnLine& line, const std::string& ret) {
      std::vector<Field> lineFields = std::move(line.fields);
      lineFields.push_back(Field::value("TxnLineID", txnIdText(line.id, txn.created)));
      return Field::aggregate(ret, context.order.arrange(ret, std::move(lineFields)));
    };
    std::optional<Field> group;
    const auto closeGroup = [&] {
      if (group)
        fields.push_back(Field::aggregate(
            groupRet, context.order.arrange(groupRet, std::move(group->children))));
      group.reset();
    };
    for (TxnLine& line : txn.lines) {
      if (line.kind == LineKind::GroupMember && group) {
        group->children.push_back(lineField(line, lineRet));
        continue;
      }
      closeGroup();
      if (line.kind == LineKind::Group) {
        group = Field::aggregate(groupRet, std::move(line.fields));
        group->children.push_back(Field::value("TxnLineID", txnIdText(line.id, txn.created)));
      } else {
        fields.push_back(lineField(line, lineRet));
      }
    }
    closeGroup();
  }
  const std::string ret = named(kind, "Ret");
  return Field::aggregate(ret, context.order.arrange(ret, std::move(fields)));
}

Answer addTxn(Context& context, const XmlNode& request, const TxnKind& kind) {
  Answer answer = answerTo(request);
  const XmlNode* add = request.child(named(kind, "Add"));
  if (add == nullptr) return answer;
  checkNumbers(*add);

  TxnRecord txn;
  FieldReader header(context, kind.stem);
  LineBuilder lines(context, kind);
  std::optional<ListRecord> customer;
  for (const XmlNode& child : add->children) {
    if (child.name == "CustomerRef") {
      customer = context.store.list(ListTable::Customers, header.resolve(child));
    } else if (child.name == named(kind, "LineAdd")) {
      lines.addLine(child);
    } else if (child.name == named(kind, "LineGroupAdd")) {
      lines.addGroup(child);
    } else if (child.name == "TxnDate") {
      txn.txnDate = child.text;
    } else if (child.name == "RefNumber") {
      txn.refNumber = latin1Text(child.text);
      if (txn.refNumber.size() > 11) throw Refusal(status::tooLong(txn.refNumber, "RefNumber"));
    } else if (child.name == "ARAccountRef") {
      txn.arAccount = header.resolve(child);
    } else {
      txn.fields.push_back(header.read1(child));
    }
  }
  if (!customer) throw Refusal(status::invalidReference("Customer", "", kind.stem));
  txn.customer = customer->id;

  // What the transaction takes from its customer and from the company when the request does
  // not say.
  if (txn.txnDate.empty()) txn.txnDate = formatDate(context.now);
  if (txn.refNumber.empty()) txn.refNumber = nextRefNumber(context, kind.table);
  defaultField(txn.fields, Field::value("DueDate", txn.txnDate));
  for (const std::string_view address : {"BillAddress", "ShipAddress"}) {
    if (const Field* own = findField(customer->fields, address)) defaultField(txn.fields, *own);
  }
  if (kind.invoice) {
    if (!txn.arAccount) txn.arAccount = context.specialAccount("AccountsReceivable");
    defaultField(txn.fields, Field::value("IsPending", "false"));
    defaultField(txn.fields, Field::value("IsFinanceCharge", "false"));
    defaultField(txn.fields, Field::value("ShipDate", txn.txnDate));
    defaultField(txn.fields, Field::value("IsToBePrinted", "true"));
  } else {
    defaultField(txn.fields, Field::value("IsActive", "true"));
  }
  defaultField(txn.fields, Field::value("IsToBeEmailed", "false"));

  txn.subtotal = lines.subtotal();
  int64_t rate = 0;
  if (context.settings.salesTax) {
    for (const auto& [own, customers] : {std::pair<std::string_view, std::string_view>{
                                             "CustomerSalesTaxCodeRef", "SalesTaxCodeRef"},
                                         {"ItemSalesTaxRef", "ItemSalesTaxRef"}}) {
      if (findField(txn.fields, own) != nullptr) continue;
      if (const Field* inherited = findField(customer->fields, customers)) {
        Field copy = *inherited;
        copy.name = own;
        txn.fields.push_back(std::move(copy));
      }
    }
    if (findField(txn.fields, "ItemSalesTaxRef") == nullptr) {
      if (const auto item = context.defaultSalesTaxItem()) {
        txn.fields.push_back(Field::reference("ItemSalesTaxRef", ListTable::Items, *item));
      }
    }
    const Field* taxItem = findField(txn.fields, "ItemSalesTaxRef");
    const Field* customerCode = findField(txn.fields, "CustomerSalesTaxCodeRef");
    rate = taxItem != nullptr ? salesTaxRate(context, taxItem->row) : 0;
    const bool taxableCustomer = customerCode == nullptr || context.isTaxable(customerCode->row);
    txn.salesTax = taxableCustomer ? roundToCents(percentOf(lines.taxable(), rate)) : 0;
  }
  setField(txn.fields, Field::value("SalesTaxPercentage", formatNumber(rate, NumberKind::Percent)));
  if (kind.invoice) txn.balance = txn.subtotal + txn.salesTax;

  // The transaction's TxnID number, then its lines' in order.
  txn.id = context.company.nextCounter("TxnID", 1 + static_cast<int64_t>(lines.lines().size()));
  int64_t lineId = txn.id;
  for (TxnLine& line : lines.lines()) line.id = ++lineId;
  txn.number = context.company.nextCounter("TxnNumber");
  txn.created = context.now;
  txn.modified = context.now;
  txn.lines = std::move(lines.lines());
  context.store.insertTxn(kind.table, txn);
  if (kind.invoice) sellFromStock(context, txn.lines);
  context.add(answer, txnRet(context, kind, std::move(txn), true));
  return answer;
}

// The transactions a query names by TxnID or RefNumber, in the order named.
std::vector<int64_t> namedTxns(Context& context, const XmlNode& request, const TxnKind& kind,
                               std::optional<std::string>& missing) {
  std::vector<int64_t> ids;
  const std::string table(Store::tableName(kind.table));
  for (const XmlNode& child : request.children) {
    const std::string value = latin1Text(child.text);
    std::vector<int64_t> found;
    if (child.name == "TxnID") {
      if (const auto id = context.store.findByTxnId(kind.table, value)) found.push_back(*id);
    } else if (child.name == "RefNumber" || child.name == "RefNumberCaseSensitive") {
      Statement& rows = context.store.statement(
          "SELECT id FROM " + table + " WHERE ref_number = ?" +
          (child.name == "RefNumber" ? "" : " COLLATE BINARY") + " ORDER BY id");
      rows.bind(1, value);
      while (rows.step()) found.push_back(rows.integer(0));
    } else {
      continue;
    }
    if (found.empty() && !missing) missing = value;
    ids.insert(ids.end(), found.begin(), found.end());
  }
  return ids;
}

// The customers an EntityFilter names (with their jobs for the "WithChildren" forms), as a
// condition on the column `customer`.
void addEntityFilter(const XmlNode& entity, Conditions& conditions) {
  std::string names;
  std::vector<Conditions::Value> values;
  for (const XmlNode& child : entity.children) {
    const std::string value = latin1Text(child.text);
    if (child.name == "ListID" || child.name == "ListIDWithChildren") {
      const auto parsed = parseListId(value);
      const int64_t id = parsed ? parsed->first : 0;
      names += names.empty() ? "" : " OR ";
      if (child.name == "ListID") {
        names += "id = ?";
        values.emplace_back(id);
      } else {
        names +=
            "id = ? OR full_name LIKE (SELECT replace(replace(full_name, '%', '\\%'), '_', "
            "'\\_') FROM customers WHERE id = ?) || ':%' ESCAPE '\\'";
        values.emplace_back(id);
        values.emplace_back(id);
      }
    } else {
      names += names.empty() ? "" : " OR ";
      names += child.name == "FullName" ? "full_name = ?"
                                        : "full_name = ? OR full_name LIKE ? ESCAPE '\\'";
      values.emplace_back(value);
      if (child.name != "FullName") values.emplace_back(likeEscaped(value) + ":%");
    }
  }
  if (!names.empty()) {
    conditions.add("customer IN (SELECT id FROM customers WHERE " + names + ")", std::move(values));
  }
}

std::vector<int64_t> filteredTxns(Context& context, const XmlNode& request, const TxnKind& kind,
                                  const QueryFilter& filter) {
  Conditions conditions;
  filter.addTo(conditions);
  if (const XmlNode* dates = request.child("TxnDateRangeFilter")) {
    if (const XmlNode* from = dates->child("FromTxnDate")) {
      conditions.add("txn_date >= ?", {from->text});
    }
    if (const XmlNode* to = dates->child("ToTxnDate")) {
      conditions.add("txn_date <= ?", {to->text});
    }
  }
  if (const XmlNode* entity = request.child("EntityFilter")) addEntityFilter(*entity, conditions);
  if (const XmlNode* paid = request.child("PaidStatus")) {
    if (paid->text == "PaidOnly") conditions.add("coalesce(balance, 0) = 0");
    if (paid->text == "NotPaidOnly") conditions.add("coalesce(balance, 0) <> 0");
  }
  Statement& rows =
      context.store.statement("SELECT id FROM " + std::string(Store::tableName(kind.table)) +
                              conditions.where() + " ORDER BY id" + filter.limit());
  conditions.bind(rows);
  std::vector<int64_t> ids;
  while (rows.step()) ids.push_back(rows.integer(0));
  return ids;
}

Answer queryTxns(Context& context, const XmlNode& request, const TxnKind& kind) {
  Answer answer = answerTo(request);
  const QueryFilter filter = QueryFilter::read(request);
  const XmlNode* includeLines = request.child("IncludeLineItems");
  const bool withLines = includeLines != nullptr && isTrue(includeLines->text);
  std::optional<std::string> missing;
  const bool named = request.child("TxnID") != nullptr || request.child("RefNumber") != nullptr ||
                     request.child("RefNumberCaseSensitive") != nullptr;
  const std::vector<int64_t> ids = named ? namedTxns(context, request, kind, missing)
                                         : filteredTxns(context, request, kind, filter);
  for (const int64_t id : ids) {
    Statement& row =
        context.store.statement("SELECT " + std::string(Store::kTxnColumns) + " FROM " +
                                std::string(Store::tableName(kind.table)) + " WHERE id = ?");
    row.bind(1, id);
    if (!row.step()) continue;
    TxnRecord txn = Store::txnRecord(row);
    if (withLines) context.store.loadLines(kind.table, txn);
    context.add(answer, filter.included(txnRet(context, kind, std::move(txn), withLines)));
  }
  finishQuery(answer, missing);
  return answer;
}

}  // namespace

Answer addEstimate(Context& context, const XmlNode& request) {
  return addTxn(context, request, kEstimates);
}

Answer queryEstimates(Context& context, const XmlNode& request) {
  return queryTxns(context, request, kEstimates);
}

Answer addInvoice(Context& context, const XmlNode& request) {
  return addTxn(context, request, kInvoices);
}

Answer queryInvoices(Context& context, const XmlNode& request) {
  return queryTxns(context, request, kInvoices);
}

}  // namespace droqbxml::simulator::handlers
