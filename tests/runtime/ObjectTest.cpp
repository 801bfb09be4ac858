// Late binding: member tables built from typed members, names in any case, in/out
// arguments, and the class factory.
#include <gtest/gtest.h>

#include "droqbxml/component/ClassFactory.hpp"
#include "droqbxml/runtime/Binding.hpp"
#include "droqbxml/runtime/Object.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

using test::raisesRuntime;

class Counter final : public Object {
 public:
  static const ClassInfo& typeInfo() {
    static const ClassInfo info(u"Counter", Members()
                                                .property(u"Name", &Counter::Name, &Counter::Name)
                                                .getter(u"Doubled", &Counter::Doubled)
                                                .property(u"Next", &Counter::Next, &Counter::Next)
                                                .method(u"Bump", &Counter::Bump)
                                                .take());
    return info;
  }
  const ClassInfo& classInfo() const override { return typeInfo(); }

  Text Name() const { return name_; }
  void Name(const Text& value) { name_ = value; }
  int32_t Doubled(int16_t index) const { return index * 2; }
  Ref<Counter> Next() const { return next_; }
  void Next(Ref<Counter> value) { next_ = std::move(value); }
  // Adds `by` (default 1 when left out by name: 0 means 1) to `value` in place.
  bool Bump(int32_t& value, int32_t by) {
    value += by == 0 ? 1 : by;
    return value > 10;
  }

 private:
  Text name_;
  Ref<Counter> next_;
};

TEST(ObjectTest, ReachesMembersByNameInAnyCaseAndWritesInOutArgumentsBack) {
  auto counter = std::make_shared<Counter>();
  counter->let(u"NAME", u"x");
  EXPECT_EQ(counter->Name(), u"x");
  EXPECT_EQ(counter->get(u"name").toText(), u"x");
  EXPECT_EQ(counter->get(u"Doubled", {Variant(u"21")}).toLong(), 42);
  EXPECT_EQ(counter->memberId(u"bump"), counter->memberId(u"Bump"));

  auto next = std::make_shared<Counter>();
  counter->set(u"Next", Variant(next));
  EXPECT_EQ(counter->Next(), next);
  EXPECT_EQ(counter->get(u"Next").toObjectOf<Counter>(), next);
  std::vector<Variant> args{Variant(9), Variant(2)};
  EXPECT_TRUE(counter->invoke(u"Bump", MemberKind::Method, args).toBoolean());
  EXPECT_EQ(args[0].toLong(), 11);
  std::vector<Variant> one{Variant(1)};
  EXPECT_FALSE(counter->invoke(u"Bump", MemberKind::Method, one).toBoolean());
  EXPECT_EQ(one[0].toLong(), 2);
}

TEST(ObjectTest, RefusesUnknownMembersKindsAndArguments) {
  auto counter = std::make_shared<Counter>();
  EXPECT_TRUE(raisesRuntime([&] { counter->get(u"Nope"); }, RuntimeError::kMemberNotSupported));
  EXPECT_TRUE(
      raisesRuntime([&] { counter->let(u"Doubled", 3); }, RuntimeError::kMemberNotSupported));
  EXPECT_TRUE(raisesRuntime([&] { counter->let(u"Next", Variant(counter)); },
                            RuntimeError::kMemberNotSupported));
  EXPECT_TRUE(
      raisesRuntime([&] { counter->set(u"Next", Variant(u"text")); }, RuntimeError::kTypeMismatch));
  EXPECT_TRUE(
      raisesRuntime([&] { counter->let(u"Name", Variant(counter)); }, RuntimeError::kTypeMismatch));
  EXPECT_TRUE(test::raises(
      [&] {
        counter->call(u"Bump", {1, 2, 3});
      },
      450, u"DroQbXml", u"Wrong number of arguments or invalid property assignment"));
}

TEST(ClassFactoryTest, CreatesEveryRegisteredClassByProgId) {
  for (const auto& progId : RegisteredProgIds()) {
    const auto object = CreateObject(progId);
    ASSERT_NE(object, nullptr);
    EXPECT_EQ(u"DroQbXml." + object->className(), progId);
  }
  EXPECT_EQ(CreateObject(u"droqbxml.CLSMYERR")->className(), u"clsMyErr");
  for (const char16_t* unknown : {u"DroQbXml.Nope", u"Other.clsMyErr", u"clsMyErr", u""}) {
    EXPECT_TRUE(raisesRuntime([&] { CreateObject(unknown); }, RuntimeError::kCantCreateObject));
  }
}

}  // namespace
}  // namespace droqbxml
