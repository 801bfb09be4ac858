// A host of the installed stand-in: it creates a company file, puts the stand-in in
// QuickBooks' place, adds a customer through the facade and reads it back. The company file
// goes in the folder given as the only argument.
#include "simulator/Simulator.hpp"

#include <filesystem>
#include <iostream>
#include <memory>

#include "droqbxml/droqbxml.hpp"
#include "simulator/CompanyFile.hpp"

using namespace droqbxml;

int main(int argc, char** argv) {
  if (argc != 2) {
    std::cerr << "usage: package_simulator_host FOLDER\n";
    return 2;
  }
  const std::filesystem::path company = std::filesystem::path(argv[1]) / "host.qbw";
  simulator::install();

  DroXmlProcessor qb;
  simulator::CompanyFile::create(company, {"Package Host", true, {toUtf8(qb.API()->appName())}});
  qb.API()->CompanyFilePath(fromUtf8(company.string()));
  qb.API()->ConnectionOpen();
  qb.API()->SessionBegin();

  auto customer = std::make_shared<DroCustomer>();
  customer->Name(u"Kim & Lee");
  qb.XML()->BuildAddCustomer(customer);
  const Text response = qb.API()->ProcessRequest(qb.XML()->XML());
  const bool added = qb.XML()->IsSuccessRs(response, customer->RequestID());
  customer->ParseRs(response);
  std::cout << "added: " << (added ? "yes" : "no") << "\n";
  std::cout << "read back: " << toUtf8(customer->FullName()) << ", ListID "
            << (customer->ListID().empty() ? "missing" : "present") << "\n";

  qb.API()->SessionEnd();
  qb.API()->ConnectionClose();
  return added ? 0 : 1;
}
