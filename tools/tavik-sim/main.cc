// tavik-sim: a simulated camera session through the tuning controller.
//
//   tavik-sim [--tuning DIR] [--scenario FILE] [--frames N] [--frames-out FILE] [--trace FILE]
//             [--prop KEY=VALUE]... [--quiet]
//
// Exit status: 0 on success, 1 when a frame failed, 2 on bad arguments or a bad scenario file.
#include <iostream>
#include <string>
#include <vector>

#include "tools/tavik-sim/cli.h"

int main(int argc, char** argv) {
  return tavik::sim::RunSimCommand(std::vector<std::string>(argv + 1, argv + argc), std::cout,
                                   std::cerr);
}
