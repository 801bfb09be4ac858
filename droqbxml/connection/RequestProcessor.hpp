// The request processor: what the component needs of QuickBooks' "QBXMLRP.RequestProcessor.1"
// (open a connection, begin a session on a company file, process requests, end the
// session, close the connection). The platform's processor on Windows and the embedded
// stand-in both implement it; the wrapper creates one by ProgID through the registry.
//
// Failures are ComErrors carrying the processor's HRESULT as Number and its message text
// as Description; the wrapper reads the text to decide what happened.
#ifndef DROQBXML_CONNECTION_REQUESTPROCESSOR_HPP_
#define DROQBXML_CONNECTION_REQUESTPROCESSOR_HPP_

#include <cstdint>
#include <functional>
#include <memory>
#include <vector>

#include "droqbxml/runtime/Text.hpp"

namespace droqbxml {

// The ProgID under which the component looks for QuickBooks' request processor.
inline constexpr TextView kRequestProcessorProgId = u"QBXMLRP.RequestProcessor.1";

// Open modes of BeginSession.
enum QBFileMode : int32_t { qbFileOpenSingleUser = 0, qbFileOpenMultiUser = 1, qbFileOpenDoNotCare = 2 };

class RequestProcessor {
 public:
  virtual ~RequestProcessor() = default;

  virtual void OpenConnection(const Text& appID, const Text& appName) = 0;
  // Returns the session ticket.
  virtual Text BeginSession(const Text& qbFile, QBFileMode mode) = 0;
  // Returns the qbXML response document.
  virtual Text ProcessRequest(const Text& ticket, const Text& request) = 0;
  virtual void EndSession(const Text& ticket) = 0;
  virtual void CloseConnection() = 0;
  virtual Text GetCurrentCompanyFileName(const Text& ticket) = 0;
  virtual int16_t MajorVersion() = 0;
  virtual int16_t MinorVersion() = 0;
};

using RequestProcessorFactory = std::function<std::shared_ptr<RequestProcessor>()>;

// Makes `factory` the source of processors for `progId` (case-insensitive), replacing any
// earlier one. Registrations are process-wide and may be made from any thread.
void registerRequestProcessor(TextView progId, RequestProcessorFactory factory);
void unregisterRequestProcessor(TextView progId);
// The factory registered for `progId`, or an empty one.
RequestProcessorFactory registeredRequestProcessor(TextView progId);
// The ProgIDs registered so far, in registration order.
std::vector<Text> registeredRequestProcessors();

// A new processor for `progId`: the registered factory, else the platform's own creation
// (COM on Windows); nothing available is the platform's 429.
std::shared_ptr<RequestProcessor> createRequestProcessor(TextView progId);

}  // namespace droqbxml

#endif  // DROQBXML_CONNECTION_REQUESTPROCESSOR_HPP_
