// Object references of the object model: shared ownership, "nothing" is an empty Ref.
#ifndef DROQBXML_RUNTIME_REF_HPP_
#define DROQBXML_RUNTIME_REF_HPP_

#include <memory>

namespace droqbxml {

class Object;

template <class T>
using Ref = std::shared_ptr<T>;

}  // namespace droqbxml

#endif  // DROQBXML_RUNTIME_REF_HPP_
