// The kinds of list entries the stand-in knows: the ten item kinds (in the order QuickBooks
// lists items) and the account types (in the order of its chart of accounts).
#ifndef DROQBXML_SIMULATOR_HANDLERS_CATALOG_HPP_
#define DROQBXML_SIMULATOR_HANDLERS_CATALOG_HPP_

#include <optional>
#include <string_view>

namespace droqbxml::simulator::handlers {

enum class ItemKind : int {
  Service = 1,
  Inventory,
  NonInventory,
  OtherCharge,
  Subtotal,
  Group,
  Discount,
  Payment,
  SalesTax,
  SalesTaxGroup,
};

struct ItemKindInfo {
  ItemKind kind;
  std::string_view name;    // "ItemService": the request, aggregate and Ret names' stem
  std::string_view object;  // "Item Service": how QuickBooks' messages name an entry of it
  bool hasSalesTaxCode;     // has SalesTaxCodeRef
};

const ItemKindInfo& itemKindInfo(ItemKind kind);
// The kind whose stem is `name` ("ItemService"), if any.
std::optional<ItemKind> itemKindNamed(std::string_view name);

// The rank of an AccountType value in the chart of accounts (1 for Bank, ...), 0 if unknown.
int accountTypeRank(std::string_view accountType);
std::string_view accountTypeOfRank(int rank);
// How QuickBooks classifies accounts of that type in the statement of cash flows.
std::string_view cashFlowClassification(std::string_view accountType);

}  // namespace droqbxml::simulator::handlers

#endif  // DROQBXML_SIMULATOR_HANDLERS_CATALOG_HPP_
