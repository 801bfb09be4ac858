// What list and transaction queries share: the filters read from a query request, a WHERE
// clause built from them with its values, and the status rules of query answers (500 for a
// named entry that does not exist, 1 when nothing matches).
#ifndef DROQBXML_SIMULATOR_HANDLERS_QUERIES_HPP_
#define DROQBXML_SIMULATOR_HANDLERS_QUERIES_HPP_

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <variant>
#include <vector>

#include "simulator/RequestDocument.hpp"
#include "simulator/handlers/Response.hpp"
#include "simulator/handlers/Store.hpp"

namespace droqbxml::simulator::handlers {

// Conditions joined with AND, and the values of their parameters in order.
class Conditions {
 public:
  using Value = std::variant<int64_t, std::string>;

  Conditions& add(std::string condition, std::vector<Value> values = {});
  // " WHERE ..." or the empty text.
  std::string where() const;
  // Binds the values from parameter 1 on.
  void bind(Statement& statement) const;

 private:
  std::vector<std::string> conditions_;
  std::vector<Value> values_;
};

// The filters every query request may carry. A modified-date range may stand directly in the
// request (lists) or inside ModifiedDateRangeFilter (transactions); both ends are inclusive.
struct QueryFilter {
  std::optional<int64_t> maxReturned;
  std::optional<int64_t> fromModified;
  std::optional<int64_t> toModified;
  std::vector<std::string> includeRetElements;

  static QueryFilter read(const XmlNode& request);
  // Adds the modified-date conditions on column `modified`.
  void addTo(Conditions& conditions) const;
  // " LIMIT n" or the empty text.
  std::string limit() const;
  // `ret` holding only the elements IncludeRetElement names, when it names any.
  Field included(Field ret) const;
};

// Sets the status of an answer with its records: 500 naming `missing` when a named entry was
// not found, 1 when there are no records, OK otherwise.
void finishQuery(Answer& answer, const std::optional<std::string>& missing);

// "%" and "_" escaped with "\" for a LIKE pattern.
std::string likeEscaped(std::string_view text);

}  // namespace droqbxml::simulator::handlers

#endif  // DROQBXML_SIMULATOR_HANDLERS_QUERIES_HPP_
