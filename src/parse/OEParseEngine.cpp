#include "ofxkit/parse/OEParseEngine.h"

#include <climits>
#include <cstdlib>
#include <cstring>
#include <new>

#include "ofxkit/parse/OEParseLogger.h"
#include "ofxkit/types/OEBuffer.h"
#include "ofxkit/types/OEUtility.h"

namespace {

constexpr uint64_t kWhiteSpaceMask = (1ull << ' ') | (1ull << '\n') | (1ull << '\r') | (1ull << '\t');

inline bool IsWs(char c) {
  const unsigned char u = static_cast<unsigned char>(c);
  return u <= ' ' && ((kWhiteSpaceMask >> u) & 1u) != 0;
}

inline unsigned char FoldUpper(char c) {
  const unsigned char u = static_cast<unsigned char>(c);
  return (u >= 'a' && u <= 'z') ? static_cast<unsigned char>(u - ('a' - 'A')) : u;
}

inline bool SameIgnoringCase(const char* a, const char* b, size_t n) {
  for (size_t i = 0; i < n; ++i) {
    if (FoldUpper(a[i]) != FoldUpper(b[i])) return false;
  }
  return true;
}

// Whether needle (NUL-terminated) occurs in the n bytes at hay, ignoring case.
bool ContainsIgnoringCase(const char* hay, size_t n, const char* needle) {
  const size_t k = strlen(needle);
  if (k > n) return false;
  for (size_t i = 0; i + k <= n; ++i) {
    if (SameIgnoringCase(hay + i, needle, k)) return true;
  }
  return false;
}

// Names are short: a plain loop beats a library call.

inline bool HasLowerCase(const char* text, size_t n) {
  for (size_t i = 0; i < n; ++i) {
    if (text[i] >= 'a' && text[i] <= 'z') return true;
  }
  return false;
}

// Item lengths are 16-bit; longer texts saturate (and then cannot be copied
// into a string, which holds at most 65534 characters).
inline unsigned short Clamp16(int32_t n) {
  return n <= 0 ? 0 : n >= 0xFFFF ? static_cast<unsigned short>(0xFFFF) : static_cast<unsigned short>(n);
}

constexpr uint64_t kOnes = 0x0101010101010101ull;
constexpr uint64_t kHighs = 0x8080808080808080ull;
constexpr bool kLittleEndian = __BYTE_ORDER__ == __ORDER_LITTLE_ENDIAN__;

// A mask of the high bit of each byte of w that is below 0x21 (whitespace or
// another control character) or is '>'. Exact up to its lowest set bit, which
// is all that is used: borrows only reach the bytes after a true match.
inline uint64_t NameStops(uint64_t w) {
  const uint64_t gt = w ^ (kOnes * '>');
  return (((gt - kOnes) & ~gt) | ((w - kOnes * 0x21) & ~w)) & kHighs;
}

// The first sixteen bytes of a name of n bytes at p, zero-padded; avail is
// how many bytes at p may be read.
inline void NameHead(const char* p, size_t n, int32_t avail, uint64_t head[2]) {
  if (kLittleEndian && avail >= 16) {
    memcpy(head, p, 16);
    if (n < 8) {
      head[0] &= (1ull << (8 * n)) - 1;  // n is at least 1
      head[1] = 0;
    } else if (n < 16) {
      head[1] &= n == 8 ? 0 : (~0ull >> (8 * (16 - n)));
    }
    return;
  }
  unsigned char bytes[16] = {};
  memcpy(bytes, p, n < 16 ? n : 16);
  memcpy(head, bytes, 16);
}

inline unsigned NameHash(const uint64_t head[2], size_t n, unsigned slots) {
  const uint64_t h = (head[0] ^ (head[1] * 0x9E3779B97F4A7C15ull) ^ n) * 0xFF51AFD7ED558CCDull;
  return static_cast<unsigned>(h >> 40) & (slots - 1);
}

// Address and usable size of a buffer's data; the size never exceeds what is
// allocated, whatever SetBufferSize was told.
inline void ViewOf(OEBuffer& buffer, const char*& data, uint32_t& size) {
  data = buffer.GetBufferPtr();
  size = buffer.GetBufferSize();
  if (size > buffer.GetBufferAllocation()) size = buffer.GetBufferAllocation();
  constexpr uint32_t kMaxText = INT32_MAX / 2;  // positions and sums of them stay in range
  if (size > kMaxText) size = kMaxText;
  if (!data) size = 0;
}

inline int32_t TextEnd(const char* data, uint32_t size) {
  if (!data || size == 0) return 0;
  const void* nul = memchr(data, 0, size);
  return nul ? static_cast<int32_t>(static_cast<const char*>(nul) - data) : static_cast<int32_t>(size);
}

void Log(OEParseWarning warning, const char* value, size_t valueLength, const char* name, size_t nameLength,
         OETagID id) {
  OELogWarning(warning, OEString(value, valueLength), OEString(name, nameLength), id);
}

// The character of a known macro name ("gt", "lt", "amp", any case), or 0.
char MacroChar(const char* name, size_t n) {
  char copy[8];
  if (n == 0 || n >= sizeof copy) return 0;
  memcpy(copy, name, n);
  copy[n] = '\0';
  const char c = OEUtility::GetMacroChar(copy);
  return c == ' ' ? 0 : c;  // GetMacroChar answers a space for an unknown name
}

// Copies n bytes at src into out with the macros expanded. 1 when out could
// hold the text.
unsigned short ExpandInto(const char* src, size_t n, OEString& out) {
  const char* amp = n ? static_cast<const char*>(memchr(src, '&', n)) : nullptr;
  if (!amp) {
    out.Assign(src, n);
    return out.GetStrLength() == n;
  }
  if (n + 1 > 0xFFFF) {
    out.Assign(nullptr, 0);
    return 0;
  }
  char* dest = out.LockBuffer(static_cast<unsigned short>(n + 1));
  if (!dest) return 0;
  size_t in = static_cast<size_t>(amp - src);
  memcpy(dest, src, in);
  size_t written = in;
  size_t semicolon = 0;  // the next ';' at or after in, when semicolon > in
  while (in < n) {
    const char c = src[in];
    if (c == '&') {
      if (semicolon <= in) {
        const void* found = memchr(src + in, ';', n - in);
        semicolon = found ? static_cast<size_t>(static_cast<const char*>(found) - src) : n;
      }
      const char replacement = semicolon < n ? MacroChar(src + in + 1, semicolon - in - 1) : 0;
      if (replacement) {
        dest[written++] = replacement;
        in = semicolon + 1;
        continue;
      }
    }
    dest[written++] = c;
    ++in;
  }
  dest[written] = '\0';
  out.UnlockBuffer();
  return 1;
}

}  // namespace

// ---------------------------------------------------------------------------
// Scanner: the lexical rules over one text (data and the length before its
// first NUL). Every read goes through At() or a loop bounded by n, so no
// position, however wild, reaches outside the text.

class OEParseEngine::Scanner {
 public:
  Scanner(const char* data, int32_t n, FindMemo* memos) : m_p(data), m_n(n), m_memos(memos) {}
  explicit Scanner(OEBuffer& buffer) : m_p(nullptr), m_n(0), m_memos(nullptr) {
    uint32_t size = 0;
    ViewOf(buffer, m_p, size);
    m_n = TextEnd(m_p, size);
  }

  const char* Data() const { return m_p; }
  int32_t Length() const { return m_n; }
  char At(int32_t i) const { return (i >= 0 && i < m_n) ? m_p[i] : '\0'; }

  int32_t SkipWs(int32_t i) const {
    if (i < 0) return i;
    while (i < m_n && IsWs(m_p[i])) ++i;
    return i;
  }
  int32_t FindWs(int32_t i) const {
    if (i < 0) return i;
    while (i < m_n && !IsWs(m_p[i])) ++i;
    return i;
  }
  // Going back from i - 1 over whitespace: just after the last other
  // character, or the position of the 0 (outside the text) that stops it.
  int32_t PrevNonWs(int32_t i) const {
    if (i <= 0) return i == INT32_MIN ? i : i - 1;
    if (i > m_n + 1) return i - 1;
    for (int32_t j = i - 1;; --j) {
      const char c = At(j);
      if (c == '\0') return j;
      if (!IsWs(c)) return j + 1;
    }
  }
  bool AllWs(int32_t from, int32_t to) const {
    for (int32_t i = from; i < to; ++i) {
      if (!IsWs(At(i))) return false;
    }
    return true;
  }

  // First ch at or after from, or -1.
  int32_t FindPlain(char ch, int32_t from) const {
    if (from < 0 || from >= m_n) return -1;
    const void* f = memchr(m_p + from, ch, static_cast<size_t>(m_n - from));
    return f ? static_cast<int32_t>(static_cast<const char*>(f) - m_p) : -1;
  }
  int32_t Find(char ch, int32_t from);
  // Where a scan from `from` that finds nothing stops: the end of the text.
  int32_t EndFrom(int32_t from) const { return (from >= 0 && from < m_n) ? m_n : from; }
  int32_t FindOrEnd(char ch, int32_t from) {
    const int32_t f = Find(ch, from);
    return f >= 0 ? f : EndFrom(from);
  }
  int32_t FindPlainOrEnd(char ch, int32_t from) const {
    const int32_t f = FindPlain(ch, from);
    return f >= 0 ? f : EndFrom(from);
  }

  unsigned short ReadItem(OETagItemInfo& item);
  // The first position from q (at least 0) of whitespace or '>', or the end
  // of the text. Eight bytes at a time while eight remain.
  int32_t NameEnd(int32_t q) const {
    if (kLittleEndian) {
      while (m_n - q >= 8) {
        uint64_t w;
        memcpy(&w, m_p + q, 8);
        const uint64_t stops = NameStops(w);
        if (!stops) {
          q += 8;
          continue;
        }
        q += __builtin_ctzll(stops) >> 3;
        if (m_p[q] == '>' || IsWs(m_p[q])) return q;
        ++q;  // another control character: part of the name
      }
    }
    while (q < m_n && m_p[q] != '>' && !IsWs(m_p[q])) ++q;
    return q;
  }
  // The first '<' from q (at least 0), or the end of the text; macro is set
  // when an '&' comes before it. Eight bytes at a time while eight remain.
  int32_t ValueEnd(int32_t q, bool& macro) const {
    if (kLittleEndian) {
      while (m_n - q >= 8) {
        uint64_t w;
        memcpy(&w, m_p + q, 8);
        const uint64_t lt = w ^ (kOnes * '<');
        const uint64_t amp = w ^ (kOnes * '&');
        const uint64_t lts = (lt - kOnes) & ~lt & kHighs;
        const uint64_t amps = (amp - kOnes) & ~amp & kHighs;
        if (lts) {
          // Only the lowest bit of each mask is exact: enough to order them.
          if (amps && __builtin_ctzll(amps) < __builtin_ctzll(lts)) macro = true;
          return q + (__builtin_ctzll(lts) >> 3);
        }
        if (amps) macro = true;
        q += 8;
      }
    }
    for (; q < m_n && m_p[q] != '<'; ++q)
      if (m_p[q] == '&') macro = true;
    return q;
  }
  bool IsComment(const OETagItemInfo& item) const;
  // Copies the item's text into out (macros expanded when asked). 1 when all
  // of it was copied.
  unsigned short CopyItem(const OETagItemInfo& item, OEString& out, bool expand) const {
    const int32_t start = item.start;
    const int32_t wanted = item.length;
    const int32_t available = (start >= 0 && start < m_n) ? m_n - start : 0;
    const int32_t n = wanted < available ? wanted : available;
    const char* src = n > 0 ? m_p + start : nullptr;
    unsigned short copied;
    if (expand) {
      copied = ExpandInto(src, static_cast<size_t>(n), out);
    } else {
      out.Assign(src, static_cast<size_t>(n));
      copied = out.GetStrLength() == n;
    }
    return copied && n == wanted;
  }
  unsigned short ReadNonComment(OETagItemInfo& item) {
    while (ReadItem(item)) {
      // Only a start tag that begins with '!' can be a comment.
      if (item.type != OEITEM_STARTTAG || At(item.start) != '!' || !IsComment(item)) return 1;
    }
    return 0;
  }

 private:
  bool ReadCData(OETagItemInfo& item, int32_t bang);
  static int MemoSlot(char ch);

  const char* m_p;
  int32_t m_n;
  FindMemo* m_memos;  // null: no memory of earlier searches
};

int OEParseEngine::Scanner::MemoSlot(char ch) {
  switch (ch) {
    case '\n': return 0;
    case '\r': return 1;
    case ':': return 2;
    case '<': return 3;
    case '>': return 4;
    case ']': return 5;
    case '-': return 6;
    default: return -1;
  }
}

// A search that may run far past the item that asked for it (header lines,
// CDATA brackets, MIME dashes) is remembered, so that asking again from a
// later position up to the answer, or from beyond a failed search, costs
// nothing. This keeps such searches linear over the whole text.
int32_t OEParseEngine::Scanner::Find(char ch, int32_t from) {
  if (from < 0 || from >= m_n) return -1;
  const int slot = m_memos ? MemoSlot(ch) : -1;
  if (slot < 0) return FindPlain(ch, from);
  FindMemo& memo = m_memos[slot];
  if (from >= memo.absentFrom) return -1;
  for (unsigned short k = 0; k < 2; ++k) {
    if (memo.from[k] <= from && from <= memo.found[k]) {
      memo.victim = static_cast<unsigned short>(k ^ 1u);
      return memo.found[k];
    }
  }
  const int32_t found = FindPlain(ch, from);
  if (found < 0) {
    memo.absentFrom = from;
    return -1;
  }
  memo.from[memo.victim] = from;
  memo.found[memo.victim] = found;
  memo.victim ^= 1u;
  return found;
}

unsigned short OEParseEngine::Scanner::ReadItem(OETagItemInfo& item) {
  item.type = OEITEM_NONE;
  const int32_t pos = SkipWs(item.end);
  item.start = pos;
  const char c = At(pos);
  if (c == '\0') return 0;
  if (c != '<') {
    item.type = OEITEM_DATA;
    item.end = FindPlainOrEnd('<', pos);
    item.length = Clamp16(PrevNonWs(item.end) - pos);
    return 1;
  }
  int32_t start = SkipWs(pos + 1);
  item.start = start;
  const char first = At(start);
  if (first == '!' && ReadCData(item, start)) return 1;
  if (first == '/') {
    start = SkipWs(start + 1);
    item.start = start;
    item.type = OEITEM_ENDTAG;
  } else {
    item.type = OEITEM_STARTTAG;
  }
  // The name runs to the first whitespace or '>'; the tag to the first '>'.
  int32_t q = NameEnd(start);
  const int32_t nameEnd = q;
  if (q < m_n && m_p[q] != '>') q = FindPlainOrEnd('>', q);
  item.end = q < m_n ? q + 1 : q;
  item.length = Clamp16(nameEnd - start);
  return 1;
}

// "<![CDATA[ ... ]]>": bang is the position of the '!'. On success the item
// starts just before the '!' and runs over the text after the '>' up to the
// next '<'. Otherwise the construct is left to be read as a tag.
bool OEParseEngine::Scanner::ReadCData(OETagItemInfo& item, int32_t bang) {
  int32_t q = SkipWs(bang + 1);
  if (At(q) != '[') return false;
  q = SkipWs(q + 1);
  static const char kWord[] = "CDATA";
  constexpr int32_t kWordLength = sizeof kWord - 1;
  if (q < 0 || m_n - q < kWordLength || !SameIgnoringCase(m_p + q, kWord, kWordLength)) return false;
  q = SkipWs(q + kWordLength);
  if (At(q) != '[') return false;
  const int32_t close1 = Find(']', q);
  if (close1 < 0 || At(close1 + 1) == '\0') return false;
  const int32_t close2 = Find(']', close1 + 1);
  if (close2 < 0 || At(close2 + 1) == '\0') return false;
  const int32_t gt = Find('>', close2 + 1);
  if (gt < 0) return false;
  item.type = OEITEM_CDATA;
  item.start = bang - 1;
  item.end = FindPlainOrEnd('<', gt + 1);
  item.length = Clamp16(PrevNonWs(item.end) - item.start);
  return true;
}

// "<!-- ... -->": a start tag whose text after the '!', up to the first '>',
// is at least four characters and begins and ends with "--".
bool OEParseEngine::Scanner::IsComment(const OETagItemInfo& item) const {
  if (item.type != OEITEM_STARTTAG || At(item.start) != '!') return false;
  const int32_t from = item.start + 1;
  int32_t stop = item.end > from ? item.end : from;
  if (stop > m_n) stop = m_n;
  if (from >= stop) return false;
  const void* gt = memchr(m_p + from, '>', static_cast<size_t>(stop - from));
  const int32_t cut = gt ? static_cast<int32_t>(static_cast<const char*>(gt) - m_p) : stop;
  return cut - from >= 4 && m_p[from] == '-' && m_p[from + 1] == '-' && m_p[cut - 2] == '-' && m_p[cut - 1] == '-';
}

// ---------------------------------------------------------------------------
// Names of end tags met after a skip that found no end tag. Reading only moves
// forward through one fixed sequence of items, so a later skip whose name is
// not here, or was last seen before the skip's first item, must fail too;
// it then fails at once instead of scanning the rest of the text again (which
// would make a text full of unclosed unknown tags quadratic).

struct OEParseEngine::SkipMemo {
  struct Slot {
    int32_t nameStart;  // -1: empty
    int32_t lastStart;  // start of the last end tag with this name
    uint32_t hash;
    unsigned short length;
  };

  ~SkipMemo() { free(slots); }

  static uint32_t Hash(const char* name, unsigned short length) {
    uint32_t h = 2166136261u;
    for (unsigned short i = 0; i < length; ++i) h = (h ^ FoldUpper(name[i])) * 16777619u;
    return h ^ (h >> 15);
  }

  Slot* Locate(const char* text, int32_t nameStart, unsigned short length, uint32_t hash) const {
    const uint32_t mask = capacity - 1;
    for (uint32_t i = hash & mask;; i = (i + 1) & mask) {
      Slot& slot = slots[i];
      if (slot.nameStart < 0) return &slot;
      if (slot.hash == hash && slot.length == length &&
          SameIgnoringCase(text + slot.nameStart, text + nameStart, length))
        return &slot;
    }
  }

  bool Grow(const char* text) {
    const uint32_t newCapacity = capacity ? capacity * 2 : 64;
    Slot* old = slots;
    const uint32_t oldCapacity = capacity;
    slots = static_cast<Slot*>(malloc(sizeof(Slot) * newCapacity));
    if (!slots) {
      slots = old;
      return false;
    }
    for (uint32_t i = 0; i < newCapacity; ++i) slots[i].nameStart = -1;
    capacity = newCapacity;
    for (uint32_t i = 0; i < oldCapacity; ++i) {
      if (old[i].nameStart >= 0) *Locate(text, old[i].nameStart, old[i].length, old[i].hash) = old[i];
    }
    free(old);
    return true;
  }

  bool Note(const char* text, int32_t itemStart, unsigned short length) {
    if ((count + 1) * 2 > capacity && !Grow(text)) return false;
    const uint32_t hash = Hash(text + itemStart, length);
    Slot* slot = Locate(text, itemStart, length, hash);
    if (slot->nameStart < 0) {
      *slot = {itemStart, itemStart, hash, length};
      ++count;
    } else {
      slot->lastStart = itemStart;
    }
    return true;
  }

  // Whether an end tag with this name may come at or after position from.
  bool MayFind(const char* text, int32_t nameStart, unsigned short length, int32_t from) const {
    if (count == 0) return false;  // no end tag at all
    const Slot* slot = Locate(text, nameStart, length, Hash(text + nameStart, length));
    return slot->nameStart >= 0 && slot->lastStart >= from;
  }

  Slot* slots = nullptr;
  uint32_t capacity = 0;
  uint32_t count = 0;
};

// ---------------------------------------------------------------------------
// Construction and view of the buffer

OEParseEngine::OEParseEngine(OEBuffer& buffer)
    : m_buffer(&buffer),
      m_current(),
      m_next(),
      m_dictionary(OETagDictionary::TheOETagDictionary()),
      m_headerPos(0),
      m_text(nullptr),
      m_size(0),
      m_textEnd(0),
      m_findMemo(),
      m_skipMemo(),
      m_names() {
  ViewOf(buffer, m_text, m_size);
  m_textEnd = TextEnd(m_text, m_size);
  ForgetSearches();
  m_current.end = Scan().FindPlainOrEnd('<', 0);
}

void OEParseEngine::SkipMemoHolder::Reset() {
  delete m_memo;
  m_memo = nullptr;
}

inline void OEParseEngine::Refresh() {
  const char* data = nullptr;
  uint32_t size = 0;
  ViewOf(*m_buffer, data, size);
  if (data == m_text && size == m_size) return;
  m_text = data;
  m_size = size;
  m_textEnd = TextEnd(data, size);
  ForgetSearches();
}

void OEParseEngine::ForgetNames() {
  for (NameSlot& slot : m_names) slot = NameSlot{{0, 0}, nullptr, 0};
}

void OEParseEngine::ForgetSearches() {
  for (FindMemo& memo : m_findMemo) memo = {{-1, -1}, {-1, -1}, INT32_MAX, 0};
  m_skipMemo.Reset();
}

OEParseEngine::Scanner OEParseEngine::Scan() { return Scanner(m_text, m_textEnd, m_findMemo); }

OEParseEngine::Scanner OEParseEngine::FreshScan() const {
  const char* data = nullptr;
  uint32_t size = 0;
  ViewOf(*m_buffer, data, size);
  if (data == m_text && size == m_size) return Scanner(m_text, m_textEnd, nullptr);
  return Scanner(data, TextEnd(data, size), nullptr);
}

unsigned short OEParseEngine::SetDictionary(TagDictionary* dictionary) {
  m_dictionary = dictionary ? dictionary : OETagDictionary::TheOETagDictionary();
  ForgetNames();
  return 1;
}

void OEParseEngine::ResetToEndOfHeader() {
  m_current.end = m_headerPos;
  m_next.type = OEITEM_NONE;
  m_skipMemo.Reset();  // the item sequence starts anew
}

// ---------------------------------------------------------------------------
// Header lines and MIME

unsigned short OEParseEngine::GetHeader(OEHeaderTag& tag, OEString& value, OEString* name) {
  Refresh();
  if (name) name->Assign(nullptr, 0);
  Scanner s = Scan();
  for (;;) {
    const int32_t pos = m_headerPos;
    int32_t eol = s.Find('\n', pos);
    if (eol < 0) eol = s.Find('\r', pos);
    if (eol < 0) return 0;
    // With no colon anywhere after, the line is still classified, so that a
    // blank line is passed over and ends the block as any other would.
    int32_t colon = s.Find(':', pos);
    if (colon < 0) colon = INT32_MAX;
    const int32_t lt = s.FindOrEnd('<', pos);
    bool bang = false;
    int32_t gt = 0;
    if (lt < eol && s.At(lt + 1) == '!') {
      bang = true;
      gt = s.FindOrEnd('>', lt + 1);
      if (lt < colon) {  // a <!...> construct before the colon
        m_headerPos = gt + 1;
        continue;
      }
    }
    const int32_t lineEnd = bang && gt + 1 > eol + 1 ? gt + 1 : eol + 1;
    if (eol < colon) {  // no colon on this line
      if (eol < lt) {
        const bool blank = s.AllWs(pos, eol);
        m_headerPos = eol + 1;
        if (blank) return 0;  // a blank line ends the header block
        continue;             // other text is passed over
      }
      if (!bang) return 0;  // a tag: the body has begun
      m_headerPos = lineEnd;
      continue;
    }
    if (lt <= eol && !bang) return 0;

    const int32_t nameStart = s.SkipWs(pos);
    m_headerPos = nameStart;
    const int32_t nameEnd = s.PrevNonWs(colon);
    const size_t nameLength = nameEnd > nameStart ? static_cast<size_t>(nameEnd - nameStart) : 0;
    OEString ownName;
    OEString& headerName = name ? *name : ownName;
    headerName.Assign(s.Data() + nameStart, nameLength);
    if (!OEDataConversion::StringToHeaderTag(headerName, tag)) tag = OE_HEADER_UNKNOWN;

    const int32_t valueStart = s.SkipWs(colon + 1);
    const int32_t valueEnd = s.PrevNonWs(bang ? lt : eol);
    if (valueEnd > valueStart) {
      value.Assign(s.Data() + valueStart, static_cast<size_t>(valueEnd - valueStart));
    } else {
      value.Assign(nullptr, 0);
    }
    m_headerPos = lineEnd;
    return 1;
  }
}

uint32_t OEParseEngine::SkipBlankLines() {
  Refresh();
  const Scanner s = Scan();
  const int32_t blankEnd = s.SkipWs(m_headerPos);
  uint32_t lines = 0;
  int32_t lastLineEnd = -1;
  for (int32_t i = m_headerPos; i >= 0 && i < blankEnd; ++i) {
    const char c = s.At(i);
    if (c == '\n' || (c == '\r' && s.At(i + 1) != '\n')) {
      ++lines;
      lastLineEnd = i;
    }
  }
  if (lastLineEnd >= 0) m_headerPos = lastLineEnd + 1;
  return lines;
}

OEMIMEType OEParseEngine::GetFileType(OEString* contentType) {
  Refresh();
  if (!contentType || !ContainsIgnoringCase(contentType->c_str(), contentType->GetStrLength(), "x-ofx"))
    return OEMIME_UNKNOWN;
  constexpr int32_t kWindow = 200;
  const Scanner s = Scan();
  const int32_t from = m_headerPos;
  int32_t n = 0;
  if (from >= 0 && from < s.Length()) n = s.Length() - from < kWindow ? s.Length() - from : kWindow;
  const char* head = n ? s.Data() + from : "";
  if (ContainsIgnoringCase(head, static_cast<size_t>(n), "SONRS")) return OEMIME_OFXRESPONSE;
  if (ContainsIgnoringCase(head, static_cast<size_t>(n), "SONRQ")) return OEMIME_OFXREQUEST;
  return OEMIME_UNKNOWN;
}

unsigned short OEParseEngine::GetMIMEBoundary(OEString& contentType, OEString& boundary) {
  static const char kMultipart[] = "multipart";
  constexpr size_t kMultipartLength = sizeof kMultipart - 1;
  constexpr size_t kMaxBoundary = 71;
  const char* type = contentType.c_str();
  const size_t n = contentType.GetStrLength();
  if (n < kMultipartLength || !SameIgnoringCase(type, kMultipart, kMultipartLength) ||
      !ContainsIgnoringCase(type, n, "boundary"))
    return 0;
  const char* eq = static_cast<const char*>(memchr(type, '=', n));
  if (!eq) return 0;
  size_t i = static_cast<size_t>(eq - type) + 1;
  if (i < n && type[i] == '"') ++i;
  char text[kMaxBoundary];
  size_t length = 0;
  for (; i < n && length < kMaxBoundary; ++i) {
    const char c = type[i];
    if (c == '"' || IsWs(c)) break;
    text[length++] = static_cast<char>(c >= 'A' && c <= 'Z' ? c - 'A' + 'a' : c);
  }
  boundary.Assign(text, length);
  return 1;
}

OEBoundStatus OEParseEngine::FindMIMEBoundary(OEString& boundary) { return FindMIMEBoundary(boundary, m_headerPos); }

OEBoundStatus OEParseEngine::FindMIMEBoundary(OEString& boundary, int32_t& position) {
  Refresh();
  Scanner s = Scan();
  const char* text = boundary.c_str();
  const int32_t length = boundary.GetStrLength();
  int32_t failedDash = -1;  // a "--" already compared without success
  for (;;) {
    const int32_t nl = s.Find('\n', position);
    if (nl < 0) return OEBOUND_NONE;
    const int32_t dash = s.Find('-', position);
    if (dash < 0) return OEBOUND_NONE;
    if (s.At(dash + 1) != '-') {
      position = nl + 1;
      continue;
    }
    const int32_t from = dash + 2;
    if (length == 0 || s.At(from) == '\0') return OEBOUND_NONE;  // nothing to compare
    OEBoundStatus result = OEBOUND_NONE;
    if (dash != failedDash) {
      if (s.Length() - from >= length && memcmp(s.Data() + from, text, static_cast<size_t>(length)) == 0) {
        position = from + length;
        result = OEBOUND_FOUND;
        if (s.At(position) == '-' && s.At(position + 1) == '-') {
          position += 2;
          result = OEBOUND_LAST;
        }
      } else {
        failedDash = dash;
      }
    }
    const int32_t lf = s.Find('\n', position);
    if (lf >= 0) position = lf + 1;
    if (result != OEBOUND_NONE) return result;
  }
}

unsigned short OEParseEngine::GetMIMEBody(OEString& boundary, OEString& body) {
  Refresh();
  int32_t position = m_headerPos;
  const OEBoundStatus found = FindMIMEBoundary(boundary, position);
  if (found == OEBOUND_NONE) return 0;
  const Scanner s = Scan();
  int32_t stop = s.PrevNonWs(position) - (boundary.GetStrLength() + 2) - (found == OEBOUND_LAST ? 2 : 0);
  if (stop > s.Length()) stop = s.Length();
  const int32_t start = m_headerPos;
  if (stop <= start) {
    body.Assign(nullptr, 0);
    return 1;
  }
  const size_t length = static_cast<size_t>(stop - start);
  body.Assign(s.Data() + start, length);
  return body.GetStrLength() == length;  // 0 when the body is too long for a string
}

// ---------------------------------------------------------------------------
// Items

inline unsigned short OEParseEngine::Advance(OETagItemInfo& current, OETagItemInfo& next) {
  if (next.type != OEITEM_NONE) {
    current = next;
    next.type = OEITEM_NONE;
    return 1;
  }
  return Scan().ReadNonComment(current);
}

OEParseEngine::OeTagItemType OEParseEngine::PeekType() {
  if (m_next.type == OEITEM_NONE) {
    m_next = m_current;
    Scan().ReadNonComment(m_next);
  }
  return m_next.type;
}

OEParseEngine::OeTagItemType OEParseEngine::NextTagType() {
  Refresh();
  return PeekType();
}

unsigned short OEParseEngine::GetOeTagItem() {
  Refresh();
  return Advance(m_current, m_next);
}

unsigned short OEParseEngine::GetTagData(OEString& out, unsigned short expand, unsigned short wipe) {
  Refresh();
  if (!Advance(m_current, m_next)) return 0;
  return CopyCurrTagItemToBuffer(out, expand, wipe);
}

unsigned short OEParseEngine::CopyCurrTagItemToBuffer(OEString& out, unsigned short expand,
                                                      unsigned short /*wipe*/) const {
  return FreshScan().CopyItem(m_current, out, expand != 0);
}

unsigned short OEParseEngine::ExpandSgmlMacros(OEString& in, OEString& out) const {
  if (&in == &out) {
    const OEString copy(in);
    return ExpandInto(copy.c_str(), copy.GetStrLength(), out);
  }
  return ExpandInto(in.c_str(), in.GetStrLength(), out);
}

// ---------------------------------------------------------------------------
// Tags

// The cached answer for a name of length 1 or more at start, or null; sets
// slot to where the name's answer is kept.
inline const OETagDictionaryEntry* OEParseEngine::CachedName(int32_t start, unsigned short length, uint64_t head[2],
                                                            NameSlot*& slot) {
  const char* name = m_text + start;
  NameHead(name, length, m_textEnd - start, head);
  slot = &m_names[NameHash(head, length, kNameSlots)];
  if (slot->length == length && slot->head[0] == head[0] && slot->head[1] == head[1] &&
      (length <= 16 || memcmp(slot->entry->name + 16, name + 16, length - 16u) == 0))
    return slot->entry;
  return nullptr;
}

inline const OETagDictionaryEntry* OEParseEngine::Lookup(int32_t start, unsigned short length, OETagID* id) {
  if (length == 0) {
    if (id) *id = OE_TAG_NONE;
    return nullptr;
  }
  uint64_t head[2];
  NameSlot* slot = nullptr;
  if (const OETagDictionaryEntry* cached = CachedName(start, length, head, slot)) {
    if (id) *id = cached->id;
    return cached;
  }
  const char* name = m_text + start;
  const OETagDictionaryEntry* entry = LookupSlow(name, length, id);
  // Only exact-case answers are kept: a lower-case name is warned about each time.
  if (entry && memcmp(entry->name, name, length) == 0) *slot = NameSlot{{head[0], head[1]}, entry, length};
  return entry;
}

const OETagDictionaryEntry* OEParseEngine::LookupSlow(const char* name, unsigned short length, OETagID* id) {
  OETagID found = OE_TAG_NONE;
  const OETagDictionaryEntry* entry = m_dictionary ? m_dictionary->GetTagID(name, length, &found, OE_CASE_EXACT)
                                                   : nullptr;
  if (!entry && HasLowerCase(name, length)) {
    if (m_dictionary) entry = m_dictionary->GetTagID(name, length, &found, OE_CASE_IGNORE);
    Log(OEPW_LOWERCASE, nullptr, 0, name, length, found);
  }
  if (id) *id = found;
  return entry;
}

// Logs the current item, which is not a known tag, and passes over it (an
// unknown start tag with its content). 0 when the skip failed.
unsigned short OEParseEngine::PassOverUnknownItem() {
  const OETagItemInfo item = m_current;
  const char* text = item.length ? m_text + item.start : nullptr;
  if (item.type == OEITEM_DATA) {
    Log(OEPW_BADFORMAT, text, item.length, nullptr, 0, OE_TAG_NONE);
  } else {
    Log(OEPW_UNKNOWNTAG, nullptr, 0, text, item.length, OE_TAG_NONE);
  }
  if (item.type != OEITEM_STARTTAG || SkipCurrentTag()) return 1;
  Log(OEPW_SKIPFAILED, nullptr, 0, text, item.length, OE_TAG_NONE);
  return 0;
}

const OETagDictionaryEntry* OEParseEngine::NextKnownTag(OETagID* id) {
  while (Advance(m_current, m_next)) {
    const OeTagItemType type = m_current.type;
    if (type == OEITEM_STARTTAG || type == OEITEM_ENDTAG) {
      if (const OETagDictionaryEntry* entry = Lookup(m_current.start, m_current.length, id)) return entry;
    }
    if (!PassOverUnknownItem()) break;
  }
  if (id) *id = OE_TAG_NONE;
  return nullptr;
}

const OETagDictionaryEntry* OEParseEngine::GetTagID(OETagID* id) {
  Refresh();
  return NextKnownTag(id);
}

// The shapes that make up nearly all of a file, read in one pass: a known
// tag written plainly ("<NAME>" or "</NAME>", no spaces inside, a name
// already met), and after a start tag its value up to the next '<'. Items,
// entry and value end up exactly as the general reading leaves them.
// Anything else (comments, CDATA, unknown or new names, odd spacing) answers
// kQuickNone with nothing changed, and the general reading takes over.
// The items are written whole, not field by field, so that reading them back
// as a whole does not stall.
namespace {
constexpr int kQuickNone = -2;
}

inline int OEParseEngine::QuickTag(OETagDictionaryEntry& entry, OEString& value) {
  const char* p = m_text;
  const int32_t n = m_textEnd;
  int32_t pos = m_current.end;
  if (pos < 0) return kQuickNone;
  while (pos < n && IsWs(p[pos])) ++pos;
  if (n - pos < 3 || p[pos] != '<') return kQuickNone;
  int32_t start = pos + 1;
  OeTagItemType type = OEITEM_STARTTAG;
  if (p[start] == '/') {
    type = OEITEM_ENDTAG;
    ++start;
  }
  if (start >= n || p[start] == '!' || p[start] == '>' || IsWs(p[start])) return kQuickNone;
  const int32_t nameEnd = Scanner(p, n, nullptr).NameEnd(start);
  if (nameEnd >= n || p[nameEnd] != '>' || nameEnd - start >= 0xFFFF) return kQuickNone;
  const unsigned short length = static_cast<unsigned short>(nameEnd - start);
  uint64_t head[2];
  NameSlot* slot = nullptr;
  const OETagDictionaryEntry* found = CachedName(start, length, head, slot);
  if (!found) return kQuickNone;
  OETagItemInfo tag;
  tag.type = type;
  tag.length = length;
  tag.start = start;
  tag.end = nameEnd + 1;
  if (type == OEITEM_ENDTAG) {
    m_current = tag;
    entry = *found;
    return OE_TAG_END;
  }
  int32_t v = nameEnd + 1;
  while (v < n && IsWs(p[v])) ++v;
  if (v >= n || p[v] == '<') {  // an aggregate, or a tag that ends the text
    m_current = tag;
    // A '<' that opens no comment or CDATA section begins a start or end tag:
    // an aggregate begins. The tag after it is read by the next call, from
    // where this one ended, as the look-ahead would have read it.
    if (v + 1 < n && p[v + 1] != '!' && !IsWs(p[v + 1])) {
      entry = *found;
      return OE_TAG_START;
    }
    return StartTagFollowedBy(*found, entry, value);
  }
  bool macro = false;  // whether the value holds an '&' to expand
  const int32_t end = Scanner(p, n, nullptr).ValueEnd(v, macro);
  int32_t last = end;
  while (IsWs(p[last - 1])) --last;  // stops at v, which is no whitespace
  OETagItemInfo data;
  data.type = OEITEM_DATA;
  data.length = Clamp16(last - v);
  data.start = v;
  data.end = end;
  m_current = data;
  // A value too long for a string fails as the general copy fails: emptied.
  unsigned short copied;
  if (macro) {
    copied = ExpandInto(p + v, data.length, value);
  } else {
    value.Assign(p + v, data.length);
    copied = value.GetStrLength() == data.length;
  }
  if (!copied || data.length != last - v) return OE_TAG_FAILED;
  entry = *found;
  return OE_TAG_ELEMENT;
}

// After the start tag just read (the current item): an aggregate's start
// when a tag follows, else an element with its value.
OETagType OEParseEngine::StartTagFollowedBy(const OETagDictionaryEntry& found, OETagDictionaryEntry& entry,
                                            OEString& value) {
  switch (PeekType()) {
    case OEITEM_STARTTAG:
    case OEITEM_ENDTAG:
      entry = found;
      return OE_TAG_START;
    case OEITEM_DATA:
    case OEITEM_CDATA: {
      const unsigned short expand = m_next.type == OEITEM_DATA;
      Advance(m_current, m_next);
      // Straight from the buffer into value: no temporary copy of a password.
      if (!Scan().CopyItem(m_current, value, expand != 0)) return OE_TAG_FAILED;
      entry = found;
      return OE_TAG_ELEMENT;
    }
    default:  // the start tag ends the text
      value.Assign(nullptr, 0);
      return OE_TAG_FAILED;
  }
}

OETagType OEParseEngine::GetOETag(OETagDictionaryEntry& entry, OEString& value) {
  Refresh();
  if (m_next.type == OEITEM_NONE) {
    const int kind = QuickTag(entry, value);
    if (kind != kQuickNone) return static_cast<OETagType>(kind);
  }
  const OETagDictionaryEntry* found = NextKnownTag(nullptr);
  if (!found) return OE_TAG_DONE;
  if (m_current.type == OEITEM_ENDTAG) {
    entry = *found;
    return OE_TAG_END;
  }
  return StartTagFollowedBy(*found, entry, value);
}

unsigned short OEParseEngine::SkipCurrentTag() {
  Refresh();
  const OETagItemInfo savedCurrent = m_current;
  const OETagItemInfo savedNext = m_next;
  const int32_t nameStart = savedCurrent.start;
  const unsigned short nameLength = savedCurrent.length;
  if (!Advance(m_current, m_next)) return 0;
  if (m_current.type == OEITEM_DATA || m_current.type == OEITEM_CDATA) return 1;  // an element and its value
  const SkipMemo* memo = m_skipMemo.Get();
  if (!memo || memo->MayFind(m_text, nameStart, nameLength, m_current.start)) {
    do {
      if (m_current.type == OEITEM_ENDTAG && m_current.length == nameLength &&
          SameIgnoringCase(m_text + m_current.start, m_text + nameStart, nameLength))
        return 1;
    } while (Advance(m_current, m_next));
    if (!memo) NoteFailedSkip(savedCurrent, savedNext);
  }
  // No end tag: the unknown tag counts as an empty one.
  Log(OEPW_BADFORMAT, nameLength ? m_text + nameStart : nullptr, nameLength, nullptr, 0, OE_TAG_NONE);
  m_current = savedCurrent;
  m_next = savedNext;
  return 1;
}

void OEParseEngine::NoteFailedSkip(const OETagItemInfo& origin, const OETagItemInfo& originNext) {
  SkipMemo* memo = new (std::nothrow) SkipMemo;
  if (!memo) return;  // only a cache: reading goes on without it
  OETagItemInfo current = origin;
  OETagItemInfo next = originNext;
  while (Advance(current, next)) {
    if (current.type == OEITEM_ENDTAG && !memo->Note(m_text, current.start, current.length)) {
      delete memo;
      return;
    }
  }
  m_skipMemo.Set(memo);
}

// ---------------------------------------------------------------------------
// Helpers on a whole buffer

unsigned short OEParseEngine::IsWhiteSpace(char c) { return IsWs(c); }

unsigned short OEParseEngine::IsWhiteSpace(const char* text) {
  if (!text) return 1;
  for (; *text; ++text) {
    if (!IsWs(*text)) return 0;
  }
  return 1;
}

int32_t OEParseEngine::SkipWhiteSpaces(OEBuffer& buffer, int32_t pos) { return Scanner(buffer).SkipWs(pos); }

int32_t OEParseEngine::FindWhiteSpaces(OEBuffer& buffer, int32_t pos) { return Scanner(buffer).FindWs(pos); }

int32_t OEParseEngine::FindPreviousNonWhiteSpace(OEBuffer& buffer, int32_t pos) {
  return Scanner(buffer).PrevNonWs(pos);
}

unsigned short OEParseEngine::GetOneItemFromOEBuffer(OEBuffer& buffer, OETagItemInfo& item) {
  return Scanner(buffer).ReadItem(item);
}

unsigned short OEParseEngine::IsCommentTag(OEBuffer& buffer, const OETagItemInfo& item) {
  return Scanner(buffer).IsComment(item);
}

unsigned short OEParseEngine::GetOETagInternal(OEBuffer& buffer, OETagItemInfo& item) {
  return Scanner(buffer).ReadNonComment(item);
}
