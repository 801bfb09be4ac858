// droqbxml: the command-line host of the DroQbXml library.
#include <iostream>

#include "cli/Cli.hpp"

int main(int argc, char** argv) {
  return droqbxml::cli::run(argc, argv, std::cin, std::cout, std::cerr);
}
