// Values shared by all of the component's objects on one thread: the host's items
// collection, the installation path and the shared error object. Each thread has its own
// copy; nothing is locked. The escaping entity table is an immutable table here too.
#ifndef DROQBXML_COMPONENT_BASGLOBALS_HPP_
#define DROQBXML_COMPONENT_BASGLOBALS_HPP_

#include <array>

#include "droqbxml/runtime/Object.hpp"
#include "droqbxml/runtime/Text.hpp"
#include "droqbxml/runtime/Variant.hpp"

namespace droqbxml {

class clsMyErr;

namespace basGlobals {

// Stores the argument as the shared items collection when it is an object whose class name
// is exactly "DroItemsCol"; anything else is ignored without error. Returns the stored
// collection (nothing until one is stored).
Ref<Object> ItemsColAccess(const Variant& value = Variant::missing());

// Stores the argument, as text and untrimmed, as the shared installation path when one is
// given; returns the stored path ("" until a facade or the host sets one).
Text DroPathAccess(const Variant& value = Variant::missing());

// The shared error object, created on first use.
Ref<clsMyErr> SharedErrorObject();
// Replaces the shared error object (an empty Ref makes the next use create a new one).
void SharedErrorObject(Ref<clsMyErr> replacement);

struct EntityRow {
  TextView entity;
  char16_t character;
};

// The five entities in the order unescaping replaces them; "&amp;" comes last so that
// "&amp;lt;" becomes "&lt;" and not "<".
inline constexpr std::array<EntityRow, 5> EntityTable{{
    {u"&apos;", u'\''},
    {u"&quot;", u'"'},
    {u"&lt;", u'<'},
    {u"&gt;", u'>'},
    {u"&amp;", u'&'},
}};

}  // namespace basGlobals
}  // namespace droqbxml

#endif  // DROQBXML_COMPONENT_BASGLOBALS_HPP_
