// The large statement the benchmarks work on: OFXKIT_BENCH_FILE, or the
// sample generator beside the project (17,000 transactions, about 2.8 MB).
#pragma once

#include <cstdio>
#include <cstdlib>
#include <string>

// The file named by the environment variable, else the generator's output.
inline std::string LoadStatement(const char* variable = "OFXKIT_BENCH_FILE",
                                 const char* generator = "gen_statement.py 17000") {
  std::string text;
  const char* path = std::getenv(variable);
  FILE* f = nullptr;
  bool piped = false;
  if (path) {
    f = std::fopen(path, "rb");
  } else {
    f = popen((std::string("python3 " OFXKIT_SHARED_DIR "/tools/") + generator + " 2>/dev/null").c_str(), "r");
    piped = true;
  }
  if (!f) return text;
  char chunk[65536];
  size_t n;
  while ((n = std::fread(chunk, 1, sizeof chunk, f)) > 0) text.append(chunk, n);
  if (piped)
    pclose(f);
  else
    std::fclose(f);
  return text;
}

inline const std::string& Statement() {
  static const std::string text = LoadStatement();
  return text;
}

// A brokerage statement: OFXKIT_BENCH_INVFILE, or the generator's 10,000
// transactions of twelve kinds with positions, balances, open orders and the
// security list (about 3.0 MB).
inline const std::string& BrokerageStatement() {
  static const std::string text = LoadStatement("OFXKIT_BENCH_INVFILE", "gen_invstatement.py 10000");
  return text;
}
