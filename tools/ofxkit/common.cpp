#include <fcntl.h>
#include <sys/prctl.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <termios.h>
#include <unistd.h>

#include <cctype>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <memory>

#include "charset.h"
#include "cli.h"

namespace cli {

namespace {
// The text of the file the command read last, as UTF-8 for output.
std::unique_ptr<Utf8Converter> g_fileText;
}  // namespace

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
  // Straight into chunk, wiped below: no stdio buffer keeps a copy of a
  // request's password after the file is closed.
  std::setvbuf(f, nullptr, _IONBF, 0);
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
  volatile char* wipe = chunk;
  for (size_t i = 0; i < sizeof chunk; ++i) wipe[i] = 0;
  return ok;
}

namespace {
bool WriteAll(int fd, const char* data, size_t size) {
  while (size) {
    ssize_t n = ::write(fd, data, size);
    if (n < 0 && errno == EINTR) continue;
    if (n <= 0) return false;
    data += n;
    size -= static_cast<size_t>(n);
  }
  return true;
}
}  // namespace

bool WritePrivateFile(const std::string& path, const OEBuffer& buffer, std::string* error) {
  const char* data = buffer.GetBufferPtr();
  const size_t size = data ? buffer.GetBufferSize() : 0;
  struct stat info;
  if (::lstat(path.c_str(), &info) == 0) {
    if (S_ISLNK(info.st_mode)) {
      *error = path + ": is a symbolic link (not followed; give the file itself)";
      return false;
    }
    if (S_ISDIR(info.st_mode)) {
      *error = path + ": is a directory";
      return false;
    }
    if (!S_ISREG(info.st_mode)) {
      // A device or a pipe (/dev/null, a FIFO) keeps nothing: written as it is.
      int fd = ::open(path.c_str(), O_WRONLY | O_NOFOLLOW | O_CLOEXEC);
      bool ok = fd >= 0 && WriteAll(fd, data, size);
      if (!ok) *error = path + ": " + std::strerror(errno);
      if (fd >= 0) ok = ::close(fd) == 0 && ok;
      return ok;
    }
  }
  size_t slash = path.rfind('/');
  std::string folder = slash == std::string::npos ? "." : slash == 0 ? "/" : path.substr(0, slash);
  std::string base = slash == std::string::npos ? path : path.substr(slash + 1);
  std::vector<char> temporary;
  for (char c : folder + (folder == "/" ? "" : "/") + "." + base + ".XXXXXX") temporary.push_back(c);
  temporary.push_back('\0');
  int fd = ::mkostemp(temporary.data(), O_CLOEXEC);
  if (fd < 0) {
    *error = path + ": " + std::strerror(errno);
    return false;
  }
  bool ok = ::fchmod(fd, S_IRUSR | S_IWUSR) == 0 && WriteAll(fd, data, size) && ::fsync(fd) == 0;
  int saved = errno;
  ok = ::close(fd) == 0 && ok;
  if (ok && std::rename(temporary.data(), path.c_str()) != 0) {
    saved = errno;
    ok = false;
  }
  if (!ok) {
    ::unlink(temporary.data());
    *error = path + ": " + std::strerror(saved);
  }
  return ok;
}

bool WriteFile(const std::string& path, const OEBuffer& buffer, std::string* error, bool privateFile) {
  if (privateFile && path != "-") return WritePrivateFile(path, buffer, error);
  FILE* f = stdout;
  if (path != "-") {
    int fd = ::open(path.c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0644);
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

void KeepSecretsOutOfCoreDumps() {
  rlimit none{0, 0};
  setrlimit(RLIMIT_CORE, &none);
  prctl(PR_SET_DUMPABLE, 0, 0, 0, 0);
}

namespace {
inline bool TagSpace(char c) { return c == ' ' || c == '\n' || c == '\r' || c == '\t'; }

// Whether the buffer holds a tag name ending in `name` (upper case), matched
// ignoring case and followed by whitespace or '>', as the parser reads names.
// With whole, the name must be the whole tag name: '<', blanks, then name.
// NUL bytes do not stop the search, so that a file whose text the parser cuts
// short is still recognised (and its loss reported).
bool HasTagName(const OEBuffer& buffer, const char* name, bool whole) {
  const char* data = buffer.GetBufferPtr();
  const size_t size = data ? buffer.GetBufferSize() : 0, n = std::strlen(name);
  for (size_t i = 0; i + n <= size; ++i) {
    size_t k = 0;
    while (k < n && std::toupper(static_cast<unsigned char>(data[i + k])) == name[k]) ++k;
    if (k < n || (i + n < size && data[i + n] != '>' && !TagSpace(data[i + n]))) continue;
    if (!whole) return true;
    size_t j = i;
    while (j > 0 && TagSpace(data[j - 1])) --j;
    if (j > 0 && data[j - 1] == '<') return true;
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
  if (!HasTagName(buffer, "OFX", true)) {
    *error = name + ": not an OFX file (no <OFX> aggregate)";
    return kBadInput;
  }
  parsed.isResponse = HasTagName(buffer, "MSGSRSV1", false) || !HasTagName(buffer, "MSGSRQV1", false);
  if (parsed.isResponse)
    parsed.file.reset(new OEFileRs());
  else
    parsed.file.reset(new OEFileRq());
  OESimpleParser parser;
  parser.SetReadingOptions(parsed.strict ? OE_READ_STRICT : OE_READ_TOLERANT);
  parsed.status = parser.Parse(&buffer, parsed.file.get(), 0);
  parsed.objectWithError = parser.GetObjectWithError();
  parsed.audit = ofxkit::AuditParse(buffer, *parsed.file);
  g_fileText = std::make_unique<Utf8Converter>(CharsetOf(*parsed.file));
  return ExitForStatus(parsed.status);
}

std::string OutputText(const char* text, const char* field) {
  std::string out;
  if (text) AppendOutputText(out, text, std::strlen(text), field);
  return out;
}

void AppendOutputText(std::string& out, const char* text, size_t n, const char* field) {
  if (g_fileText)
    g_fileText->Append(text, n, out, field);
  else
    out.append(text, n);
}

int ReportLosses(const char* command, const ParsedFile& parsed, int rc) {
  if (g_fileText && !g_fileText->Report().empty())
    std::fprintf(stderr, "ofxkit %s: %s\n", command, g_fileText->Report().c_str());
  if (!parsed.audit.complete)
    std::fprintf(stderr, "ofxkit %s: the file could not be checked for unread data (out of memory)\n", command);
  for (const ofxkit::AuditFinding& finding : parsed.audit.findings)
    if (finding.IsLoss()) std::fprintf(stderr, "ofxkit %s: %s\n", command, finding.Describe().c_str());
  return parsed.audit.HasLoss() && rc == kClean ? kWarnings : rc;
}

void AppendCsv(std::string& out, const char* text, bool raw, const char* field) {
  if (!text) return;
  const size_t start = out.size();
  AppendOutputText(out, text, std::strlen(text), field);
  if (out.size() == start) return;
  if (!raw && std::strchr("=+-@\t\r", out[start]) && out[start] != '\0') out.insert(start, 1, '\'');
  bool quote = false;
  for (size_t i = start; i < out.size() && !quote; ++i) {
    const char c = out[i];
    quote = c == ',' || c == '"' || c == '\r' || c == '\n';
  }
  if (!quote) return;
  const std::string field_text = out.substr(start);
  out.resize(start);
  out += '"';
  for (char c : field_text) {
    if (c == '"') out += '"';
    out += c;
  }
  out += '"';
}

std::string CsvText(const char* text, bool raw, const char* field) {
  std::string out;
  AppendCsv(out, text, raw, field);
  return out;
}

void AppendIsoDate(std::string& out, const OEDateTime& d) {
  char text[16];
  char* p = text + sizeof text;
  const unsigned parts[] = {d.GetDay(), d.GetMonth()};
  for (unsigned part : parts) {
    *--p = static_cast<char>('0' + part % 10);
    *--p = static_cast<char>('0' + part / 10 % 10);
    *--p = '-';
  }
  unsigned year = d.GetYear();
  int digits = 0;
  do {
    *--p = static_cast<char>('0' + year % 10);
    year /= 10;
  } while (++digits < 4 || year != 0);
  out.append(p, static_cast<size_t>(text + sizeof text - p));
}

std::string IsoDate(const OEDateTime& d) {
  std::string text;
  AppendIsoDate(text, d);
  return text;
}

bool AppendElement(std::string& out, const OEDataObj* obj, OETagID tag) {
  const auto* agg = static_cast<const OEAggregate*>(obj);  // every object these commands read is one
  const OEFieldDesc* d = agg ? agg->FieldAt(tag) : nullptr;
  if (!d || !d->text || !agg->ValidateTag(tag)) return false;
  thread_local OEString text;
  if (!d->text(agg, 0, text)) return false;
  out.append(text.c_str(), text.GetStrLength());
  return text.GetStrLength() != 0;
}

const char* TagName(OETagID tag) {
  OETagDictionary* dictionary = OETagDictionary::TheOETagDictionary();
  const char* name = dictionary ? dictionary->GetTagString(tag) : nullptr;
  return name ? name : "?";
}

bool PromptPassword(const char* prompt, OEUserPassword& out) {
  KeepSecretsOutOfCoreDumps();
  // Read byte by byte: no stdio buffer keeps a copy of the line.
  std::setvbuf(stdin, nullptr, _IONBF, 0);
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

// Parses FILE for a command: false with *rc the exit status when the command
// ends here, else true with *rc the parse's exit status.
ParsedFile::~ParsedFile() {
  if (!keepUntilExit || !file) return;
  // Held from a global, so that leak checkers see the tree as still in use.
  static auto* kept = new std::vector<std::unique_ptr<OEFileOFX>>;
  kept->push_back(std::move(file));
}

bool ParseCommandFile(const char* command, const char* help, Args& args, ParsedFile& parsed, bool* raw, int* rc) {
  *rc = kClean;
  parsed.keepUntilExit = true;
  if (args.Flag("help")) {
    std::fputs(help, stdout);
    return false;
  }
  if (raw) *raw = args.Flag("raw");
  parsed.strict = args.Flag("strict");
  std::string error;
  std::vector<std::string> files = args.Positional(&error);
  if (!error.empty() || files.size() != 1) {
    std::fprintf(stderr, "ofxkit %s: %s\n%s", command, error.empty() ? "expected one FILE" : error.c_str(), help);
    *rc = kUsage;
    return false;
  }
  *rc = ParseOFXFile(files[0], parsed, &error);
  if (*rc == kBadInput) {
    std::fprintf(stderr, "ofxkit %s: %s\n", command, error.c_str());
    return false;
  }
  if (*rc == kParseFailed)
    std::fprintf(stderr, "ofxkit %s: the parse stopped early (status %d); what was read is shown\n", command,
                 static_cast<int>(parsed.status));
  return true;
}

}  // namespace cli
