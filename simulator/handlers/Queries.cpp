// Query filters and answers.
#include "simulator/handlers/Queries.hpp"

#include <algorithm>

#include "simulator/handlers/Clock.hpp"
#include "simulator/handlers/Values.hpp"

namespace droqbxml::simulator::handlers {

Conditions& Conditions::add(std::string condition, std::vector<Value> values) {
  conditions_.push_back(std::move(condition));
  values_.insert(values_.end(), values.begin(), values.end());
  return *this;
}

std::string Conditions::where() const {
  std::string text;
  for (const std::string& condition : conditions_) {
    text += text.empty() ? " WHERE " : " AND ";
    text += condition;
  }
  return text;
}

void Conditions::bind(Statement& statement) const {
  int index = 1;
  for (const Value& value : values_) {
    if (const auto* number = std::get_if<int64_t>(&value)) {
      statement.bind(index++, *number);
    } else {
      statement.bind(index++, std::get<std::string>(value));
    }
  }
}

QueryFilter QueryFilter::read(const XmlNode& request) {
  QueryFilter filter;
  if (const XmlNode* max = request.child("MaxReturned")) {
    filter.maxReturned = std::max<int64_t>(0, std::strtoll(max->text.c_str(), nullptr, 10));
  }
  const XmlNode* range = request.child("ModifiedDateRangeFilter");
  const XmlNode& dates = range != nullptr ? *range : request;
  if (const XmlNode* from = dates.child("FromModifiedDate");
      from != nullptr && !from->text.empty()) {
    filter.fromModified = parseDateTime(from->text, false);
  }
  if (const XmlNode* to = dates.child("ToModifiedDate"); to != nullptr && !to->text.empty()) {
    filter.toModified = parseDateTime(to->text, true);
  }
  for (const XmlNode* element : request.childrenNamed("IncludeRetElement")) {
    filter.includeRetElements.push_back(element->text);
  }
  return filter;
}

void QueryFilter::addTo(Conditions& conditions) const {
  if (fromModified) conditions.add("modified >= ?", {*fromModified});
  if (toModified) conditions.add("modified <= ?", {*toModified});
}

std::string QueryFilter::limit() const {
  return maxReturned ? " LIMIT " + std::to_string(*maxReturned) : std::string();
}

Field QueryFilter::included(Field ret) const {
  if (includeRetElements.empty()) return ret;
  std::erase_if(ret.children, [&](const Field& field) {
    return std::find(includeRetElements.begin(), includeRetElements.end(), field.name) ==
           includeRetElements.end();
  });
  return ret;
}

void finishQuery(Answer& answer, const std::optional<std::string>& missing) {
  if (missing) {
    answer.status = status::notFound(*missing);
  } else if (answer.count == 0) {
    answer.status = status::noMatch();
  }
}

std::string likeEscaped(std::string_view text) {
  std::string escaped;
  for (const char c : text) {
    if (c == '%' || c == '_' || c == '\\') escaped += '\\';
    escaped += c;
  }
  return escaped;
}

}  // namespace droqbxml::simulator::handlers
