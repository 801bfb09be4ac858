// The base of every public class, and late binding: each class publishes a member table
// (name, kind, call taking and returning Variants) built once from the typed C++ members.
// Names map to member ids without regard to ASCII case, as automation clients expect;
// invoke then dispatches on the id. An unknown name or a kind the member lacks is 438.
#ifndef DROQBXML_RUNTIME_OBJECT_HPP_
#define DROQBXML_RUNTIME_OBJECT_HPP_

#include <cstdint>
#include <functional>
#include <memory>
#include <span>
#include <unordered_map>
#include <vector>

#include "droqbxml/runtime/Ref.hpp"
#include "droqbxml/runtime/Text.hpp"
#include "droqbxml/runtime/Variant.hpp"

namespace droqbxml {

// How a member is reached: property get, property let (a value), property set (an
// object), or a method call.
enum class MemberKind : uint8_t { Get, Let, Set, Method };

// Arguments of a late-bound call, in order; for a let or set the new value comes last.
// In/out arguments are written back into their slot.
using Arguments = std::span<Variant>;
using MemberCall = std::function<Variant(Object& self, Arguments args)>;

// What a member's call returns and takes, as the type library describes it: the value
// kinds of the automation platform, an argument passed by reference being in/out.
enum class ValueType : uint8_t { None, Text, Boolean, Short, Long, Double, Any, Object, Unknown };
struct ParamShape {
  ValueType type = ValueType::Any;
  bool inOut = false;
  bool optional = false;
};
struct Shape {
  ValueType result = ValueType::Any;
  std::vector<ParamShape> params;
};

struct MemberBinding {
  Text name;
  MemberKind kind;
  MemberCall call;
  Shape shape;
};

// A class's name and member table: the class's entry of the component's type library.
class ClassInfo {
 public:
  ClassInfo(Text className, std::vector<MemberBinding> members);

  const Text& className() const noexcept { return className_; }
  // The id of a member name (any ASCII case), or -1 when there is none.
  int32_t findMember(TextView name) const;
  const Text& memberName(int32_t id) const;
  int32_t memberCount() const noexcept { return static_cast<int32_t>(members_.size()); }
  bool hasKind(int32_t id, MemberKind kind) const;
  // The shape of a member's call of that kind (hasKind first).
  const Shape& shape(int32_t id, MemberKind kind) const;
  Variant invoke(Object& self, int32_t id, MemberKind kind, Arguments args) const;

 private:
  struct Member {
    Text name;
    MemberCall calls[4];
    Shape shapes[4];
  };
  Text className_;
  std::vector<Member> members_;
  std::unordered_map<Text, int32_t> ids_;  // upper-case name to id
};

class Object : public std::enable_shared_from_this<Object> {
 public:
  virtual ~Object() = default;

  virtual const ClassInfo& classInfo() const = 0;
  const Text& className() const { return classInfo().className(); }

  // The id of a member; 438 when the class has no member of that name.
  int32_t memberId(TextView name) const;
  Variant invoke(int32_t id, MemberKind kind, Arguments args);
  Variant invoke(TextView name, MemberKind kind, Arguments args);

  // Conveniences over invoke for hosts and tests.
  Variant get(TextView name, std::vector<Variant> args = {});
  void let(TextView name, Variant value);
  void set(TextView name, Variant object);
  Variant call(TextView name, std::vector<Variant> args = {});

 protected:
  Object() = default;
  Object(const Object&) = default;
  Object& operator=(const Object&) = default;
};

}  // namespace droqbxml

#endif  // DROQBXML_RUNTIME_OBJECT_HPP_
