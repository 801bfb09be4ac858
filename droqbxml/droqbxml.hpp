// DroQbXml: the umbrella header a host includes. Inside the library, include the headers
// a file really uses instead.
#ifndef DROQBXML_DROQBXML_HPP_
#define DROQBXML_DROQBXML_HPP_

#include "droqbxml/component/ClassFactory.hpp"
#include "droqbxml/component/basGlobals.hpp"
#include "droqbxml/diagnostics/ErrorNumbers.hpp"
#include "droqbxml/diagnostics/Logs.hpp"
#include "droqbxml/diagnostics/clsAppPathAccess.hpp"
#include "droqbxml/diagnostics/clsMyErr.hpp"
#include "droqbxml/diagnostics/clsTrace.hpp"
#include "droqbxml/qbxml/DroXmlBuilder.hpp"
#include "droqbxml/qbxml/DroXmlElement.hpp"
#include "droqbxml/qbxml/Enumerations.hpp"
#include "droqbxml/qbxml/XmlEscaping.hpp"
#include "droqbxml/qbxml/clsXmlStringEscaping.hpp"
#include "droqbxml/runtime/ComError.hpp"
#include "droqbxml/runtime/KeyedCollection.hpp"
#include "droqbxml/runtime/Object.hpp"
#include "droqbxml/runtime/Text.hpp"
#include "droqbxml/runtime/Utf.hpp"
#include "droqbxml/runtime/Variant.hpp"

#endif  // DROQBXML_DROQBXML_HPP_
