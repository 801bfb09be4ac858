// The in-process server's entry points: a class factory for every public class, created by
// ProgID through the component's own class factory, and the registration of those classes.
// CLSIDs are derived from the ProgIDs, so they stay the same from build to build.
#include <objbase.h>
#include <oleauto.h>
#include <olectl.h>
#include <windows.h>

#include <array>
#include <cstdint>
#include <exception>
#include <string>
#include <vector>

#include "com/Dispatch.hpp"
#include "com/typelib/TypeLibrary.hpp"
#include "droqbxml/component/ClassFactory.hpp"
#include "droqbxml/runtime/ComError.hpp"

namespace droqbxml::com {
namespace {

HMODULE thisModule = nullptr;

CLSID clsidOf(const Text& progId) { return toGuid(classIdOf(progId)); }

std::wstring wide(const Text& text) { return std::wstring(text.begin(), text.end()); }

std::wstring clsidText(const CLSID& id) {
  std::array<wchar_t, 40> text{};
  StringFromGUID2(id, text.data(), static_cast<int>(text.size()));
  return text.data();
}

// Class factories are not counted among the live objects: COM may keep one cached, and only
// LockServer holds the server.
class Factory final : public IClassFactory {
 public:
  explicit Factory(Text progId) : progId_(std::move(progId)) {}

  HRESULT STDMETHODCALLTYPE QueryInterface(REFIID iid, void** out) override {
    if (out == nullptr) return E_POINTER;
    if (IsEqualIID(iid, IID_IUnknown) || IsEqualIID(iid, IID_IClassFactory)) {
      *out = static_cast<IClassFactory*>(this);
      AddRef();
      return S_OK;
    }
    *out = nullptr;
    return E_NOINTERFACE;
  }
  ULONG STDMETHODCALLTYPE AddRef() override { return ++references_; }
  ULONG STDMETHODCALLTYPE Release() override {
    const ULONG left = --references_;
    if (left == 0) delete this;
    return left;
  }
  HRESULT STDMETHODCALLTYPE CreateInstance(IUnknown* outer, REFIID iid, void** out) override {
    if (out == nullptr) return E_POINTER;
    *out = nullptr;
    if (outer != nullptr) return CLASS_E_NOAGGREGATION;
    try {
      IDispatch* object = dispatchFor(CreateObject(progId_));
      const HRESULT result = object->QueryInterface(iid, out);
      object->Release();
      return result;
    } catch (const ComError& error) {
      return error.number() < 0 ? static_cast<HRESULT>(error.number()) : E_FAIL;
    } catch (const std::exception&) {
      return E_OUTOFMEMORY;
    }
  }
  HRESULT STDMETHODCALLTYPE LockServer(BOOL lock) override {
    if (lock) {
      ++serverLocks();
    } else {
      --serverLocks();
    }
    return S_OK;
  }

 private:
  Text progId_;
  std::atomic<ULONG> references_{1};
};

bool setValue(HKEY root, const std::wstring& key, const wchar_t* name, const std::wstring& value) {
  HKEY handle = nullptr;
  if (RegCreateKeyExW(root, key.c_str(), 0, nullptr, 0, KEY_WRITE, nullptr, &handle, nullptr) !=
      ERROR_SUCCESS) {
    return false;
  }
  const auto bytes = static_cast<DWORD>((value.size() + 1) * sizeof(wchar_t));
  const bool ok =
      RegSetValueExW(handle, name, 0, REG_SZ, reinterpret_cast<const BYTE*>(value.c_str()),
                     bytes) == ERROR_SUCCESS;
  RegCloseKey(handle);
  return ok;
}

}  // namespace
}  // namespace droqbxml::com

using droqbxml::Text;
using namespace droqbxml::com;

extern "C" BOOL WINAPI DllMain(HINSTANCE instance, DWORD reason, LPVOID) {
  if (reason == DLL_PROCESS_ATTACH) {
    thisModule = instance;
    DisableThreadLibraryCalls(instance);
  }
  // For the tests: how many objects were still alive when the server was unloaded.
  if (reason == DLL_PROCESS_DETACH) {
    std::array<wchar_t, MAX_PATH> file{};
    if (GetEnvironmentVariableW(L"DROQBXML_COM_LIVE_FILE", file.data(),
                                static_cast<DWORD>(file.size())) > 0) {
      const HANDLE out = CreateFileW(file.data(), GENERIC_WRITE, 0, nullptr, CREATE_ALWAYS,
                                     FILE_ATTRIBUTE_NORMAL, nullptr);
      if (out != INVALID_HANDLE_VALUE) {
        const std::string count = std::to_string(liveObjects().load());
        DWORD written = 0;
        WriteFile(out, count.data(), static_cast<DWORD>(count.size()), &written, nullptr);
        CloseHandle(out);
      }
    }
  }
  return TRUE;
}

extern "C" HRESULT STDAPICALLTYPE DllGetClassObject(REFCLSID clsid, REFIID iid, void** out) {
  if (out == nullptr) return E_POINTER;
  *out = nullptr;
  for (const Text& progId : droqbxml::RegisteredProgIds()) {
    if (!IsEqualCLSID(clsid, clsidOf(progId))) continue;
    auto* factory = new (std::nothrow) Factory(progId);
    if (factory == nullptr) return E_OUTOFMEMORY;
    const HRESULT result = factory->QueryInterface(iid, out);
    factory->Release();
    return result;
  }
  return CLASS_E_CLASSNOTAVAILABLE;
}

extern "C" HRESULT STDAPICALLTYPE DllCanUnloadNow() {
  return liveObjects() == 0 && serverLocks() == 0 ? S_OK : S_FALSE;
}

extern "C" HRESULT STDAPICALLTYPE DllRegisterServer() {
  std::array<wchar_t, MAX_PATH> path{};
  GetModuleFileNameW(thisModule, path.data(), static_cast<DWORD>(path.size()));
  for (const Text& progId : droqbxml::RegisteredProgIds()) {
    const std::wstring id = clsidText(clsidOf(progId));
    const std::wstring name = wide(progId);
    const std::wstring clsidKey = L"CLSID\\" + id;
    const bool ok =
        setValue(HKEY_CLASSES_ROOT, name, nullptr, name) &&
        setValue(HKEY_CLASSES_ROOT, name + L"\\CLSID", nullptr, id) &&
        setValue(HKEY_CLASSES_ROOT, clsidKey, nullptr, name) &&
        setValue(HKEY_CLASSES_ROOT, clsidKey + L"\\ProgID", nullptr, name) &&
        setValue(HKEY_CLASSES_ROOT, clsidKey + L"\\InprocServer32", nullptr, path.data()) &&
        setValue(HKEY_CLASSES_ROOT, clsidKey + L"\\InprocServer32", L"ThreadingModel",
                 L"Apartment");
    if (!ok) return SELFREG_E_CLASS;
    setValue(HKEY_CLASSES_ROOT, clsidKey + L"\\TypeLib", nullptr, clsidText(toGuid(libraryId())));
  }
  // The type library embedded in the DLL, registered under its LIBID.
  ITypeLib* library = nullptr;
  if (FAILED(LoadTypeLibEx(path.data(), REGKIND_REGISTER, &library))) return SELFREG_E_TYPELIB;
  library->Release();
  return S_OK;
}

extern "C" HRESULT STDAPICALLTYPE DllUnregisterServer() {
  UnRegisterTypeLib(toGuid(libraryId()), 1, 0, LOCALE_NEUTRAL, SYS_WIN64);
  for (const Text& progId : droqbxml::RegisteredProgIds()) {
    RegDeleteTreeW(HKEY_CLASSES_ROOT, wide(progId).c_str());
    RegDeleteTreeW(HKEY_CLASSES_ROOT, (L"CLSID\\" + clsidText(clsidOf(progId))).c_str());
  }
  return S_OK;
}
