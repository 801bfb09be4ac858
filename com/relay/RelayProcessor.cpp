// A request processor for Windows programs under Wine, registered in a Wine prefix as
// QuickBooks' "QBXMLRP.RequestProcessor.1": each call of its automation interface is
// relayed over a loopback TCP connection to `droqbxml relay` on the Linux side, which
// answers it with the embedded stand-in. Errors come back as DISP_E_EXCEPTION carrying the
// processor's HRESULT and message, as QuickBooks' own processor reports them. The port is
// DROQBXML_RELAY_PORT, else 7371. One connection per processor object.
#include <winsock2.h>
#include <ws2tcpip.h>
// After winsock2.h:
#include <objbase.h>
#include <oleauto.h>
#include <olectl.h>
#include <windows.h>

#include <array>
#include <atomic>
#include <cstdint>
#include <cstdlib>
#include <cwchar>
#include <string>
#include <vector>

namespace {

HMODULE thisModule = nullptr;
std::atomic<long> liveObjects{0};
std::atomic<long> serverLocks{0};

constexpr const wchar_t* kProgId = L"QBXMLRP.RequestProcessor.1";
constexpr const wchar_t* kVersionIndependentProgId = L"QBXMLRP.RequestProcessor";
// {8E5A4C11-3B2D-4F6A-9C7E-1D0B2A3F4E51}
constexpr CLSID kClsid = {
    0x8e5a4c11, 0x3b2d, 0x4f6a, {0x9c, 0x7e, 0x1d, 0x0b, 0x2a, 0x3f, 0x4e, 0x51}};

// The members of QuickBooks' processor that the component calls, DISPIDs 1 to 8.
constexpr std::array<const wchar_t*, 8> kMembers{L"OpenConnection",  L"BeginSession",
                                                 L"ProcessRequest",  L"EndSession",
                                                 L"CloseConnection", L"GetCurrentCompanyFileName",
                                                 L"MajorVersion",    L"MinorVersion"};

std::string utf8(const wchar_t* text, int length) {
  if (length == 0) return {};
  const int size = WideCharToMultiByte(CP_UTF8, 0, text, length, nullptr, 0, nullptr, nullptr);
  std::string out(static_cast<size_t>(size), '\0');
  WideCharToMultiByte(CP_UTF8, 0, text, length, out.data(), size, nullptr, nullptr);
  return out;
}

BSTR bstr(const std::string& text) {
  const int size =
      MultiByteToWideChar(CP_UTF8, 0, text.data(), static_cast<int>(text.size()), nullptr, 0);
  BSTR out = SysAllocStringLen(nullptr, static_cast<UINT>(size));
  MultiByteToWideChar(CP_UTF8, 0, text.data(), static_cast<int>(text.size()), out, size);
  return out;
}

class Connection {
 public:
  ~Connection() {
    if (socket_ != INVALID_SOCKET) closesocket(socket_);
  }
  // Sends one call and reads its answer; false when the relay cannot be reached.
  bool call(const std::vector<std::string>& fields, std::vector<std::string>& answer) {
    if (socket_ == INVALID_SOCKET && !connect()) return false;
    std::string body;
    for (size_t i = 0; i < fields.size(); ++i) body += (i ? std::string(1, '\0') : "") + fields[i];
    const auto size = static_cast<uint32_t>(body.size());
    const char header[4] = {static_cast<char>(size), static_cast<char>(size >> 8),
                            static_cast<char>(size >> 16), static_cast<char>(size >> 24)};
    if (!sendAll(header, 4) || !sendAll(body.data(), body.size())) return false;
    unsigned char reply[4];
    if (!readAll(reinterpret_cast<char*>(reply), 4)) return false;
    std::string text(
        reply[0] | reply[1] << 8 | reply[2] << 16 | static_cast<uint32_t>(reply[3]) << 24, '\0');
    if (!readAll(text.data(), text.size())) return false;
    answer.clear();
    size_t from = 0;
    for (size_t at = text.find('\0'); at != std::string::npos; at = text.find('\0', from)) {
      answer.push_back(text.substr(from, at - from));
      from = at + 1;
    }
    answer.push_back(text.substr(from));
    return true;
  }

 private:
  bool connect() {
    WSADATA data;
    if (WSAStartup(MAKEWORD(2, 2), &data) != 0) return false;
    const char* port = std::getenv("DROQBXML_RELAY_PORT");
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_port = htons(static_cast<u_short>(port ? std::atoi(port) : 7371));
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    socket_ = ::socket(AF_INET, SOCK_STREAM, IPPROTO_TCP);
    if (socket_ == INVALID_SOCKET) return false;
    if (::connect(socket_, reinterpret_cast<sockaddr*>(&address), sizeof address) != 0) {
      closesocket(socket_);
      socket_ = INVALID_SOCKET;
      return false;
    }
    return true;
  }
  bool sendAll(const char* data, size_t size) {
    while (size > 0) {
      const int sent = ::send(socket_, data, static_cast<int>(size), 0);
      if (sent <= 0) return false;
      data += sent;
      size -= static_cast<size_t>(sent);
    }
    return true;
  }
  bool readAll(char* data, size_t size) {
    while (size > 0) {
      const int got = ::recv(socket_, data, static_cast<int>(size), 0);
      if (got <= 0) return false;
      data += got;
      size -= static_cast<size_t>(got);
    }
    return true;
  }

  SOCKET socket_ = INVALID_SOCKET;
};

HRESULT fail(EXCEPINFO* info, HRESULT code, const std::string& message) {
  if (info != nullptr) {
    ZeroMemory(info, sizeof *info);
    info->scode = code;
    info->bstrSource = SysAllocString(kProgId);
    info->bstrDescription = bstr(message);
  }
  return DISP_E_EXCEPTION;
}

class Processor final : public IDispatch {
 public:
  Processor() { ++liveObjects; }
  ~Processor() { --liveObjects; }

  HRESULT STDMETHODCALLTYPE QueryInterface(REFIID iid, void** out) override {
    if (out == nullptr) return E_POINTER;
    if (IsEqualIID(iid, IID_IUnknown) || IsEqualIID(iid, IID_IDispatch)) {
      *out = static_cast<IDispatch*>(this);
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
  HRESULT STDMETHODCALLTYPE GetTypeInfoCount(UINT* count) override {
    if (count != nullptr) *count = 0;
    return S_OK;
  }
  HRESULT STDMETHODCALLTYPE GetTypeInfo(UINT, LCID, ITypeInfo**) override {
    return DISP_E_BADINDEX;
  }
  HRESULT STDMETHODCALLTYPE GetIDsOfNames(REFIID, LPOLESTR* names, UINT count, LCID,
                                          DISPID* ids) override {
    HRESULT result = S_OK;
    for (UINT i = 0; i < count; ++i) {
      ids[i] = DISPID_UNKNOWN;
      for (size_t m = 0; i == 0 && m < kMembers.size(); ++m) {
        if (_wcsicmp(names[0], kMembers[m]) == 0) ids[0] = static_cast<DISPID>(m + 1);
      }
      if (ids[i] == DISPID_UNKNOWN) result = DISP_E_UNKNOWNNAME;
    }
    return result;
  }
  HRESULT STDMETHODCALLTYPE Invoke(DISPID id, REFIID, LCID, WORD, DISPPARAMS* params,
                                   VARIANT* result, EXCEPINFO* info, UINT*) override {
    if (id < 1 || id > static_cast<DISPID>(kMembers.size())) return DISP_E_MEMBERNOTFOUND;
    const wchar_t* name = kMembers[static_cast<size_t>(id - 1)];
    std::vector<std::string> call{utf8(name, static_cast<int>(std::wcslen(name)))};
    for (UINT i = params == nullptr ? 0 : params->cArgs; i-- > 0;) {
      VARIANT text;
      VariantInit(&text);
      if (FAILED(VariantChangeType(&text, &params->rgvarg[i], 0, VT_BSTR))) {
        return DISP_E_TYPEMISMATCH;
      }
      call.push_back(utf8(V_BSTR(&text), static_cast<int>(SysStringLen(V_BSTR(&text)))));
      VariantClear(&text);
    }
    std::vector<std::string> answer;
    if (!connection_.call(call, answer) || answer.empty()) {
      return fail(info, E_FAIL, "The request processor relay (droqbxml relay) cannot be reached.");
    }
    if (answer[0] != "OK") {
      const long code = answer.size() > 1 ? std::strtol(answer[1].c_str(), nullptr, 10) : E_FAIL;
      return fail(info, static_cast<HRESULT>(code), answer.size() > 2 ? answer[2] : "");
    }
    if (result != nullptr) {
      VariantInit(result);
      const std::string value = answer.size() > 1 ? answer[1] : "";
      if (id == 7 || id == 8) {
        V_VT(result) = VT_I2;
        V_I2(result) = static_cast<SHORT>(std::atoi(value.c_str()));
      } else if (id == 2 || id == 3 || id == 6) {
        V_VT(result) = VT_BSTR;
        V_BSTR(result) = bstr(value);
      }
    }
    return S_OK;
  }

 private:
  std::atomic<ULONG> references_{1};
  Connection connection_;
};

class Factory final : public IClassFactory {
 public:
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
  ULONG STDMETHODCALLTYPE AddRef() override { return 2; }  // one static factory
  ULONG STDMETHODCALLTYPE Release() override { return 1; }
  HRESULT STDMETHODCALLTYPE CreateInstance(IUnknown* outer, REFIID iid, void** out) override {
    if (out == nullptr) return E_POINTER;
    *out = nullptr;
    if (outer != nullptr) return CLASS_E_NOAGGREGATION;
    auto* processor = new Processor();
    const HRESULT result = processor->QueryInterface(iid, out);
    processor->Release();
    return result;
  }
  HRESULT STDMETHODCALLTYPE LockServer(BOOL lock) override {
    if (lock) {
      ++serverLocks;
    } else {
      --serverLocks;
    }
    return S_OK;
  }
};

Factory factory;

bool setValue(const std::wstring& key, const wchar_t* name, const std::wstring& value) {
  HKEY handle = nullptr;
  if (RegCreateKeyExW(HKEY_CLASSES_ROOT, key.c_str(), 0, nullptr, 0, KEY_WRITE, nullptr, &handle,
                      nullptr) != ERROR_SUCCESS) {
    return false;
  }
  const bool ok =
      RegSetValueExW(handle, name, 0, REG_SZ, reinterpret_cast<const BYTE*>(value.c_str()),
                     static_cast<DWORD>((value.size() + 1) * sizeof(wchar_t))) == ERROR_SUCCESS;
  RegCloseKey(handle);
  return ok;
}

std::wstring clsidText() {
  wchar_t text[40];
  StringFromGUID2(kClsid, text, 40);
  return text;
}

}  // namespace

extern "C" BOOL WINAPI DllMain(HINSTANCE instance, DWORD reason, LPVOID) {
  if (reason == DLL_PROCESS_ATTACH) {
    thisModule = instance;
    DisableThreadLibraryCalls(instance);
  }
  return TRUE;
}

extern "C" HRESULT STDAPICALLTYPE DllGetClassObject(REFCLSID clsid, REFIID iid, void** out) {
  if (!IsEqualCLSID(clsid, kClsid)) return CLASS_E_CLASSNOTAVAILABLE;
  return factory.QueryInterface(iid, out);
}

extern "C" HRESULT STDAPICALLTYPE DllCanUnloadNow() {
  return liveObjects == 0 && serverLocks == 0 ? S_OK : S_FALSE;
}

extern "C" HRESULT STDAPICALLTYPE DllRegisterServer() {
  wchar_t path[MAX_PATH];
  GetModuleFileNameW(thisModule, path, MAX_PATH);
  const std::wstring id = clsidText();
  const bool ok =
      setValue(kProgId, nullptr, L"QuickBooks request processor (relay)") &&
      setValue(std::wstring(kProgId) + L"\\CLSID", nullptr, id) &&
      setValue(kVersionIndependentProgId, nullptr, L"") &&
      setValue(std::wstring(kVersionIndependentProgId) + L"\\CLSID", nullptr, id) &&
      setValue(std::wstring(kVersionIndependentProgId) + L"\\CurVer", nullptr, kProgId) &&
      setValue(L"CLSID\\" + id + L"\\ProgID", nullptr, kProgId) &&
      setValue(L"CLSID\\" + id + L"\\InprocServer32", nullptr, path) &&
      setValue(L"CLSID\\" + id + L"\\InprocServer32", L"ThreadingModel", L"Apartment");
  return ok ? S_OK : SELFREG_E_CLASS;
}

extern "C" HRESULT STDAPICALLTYPE DllUnregisterServer() {
  RegDeleteTreeW(HKEY_CLASSES_ROOT, kProgId);
  RegDeleteTreeW(HKEY_CLASSES_ROOT, kVersionIndependentProgId);
  RegDeleteTreeW(HKEY_CLASSES_ROOT, (L"CLSID\\" + clsidText()).c_str());
  return S_OK;
}
