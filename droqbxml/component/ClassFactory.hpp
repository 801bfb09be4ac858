// The class factory: every public class can be created by its ProgID, "DroQbXml." + the
// class name (compared without regard to ASCII case, as ProgIDs are). An unknown ProgID is
// the platform's 429.
#ifndef DROQBXML_COMPONENT_CLASSFACTORY_HPP_
#define DROQBXML_COMPONENT_CLASSFACTORY_HPP_

#include <vector>

#include "droqbxml/runtime/Object.hpp"

namespace droqbxml {

Ref<Object> CreateObject(TextView progId);

// The ProgIDs of every creatable class, in the order of the type library.
std::vector<Text> RegisteredProgIds();

}  // namespace droqbxml

#endif  // DROQBXML_COMPONENT_CLASSFACTORY_HPP_
