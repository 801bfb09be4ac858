// Under Wine: the type library embedded in DroQbXml.dll, read back with LoadTypeLib and
// ITypeInfo, as one sorted line per enumeration value and per interface member, in the form
// droqbxml_idl writes from the member tables (scripts/com-tests.sh compares the two).
#include <windows.h>
// After windows.h:
#include <oleauto.h>

#include <algorithm>
#include <cstdio>
#include <string>
#include <vector>

namespace {

std::string narrow(BSTR text) {
  std::string out;
  for (UINT i = 0; text != nullptr && i < SysStringLen(text); ++i) {
    out += static_cast<char>(text[i]);
  }
  return out;
}

std::string nameOf(ITypeInfo* info, MEMBERID id) {
  BSTR name = nullptr;
  info->GetDocumentation(id, &name, nullptr, nullptr, nullptr);
  std::string text = narrow(name);
  SysFreeString(name);
  return text;
}

std::string upper(std::string text) {
  for (char& c : text) c = (c >= 'a' && c <= 'z') ? static_cast<char>(c - 32) : c;
  return text;
}

}  // namespace

int main() {
  ITypeLib* library = nullptr;
  if (FAILED(LoadTypeLibEx(L"DroQbXml.dll", REGKIND_NONE, &library))) {
    std::printf("FAIL no type library in DroQbXml.dll\n");
    return 1;
  }
  std::vector<std::string> lines;
  for (UINT i = 0; i < library->GetTypeInfoCount(); ++i) {
    ITypeInfo* info = nullptr;
    library->GetTypeInfo(i, &info);
    TYPEATTR* attributes = nullptr;
    info->GetTypeAttr(&attributes);
    const std::string typeName = nameOf(info, MEMBERID_NIL);
    if (attributes->typekind == TKIND_ENUM) {
      for (WORD v = 0; v < attributes->cVars; ++v) {
        VARDESC* var = nullptr;
        info->GetVarDesc(v, &var);
        lines.push_back("enum " + typeName + " " + nameOf(info, var->memid) + " " +
                        std::to_string(V_I4(var->lpvarValue)));
        info->ReleaseVarDesc(var);
      }
    } else if (attributes->typekind == TKIND_DISPATCH &&
               (attributes->wTypeFlags & TYPEFLAG_FDUAL) != 0) {
      // A dual interface: its members are those of its vtable side.
      HREFTYPE reference = 0;
      ITypeInfo* vtable = nullptr;
      TYPEATTR* vtableAttributes = nullptr;
      if (SUCCEEDED(info->GetRefTypeOfImplType(static_cast<UINT>(-1), &reference)) &&
          SUCCEEDED(info->GetRefTypeInfo(reference, &vtable)) &&
          SUCCEEDED(vtable->GetTypeAttr(&vtableAttributes))) {
        for (WORD f = 0; f < vtableAttributes->cFuncs; ++f) {
          FUNCDESC* func = nullptr;
          vtable->GetFuncDesc(f, &func);
          lines.push_back(typeName + " " + std::to_string(func->memid) + " " +
                          std::to_string(func->invkind) + " " + upper(nameOf(vtable, func->memid)) +
                          " " + std::to_string(func->cParams) + " " +
                          std::to_string(func->cParamsOpt));
          vtable->ReleaseFuncDesc(func);
        }
        vtable->ReleaseTypeAttr(vtableAttributes);
      } else {
        lines.push_back("FAIL no vtable side for " + typeName);
      }
      if (vtable != nullptr) vtable->Release();
    }
    info->ReleaseTypeAttr(attributes);
    info->Release();
  }
  library->Release();
  std::sort(lines.begin(), lines.end());
  for (const std::string& line : lines) std::printf("%s\n", line.c_str());
  return 0;
}
