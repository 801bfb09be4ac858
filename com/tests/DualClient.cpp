// Under Wine: a client that binds early, through the dual interfaces' vtables as widl
// declares them, reaches the same members as a script does by name: texts, numbers,
// objects, optional and in/out arguments, and errors as HRESULTs with error information.
#include <windows.h>
// After windows.h:
#include <oleauto.h>

#include <cstdio>
#include <cwchar>

#include "DroQbXml.h"

namespace {

int failures = 0;

void check(const char* label, bool ok) {
  if (!ok) {
    std::printf("FAIL %s\n", label);
    ++failures;
  }
}

template <class Interface>
Interface* create(REFCLSID clsid, REFIID iid) {
  Interface* object = nullptr;
  CoCreateInstance(clsid, nullptr, CLSCTX_INPROC_SERVER, iid, reinterpret_cast<void**>(&object));
  return object;
}

VARIANT text(const wchar_t* value) {
  VARIANT v;
  VariantInit(&v);
  V_VT(&v) = VT_BSTR;
  V_BSTR(&v) = SysAllocString(value);
  return v;
}

VARIANT missing() {
  VARIANT v;
  VariantInit(&v);
  V_VT(&v) = VT_ERROR;
  V_ERROR(&v) = DISP_E_PARAMNOTFOUND;
  return v;
}

}  // namespace

int main() {
  CoInitialize(nullptr);
  _DroXmlBuilder* builder = create<_DroXmlBuilder>(CLSID_DroXmlBuilder, IID__DroXmlBuilder);
  _DroEstimate* estimate = create<_DroEstimate>(CLSID_DroEstimate, IID__DroEstimate);
  check("created", builder != nullptr && estimate != nullptr);
  if (builder != nullptr && estimate != nullptr) {
    BSTR memo = SysAllocString(L"Porch & steps");
    check("put text", SUCCEEDED(estimate->put_Memo(memo)));
    SysFreeString(memo);
    BSTR read = nullptr;
    check("get text", SUCCEEDED(estimate->get_Memo(&read)) && read != nullptr &&
                          std::wcscmp(read, L"Porch & steps") == 0);
    SysFreeString(read);

    IDispatch* linesObject = nullptr;
    check("get object", SUCCEEDED(estimate->get_EstimateLines(&linesObject)) && linesObject);
    _DroEstimateLineCol* lines = nullptr;
    if (linesObject != nullptr) {
      linesObject->QueryInterface(IID__DroEstimateLineCol, reinterpret_cast<void**>(&lines));
      linesObject->Release();
    }
    check("its interface", lines != nullptr);
    if (lines != nullptr) {
      VARIANT key = text(L"Tile");
      VARIANT none = missing();
      IDispatch* added = nullptr;
      check("optional argument left out", SUCCEEDED(lines->Add(key, none, &added)) && added);
      VariantClear(&key);
      if (added != nullptr) added->Release();
      LONG count = 0;
      check("number", SUCCEEDED(lines->get_Count(&count)) && count == 1);
      // In/out positions of a line collection's ParseRs come back moved.
      BSTR response = SysAllocString(
          L"<EstimateLineRet><TxnLineID>L1</TxnLineID><ItemRef><ListID>1</ListID>"
          L"<FullName>Tile</FullName></ItemRef></EstimateLineRet>");
      VARIANT start;
      VARIANT end;
      VariantInit(&start);
      VariantInit(&end);
      V_VT(&start) = VT_I4;
      V_I4(&start) = 0;
      V_VT(&end) = VT_I4;
      V_I4(&end) = 1;
      check("in/out call", SUCCEEDED(lines->ParseRs(response, &start, &end)));
      check("in/out written back", V_VT(&end) == VT_I4 && V_I4(&end) > 1);
      SysFreeString(response);
      lines->Release();
    }

    // A failure is its HRESULT, with the component's text in the error information.
    check("builds", SUCCEEDED(builder->BuildQueryByAll(0)));
    const HRESULT refused = builder->AddHeaders();
    check("component error", refused == static_cast<HRESULT>(0x80044E22));
    IErrorInfo* error = nullptr;
    BSTR source = nullptr;
    check("error information", GetErrorInfo(0, &error) == S_OK && error != nullptr &&
                                   SUCCEEDED(error->GetSource(&source)) &&
                                   std::wcscmp(source, L"DroXmlProcessor.AddHeaders") == 0);
    SysFreeString(source);
    if (error != nullptr) error->Release();
    BSTR xml = nullptr;
    check("result text", SUCCEEDED(builder->get_XML(&xml)) && xml != nullptr &&
                             std::wcsstr(xml, L"<CustomerQueryRq requestID=\"2\" />") != nullptr);
    SysFreeString(xml);
  }
  if (estimate != nullptr) estimate->Release();
  if (builder != nullptr) builder->Release();
  CoUninitialize();
  if (failures == 0) std::printf("ALL PASS\n");
  std::printf("SCRIPT DONE\n");
  return failures;
}
