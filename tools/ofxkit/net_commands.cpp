// Entry point of the module that holds the tool's network commands.
#include <cstring>

#include "cli.h"

extern "C" int ofxkit_net_command(const char* name, int argc, char** argv) {
  if (!std::strcmp(name, "exchange")) return cli::CmdExchange(argc, argv);
  if (!std::strcmp(name, "serve")) return cli::CmdServe(argc, argv);
  return cli::kUsage;
}
