// A host of the installed library: the umbrella header only. It escapes a text, builds a
// customer add request, creates a record by ProgID and reaches it by name, and catches an
// error the library raises; each result is one line that scripts/package-test.sh checks.
#include <iostream>
#include <memory>

#include "droqbxml/droqbxml.hpp"

using namespace droqbxml;

int main() {
  clsXmlStringEscaping escaper;
  std::cout << "escaped: " << toUtf8(escaper.XMLEscape(u"Smith & Sons <Plumbing>")) << "\n";

  auto customer = std::make_shared<DroCustomer>();
  customer->Name(u"Kim & Lee");
  DroXmlBuilder builder;
  builder.BuildAddCustomer(customer);
  std::cout << "request id: " << toUtf8(customer->RequestID()) << "\n";
  std::cout << "request:\n" << toUtf8(builder.XML()) << "\n";

  // The class factory and the member tables live in the library.
  Ref<Object> late = CreateObject(u"DroQbXml.DroCustomer");
  late->let(u"name", u"Late Bound Ltd");
  std::cout << "late-bound Name: " << toUtf8(late->get(u"Name").toText()) << "\n";

  // An error raised inside the library is caught here by its type.
  try {
    customer->Name(Text(42, u'x'));
    std::cout << "no error\n";
  } catch (const ComError& e) {
    std::cout << "error: " << e.number() << " from " << toUtf8(e.source()) << "\n";
  }
  return 0;
}
