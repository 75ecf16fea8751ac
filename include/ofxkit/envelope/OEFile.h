// OFX files: the roots of the object trees.
//
// An OFX file travels as an optional block of MIME header lines, the OFX
// header block ("OFXHEADER:100", "DATA:OFXSGML", ...), a blank line and one or
// more OFX aggregates; it may also be one part of a MIME multipart message.
//
//   OEFile     the MIME side: MIME header lines, boundary, body text, parts,
//              and the stored OFX header values.
//   OEFileOFX  adds the OFX header block with its defaults and its checks.
//   OEFileRq   a request file: one OERequest per OFX aggregate.
//   OEFileRs   a response file: one OEResponse per OFX aggregate.
//
// A file is filled by the application or by a parse (OESimpleParser hands it
// every header line through HandleHeader, asks ValidateHeaders before the
// body, and gives it each OFX aggregate through HandleTagStart), and it is
// written by OEBuilder::Build.
#pragma once

#include <string>
#include <unordered_map>

#include <type_traits>

#include "ofxkit/core/OEDataObj.h"
#include "ofxkit/core/OEDataObjFactory.h"
#include "ofxkit/envelope/OERequest.h"
#include "ofxkit/parse/OESimpleParser.h"
#include "ofxkit/types/OEDataConversion.h"
#include "ofxkit/types/OEDynamicArray.h"
#include "ofxkit/types/OEString.h"

// One MIME header line: "name: value".
class OEMIMEHeader {
 public:
  OEMIMEHeader() = default;
  OEMIMEHeader(const OEString& name, const OEString& value) : m_name(name), m_value(value) {}
  virtual ~OEMIMEHeader() = default;

  const OEString& GetName() const { return m_name; }
  const OEString& GetValue() const { return m_value; }
  unsigned short SetName(const OEString& name) {
    m_name = name;
    return 1;
  }
  unsigned short SetValue(const OEString& value) {
    m_value = value;
    return 1;
  }

 private:
  OEString m_name;
  OEString m_value;
};

class OEFile;

// Elements of the file arrays come from the installed object factory.
template <>
struct OEArrayElementTraits<OEMIMEHeader> {
  static OEMIMEHeader* New();
  static void Delete(OEMIMEHeader* p) { delete p; }
};
template <>
struct OEArrayElementTraits<OEFile> {
  static OEFile* New();
  static void Delete(OEFile* p);
};

class OEDynamicArrayMIMEHeader : public OEDynamicArrayTyped<OEMIMEHeader> {
 public:
  using OEDynamicArrayTyped<OEMIMEHeader>::OEDynamicArrayTyped;
};

class OEDynamicArraySubfile : public OEDynamicArrayTyped<OEFile> {
 public:
  using OEDynamicArrayTyped<OEFile>::OEDynamicArrayTyped;
};

class OEFile : public OEDataObj, public OEHeaderValidation {
 public:
  OEFile();
  OEFile(const OEFile&) = delete;
  OEFile& operator=(const OEFile&) = delete;
  ~OEFile() override;

  // --- Parsing -------------------------------------------------------------
  // A plain file takes no tags: both answer 1.
  OEParseStatus HandleTagStart(const OETagDictionaryEntry* const entry) override;
  using OEDataObj::HandleTagElement;
  OEParseStatus HandleTagElement(const OETagDictionaryEntry* const entry, const OEString& value) override;
  // One header line. OFX headers (tags OFXHEADER..NEWFILEUID) are stored;
  // anything else becomes a MIME header under its name (3 when the line has
  // no name or no header object can be had). An empty value is ignored.
  OEParseStatus HandleHeader(OEHeaderTag tag, const OEString& value, OEString* name) override;
  // Hook for a boundary line met while reading a multipart text; does nothing.
  virtual unsigned short HandleBoundary() { return 0; }

  // --- Writing -------------------------------------------------------------
  // The header block, then the parts between boundary lines, then the body
  // text and the closing boundary. A file with a parent writes no header
  // block of its own.
  OEBuildStatus Build(OEBuilder* builder) const override;
  // The MIME header lines ("name: value", CR LF); no blank line follows.
  virtual OEBuildStatus BuildHeaders(OEBuilder* builder) const;

  // --- Header values (OFXHEADER..NEWFILEUID) ---------------------------------
  // Stores a non-empty value for tags OFXHEADER..NEWFILEUID; 0 otherwise.
  unsigned short SetHeader(OEHeaderTag tag, const OEString& value);
  // The stored value, or null when the header was not given.
  const OEString* GetHeader(OEHeaderTag tag) const;
  // 1 when the header was given.
  virtual unsigned short ValidateHeader(OEHeaderTag tag) const;
  // A plain file accepts any header block: 1.
  unsigned short ValidateHeaders() const override;
  // Forgets every stored header value.
  void ClearHeaders();

  // --- MIME side ---------------------------------------------------------------
  unsigned short SetBoundary(const OEString& boundary) {
    m_boundary = boundary;
    return 1;
  }
  const OEString& GetBoundary() const { return m_boundary; }
  unsigned short SetMIMEBody(const OEString& body) {
    m_mimeBody = body;
    return 1;
  }
  const OEString& GetMIMEBody() const { return m_mimeBody; }

  unsigned short GetNumberMIMEHeaders() const { return m_mimeHeaders.Entries(); }
  const OEMIMEHeader* GetMIMEHeader(unsigned short index) const { return m_mimeHeaders.Get(index); }
  // Any other integer type (a literal 0 included) as an index.
  template <class Index, std::enable_if_t<std::is_integral<Index>::value, int> = 0>
  const OEMIMEHeader* GetMIMEHeader(Index index) const {
    if (static_cast<long long>(index) < 0 || static_cast<unsigned long long>(index) > 0xFFFF) return nullptr;
    return GetMIMEHeader(static_cast<unsigned short>(index));
  }
  // The first MIME header whose name equals name ignoring case, or null.
  const OEMIMEHeader* GetMIMEHeader(const char* name) const;
  const OEMIMEHeader* GetMIMEHeader(const OEString* name) const {
    return name ? GetMIMEHeader(name->c_str()) : nullptr;
  }
  // Sets the value of the MIME header of that name (ignoring case), adding it
  // at the end when there is none. 0 for an empty name or when memory fails.
  unsigned short SetMIMEHeader(const OEString& name, const OEString& value);

  // --- Parts ---------------------------------------------------------------
  // The file owns the parts given to it; neither setter sets the part's parent.
  unsigned short SetSubfile(unsigned short index, OEFile* part) { return m_subfiles.Set(index, part); }
  unsigned short AppendSubfile(OEFile* part) { return m_subfiles.Append(part); }
  OEFile* GetSubfile(unsigned short index) const { return m_subfiles.Get(index); }
  unsigned short GetNumberOfSubfiles() const { return m_subfiles.Entries(); }
  OEDataObj* GetChild(unsigned short index) const override;
  unsigned short GetNumberOfChildren() const override;

  // The file of which this one is a part (not owned); null when it stands alone.
  OEFile* GetParent() const { return m_parent; }
  void SetParent(OEFile* parent) { m_parent = parent; }

  // Installs the object factory for all data objects; 0 for null.
  virtual unsigned short SetFactory(OEDataObjFactory* factory) { return OEDataObj::SetFactory(factory); }

  // Makes this file a copy of from: MIME headers, boundary, body, parts
  // (each a new object of its kind whose parent is this file), header values
  // and base members. 0 when memory fails.
  unsigned short DeepCopyFrom(const OEFile* from);

 protected:
  // Makes this new part a copy of from with the DeepCopyFrom of this class,
  // so that request and response files are copied whole.
  virtual unsigned short CopyPartFrom(const OEFile* from) { return DeepCopyFrom(from); }

 private:
  static constexpr int kFirstHeader = OE_HEADER_OFXHEADER;
  static constexpr int kLastHeader = OE_HEADER_NEWFILEUID;
  static bool IsOFXHeader(OEHeaderTag tag) { return tag >= kFirstHeader && tag <= kLastHeader; }
  // Builds one part into its own text and records its MIME headers.
  OEBuildStatus BuildPart(OEBuilder* builder, OEFile* part) const;

  OEFile* m_parent;
  OEDynamicArrayMIMEHeader m_mimeHeaders;
  OEString m_boundary;
  OEString m_mimeBody;
  OEDynamicArraySubfile m_subfiles;
  // Values of OFXHEADER..NEWFILEUID; an empty string means not given.
  OEString m_headers[kLastHeader - kFirstHeader + 1];
  // MIME header positions by upper-cased name, so that a long header block
  // is read in linear time; the first m_mimeIndexed headers are in it.
  mutable std::unordered_map<std::string, unsigned short> m_mimeIndex;
  mutable unsigned short m_mimeIndexed = 0;
};

// A file with an OFX header block: writes it with defaults for the headers
// not given, and checks it while parsing.
class OEFileOFX : public OEFile {
 public:
  OEFileOFX() = default;

  unsigned short GetArrayOfValidTags(OEArrayOfTags& tags) const override;
  unsigned short GetArrayOfRequiredTags(OEArrayOfTags& tags) const override;
  // 0 when the OFXHEADER header was not given.
  unsigned short AllRequiredPresent() override;
  // A blank line when the file holds MIME headers, the nine OFX header lines
  // (stored values or defaults) and a blank line.
  OEBuildStatus BuildHeaders(OEBuilder* builder) const override;
  // Logs every missing or unexpected header; 0 only for an unknown DATA,
  // ENCODING or COMPRESSION value.
  unsigned short ValidateHeaders() const override;
  // Also accepts "ENCODING:UTF-8" and "ENCODING:UNICODE" (with the warning a
  // wrong value gets), which real servers send.
  unsigned short ValidateHeadersTolerantly() const override;
 private:
  unsigned short CheckHeaders(bool tolerant) const;
};

// What request and response files share: one Item per OFX aggregate of the
// text, in document order, written after the file's header block and parts.
template <class Item, class Array, OETagID FileType>
class OEFileOFXItems : public OEFileOFX {
 public:
  OEFileOFXItems() { SetType(FileType); }

  // The OFX start tag makes a new Item and makes it current; other tags are
  // accepted and ignored. 3 without a parser or when memory fails.
  OEParseStatus HandleTagStart(const OETagDictionaryEntry* const entry) override;
  // A file takes no elements: logs OEPW_INVALIDELEM and answers 4.
  using OEFile::HandleTagElement;
  OEParseStatus HandleTagElement(const OETagDictionaryEntry* const entry, const OEString& value) override;
  OEBuildStatus Build(OEBuilder* builder) const override;
  OEDataObj* GetChild(unsigned short index) const override { return m_items.Get(index); }
  unsigned short GetNumberOfChildren() const override { return m_items.Entries(); }

 protected:
  // The file owns the items given to it.
  unsigned short SetItem(unsigned short index, Item* item);
  Item* GetItem(unsigned short index) const { return m_items.Get(index); }
  unsigned short GetNumberOfItems() const { return m_items.Entries(); }
  unsigned short CopyItemsFrom(const OEFileOFXItems* from);
  unsigned short CopyPartFrom(const OEFile* from) override;

 private:
  Array m_items;
};

// Named accessors of the items: Set<Name>, Append<Name>, Get<Name>,
// GetNumberOf<Name>, and the deep copy from a file of the same class.
#define OE_FILE_ITEM_ACCESSORS(Class, Name, Item)                                                  \
 public:                                                                                           \
  unsigned short Set##Name(unsigned short index, Item* item) { return SetItem(index, item); }      \
  unsigned short Append##Name(Item* item) { return SetItem(GetNumberOfItems(), item); }            \
  Item* Get##Name(unsigned short index) const { return GetItem(index); }                           \
  unsigned short GetNumberOf##Name() const { return GetNumberOfItems(); }                          \
  using OEFile::DeepCopyFrom;                                                                      \
  unsigned short DeepCopyFrom(const Class* from) { return CopyItemsFrom(from); }

// A request file: its OFX aggregates are OERequest objects. Type OFXFILERQ.
class OEFileRq : public OEFileOFXItems<OERequest, OEDynamicArrayRequest, OE_TAG_OFXFILERQ> {
  OE_FILE_ITEM_ACCESSORS(OEFileRq, Request, OERequest)
};

// A response file: its OFX aggregates are OEResponse objects. Type OFXFILERS.
// Hand an empty one to OESimpleParser::Parse as the root.
class OEFileRs : public OEFileOFXItems<OEResponse, OEDynamicArrayResponse, OE_TAG_OFXFILERS> {
  OE_FILE_ITEM_ACCESSORS(OEFileRs, Response, OEResponse)
};

extern template class OEFileOFXItems<OERequest, OEDynamicArrayRequest, OE_TAG_OFXFILERQ>;
extern template class OEFileOFXItems<OEResponse, OEDynamicArrayResponse, OE_TAG_OFXFILERS>;
