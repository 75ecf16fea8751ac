// The large statement the benchmarks work on: OFXKIT_BENCH_FILE, or the
// sample generator beside the project (17,000 transactions, about 2.8 MB).
#pragma once

#include <cstdio>
#include <cstdlib>
#include <string>

inline std::string LoadStatement() {
  std::string text;
  const char* path = std::getenv("OFXKIT_BENCH_FILE");
  FILE* f = nullptr;
  bool piped = false;
  if (path) {
    f = std::fopen(path, "rb");
  } else {
    f = popen("python3 " OFXKIT_SHARED_DIR "/tools/gen_statement.py 17000 2>/dev/null", "r");
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
