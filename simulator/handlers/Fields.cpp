// Fields and their compact stored form. A stored node is a header number (element name code
// times four plus the node kind), then a value's length and bytes, an aggregate's child count
// and children, or a reference's list and row.
#include "simulator/handlers/Fields.hpp"

#include <array>
#include <stdexcept>
#include <unordered_map>
#include <utility>

namespace droqbxml::simulator::handlers {
namespace {

// Element names by code (code = position + 1; 0 = the name follows inline). Company files keep
// these codes: append new names at the end, never reorder or remove one.
// clang-format off
constexpr std::array<std::string_view, 206> kElementNames{{
    "Name", "IsActive", "ClassRef", "ParentRef", "ListID", "FullName", "CompanyName", "Salutation",
    "FirstName", "MiddleName", "LastName", "Suffix", "JobTitle", "BillAddress", "Addr1", "Addr2",
    "Addr3", "Addr4", "Addr5", "City", "State", "PostalCode", "Country", "Note", "ShipAddress",
    "ShipToAddress", "PrintAs", "Phone", "Mobile", "Pager", "AltPhone", "Fax", "Email", "Cc",
    "Contact", "AltContact", "AdditionalContactRef", "Contacts", "CustomerTypeRef", "TermsRef",
    "SalesRepRef", "OpenBalance", "OpenBalanceDate", "SalesTaxCodeRef", "ItemSalesTaxRef",
    "SalesTaxCountry", "ResaleNumber", "AccountNumber", "CreditLimit", "PreferredPaymentMethodRef",
    "CreditCardInfo", "JobStatus", "JobStartDate", "JobProjectedEndDate", "JobEndDate", "JobDesc",
    "JobTypeRef", "Notes", "AdditionalNotes", "IsStatementWithParent", "DeliveryMethod",
    "PreferredDeliveryMethod", "PriceLevelRef", "ExternalGUID", "TaxRegistrationNumber",
    "CurrencyRef", "TimeCreated", "TimeModified", "EditSequence", "Sublevel", "BillAddressBlock",
    "ShipAddressBlock", "ContactsRet", "Balance", "TotalBalance", "AdditionalNotesRet",
    "DataExtRet", "OwnerID", "DataExtName", "DataExtType", "DataExtValue", "AccountType",
    "DetailAccountType", "BankNumber", "Desc", "TaxLineID", "SpecialAccountType", "IsTaxAccount",
    "LastCheckNumber", "TaxLineInfoRet", "TaxLineName", "CashFlowClassification", "BarCode",
    "UnitOfMeasureSetRef", "IsTaxIncluded", "SalesOrPurchase", "Price", "PricePercent",
    "AccountRef", "SalesAndPurchase", "SalesDesc", "SalesPrice", "IncomeAccountRef",
    "PurchaseDesc", "PurchaseCost", "PurchaseTaxCodeRef", "ExpenseAccountRef", "PrefVendorRef",
    "BarCodeValue", "ManufacturerPartNumber", "SpecialItemType", "COGSAccountRef",
    "AssetAccountRef", "ReorderPoint", "Max", "QuantityOnHand", "TotalValue", "InventoryDate",
    "AverageCost", "QuantityOnOrder", "QuantityOnSalesOrder", "ItemDesc", "DiscountRate",
    "DiscountRatePercent", "IsPrintItemsInGroup", "ItemGroupLine", "ItemRef", "Quantity",
    "UnitOfMeasure", "DepositToAccountRef", "PaymentMethodRef", "TaxRate", "TaxVendorRef",
    "SalesTaxReturnLineRef", "CustomerRef", "TemplateRef", "TxnDate", "RefNumber", "PONumber",
    "DueDate", "FOB", "Memo", "CustomerMsgRef", "IsToBeEmailed", "CustomerSalesTaxCodeRef",
    "Other", "ExchangeRate", "EstimateLineAdd", "Rate", "RatePercent", "Amount", "TaxAmount",
    "OptionForPriceRuleConflict", "InventorySiteRef", "InventorySiteLocationRef", "MarkupRate",
    "MarkupRatePercent", "OverrideItemAccountRef", "Other1", "Other2", "DataExt",
    "EstimateLineGroupAdd", "ItemGroupRef", "TxnID", "TxnNumber", "Subtotal", "SalesTaxPercentage",
    "SalesTaxTotal", "TotalAmount", "TotalAmountInHomeCurrency", "LinkedTxn", "EstimateLineRet",
    "TxnLineID", "OverrideUOMSetRef", "EstimateLineGroupRet", "ARAccountRef", "IsPending",
    "IsFinanceCharge", "ShipDate", "ShipMethodRef", "IsToBePrinted", "LinkToTxnID", "SetCredit",
    "InvoiceLineAdd", "SerialNumber", "LotNumber", "ServiceDate", "IsTaxable", "LinkToTxn",
    "InvoiceLineGroupAdd", "DiscountLineAdd", "SalesTaxLineAdd", "ShippingLineAdd",
    "AppliedAmount", "BalanceRemaining", "BalanceRemainingInHomeCurrency", "IsPaid",
    "SuggestedDiscountAmount", "SuggestedDiscountDate", "InvoiceLineRet", "InvoiceLineGroupRet",
    "DiscountLineRet", "SalesTaxLineRet", "ShippingLineRet", "ContactName", "ContactValue"
}};
// clang-format on

uint64_t nameCode(std::string_view name) {
  static const std::unordered_map<std::string_view, uint64_t> codes = [] {
    std::unordered_map<std::string_view, uint64_t> map;
    for (size_t i = 0; i < kElementNames.size(); ++i) map.emplace(kElementNames[i], i + 1);
    return map;
  }();
  const auto found = codes.find(name);
  return found == codes.end() ? 0 : found->second;
}

void putNumber(std::string& out, uint64_t value) {
  while (value >= 0x80) {
    out += static_cast<char>((value & 0x7f) | 0x80);
    value >>= 7;
  }
  out += static_cast<char>(value);
}

void putText(std::string& out, std::string_view text) {
  putNumber(out, text.size());
  out += text;
}

void encode(std::string& out, const Field& field) {
  const uint64_t code = nameCode(field.name);
  putNumber(out, code * 4 + static_cast<uint64_t>(field.kind));
  if (code == 0) putText(out, field.name);
  switch (field.kind) {
    case Field::Kind::Value:
      putText(out, field.text);
      break;
    case Field::Kind::Aggregate:
      putNumber(out, field.children.size());
      for (const Field& child : field.children) encode(out, child);
      break;
    case Field::Kind::Reference:
      putNumber(out, static_cast<uint64_t>(field.table));
      putNumber(out, static_cast<uint64_t>(field.row));
      break;
  }
}

class Reader {
 public:
  explicit Reader(std::string_view blob) : blob_(blob) {}

  bool done() const { return position_ == blob_.size(); }

  uint64_t number() {
    uint64_t value = 0;
    for (int shift = 0; shift < 64; shift += 7) {
      if (done()) damaged();
      const auto byte = static_cast<unsigned char>(blob_[position_++]);
      value |= static_cast<uint64_t>(byte & 0x7f) << shift;
      if ((byte & 0x80) == 0) return value;
    }
    damaged();
  }

  std::string_view text() {
    const uint64_t length = number();
    if (length > blob_.size() - position_) damaged();
    const std::string_view result = blob_.substr(position_, length);
    position_ += length;
    return result;
  }

  // Reads the next field into `result`, a field made for it where it is kept.
  void field(Field& result, int depth) {
    if (depth > 16) damaged();
    const uint64_t header = number();
    const uint64_t code = header / 4;
    const auto kind = header % 4;
    if (code == 0) {
      result.name = text();
    } else if (code <= kElementNames.size()) {
      result.name = kElementNames[code - 1];
    } else {
      damaged();
    }
    switch (kind) {
      case 0:
        result.kind = Field::Kind::Value;
        result.text = text();
        break;
      case 1: {
        result.kind = Field::Kind::Aggregate;
        const uint64_t count = number();
        if (count > blob_.size()) damaged();
        result.children.resize(count);
        for (Field& child : result.children) field(child, depth + 1);
        break;
      }
      case 2:
        result.kind = Field::Kind::Reference;
        result.table = static_cast<ListTable>(number());
        result.row = static_cast<int64_t>(number());
        break;
      default:
        damaged();
    }
  }

 private:
  [[noreturn]] static void damaged() {
    throw std::runtime_error("a stored record of the company file is damaged");
  }

  std::string_view blob_;
  size_t position_ = 0;
};

}  // namespace

Field Field::value(std::string name, std::string text) {
  Field field;
  field.name = std::move(name);
  field.text = std::move(text);
  return field;
}

Field Field::aggregate(std::string name, std::vector<Field> children) {
  Field field;
  field.name = std::move(name);
  field.kind = Kind::Aggregate;
  field.children = std::move(children);
  return field;
}

Field Field::reference(std::string name, ListTable table, int64_t row) {
  Field field;
  field.name = std::move(name);
  field.kind = Kind::Reference;
  field.table = table;
  field.row = row;
  return field;
}

const Field* Field::child(std::string_view childName) const {
  return findField(children, childName);
}

const Field* findField(const std::vector<Field>& fields, std::string_view name) {
  for (const Field& field : fields) {
    if (field.name == name) return &field;
  }
  return nullptr;
}

std::string fieldText(const std::vector<Field>& fields, std::string_view name) {
  const Field* field = findField(fields, name);
  return field != nullptr && field->kind == Field::Kind::Value ? field->text : std::string();
}

void appendValue(std::vector<Field>& fields, std::string_view name, std::string text) {
  Field& field = fields.emplace_back();
  field.name = name;
  field.text = std::move(text);
}

void setField(std::vector<Field>& fields, Field field) {
  removeField(fields, field.name);
  fields.push_back(std::move(field));
}

void removeField(std::vector<Field>& fields, std::string_view name) {
  std::erase_if(fields, [&](const Field& field) { return field.name == name; });
}

std::string encodeFields(const std::vector<Field>& fields) {
  std::string out;
  for (const Field& field : fields) encode(out, field);
  return out;
}

std::vector<Field> decodeFields(std::string_view blob, size_t room) {
  Reader reader(blob);
  std::vector<Field> fields;
  fields.reserve(16 + room);
  while (!reader.done()) reader.field(fields.emplace_back(), 0);
  return fields;
}

}  // namespace droqbxml::simulator::handlers
