// droqbxml_idl: prints the component's type library as IDL ("idl", for widl) or as the
// listing the Windows-side check compares with the compiled library ("listing").
#include <cstdio>
#include <string>

#include "com/typelib/TypeLibrary.hpp"

int main(int argc, char** argv) {
  const std::string what = argc > 1 ? argv[1] : "idl";
  if (what != "idl" && what != "listing") {
    std::fprintf(stderr, "usage: droqbxml_idl [idl|listing]\n");
    return 2;
  }
  const std::string text = what == "idl" ? droqbxml::com::idlSource() : droqbxml::com::listing();
  std::fwrite(text.data(), 1, text.size(), stdout);
  return 0;
}
