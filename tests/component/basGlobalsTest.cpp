// The per-thread shared values.
#include <gtest/gtest.h>

#include <thread>

#include "droqbxml/component/basGlobals.hpp"
#include "droqbxml/diagnostics/clsMyErr.hpp"
#include "droqbxml/runtime/Binding.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

// Stand-ins for the items collection: only the class name matters.
template <const char16_t* Name>
class NamedObject final : public Object {
 public:
  static const ClassInfo& typeInfo() {
    static const ClassInfo info(Name, Members().take());
    return info;
  }
  const ClassInfo& classInfo() const override { return typeInfo(); }
};
constexpr char16_t kItemsCol[] = u"DroItemsCol";
constexpr char16_t kOtherCase[] = u"droItemsCol";

// Runs `body` on a new thread, which starts with fresh shared values.
template <class F>
void onFreshThread(F body) {
  std::thread(body).join();
}

TEST(basGlobalsTest, ItemsCollectionAcceptsOnlyTheExactClassName) {
  onFreshThread([] {
    EXPECT_EQ(basGlobals::ItemsColAccess(), nullptr);
    auto items = std::make_shared<NamedObject<kItemsCol>>();
    EXPECT_EQ(basGlobals::ItemsColAccess(Variant(items)), items);
    auto other = std::make_shared<NamedObject<kOtherCase>>();
    EXPECT_EQ(basGlobals::ItemsColAccess(Variant(other)), items);
    EXPECT_EQ(basGlobals::ItemsColAccess(Variant(u"DroItemsCol")), items);
    EXPECT_EQ(basGlobals::ItemsColAccess(Variant()), items);
  });
}

// The path is stored as given; the error object is created once per thread and can be
// replaced, though never by nothing.
TEST(basGlobalsTest, PathAndErrorObjectAreEachThreadsOwn) {
  onFreshThread([] {
    EXPECT_EQ(basGlobals::DroPathAccess(), u"");
    EXPECT_EQ(basGlobals::DroPathAccess(Variant(u" D:\\Apps ")), u" D:\\Apps ");
    EXPECT_EQ(basGlobals::DroPathAccess(), u" D:\\Apps ");
    EXPECT_EQ(basGlobals::DroPathAccess(Variant(12)), u"12");
    const auto first = basGlobals::SharedErrorObject();
    EXPECT_EQ(basGlobals::SharedErrorObject(), first);
    onFreshThread([&] {
      EXPECT_EQ(basGlobals::DroPathAccess(), u"");
      EXPECT_NE(basGlobals::SharedErrorObject(), first);
    });
    EXPECT_EQ(basGlobals::DroPathAccess(), u"12");
    auto replacement = std::make_shared<clsMyErr>();
    basGlobals::SharedErrorObject(replacement);
    EXPECT_EQ(basGlobals::SharedErrorObject(), replacement);
    basGlobals::SharedErrorObject(nullptr);
    EXPECT_NE(basGlobals::SharedErrorObject(), nullptr);
  });
}

}  // namespace
}  // namespace droqbxml
