// DroXmlProcessor: the host's entry object. Creating one resets the shared installation
// path to the default and hands out a request builder (XML) and a connection wrapper (API);
// it also exposes the per-thread shared values: items collection, path and error object.
#ifndef DROQBXML_COMPONENT_DROXMLPROCESSOR_HPP_
#define DROQBXML_COMPONENT_DROXMLPROCESSOR_HPP_

#include "droqbxml/connection/DroXmlSdkWrapper.hpp"
#include "droqbxml/diagnostics/clsMyErr.hpp"
#include "droqbxml/qbxml/DroXmlBuilder.hpp"
#include "droqbxml/runtime/Object.hpp"

namespace droqbxml {

class DroXmlProcessor final : public Object {
 public:
  // Runs Class_Initialize.
  DroXmlProcessor();
  // Runs Class_Terminate.
  ~DroXmlProcessor() override;

  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  const Ref<DroXmlBuilder>& XML() const { return xml_; }
  void XML(Ref<DroXmlBuilder> value) { xml_ = std::move(value); }
  const Ref<DroXmlSdkWrapper>& API() const { return api_; }
  void API(Ref<DroXmlSdkWrapper> value) { api_ = std::move(value); }

  // The shared items collection (nothing until one is set). Only an object whose class
  // name is exactly "DroItemsCol" is stored; any other object is ignored without error.
  Ref<Object> qbXMLItemsCol() const;
  void qbXMLItemsCol(Ref<Object> value);

  // The shared installation path, stored as given (no trimming, no check).
  Text DroPath() const;
  void DroPath(const Text& value);

  // Resets the shared installation path to "C:\Program Files\Orvanne\Tessaly" (every
  // creation does, overwriting a path the host set before), then creates XML and API.
  void Class_Initialize();
  // Releases XML, then API; the shared values are left as they are.
  void Class_Terminate();

  // The shared error object, created on first use; set replaces it.
  Ref<clsMyErr> MyErr() const;
  void MyErr(Ref<clsMyErr> value);

 private:
  Ref<DroXmlBuilder> xml_;
  Ref<DroXmlSdkWrapper> api_;
};

}  // namespace droqbxml

#endif  // DROQBXML_COMPONENT_DROXMLPROCESSOR_HPP_
