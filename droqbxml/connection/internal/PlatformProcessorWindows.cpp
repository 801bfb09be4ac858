// On Windows the request processor is the one QuickBooks registers with COM: created by
// ProgID and called late-bound through IDispatch, each member name resolved to its DISPID
// once per processor. What the processor reports becomes a ComError with its HRESULT (or
// its own error code) as Number and its message text as Description.
#ifdef _WIN32

#include "droqbxml/connection/internal/PlatformProcessor.hpp"

// The COM and automation API.
#include <objbase.h>
#include <oleauto.h>
#include <windows.h>

#include <array>
#include <cstddef>
#include <cstdint>
#include <new>
#include <optional>
#include <utility>
#include <vector>

#include "droqbxml/runtime/ComError.hpp"

namespace droqbxml::internal {
namespace {

// Text and OLECHAR are both UTF-16 code units on Windows, so they convert by reinterpretation.
static_assert(sizeof(OLECHAR) == sizeof(char16_t));

// Answers of CLSIDFromProgID meaning "no class by that name": the caller reports 429 for them.
constexpr std::array<HRESULT, 4> kNotRegistered{CO_E_CLASSSTRING, REGDB_E_CLASSNOTREG,
                                                REGDB_E_READREGDB, REGDB_E_KEYMISSING};

// One member of QuickBooks' request processor as the processor publishes it: its name, how
// Invoke reaches it, and its slot in a processor's cache of DISPIDs.
struct Member {
  size_t slot;
  const OLECHAR* name;
  WORD kind;
};

constexpr Member kOpenConnection{0, L"OpenConnection", DISPATCH_METHOD};
constexpr Member kBeginSession{1, L"BeginSession", DISPATCH_METHOD};
constexpr Member kProcessRequest{2, L"ProcessRequest", DISPATCH_METHOD};
constexpr Member kEndSession{3, L"EndSession", DISPATCH_METHOD};
constexpr Member kCloseConnection{4, L"CloseConnection", DISPATCH_METHOD};
constexpr Member kGetCurrentCompanyFileName{5, L"GetCurrentCompanyFileName", DISPATCH_METHOD};
constexpr Member kMajorVersion{6, L"MajorVersion", DISPATCH_PROPERTYGET};
constexpr Member kMinorVersion{7, L"MinorVersion", DISPATCH_PROPERTYGET};
constexpr size_t kMemberCount = 8;

// The system's text for `result` without its line end, or the platform's generic
// "Automation error" when the system has none (QuickBooks' own codes, for instance).
Text systemMessage(HRESULT result) {
  std::array<wchar_t, 1024> buffer{};
  DWORD length = FormatMessageW(FORMAT_MESSAGE_FROM_SYSTEM | FORMAT_MESSAGE_IGNORE_INSERTS, nullptr,
                                static_cast<DWORD>(result), 0, buffer.data(),
                                static_cast<DWORD>(buffer.size()), nullptr);
  while (length > 0 && (buffer[length - 1] == L'\r' || buffer[length - 1] == L'\n' ||
                        buffer[length - 1] == L' ')) {
    --length;
  }
  if (length == 0) return u"Automation error";
  return Text(reinterpret_cast<const char16_t*>(buffer.data()), length);
}

// Raises a failed call: `result` as Number, the system's text as Description.
[[noreturn]] void raiseFailure(HRESULT result, TextView source) {
  raiseError(static_cast<int32_t>(result), Text(source), systemMessage(result));
}

Text textOf(BSTR text) {
  if (text == nullptr) return {};
  return Text(reinterpret_cast<const char16_t*>(text), SysStringLen(text));
}

// This thread's membership of a single-threaded apartment while the guard lives. A thread
// already in COM keeps its apartment (the call is counted and undone all the same); a thread
// in the multithreaded apartment is used as it is. Raises what CoInitializeEx reports otherwise.
class ComApartment {
 public:
  explicit ComApartment(TextView source) {
    const HRESULT result = CoInitializeEx(nullptr, COINIT_APARTMENTTHREADED);
    if (result == RPC_E_CHANGED_MODE) return;
    if (FAILED(result)) raiseFailure(result, source);
    thread_ = GetCurrentThreadId();  // S_OK and S_FALSE both want their CoUninitialize
  }
  ~ComApartment() {
    // Only the thread that joined can leave; on another thread COM's count is not ours.
    if (thread_ && *thread_ == GetCurrentThreadId()) CoUninitialize();
  }
  ComApartment(const ComApartment&) = delete;
  ComApartment& operator=(const ComApartment&) = delete;

 private:
  std::optional<DWORD> thread_;
};

// The sole owner of one IDispatch reference, released with the holder.
class DispatchRef {
 public:
  DispatchRef() = default;
  ~DispatchRef() {
    if (pointer_ != nullptr) pointer_->Release();
  }
  DispatchRef(const DispatchRef&) = delete;
  DispatchRef& operator=(const DispatchRef&) = delete;

  IDispatch* operator->() const noexcept { return pointer_; }
  // Where a creation call stores the new reference; the holder is empty then.
  void** put() noexcept { return reinterpret_cast<void**>(&pointer_); }

 private:
  IDispatch* pointer_ = nullptr;
};

// One VARIANT, cleared (its BSTR freed) with the holder.
class OleVariant {
 public:
  OleVariant() noexcept { VariantInit(&value_); }
  ~OleVariant() { VariantClear(&value_); }
  OleVariant(const OleVariant&) = delete;
  OleVariant& operator=(const OleVariant&) = delete;

  VARIANT* get() noexcept { return &value_; }
  // Converts the value in place to `type`; raises what VariantChangeType reports.
  void changeType(VARTYPE type, TextView source) {
    if (V_VT(&value_) == type) return;
    const HRESULT result = VariantChangeType(&value_, &value_, 0, type);
    if (FAILED(result)) raiseFailure(result, source);
  }

 private:
  VARIANT value_;
};

// The arguments of one call in the order Invoke takes them (the last one first), each
// cleared with the holder.
class Arguments {
 public:
  Arguments() = default;
  ~Arguments() {
    for (auto& value : values_) VariantClear(&value);
  }
  Arguments(const Arguments&) = delete;
  Arguments& operator=(const Arguments&) = delete;

  // Adds the next argument, left to right as the member declares them.
  Arguments& text(const Text& value) {
    VARIANT& slot = prepend();
    V_BSTR(&slot) = SysAllocStringLen(reinterpret_cast<const OLECHAR*>(value.data()),
                                      static_cast<UINT>(value.size()));
    if (V_BSTR(&slot) == nullptr) throw std::bad_alloc();
    V_VT(&slot) = VT_BSTR;
    return *this;
  }
  Arguments& number(int32_t value) {
    VARIANT& slot = prepend();
    V_I4(&slot) = value;
    V_VT(&slot) = VT_I4;
    return *this;
  }

  DISPPARAMS params() noexcept {
    return DISPPARAMS{values_.data(), nullptr, static_cast<UINT>(values_.size()), 0};
  }

 private:
  // A new empty slot before the others.
  VARIANT& prepend() {
    values_.insert(values_.begin(), VARIANT{});
    VariantInit(&values_.front());
    return values_.front();
  }

  std::vector<VARIANT> values_;
};

// What a member reported through DISP_E_EXCEPTION; its texts are freed with the holder.
class ExceptionInfo {
 public:
  ExceptionInfo() noexcept : info_{} {}
  ~ExceptionInfo() {
    SysFreeString(info_.bstrSource);
    SysFreeString(info_.bstrDescription);
    SysFreeString(info_.bstrHelpFile);
  }
  ExceptionInfo(const ExceptionInfo&) = delete;
  ExceptionInfo& operator=(const ExceptionInfo&) = delete;

  EXCEPINFO* get() noexcept { return &info_; }

  // Raises the member's error: its own code (scode, else wCode, else `result`) as Number,
  // its description (else the system's text for the code), its source (else `source`), its
  // help file and context.
  [[noreturn]] void raise(HRESULT result, TextView source) {
    if (info_.pfnDeferredFillIn != nullptr) info_.pfnDeferredFillIn(&info_);
    ErrorRecord record;
    const HRESULT code = info_.scode != 0 ? info_.scode : result;
    record.Number = info_.scode == 0 && info_.wCode != 0 ? static_cast<int32_t>(info_.wCode)
                                                         : static_cast<int32_t>(code);
    record.Source = textOf(info_.bstrSource);
    if (record.Source.empty()) record.Source = Text(source);
    record.Description = textOf(info_.bstrDescription);
    if (record.Description.empty()) record.Description = systemMessage(code);
    record.HelpFile = textOf(info_.bstrHelpFile);
    record.HelpContext = static_cast<int32_t>(info_.dwHelpContext);
    // The whole record, not raiseError's three fields: hosts show the member's help topic.
    throw ComError(std::move(record));
  }

 private:
  EXCEPINFO info_;
};

// QuickBooks' request processor reached through IDispatch. It lives in the creating thread's
// apartment and, like every apartment-threaded object, is called and released on that thread.
class DispatchProcessor final : public RequestProcessor {
 public:
  // Creates the class `classId` registered as `progId`; raises what CoCreateInstance reports.
  DispatchProcessor(Text progId, const CLSID& classId)
      : apartment_(progId), progId_(std::move(progId)) {
    const HRESULT result =
        CoCreateInstance(classId, nullptr, CLSCTX_ALL, IID_IDispatch, dispatch_.put());
    if (FAILED(result)) raiseFailure(result, progId_);
  }

  void OpenConnection(const Text& appID, const Text& appName) override {
    Arguments arguments;
    arguments.text(appID).text(appName);
    OleVariant result;
    invoke(kOpenConnection, arguments, result);
  }

  Text BeginSession(const Text& qbFile, QBFileMode mode) override {
    Arguments arguments;
    arguments.text(qbFile).number(mode);
    return invokeText(kBeginSession, arguments);
  }

  Text ProcessRequest(const Text& ticket, const Text& request) override {
    Arguments arguments;
    arguments.text(ticket).text(request);
    return invokeText(kProcessRequest, arguments);
  }

  void EndSession(const Text& ticket) override {
    Arguments arguments;
    arguments.text(ticket);
    OleVariant result;
    invoke(kEndSession, arguments, result);
  }

  void CloseConnection() override {
    Arguments arguments;
    OleVariant result;
    invoke(kCloseConnection, arguments, result);
  }

  Text GetCurrentCompanyFileName(const Text& ticket) override {
    Arguments arguments;
    arguments.text(ticket);
    return invokeText(kGetCurrentCompanyFileName, arguments);
  }

  int16_t MajorVersion() override { return invokeInteger(kMajorVersion); }
  int16_t MinorVersion() override { return invokeInteger(kMinorVersion); }

 private:
  // The member's DISPID, asked of the processor on first use.
  DISPID dispid(const Member& member) {
    auto& cached = dispids_[member.slot];
    if (!cached) {
      LPOLESTR name = const_cast<LPOLESTR>(member.name);  // GetIDsOfNames only reads it
      DISPID id = DISPID_UNKNOWN;
      const HRESULT result = dispatch_->GetIDsOfNames(IID_NULL, &name, 1, LOCALE_USER_DEFAULT, &id);
      if (FAILED(result)) raiseFailure(result, progId_);
      cached = id;
    }
    return *cached;
  }

  // Calls the member; `result` receives its value. Raises what the member or Invoke reports.
  void invoke(const Member& member, Arguments& arguments, OleVariant& result) {
    const DISPID id = dispid(member);
    DISPPARAMS params = arguments.params();
    ExceptionInfo exception;
    UINT argumentError = 0;
    const HRESULT outcome =
        dispatch_->Invoke(id, IID_NULL, LOCALE_USER_DEFAULT, member.kind, &params, result.get(),
                          exception.get(), &argumentError);
    if (outcome == DISP_E_EXCEPTION) exception.raise(outcome, progId_);
    if (FAILED(outcome)) raiseFailure(outcome, progId_);
  }

  Text invokeText(const Member& member, Arguments& arguments) {
    OleVariant result;
    invoke(member, arguments, result);
    result.changeType(VT_BSTR, progId_);
    return textOf(V_BSTR(result.get()));
  }

  int16_t invokeInteger(const Member& member) {
    Arguments none;
    OleVariant result;
    invoke(member, none, result);
    result.changeType(VT_I2, progId_);
    return V_I2(result.get());
  }

  // Declared first so COM outlives the reference below.
  ComApartment apartment_;
  Text progId_;
  DispatchRef dispatch_;
  std::array<std::optional<DISPID>, kMemberCount> dispids_{};
};

}  // namespace

std::shared_ptr<RequestProcessor> createPlatformProcessor(TextView progId) {
  const Text name(progId);
  const ComApartment apartment(name);  // for the look-up; the processor joins on its own
  CLSID classId{};
  const HRESULT result = CLSIDFromProgID(reinterpret_cast<const OLECHAR*>(name.c_str()), &classId);
  for (const HRESULT notRegistered : kNotRegistered) {
    if (result == notRegistered) return nullptr;
  }
  if (FAILED(result)) raiseFailure(result, name);
  return std::make_shared<DispatchProcessor>(name, classId);
}

}  // namespace droqbxml::internal

#endif  // _WIN32
