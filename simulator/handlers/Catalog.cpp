// The item kinds and account types, each one row of a table.
#include "simulator/handlers/Catalog.hpp"

#include <array>
#include <stdexcept>

namespace droqbxml::simulator::handlers {
namespace {

constexpr std::array<ItemKindInfo, 10> kItemKinds{{
    {ItemKind::Service, "ItemService", "Item Service", true},
    {ItemKind::Inventory, "ItemInventory", "Item Inventory", true},
    {ItemKind::NonInventory, "ItemNonInventory", "Item Non Inventory", true},
    {ItemKind::OtherCharge, "ItemOtherCharge", "Item Other Charge", true},
    {ItemKind::Subtotal, "ItemSubtotal", "Item Subtotal", false},
    {ItemKind::Group, "ItemGroup", "Item Group", false},
    {ItemKind::Discount, "ItemDiscount", "Item Discount", true},
    {ItemKind::Payment, "ItemPayment", "Item Payment", false},
    {ItemKind::SalesTax, "ItemSalesTax", "Item Sales Tax", false},
    {ItemKind::SalesTaxGroup, "ItemSalesTaxGroup", "Item Sales Tax Group", false},
}};

struct AccountType {
  std::string_view name;
  std::string_view cashFlow;
};

// The chart of accounts' order: balance sheet accounts, then income and expenses.
constexpr std::array<AccountType, 16> kAccountTypes{{
    {"Bank", "NotApplicable"},
    {"AccountsReceivable", "Operating"},
    {"OtherCurrentAsset", "Operating"},
    {"FixedAsset", "Investing"},
    {"OtherAsset", "Investing"},
    {"AccountsPayable", "Operating"},
    {"CreditCard", "Operating"},
    {"OtherCurrentLiability", "Operating"},
    {"LongTermLiability", "Financing"},
    {"Equity", "Financing"},
    {"Income", "NotApplicable"},
    {"CostOfGoodsSold", "NotApplicable"},
    {"Expense", "NotApplicable"},
    {"OtherIncome", "NotApplicable"},
    {"OtherExpense", "NotApplicable"},
    {"NonPosting", "NotApplicable"},
}};

}  // namespace

const ItemKindInfo& itemKindInfo(ItemKind kind) {
  for (const ItemKindInfo& info : kItemKinds) {
    if (info.kind == kind) return info;
  }
  throw std::logic_error("unknown item kind");
}

std::optional<ItemKind> itemKindNamed(std::string_view name) {
  for (const ItemKindInfo& info : kItemKinds) {
    if (info.name == name) return info.kind;
  }
  return std::nullopt;
}

int accountTypeRank(std::string_view accountType) {
  for (size_t i = 0; i < kAccountTypes.size(); ++i) {
    if (kAccountTypes[i].name == accountType) return static_cast<int>(i) + 1;
  }
  return 0;
}

std::string_view accountTypeOfRank(int rank) {
  return rank >= 1 && rank <= static_cast<int>(kAccountTypes.size()) ? kAccountTypes[rank - 1].name
                                                                     : std::string_view();
}

std::string_view cashFlowClassification(std::string_view accountType) {
  for (const AccountType& type : kAccountTypes) {
    if (type.name == accountType) return type.cashFlow;
  }
  return "NotApplicable";
}

}  // namespace droqbxml::simulator::handlers
