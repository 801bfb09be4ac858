// The component's objects as COM automation objects: IDispatch over the member tables of
// the late-binding surface, IEnumVARIANT over a collection's NewEnum, and the conversions
// between VARIANTs and the component's values. Nothing here adds behaviour: a script sees
// what the C++ late-binding surface does, errors included (a ComError crosses as
// DISP_E_EXCEPTION with its number, source and description).
#ifndef DROQBXML_COM_DISPATCH_HPP_
#define DROQBXML_COM_DISPATCH_HPP_

#include <oaidl.h>
#include <windows.h>

#include <atomic>

#include "com/typelib/TypeLibrary.hpp"
#include "droqbxml/runtime/Object.hpp"

namespace droqbxml::com {

// COM objects alive and class-factory locks held, for DllCanUnloadNow.
std::atomic<long>& liveObjects();
std::atomic<long>& serverLocks();

// The platform's form of one of the type library's GUIDs.
GUID toGuid(const Guid& guid);

// A new automation object over `object` (one reference held by the caller).
IDispatch* dispatchFor(Ref<Object> object);

}  // namespace droqbxml::com

#endif  // DROQBXML_COM_DISPATCH_HPP_
