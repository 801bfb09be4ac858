// IDispatch and IEnumVARIANT over the component's objects.
#include "com/Dispatch.hpp"

#include <oleauto.h>

#include <cstdint>
#include <cstring>
#include <exception>
#include <map>
#include <memory>
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

// The vtable side of an object's dual interface: a vtable built from the type library and
// the object it belongs to (see DualThunks.S).
struct DualFace {
  void** vtable;
  class DispatchObject* owner;
};
const struct DualTable* dualTableFor(const Text& className);

class DispatchObject final : public Counted<IDispatch> {
 public:
  explicit DispatchObject(Ref<Object> object) : object_(std::move(object)) {
    dual_.vtable = nullptr;
    dual_.owner = this;
  }

  const Ref<Object>& object() const { return object_; }

  HRESULT STDMETHODCALLTYPE QueryInterface(REFIID iid, void** out) override {
    if (out == nullptr) return E_POINTER;
    if (IsEqualIID(iid, IID_IUnknown) || IsEqualIID(iid, IID_IDispatch) ||
        IsEqualIID(iid, kOwnObject)) {
      *out = static_cast<IDispatch*>(this);
      AddRef();
      return S_OK;
    }
    if (IsEqualIID(iid, toGuid(interfaceIdOf(object_->className())))) {
      if (dual_.vtable == nullptr) {
        if (const DualTable* table = dualTableFor(object_->className())) {
          dual_.vtable = const_cast<void**>(dualVtable(*table));
        }
      }
      if (dual_.vtable != nullptr) {
        *out = &dual_;
        AddRef();
        return S_OK;
      }
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

  static void* const* dualVtable(const DualTable& table);

  Ref<Object> object_;
  DualFace dual_;
};

// What the vtable side needs to know of each slot: the member it reaches and how, the kinds
// of its arguments, and the kind of its result (VT_EMPTY: none).
struct SlotInfo {
  MEMBERID memberId = 0;
  WORD flags = DISPATCH_METHOD;
  std::vector<VARTYPE> params;
  VARTYPE result = VT_EMPTY;
};

struct DualTable {
  std::vector<void*> vtable;
  std::vector<SlotInfo> slots;
};

HRESULT STDMETHODCALLTYPE dualQueryInterface(DualFace* self, REFIID iid, void** out) {
  return self->owner->QueryInterface(iid, out);
}
ULONG STDMETHODCALLTYPE dualAddRef(DualFace* self) { return self->owner->AddRef(); }
ULONG STDMETHODCALLTYPE dualRelease(DualFace* self) { return self->owner->Release(); }
HRESULT STDMETHODCALLTYPE dualGetTypeInfoCount(DualFace* self, UINT* count) {
  return self->owner->GetTypeInfoCount(count);
}
HRESULT STDMETHODCALLTYPE dualGetTypeInfo(DualFace* self, UINT index, LCID lcid, ITypeInfo** out) {
  return self->owner->GetTypeInfo(index, lcid, out);
}
HRESULT STDMETHODCALLTYPE dualGetIDsOfNames(DualFace* self, REFIID iid, LPOLESTR* names, UINT count,
                                            LCID lcid, DISPID* ids) {
  return self->owner->GetIDsOfNames(iid, names, count, lcid, ids);
}
HRESULT STDMETHODCALLTYPE dualInvoke(DualFace* self, DISPID id, REFIID iid, LCID lcid, WORD flags,
                                     DISPPARAMS* params, VARIANT* result, EXCEPINFO* info,
                                     UINT* argumentError) {
  return self->owner->Invoke(id, iid, lcid, flags, params, result, info, argumentError);
}

extern "C" char droqbxml_dual_thunks[];
constexpr size_t kThunks = 1024;
constexpr size_t kThunkSize = 16;

// The vtable side of a class's dual interface as the type library describes it; nothing
// when the library does not describe the class.
const DualTable* dualTableFor(const Text& className) {
  static std::map<Text, std::unique_ptr<DualTable>> tables;
  const auto known = tables.find(className);
  if (known != tables.end()) return known->second.get();
  auto& entry = tables[className];
  ITypeLib* library = ownLibrary();
  ITypeInfo* dispatch = nullptr;
  ITypeInfo* vtable = nullptr;
  HREFTYPE reference = 0;
  TYPEATTR* attributes = nullptr;
  if (library == nullptr ||
      FAILED(library->GetTypeInfoOfGuid(toGuid(interfaceIdOf(className)), &dispatch)) ||
      FAILED(dispatch->GetRefTypeOfImplType(static_cast<UINT>(-1), &reference)) ||
      FAILED(dispatch->GetRefTypeInfo(reference, &vtable)) ||
      FAILED(vtable->GetTypeAttr(&attributes))) {
    if (dispatch != nullptr) dispatch->Release();
    return nullptr;
  }
  auto table = std::make_unique<DualTable>();
  for (WORD f = 0; f < attributes->cFuncs; ++f) {
    FUNCDESC* func = nullptr;
    if (FAILED(vtable->GetFuncDesc(f, &func))) continue;
    const size_t slot = static_cast<size_t>(func->oVft) / sizeof(void*) - 7;
    if (slot < kThunks) {
      if (table->slots.size() <= slot) table->slots.resize(slot + 1);
      SlotInfo& info = table->slots[slot];
      info.memberId = func->memid;
      info.flags = func->invkind == INVOKE_PROPERTYGET      ? DISPATCH_PROPERTYGET
                   : func->invkind == INVOKE_PROPERTYPUT    ? DISPATCH_PROPERTYPUT
                   : func->invkind == INVOKE_PROPERTYPUTREF ? DISPATCH_PROPERTYPUTREF
                                                            : DISPATCH_METHOD;
      for (SHORT p = 0; p < func->cParams; ++p) {
        const ELEMDESC& param = func->lprgelemdescParam[p];
        const bool pointer = param.tdesc.vt == VT_PTR;
        const VARTYPE type = pointer ? param.tdesc.lptdesc->vt : param.tdesc.vt;
        if ((param.paramdesc.wParamFlags & PARAMFLAG_FRETVAL) != 0) {
          info.result = type;
        } else {
          info.params.push_back(pointer ? static_cast<VARTYPE>(type | VT_BYREF) : type);
        }
      }
    }
    vtable->ReleaseFuncDesc(func);
  }
  vtable->ReleaseTypeAttr(attributes);
  vtable->Release();
  dispatch->Release();
  table->vtable = {
      reinterpret_cast<void*>(&dualQueryInterface), reinterpret_cast<void*>(&dualAddRef),
      reinterpret_cast<void*>(&dualRelease),        reinterpret_cast<void*>(&dualGetTypeInfoCount),
      reinterpret_cast<void*>(&dualGetTypeInfo),    reinterpret_cast<void*>(&dualGetIDsOfNames),
      reinterpret_cast<void*>(&dualInvoke)};
  for (size_t slot = 0; slot < table->slots.size(); ++slot) {
    table->vtable.push_back(droqbxml_dual_thunks + slot * kThunkSize);
  }
  entry = std::move(table);
  return entry.get();
}

void* const* DispatchObject::dualVtable(const DualTable& table) { return table.vtable.data(); }

Ref<Object> objectInside(IUnknown* unknown) {
  IDispatch* own = nullptr;
  if (FAILED(unknown->QueryInterface(kOwnObject, reinterpret_cast<void**>(&own)))) return nullptr;
  Ref<Object> object = static_cast<DispatchObject*>(own)->object();
  own->Release();
  return object;
}

}  // namespace

// A call through slot `slot` of a dual interface's vtable: the arguments as the caller left
// them (`arguments[0]` is the interface, then one 8-byte slot each; the first three after it
// also in `doubles` when they are floating point), made into an IDispatch call of the same
// member. The result goes where the last argument points; a failure is its HRESULT, with
// the error information set as for IDispatch callers.
extern "C" HRESULT droqbxml_dual_call(void* self, int slot, uint64_t* arguments, double* doubles) {
  auto* face = static_cast<DualFace*>(self);
  const DualTable* table = dualTableFor(face->owner->object()->className());
  if (table == nullptr || slot < 0 || static_cast<size_t>(slot) >= table->slots.size()) {
    return E_NOTIMPL;
  }
  const SlotInfo& info = table->slots[static_cast<size_t>(slot)];
  const size_t count = info.params.size();
  std::vector<VARIANT> values(count);
  for (size_t p = 0; p < count; ++p) {
    const uint64_t raw = arguments[p + 1];
    VARIANT& value = values[count - 1 - p];  // IDispatch takes them last to first
    VariantInit(&value);
    switch (info.params[p]) {
      case VT_BSTR:
        V_VT(&value) = VT_BSTR;
        V_BSTR(&value) = reinterpret_cast<BSTR>(raw);
        break;
      case VT_BOOL:
        V_VT(&value) = VT_BOOL;
        V_BOOL(&value) = static_cast<VARIANT_BOOL>(raw & 0xFFFF);
        break;
      case VT_I2:
        V_VT(&value) = VT_I2;
        V_I2(&value) = static_cast<SHORT>(raw & 0xFFFF);
        break;
      case VT_I4:
        V_VT(&value) = VT_I4;
        V_I4(&value) = static_cast<LONG>(raw & 0xFFFFFFFF);
        break;
      case VT_R8:
        V_VT(&value) = VT_R8;
        if (p < 3) {
          V_R8(&value) = doubles[p];
        } else {
          std::memcpy(&V_R8(&value), &arguments[p + 1], sizeof(double));
        }
        break;
      case VT_DISPATCH:
        V_VT(&value) = VT_DISPATCH;
        V_DISPATCH(&value) = reinterpret_cast<IDispatch*>(raw);
        break;
      case VT_UNKNOWN:
        V_VT(&value) = VT_UNKNOWN;
        V_UNKNOWN(&value) = reinterpret_cast<IUnknown*>(raw);
        break;
      case VT_VARIANT:  // a VARIANT by value arrives as a pointer to the caller's copy
        std::memcpy(&value, reinterpret_cast<const VARIANT*>(raw), sizeof(VARIANT));
        break;
      default:  // by reference: the caller's own storage
        V_VT(&value) = static_cast<VARTYPE>(VT_VARIANT | VT_BYREF);
        V_VARIANTREF(&value) = reinterpret_cast<VARIANT*>(raw);
        break;
    }
  }
  DISPID put = DISPID_PROPERTYPUT;
  const bool isPut = (info.flags & (DISPATCH_PROPERTYPUT | DISPATCH_PROPERTYPUTREF)) != 0;
  DISPPARAMS params{values.data(), isPut ? &put : nullptr, static_cast<UINT>(count),
                    isPut ? 1u : 0u};
  VARIANT result;
  VariantInit(&result);
  EXCEPINFO exception{};
  const HRESULT called = face->owner->Invoke(info.memberId, IID_NULL, LOCALE_USER_DEFAULT,
                                             info.flags, &params, &result, &exception, nullptr);
  // The arguments were the caller's: nothing of theirs is freed here.
  if (called == DISP_E_EXCEPTION) {
    SysFreeString(exception.bstrSource);
    SysFreeString(exception.bstrDescription);
    SysFreeString(exception.bstrHelpFile);
    VariantClear(&result);
    return exception.scode;
  }
  if (FAILED(called) || info.result == VT_EMPTY) {
    VariantClear(&result);
    return called;
  }
  void* out = reinterpret_cast<void*>(arguments[count + 1]);
  if (out == nullptr) {
    VariantClear(&result);
    return E_POINTER;
  }
  if (info.result == VT_VARIANT) {
    std::memcpy(out, &result, sizeof(VARIANT));
    return S_OK;
  }
  VARIANT converted;
  VariantInit(&converted);
  const HRESULT changed = VariantChangeType(&converted, &result, 0, info.result);
  VariantClear(&result);
  if (FAILED(changed)) return changed;
  switch (info.result) {
    case VT_BSTR:
      *static_cast<BSTR*>(out) = V_BSTR(&converted);
      break;
    case VT_BOOL:
      *static_cast<VARIANT_BOOL*>(out) = V_BOOL(&converted);
      break;
    case VT_I2:
      *static_cast<SHORT*>(out) = V_I2(&converted);
      break;
    case VT_I4:
      *static_cast<LONG*>(out) = V_I4(&converted);
      break;
    case VT_R8:
      *static_cast<double*>(out) = V_R8(&converted);
      break;
    case VT_DISPATCH:
      *static_cast<IDispatch**>(out) = V_DISPATCH(&converted);
      break;
    case VT_UNKNOWN:
      *static_cast<IUnknown**>(out) = V_UNKNOWN(&converted);
      break;
    default:
      VariantClear(&converted);
      return DISP_E_TYPEMISMATCH;
  }
  return S_OK;
}

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
