#include "ofxkit/audit/Audit.h"

#include <algorithm>
#include <cstring>
#include <new>
#include <utility>

#include "ofxkit/core/OEAggregate.h"
#include "ofxkit/core/OEDataObj.h"
#include "ofxkit/core/OETagDictionary.h"
#include "ofxkit/envelope/OEMessageSet.h"
#include "ofxkit/parse/OEParseEngine.h"
#include "ofxkit/types/OEBuffer.h"

namespace ofxkit {
namespace {

// Names rather than ids, so that a tag missing from the dictionary of a
// build is left out rather than breaking it.
const char* const kAuditedNames[] = {
    // The document, its message sets and wrappers.
    "OFX", "SIGNONMSGSRSV1", "SONRS", "BANKMSGSRSV1", "CREDITCARDMSGSRSV1", "INVSTMTMSGSRSV1",
    "SECLISTMSGSRSV1", "STMTTRNRS", "CCSTMTTRNRS", "INVSTMTTRNRS",
    // Statements, their lists and transactions, balances.
    "STMTRS", "CCSTMTRS", "INVSTMTRS", "STMTENDRS", "CCSTMTENDRS", "CLOSING", "CCCLOSING", "BANKTRANLIST",
    "STMTTRN", "LEDGERBAL", "AVAILBAL", "BALLIST", "BAL", "INVBAL",
    // Accounts.
    "BANKACCTFROM", "CCACCTFROM", "INVACCTFROM", "BANKACCTTO", "CCACCTTO", "ACCTINFO",
    // Investment transactions.
    "INVTRANLIST", "INVTRAN", "BUYDEBT", "BUYMF", "BUYOPT", "BUYOTHER", "BUYSTOCK", "CLOSUREOPT", "INCOME",
    "INVEXPENSE", "JRNLFUND", "JRNLSEC", "MARGININTEREST", "REINVEST", "RETOFCAP", "SELLDEBT", "SELLMF", "SELLOPT",
    "SELLOTHER", "SELLSTOCK", "SPLIT", "TRANSFER", "INVBANKTRAN",
    // Positions, open orders, securities.
    "INVPOSLIST", "INVPOS", "POSDEBT", "POSMF", "POSOPT", "POSOTHER", "POSSTOCK", "INVOOLIST", "OO", "OOBUYDEBT",
    "OOBUYMF", "OOBUYOPT", "OOBUYOTHER", "OOBUYSTOCK", "OOSELLDEBT", "OOSELLMF", "OOSELLOPT", "OOSELLOTHER",
    "OOSELLSTOCK", "SWITCHMF", "SECLIST", "SECINFO", "SECID", "DEBTINFO", "MFINFO", "OPTINFO", "OTHERINFO",
    "STOCKINFO"};

// Placed findings beyond this many of one kind and tag are only counted.
constexpr size_t kMaxFrames = 64;  // aggregates tracked open at once

inline char Upper(char c) { return (c >= 'a' && c <= 'z') ? static_cast<char>(c - 'a' + 'A') : c; }

bool SameName(const char* a, const char* b, size_t n) {
  for (size_t i = 0; i < n; ++i)
    if (Upper(a[i]) != Upper(b[i])) return false;
  return true;
}

std::string TagText(OETagID id) {
  OETagDictionary* dictionary = OETagDictionary::TheOETagDictionary();
  const char* name = dictionary && id ? dictionary->GetTagString(id) : nullptr;
  return name ? name : "?";
}

std::string Ordinal(uint32_t n) {
  const uint32_t mod100 = n % 100, mod10 = n % 10;
  const char* suffix = (mod100 >= 11 && mod100 <= 13) ? "th" : mod10 == 1 ? "st" : mod10 == 2 ? "nd" : mod10 == 3 ? "rd" : "th";
  return std::to_string(n) + suffix;
}

// The engine's item reader, without the tag lookups of a parse (which log).
class ItemReader : public OEParseEngine {
 public:
  explicit ItemReader(OEBuffer& buffer) : OEParseEngine(buffer) {}
  bool Next() { return GetOeTagItem() != 0; }
  const OETagItemInfo& Item() const { return CurrentItem(); }
  OeTagItemType Peek() { return NextTagType(); }
};

// What one class of the tree says of a child tag: the member it fills and
// whether that member holds one value or many.
struct ChildRule {
  OETagID tag;
  const void* member;
  bool single;
};

class Auditor {
 public:
  Auditor(const OEBuffer& text, const OEDataObj& root) : m_text(text), m_root(root) {}
  AuditReport Run();

 private:
  struct Frame {
    OETagID tag;
    int32_t nameStart;
    unsigned short nameLength;
    const std::vector<ChildRule>* rules;  // null: the tree has no object of its class
    std::vector<const void*> seen;        // single members given so far
  };
  struct Group {  // findings of one kind, tag and parent, gathered
    AuditKind kind;
    OETagID tag, parent;
    std::string name;  // of an unknown tag, as first written
    uint32_t count;
    int32_t position, until;
  };

  void WalkTree();
  void ScanText(OEBuffer& buffer);
  void StartTag(ItemReader& reader, OETagID id, const OEParseEngine::OETagItemInfo& item);
  void EndTag(const OEParseEngine::OETagItemInfo& item);
  void CheckTag(const OEParseEngine::OETagItemInfo& item, OETagID id);
  void CheckCData(const OEParseEngine::OETagItemInfo& item);
  void Note(AuditKind kind, OETagID tag, OETagID parent, int32_t position, int32_t until,
            const OEParseEngine::OETagItemInfo* item = nullptr);
  OETagID Lookup(const char* name, unsigned short length);
  uint32_t& Slot(std::vector<uint32_t>& counts, OETagID id) {
    if (id >= counts.size()) counts.resize(id + 1u, 0);
    return counts[id];
  }
  uint32_t CountOf(const std::vector<uint32_t>& counts, OETagID id) const {
    return id < counts.size() ? counts[id] : 0;
  }

  const OEBuffer& m_text;
  const OEDataObj& m_root;
  const char* m_data = nullptr;
  int32_t m_length = 0;
  OETagDictionary* m_dictionary = OETagDictionary::TheOETagDictionary();
  OETagNameCache m_names;
  std::vector<bool> m_audited;
  std::vector<uint32_t> m_inTree, m_inText;
  std::vector<int32_t> m_firstUnread;  // per tag: the start tag after as many as the tree holds
  std::vector<std::vector<ChildRule>> m_rules;  // per tag id: from the first aggregate of the tree
  std::vector<bool> m_hasRules;
  // The open aggregates are m_frames[0, m_depth); frames past the depth are
  // kept, with their storage, for the next aggregates opened.
  std::vector<Frame> m_frames;
  size_t m_depth = 0;
  size_t m_untracked = 0;  // aggregates open beyond kMaxFrames
  std::vector<Group> m_groups;
  AuditReport m_report;
};

OETagID Auditor::Lookup(const char* name, unsigned short length) {
  if (const OETagDictionaryEntry* entry = m_names.Find(name, length)) return entry->id;
  OETagID id = OE_TAG_NONE;
  if (!m_dictionary || !length) return id;
  if (const OETagDictionaryEntry* entry = m_dictionary->GetTagID(name, length, &id, OE_CASE_EXACT))
    m_names.Remember(entry, name, length);
  else
    m_dictionary->GetTagID(name, length, &id, OE_CASE_IGNORE);
  return id;
}

void Auditor::WalkTree() {
  // Depth first with one frame per open object, so the walk holds as many
  // frames as the tree is deep, not one entry per transaction of a list.
  struct Frame {
    const OEDataObj* obj;
    const OEDataObj* extra;  // visited after the children
    unsigned short next;
    unsigned short count;
  };
  std::vector<Frame> open;
  const OEDataObj* obj = &m_root;
  while (obj || !open.empty()) {
    if (!obj) {
      Frame& top = open.back();
      if (top.next < top.count) {
        obj = top.obj->GetChild(top.next++);
      } else {
        obj = top.extra;
        open.pop_back();
      }
      continue;
    }
    const OETagID type = obj->GetType();
    ++Slot(m_inTree, type);
    if (type >= m_hasRules.size()) {
      m_hasRules.resize(type + 1u, false);
      m_rules.resize(type + 1u);
    }
    const OEAggregate* aggregate = dynamic_cast<const OEAggregate*>(obj);
    if (aggregate && !m_hasRules[type]) {
      m_hasRules[type] = true;
      const OEAggregateInfo& info = aggregate->GetInfo();
      for (size_t i = 0; i < info.valid.size() && i < info.byPosition.size(); ++i) {
        const OEFieldDesc* field = info.byPosition[i];
        if (!field) continue;
        const bool single = field->kind == OE_FIELD_ELEMENT || field->kind == OE_FIELD_CHILD;
        m_rules[type].push_back({info.valid[i], field->member ? field->member : field, single});
      }
    }
    // A securities-list response set holds its list beside its wrappers.
    const OEDataObj* extra = nullptr;
    if (type == OE_TAG_SECLISTMSGSRSV1)
      if (const auto* set = dynamic_cast<const OEMessageSetRs*>(obj)) extra = set->GetSecList();
    open.push_back({obj, extra, 0, obj->GetNumberOfChildren()});
    obj = nullptr;
  }
}

void Auditor::Note(AuditKind kind, OETagID tag, OETagID parent, int32_t position, int32_t until,
                   const OEParseEngine::OETagItemInfo* item) {
  for (Group& g : m_groups) {
    if (g.kind == kind && g.tag == tag && g.parent == parent) {
      ++g.count;
      return;
    }
  }
  std::string name;
  if (item && tag == OE_TAG_NONE) {
    constexpr unsigned short kShown = 40;
    name.assign(m_data + item->start, std::min(item->length, kShown));
    for (char& c : name)
      if (static_cast<unsigned char>(c) < ' ' || static_cast<unsigned char>(c) >= 0x7F) c = '?';
  }
  m_groups.push_back({kind, tag, parent, std::move(name), 1, position, until});
}

// A tag whose text, between its name and the '>' that closes it, holds a '<'
// or a line end lacks its own '>': it has swallowed what follows.
void Auditor::CheckTag(const OEParseEngine::OETagItemInfo& item, OETagID id) {
  const int32_t from = item.start + item.length;
  const int32_t to = std::min(item.end, m_length);
  for (int32_t i = from; i < to; ++i) {
    const char c = m_data[i];
    if (c == '<' || c == '\n' || c == '\r') {
      Note(AuditKind::kBrokenTag, id, OE_TAG_NONE, item.start, item.end, &item);
      return;
    }
  }
}

// A CDATA section runs to the first "]...]>" however far it is; when its text
// holds OFX tags, it has swallowed them.
void Auditor::CheckCData(const OEParseEngine::OETagItemInfo& item) {
  const int32_t to = std::min(item.end, m_length);
  for (int32_t i = item.start + 2; i < to; ++i) {
    if (m_data[i] != '<') continue;
    int32_t p = i + 1;
    if (p < to && m_data[p] == '/') ++p;
    int32_t q = p;
    while (q < to && m_data[q] != '>' && m_data[q] != '<' && m_data[q] != ' ' && m_data[q] != '\n' &&
           m_data[q] != '\r' && m_data[q] != '\t')
      ++q;
    if (q < to && m_data[q] == '>' && q - p < 0xFFFF && Lookup(m_data + p, static_cast<unsigned short>(q - p))) {
      Note(AuditKind::kCDataOverTags, OE_TAG_NONE, OE_TAG_NONE, item.start, item.end);
      return;
    }
  }
}

void Auditor::StartTag(ItemReader& reader, OETagID id, const OEParseEngine::OETagItemInfo& item) {
  if (id < m_audited.size() && m_audited[id]) {
    const uint32_t seen = ++Slot(m_inText, id);
    if (seen == CountOf(m_inTree, id) + 1) {
      if (id >= m_firstUnread.size()) m_firstUnread.resize(id + 1u, -1);
      m_firstUnread[id] = item.start;
    }
  }
  // A child of the innermost open aggregate: a single member given again?
  if (m_depth && m_untracked == 0 && id != OE_TAG_NONE) {
    Frame& top = m_frames[m_depth - 1];
    if (top.rules) {
      for (const ChildRule& rule : *top.rules) {
        if (rule.tag != id) continue;
        if (rule.single) {
          if (std::find(top.seen.begin(), top.seen.end(), rule.member) != top.seen.end())
            Note(AuditKind::kReplaced, id, top.tag, item.start, -1);
          else
            top.seen.push_back(rule.member);
        }
        break;
      }
    }
  }
  const OEParseEngine::OeTagItemType next = reader.Peek();
  if (next == OEParseEngine::OEITEM_DATA || next == OEParseEngine::OEITEM_CDATA) return;  // an element
  if (m_depth >= kMaxFrames || m_untracked) {
    ++m_untracked;
    return;
  }
  const std::vector<ChildRule>* rules = id < m_hasRules.size() && m_hasRules[id] ? &m_rules[id] : nullptr;
  if (m_depth == m_frames.size()) m_frames.emplace_back();
  Frame& frame = m_frames[m_depth++];
  frame.tag = id;
  frame.nameStart = item.start;
  frame.nameLength = item.length;
  frame.rules = rules;
  frame.seen.clear();
}

// An end tag closes the innermost open aggregate of its name (and any left
// open inside it); an end tag that closes nothing (an element's) is passed.
void Auditor::EndTag(const OEParseEngine::OETagItemInfo& item) {
  if (m_untracked) {
    --m_untracked;
    return;
  }
  for (size_t k = m_depth; k > 0; --k) {
    const Frame& f = m_frames[k - 1];
    if (f.nameLength == item.length && SameName(m_data + f.nameStart, m_data + item.start, item.length)) {
      m_depth = k - 1;
      return;
    }
  }
}

void Auditor::ScanText(OEBuffer& buffer) {
  m_data = buffer.GetBufferPtr();
  m_length = m_data ? static_cast<int32_t>(std::min<uint32_t>(buffer.GetBufferSize(), INT32_MAX / 2)) : 0;
  ItemReader reader(buffer);
  while (reader.Next()) {
    const OEParseEngine::OETagItemInfo item = reader.Item();
    switch (item.type) {
      case OEParseEngine::OEITEM_STARTTAG:
      case OEParseEngine::OEITEM_ENDTAG: {
        ++m_report.tagsInText;
        const OETagID id = Lookup(m_data + item.start, item.length);
        CheckTag(item, id);
        if (item.type == OEParseEngine::OEITEM_STARTTAG)
          StartTag(reader, id, item);
        else
          EndTag(item);
        break;
      }
      case OEParseEngine::OEITEM_CDATA:
        CheckCData(item);
        break;
      default:
        break;
    }
  }
}

AuditReport Auditor::Run() {
  try {
    m_audited.assign(OE_TAG_COUNT_PLUS_ONE, false);
    for (const OETagID id : AuditedAggregates()) m_audited[id] = true;
    WalkTree();

    // The engine's text ends at the first NUL byte. Text after it, when there
    // is any, is audited too, with the NULs read as blanks.
    const char* data = m_text.GetBufferPtr();
    const uint32_t size = data ? m_text.GetBufferSize() : 0;
    const char* nul = size ? static_cast<const char*>(std::memchr(data, 0, size)) : nullptr;
    bool textAfterNul = false;
    if (nul) {
      for (const char* p = nul; p < data + size && !textAfterNul; ++p)
        textAfterNul = *p != 0 && *p != ' ' && *p != '\n' && *p != '\r' && *p != '\t';
    }
    if (textAfterNul) {
      OEBuffer copy(size + 1, 0);
      if (copy.WriteLarge(data, size) != OEBUF_OK) {
        m_report.complete = false;
        return m_report;
      }
      char* bytes = copy.GetBufferPtr();
      std::replace(bytes, bytes + size, '\0', ' ');
      const int32_t at = static_cast<int32_t>(nul - data);
      Note(AuditKind::kTextAfterNul, OE_TAG_NONE, OE_TAG_NONE, at, static_cast<int32_t>(size));
      ScanText(copy);
    } else {
      ScanText(const_cast<OEBuffer&>(m_text));  // the engine only reads
    }

    std::vector<AuditFinding>& out = m_report.findings;
    for (const Group& g : m_groups) {
      AuditFinding f;
      f.kind = g.kind;
      f.tag = g.tag;
      f.parent = g.parent;
      f.name = g.tag ? TagText(g.tag) : g.name;
      f.occurrences = g.count;
      f.position = g.position;
      f.until = g.until;
      out.push_back(f);
    }
    for (const OETagID id : AuditedAggregates()) {
      const uint32_t text = CountOf(m_inText, id), tree = CountOf(m_inTree, id);
      if (text == tree) continue;
      AuditFinding f;
      f.kind = text <= tree                      ? AuditKind::kSurplus
               : (id == OE_TAG_OFX && tree > 0) ? AuditKind::kOFXAfterEnd
                                                : AuditKind::kMissing;
      f.tag = id;
      f.name = TagText(id);
      f.inText = text;
      f.inTree = tree;
      if (text > tree && id < m_firstUnread.size()) f.position = m_firstUnread[id];
      out.push_back(f);
    }
    // In the order of the text; findings with no place last.
    std::stable_sort(out.begin(), out.end(), [](const AuditFinding& a, const AuditFinding& b) {
      return static_cast<uint32_t>(a.position) < static_cast<uint32_t>(b.position);
    });
  } catch (const std::bad_alloc&) {
    m_report.complete = false;
  }
  return std::move(m_report);
}

}  // namespace

const std::vector<OETagID>& AuditedAggregates() {
  static const std::vector<OETagID> tags = [] {
    std::vector<OETagID> ids;
    OETagDictionary* dictionary = OETagDictionary::TheOETagDictionary();
    for (const char* name : kAuditedNames) {
      OETagID id = OE_TAG_NONE;
      if (dictionary && dictionary->GetTagID(name, static_cast<unsigned short>(std::strlen(name)), &id, OE_CASE_EXACT) &&
          id != OE_TAG_NONE && id < OE_TAG_COUNT_PLUS_ONE)
        ids.push_back(id);
    }
    return ids;
  }();
  return tags;
}

AuditReport AuditParse(const OEBuffer& text, const OEDataObj& root) { return Auditor(text, root).Run(); }

bool AuditReport::HasLoss() const {
  if (!complete) return true;  // nothing can be vouched for
  for (const AuditFinding& f : findings)
    if (f.IsLoss()) return true;
  return false;
}

std::string AuditFinding::Describe() const {
  const std::string at = position >= 0 ? " at byte " + std::to_string(position) : std::string();
  const std::string times = occurrences > 1 ? " (" + std::to_string(occurrences) + " places, the first" + at + ")" : at;
  switch (kind) {
    case AuditKind::kMissing:
      return std::to_string(inText - inTree) + " of " + std::to_string(inText) + " " + name +
             " in the file were not read: the tree holds " + std::to_string(inTree) +
             (position >= 0 ? ", and the " + Ordinal(inTree + 1) + " in the file starts at byte " + std::to_string(position)
                            : std::string());
    case AuditKind::kSurplus:
      return "the tree holds " + std::to_string(inTree) + " " + name + " but the file has " + std::to_string(inText);
    case AuditKind::kReplaced:
      return name + " given more than once in one " + TagText(parent) + times + ": only the last was kept";
    case AuditKind::kBrokenTag:
      return "a " + name + " tag has no '>' of its own" + times + ": what follows it up to the next '>' was read as part of the tag";
    case AuditKind::kCDataOverTags:
      return "a CDATA section runs over OFX tags" + times + " up to byte " + std::to_string(until) +
             ": they were read as text";
    case AuditKind::kOFXAfterEnd:
      return std::to_string(inText - inTree) + " of " + std::to_string(inText) +
             " OFX aggregates in the file were not read: the first not read starts" + at +
             ", after the end of the last one read";
    case AuditKind::kTextAfterNul:
      return "the text stops at a NUL byte" + at + ": the " + std::to_string(until - position - 1) +
             " bytes after it were not read";
  }
  return "?";
}

}  // namespace ofxkit
