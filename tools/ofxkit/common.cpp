#include <fcntl.h>
#include <termios.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstring>

#include "cli.h"

namespace cli {

Args::Args(int argc, char** argv, int first) {
  for (int i = first; i < argc; ++i) m_args.emplace_back(argv[i]);
  m_used.assign(m_args.size(), false);
}

bool Args::Flag(const std::string& name) {
  bool found = false;
  for (size_t i = 0; i < m_args.size(); ++i)
    if (!m_used[i] && m_args[i] == "--" + name) found = m_used[i] = true;
  return found;
}

bool Args::HasOption(const std::string& name) const {
  for (const std::string& a : m_args)
    if (a == "--" + name || a.rfind("--" + name + "=", 0) == 0) return true;
  return false;
}

// One-letter options are written -o VALUE, longer ones --name VALUE or --name=VALUE.
std::vector<std::string> Args::Options(const std::string& name) {
  std::vector<std::string> values;
  const std::string flag = (name.size() == 1 ? "-" : "--") + name;
  for (size_t i = 0; i < m_args.size(); ++i) {
    if (m_used[i]) continue;
    if (m_args[i] == flag && i + 1 < m_args.size()) {
      values.push_back(m_args[i + 1]);
      m_used[i] = m_used[i + 1] = true;
    } else if (m_args[i].rfind(flag + "=", 0) == 0) {
      values.push_back(m_args[i].substr(flag.size() + 1));
      m_used[i] = true;
    }
  }
  return values;
}

std::string Args::Option(const std::string& name) {
  std::vector<std::string> values = Options(name);
  return values.empty() ? std::string() : values.back();
}

std::vector<std::string> Args::Positional(std::string* error) {
  std::vector<std::string> out;
  for (size_t i = 0; i < m_args.size(); ++i) {
    if (m_used[i]) continue;
    if (m_args[i].size() > 1 && m_args[i][0] == '-' && error && error->empty())
      *error = "unknown option '" + m_args[i] + "'";
    else
      out.push_back(m_args[i]);
  }
  return out;
}

bool ReadFile(const std::string& path, OEBuffer& buffer, std::string* error) {
  FILE* f = std::fopen(path.c_str(), "rb");
  if (!f) {
    *error = path + ": " + std::strerror(errno);
    return false;
  }
  // Room for the whole file at once, rather than growing step by step.
  if (std::fseek(f, 0, SEEK_END) == 0) {
    long size = std::ftell(f);
    if (size > 0 && size < static_cast<long>(OEBuffer::kMaxBufferSize)) buffer.AllocateTo(static_cast<uint32_t>(size) + 1);
    std::rewind(f);
  }
  char chunk[OEBuffer::kChunk];
  size_t n;
  bool ok = true;
  while ((n = std::fread(chunk, 1, sizeof chunk, f)) > 0) {
    if (buffer.WriteLarge(chunk, static_cast<uint32_t>(n)) != OEBUF_OK) {
      *error = path + ": too large (files of up to " + std::to_string(OEBuffer::kMaxBufferSize - 1) +
               " bytes can be read)";
      ok = false;
      break;
    }
  }
  if (ok && std::ferror(f)) {
    *error = path + ": read error";
    ok = false;
  }
  std::fclose(f);
  return ok;
}

bool WriteFile(const std::string& path, const OEBuffer& buffer, std::string* error, bool privateFile) {
  FILE* f = stdout;
  if (path != "-") {
    // A request holds a password: such a file is readable by its owner only.
    int fd = ::open(path.c_str(), O_WRONLY | O_CREAT | O_TRUNC, privateFile ? 0600 : 0644);
    f = fd >= 0 ? fdopen(fd, "wb") : nullptr;
    if (fd >= 0 && !f) ::close(fd);
  }
  if (!f) {
    *error = path + ": " + std::strerror(errno);
    return false;
  }
  size_t size = buffer.GetBufferSize();
  bool ok = std::fwrite(buffer.GetBufferPtr(), 1, size, f) == size;
  if (f != stdout) ok = std::fclose(f) == 0 && ok;
  if (!ok) *error = path + ": write error";
  return ok;
}

namespace {
// Case-insensitive search for `needle` in the buffer.
bool Contains(const OEBuffer& buffer, const char* needle) {
  const char* data = buffer.GetBufferPtr();
  size_t size = buffer.GetBufferSize(), n = std::strlen(needle);
  for (size_t i = 0; i + n <= size; ++i) {
    size_t k = 0;
    while (k < n && std::toupper(static_cast<unsigned char>(data[i + k])) == needle[k]) ++k;
    if (k == n) return true;
  }
  return false;
}
}  // namespace

int ExitForStatus(OEParseStatus status) {
  if (status == OE_PARSE_OK) return kClean;
  if (status == OE_PARSE_WARNINGS) return kWarnings;
  return kParseFailed;
}

int ParseOFXFile(const std::string& path, ParsedFile& parsed, std::string* error) {
  // A buffer as large as the file, however large that is.
  int failure = 0;
  std::unique_ptr<OEBuffer> buffer(OEReadFileIntoBuffer(path.c_str(), &failure));
  if (!buffer) {
    *error = path + ": " + (failure == EFBIG ? "too large (files of up to 2 GB can be read)" : std::strerror(failure));
    return kBadInput;
  }
  return ParseOFXBuffer(*buffer, path, parsed, error);
}

int ParseOFXBuffer(OEBuffer& buffer, const std::string& name, ParsedFile& parsed, std::string* error) {
  if (!Contains(buffer, "<OFX>")) {
    *error = name + ": not an OFX file (no <OFX> aggregate)";
    return kBadInput;
  }
  parsed.isResponse = Contains(buffer, "MSGSRSV1>") || !Contains(buffer, "MSGSRQV1>");
  if (parsed.isResponse)
    parsed.file.reset(new OEFileRs());
  else
    parsed.file.reset(new OEFileRq());
  OESimpleParser parser;
  parsed.status = parser.Parse(&buffer, parsed.file.get(), 0);
  parsed.objectWithError = parser.GetObjectWithError();
  return ExitForStatus(parsed.status);
}

const char* TagName(OETagID tag) {
  OETagDictionary* dictionary = OETagDictionary::TheOETagDictionary();
  const char* name = dictionary ? dictionary->GetTagString(tag) : nullptr;
  return name ? name : "?";
}

bool PromptPassword(const char* prompt, OEUserPassword& out) {
  bool terminal = isatty(STDIN_FILENO);
  termios saved{};
  if (terminal) {
    std::fprintf(stderr, "%s", prompt);
    std::fflush(stderr);
    tcgetattr(STDIN_FILENO, &saved);
    termios quiet = saved;
    quiet.c_lflag &= static_cast<tcflag_t>(~ECHO);
    tcsetattr(STDIN_FILENO, TCSAFLUSH, &quiet);
  }
  char line[256];
  bool ok = std::fgets(line, sizeof line, stdin) != nullptr;
  if (terminal) {
    tcsetattr(STDIN_FILENO, TCSAFLUSH, &saved);
    std::fprintf(stderr, "\n");
  }
  if (ok) {
    line[std::strcspn(line, "\r\n")] = '\0';
    out = line;
  }
  volatile char* wipe = line;
  for (size_t i = 0; i < sizeof line; ++i) wipe[i] = 0;
  return ok && !out.IsEmpty();
}

}  // namespace cli
