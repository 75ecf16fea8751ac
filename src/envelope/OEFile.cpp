#include "ofxkit/envelope/OEFile.h"

#include <cstdio>
#include <new>

#include "ofxkit/core/OEBuilder.h"
#include "ofxkit/parse/OEParseLogger.h"
#include "ofxkit/types/OEBuffer.h"

namespace {

// How a header value is checked while parsing.
enum HeaderCheck : uint8_t {
  kUnchecked,  // anything goes
  kWarn,       // a wrong value is logged
  kFatal       // a wrong value is logged and refuses the file
};

// One OFX header: the value written when none was given, the accepted values,
// and what a wrong value costs. With no table, text is the only accepted value.
struct HeaderRule {
  const char* text;
  const char* const* table;
  unsigned short count;
  HeaderCheck check;
};

#define OE_ENUM_HEADER(ENUM, TABLE, CHECK) \
  { nullptr, OEDataConversion::TABLE, OEEnumTraits<ENUM>::kCount, CHECK }
// Indexed by OEHeaderTag - OE_HEADER_OFXHEADER.
const HeaderRule kHeaderRules[] = {
    {"100", nullptr, 0, kWarn},                                  // OFXHEADER
    OE_ENUM_HEADER(OEOFXData, m_OFXData, kFatal),                // DATA
    {"102", nullptr, 0, kWarn},                                  // VERSION
    OE_ENUM_HEADER(OEOFXSecurity, m_OFXSecurity, kUnchecked),    // SECURITY
    OE_ENUM_HEADER(OEOFXEncoding, m_OFXEncoding, kFatal),        // ENCODING
    OE_ENUM_HEADER(OEOFXCharSet, m_OFXCharSet, kWarn),           // CHARSET
    OE_ENUM_HEADER(OEOFXCompression, m_OFXCompression, kFatal),  // COMPRESSION
    OE_ENUM_HEADER(OEOFXFileUID, m_OFXFileUID, kUnchecked),      // OLDFILEUID
    OE_ENUM_HEADER(OEOFXFileUID, m_OFXFileUID, kUnchecked),      // NEWFILEUID
};
#undef OE_ENUM_HEADER
constexpr int kHeaderCount = sizeof kHeaderRules / sizeof kHeaderRules[0];
static_assert(kHeaderCount == OE_HEADER_NEWFILEUID - OE_HEADER_OFXHEADER + 1, "one rule per OFX header");

const HeaderRule& RuleFor(int tag) { return kHeaderRules[tag - OE_HEADER_OFXHEADER]; }

bool Accepted(const HeaderRule& rule, const OEString& value) {
  if (!rule.table) return value.strcmpi(rule.text) != 0;
  return OEDataConversion::FindText(value.c_str(), value.GetStrLength(), 0, static_cast<unsigned short>(rule.count - 1),
                                    rule.table) >= 0;
}

// The default values as strings, made once.
const OEString& DefaultValue(int tag) {
  static const struct Defaults {
    OEString values[kHeaderCount];
    Defaults() {
      for (int i = 0; i < kHeaderCount; ++i)
        values[i] = kHeaderRules[i].text ? kHeaderRules[i].text : kHeaderRules[i].table[0];
    }
  } defaults;
  return defaults.values[tag - OE_HEADER_OFXHEADER];
}

constexpr const char kOFXContentType[] = "application/x-ofx";

// Appends a newly made element and answers it. Null when nothing was made
// (an allocation failure, flagged) or when the array cannot grow (the
// element is deleted).
template <class T, class Array>
T* AppendMade(Array& array, T* made) {
  if (!made) {
    g_allocFailed = 1;
    return nullptr;
  }
  if (!array.Append(made)) {
    delete made;
    return nullptr;
  }
  return made;
}

// A part of the same kind as one of that type, made through the factory.
OEFile* MakePartLike(OEDataObjFactory* factory, OETagID type) {
  switch (type) {
    case OE_TAG_OFXFILERQ:
      return factory->NewFileRq();
    case OE_TAG_OFXFILERS:
      return factory->NewFileRs();
    default:
      return factory->NewSubfile();
  }
}

}  // namespace

// ---------------------------------------------------------------------------
// Array elements

OEMIMEHeader* OEArrayElementTraits<OEMIMEHeader>::New() {
  OEDataObjFactory* factory = OEDataObj::GetFactory();
  return factory ? factory->NewMIMEHeader() : nullptr;
}

OEFile* OEArrayElementTraits<OEFile>::New() {
  OEDataObjFactory* factory = OEDataObj::GetFactory();
  return factory ? MakePartLike(factory, OE_TAG_MIME) : nullptr;
}

void OEArrayElementTraits<OEFile>::Delete(OEFile* p) { delete p; }

// ---------------------------------------------------------------------------
// OEFile

OEFile::OEFile() : m_parent(nullptr), m_mimeHeaders(1, 4), m_subfiles(1, 1) { SetType(OE_TAG_MIME); }

OEFile::~OEFile() = default;

OEParseStatus OEFile::HandleTagStart(const OETagDictionaryEntry* const) { return static_cast<OEParseStatus>(1); }

OEParseStatus OEFile::HandleTagElement(const OETagDictionaryEntry* const, const OEString&) {
  return static_cast<OEParseStatus>(1);
}

OEParseStatus OEFile::HandleHeader(OEHeaderTag tag, const OEString& value, OEString* name) {
  if (value.IsEmpty()) return OE_PARSE_OK;
  if (SetHeader(tag, value)) return OE_PARSE_OK;
  // MIME or HTTP-style lines, unknown names, and values that could not be kept.
  if (!name || name->IsEmpty()) return OE_PARSE_NO_PARSER;
  return SetMIMEHeader(*name, value) ? OE_PARSE_OK : OE_PARSE_NO_PARSER;
}

unsigned short OEFile::SetHeader(OEHeaderTag tag, const OEString& value) {
  if (!IsOFXHeader(tag) || value.IsEmpty()) return 0;
  OEString& slot = m_headers[tag - kFirstHeader];
  slot = value;
  if (slot.GetStrLength() != value.GetStrLength()) {  // the copy could not be allocated
    g_allocFailed = 1;
    slot.Assign(nullptr, 0);
    return 0;
  }
  return 1;
}

const OEString* OEFile::GetHeader(OEHeaderTag tag) const {
  if (!IsOFXHeader(tag)) return nullptr;
  const OEString& slot = m_headers[tag - kFirstHeader];
  return slot.IsEmpty() ? nullptr : &slot;
}

unsigned short OEFile::ValidateHeader(OEHeaderTag tag) const { return GetHeader(tag) != nullptr; }

unsigned short OEFile::ValidateHeaders() const { return 1; }

void OEFile::ClearHeaders() {
  for (OEString& slot : m_headers) slot.Assign(nullptr, 0);
}

namespace {
std::string FoldedName(const char* name) {
  std::string key(name);
  for (char& c : key)
    if (c >= 'a' && c <= 'z') c = static_cast<char>(c - 'a' + 'A');
  return key;
}
}  // namespace

const OEMIMEHeader* OEFile::GetMIMEHeader(const char* name) const {
  if (!name) return nullptr;
  const unsigned short n = m_mimeHeaders.Entries();
  try {
    if (m_mimeIndexed > n) {  // headers were removed: index them anew
      m_mimeIndex.clear();
      m_mimeIndexed = 0;
    }
    for (; m_mimeIndexed < n; ++m_mimeIndexed)
      if (const OEMIMEHeader* header = m_mimeHeaders.Get(m_mimeIndexed))
        m_mimeIndex.emplace(FoldedName(header->GetName().c_str()), m_mimeIndexed);  // the first of a name wins
    const auto found = m_mimeIndex.find(FoldedName(name));
    if (found == m_mimeIndex.end()) return nullptr;
    const OEMIMEHeader* header = m_mimeHeaders.Get(found->second);
    if (header && header->GetName().strcmpi(name)) return header;
  } catch (const std::bad_alloc&) {
    m_mimeIndex.clear();
    m_mimeIndexed = 0;
  }
  // Out of memory, or headers replaced behind the index: look at each.
  for (unsigned short i = 0; i < n; ++i) {
    const OEMIMEHeader* header = m_mimeHeaders.Get(i);
    if (header && header->GetName().strcmpi(name)) return header;
  }
  return nullptr;
}

unsigned short OEFile::SetMIMEHeader(const OEString& name, const OEString& value) {
  if (name.IsEmpty()) return 0;
  OEMIMEHeader* header = const_cast<OEMIMEHeader*>(GetMIMEHeader(name.c_str()));
  if (!header) header = AppendMade(m_mimeHeaders, OEArrayElementTraits<OEMIMEHeader>::New());
  if (!header) return 0;
  header->SetName(name);
  header->SetValue(value);
  return 1;
}

OEDataObj* OEFile::GetChild(unsigned short index) const { return m_subfiles.Get(index); }

unsigned short OEFile::GetNumberOfChildren() const { return m_subfiles.Entries(); }

OEBuildStatus OEFile::BuildHeaders(OEBuilder* builder) const {
  if (!builder) return OE_BUILD_NO_OUTPUT;
  OEString line;
  for (unsigned short i = 0; i < m_mimeHeaders.Entries(); ++i) {
    const OEMIMEHeader* header = m_mimeHeaders.Get(i);
    if (!header) return OE_BUILD_NO_OUTPUT;
    line = header->GetName();
    line += ": ";
    line += header->GetValue().c_str();
    line += '\r';  // the builder adds the line feed
    OEBuildStatus status = builder->AddString(line, OE_MACRO_NONE, 1);
    if (status != OE_BUILD_OK) return status;
  }
  return OE_BUILD_OK;
}

OEBuildStatus OEFile::BuildPart(OEBuilder* builder, OEFile* part) const {
  // The part is written alone first: its size goes into its MIME headers,
  // which precede its text.
  OEBuffer text;
  OEBuilder partBuilder(2);
  unsigned short allocFailed = g_allocFailed;  // the inner build clears the flag
  OEBuildStatus status = partBuilder.Build(&text, part, OE_BUILD_STRICT, 1);
  if (allocFailed) g_allocFailed = 1;
  if (status != OE_BUILD_OK) {
    builder->SetObjectInError(partBuilder.GetObjectInError() ? partBuilder.GetObjectInError() : part);
    return status;
  }

  char size[24];
  snprintf(size, sizeof size, "%lu", static_cast<unsigned long>(text.GetBufferSize()));
  OEString name("content-length");
  if (part->HandleHeader(OE_HEADER_UNKNOWN, OEString(size), &name) != OE_PARSE_OK) return OE_BUILD_NO_MEMORY;
  OETagID type = part->GetType();
  if (type == OE_TAG_OFXFILERQ || type == OE_TAG_OFXFILERS) {
    name = "content-type";
    if (part->HandleHeader(OE_HEADER_UNKNOWN, OEString(kOFXContentType), &name) != OE_PARSE_OK)
      return OE_BUILD_NO_MEMORY;
  }

  status = part->BuildHeaders(builder);
  if (status != OE_BUILD_OK || text.GetBufferSize() == 0) return status;
  return builder->AddBuffer(&text);
}

OEBuildStatus OEFile::Build(OEBuilder* builder) const {
  if (!builder) return OE_BUILD_NO_OUTPUT;
  OEBuildStatus status = OE_BUILD_OK;
  if (!m_parent) {
    status = BuildHeaders(builder);
    if (status != OE_BUILD_OK) return status;
  }

  OEString delimiter;
  if (!m_boundary.IsEmpty()) {
    delimiter = "--";
    delimiter += m_boundary.c_str();
  }
  for (unsigned short i = 0; i < m_subfiles.Entries(); ++i) {
    OEFile* part = m_subfiles.Get(i);
    if (!part) return OE_BUILD_NO_OUTPUT;
    if (!delimiter.IsEmpty()) {
      status = builder->AddString(delimiter, OE_MACRO_NONE, 1);
      if (status != OE_BUILD_OK) return status;
    }
    status = BuildPart(builder, part);
    if (status != OE_BUILD_OK) return status;
  }

  if (!m_mimeBody.IsEmpty()) {
    status = builder->AddString(m_mimeBody, OE_MACRO_NONE, 1);
    if (status != OE_BUILD_OK) return status;
  }
  if (!delimiter.IsEmpty()) {
    delimiter += "--";
    status = builder->AddString(delimiter, OE_MACRO_NONE, 1);
  }
  return status;
}

unsigned short OEFile::DeepCopyFrom(const OEFile* from) {
  if (!from) return 0;
  if (from == this) return 1;
  OEDataObjFactory* factory = GetFactory();
  if (!factory) return 0;

  m_boundary = from->m_boundary;
  m_mimeBody = from->m_mimeBody;

  m_mimeHeaders.DeleteAll();
  m_mimeIndex.clear();
  m_mimeIndexed = 0;
  for (unsigned short i = 0; i < from->m_mimeHeaders.Entries(); ++i) {
    const OEMIMEHeader* header = from->m_mimeHeaders.Get(i);
    if (header && !SetMIMEHeader(header->GetName(), header->GetValue())) return 0;
  }

  m_subfiles.DeleteAll();
  for (unsigned short i = 0; i < from->m_subfiles.Entries(); ++i) {
    const OEFile* part = from->m_subfiles.Get(i);
    if (!part) continue;
    OEFile* copy = AppendMade(m_subfiles, MakePartLike(factory, part->GetType()));
    if (!copy) return 0;
    copy->SetParent(this);
    if (!copy->CopyPartFrom(part)) return 0;
  }

  for (int i = 0; i < kHeaderCount; ++i) {
    m_headers[i] = from->m_headers[i];
    if (m_headers[i].GetStrLength() != from->m_headers[i].GetStrLength()) {
      g_allocFailed = 1;
      return 0;
    }
  }
  return CopyBaseMembersFrom(from);
}

// ---------------------------------------------------------------------------
// OEFileOFX

namespace {
const OETagID kFileTags[] = {OE_TAG_OFX};
}

unsigned short OEFileOFX::GetArrayOfValidTags(OEArrayOfTags& tags) const {
  tags.tags = kFileTags;
  tags.count = 1;
  return 1;
}

unsigned short OEFileOFX::GetArrayOfRequiredTags(OEArrayOfTags& tags) const { return GetArrayOfValidTags(tags); }

unsigned short OEFileOFX::AllRequiredPresent() {
  if (!ValidateHeader(OE_HEADER_OFXHEADER)) return 0;
  return OEDataObj::AllRequiredPresent();
}

OEBuildStatus OEFileOFX::BuildHeaders(OEBuilder* builder) const {
  if (!builder) return OE_BUILD_NO_OUTPUT;
  if (GetNumberMIMEHeaders() > 0) {
    OEBuildStatus status = builder->AddBlankLine();
    if (status != OE_BUILD_OK) return status;
  }
  for (int t = OE_HEADER_OFXHEADER; t <= OE_HEADER_NEWFILEUID; ++t) {
    OEHeaderTag tag = static_cast<OEHeaderTag>(t);
    const OEString* value = GetHeader(tag);
    OEBuildStatus status = builder->AddHeader(tag, value ? *value : DefaultValue(t));
    if (status != OE_BUILD_OK) return status;
  }
  return builder->AddBlankLine();
}

unsigned short OEFileOFX::ValidateHeaders() const { return CheckHeaders(false); }

unsigned short OEFileOFX::ValidateHeadersTolerantly() const { return CheckHeaders(true); }

unsigned short OEFileOFX::CheckHeaders(bool tolerant) const {
  unsigned short result = 1;
  OEDataObj* self = const_cast<OEFileOFX*>(this);
  for (int t = OE_HEADER_OFXHEADER; t <= OE_HEADER_NEWFILEUID; ++t) {
    OEHeaderTag tag = static_cast<OEHeaderTag>(t);
    const HeaderRule& rule = RuleFor(t);
    const OEString* value = GetHeader(tag);
    if (!value) {
      OELogWarning(OEPW_MISSINGTAG, OEString(), OEString(OEDataConversion::Text(tag)), GetType(), self);
      continue;
    }
    if (rule.check == kUnchecked || Accepted(rule, *value)) continue;
    OELogWarning(OEPW_BADFORMAT, *value, OEString(OEDataConversion::Text(tag)), GetType(), self);
    const bool tolerated = tolerant && tag == OE_HEADER_ENCODING &&
                           (value->strcmpi("UTF-8") || value->strcmpi("UTF8") || value->strcmpi("UNICODE"));
    if (rule.check == kFatal && !tolerated) result = 0;
  }
  return result;
}

// ---------------------------------------------------------------------------
// OEFileRq and OEFileRs

template <class Item, class Array, OETagID FileType>
OEParseStatus OEFileOFXItems<Item, Array, FileType>::HandleTagStart(const OETagDictionaryEntry* const entry) {
  if (!GetParser() || !GetFactory()) return OE_PARSE_NO_PARSER;
  if (!entry || entry->id != OE_TAG_OFX) return OE_PARSE_OK;
  Item* item = AppendMade(m_items, OEArrayElementTraits<Item>::New());
  return item ? PushAndSetObject(item, OE_TAG_OFX) : OE_PARSE_NO_PARSER;
}

template <class Item, class Array, OETagID FileType>
OEParseStatus OEFileOFXItems<Item, Array, FileType>::HandleTagElement(const OETagDictionaryEntry* const entry,
                                                                        const OEString& value) {
  OELogWarning(OEPW_INVALIDELEM, value, OEString(entry ? entry->name : nullptr), entry ? entry->id : OE_TAG_NONE,
               this);
  return OE_PARSE_NOT_HANDLED;
}

template <class Item, class Array, OETagID FileType>
OEBuildStatus OEFileOFXItems<Item, Array, FileType>::Build(OEBuilder* builder) const {
  OEBuildStatus status = OEFile::Build(builder);
  for (unsigned short i = 0; status == OE_BUILD_OK && i < m_items.Entries(); ++i) {
    const Item* item = m_items.Get(i);
    status = item ? item->BuildObject(builder, OE_TAG_NONE) : OE_BUILD_NO_OUTPUT;
  }
  return status;
}

template <class Item, class Array, OETagID FileType>
unsigned short OEFileOFXItems<Item, Array, FileType>::SetItem(unsigned short index, Item* item) {
  if (!m_items.Set(index, item)) return 0;
  SetTag(OE_TAG_OFX);
  return 1;
}

template <class Item, class Array, OETagID FileType>
unsigned short OEFileOFXItems<Item, Array, FileType>::CopyItemsFrom(const OEFileOFXItems* from) {
  if (!from) return 0;
  if (from == this) return 1;
  if (!OEFile::DeepCopyFrom(from)) return 0;
  m_items.DeleteAll();
  for (unsigned short i = 0; i < from->m_items.Entries(); ++i) {
    const Item* source = from->m_items.Get(i);
    if (!source) continue;
    Item* copy = AppendMade(m_items, OEArrayElementTraits<Item>::New());
    if (!copy || !copy->DeepCopyFrom(source)) return 0;
  }
  return 1;
}

template <class Item, class Array, OETagID FileType>
unsigned short OEFileOFXItems<Item, Array, FileType>::CopyPartFrom(const OEFile* from) {
  const OEFileOFXItems* same = dynamic_cast<const OEFileOFXItems*>(from);
  return same ? CopyItemsFrom(same) : OEFile::DeepCopyFrom(from);
}

template class OEFileOFXItems<OERequest, OEDynamicArrayRequest, OE_TAG_OFXFILERQ>;
template class OEFileOFXItems<OEResponse, OEDynamicArrayResponse, OE_TAG_OFXFILERS>;
