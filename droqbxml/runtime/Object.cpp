// Member tables and dispatch by id.
#include "droqbxml/runtime/Object.hpp"

#include <utility>

#include "droqbxml/runtime/ComError.hpp"

namespace droqbxml {
namespace {

size_t slot(MemberKind kind) { return static_cast<size_t>(kind); }

}  // namespace

ClassInfo::ClassInfo(Text className, std::vector<MemberBinding> members)
    : className_(std::move(className)) {
  for (auto& binding : members) {
    const Text key = upperAscii(binding.name);
    auto found = ids_.find(key);
    int32_t id = 0;
    if (found == ids_.end()) {
      id = static_cast<int32_t>(members_.size());
      ids_.emplace(key, id);
      members_.push_back(Member{std::move(binding.name), {}, {}});
    } else {
      id = found->second;
    }
    members_[static_cast<size_t>(id)].calls[slot(binding.kind)] = std::move(binding.call);
    members_[static_cast<size_t>(id)].shapes[slot(binding.kind)] = std::move(binding.shape);
  }
}

int32_t ClassInfo::findMember(TextView name) const {
  const auto found = ids_.find(upperAscii(name));
  return found == ids_.end() ? -1 : found->second;
}

const Text& ClassInfo::memberName(int32_t id) const {
  if (id < 0 || id >= memberCount()) raiseRuntimeError(RuntimeError::kMemberNotSupported);
  return members_[static_cast<size_t>(id)].name;
}

bool ClassInfo::hasKind(int32_t id, MemberKind kind) const {
  return id >= 0 && id < memberCount() &&
         static_cast<bool>(members_[static_cast<size_t>(id)].calls[slot(kind)]);
}

const Shape& ClassInfo::shape(int32_t id, MemberKind kind) const {
  if (id < 0 || id >= memberCount()) raiseRuntimeError(RuntimeError::kMemberNotSupported);
  return members_[static_cast<size_t>(id)].shapes[slot(kind)];
}

Variant ClassInfo::invoke(Object& self, int32_t id, MemberKind kind, Arguments args) const {
  if (id < 0 || id >= memberCount()) raiseRuntimeError(RuntimeError::kMemberNotSupported);
  const auto& member = members_[static_cast<size_t>(id)];
  const MemberCall* call = &member.calls[slot(kind)];
  // Automation clients ask for "get or call" together: a property get may reach a method
  // and a method call may reach a property get.
  if (!*call && kind == MemberKind::Get) call = &member.calls[slot(MemberKind::Method)];
  if (!*call && kind == MemberKind::Method) call = &member.calls[slot(MemberKind::Get)];
  if (!*call) raiseRuntimeError(RuntimeError::kMemberNotSupported);
  return (*call)(self, args);
}

int32_t Object::memberId(TextView name) const {
  const int32_t id = classInfo().findMember(name);
  if (id < 0) raiseRuntimeError(RuntimeError::kMemberNotSupported);
  return id;
}

Variant Object::invoke(int32_t id, MemberKind kind, Arguments args) {
  return classInfo().invoke(*this, id, kind, args);
}

Variant Object::invoke(TextView name, MemberKind kind, Arguments args) {
  return invoke(memberId(name), kind, args);
}

Variant Object::get(TextView name, std::vector<Variant> args) {
  return invoke(name, MemberKind::Get, args);
}

void Object::let(TextView name, Variant value) {
  Variant args[] = {std::move(value)};
  invoke(name, MemberKind::Let, args);
}

void Object::set(TextView name, Variant object) {
  Variant args[] = {std::move(object)};
  invoke(name, MemberKind::Set, args);
}

Variant Object::call(TextView name, std::vector<Variant> args) {
  return invoke(name, MemberKind::Method, args);
}

}  // namespace droqbxml
