// IDispatch and IEnumVARIANT over the component's objects.
#include "com/Dispatch.hpp"

#include <oleauto.h>

#include <cstring>
#include <exception>
#include <new>
#include <vector>

#include "com/typelib/TypeLibrary.hpp"
#include "droqbxml/runtime/ComError.hpp"
#include "droqbxml/runtime/Enumerator.hpp"

namespace droqbxml::com {
namespace {

static_assert(sizeof(OLECHAR) == sizeof(char16_t));

// Asked of an IDispatch to learn whether it is one of ours, and to reach the object inside.
// {6C0D3B52-8F1E-4C35-9A0B-4D52F0A1E7C3}
constexpr IID kOwnObject = {
    0x6c0d3b52, 0x8f1e, 0x4c35, {0x9a, 0x0b, 0x4d, 0x52, 0xf0, 0xa1, 0xe7, 0xc3}};

// The type library embedded in this module, loaded once; nothing when it cannot be.
ITypeLib* ownLibrary() {
  static ITypeLib* library = [] {
    HMODULE module = nullptr;
    GetModuleHandleExW(
        GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS | GET_MODULE_HANDLE_EX_FLAG_UNCHANGED_REFCOUNT,
        reinterpret_cast<LPCWSTR>(&ownLibrary), &module);
    wchar_t path[MAX_PATH];
    GetModuleFileNameW(module, path, MAX_PATH);
    ITypeLib* loaded = nullptr;
    return SUCCEEDED(LoadTypeLibEx(path, REGKIND_NONE, &loaded)) ? loaded : nullptr;
  }();
  return library;
}

// The runtime's "Wrong number of arguments or invalid property assignment".
constexpr int32_t kWrongArgumentCount = 450;

Text textOf(const OLECHAR* text, size_t length) {
  return Text(reinterpret_cast<const char16_t*>(text), length);
}

BSTR bstrOf(const Text& text) {
  return SysAllocStringLen(reinterpret_cast<const OLECHAR*>(text.data()),
                           static_cast<UINT>(text.size()));
}

class DispatchObject;
Ref<Object> objectInside(IUnknown* unknown);

// The component's value of an argument, through VT_BYREF.
Variant valueOf(const VARIANT& argument) {
  const VARIANT* v = &argument;
  while (V_VT(v) == (VT_VARIANT | VT_BYREF)) v = V_VARIANTREF(v);
  const bool byRef = (V_VT(v) & VT_BYREF) != 0;
  switch (V_VT(v) & ~VT_BYREF) {
    case VT_EMPTY:
      return Variant();
    case VT_NULL:
      return Variant::null();
    case VT_BOOL:
      return Variant((byRef ? *V_BOOLREF(v) : V_BOOL(v)) != VARIANT_FALSE);
    case VT_I2:
      return Variant(static_cast<int16_t>(byRef ? *V_I2REF(v) : V_I2(v)));
    case VT_UI1:
      return Variant(static_cast<int16_t>(byRef ? *V_UI1REF(v) : V_UI1(v)));
    case VT_I4:
      return Variant(static_cast<int32_t>(byRef ? *V_I4REF(v) : V_I4(v)));
    case VT_INT:
      return Variant(static_cast<int32_t>(byRef ? *V_INTREF(v) : V_INT(v)));
    case VT_R4:
      return Variant(static_cast<double>(byRef ? *V_R4REF(v) : V_R4(v)));
    case VT_R8:
      return Variant(byRef ? *V_R8REF(v) : V_R8(v));
    case VT_CY:
      return Variant::currency((byRef ? *V_CYREF(v) : V_CY(v)).int64);
    case VT_DATE:
      return Variant::date(byRef ? *V_DATEREF(v) : V_DATE(v));
    case VT_BSTR: {
      const BSTR text = byRef ? *V_BSTRREF(v) : V_BSTR(v);
      return Variant(text == nullptr ? Text() : textOf(text, SysStringLen(text)));
    }
    case VT_DISPATCH:
    case VT_UNKNOWN: {
      IUnknown* unknown = byRef ? *V_UNKNOWNREF(v) : V_UNKNOWN(v);
      if (unknown == nullptr) return Variant(Ref<Object>());
      if (Ref<Object> object = objectInside(unknown)) return Variant(object);
      break;  // another server's object: the component knows only its own
    }
    case VT_ERROR:
      if ((byRef ? *V_ERRORREF(v) : V_ERROR(v)) == DISP_E_PARAMNOTFOUND) return Variant::missing();
      break;
    default:
      break;
  }
  raiseRuntimeError(RuntimeError::kTypeMismatch);
}

// A value as a new VARIANT (the caller owns it).
void store(const Variant& value, VARIANT* out) {
  VariantInit(out);
  switch (value.kind()) {
    case Variant::Kind::Missing:
      V_VT(out) = VT_ERROR;
      V_ERROR(out) = DISP_E_PARAMNOTFOUND;
      break;
    case Variant::Kind::Empty:
      break;
    case Variant::Kind::Null:
      V_VT(out) = VT_NULL;
      break;
    case Variant::Kind::Boolean:
      V_VT(out) = VT_BOOL;
      V_BOOL(out) = value.toBoolean() ? VARIANT_TRUE : VARIANT_FALSE;
      break;
    case Variant::Kind::Integer:
      V_VT(out) = VT_I2;
      V_I2(out) = value.toInteger();
      break;
    case Variant::Kind::Long:
      V_VT(out) = VT_I4;
      V_I4(out) = value.toLong();
      break;
    case Variant::Kind::Double:
      V_VT(out) = VT_R8;
      V_R8(out) = value.toDouble();
      break;
    case Variant::Kind::Currency:
      V_VT(out) = VT_CY;
      V_CY(out).int64 = value.toCurrency();
      break;
    case Variant::Kind::Date:
      V_VT(out) = VT_DATE;
      V_DATE(out) = value.toDouble();
      break;
    case Variant::Kind::String:
      V_VT(out) = VT_BSTR;
      V_BSTR(out) = bstrOf(value.toText());
      break;
    case Variant::Kind::Object: {
      const Ref<Object> object = value.toObject();
      V_VT(out) = VT_DISPATCH;
      V_DISPATCH(out) = object ? dispatchFor(object) : nullptr;
      break;
    }
  }
}

// Writes an in/out argument's new value back where the caller passed it by reference.
void writeBack(const Variant& value, VARIANT& argument) {
  VARIANT* v = &argument;
  while (V_VT(v) == (VT_VARIANT | VT_BYREF)) {
    VARIANT* inner = V_VARIANTREF(v);
    if ((V_VT(inner) & VT_BYREF) == 0) {
      VariantClear(inner);
      store(value, inner);
      return;
    }
    v = inner;
  }
  switch (V_VT(v)) {
    case VT_I4 | VT_BYREF:
      *V_I4REF(v) = value.toLong();
      break;
    case VT_I2 | VT_BYREF:
      *V_I2REF(v) = value.toInteger();
      break;
    case VT_R8 | VT_BYREF:
      *V_R8REF(v) = value.toDouble();
      break;
    case VT_BOOL | VT_BYREF:
      *V_BOOLREF(v) = value.toBoolean() ? VARIANT_TRUE : VARIANT_FALSE;
      break;
    case VT_BSTR | VT_BYREF:
      SysFreeString(*V_BSTRREF(v));
      *V_BSTRREF(v) = bstrOf(value.toText());
      break;
    default:
      break;  // kinds no member writes back
  }
}

// The HRESULT a script sees for an error number: the component's numbers are HRESULTs
// already; the runtime's small numbers are the platform's control-facility codes, which
// script engines show as the number itself (13, 438...).
HRESULT scodeOf(int32_t number) {
  if (number < 0) return static_cast<HRESULT>(number);
  return MAKE_HRESULT(SEVERITY_ERROR, FACILITY_CONTROL, number & 0xFFFF);
}

HRESULT raised(const ComError& error, EXCEPINFO* info) {
  const HRESULT scode = scodeOf(error.number());
  if (info != nullptr) {
    std::memset(info, 0, sizeof *info);
    info->bstrSource = bstrOf(error.source());
    info->bstrDescription = bstrOf(error.description());
    info->scode = scode;
  }
  ICreateErrorInfo* create = nullptr;
  if (SUCCEEDED(CreateErrorInfo(&create))) {
    create->SetSource(reinterpret_cast<LPOLESTR>(const_cast<char16_t*>(error.source().c_str())));
    create->SetDescription(
        reinterpret_cast<LPOLESTR>(const_cast<char16_t*>(error.description().c_str())));
    IErrorInfo* errorInfo = nullptr;
    if (SUCCEEDED(create->QueryInterface(IID_IErrorInfo, reinterpret_cast<void**>(&errorInfo)))) {
      SetErrorInfo(0, errorInfo);
      errorInfo->Release();
    }
    create->Release();
  }
  return DISP_E_EXCEPTION;
}

// What every COM object of the server shares: a reference count and the server's count of
// live objects.
template <class Interface>
class Counted : public Interface {
 public:
  Counted() { ++liveObjects(); }
  virtual ~Counted() { --liveObjects(); }
  Counted(const Counted&) = delete;
  Counted& operator=(const Counted&) = delete;

  ULONG STDMETHODCALLTYPE AddRef() override { return ++references_; }
  ULONG STDMETHODCALLTYPE Release() override {
    const ULONG left = --references_;
    if (left == 0) delete this;
    return left;
  }

 private:
  std::atomic<ULONG> references_{1};
};

// For Each over a collection: the items of its NewEnum's snapshot.
class EnumVariant final : public Counted<IEnumVARIANT> {
 public:
  explicit EnumVariant(Ref<Object> enumerator) : enumerator_(std::move(enumerator)) {}

  HRESULT STDMETHODCALLTYPE QueryInterface(REFIID iid, void** out) override {
    if (out == nullptr) return E_POINTER;
    if (IsEqualIID(iid, IID_IUnknown) || IsEqualIID(iid, IID_IEnumVARIANT)) {
      *out = static_cast<IEnumVARIANT*>(this);
      AddRef();
      return S_OK;
    }
    *out = nullptr;
    return E_NOINTERFACE;
  }
  HRESULT STDMETHODCALLTYPE Next(ULONG count, VARIANT* items, ULONG* fetched) override {
    ULONG done = 0;
    try {
      for (; done < count; ++done) {
        const Variant item = enumerator_->call(u"Next");
        if (item.isEmpty()) break;
        store(item, &items[done]);
      }
    } catch (const std::exception&) {
      return E_FAIL;
    }
    if (fetched != nullptr) *fetched = done;
    return done == count ? S_OK : S_FALSE;
  }
  HRESULT STDMETHODCALLTYPE Skip(ULONG count) override {
    for (ULONG i = 0; i < count; ++i) {
      if (enumerator_->call(u"Next").isEmpty()) return S_FALSE;
    }
    return S_OK;
  }
  HRESULT STDMETHODCALLTYPE Reset() override {
    enumerator_->call(u"Reset");
    return S_OK;
  }
  HRESULT STDMETHODCALLTYPE Clone(IEnumVARIANT** out) override {
    if (out != nullptr) *out = nullptr;
    return E_NOTIMPL;
  }

 private:
  Ref<Object> enumerator_;
};

class DispatchObject final : public Counted<IDispatch> {
 public:
  explicit DispatchObject(Ref<Object> object) : object_(std::move(object)) {}

  const Ref<Object>& object() const { return object_; }

  HRESULT STDMETHODCALLTYPE QueryInterface(REFIID iid, void** out) override {
    if (out == nullptr) return E_POINTER;
    if (IsEqualIID(iid, IID_IUnknown) || IsEqualIID(iid, IID_IDispatch) ||
        IsEqualIID(iid, kOwnObject)) {
      *out = static_cast<IDispatch*>(this);
      AddRef();
      return S_OK;
    }
    *out = nullptr;
    return E_NOINTERFACE;
  }

  // The class's interface in the type library (objects of classes it does not describe,
  // such as a NewEnum enumerator reached by name, have none).
  HRESULT STDMETHODCALLTYPE GetTypeInfoCount(UINT* count) override {
    if (count == nullptr) return E_POINTER;
    ITypeInfo* info = typeInfo();
    *count = info != nullptr ? 1 : 0;
    if (info != nullptr) info->Release();
    return S_OK;
  }
  HRESULT STDMETHODCALLTYPE GetTypeInfo(UINT index, LCID, ITypeInfo** info) override {
    if (info == nullptr) return E_POINTER;
    *info = index == 0 ? typeInfo() : nullptr;
    return *info != nullptr ? S_OK : DISP_E_BADINDEX;
  }

  HRESULT STDMETHODCALLTYPE GetIDsOfNames(REFIID, LPOLESTR* names, UINT count, LCID,
                                          DISPID* ids) override {
    if (names == nullptr || ids == nullptr || count == 0) return E_INVALIDARG;
    const ClassInfo& info = object_->classInfo();
    const Text name = textOf(names[0], std::wcslen(names[0]));
    const int32_t id = info.findMember(name);
    HRESULT result = S_OK;
    if (name == u"_NewEnum" && info.findMember(u"NewEnum") >= 0) {
      ids[0] = DISPID_NEWENUM;
    } else if (id >= 0) {
      ids[0] = dispIdOf(info, id);
    } else {
      ids[0] = DISPID_UNKNOWN;
      result = DISP_E_UNKNOWNNAME;
    }
    // Members take no named arguments.
    for (UINT i = 1; i < count; ++i) {
      ids[i] = DISPID_UNKNOWN;
      result = DISP_E_UNKNOWNNAME;
    }
    return result;
  }

  HRESULT STDMETHODCALLTYPE Invoke(DISPID dispid, REFIID, LCID, WORD flags, DISPPARAMS* params,
                                   VARIANT* result, EXCEPINFO* exception,
                                   UINT* argumentError) override {
    if (params == nullptr) return E_INVALIDARG;
    if (params->cNamedArgs > 1 ||
        (params->cNamedArgs == 1 && params->rgdispidNamedArgs[0] != DISPID_PROPERTYPUT)) {
      return DISP_E_NONAMEDARGS;
    }
    const ClassInfo& info = object_->classInfo();
    const int32_t id = memberIdOf(info, static_cast<int32_t>(dispid));
    if (id < 0) return DISP_E_MEMBERNOTFOUND;
    try {
      // The arguments come last to first; a put's value (the named argument) is the last.
      std::vector<Variant> args;
      args.reserve(params->cArgs);
      for (UINT i = params->cArgs; i-- > 0;) {
        try {
          args.push_back(valueOf(params->rgvarg[i]));
        } catch (const ComError&) {
          if (argumentError != nullptr) *argumentError = i;
          throw;
        }
      }
      const Variant value = call(id, kindOf(info, id, flags, args), args);
      for (UINT i = 0; i < params->cArgs; ++i) {
        if ((V_VT(&params->rgvarg[i]) & VT_BYREF) != 0) {
          writeBack(args[params->cArgs - 1 - i], params->rgvarg[i]);
        }
      }
      if (dispid == DISPID_NEWENUM) {
        if (result != nullptr) {
          VariantInit(result);
          V_VT(result) = VT_UNKNOWN;
          V_UNKNOWN(result) = new EnumVariant(value.toObject());
        }
        return S_OK;
      }
      if (result != nullptr) store(value, result);
      return S_OK;
    } catch (const ComError& error) {
      return raised(error, exception);
    } catch (const std::bad_alloc&) {
      return E_OUTOFMEMORY;
    } catch (const std::exception&) {
      return E_FAIL;
    }
  }

 private:
  ITypeInfo* typeInfo() const {
    ITypeLib* library = ownLibrary();
    ITypeInfo* info = nullptr;
    if (library == nullptr ||
        FAILED(library->GetTypeInfoOfGuid(toGuid(interfaceIdOf(object_->className())), &info))) {
      return nullptr;
    }
    return info;
  }

  // The member's call. A property read with arguments that it does not take reads the
  // property and passes the arguments to the default member of what it holds, as
  // `est.EstimateLines(1)` means on the platform.
  Variant call(int32_t id, MemberKind kind, std::vector<Variant>& args) {
    if (kind != MemberKind::Get || args.empty()) return object_->invoke(id, kind, args);
    try {
      return object_->invoke(id, kind, args);
    } catch (const ComError& error) {
      if (error.number() != kWrongArgumentCount) throw;
    }
    const Ref<Object> held = object_->invoke(id, kind, {}).toObject();
    if (!held) raiseRuntimeError(RuntimeError::kObjectNotSet);
    const int32_t item = held->classInfo().findMember(u"Item");
    if (item < 0) raiseRuntimeError(RuntimeError::kMemberNotSupported);
    return held->invoke(
        item,
        held->classInfo().hasKind(item, MemberKind::Method) ? MemberKind::Method : MemberKind::Get,
        args);
  }

  // How the call reaches the member: a put is a let, or a set when the member takes an
  // object; a get-or-call is a call when the member is a method.
  static MemberKind kindOf(const ClassInfo& info, int32_t id, WORD flags,
                           const std::vector<Variant>& args) {
    if ((flags & DISPATCH_PROPERTYPUTREF) != 0) {
      return info.hasKind(id, MemberKind::Set) ? MemberKind::Set : MemberKind::Let;
    }
    if ((flags & DISPATCH_PROPERTYPUT) != 0) {
      const bool object = !args.empty() && args.back().isObject();
      if (!info.hasKind(id, MemberKind::Let) || (object && info.hasKind(id, MemberKind::Set))) {
        return MemberKind::Set;
      }
      return MemberKind::Let;
    }
    if ((flags & DISPATCH_METHOD) != 0 && info.hasKind(id, MemberKind::Method)) {
      return MemberKind::Method;
    }
    return MemberKind::Get;
  }

  Ref<Object> object_;
};

Ref<Object> objectInside(IUnknown* unknown) {
  IDispatch* own = nullptr;
  if (FAILED(unknown->QueryInterface(kOwnObject, reinterpret_cast<void**>(&own)))) return nullptr;
  Ref<Object> object = static_cast<DispatchObject*>(own)->object();
  own->Release();
  return object;
}

}  // namespace

GUID toGuid(const Guid& guid) {
  GUID out;
  out.Data1 = guid.data1;
  out.Data2 = guid.data2;
  out.Data3 = guid.data3;
  for (size_t i = 0; i < 8; ++i) out.Data4[i] = guid.data4[i];
  return out;
}

std::atomic<long>& liveObjects() {
  static std::atomic<long> count{0};
  return count;
}

std::atomic<long>& serverLocks() {
  static std::atomic<long> count{0};
  return count;
}

IDispatch* dispatchFor(Ref<Object> object) { return new DispatchObject(std::move(object)); }

}  // namespace droqbxml::com
