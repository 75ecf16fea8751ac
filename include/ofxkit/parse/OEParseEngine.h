// The lexical layer under every parse: reads one OEBuffer holding a whole
// OFX file (optional MIME wrapping, the NAME:VALUE header block, the SGML
// body) and hands out header lines and tags one at a time.
//
// The engine works in place: an item is a position and a length in the
// buffer, names are looked up in the tag dictionary straight from the buffer,
// and text is copied only when a value or a header is delivered. It never
// allocates objects and never writes to the buffer.
//
// Whitespace is exactly space, line feed, carriage return and tab. The text
// ends at the buffer's size or at its first NUL byte, whichever comes first:
// every scan stops there, and nothing past it is ever read.
#pragma once

#include <cstdint>

#include "ofxkit/core/OETagDictionary.h"
#include "ofxkit/core/OETagID.h"
#include "ofxkit/types/OEDataConversion.h"
#include "ofxkit/types/OEString.h"

class OEBuffer;

// Result of looking for a MIME boundary line.
enum OEBoundStatus : int32_t {
  OEBOUND_NONE = 0,   // no boundary line found
  OEBOUND_FOUND = 1,  // a boundary line
  OEBOUND_LAST = 2    // the closing boundary line (boundary followed by "--")
};

// Kind of document found after the header block. Value 1 is reserved for a
// MIME type of no OFX kind; GetFileType never answers it.
enum OEMIMEType : int32_t {
  OEMIME_UNKNOWN = 0,
  OEMIME_OTHER = 1,
  OEMIME_OFXREQUEST = 2,
  OEMIME_OFXRESPONSE = 3
};

class OEParseEngine {
 public:
  // Kind of one lexical item.
  enum OeTagItemType : int32_t {
    OEITEM_NONE = -1,     // no item (also an empty look-ahead slot)
    OEITEM_STARTTAG = 0,  // <NAME ...>, and any <!...> that is no comment or CDATA
    OEITEM_ENDTAG = 1,    // </NAME>
    OEITEM_DATA = 2,      // text between tags
    OEITEM_CDATA = 3      // a CDATA section and the text after it up to the next '<'
  };

  // One item: its kind, where its text starts and how long it is (for a tag,
  // the name only; for text, without trailing whitespace), and where the next
  // scan begins.
  struct OETagItemInfo {
    OETagItemInfo() : type(OEITEM_NONE), length(0), start(0), end(0) {}
    OeTagItemType type;
    unsigned short length;
    int32_t start;
    int32_t end;
  };

  // Remembers the buffer (not owned; it must outlive the engine and keep its
  // text while the engine reads it). Tag reading starts at the first '<',
  // header reading at position 0; names are looked up in the shared dictionary.
  explicit OEParseEngine(OEBuffer& buffer);
  // Copies read the same buffer from the same positions.
  OEParseEngine(const OEParseEngine& other) = default;
  OEParseEngine& operator=(const OEParseEngine& other) = default;
  virtual ~OEParseEngine() = default;

  // Dictionary for every later name lookup (not owned); null goes back to the
  // shared dictionary. Returns 1.
  unsigned short SetDictionary(TagDictionary* dictionary);

  int32_t GetHeaderPos() const { return m_headerPos; }
  // Position just past the item last read (the tag or value that GetOETag
  // delivered), for reporting where a parse stands.
  int32_t ItemEnd() const { return m_current.end; }
  // Where the text ends, as of the last item read (0 before any).
  int32_t TextLength() const { return m_textEnd; }
  // Tag reading resumes where the header block ended (the look-ahead slot is
  // emptied, so nothing read before is handed out again).
  void ResetToEndOfHeader();

  // ---- Header block and MIME
  // Moves the header position past blank lines (whitespace up to a line end);
  // answers how many line ends were passed.
  uint32_t SkipBlankLines();
  // Reads the next header line: 1 with tag (OE_HEADER_UNKNOWN for a name that
  // is not an OFX header; that is logged), value and, when name is given, the
  // raw name; 0 when the header block has ended (blank line, or the body
  // begins) or no further line can be read.
  unsigned short GetHeader(OEHeaderTag& tag, OEString& value, OEString* name);
  // For an OFX content type ("x-ofx"), whether the first 200 characters after
  // the header block hold a sign-on response or request.
  OEMIMEType GetFileType(OEString* contentType);
  // The boundary of a multipart content type, lower-cased. 1 when found.
  unsigned short GetMIMEBoundary(OEString& contentType, OEString& boundary);
  // Looks for the next "--boundary" line from the header position (which then
  // moves to the start of the line after it), or from position (moved the same
  // way).
  OEBoundStatus FindMIMEBoundary(OEString& boundary);
  OEBoundStatus FindMIMEBoundary(OEString& boundary, int32_t& position);
  // The text from the header position up to the next boundary line (the line
  // end before it included). The header position does not move. 1 when found.
  unsigned short GetMIMEBody(OEString& boundary, OEString& body);

  // ---- Tags
  // One step for a parser: OE_TAG_START (an aggregate opens), OE_TAG_END,
  // OE_TAG_ELEMENT (value set, macros expanded unless it is a CDATA section),
  // OE_TAG_DONE (no further tag) or OE_TAG_FAILED (a start tag with nothing
  // after it: value emptied, entry untouched; or a value too long to copy).
  // Unknown tags and stray text are logged and skipped on the way.
  virtual OETagType GetOETag(OETagDictionaryEntry& entry, OEString& value);
  // The next known start or end tag (its id through id when given), or null at
  // the end of the text.
  const OETagDictionaryEntry* GetTagID(OETagID* id);
  // Skips the start tag just read with its content: its value, or everything
  // up to its end tag (name compared ignoring case, nesting not counted). When
  // no end tag comes, logs OEPW_BADFORMAT and leaves the tag as an empty one.
  // 0 when nothing at all follows the tag.
  unsigned short SkipCurrentTag();

 protected:
  const OETagItemInfo& CurrentItem() const { return m_current; }
  const OETagItemInfo& NextItem() const { return m_next; }

  // Kind of the item after the current one, read into the look-ahead slot
  // first when the slot is empty.
  OeTagItemType NextTagType();
  OeTagItemType CurrTagItemType() const { return m_current.type; }
  // Makes the next non-comment item current; 0 at the end of the text.
  unsigned short GetOeTagItem();
  // GetOeTagItem, then CopyCurrTagItemToBuffer.
  unsigned short GetTagData(OEString& out, unsigned short expand, unsigned short wipe);
  // Copies the current item's text into out, with the three character macros
  // expanded when expand is 1. 1 when the whole text was copied. The text goes
  // straight from the buffer into out's own block, so no intermediate copy of
  // a password is ever left behind: wipe needs no further work.
  unsigned short CopyCurrTagItemToBuffer(OEString& out, unsigned short expand, unsigned short wipe) const;
  // Replaces "&gt;", "&lt;" and "&amp;" (any case) by their characters; other
  // "&name;" texts stay as written, and replacements are not rescanned.
  // Returns 1 (0 only when out cannot hold the text).
  unsigned short ExpandSgmlMacros(OEString& in, OEString& out) const;

  // Helpers on a whole buffer. They find the end of its text first, so they
  // cost a pass over the buffer; the engine itself uses its own view.
  static unsigned short IsWhiteSpace(char c);
  // 1 for null, empty or all-whitespace text.
  static unsigned short IsWhiteSpace(const char* text);
  static int32_t SkipWhiteSpaces(OEBuffer& buffer, int32_t pos);
  static int32_t FindWhiteSpaces(OEBuffer& buffer, int32_t pos);
  static int32_t FindPreviousNonWhiteSpace(OEBuffer& buffer, int32_t pos);
  // Reads one item from item.end; 0 (type OEITEM_NONE) at the end of the text.
  static unsigned short GetOneItemFromOEBuffer(OEBuffer& buffer, OETagItemInfo& item);
  static unsigned short IsCommentTag(OEBuffer& buffer, const OETagItemInfo& item);
  // Reads items until one is not a comment; 0 at the end of the text.
  static unsigned short GetOETagInternal(OEBuffer& buffer, OETagItemInfo& item);

 private:
  class Scanner;
  struct SkipMemo;
  // Owns the memo of failed skips. It is a cache of this engine's own reading,
  // so a copied engine starts without one.
  class SkipMemoHolder {
   public:
    SkipMemoHolder() = default;
    SkipMemoHolder(const SkipMemoHolder&) {}
    SkipMemoHolder& operator=(const SkipMemoHolder&) {
      Reset();
      return *this;
    }
    ~SkipMemoHolder() { Reset(); }
    SkipMemo* Get() const { return m_memo; }
    void Set(SkipMemo* memo) {
      Reset();
      m_memo = memo;
    }
    void Reset();

   private:
    SkipMemo* m_memo = nullptr;
  };
  // Recent answers of a far search for one character: two (from, found)
  // pairs, and the lowest start from which the character is known absent.
  struct FindMemo {
    int32_t from[2];
    int32_t found[2];
    int32_t absentFrom;
    unsigned short victim;  // pair replaced next
  };
  static constexpr int kFindMemos = 7;

  // Re-reads the buffer's address and size; when they changed, finds the end
  // of the text again and forgets every cached search.
  void Refresh();
  void ForgetSearches();
  void ForgetNames();
  Scanner Scan();
  // A scanner over the buffer as it is now, for the const operations.
  Scanner FreshScan() const;
  unsigned short Advance(OETagItemInfo& current, OETagItemInfo& next);
  struct NameSlot;
  const OETagDictionaryEntry* CachedName(int32_t start, unsigned short length, uint64_t head[2], NameSlot*& slot);
  const OETagDictionaryEntry* Lookup(int32_t start, unsigned short length, OETagID* id);
  int QuickTag(OETagDictionaryEntry& entry, OEString& value);
  OETagType StartTagFollowedBy(const OETagDictionaryEntry& found, OETagDictionaryEntry& entry, OEString& value);
  const OETagDictionaryEntry* LookupSlow(const char* name, unsigned short length, OETagID* id);
  const OETagDictionaryEntry* NextKnownTag(OETagID* id);
  OeTagItemType PeekType();
  unsigned short PassOverUnknownItem();
  void NoteFailedSkip(const OETagItemInfo& origin, const OETagItemInfo& originNext);

  OEBuffer* m_buffer;
  OETagItemInfo m_current;
  OETagItemInfo m_next;
  TagDictionary* m_dictionary;
  int32_t m_headerPos;

  // View of the buffer: its address and size when last seen, and the end of
  // its text (size or first NUL).
  const char* m_text;
  uint32_t m_size;
  int32_t m_textEnd;
  FindMemo m_findMemo[kFindMemos];
  SkipMemoHolder m_skipMemo;  // end tags after a failed skip

  // Recent exact-case answers of the dictionary, by a hash of the name's
  // first sixteen bytes: names repeat heavily in a statement, and a hit costs
  // two word comparisons (and a byte comparison of any rest past sixteen).
  struct NameSlot {
    uint64_t head[2];  // the first sixteen bytes of the name, zero-padded
    const OETagDictionaryEntry* entry;
    unsigned short length;
  };
  static constexpr unsigned kNameSlots = 128;
  NameSlot m_names[kNameSlots];
};
