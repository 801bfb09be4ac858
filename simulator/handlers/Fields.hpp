// The stand-in's one shape for the contents of a record: a tree of named fields holding
// values, aggregates and references to list entries. Requests are read into it, company files
// keep it (in a compact binary form), and responses are written from it.
#ifndef DROQBXML_SIMULATOR_HANDLERS_FIELDS_HPP_
#define DROQBXML_SIMULATOR_HANDLERS_FIELDS_HPP_

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace droqbxml::simulator::handlers {

// The lists a company file keeps; a reference field points at a row of one of them.
enum class ListTable : uint8_t { Customers = 1, Accounts = 2, Items = 3, SalesTaxCodes = 4 };

struct Field {
  enum class Kind : uint8_t { Value, Aggregate, Reference };

  std::string name;
  Kind kind = Kind::Value;
  std::string text;             // a value: as QuickBooks writes it
  std::vector<Field> children;  // an aggregate's fields, in schema order
  ListTable table{};            // a reference: the list and the row it points at
  int64_t row = 0;

  static Field value(std::string name, std::string text);
  static Field aggregate(std::string name, std::vector<Field> children);
  static Field reference(std::string name, ListTable table, int64_t row);

  // The first child of that name, or nullptr.
  const Field* child(std::string_view childName) const;
};

// The first field of that name among `fields`, or nullptr.
const Field* findField(const std::vector<Field>& fields, std::string_view name);
// The text of the first value field of that name, or the empty text.
std::string fieldText(const std::vector<Field>& fields, std::string_view name);
// Appends the value field `name` holding `text`, made where it is kept (records of a long list
// are built field by field).
void appendValue(std::vector<Field>& fields, std::string_view name, std::string text);
// Replaces every field of that name by `field`, or appends it when there is none.
void setField(std::vector<Field>& fields, Field field);
void removeField(std::vector<Field>& fields, std::string_view name);

// The compact form a company file keeps: element names as numbers of a fixed, append-only
// table (unknown names inline), lengths and rows as variable-length integers.
std::string encodeFields(const std::vector<Field>& fields);
// The inverse of encodeFields; a blob that is not one raises std::runtime_error. `room`: how
// many fields the caller is about to add.
std::vector<Field> decodeFields(std::string_view blob, size_t room = 0);

}  // namespace droqbxml::simulator::handlers

#endif  // DROQBXML_SIMULATOR_HANDLERS_FIELDS_HPP_
