// DroXmlBuilder, items: one add request per item kind. The non-inventory item is reached
// directly; every other kind is reached member by member by name, as hosts have always been
// able to hand in any object with the right members.
#include "droqbxml/qbxml/DroXmlBuilder.hpp"

#include "droqbxml/qbxml/internal/RequestWriting.hpp"
#include "droqbxml/records/DroSalesItems.hpp"
#include "droqbxml/records/DroTypedRefs.hpp"
#include "droqbxml/runtime/ComError.hpp"

namespace droqbxml {
namespace {

using internal::ByName;
using internal::writeElement;
using internal::writeElementIfSet;
using internal::writeReference;
using internal::writeReferenceIfSet;

// Opens "<kind>AddRq" with the item's identifier and "<kind>Add".
void openItemAdd(DroXmlBuilder& builder, TextView kind, const ByName& item) {
  internal::openAddRequest(builder, Text(kind) + u"AddRq", [&](const Text& id) {
    item.let(u"RequestID", id);
    return item.text(u"RequestID");
  });
  builder.AddAggregateBegin(builder.CreateElement(Text(kind) + u"Add"));
}

void closeItemAdd(DroXmlBuilder& builder) {
  builder.AddAggregateEnd();
  builder.AddAggregateEnd();
  builder.AddFooters();
}

// "Name" always, then "IsActive" when set: every kind starts so.
void writeNameAndActive(DroXmlBuilder& builder, const ByName& item) {
  writeElement(builder, u"Name", item.text(u"Name"));
  writeElementIfSet(builder, u"IsActive", item.text(u"IsActive"));
}

void writeRefIfSet(DroXmlBuilder& builder, const ByName& item, TextView name) {
  writeReferenceIfSet(builder, name, item.object(name));
}

// The "SalesOrPurchase" aggregate. The service item writes its account as an empty
// element followed by the reference's child, and closes once more than it opened: the
// requests services have always sent.
void writeSalesOrPurchase(DroXmlBuilder& builder, const ByName& side, bool serviceForm) {
  builder.AddAggregateBegin(builder.CreateElement(u"SalesOrPurchase"));
  writeElementIfSet(builder, u"Desc", side.text(u"Desc"));
  const Text price = side.text(u"Price");
  const Text percent = side.text(u"PricePercent");
  if (!price.empty()) {
    writeElement(builder, u"Price", price);
  } else if (!percent.empty()) {
    writeElement(builder, u"PricePercent", percent);
  }
  const ByName account = side.object(u"AccountRef");
  if (serviceForm) {
    builder.AddElement(builder.CreateElement(u"AccountRef"));
    internal::writeListIdOrFullName(builder, account);
    builder.AddAggregateEnd();
  } else {
    writeReference(builder, u"AccountRef", account);
  }
  builder.AddAggregateEnd();
}

void writeSalesAndPurchase(DroXmlBuilder& builder, const ByName& side) {
  builder.AddAggregateBegin(builder.CreateElement(u"SalesAndPurchase"));
  writeElementIfSet(builder, u"SalesDesc", side.text(u"SalesDesc"));
  writeElementIfSet(builder, u"SalesPrice", side.text(u"SalesPrice"));
  writeReference(builder, u"IncomeAccountRef", side.object(u"IncomeAccountRef"));
  writeElementIfSet(builder, u"PurchaseDesc", side.text(u"PurchaseDesc"));
  writeElementIfSet(builder, u"PurchaseCost", side.text(u"PurchaseCost"));
  writeReference(builder, u"ExpenseAccountRef", side.object(u"ExpenseAccountRef"));
  writeRefIfSet(builder, side, u"PrefVendorRef");
  builder.AddAggregateEnd();
}

// The sales side of the non-inventory, other-charge and service kinds: the sales-or-purchase
// side when it holds anything, otherwise the sales-and-purchase side, even when empty.
void writeSalesSide(DroXmlBuilder& builder, const ByName& item, bool salesOrPurchaseSet,
                    bool serviceForm) {
  if (salesOrPurchaseSet) {
    writeSalesOrPurchase(builder, item.object(u"SalesOrPurchase"), serviceForm);
  } else {
    writeSalesAndPurchase(builder, item.object(u"SalesAndPurchase"));
  }
}

void buildNonInventory(DroXmlBuilder& builder, DroItemNonInventory& item) {
  const ByName named(item.shared_from_this());
  openItemAdd(builder, u"ItemNonInventory", named);
  writeElement(builder, u"Name", item.Name());
  writeElementIfSet(builder, u"IsActive", item.IsActive());
  writeReferenceIfSet(builder, u"ParentRef", *item.ParentRef());
  writeReferenceIfSet(builder, u"SalesTaxCodeRef", *item.SalesTaxCodeRef());
  const DroSalesOrPurchase& side = *item.SalesOrPurchase();
  const bool set = !side.Desc().empty() || !side.Price().empty() || !side.PricePercent().empty() ||
                   !side.AccountRef()->ListID().empty() || !side.AccountRef()->FullName().empty();
  writeSalesSide(builder, named, set, false);
  closeItemAdd(builder);
}

// Other charges and services.
void buildSalesItem(DroXmlBuilder& builder, TextView kind, const ByName& item, bool service) {
  openItemAdd(builder, kind, item);
  writeNameAndActive(builder, item);
  writeRefIfSet(builder, item, u"ParentRef");
  writeRefIfSet(builder, item, u"SalesTaxCodeRef");
  writeSalesSide(builder, item, !item.object(u"SalesOrPurchase").IsEmpty(), service);
  closeItemAdd(builder);
}

void buildInventory(DroXmlBuilder& builder, const ByName& item) {
  openItemAdd(builder, u"ItemInventory", item);
  writeNameAndActive(builder, item);
  writeRefIfSet(builder, item, u"ParentRef");
  writeRefIfSet(builder, item, u"SalesTaxCodeRef");
  writeElementIfSet(builder, u"SalesDesc", item.text(u"SalesDesc"));
  writeElementIfSet(builder, u"SalesPrice", item.text(u"SalesPrice"));
  writeReference(builder, u"IncomeAccountRef", item.object(u"IncomeAccountRef"));
  writeElementIfSet(builder, u"PurchaseDesc", item.text(u"PurchaseDesc"));
  writeElementIfSet(builder, u"PurchaseCost", item.text(u"PurchaseCost"));
  writeReference(builder, u"COGSAccountRef", item.object(u"COGSAccountRef"));
  writeRefIfSet(builder, item, u"PrefVendorRef");
  writeReference(builder, u"AssetAccountRef", item.object(u"AssetAccountRef"));
  writeElementIfSet(builder, u"ReorderPoint", item.text(u"ReorderPoint"));
  closeItemAdd(builder);
}

void buildSubtotal(DroXmlBuilder& builder, const ByName& item) {
  openItemAdd(builder, u"ItemSubtotal", item);
  writeNameAndActive(builder, item);
  writeElementIfSet(builder, u"ItemDesc", item.text(u"ItemDesc"));
  closeItemAdd(builder);
}

void buildDiscount(DroXmlBuilder& builder, const ByName& item) {
  openItemAdd(builder, u"ItemDiscount", item);
  writeNameAndActive(builder, item);
  writeRefIfSet(builder, item, u"ParentRef");
  writeElementIfSet(builder, u"ItemDesc", item.text(u"ItemDesc"));
  writeRefIfSet(builder, item, u"SalesTaxCodeRef");
  // Both rate elements go out when both are set.
  writeElementIfSet(builder, u"DiscountRate", item.text(u"DiscountRate"));
  writeElementIfSet(builder, u"DiscountRatePercent", item.text(u"DiscountRatePercent"));
  writeRefIfSet(builder, item, u"AccountRef");
  closeItemAdd(builder);
}

void buildGroup(DroXmlBuilder& builder, const ByName& item) {
  openItemAdd(builder, u"ItemGroup", item);
  writeNameAndActive(builder, item);
  writeElementIfSet(builder, u"ItemDesc", item.text(u"ItemDesc"));
  // "Item" in the singular: the element name groups have always been sent with.
  writeElementIfSet(builder, u"IsPrintItemInGroup", item.text(u"IsPrintItemsInGroup"));
  // Each member line is an "ItemRef" aggregate that also holds the quantity; lines without
  // an item are left out, whatever their quantity.
  item.object(u"ItemGroupLines").forEach([&](const Variant& member) {
    const ByName line(member.toObject());
    const ByName ref = line.object(u"ItemRef");
    if (ref.IsEmpty()) return;
    builder.AddAggregateBegin(builder.CreateElement(u"ItemRef"));
    internal::writeListIdOrFullName(builder, ref);
    writeElementIfSet(builder, u"Quantity", line.text(u"Quantity"));
    builder.AddAggregateEnd();
  });
  closeItemAdd(builder);
}

void buildPayment(DroXmlBuilder& builder, const ByName& item) {
  openItemAdd(builder, u"ItemPayment", item);
  writeNameAndActive(builder, item);
  // "IremDesc" is what payment items have always been sent with.
  writeElementIfSet(builder, u"IremDesc", item.text(u"ItemDesc"));
  writeRefIfSet(builder, item, u"DepositToAccountRef");
  writeRefIfSet(builder, item, u"PaymentMethodRef");
  closeItemAdd(builder);
}

void buildSalesTax(DroXmlBuilder& builder, const ByName& item) {
  openItemAdd(builder, u"ItemSalesTax", item);
  writeNameAndActive(builder, item);
  writeElementIfSet(builder, u"ItemDesc", item.text(u"ItemDesc"));
  writeElementIfSet(builder, u"TaxRate", item.text(u"TaxRate"));
  writeRefIfSet(builder, item, u"TaxVendorRef");
  closeItemAdd(builder);
}

void buildSalesTaxGroup(DroXmlBuilder& builder, const ByName& item) {
  openItemAdd(builder, u"ItemSalesTaxGroup", item);
  writeNameAndActive(builder, item);
  writeElementIfSet(builder, u"ItemDesc", item.text(u"ItemDesc"));
  // The members are taken as references: an item record among them (all the items
  // collection can create) is the runtime's 13 here.
  item.object(u"ItemSalesTaxRefs").forEach([&](const Variant& member) {
    const auto ref = member.toObjectOf<DroItemSalesTaxRef>();
    if (!ref) raiseRuntimeError(RuntimeError::kObjectNotSet);
    writeReferenceIfSet(builder, u"ItemSalesTaxRef", *ref);
  });
  closeItemAdd(builder);
}

}  // namespace

void DroXmlBuilder::BuildAddItem(udItemType ItemType, const Variant& Item) {
  if (ItemType == udItemNonInventory) {
    // The class is checked before anything is written.
    const auto item = Item.toObjectOf<DroItemNonInventory>();
    if (!item) raiseRuntimeError(RuntimeError::kObjectNotSet);
    buildNonInventory(*this, *item);
    return;
  }
  switch (ItemType) {
    case udItemSubtotal:
      return buildSubtotal(*this, ByName(Item.toObject()));
    case udItemInventory:
      return buildInventory(*this, ByName(Item.toObject()));
    case udItemDiscount:
      return buildDiscount(*this, ByName(Item.toObject()));
    case udItemGroup:
      return buildGroup(*this, ByName(Item.toObject()));
    case udItemOtherCharge:
      return buildSalesItem(*this, u"ItemOtherCharge", ByName(Item.toObject()), false);
    case udItemPayment:
      return buildPayment(*this, ByName(Item.toObject()));
    case udItemSalesTax:
      return buildSalesTax(*this, ByName(Item.toObject()));
    case udItemSalesTaxGroup:
      return buildSalesTaxGroup(*this, ByName(Item.toObject()));
    case udItemService:
      return buildSalesItem(*this, u"ItemService", ByName(Item.toObject()), true);
    default:
      return;  // payroll wage items, udUnknown and anything else: nothing is built
  }
}

}  // namespace droqbxml
