// The component's own error numbers (0x80040000 + 20001 and upward) and clsErrorNumbers,
// the public class that carries them. Two members share 0x80044E34 on purpose: a parsing
// failure and a second open trace file differ only by source and description.
#ifndef DROQBXML_DIAGNOSTICS_ERRORNUMBERS_HPP_
#define DROQBXML_DIAGNOSTICS_ERRORNUMBERS_HPP_

#include <array>
#include <cstdint>

#include "droqbxml/runtime/Object.hpp"

namespace droqbxml {

// Published spellings, misspellings included (INITIONALIZED, QUNANTITY, PARING).
enum ERROR_NUMBER : int32_t {
  COMPANY_FILE_NOT_FOUND = -2147201503,
  DRO_XML_PROCESSOR_IMPROPERLY_INITIONALIZED = -2147201502,
  MISMATCH = -2147201501,
  COMPANY_FILE_PATH_IMPROPERLY_INITIALIZED = -2147201500,
  JOB_STATUS = -2147201499,
  TYPE_ACCOUNT = -2147201498,
  TYPE_AMOUNT = -2147201497,
  TYPE_BOOL = -2147201496,
  TYPE_DATE = -2147201495,
  TYPE_DATETIME = -2147201494,
  TYPE_INT = -2147201493,
  TYPE_PRICE = -2147201492,
  TYPE_QUNANTITY = -2147201491,
  TYPE_TIME_INTERVAL = -2147201490,
  TYPE_ID = -2147201489,
  TYPE_STRING = -2147201488,
  TYPE_WAGE = -2147201487,
  PARING = -2147201484,
  TOO_MANY_OPEN_TRACE_FILES = -2147201484,
  CANT_ADD_TO_QB_ITEM = -2147201482,
  CANT_ADD_TO_QB_CUSTOMER = -2147201481,
  CANT_ADD_TO_QB_JOB = -2147201480,
  CANT_ADD_TO_QB_ESTIMATE = -2147201479,
  CANT_ADD_TO_QB_INVOICE = -2147201478,
  CANT_ADD_TO_QB_ACCOUNT = -2147201477,
};

struct ErrorNumberName {
  const char16_t* name;
  ERROR_NUMBER value;
};

// Every member in published order, for the late-bound surface and for hosts that list them.
inline constexpr std::array<ErrorNumberName, 25> kErrorNumberNames{{
    {u"COMPANY_FILE_NOT_FOUND", COMPANY_FILE_NOT_FOUND},
    {u"DRO_XML_PROCESSOR_IMPROPERLY_INITIONALIZED", DRO_XML_PROCESSOR_IMPROPERLY_INITIONALIZED},
    {u"MISMATCH", MISMATCH},
    {u"COMPANY_FILE_PATH_IMPROPERLY_INITIALIZED", COMPANY_FILE_PATH_IMPROPERLY_INITIALIZED},
    {u"JOB_STATUS", JOB_STATUS},
    {u"TYPE_ACCOUNT", TYPE_ACCOUNT},
    {u"TYPE_AMOUNT", TYPE_AMOUNT},
    {u"TYPE_BOOL", TYPE_BOOL},
    {u"TYPE_DATE", TYPE_DATE},
    {u"TYPE_DATETIME", TYPE_DATETIME},
    {u"TYPE_INT", TYPE_INT},
    {u"TYPE_PRICE", TYPE_PRICE},
    {u"TYPE_QUNANTITY", TYPE_QUNANTITY},
    {u"TYPE_TIME_INTERVAL", TYPE_TIME_INTERVAL},
    {u"TYPE_ID", TYPE_ID},
    {u"TYPE_STRING", TYPE_STRING},
    {u"TYPE_WAGE", TYPE_WAGE},
    {u"PARING", PARING},
    {u"TOO_MANY_OPEN_TRACE_FILES", TOO_MANY_OPEN_TRACE_FILES},
    {u"CANT_ADD_TO_QB_ITEM", CANT_ADD_TO_QB_ITEM},
    {u"CANT_ADD_TO_QB_CUSTOMER", CANT_ADD_TO_QB_CUSTOMER},
    {u"CANT_ADD_TO_QB_JOB", CANT_ADD_TO_QB_JOB},
    {u"CANT_ADD_TO_QB_ESTIMATE", CANT_ADD_TO_QB_ESTIMATE},
    {u"CANT_ADD_TO_QB_INVOICE", CANT_ADD_TO_QB_INVOICE},
    {u"CANT_ADD_TO_QB_ACCOUNT", CANT_ADD_TO_QB_ACCOUNT},
}};

// Carries ERROR_NUMBER into the type library; late-bound clients read each member as a
// read-only property of that name.
class clsErrorNumbers final : public Object {
 public:
  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }
};

}  // namespace droqbxml

#endif  // DROQBXML_DIAGNOSTICS_ERRORNUMBERS_HPP_
