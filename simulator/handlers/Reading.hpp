// Reading the aggregates of a request into fields, as QuickBooks takes them in: numbers
// converted (3040 when they cannot be), text reduced to ISO-8859-1, booleans in their written
// form, and every reference to a list entry resolved by ListID or FullName (3140 when it does
// not resolve). Each refusal raises a Refusal.
#ifndef DROQBXML_SIMULATOR_HANDLERS_READING_HPP_
#define DROQBXML_SIMULATOR_HANDLERS_READING_HPP_

#include <cstdint>
#include <initializer_list>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "simulator/RequestDocument.hpp"
#include "simulator/handlers/Catalog.hpp"
#include "simulator/handlers/Context.hpp"
#include "simulator/handlers/Fields.hpp"

namespace droqbxml::simulator::handlers {

// Refuses the request (3040) at the first number below `aggregate`, in document order, that
// QuickBooks cannot convert. QuickBooks converts a whole request before it looks anything up.
void checkNumbers(const XmlNode& aggregate);

// The text of a child element as QuickBooks keeps it, or the empty text.
std::string childText(const XmlNode& parent, std::string_view name);

// Which entries a reference may point at.
struct Target {
  std::optional<ListTable> table;   // none: a list this company file does not keep
  std::string_view list;            // how QuickBooks' message names the list: "Customer", ...
  std::vector<ItemKind> itemKinds;  // items only: the kinds allowed, empty for any
};

// What an ItemRef of a line or of a group's line may name: an item of any kind but a group.
Target lineItems();

class FieldReader {
 public:
  // `object` names what is read in QuickBooks' messages ("Customer", "Invoice line", ...);
  // `parent` is where a ParentRef points.
  FieldReader(Context& context, std::string_view object, std::optional<Target> parent = {});

  // Also refuses a SalesTaxCodeRef while sales tax is turned off, with the message QuickBooks
  // gives for transaction lines (`lineItem`: "InvoiceLineItem" or "EstimateLineItem").
  FieldReader& refuseTaxCodesWithoutSalesTax(std::string_view lineItem);
  // Resolves references named `element` among `target` instead of the usual list.
  FieldReader& target(std::string_view element, Target target);

  // The fields of the children of `aggregate`, except those named in `skip`.
  std::vector<Field> read(const XmlNode& aggregate,
                          std::initializer_list<std::string_view> skip = {});
  // One element as a field.
  Field read1(const XmlNode& element);
  // The row a reference element (ListID or FullName) points at.
  int64_t resolve(const XmlNode& reference);

 private:
  Target targetOf(std::string_view element) const;

  Context& context_;
  std::string object_;
  std::optional<Target> parent_;
  std::string lineItem_;
  std::vector<std::pair<std::string, Target>> targets_;
};

}  // namespace droqbxml::simulator::handlers

#endif  // DROQBXML_SIMULATOR_HANDLERS_READING_HPP_
