// Loads the module of the network commands on first use: the tool itself
// links only the parts of the library that read and write OFX.
#include <dlfcn.h>
#include <unistd.h>

#include <cstdio>
#include <string>

#include "cli.h"

namespace cli {
namespace {

const char kModuleName[] = "ofxkit-net-commands.so";

// The directory of the running executable, "" when it cannot be told.
std::string ExecutableDir() {
  char path[4096];
  ssize_t n = readlink("/proc/self/exe", path, sizeof path - 1);
  if (n <= 0) return "";
  std::string exe(path, static_cast<size_t>(n));
  size_t slash = exe.rfind('/');
  return slash == std::string::npos ? "" : exe.substr(0, slash);
}

}  // namespace

int RunNetCommand(const char* name, int argc, char** argv) {
  std::string dir = ExecutableDir();
  // Installed, the module is in the library directory's ofxkit folder; in a
  // build tree, beside the executable.
  const std::string candidates[] = {dir + "/" + OFXKIT_CLI_MODULE_FROM_BIN + "/" + kModuleName,
                                    dir + "/" + kModuleName};
  void* module = nullptr;
  std::string error;
  for (const std::string& path : candidates) {
    if (dir.empty()) break;
    module = dlopen(path.c_str(), RTLD_NOW | RTLD_LOCAL);
    if (module) break;
    const char* why = dlerror();
    if (error.empty() && why && access(path.c_str(), F_OK) == 0) error = why;
  }
  if (!module) {
    std::fprintf(stderr, "ofxkit %s: the network commands cannot be loaded (%s)\n", name,
                 error.empty() ? (std::string(kModuleName) + " not found beside the tool").c_str() : error.c_str());
    return kBadInput;
  }
  using Entry = int (*)(const char*, int, char**);
  Entry entry = reinterpret_cast<Entry>(dlsym(module, "ofxkit_net_command"));
  if (!entry) {
    std::fprintf(stderr, "ofxkit %s: %s is not the tool's module\n", name, kModuleName);
    return kBadInput;
  }
  // The module stays loaded until the process ends.
  return entry(name, argc, argv);
}

}  // namespace cli
