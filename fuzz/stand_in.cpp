// The whole stand-in answering arbitrary request documents in a session on a real company
// file (made once per process on a memory file system, with the customers and items the
// seed requests name, and put back as it was made every few thousand documents so that the
// lists stay small). A document QuickBooks will not read
// fails with its parse error; any other failure, or anything but a ComError, is a finding. Every
// answer must be a well-formed response document in which each response carries its status code,
// severity and message.
#include <expat.h>
#include <fuzzer/FuzzedDataProvider.h>

#include <cstdint>
#include <filesystem>
#include <memory>
#include <string>
#include <string_view>

#include "droqbxml/runtime/Utf.hpp"
#include "fuzz/FuzzSupport.hpp"
#include "simulator/CompanyFile.hpp"
#include "simulator/Simulator.hpp"

namespace droqbxml::fuzz {
namespace {

constexpr int kDocumentsPerCompanyFile = 5000;

// What the company holds before the first document: the names the seed requests use.
constexpr std::string_view kLists =
    "<?xml version=\"1.0\"?><?qbxml version=\"13.0\"?><QBXML>"
    "<QBXMLMsgsRq onError=\"stopOnError\">"
    "<CustomerAddRq><CustomerAdd><Name>A</Name></CustomerAdd></CustomerAddRq>"
    "<CustomerAddRq><CustomerAdd><Name>Kim Lee</Name></CustomerAdd></CustomerAddRq>"
    "<CustomerAddRq><CustomerAdd><Name>Lee &amp; Daughters</Name></CustomerAdd></CustomerAddRq>"
    "<CustomerAddRq><CustomerAdd><Name>Kitchen</Name><ParentRef><FullName>Lee &amp; "
    "Daughters</FullName></ParentRef></CustomerAdd></CustomerAddRq>"
    "<ItemServiceAddRq><ItemServiceAdd><Name>Labour</Name><SalesOrPurchase><Price>85.00</Price>"
    "<AccountRef><FullName>Sales</FullName></AccountRef></SalesOrPurchase></ItemServiceAdd>"
    "</ItemServiceAddRq>"
    "<ItemServiceAddRq><ItemServiceAdd><Name>Labor</Name><SalesOrPurchase><Price>60.00</Price>"
    "<AccountRef><FullName>Sales</FullName></AccountRef></SalesOrPurchase></ItemServiceAdd>"
    "</ItemServiceAddRq>"
    "<ItemInventoryAddRq><ItemInventoryAdd><Name>Tile</Name><SalesPrice>4.50</SalesPrice>"
    "<IncomeAccountRef><FullName>Sales</FullName></IncomeAccountRef><COGSAccountRef>"
    "<FullName>Cost of Goods Sold</FullName></COGSAccountRef><AssetAccountRef><FullName>"
    "Inventory Asset</FullName></AssetAccountRef></ItemInventoryAdd></ItemInventoryAddRq>"
    "<ItemSubtotalAddRq><ItemSubtotalAdd><Name>Sub</Name></ItemSubtotalAdd></ItemSubtotalAddRq>"
    "<ItemGroupAddRq><ItemGroupAdd><Name>Kit</Name><ItemGroupLine><ItemRef><FullName>Tile"
    "</FullName></ItemRef><Quantity>4</Quantity></ItemGroupLine></ItemGroupAdd>"
    "</ItemGroupAddRq>"
    "</QBXMLMsgsRq></QBXML>";

class Session {
 public:
  Session() : made_(scratchFolder() / "made.qbw"), company_(scratchFolder() / "company.qbw") {
    simulator::CompanySettings settings;
    settings.allowedApplications = {"Fuzz"};
    simulator::CompanyFile::create(made_, settings);
    begin(made_);
    const std::string answer = toUtf8(processor_->ProcessRequest(ticket_, fromUtf8(kLists)));
    require(answer.find("statusCode=\"0\"") != std::string::npos &&
                answer.find("statusSeverity=\"Error\"") == std::string::npos,
            "the company's lists are added", answer);
    processor_->EndSession(ticket_);
    begin(company_);
  }

  Text answer(const Text& request) {
    if (++documents_ % kDocumentsPerCompanyFile == 0) {
      processor_->EndSession(ticket_);
      begin(company_);
    }
    return processor_->ProcessRequest(ticket_, request);
  }

 private:
  // A session on `file`; the working company file starts again as it was made.
  void begin(const std::filesystem::path& file) {
    if (file == company_) {
      std::filesystem::copy_file(made_, company_,
                                 std::filesystem::copy_options::overwrite_existing);
    }
    processor_ = simulator::createProcessor();
    processor_->OpenConnection(u"", u"Fuzz");
    ticket_ = processor_->BeginSession(fromUtf8(file.string()), qbFileOpenDoNotCare);
  }

  std::filesystem::path made_;
  std::filesystem::path company_;
  std::shared_ptr<RequestProcessor> processor_;
  Text ticket_;
  int documents_ = 0;
};

// Checks a response document with Expat: well formed, and every element inside
// QBXMLMsgsRs with the three status attributes.
class ResponseCheck {
 public:
  static void check(const std::string& response) {
    ResponseCheck state;
    const std::unique_ptr<XML_ParserStruct, decltype(&XML_ParserFree)> parser(
        XML_ParserCreate("UTF-8"), &XML_ParserFree);
    XML_SetUserData(parser.get(), &state);
    XML_SetElementHandler(parser.get(), &ResponseCheck::onStart, &ResponseCheck::onEnd);
    const bool wellFormed = XML_Parse(parser.get(), response.data(),
                                      static_cast<int>(response.size()), XML_TRUE) == XML_STATUS_OK;
    if (!wellFormed) {
      require(false, "the answer is well-formed XML",
              std::string(XML_ErrorString(XML_GetErrorCode(parser.get()))) + " at line " +
                  std::to_string(XML_GetCurrentLineNumber(parser.get())) + "\n" + response);
    }
    require(state.unmarked_.empty(), "every response carries its status",
            state.unmarked_ + "\n" + response);
  }

 private:
  static void onStart(void* data, const XML_Char* name, const XML_Char** attributes) {
    auto& self = *static_cast<ResponseCheck*>(data);
    if (++self.depth_ != 3) return;
    int found = 0;
    for (const XML_Char** a = attributes; *a; a += 2) {
      const std::string attribute = a[0];
      found += attribute == "statusCode" || attribute == "statusSeverity" ||
               attribute == "statusMessage";
    }
    if (found != 3) self.unmarked_ = name;
  }
  static void onEnd(void* data, const XML_Char*) { --static_cast<ResponseCheck*>(data)->depth_; }

  int depth_ = 0;
  std::string unmarked_;
};

Session& session() {
  static Session once;
  return once;
}

}  // namespace
}  // namespace droqbxml::fuzz

// The company file is made here, before the first input's one second starts.
extern "C" int LLVMFuzzerInitialize(int*, char***) {
  droqbxml::fuzz::session();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  using namespace droqbxml;
  using namespace droqbxml::fuzz;
  const std::string document(reinterpret_cast<const char*>(data), size);
  Text answer;
  try {
    answer = session().answer(fromUtf8(document));
  } catch (const ComError& error) {
    // A document QuickBooks will not read is its parse error; any other failure on a
    // healthy company file means the stand-in broke down inside.
    require(error.number() == static_cast<int32_t>(0x80040400u),
            "the stand-in fails a document only with the parse error", error.what());
    return 0;
  }
  ResponseCheck::check(toUtf8(answer));
  return 0;
}
