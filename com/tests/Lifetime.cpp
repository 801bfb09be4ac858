// Under Wine: the server says it can be unloaded exactly when no object it made is alive and
// no lock is held, and creating objects by ProgID through the registry finds it.
#include <objbase.h>
#include <oleauto.h>
#include <windows.h>

#include <cstdio>

using CanUnload = HRESULT(STDAPICALLTYPE*)();

int main() {
  int failures = 0;
  const auto check = [&](const char* label, bool ok) {
    if (!ok) {
      std::printf("FAIL %s\n", label);
      ++failures;
    }
  };
  CoInitialize(nullptr);
  HMODULE server = LoadLibraryW(L"DroQbXml.dll");
  check("loaded", server != nullptr);
  const auto canUnload = reinterpret_cast<CanUnload>(
      reinterpret_cast<void*>(GetProcAddress(server, "DllCanUnloadNow")));
  check("exported", canUnload != nullptr);
  if (server != nullptr && canUnload != nullptr) {
    check("nothing alive", canUnload() == S_OK);
    CLSID clsid;
    check("registered", SUCCEEDED(CLSIDFromProgID(L"DroQbXml.DroEstimate", &clsid)));
    IDispatch* estimate = nullptr;
    check("created", SUCCEEDED(CoCreateInstance(clsid, nullptr, CLSCTX_INPROC_SERVER, IID_IDispatch,
                                                reinterpret_cast<void**>(&estimate))));
    IClassFactory* factory = nullptr;
    check("factory",
          SUCCEEDED(CoGetClassObject(clsid, CLSCTX_INPROC_SERVER, nullptr, IID_IClassFactory,
                                     reinterpret_cast<void**>(&factory))));
    if (estimate != nullptr && factory != nullptr) {
      // A property holding an object hands out an object of its own.
      OLECHAR name[] = L"EstimateLines";
      OLECHAR* names[] = {name};
      DISPID id = 0;
      estimate->GetIDsOfNames(IID_NULL, names, 1, LOCALE_USER_DEFAULT, &id);
      DISPPARAMS none{nullptr, nullptr, 0, 0};
      VARIANT lines;
      VariantInit(&lines);
      check("property",
            SUCCEEDED(estimate->Invoke(id, IID_NULL, LOCALE_USER_DEFAULT, DISPATCH_PROPERTYGET,
                                       &none, &lines, nullptr, nullptr)));
      estimate->Release();
      check("an object alive", canUnload() == S_FALSE);
      VariantClear(&lines);
      factory->LockServer(TRUE);
      factory->Release();
      check("a lock held", canUnload() == S_FALSE);
      CoGetClassObject(clsid, CLSCTX_INPROC_SERVER, nullptr, IID_IClassFactory,
                       reinterpret_cast<void**>(&factory));
      factory->LockServer(FALSE);
      factory->Release();
      check("all released", canUnload() == S_OK);
    }
  }
  CoUninitialize();
  if (failures == 0) std::printf("ALL PASS\n");
  std::printf("SCRIPT DONE\n");
  return failures;
}
