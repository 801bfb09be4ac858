// The facade over the builder, the wrapper and the shared values.
#include "droqbxml/component/DroXmlProcessor.hpp"

#include <memory>
#include <utility>

#include "droqbxml/component/basGlobals.hpp"
#include "droqbxml/diagnostics/Logs.hpp"
#include "droqbxml/runtime/Binding.hpp"

namespace droqbxml {

DroXmlProcessor::DroXmlProcessor() { Class_Initialize(); }

DroXmlProcessor::~DroXmlProcessor() { Class_Terminate(); }

const ClassInfo& DroXmlProcessor::typeInfo() {
  using P = DroXmlProcessor;
  static const ClassInfo info(u"DroXmlProcessor",
                              Members()
                                  .property(u"XML", &P::XML, &P::XML)
                                  .property(u"API", &P::API, &P::API)
                                  .property(u"qbXMLItemsCol", &P::qbXMLItemsCol, &P::qbXMLItemsCol)
                                  .property(u"DroPath", &P::DroPath, &P::DroPath)
                                  .method(u"Class_Initialize", &P::Class_Initialize)
                                  .method(u"Class_Terminate", &P::Class_Terminate)
                                  .property(u"MyErr", &P::MyErr, &P::MyErr)
                                  .take());
  return info;
}

Ref<Object> DroXmlProcessor::qbXMLItemsCol() const { return basGlobals::ItemsColAccess(); }

void DroXmlProcessor::qbXMLItemsCol(Ref<Object> value) {
  basGlobals::ItemsColAccess(Variant(std::move(value)));
}

Text DroXmlProcessor::DroPath() const { return basGlobals::DroPathAccess(); }

void DroXmlProcessor::DroPath(const Text& value) { basGlobals::DroPathAccess(Variant(value)); }

void DroXmlProcessor::Class_Initialize() {
  // Every creation resets the path, even one the host set before (hosts rely on this).
  basGlobals::DroPathAccess(Variant(kDefaultInstallPath));
  xml_ = std::make_shared<DroXmlBuilder>();
  api_ = std::make_shared<DroXmlSdkWrapper>();
}

void DroXmlProcessor::Class_Terminate() {
  xml_.reset();
  api_.reset();
}

Ref<clsMyErr> DroXmlProcessor::MyErr() const { return basGlobals::SharedErrorObject(); }

void DroXmlProcessor::MyErr(Ref<clsMyErr> value) {
  basGlobals::SharedErrorObject(std::move(value));
}

}  // namespace droqbxml
