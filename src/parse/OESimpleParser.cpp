#include "ofxkit/parse/OESimpleParser.h"

#include <cstdio>
#include <cstring>
#include <new>

#include "ofxkit/core/OEAggregate.h"
#include "ofxkit/core/OEDataObj.h"
#include "ofxkit/core/OEDataObjFactory.h"
#include "ofxkit/core/OETagDictionary.h"
#include "ofxkit/parse/OEParseEngine.h"
#include "ofxkit/types/OEBuffer.h"
#include "ofxkit/types/OEDataConversion.h"
#include "ofxkit/types/OEUtility.h"
#include "../core/OEPool.h"

namespace {
// Overwrites a password value in place, character for character.
void MaskPassword(OEString& value) {
  unsigned short n = value.GetStrLength();
  if (n == 0) return;
  char* text = value.LockBuffer(static_cast<unsigned short>(n + 1));
  if (!text) return;
  memset(text, '*', n);
  text[n] = '\0';
  value.UnlockBuffer();
}
// The elements whose values are passwords: never shown, in a warning or in
// the parser's copy.
bool IsPasswordTag(OETagID tag) {
  return tag == OE_TAG_USERPASS || tag == OE_TAG_NEWUSERPASS || tag == OE_TAG_TEMPPASS;
}
// Masks the texts of the warnings logged from `first` on that name no known
// tag: after a password element they are pieces of a malformed password
// (`<USERPASS>Secr3t<Rest0fPass`), read as unknown tags or stray text.
void MaskWarningsSince(uint32_t first) {
  OEParseLogger* log = OEParseLogger::TheOEParseLogger();
  for (uint32_t i = first; log && i < log->Entries(); ++i) {
    OEParseException* record = log->Get(static_cast<unsigned short>(i));
    if (!record || record->tag != OE_TAG_NONE) continue;
    MaskPassword(record->value);
    MaskPassword(record->tagName);
  }
}
// True when, after blanks, the text at `position` is the start tag <OFX>.
bool AnotherOFXFollows(OEBuffer& buffer, int32_t position) {
  char c;
  while ((c = buffer.GetCh(position)) == ' ' || c == '\r' || c == '\n' || c == '\t') ++position;
  const char* tag = "<OFX>";
  for (int i = 0; tag[i]; ++i) {
    c = buffer.GetCh(position + i);
    if (c >= 'a' && c <= 'z') c = static_cast<char>(c - 'a' + 'A');
    if (c != tag[i]) return false;
  }
  return true;
}
}  // namespace

OESimpleParser::OESimpleParser() : m_engine(nullptr), m_objectWithError(nullptr) {}

unsigned short OESimpleParser::LogRecord(OEParseWarning warning, const OEString& value, const char* tagName,
                                         OETagID tag) {
  OEDataObjFactory* factory = OEDataObj::GetFactory();
  OEParseException* record = factory ? factory->NewParseException() : nullptr;
  if (!record) {
    g_allocFailed = 1;
    return 0;
  }
  record->warning = warning;
  record->value = value;
  record->tagName = tagName;
  record->tag = tag;
  record->object = GetCurrentObj();
  return AppendParseException(record);
}

OEParseStatus OESimpleParser::ReadHeaders(OEParseEngine& engine, OEDataObj* root) {
  OEHeaderTag tag = OE_HEADER_UNKNOWN;
  OEString value;
  OEString name;
  // First block: MIME or HTTP-style lines (with their names), then the OFX
  // header lines. A text that starts with the OFX headers reads them here.
  // Real header blocks hold a few dozen lines; past kMaxHeaderLines the lines
  // are still read (so the body is found where it starts) but not kept.
  uint32_t lines = 0;
  if ((m_options & OE_READ_TOLERANT) && engine.SkipBlankLines())
    LogRecord(OEPW_BADFORMAT, OEString("blank lines before the header block"), "", OE_TAG_NONE);
  for (int block = 0; block < 2; ++block) {
    OEString* names = block == 0 ? &name : nullptr;
    while (engine.GetHeader(tag, value, names)) {
      if (++lines > kMaxHeaderLines) {
        if (lines == kMaxHeaderLines + 1) {
          char text[64];
          snprintf(text, sizeof text, "more than %u header lines: the rest were not read",
                   static_cast<unsigned>(kMaxHeaderLines));
          LogRecord(OEPW_BADFORMAT, OEString(text), names ? name.c_str() : "", OE_TAG_NONE);
        }
        continue;
      }
      OEParseStatus status = GetCurrentObj()->HandleHeader(tag, value, names);
      if (status != OE_PARSE_OK) return status;
    }
  }
  OETagID type = root->GetType();
  if (type == OE_TAG_OFXFILERS || type == OE_TAG_OFXFILERQ) {
    const OEHeaderValidation* file = dynamic_cast<const OEHeaderValidation*>(root);
    if (file && !((m_options & OE_READ_TOLERANT) ? file->ValidateHeadersTolerantly() : file->ValidateHeaders()))
      return OE_PARSE_NOT_HANDLED;
  }
  return OE_PARSE_OK;
}

// A tolerant reading takes an element of the current aggregate that is
// directly followed by another tag ("<MEMO><NAME>") as an empty element:
// nothing is set, and a warning names it. False when the tag is no element
// of the current object (it then goes to HandleTagStart as usual).
bool OESimpleParser::ReadEmptyElement(const OETagDictionaryEntry& entry) {
  if (!(m_options & OE_READ_TOLERANT)) return false;
  const OEAggregate* aggregate = dynamic_cast<const OEAggregate*>(GetCurrentObj());
  const OEFieldDesc* field = aggregate ? aggregate->FieldAt(entry.id) : nullptr;
  if (!field || (field->kind != OE_FIELD_ELEMENT && field->kind != OE_FIELD_VALUES)) return false;
  LogRecord(OEPW_BADFORMAT, OEString(), entry.name, entry.id);
  return true;
}

OEParseStatus OESimpleParser::ReadBody(OEParseEngine& engine, OEBuffer* buffer) {
  OETagDictionaryEntry entry{OE_TAG_NONE, nullptr};
  OEString value;
  OEParseStatus status = OE_PARSE_OK;
  int32_t previous = -1;
  OETagID previousElement = OE_TAG_NONE;
  OEParseLogger* log = OEParseLogger::TheOEParseLogger();
  bool afterPassword = false;
  while (status == OE_PARSE_OK && previous != OE_TAG_DONE) {
    bool afterElement = previous == OE_TAG_ELEMENT;
    const uint32_t logged = afterPassword && log ? log->Entries() : 0;
    OETagType kind = engine.GetOETag(entry, value);
    // Whatever lies between a password tag and the next known tag is secret.
    if (afterPassword) MaskWarningsSince(logged);
    const bool password = (kind == OE_TAG_ELEMENT || kind == OE_TAG_START) && IsPasswordTag(entry.id);
    afterPassword = password;
    previous = kind;
    // Warnings take their position from the buffer's offset: keep it just
    // past the item being handled.
    if (buffer) buffer->SetBufferOffset(static_cast<uint32_t>(engine.ItemEnd()));
    OEDataObj* current = GetCurrentObj();
    switch (kind) {
      case OE_TAG_START: {
        const bool valid = IsValidTag(entry.id) != 0;
        if (valid && ReadEmptyElement(entry)) {
          previous = OE_TAG_ELEMENT;  // so that its end tag, when given, is passed over
          previousElement = entry.id;
          break;
        }
        if (!valid) {
          LogRecord(OEPW_INVALIDAGG, OEString(), entry.name, entry.id);
          engine.SkipCurrentTag();
          break;
        }
        status = current->HandleTagStart(&entry);
        if (status != OE_PARSE_OK) LogRecord(OEPW_INVALIDAGG, OEString(), entry.name, entry.id);
        break;
      }
      case OE_TAG_END:
        if (afterElement && entry.id == previousElement) break;  // an element's optional end tag
        status = current->HandleTagEnd(&entry);
        // Nothing after </OFX> is read (servers often leave trailing bytes),
        // except a further OFX aggregate of a file holding several.
        if (entry.id == OE_TAG_OFX && !(status == OE_PARSE_OK && GetDepth() == 0 && buffer &&
                                        AnotherOFXFollows(*buffer, engine.ItemEnd())))
          previous = OE_TAG_DONE;
        break;
      case OE_TAG_ELEMENT: {
        if (!IsValidTag(entry.id)) {
          if (password) MaskPassword(value);
          if (!LogRecord(OEPW_INVALIDELEM, value, entry.name, entry.id)) status = OE_PARSE_NO_PARSER;
        } else {
          status = current->HandleTagElement(&entry, value);
          if (password) MaskPassword(value);
          if (status != OE_PARSE_OK && !LogRecord(OEPW_INVALIDELEM, value, entry.name, entry.id))
            status = OE_PARSE_NO_PARSER;
        }
        previousElement = entry.id;
        break;
      }
      case OE_TAG_DONE:
        if (GetDepth() > 0) status = OE_PARSE_NOT_HANDLED;  // the text ended inside aggregates
        break;
      default:
        if (!LogRecord(OEPW_UNKNOWNTAG, value, entry.name, entry.id)) status = OE_PARSE_NO_PARSER;
        else status = OE_PARSE_NOT_HANDLED;
        break;
    }
  }
  MaskPassword(value);  // no password text stays in the parser's copy
  return status;
}

OEParseStatus OESimpleParser::Parse(OEBuffer* buffer, OEDataObj* root, unsigned short checkRequired) {
  if (!root || (!buffer && !m_engine)) return OE_PARSE_NO_PARSER;
  SetCurrentObj(root);
  root->SetupForParsing(this);
  g_allocFailed = 0;
  OEParseLogger* log = OEParseLogger::TheOEParseLogger();
  if (log) {
    log->DeleteAll();
    log->SetBuffer(buffer);
    log->SetParser(this);
  }
  uint32_t savedOffset = buffer ? buffer->GetBufferOffset() : 0;
  OEParseEngine* engine = m_engine;
  bool ownEngine = false;
  if (!engine) {
    engine = new (std::nothrow) OEParseEngine(*buffer);
    if (!engine) {
      g_allocFailed = 1;
      return OE_PARSE_NO_PARSER;
    }
    ownEngine = true;
  }
  m_objectWithError = nullptr;

  OEParseStatus status = ReadHeaders(*engine, root);
  if (status == OE_PARSE_OK) {
    engine->ResetToEndOfHeader();
    // The object pool sizes its pages from how far this reading has come.
    struct Reading {
      explicit Reading(const OEParseEngine* engine) { OEPoolReading(engine); }
      ~Reading() { OEPoolReading(nullptr); }
    } reading(engine);
    status = ReadBody(*engine, buffer);
  }
  if (status != OE_PARSE_OK && status != OE_PARSE_NO_PARSER) m_objectWithError = GetCurrentObj();

  if (checkRequired) {
    OEDataObj* lacking = root;
    OETagID missing = OE_TAG_NONE;
    if (!OEUtility::AllRequiredPresent(&lacking, &missing))
      AppendParseException(OEPW_MISSINGTAG, OEString(), OEString(), missing, lacking);
  }
  if (status == OE_PARSE_OK && GetAnyParseExceptionsLogged()) {
    status = OE_PARSE_WARNINGS;
    if (!m_objectWithError) m_objectWithError = root;
  }
  if (g_allocFailed) {
    status = OE_PARSE_NO_PARSER;
    if (!m_objectWithError) m_objectWithError = root;
  }
  if (ownEngine) delete engine;
  // The log must not keep pointers to a buffer or parser that the caller may
  // free; later warnings have no position and name no parse object.
  if (log) {
    log->SetBuffer(nullptr);
    log->SetParser(nullptr);
  }
  if (buffer) buffer->SetBufferOffset(savedOffset);
  return status;
}
