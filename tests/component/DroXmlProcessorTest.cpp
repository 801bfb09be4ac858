// The facade: what a new one holds and how it shares the per-thread values.
#include <gtest/gtest.h>

#include <thread>

#include "droqbxml/component/ClassFactory.hpp"
#include "droqbxml/component/DroXmlProcessor.hpp"
#include "droqbxml/component/basGlobals.hpp"
#include "droqbxml/runtime/Binding.hpp"
#include "tests/TestSupport.hpp"
#include "tests/connection/FakeProcessor.hpp"

namespace droqbxml {
namespace {

class ItemsColStandIn final : public Object {
 public:
  static const ClassInfo& typeInfo() {
    static const ClassInfo info(u"DroItemsCol", Members().take());
    return info;
  }
  const ClassInfo& classInfo() const override { return typeInfo(); }
};

template <class F>
void onFreshThread(F body) {
  std::thread(body).join();
}

// A new facade holds a fresh builder and wrapper and resets the shared path; the items
// collection and the error object it shares outlive it.
TEST(DroXmlProcessorTest, NewFacadeResetsThePathAndSharesTheThreadsValues) {
  onFreshThread([] {
    auto items = std::make_shared<ItemsColStandIn>();
    Ref<clsMyErr> err;
    {
      DroXmlProcessor facade;
      EXPECT_EQ(facade.XML()->XML(), u"");
      EXPECT_EQ(facade.qbXMLItemsCol(), nullptr);
      facade.DroPath(u" D:\\Apps ");
      EXPECT_EQ(facade.DroPath(), u" D:\\Apps ");
      DroXmlProcessor second;
      EXPECT_EQ(facade.DroPath(), u"C:\\Program Files\\Orvanne\\Tessaly");
      facade.qbXMLItemsCol(items);
      facade.qbXMLItemsCol(std::make_shared<clsMyErr>());  // another class: ignored
      EXPECT_EQ(facade.qbXMLItemsCol(), items);
      err = facade.MyErr();
      EXPECT_EQ(facade.MyErr(), err);
      facade.Class_Terminate();
      EXPECT_EQ(facade.XML(), nullptr);
      EXPECT_EQ(facade.API(), nullptr);
    }
    EXPECT_EQ(basGlobals::ItemsColAccess(), items);
    EXPECT_EQ(basGlobals::SharedErrorObject(), err);
    DroXmlProcessor facade;
    auto replacement = std::make_shared<clsMyErr>();
    facade.MyErr(replacement);
    EXPECT_EQ(basGlobals::SharedErrorObject(), replacement);
  });
}

TEST(DroXmlProcessorTest, ReachableByName) {
  test::FakeProcessorRegistration registration;
  const auto facade = CreateObject(u"DroQbXml.DroXmlProcessor");
  const auto builder = facade->get(u"XML").toObject();
  builder->call(u"BuildQueryByAll", {0});
  const auto api = facade->get(u"api").toObject();
  api->let(u"CompanyFilePath", u"C:\\co.qbw");
  api->call(u"ConnectionOpen");
  api->call(u"SessionBegin");
  api->call(u"ProcessRequest", {builder->get(u"XML")});
  EXPECT_EQ(api->get(u"ResponseStatus").toLong(), RSSuccess);
  EXPECT_EQ(facade->get(u"DroPath").toText(), u"C:\\Program Files\\Orvanne\\Tessaly");
  EXPECT_EQ(facade->get(u"MyErr").toObject()->className(), u"clsMyErr");
}

}  // namespace
}  // namespace droqbxml
