// The type library written from the member tables.
#include "com/typelib/TypeLibrary.hpp"

#include <algorithm>
#include <cstdio>
#include <span>
#include <utility>
#include <vector>

#include "droqbxml/component/ClassFactory.hpp"
#include "droqbxml/diagnostics/ErrorNumbers.hpp"
#include "droqbxml/diagnostics/clsTrace.hpp"
#include "droqbxml/qbxml/Enumerations.hpp"
#include "droqbxml/runtime/Utf.hpp"

namespace droqbxml::com {
namespace {

struct EnumValue {
  const char* name;
  int32_t value;
};
struct Enumeration {
  const char* name;
  std::vector<EnumValue> values;
};

// The enumerations hosts see, with the values of the C++ enumerations.
std::vector<Enumeration> enumerations() {
  std::vector<Enumeration> all{
      {"udEntityType",
       {{"udEtCustomer", udEtCustomer},
        {"udEtjob", udEtjob},
        {"udEtEstimate", udEtEstimate},
        {"udEtInvoice", udEtInvoice},
        {"udEtItem", udEtItem},
        {"udEtItemNonInv", udEtItemNonInv},
        {"udEtItemOther", udEtItemOther},
        {"udEtAccount", udEtAccount},
        {"udEtItemInv", udEtItemInv}}},
      {"udItemType",
       {{"udUnknown", udUnknown},
        {"udItemNonInventory", udItemNonInventory},
        {"udItemSubtotal", udItemSubtotal},
        {"udItemInventory", udItemInventory},
        {"udItemDiscount", udItemDiscount},
        {"udItemGroup", udItemGroup},
        {"udItemOtherCharge", udItemOtherCharge},
        {"udItemPayment", udItemPayment},
        {"udItemSalesTax", udItemSalesTax},
        {"udItemSalesTaxGroup", udItemSalesTaxGroup},
        {"udItemService", udItemService},
        {"udItemPayrollItemWage", udItemPayrollItemWage}}},
      {"udActiveStatus",
       {{"udAsActiveOnly", udAsActiveOnly},
        {"udAsInactiveOnly", udAsInactiveOnly},
        {"udAsAll", udAsAll}}},
      {"udResponseStatus",
       {{"RSUnknown", RSUnknown},
        {"RSSuccess", RSSuccess},
        {"RSNoMatch", RSNoMatch},
        {"RSNotFound", RSNotFound},
        {"RSRefNotFound", RSRefNotFound},
        {"RSTaxErrorInvoice", RSTaxErrorInvoice},
        {"RSTaxErrorEstimate", RSTaxErrorEstimate},
        {"RSParsingError", RSParsingError},
        {"RSCoNameMismatch", RSCoNameMismatch},
        {"RSCantLogin", RSCantLogin},
        {"RSUnsetCoFile", RSUnsetCoFile}}},
      {"eudOutStreamStype", {{"eOutToDebug", eOutToDebug}, {"eOutToFile", eOutToFile}}},
      {"eudTraceFileAction", {{"eAppend", eAppend}, {"eOverWrite", eOverWrite}}},
  };
  Enumeration errors{"ERROR_NUMBER", {}};
  static std::vector<std::string> names;  // kept for the c_str()s below
  names.clear();
  names.reserve(kErrorNumberNames.size());
  for (const auto& entry : kErrorNumberNames) names.push_back(toUtf8(Text(entry.name)));
  for (size_t i = 0; i < kErrorNumberNames.size(); ++i) {
    errors.values.push_back({names[i].c_str(), kErrorNumberNames[i].value});
  }
  all.push_back(std::move(errors));
  return all;
}

struct ClassEntry {
  Text progId;
  Ref<Object> object;  // a fresh instance, for its member table
};

std::vector<ClassEntry> classes() {
  std::vector<ClassEntry> all;
  for (const Text& progId : RegisteredProgIds()) all.push_back({progId, CreateObject(progId)});
  return all;
}

const char* idlType(ValueType type) {
  switch (type) {
    case ValueType::Text:
      return "BSTR";
    case ValueType::Boolean:
      return "VARIANT_BOOL";
    case ValueType::Short:
      return "short";
    case ValueType::Long:
      return "long";
    case ValueType::Double:
      return "double";
    case ValueType::Object:
      return "IDispatch*";
    case ValueType::Unknown:
      return "IUnknown*";
    case ValueType::None:
    case ValueType::Any:
      break;
  }
  return "VARIANT";
}

// The kinds a member is reached by, in the library's order, with IDL's attribute for each.
constexpr std::array<std::pair<MemberKind, const char*>, 4> kKinds{{
    {MemberKind::Get, "propget"},
    {MemberKind::Let, "propput"},
    {MemberKind::Set, "propputref"},
    {MemberKind::Method, ""},
}};

// The INVOKEKIND of a kind, as ITypeInfo reports it.
int invokeKind(MemberKind kind) {
  switch (kind) {
    case MemberKind::Get:
      return 2;
    case MemberKind::Let:
      return 4;
    case MemberKind::Set:
      return 8;
    case MemberKind::Method:
      break;
  }
  return 1;
}

std::string upper(std::string text) {
  for (char& c : text) c = (c >= 'a' && c <= 'z') ? static_cast<char>(c - 32) : c;
  return text;
}

}  // namespace

Guid guidOf(const Text& name) {
  const auto hash = [&](uint64_t value) {
    for (const char16_t unit : name) {
      value ^= static_cast<uint64_t>(unit);
      value *= 1099511628211ULL;
    }
    return value;
  };
  const uint64_t high = hash(14695981039346656037ULL);
  const uint64_t low = hash(0x6a09e667f3bcc909ULL);
  Guid guid{};
  guid.data1 = static_cast<uint32_t>(high >> 32);
  guid.data2 = static_cast<uint16_t>(high >> 16);
  guid.data3 = static_cast<uint16_t>((high & 0x0FFF) | 0x5000);
  for (size_t i = 0; i < 8; ++i) guid.data4[i] = static_cast<uint8_t>(low >> (56 - 8 * i));
  guid.data4[0] = static_cast<uint8_t>((guid.data4[0] & 0x3F) | 0x80);
  return guid;
}

std::string guidText(const Guid& guid) {
  char text[40];
  std::snprintf(text, sizeof text, "%08X-%04X-%04X-%02X%02X-%02X%02X%02X%02X%02X%02X",
                static_cast<unsigned>(guid.data1), guid.data2, guid.data3, guid.data4[0],
                guid.data4[1], guid.data4[2], guid.data4[3], guid.data4[4], guid.data4[5],
                guid.data4[6], guid.data4[7]);
  return text;
}

Guid classIdOf(const Text& progId) { return guidOf(progId); }
Guid interfaceIdOf(const Text& className) { return guidOf(u"DroQbXml._" + className); }
Guid libraryId() { return guidOf(u"DroQbXml type library"); }

int32_t dispIdOf(const ClassInfo& info, int32_t id) {
  const Text& name = info.memberName(id);
  if (name == u"Item") return 0;
  if (name == u"NewEnum") return -4;
  return id + 1;
}

int32_t memberIdOf(const ClassInfo& info, int32_t dispId) {
  if (dispId == 0) return info.findMember(u"Item");
  if (dispId == -4) return info.findMember(u"NewEnum");
  const int32_t id = dispId - 1;
  if (id < 0 || id >= info.memberCount()) return -1;
  const Text& name = info.memberName(id);
  return name == u"Item" || name == u"NewEnum" ? -1 : id;
}

std::string idlSource() {
  std::string idl =
      "// The DroQbXml type library, written from the component's member tables.\n"
      "import \"oaidl.idl\";\n\n[uuid(" +
      guidText(libraryId()) +
      "), version(1.0), helpstring(\"DroQbXml: qbXML requests and responses\")]\n"
      "library DroQbXml\n{\n  importlib(\"stdole2.tlb\");\n\n";
  for (const Enumeration& enumeration : enumerations()) {
    idl += "  typedef enum " + std::string(enumeration.name) + " {\n";
    for (const EnumValue& value : enumeration.values) {
      idl += "    " + std::string(value.name) + " = " + std::to_string(value.value) + ",\n";
    }
    idl += "  } " + std::string(enumeration.name) + ";\n\n";
  }
  for (const ClassEntry& entry : classes()) {
    const ClassInfo& info = entry.object->classInfo();
    const std::string className = toUtf8(info.className());
    idl += "  [object, uuid(" + guidText(interfaceIdOf(info.className())) +
           "), dual, oleautomation, nonextensible]\n  interface _" + className + " : IDispatch {\n";
    for (int32_t id = 0; id < info.memberCount(); ++id) {
      const std::string name = toUtf8(info.memberName(id));
      const int32_t dispId = dispIdOf(info, id);
      for (const auto& [kind, attribute] : kKinds) {
        if (!info.hasKind(id, kind)) continue;
        const Shape& shape = info.shape(id, kind);
        std::string attributes = "id(" + std::to_string(dispId) + ")";
        if (*attribute != '\0') attributes += std::string(", ") + attribute;
        if (dispId == -4) attributes += ", restricted";
        std::string params;
        for (size_t i = 0; i < shape.params.size(); ++i) {
          const ParamShape& param = shape.params[i];
          params += params.empty() ? "" : ", ";
          const std::string argument = "arg" + std::to_string(i + 1);
          if (param.inOut) {
            params += "[in, out] VARIANT* " + argument;
          } else if (param.optional) {
            params += "[in, optional] VARIANT " + argument;
          } else {
            params += std::string("[in] ") + idlType(param.type) + " " + argument;
          }
        }
        if (shape.result != ValueType::None && kind != MemberKind::Let && kind != MemberKind::Set) {
          params += std::string(params.empty() ? "" : ", ") + "[out, retval] " +
                    idlType(shape.result) + "* result";
        }
        idl += "    [" + attributes + "] HRESULT " + (dispId == -4 ? "_NewEnum" : name) + "(" +
               params + ");\n";
      }
    }
    idl += "  };\n\n  [uuid(" + guidText(classIdOf(entry.progId)) + ")]\n  coclass " + className +
           " {\n    [default] interface _" + className + ";\n  };\n\n";
  }
  return idl + "}\n";
}

std::string listing() {
  std::vector<std::string> lines;
  for (const Enumeration& enumeration : enumerations()) {
    for (const EnumValue& value : enumeration.values) {
      lines.push_back("enum " + std::string(enumeration.name) + " " + value.name + " " +
                      std::to_string(value.value));
    }
  }
  for (const ClassEntry& entry : classes()) {
    const ClassInfo& info = entry.object->classInfo();
    const std::string interfaceName = "_" + toUtf8(info.className());
    for (int32_t id = 0; id < info.memberCount(); ++id) {
      const int32_t dispId = dispIdOf(info, id);
      for (const auto& [kind, attribute] : kKinds) {
        if (!info.hasKind(id, kind)) continue;
        const Shape& shape = info.shape(id, kind);
        const bool retval =
            shape.result != ValueType::None && kind != MemberKind::Let && kind != MemberKind::Set;
        const auto optional =
            std::count_if(shape.params.begin(), shape.params.end(),
                          [](const ParamShape& p) { return p.optional && !p.inOut; });
        lines.push_back(interfaceName + " " + std::to_string(dispId) + " " +
                        std::to_string(invokeKind(kind)) + " " +
                        upper(dispId == -4 ? "_NewEnum" : toUtf8(info.memberName(id))) + " " +
                        std::to_string(shape.params.size() + (retval ? 1 : 0)) + " " +
                        std::to_string(optional));
      }
    }
  }
  std::sort(lines.begin(), lines.end());
  std::string text;
  for (const std::string& line : lines) text += line + "\n";
  return text;
}

}  // namespace droqbxml::com
