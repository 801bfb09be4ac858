// A process that adds to a company file through the stand-in, one request at a time, for
// the test that kills it (company_file_survives.py). Add N (numbered from FIRST) is, by
// N mod 3, a customer, a service item, or an invoice to customer N-2 with one to four lines
// of item N-1; each is named (or numbered) PREFIX-N. Each answered add is reported on
// standard output ("answered N") as soon as its answer is there.
//
//   droqbxml_company_adder COMPANY PREFIX FIRST COUNT
//
// Exit status: 0 every add answered with success; 1 an add refused ("refused N" and the
// answer); 3 QuickBooks refused the session or a request ("error 0x... description").
#include <unistd.h>

#include <cstdint>
#include <cstdio>
#include <string>

#include "droqbxml/runtime/ComError.hpp"
#include "droqbxml/runtime/Utf.hpp"
#include "simulator/Simulator.hpp"

namespace {

using droqbxml::fromUtf8;

void say(const std::string& line) {
  const std::string text = line + "\n";
  if (::write(STDOUT_FILENO, text.data(), text.size()) < 0) std::_Exit(4);
}

int linesOf(int n) { return n / 3 % 4 + 1; }

std::string request(const std::string& prefix, int n) {
  const std::string name = prefix + "-" + std::to_string(n);
  std::string body;
  if (n % 3 == 0) {
    body = "<CustomerAddRq><CustomerAdd><Name>" + name + "</Name></CustomerAdd></CustomerAddRq>";
  } else if (n % 3 == 1) {
    body = "<ItemServiceAddRq><ItemServiceAdd><Name>" + name +
           "</Name><SalesOrPurchase><Price>12.50</Price><AccountRef><FullName>Sales</FullName>"
           "</AccountRef></SalesOrPurchase></ItemServiceAdd></ItemServiceAddRq>";
  } else {
    body = "<InvoiceAddRq><InvoiceAdd><CustomerRef><FullName>" + prefix + "-" +
           std::to_string(n - 2) + "</FullName></CustomerRef><RefNumber>" + name + "</RefNumber>";
    for (int line = 1; line <= linesOf(n); ++line) {
      body += "<InvoiceLineAdd><ItemRef><FullName>" + prefix + "-" + std::to_string(n - 1) +
              "</FullName></ItemRef><Quantity>" + std::to_string(line) +
              "</Quantity></InvoiceLineAdd>";
    }
    body += "</InvoiceAdd></InvoiceAddRq>";
  }
  return "<?xml version=\"1.0\"?><?qbxml version=\"13.0\"?><QBXML>"
         "<QBXMLMsgsRq onError=\"stopOnError\">" +
         body + "</QBXMLMsgsRq></QBXML>";
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 5) {
    std::fprintf(stderr, "usage: droqbxml_company_adder COMPANY PREFIX FIRST COUNT\n");
    return 2;
  }
  const std::string prefix = argv[2];
  const int first = std::stoi(argv[3]);
  const int count = std::stoi(argv[4]);
  try {
    const auto processor = droqbxml::simulator::createProcessor();
    processor->OpenConnection(u"", u"Tessaly");
    const droqbxml::Text ticket =
        processor->BeginSession(fromUtf8(argv[1]), droqbxml::qbFileOpenDoNotCare);
    for (int n = first; n < first + count; ++n) {
      const std::string answer =
          droqbxml::toUtf8(processor->ProcessRequest(ticket, fromUtf8(request(prefix, n))));
      if (answer.find("statusCode=\"0\"") == std::string::npos) {
        say("refused " + std::to_string(n) + " " + answer);
        return 1;
      }
      say("answered " + std::to_string(n));
    }
    processor->EndSession(ticket);
    processor->CloseConnection();
  } catch (const droqbxml::ComError& error) {
    char number[16];
    std::snprintf(number, sizeof number, "0x%08X", static_cast<uint32_t>(error.number()));
    say(std::string("error ") + number + " " + error.what());
    return 3;
  }
  return 0;
}
