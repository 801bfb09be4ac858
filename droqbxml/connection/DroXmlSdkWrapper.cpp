// The session wrapper: connection and session steps, the mapping of the processor's
// messages to status values, and the failed-exchange log.
#include "droqbxml/connection/DroXmlSdkWrapper.hpp"

#include <array>
#include <optional>

#include "droqbxml/component/basGlobals.hpp"
#include "droqbxml/diagnostics/Logs.hpp"
#include "droqbxml/diagnostics/clsMyErr.hpp"
#include "droqbxml/qbxml/XmlEscaping.hpp"
#include "droqbxml/runtime/Binding.hpp"
#include "droqbxml/runtime/Clock.hpp"
#include "droqbxml/runtime/ComError.hpp"
#include "droqbxml/runtime/Numbers.hpp"

namespace droqbxml {
namespace {

// The identifier the host application is known by in QuickBooks' integrated applications.
constexpr TextView kApplicationId = u"4093-27-";
constexpr TextView kApplicationName = u"Tessaly";

constexpr TextView kOpenConnectionNotCalled = u"OpenConnection\" has not been called.";
constexpr TextView kBeginSessionNotCalled =
    u"BeginSession\" method has not been called or did not succeed.";
// Compared as a whole, unlike the other messages, which are searched for.
constexpr TextView kOtherCompanyFileOpen =
    u"There is already a company data file open and it is different from the requested one.";
constexpr std::array<TextView, 4> kLoginRefusals{
    u"This application is not allowed to log into this QuickBooks company data file "
    u"automatically.",
    u"This application has not accessed this QuickBooks company data file before.  Only the "
    u"QuickBooks administrator can grant permission for an application to access a "
    u"QuickBooks company data file for the first time.",
    u"Unexpected error. Check the qbsdk.log file for possible, additional information.",
    u"Access denied. This application does not have permission to access this QuickBooks "
    u"company data file. If access is required, the QuickBooks administrator can grant "
    u"permission through Integrated Application preferences.",
};
constexpr std::array<TextView, 2> kParseFailures{
    u"An error occurred when parsing the provided XML file.",
    u"QuickBooks found an error when parsing the provided XML text stream.",
};
// QuickBooks' misspelt "turned of" is searched for on purpose, beside "turned off".
constexpr std::array<TextView, 3> kEstimateTaxMessages{
    u"There is an invalid reference to QuickBooks EstimateLineItem SalesTaxCode \"NON\" in the "
    u"Estimate line.  QuickBooks error message: You can't set taxable if Sales tax is turned "
    u"of or the item is not a taxable item type.",
    u"There is an invalid reference to QuickBooks EstimateLineItem SalesTaxCode \"NON\" in the "
    u"Estimate line.  QuickBooks error message: You can't set taxable if Sales tax is turned "
    u"off or the item is not a taxable item type.",
    u"There is an invalid reference to QuickBooks EstimateLineItem SalesTaxCode \"NON\" in the "
    u"Estimate line.",
};
constexpr std::array<TextView, 3> kInvoiceTaxMessages{
    u"There is an invalid reference to QuickBooks InvoiceLineItem SalesTaxCode \"NON\" in the "
    u"Invoice line.  QuickBooks error message: You can't set taxable if Sales tax is turned "
    u"of or the item is not a taxable item type.",
    u"There is an invalid reference to QuickBooks InvoiceLineItem SalesTaxCode \"NON\" in the "
    u"Invoice line.  QuickBooks error message: You can't set taxable if Sales tax is turned "
    u"off or the item is not a taxable item type.",
    u"There is an invalid reference to QuickBooks InvoiceLineItem SalesTaxCode \"NON\" in the "
    u"Invoice line.",
};

bool contains(TextView text, TextView what) { return text.find(what) != TextView::npos; }

template <size_t N>
bool containsAny(TextView text, const std::array<TextView, N>& messages) {
  for (const auto message : messages) {
    if (contains(text, message)) return true;
  }
  return false;
}

template <size_t N>
bool containsAnyUpper(const Text& upperText, const std::array<TextView, N>& messages) {
  for (const auto message : messages) {
    if (contains(upperText, upperAscii(message))) return true;
  }
  return false;
}

// The platform's Val: the leading number of a text (spaces skipped), 0 when there is none.
double leadingNumber(TextView text) {
  size_t i = 0;
  while (i < text.size() && (text[i] == u' ' || text[i] == u'\t')) ++i;
  const size_t start = i;
  auto digits = [&] {
    while (i < text.size() && text[i] >= u'0' && text[i] <= u'9') ++i;
  };
  if (i < text.size() && (text[i] == u'+' || text[i] == u'-')) ++i;
  const size_t integerStart = i;
  digits();
  bool any = i > integerStart;
  if (i < text.size() && text[i] == u'.') {
    const size_t fractionStart = ++i;
    digits();
    any = any || i > fractionStart;
  }
  if (!any) return 0.0;
  if (i < text.size() && (upperAscii(text[i]) == u'E' || upperAscii(text[i]) == u'D')) {
    size_t save = i++;
    if (i < text.size() && (text[i] == u'+' || text[i] == u'-')) ++i;
    const size_t exponentStart = i;
    digits();
    if (i == exponentStart) i = save;
  }
  return textToDouble(text.substr(start, i - start));
}

[[noreturn]] void raiseRecorded(const ErrorRecord& error, TextView source) {
  const auto shared = basGlobals::SharedErrorObject();
  shared->SetError(error, Text(source));
  shared->Raise();
  throw ComError(error);  // Raise returns only for error number 0
}

}  // namespace

DroXmlSdkWrapper::DroXmlSdkWrapper() {
  try {
    processor_ = createRequestProcessor(kRequestProcessorProgId);
  } catch (const ComError& error) {
    if (error.number() != RuntimeError::kCantCreateObject) {
      raiseRecorded(error.record(), u"DroXmlSdkWrapper.Class_Initialize.CreateQbXmlObject");
    }
  }
  if (processor_) {
    appID_ = Text(kApplicationId);
    appName_ = Text(kApplicationName);
    coFilePathDefault_.clear();
    responseStatus_ = RSUnknown;
  }
}

const ClassInfo& DroXmlSdkWrapper::typeInfo() {
  using W = DroXmlSdkWrapper;
  static const ClassInfo info(
      u"DroXmlSdkWrapper",
      Members()
          .getter(u"QbxmlMajorVerion", &W::QbxmlMajorVerion)
          .getter(u"QbxmlMinorVersion", &W::QbxmlMinorVersion)
          .method(u"class_termintate", &W::class_termintate)
          .method(u"ConnectionOpen", &W::ConnectionOpen)
          .getter(u"GetCurrentCompanyFileName", &W::GetCurrentCompanyFileName)
          .method(u"ConnectionClose", &W::ConnectionClose)
          .method(u"SessionBegin", &W::SessionBegin)
          .method(u"SessionEnd", &W::SessionEnd)
          .method(u"ProcessRequest", &W::ProcessRequest)
          .property(u"appName", &W::appName, &W::appName)
          .getter(u"SessionTicket", &W::SessionTicket)
          .property(u"appID", &W::appID, &W::appID)
          .property(u"CompanyFilePath", &W::CompanyFilePath, &W::CompanyFilePath)
          .getter(u"CoFilePathDefault", &W::CoFilePathDefault)
          .getter(u"ResponseStatus", &W::ResponseStatus)
          .method(u"TestForSdkComms", &W::TestForSdkComms)
          .optional(1)
          .method(u"XMLUnEscape", &W::XMLUnEscape)
          .take());
  return info;
}

RequestProcessor& DroXmlSdkWrapper::processor() const {
  if (!processor_) raiseRuntimeError(RuntimeError::kObjectNotSet);
  return *processor_;
}

int16_t DroXmlSdkWrapper::QbxmlMajorVerion() const { return processor().MajorVersion(); }
int16_t DroXmlSdkWrapper::QbxmlMinorVersion() const { return processor().MinorVersion(); }

void DroXmlSdkWrapper::class_termintate() { processor_.reset(); }

void DroXmlSdkWrapper::ConnectionOpen() {
  try {
    processor().OpenConnection(appID_, appName_);
  } catch (const ComError& error) {
    raiseRecorded(error.record(), u"DroXmlSdkWrapper.ConnectionOpen");
  }
}

Text DroXmlSdkWrapper::GetCurrentCompanyFileName() const {
  return processor().GetCurrentCompanyFileName(sessionTicket_);
}

void DroXmlSdkWrapper::ConnectionClose() { processor().CloseConnection(); }

void DroXmlSdkWrapper::SessionBegin() {
  for (;;) {
    if (companyFilePath_.empty()) {
      SetResponseStatus(RSUnsetCoFile);
      return;
    }
    std::optional<ErrorRecord> failure;
    try {
      sessionTicket_ = processor().BeginSession(companyFilePath_, qbFileOpenDoNotCare);
    } catch (const ComError& error) {
      failure = error.record();
    }
    const Text description = failure ? failure->Description : Text();
    if (contains(description, kOpenConnectionNotCalled)) {
      // Unbounded on purpose: it ends when ConnectionOpen raises or the session begins.
      ConnectionOpen();
      continue;
    }
    if (description == kOtherCompanyFileOpen) {
      SetResponseStatus(RSCoNameMismatch);
    } else if (containsAny(description, kLoginRefusals)) {
      SetResponseStatus(RSCantLogin);
    } else if (failure) {
      basGlobals::SharedErrorObject()->SetError(*failure, u"DroXmlSdkWrapper.SessionBegin");
      ConnectionClose();
      basGlobals::SharedErrorObject()->Raise();
      throw ComError(*failure);
    }
    return;
  }
}

void DroXmlSdkWrapper::SessionEnd() {
  try {
    processor().EndSession(sessionTicket_);
  } catch (const ComError& error) {
    if (contains(error.description(), kBeginSessionNotCalled)) {
      raiseRecorded(error.record(), u"DroXmlSdkWrapper.SessionEnd");
    }
    throw;
  }
  sessionTicket_.clear();
}

Text DroXmlSdkWrapper::ProcessRequest(const Text& sSendText) {
  Text response;
  LocalTime sent = kZeroDate;
  LocalTime received = kZeroDate;
  if (!trimView(sSendText).empty()) {
    try {
      sent = now();
      response = processor().ProcessRequest(sessionTicket_, sSendText);
      received = now();
      SetResponseStatus(ReadStatusCode(response));
      unescapeInPlace(response);  // what XMLUnEscape gives, without a copy
      if (responseStatus_ == RSRefNotFound) {
        const Text upper = upperAscii(response);
        if (containsAnyUpper(upper, kEstimateTaxMessages)) {
          SetResponseStatus(RSTaxErrorEstimate);
        } else if (containsAnyUpper(upper, kInvoiceTaxMessages)) {
          SetResponseStatus(RSTaxErrorInvoice);
        }
      }
    } catch (const ComError& error) {
      if (containsAny(error.description(), kParseFailures)) {
        SetResponseStatus(RSParsingError);
        if (response.empty()) response = error.description();
      } else {
        SetResponseStatus(RSUnknown);
        if (response.empty()) response = error.description();
        basGlobals::SharedErrorObject()->SetError(error.record(),
                                                  u"DroXmlSdkWrapper.ProcessRequest");
      }
    }
  }
  // Also after a blank request, with the previous status and the zero date.
  if (responseStatus_ != RSSuccess && responseStatus_ != RSNotFound) {
    LogFailedExchange(sSendText, response, sent, received);
  }
  return response;
}

void DroXmlSdkWrapper::appName(const Text& value) { appName_ = trim(value); }
void DroXmlSdkWrapper::appID(const Text& value) { appID_ = trim(value); }
void DroXmlSdkWrapper::CompanyFilePath(const Text& value) { companyFilePath_ = trim(value); }

bool DroXmlSdkWrapper::TestForSdkComms(const Text& FilePath) {
  SetResponseStatus(RSUnknown);
  CompanyFilePath(FilePath);
  ConnectionOpen();
  SessionBegin();
  if (responseStatus_ == RSUnknown || responseStatus_ == RSSuccess) {
    const bool result = !sessionTicket_.empty();
    SessionEnd();
    ConnectionClose();
    return result;
  }
  // The connection opened above is deliberately left open.
  return false;
}

Text DroXmlSdkWrapper::XMLUnEscape(const Text& sValue) const {
  return XMLUnEscapeText(sValue, false);
}

int32_t DroXmlSdkWrapper::ReadStatusCode(const Text& response) {
  constexpr TextView kStatusCode = u"statusCode=";
  const auto at = response.find(kStatusCode);
  if (at == Text::npos) return RSUnknown;
  const size_t start = at + kStatusCode.size() + 1;  // past the opening quote, not checked
  const auto end = start <= response.size() ? response.find(u'"', start) : Text::npos;
  if (end == Text::npos) raiseRuntimeError(RuntimeError::kInvalidProcedureCall);
  return doubleToLong(leadingNumber(TextView(response).substr(start, end - start)));
}

bool DroXmlSdkWrapper::IsIncompleteQueryResponse(const Text& response) {
  constexpr TextView kHead =
      u"The query request has not been fully completed. There was a required element (";
  constexpr TextView kTail = u") that could not be found in QuickBooks.";
  const auto at = response.find(kHead);
  return at != Text::npos && response.find(kTail, at + kHead.size()) != Text::npos;
}

}  // namespace droqbxml
