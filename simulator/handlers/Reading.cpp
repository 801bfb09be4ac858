// Request aggregates into fields. Which list a reference element points into is one table;
// the request handlers narrow it where a reference may only name some kinds of items.
#include "simulator/handlers/Reading.hpp"

#include <algorithm>
#include <array>

#include "simulator/handlers/Status.hpp"
#include "simulator/handlers/Values.hpp"

namespace droqbxml::simulator::handlers {
namespace {

struct ReferenceRule {
  std::string_view element;
  std::optional<ListTable> table;
  std::string_view list;
};

// Reference elements by the list they point into. The lists without a table here (classes,
// terms, vendors, ...) are lists a company file of the stand-in keeps empty, so a reference
// into one never resolves.
constexpr std::array<ReferenceRule, 36> kReferences{{
    {"CustomerRef", ListTable::Customers, "Customer"},
    {"SalesTaxCodeRef", ListTable::SalesTaxCodes, "SalesTaxCode"},
    {"CustomerSalesTaxCodeRef", ListTable::SalesTaxCodes, "SalesTaxCode"},
    {"PurchaseTaxCodeRef", ListTable::SalesTaxCodes, "SalesTaxCode"},
    {"ItemRef", ListTable::Items, "Item"},
    {"ItemGroupRef", ListTable::Items, "Item"},
    {"ItemSalesTaxRef", ListTable::Items, "Item"},
    {"AccountRef", ListTable::Accounts, "Account"},
    {"IncomeAccountRef", ListTable::Accounts, "Account"},
    {"ExpenseAccountRef", ListTable::Accounts, "Account"},
    {"COGSAccountRef", ListTable::Accounts, "Account"},
    {"AssetAccountRef", ListTable::Accounts, "Account"},
    {"DepositToAccountRef", ListTable::Accounts, "Account"},
    {"ARAccountRef", ListTable::Accounts, "Account"},
    {"OverrideItemAccountRef", ListTable::Accounts, "Account"},
    {"ClassRef", std::nullopt, "Class"},
    {"TermsRef", std::nullopt, "Terms"},
    {"SalesRepRef", std::nullopt, "SalesRep"},
    {"CustomerTypeRef", std::nullopt, "CustomerType"},
    {"JobTypeRef", std::nullopt, "JobType"},
    {"PrefVendorRef", std::nullopt, "Vendor"},
    {"TaxVendorRef", std::nullopt, "Vendor"},
    {"PaymentMethodRef", std::nullopt, "PaymentMethod"},
    {"PreferredPaymentMethodRef", std::nullopt, "PaymentMethod"},
    {"ShipMethodRef", std::nullopt, "ShipMethod"},
    {"CustomerMsgRef", std::nullopt, "CustomerMsg"},
    {"TemplateRef", std::nullopt, "Template"},
    {"PriceLevelRef", std::nullopt, "PriceLevel"},
    {"CurrencyRef", std::nullopt, "Currency"},
    {"UnitOfMeasureSetRef", std::nullopt, "UnitOfMeasureSet"},
    {"OverrideUOMSetRef", std::nullopt, "UnitOfMeasureSet"},
    {"InventorySiteRef", std::nullopt, "InventorySite"},
    {"InventorySiteLocationRef", std::nullopt, "InventorySiteLocation"},
    {"SalesTaxReturnLineRef", std::nullopt, "SalesTaxReturnLine"},
    {"PayrollItemWageRef", std::nullopt, "PayrollItemWage"},
    {"VendorRef", std::nullopt, "Vendor"},
}};

// A list reference: every element named "...Ref" except AdditionalContactRef, which holds a
// contact's name and value.
bool isReference(const XmlNode& element) {
  const std::string_view name = element.name;
  return name.size() > 3 && name.substr(name.size() - 3) == "Ref" && name != "AdditionalContactRef";
}

// A boolean element: "Is" followed by a capital letter (IsActive, IsTaxable, ...).
bool isBoolean(std::string_view name) {
  return name.size() > 2 && name.substr(0, 2) == "Is" && name[2] >= 'A' && name[2] <= 'Z';
}

}  // namespace

void checkNumbers(const XmlNode& aggregate) {
  for (const XmlNode& child : aggregate.children) {
    if (!child.children.empty()) {
      checkNumbers(child);
      continue;
    }
    const auto kind = numberKindOf(child.name);
    if (kind && !child.text.empty() && !parseNumber(child.text, *kind)) {
      throw Refusal(status::conversion(numberKindWord(*kind), child.text, child.name));
    }
  }
}

std::string childText(const XmlNode& parent, std::string_view name) {
  const XmlNode* child = parent.child(name);
  return child == nullptr ? std::string() : latin1Text(child->text);
}

Target lineItems() {
  return Target{ListTable::Items,
                "Item",
                {ItemKind::Service, ItemKind::Inventory, ItemKind::NonInventory,
                 ItemKind::OtherCharge, ItemKind::Subtotal, ItemKind::Discount, ItemKind::Payment,
                 ItemKind::SalesTax, ItemKind::SalesTaxGroup}};
}

FieldReader::FieldReader(Context& context, std::string_view object, std::optional<Target> parent)
    : context_(context), object_(object), parent_(std::move(parent)) {}

FieldReader& FieldReader::refuseTaxCodesWithoutSalesTax(std::string_view lineItem) {
  lineItem_ = lineItem;
  return *this;
}

FieldReader& FieldReader::target(std::string_view element, Target target) {
  targets_.emplace_back(std::string(element), std::move(target));
  return *this;
}

std::vector<Field> FieldReader::read(const XmlNode& aggregate,
                                     std::initializer_list<std::string_view> skip) {
  std::vector<Field> fields;
  for (const XmlNode& child : aggregate.children) {
    if (std::find(skip.begin(), skip.end(), child.name) != skip.end()) continue;
    fields.push_back(read1(child));
  }
  return fields;
}

Field FieldReader::read1(const XmlNode& element) {
  if (isReference(element)) {
    const Target target = targetOf(element.name);
    return Field::reference(element.name, target.table.value_or(ListTable::Customers),
                            resolve(element));
  }
  if (!element.children.empty()) {
    std::vector<Field> children;
    for (const XmlNode& child : element.children) children.push_back(read1(child));
    return Field::aggregate(element.name, std::move(children));
  }
  if (const auto kind = numberKindOf(element.name); kind && !element.text.empty()) {
    const auto value = parseNumber(element.text, *kind);
    if (!value) {
      throw Refusal(status::conversion(numberKindWord(*kind), element.text, element.name));
    }
    return Field::value(element.name, formatNumber(*value, *kind));
  }
  if (isBoolean(element.name) && !element.text.empty()) {
    return Field::value(element.name, booleanText(element.text));
  }
  return Field::value(element.name, latin1Text(element.text));
}

int64_t FieldReader::resolve(const XmlNode& reference) {
  const XmlNode* listId = reference.child("ListID");
  const std::string value =
      listId != nullptr ? latin1Text(listId->text) : childText(reference, "FullName");
  const Target target = targetOf(reference.name);
  if (!lineItem_.empty() && reference.name == "SalesTaxCodeRef" && !context_.settings.salesTax) {
    throw Refusal(status::taxCodeWithoutSalesTax(lineItem_, value, object_));
  }
  std::optional<int64_t> row;
  if (target.table) {
    row = listId != nullptr ? context_.store.findByListId(*target.table, value)
                            : context_.store.findByFullName(*target.table, value);
  }
  if (row && !target.itemKinds.empty()) {
    const auto record = context_.store.list(*target.table, *row);
    const auto kind = static_cast<ItemKind>(record ? record->kind : 0);
    if (std::find(target.itemKinds.begin(), target.itemKinds.end(), kind) ==
        target.itemKinds.end()) {
      row.reset();
    }
  }
  if (!row) throw Refusal(status::invalidReference(target.list, value, object_));
  return *row;
}

Target FieldReader::targetOf(std::string_view element) const {
  for (const auto& [name, target] : targets_) {
    if (name == element) return target;
  }
  if (element == "ParentRef" && parent_) return *parent_;
  if (element == "ItemSalesTaxRef") {
    return Target{ListTable::Items, "Item", {ItemKind::SalesTax, ItemKind::SalesTaxGroup}};
  }
  if (element == "ItemGroupRef") return Target{ListTable::Items, "Item", {ItemKind::Group}};
  for (const ReferenceRule& rule : kReferences) {
    if (rule.element == element) return Target{rule.table, rule.list, {}};
  }
  // Any other reference names a list the company file does not keep.
  std::string_view list = element;
  list.remove_suffix(3);
  return Target{std::nullopt, list, {}};
}

}  // namespace droqbxml::simulator::handlers
