// The status QuickBooks gives each response element (code, severity and message), every
// message text of the stand-in in one place, and the Refusal that carries an error status
// from deep inside a request back to the request boundary, where the request's transaction
// is rolled back and its response element written.
#ifndef DROQBXML_SIMULATOR_HANDLERS_STATUS_HPP_
#define DROQBXML_SIMULATOR_HANDLERS_STATUS_HPP_

#include <exception>
#include <string>
#include <string_view>
#include <utility>

namespace droqbxml::simulator::handlers {

struct Status {
  int code = 0;
  std::string_view severity = "Info";  // "Info", "Warn" or "Error"
  std::string message = "Status OK";

  bool isError() const { return severity == "Error"; }
};

namespace status {

Status ok();
// 1: a query filter matched nothing.
Status noMatch();
// 500: a query named a ListID, FullName, TxnID or RefNumber `value` that does not exist.
Status notFound(std::string_view value);
// 1030: a request type this QuickBooks does not support (for the stand-in: one it does
// not model).
Status unsupported();
// 3040: a number QuickBooks cannot convert (`kindWord`: amount, price, quantity, percentage).
Status conversion(std::string_view kindWord, std::string_view value, std::string_view field);
// 3070: a text longer than its field allows.
Status tooLong(std::string_view value, std::string_view field);
// 3100: the name of a new list entry is taken.
Status nameInUse(std::string_view name);
// 3140: a reference to `value` in the list `list` that does not resolve, in `object`.
Status invalidReference(std::string_view list, std::string_view value, std::string_view object);
// 3140: a line's sales tax code while sales tax is turned off (`lineItem`: InvoiceLineItem or
// EstimateLineItem; `object`: "Invoice line" or "Estimate line").
Status taxCodeWithoutSalesTax(std::string_view lineItem, std::string_view value,
                              std::string_view object);

}  // namespace status

// Raised by the request handlers when QuickBooks refuses the request being answered.
class Refusal : public std::exception {
 public:
  explicit Refusal(Status status) : status_(std::move(status)) {}
  const Status& status() const noexcept { return status_; }
  const char* what() const noexcept override { return status_.message.c_str(); }

 private:
  Status status_;
};

}  // namespace droqbxml::simulator::handlers

#endif  // DROQBXML_SIMULATOR_HANDLERS_STATUS_HPP_
