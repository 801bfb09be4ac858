// The Web Connector's SOAP envelopes: the answers written byte for byte as a .NET service
// writes them, calls read back exactly, and every unsafe or malformed body refused.
#include <gtest/gtest.h>

#include <string>

#include "webconnector/Soap.hpp"

namespace droqbxml::webconnector {
namespace {

const std::string kHead =
    "<?xml version=\"1.0\" encoding=\"utf-8\"?><soap:Envelope "
    "xmlns:soap=\"http://schemas.xmlsoap.org/soap/envelope/\" "
    "xmlns:xsi=\"http://www.w3.org/2001/XMLSchema-instance\" "
    "xmlns:xsd=\"http://www.w3.org/2001/XMLSchema\"><soap:Body>";
const std::string kTail = "</soap:Body></soap:Envelope>";

std::string enveloped(const std::string& body) { return kHead + body + kTail; }

std::string refusal(const std::string& body) {
  try {
    readSoapMessage(body);
  } catch (const SoapError& error) {
    return error.what();
  }
  return "accepted";
}

TEST(SoapTest, WritesAnswersAsDotNetDoes) {
  const struct {
    std::string written;
    std::string expected;
  } cases[] = {
      {soapStringsResult("authenticate", {"T", "nvu"}),
       "<authenticateResponse xmlns=\"http://developer.intuit.com/\"><authenticateResult>"
       "<string>T</string><string>nvu</string></authenticateResult></authenticateResponse>"},
      {soapIntResult("receiveResponseXML", -101),
       "<receiveResponseXMLResponse xmlns=\"http://developer.intuit.com/\">"
       "<receiveResponseXMLResult>-101</receiveResponseXMLResult></receiveResponseXMLResponse>"},
      {soapStringResult("getLastError", "a < b & c > d \"e\""),
       "<getLastErrorResponse xmlns=\"http://developer.intuit.com/\"><getLastErrorResult>"
       "a &lt; b &amp; c &gt; d \"e\"</getLastErrorResult></getLastErrorResponse>"},
      {soapFault("soap:Client", "no ticket <x>"),
       "<soap:Fault><faultcode>soap:Client</faultcode><faultstring>no ticket &lt;x&gt;"
       "</faultstring></soap:Fault>"},
      {soapCall("closeConnection", {{"ticket", "T"}}),
       "<closeConnection xmlns=\"http://developer.intuit.com/\"><ticket>T</ticket>"
       "</closeConnection>"},
  };
  for (const auto& c : cases) EXPECT_EQ(c.written, enveloped(c.expected));
}

TEST(SoapTest, ReadsCallsAnswersAndFaults) {
  // As .NET writes an answer, with prefixes and white space between elements.
  const auto answer = readSoapMessage(
      "<?xml version=\"1.0\"?>\n<s:Envelope xmlns:s=\"http://schemas.xmlsoap.org/soap/envelope/\">"
      "<s:Header><x:Trace xmlns:x=\"urn:x\"><x:string>no</x:string></x:Trace></s:Header>\n"
      " <s:Body>\n  <r:authenticateResponse xmlns:r=\"http://developer.intuit.com/\">"
      "<r:authenticateResult>\n<r:string>T&amp;1</r:string><string>none</string>"
      "</r:authenticateResult></r:authenticateResponse>\n </s:Body></s:Envelope>");
  EXPECT_EQ(answer.operation, "authenticateResponse");
  EXPECT_EQ(answer.strings, (std::vector<std::string>{"T&1", "none"}));
  EXPECT_TRUE(answer.has("authenticateResult"));

  EXPECT_FALSE(answer.has("ticket"));
  EXPECT_EQ(answer.parameter("ticket"), "");

  const auto fault = readSoapMessage(soapFault("soap:Server", "QuickBooks is busy"));
  EXPECT_EQ(fault.operation, "Fault");
  EXPECT_EQ(fault.parameter("faultcode"), "soap:Server");
  EXPECT_EQ(fault.parameter("faultstring"), "QuickBooks is busy");
}

TEST(SoapTest, QbxmlDocumentTravelsExactly) {
  const std::string document =
      "<?xml version=\"1.0\" encoding=\"utf-8\"?>\r\n<?qbxml version=\"13.0\"?>\r\n<QBXML>\r\n"
      "\t<QBXMLMsgsRq onError=\"stopOnError\">\r\n<CustomerAddRq><CustomerAdd>"
      "<Name>Café &amp; \"Ünïcode\" 'x' ]]&gt; €</Name></CustomerAdd></CustomerAddRq>\r\n"
      "</QBXMLMsgsRq>\r\n</QBXML>\r\n";
  EXPECT_EQ(readSoapMessage(soapCall("receiveResponseXML", {{"response", document}}))
                .parameter("response"),
            document);
  EXPECT_EQ(readSoapMessage(soapStringResult("sendRequestXML", document))
                .parameter("sendRequestXMLResult"),
            document);
}

TEST(SoapTest, RefusesUnsafeAndMalformedBodies) {
  const std::string ns = "http://developer.intuit.com/";
  const std::string op = "<op xmlns=\"" + ns + "\"/>";
  const std::string doctype = "a SOAP message may not declare a DOCTYPE";
  // An envelope that would be accepted but for what comes before it.
  const auto bare = [](const std::string& body) {
    return enveloped(body).substr(kHead.find("?>") + 2);
  };
  const auto withText = [&](const std::string& text) {
    return "<op xmlns=\"" + ns + "\"><p>" + text + "</p></op>";
  };
  // Envelope, Body and the operation, then elements down to the 32nd level, or the 33rd.
  const auto nested = [&](int levels) {
    std::string inner;
    for (int level = 4; level <= levels; ++level) inner = "<a>" + inner + "</a>";
    return enveloped("<op xmlns=\"" + ns + "\">" + inner + "</op>");
  };
  const struct {
    std::string body;
    std::string message;
  } cases[] = {
      {"<!DOCTYPE s:Envelope>" + bare(op), doctype},
      {"<!DOCTYPE s [<!ENTITY e \"boom\">]>" + bare(withText("&e;")), doctype},
      {"<!DOCTYPE s [<!ENTITY e SYSTEM \"file:///etc/passwd\">]>" + bare(withText("&e;")), doctype},
      {"<!DOCTYPE s [<!ENTITY a \"aaaaaaaa\"><!ENTITY b \"&a;&a;&a;&a;&a;&a;&a;&a;\">"
       "<!ENTITY c \"&b;&b;&b;&b;&b;&b;&b;&b;\">]>" +
           bare(withText("&c;&c;&c;&c;&c;&c;&c;&c;")),
       doctype},
      {enveloped(withText("&ext;")),
       "the SOAP message is not well formed XML (line 1): undefined entity"},
      {"<?xml version=\"1.0\" encoding=\"ISO-8859-1\"?>" + bare(op),
       "the SOAP message must be UTF-8, not ISO-8859-1"},
      {"<e:Envelope xmlns:e=\"http://www.w3.org/2003/05/soap-envelope\"><e:Body>" + op +
           "</e:Body></e:Envelope>",
       "the body is not a SOAP 1.1 envelope"},
      {"<Envelope><Body>" + op + "</Body></Envelope>", "the body is not a SOAP 1.1 envelope"},
      {"<s:Envelope xmlns:s=\"http://schemas.xmlsoap.org/soap/envelope/\"/>",
       "the SOAP envelope has no Body"},
      {"<s:Envelope xmlns:s=\"http://schemas.xmlsoap.org/soap/envelope/\"><s:Body>" + op +
           "</s:Body><s:Header/></s:Envelope>",
       "unexpected element 'Header' in the SOAP envelope"},
      {enveloped(""), "the SOAP body holds no operation"},
      {enveloped(op + op), "the SOAP body holds more than one operation"},
      {enveloped("<op xmlns=\"urn:other\"/>"),
       "the operation 'op' is not in the namespace http://developer.intuit.com/"},
      {enveloped("<op xmlns=\"" + ns + "\"><a></op>"),
       "the SOAP message is not well formed XML (line 1): mismatched tag"},
      {"", "the SOAP message is not well formed XML (line 1): no element found"},
      {nested(32), "accepted"},
      {nested(33), "the SOAP message nests deeper than 32 elements"},
  };
  for (const auto& c : cases) EXPECT_EQ(refusal(c.body), c.message) << c.body;
}

}  // namespace
}  // namespace droqbxml::webconnector
