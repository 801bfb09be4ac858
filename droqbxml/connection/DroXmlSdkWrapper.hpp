// DroXmlSdkWrapper: the only class that talks to QuickBooks. It owns one request processor,
// opens the connection under the host's identity, begins and ends a session on a company
// file, sends each request and hands back the response, unescaped once. QuickBooks'
// expected outcomes become ResponseStatus values, not errors; every exchange that did not
// succeed is written to the failed-exchange log.
#ifndef DROQBXML_CONNECTION_DROXMLSDKWRAPPER_HPP_
#define DROQBXML_CONNECTION_DROXMLSDKWRAPPER_HPP_

#include <cstdint>
#include <memory>

#include "droqbxml/connection/RequestProcessor.hpp"
#include "droqbxml/qbxml/Enumerations.hpp"
#include "droqbxml/runtime/Object.hpp"

namespace droqbxml {

class DroXmlSdkWrapper final : public Object {
 public:
  // Creates the processor registered as "QBXMLRP.RequestProcessor.1". When none can be
  // created (429) the wrapper goes on without one: appID and appName stay "", the status 0,
  // and calls that reach the processor fail with the runtime's 91. Any other creation
  // failure is raised from "DroXmlSdkWrapper.Class_Initialize.CreateQbXmlObject".
  DroXmlSdkWrapper();

  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  // The processor's version numbers, read through unchanged (published spelling "Verion").
  int16_t QbxmlMajorVerion() const;
  int16_t QbxmlMinorVersion() const;
  // Releases the processor (published spelling); the host calls it before dropping the
  // wrapper.
  void class_termintate();
  // Opens the connection; any failure is recorded under "DroXmlSdkWrapper.ConnectionOpen"
  // and raised.
  void ConnectionOpen();
  Text GetCurrentCompanyFileName() const;
  void ConnectionClose();
  // Begins a session on CompanyFilePath: "" sets RSUnsetCoFile; another open company file
  // sets RSCoNameMismatch; refused logins set RSCantLogin; a connection that was not open
  // is opened and the session tried again; other failures close the connection and raise.
  void SessionBegin();
  void SessionEnd();
  // Sends a request and returns the response unescaped once ("" for a blank request).
  // Processor failures are returned as the response text with RSParsingError or RSUnknown.
  Text ProcessRequest(const Text& sSendText);

  const Text& appName() const { return appName_; }
  void appName(const Text& value);
  const Text& SessionTicket() const { return sessionTicket_; }
  const Text& appID() const { return appID_; }
  void appID(const Text& value);
  const Text& CompanyFilePath() const { return companyFilePath_; }
  void CompanyFilePath(const Text& value);
  const Text& CoFilePathDefault() const { return coFilePathDefault_; }
  udResponseStatus ResponseStatus() const { return responseStatus_; }

  // Opens a connection and a session on FilePath and reports whether a ticket was issued.
  // On a refusal the connection it opened is deliberately left open.
  bool TestForSdkComms(const Text& FilePath = u"");
  Text XMLUnEscape(const Text& sValue) const;

  // The status of a response: its first statusCode attribute read as a leading number,
  // -10 when there is none. A code without a closing quote is the runtime's 5.
  static int32_t ReadStatusCode(const Text& response);
  // True when the response carries QuickBooks' "not fully completed" warning. Nothing in
  // the wrapper calls it; hosts may.
  static bool IsIncompleteQueryResponse(const Text& response);

 private:
  RequestProcessor& processor() const;
  void SetResponseStatus(int32_t status) { responseStatus_ = static_cast<udResponseStatus>(status); }

  Text appID_;
  Text appName_;
  Text sessionTicket_;
  Text companyFilePath_;
  std::shared_ptr<RequestProcessor> processor_;
  Text coFilePathDefault_;
  udResponseStatus responseStatus_ = RSSuccess;
};

}  // namespace droqbxml

#endif  // DROQBXML_CONNECTION_DROXMLSDKWRAPPER_HPP_
