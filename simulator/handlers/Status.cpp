// QuickBooks' status texts, word for word: the two spaces after full stops inside the
// messages and the space after the conversion message are QuickBooks' own.
#include "simulator/handlers/Status.hpp"

namespace droqbxml::simulator::handlers::status {
namespace {

constexpr std::string_view kMissingRecord =
    "QuickBooks error message: Invalid argument.  The specified record does not exist in the "
    "list.";

std::string quoted(std::string_view value) { return "\"" + std::string(value) + "\""; }

Status error(int code, std::string message) { return Status{code, "Error", std::move(message)}; }

}  // namespace

Status ok() { return Status{}; }

Status noMatch() {
  return Status{1, "Info", "A query request did not find a matching object in QuickBooks"};
}

Status notFound(std::string_view value) {
  return Status{500, "Warn",
                "The query request has not been fully completed. There was a required element (" +
                    quoted(value) + ") that could not be found in QuickBooks."};
}

// Intuit's published status codes list 1030, "Unsupported message", with this text.
Status unsupported() {
  return error(1030, "This request is not supported by this implementation.");
}

Status conversion(std::string_view kindWord, std::string_view value, std::string_view field) {
  return error(3040, "There was an error when converting the " + std::string(kindWord) + " " +
                         quoted(value) + " in the field " + quoted(field) + ". ");
}

Status tooLong(std::string_view value, std::string_view field) {
  return error(3070,
               "The string " + quoted(value) + " in the field " + quoted(field) + " is too long.");
}

Status nameInUse(std::string_view name) {
  return error(3100, "The name " + quoted(name) + " of the list element is already in use.");
}

Status invalidReference(std::string_view list, std::string_view value, std::string_view object) {
  return error(3140, "There is an invalid reference to QuickBooks " + std::string(list) + " " +
                         quoted(value) + " in the " + std::string(object) + ".  " +
                         std::string(kMissingRecord));
}

Status taxCodeWithoutSalesTax(std::string_view lineItem, std::string_view value,
                              std::string_view object) {
  return error(3140, "There is an invalid reference to QuickBooks " + std::string(lineItem) +
                         " SalesTaxCode " + quoted(value) + " in the " + std::string(object) +
                         ".  QuickBooks error message: You can't set taxable if Sales tax is "
                         "turned off or the item is not a taxable item type.");
}

}  // namespace droqbxml::simulator::handlers::status
