# Which symbols a shared build of the library and of the stand-in exports: a linker version
# script written at configure time from a namespace to export and the namespaces inside it
# to keep private.
#
# Why a version script and not export macros: the public classes are declared in some
# eighty headers that are edited all the time, and one forgotten macro silently drops a
# class from the shared library. Naming the exported namespace once here keeps the headers
# untouched and exports every public class whatever file it lives in. The sources keep
# default visibility (a version script cannot bring a hidden symbol back), and inline
# functions are not hidden, so a function-local static in a public header stays one object
# shared by the library and its host.
#
# GNU ld binds a symbol matched by both a global and a local wildcard to the global one,
# so "export droqbxml::*, hide droqbxml::internal::*" would export everything. The patterns
# below therefore match "the namespace, except these inner namespaces" directly: for
# droqbxml:: without internal:: they are droqbxml::[!i]*, droqbxml::i[!n]*, ...,
# droqbxml::internal[a-zA-Z0-9_]* (ld's script lexer takes no ':' inside brackets, so the
# last step names what may follow instead). scripts/package-test.sh checks the result with
# nm.

# Demangled forms under which a class's or a function's symbols appear besides its own
# name. '?' stands for the space, which an unquoted pattern cannot hold.
set(_droqbxml_symbol_forms
  ""
  "typeinfo?for?"
  "typeinfo?name?for?"
  "vtable?for?"
  "VTT?for?"
  "virtual?thunk?to?"
  "non-virtual?thunk?to?"
  "covariant?return?thunk?to?"
  "guard?variable?for?"
  "TLS?init?function?for?"
  "TLS?wrapper?function?for?"
  "template?parameter?object?for?")

# Glob patterns matching every text that starts with `prefix` but with none of
# prefix + each of ARGN (each ending in ':').
function(_droqbxml_patterns_without out prefix)
  set(excluded ${ARGN})
  if(NOT excluded)
    set(${out} "${prefix}*" PARENT_SCOPE)
    return()
  endif()
  set(firsts "")
  foreach(suffix IN LISTS excluded)
    string(SUBSTRING "${suffix}" 0 1 first)
    list(APPEND firsts "${first}")
  endforeach()
  list(REMOVE_DUPLICATES firsts)
  list(JOIN firsts "" chars)
  if(chars STREQUAL ":")
    set(patterns "${prefix}[a-zA-Z0-9_]*")
  elseif(chars MATCHES ":")
    message(FATAL_ERROR "droqbxml symbols: cannot exclude '${ARGN}' after '${prefix}'")
  else()
    set(patterns "${prefix}[!${chars}]*")
  endif()
  foreach(first IN LISTS firsts)
    set(rest "")
    set(whole FALSE)
    foreach(suffix IN LISTS excluded)
      string(SUBSTRING "${suffix}" 0 1 head)
      if(head STREQUAL first)
        string(SUBSTRING "${suffix}" 1 -1 tail)
        if(tail STREQUAL "")
          set(whole TRUE)
        else()
          list(APPEND rest "${tail}")
        endif()
      endif()
    endforeach()
    if(NOT whole)
      _droqbxml_patterns_without(inner "${prefix}${first}" ${rest})
      list(APPEND patterns ${inner})
    endif()
  endforeach()
  set(${out} "${patterns}" PARENT_SCOPE)
endfunction()

# droqbxml_export_only(<target> NAMESPACE <ns> [HIDE <inner ns>...])
# Links a shared <target> with a version script exporting the symbols of C++ namespace <ns>
# (for example droqbxml::simulator) except those of the inner namespaces HIDE (relative to
# <ns>, for example internal). Does nothing for a static library or where the linker is not
# an ELF one.
function(droqbxml_export_only target)
  cmake_parse_arguments(PARSE_ARGV 1 arg "" "NAMESPACE" "HIDE")
  get_target_property(type ${target} TYPE)
  if(NOT type STREQUAL "SHARED_LIBRARY" OR APPLE OR WIN32)
    return()
  endif()
  set(hidden "")
  foreach(ns IN LISTS arg_HIDE)
    list(APPEND hidden "${ns}:")
  endforeach()
  _droqbxml_patterns_without(names "${arg_NAMESPACE}::" ${hidden})
  set(script "/* Written by cmake/DroqbxmlSymbols.cmake for ${target}. */\n{\n  global:\n")
  string(APPEND script "    extern \"C++\" {\n")
  foreach(form IN LISTS _droqbxml_symbol_forms)
    foreach(name IN LISTS names)
      string(APPEND script "      ${form}${name};\n")
    endforeach()
  endforeach()
  string(APPEND script "    };\n  local:\n    *;\n};\n")
  set(file "${CMAKE_CURRENT_BINARY_DIR}/${target}.map")
  file(CONFIGURE OUTPUT "${file}" CONTENT "${script}" @ONLY)
  target_link_options(${target} PRIVATE "LINKER:--version-script=${file}")
  set_property(TARGET ${target} APPEND PROPERTY LINK_DEPENDS "${file}")
endfunction()
