// The component's type library, written from the member tables of the late-binding surface:
// the IDL that widl compiles into the COM server, the GUIDs of its classes and interfaces
// (derived from their names, so they stay the same from build to build), and a listing of
// what the library describes, which the tests compare with the library read back on Windows.
// Portable C++: the IDL is written on Linux before the Windows build.
#ifndef DROQBXML_COM_TYPELIB_TYPELIBRARY_HPP_
#define DROQBXML_COM_TYPELIB_TYPELIBRARY_HPP_

#include <array>
#include <cstdint>
#include <string>

#include "droqbxml/runtime/Object.hpp"

namespace droqbxml::com {

// A GUID as its 16 bytes in the order of the GUID structure's fields.
struct Guid {
  uint32_t data1;
  uint16_t data2;
  uint16_t data3;
  std::array<uint8_t, 8> data4;
};
// A name-based GUID for `name`: the same name always gives the same GUID.
Guid guidOf(const Text& name);
// "8E5A4C11-3B2D-4F6A-9C7E-1D0B2A3F4E51" (no braces).
std::string guidText(const Guid& guid);

// What the library calls the class's class object and its default interface.
Guid classIdOf(const Text& progId);  // "DroQbXml.DroEstimate"
Guid interfaceIdOf(const Text& className);
Guid libraryId();

// The DISPID of a member: a collection's Item is the default member (0), NewEnum is the
// enumerator (-4, named "_NewEnum"), every other member its table id plus 1.
int32_t dispIdOf(const ClassInfo& info, int32_t id);
// The member id of a DISPID, -1 when there is none.
int32_t memberIdOf(const ClassInfo& info, int32_t dispId);

// The library's IDL source.
std::string idlSource();
// One line per enumeration value and per interface member as the library describes it:
// "interface memid kind name params optional", sorted; the Windows side writes the same
// from the compiled library.
std::string listing();

}  // namespace droqbxml::com

#endif  // DROQBXML_COM_TYPELIB_TYPELIBRARY_HPP_
