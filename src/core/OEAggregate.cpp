#include "ofxkit/core/OEAggregate.h"

#include <algorithm>
#include <atomic>
#include <cstdlib>
#include <cstdio>
#include <cstring>

#include "ofxkit/parse/OEParseLogger.h"
#include "OEPool.h"

namespace {
// Entries a dynamic array can hold: its count is 16-bit.
constexpr unsigned kMaxListEntries = 0xFFFF;
}  // namespace

// Field store blocks: the least made (a first block until the class has
// learnt better, and any further one), and the largest (the pool's).
constexpr uint32_t kBlock = 64;
constexpr uint32_t kLargestBlock = 4096;

// ---------------------------------------------------------------------------

OEQuietConversion::OEQuietConversion() : m_wasEnabled(0), m_count(0) {
  if (OEParseLogger* log = OEParseLogger::TheOEParseLogger()) {
    m_wasEnabled = log->GetLoggingEnabled();
    m_count = log->GetReportCount();
    log->EnableLogging(0);
  }
}

OEQuietConversion::~OEQuietConversion() {
  if (OEParseLogger* log = OEParseLogger::TheOEParseLogger()) log->EnableLogging(m_wasEnabled);
}

bool OEQuietConversion::Faulted() const {
  OEParseLogger* log = OEParseLogger::TheOEParseLogger();
  return log && log->GetReportCount() != m_count;
}

OEParseWarning OEQuietConversion::Fault() const {
  OEParseLogger* log = OEParseLogger::TheOEParseLogger();
  return Faulted() ? log->GetLastReported() : OEPW_UNKNOWNEXCEPTION;
}

// ---------------------------------------------------------------------------

unsigned short OEValueText(const OEPrecisionInteger& value, OEString& out) {
  char text[OEPrecisionInteger::kTextSize + 1];
  if (!value.IsValid() || !value.FormatText(text)) return 0;
  out = text;
  return 1;
}
unsigned short OEValueText(const OEDateTime& value, OEString& out) { return value.GetDateString(out); }
unsigned short OEValueText(const OETime& value, OEString& out) { return value.GetTimeString(out); }
unsigned short OEValueText(const OELanguage& value, OEString& out) {
  return OEDataConversion::LanguageToString(value, out);
}
unsigned short OEValueText(int64_t value, OEString& out) {
  char text[24];
  snprintf(text, sizeof text, "%lld", static_cast<long long>(value));
  out = text;
  return 1;
}

// ---------------------------------------------------------------------------

OEAggregateInfo::OEAggregateInfo(const OEAggregateInfo* parentInfo, std::initializer_list<OEFieldDesc> ownFields,
                                 OETagID type)
    : parent(parentInfo), fields(ownFields), defaultType(type) {}

OEAggregateInfo& OEAggregateInfo::Valid(std::initializer_list<OETagID> tags) {
  valid.assign(tags);
  return *this;
}

OEAggregateInfo& OEAggregateInfo::Required(std::initializer_list<OETagID> tags) {
  required.assign(tags);
  return *this;
}

OEAggregateInfo& OEAggregateInfo::WriteOrder(std::initializer_list<OETagID> tags) {
  order.assign(tags);
  return *this;
}

OEAggregateInfo& OEAggregateInfo::OneOf(OETagID first, OETagID second) {
  oneOf.push_back(Pair{first, second});
  return *this;
}

OEAggregateInfo& OEAggregateInfo::ExactlyOneOf(std::initializer_list<OETagID> tags) {
  exactlyOne.emplace_back(tags);
  return *this;
}

OEAggregateInfo& OEAggregateInfo::Alternatives(std::initializer_list<OETagID> tags) {
  alternatives.emplace_back(tags);
  return *this;
}

OEAggregateInfo& OEAggregateInfo::Excludes(OETagID first, OETagID second) {
  excludes.push_back(Pair{first, second});
  return *this;
}

OEAggregateInfo& OEAggregateInfo::RequiresIf(OETagID present, OETagID needed) {
  requiresIf.push_back(Pair{present, needed});
  return *this;
}

const OEFieldDesc* OEAggregateInfo::FindField(OETagID tag) const {
  for (const OEAggregateInfo* info = this; info; info = info->parent)
    for (const OEFieldDesc& d : info->fields)
      if (d.tag == tag) return &d;
  return nullptr;
}

namespace {
bool SameMember(const OEFieldDesc* a, const OEFieldDesc* b) {
  return a->kind == b->kind && strcmp(static_cast<const char*>(a->member), static_cast<const char*>(b->member)) == 0;
}

bool Contains(const std::vector<const OEFieldDesc*>& list, const OEFieldDesc* d) {
  for (const OEFieldDesc* x : list)
    if (SameMember(x, d)) return true;
  return false;
}

bool IsChildKind(const OEFieldDesc* d) { return d->kind == OE_FIELD_CHILD || d->kind == OE_FIELD_LIST; }
}  // namespace

const OEAggregateInfo& OEAggregateInfo::Finish() {
  positionOf.clear();
  if (!valid.empty() && valid.size() < 255) {
    uint32_t low = *std::min_element(valid.begin(), valid.end());
    uint32_t high = *std::max_element(valid.begin(), valid.end());
    if (high - low < 4096) {
      firstTag = static_cast<OETagID>(low);
      positionOf.assign(high - low + 1, 0);
      for (size_t i = valid.size(); i-- > 0;) positionOf[valid[i] - low] = static_cast<uint8_t>(i + 1);
    }
  }
  byPosition.clear();
  for (OETagID tag : valid) byPosition.push_back(FindField(tag));

  const std::vector<OETagID>& writing = order.empty() ? valid : order;
  for (OETagID tag : writing) {
    const OEFieldDesc* d = FindField(tag);
    if (!d) continue;
    if (IsChildKind(d) && Contains(writeList, d)) continue;  // a child is written once, under its own type
    writeList.push_back(d);
    writeTags.push_back(tag);
  }
  for (const OEFieldDesc* d : byPosition)
    if (d && IsChildKind(d) && !Contains(children, d)) children.push_back(d);
  for (const OEAggregateInfo* info = this; info; info = info->parent)
    for (const OEFieldDesc& d : info->fields)
      if (!d.alias && !Contains(members, &d)) members.push_back(&d);
  // Members are stored under the keys of their names: two members of one
  // class under one key would share a value. That is a fault of the class's
  // description, found the first time the class is used.
  for (size_t i = 0; i < members.size(); ++i)
    for (size_t j = i + 1; j < members.size(); ++j)
      if (members[i]->key == members[j]->key) {
        fprintf(stderr, "ofxkit: members %s and %s of one aggregate share a key\n",
                static_cast<const char*>(members[i]->member), static_cast<const char*>(members[j]->member));
        abort();
      }
  return *this;
}

// ---------------------------------------------------------------------------

const OEAggregateInfo& OEAggregate::ClassInfo() {
  static OEAggregateInfo info(nullptr, {}, OE_TAG_NONE);
  static const OEAggregateInfo& finished = info.Finish();
  return finished;
}

namespace {
// A tag's presence-bit position from the class's table, or -1; `fallback`
// answers for a class whose valid tags lie too far apart for a table.
template <class Fallback>
inline int32_t PositionIn(const OEAggregateInfo& info, OETagID tag, Fallback fallback) {
  if (info.positionOf.empty()) return fallback();
  uint32_t k = static_cast<uint32_t>(tag) - static_cast<uint32_t>(info.firstTag);
  int32_t position = k < info.positionOf.size() ? static_cast<int32_t>(info.positionOf[k]) - 1 : -1;
  return position < OEDataObj::kMaxValidTags ? position : -1;
}
}  // namespace

int32_t OEAggregate::ValidTagPosition(OETagID tag) const {
  return PositionIn(GetInfo(), tag, [&] { return OEDataObj::ValidTagPosition(tag); });
}

const OEFieldDesc* OEAggregate::FieldAt(OETagID tag) const {
  // Straight from the class's own tables: one look at the description per
  // element a parse hands over.
  const OEAggregateInfo& info = GetInfo();
  int32_t position = PositionIn(info, tag, [&] { return OEDataObj::ValidTagPosition(tag); });
  if (position < 0) return nullptr;
  return static_cast<size_t>(position) < info.byPosition.size() ? info.byPosition[position] : nullptr;
}

unsigned short OEAggregate::GetArrayOfValidTags(OEArrayOfTags& tags) const {
  const OEAggregateInfo& info = GetInfo();
  tags.tags = info.valid.empty() ? nullptr : info.valid.data();
  tags.count = static_cast<unsigned short>(info.valid.size());
  return 1;
}

unsigned short OEAggregate::GetArrayOfRequiredTags(OEArrayOfTags& tags) const {
  const OEAggregateInfo& info = GetInfo();
  tags.tags = info.required.empty() ? nullptr : info.required.data();
  tags.count = static_cast<unsigned short>(info.required.size());
  return 1;
}

OEParseStatus OEAggregate::HandleTagElement(const OETagDictionaryEntry* const entry, const OEString& value) {
  if (!entry) return OE_PARSE_NOT_HANDLED;
  const OEFieldDesc* d = FieldAt(entry->id);
  if (!d || !d->setText) return OE_PARSE_NOT_HANDLED;
  d->setText(this, entry->id, value);  // the setter logs whatever did not fit
  return OE_PARSE_OK;
}

unsigned short OEAggregate::SetElementText(OETagID tag, const OEString& text) {
  const OEFieldDesc* d = FieldAt(tag);
  return (d && d->setText) ? d->setText(this, tag, text) : 0;
}

OEParseStatus OEAggregate::HandleTagEnd(const OETagDictionaryEntry* const entry) {
  OEParseStatus status = OEDataObj::HandleTagEnd(entry);
  if (status == OE_PARSE_OK && !m_fields.Empty()) {
    uint32_t needed = std::min<uint32_t>((m_fields.NeededBytes() + 7u) & ~7u, kLargestBlock);
    GetInfo().storeHint.Learn(static_cast<uint16_t>(needed));
  }
  return status;
}

OEParseStatus OEAggregate::HandleTagStart(const OETagDictionaryEntry* const entry) {
  if (!entry) return OE_PARSE_NOT_HANDLED;
  const OEFieldDesc* d = FieldAt(entry->id);
  if (!d || !d->create) return OE_PARSE_NOT_HANDLED;
  OEDataObjFactory* factory = GetFactory();
  if (!factory) return OE_PARSE_NO_PARSER;
  // A creator that runs out of memory has set g_allocFailed; one that knows
  // no class for the tag (an aggregate this build does not model) has not.
  OEDataObj* child = d->create(factory, entry->id);
  if (!child) return OE_PARSE_NO_PARSER;
  if (!d->put(this, child)) {
    delete child;
    // A list counts its entries in 16 bits: one more than it can hold ends
    // the parse here, with a warning that says so, rather than lose entries
    // quietly or wrap the count.
    if (d->kind == OE_FIELD_LIST && d->count && d->count(this) >= kMaxListEntries) {
      char count[16];
      snprintf(count, sizeof count, "%u", static_cast<unsigned>(kMaxListEntries) + 1u);
      LogFieldFault(OEPW_OUTOFRANGE, entry->id, OEString(count));
    }
    return OE_PARSE_NO_PARSER;
  }
  if (d->link) d->link(child, this, GetType());
  return PushAndSetObject(child, entry->id);
}

OEBuildStatus OEAggregate::Build(OEBuilder* builder) const {
  if (!builder) return OE_BUILD_NO_OUTPUT;
  const OEAggregateInfo& info = GetInfo();
  for (size_t i = 0; i < info.writeList.size(); ++i) {
    const OEFieldDesc* d = info.writeList[i];
    OETagID tag = info.writeTags[i];
    OEBuildStatus status = OE_BUILD_OK;
    if (d->write) {
      if (!ValidateTag(tag)) continue;
      status = d->write(builder, this, tag);
    } else {
      unsigned short n = d->count(this);
      for (unsigned short k = 0; k < n && status == OE_BUILD_OK; ++k)
        if (const OEDataObj* child = d->get(this, k)) status = child->BuildObject(builder, OE_TAG_NONE);
    }
    if (status != OE_BUILD_OK) {
      builder->SetObjectInError(const_cast<OEAggregate*>(this));
      return status;
    }
  }
  return OE_BUILD_OK;
}

unsigned short OEAggregate::AllRequiredPresent() {
  if (!OEDataObj::AllRequiredPresent()) return 0;
  const OEAggregateInfo& info = GetInfo();
  for (const OEAggregateInfo::Pair& pair : info.oneOf)
    if (ValidateTag(pair.first) && ValidateTag(pair.second)) return 0;
  for (const std::vector<OETagID>& choice : info.exactlyOne)
    if (PresentAmong(choice) != 1) return 0;
  for (const std::vector<OETagID>& choice : info.alternatives)
    if (PresentAmong(choice) != 1) return 0;
  for (const OEAggregateInfo::Pair& pair : info.excludes)
    if (ValidateTag(pair.first) && ValidateTag(pair.second)) return 0;
  for (const OEAggregateInfo::Pair& pair : info.requiresIf)
    if (ValidateTag(pair.first) && !ValidateTag(pair.second)) return 0;
  return 1;
}

unsigned short OEAggregate::PresentAmong(const std::vector<OETagID>& tags) const {
  unsigned short n = 0;
  for (OETagID tag : tags) n = static_cast<unsigned short>(n + (ValidateTag(tag) ? 1 : 0));
  return n;
}

// The missing tags are, in this order: the absent required tags; for each
// pair of which neither is present, the first of the pair; for each
// exactly-one choice with none present, its first tag; for each set of
// alternatives with none present, every alternative; for each tag that needs
// another, the other when it is absent. Each answer is the missing tag that
// follows `after` in that sequence (the first one when `after` is 0).
OETagID OEAggregate::GetFirstMissingRequiredTag(OETagID after) const {
  const OEAggregateInfo& info = GetInfo();
  std::vector<OETagID> missing;
  OEArrayOfTags required{nullptr, 0};
  if (GetArrayOfRequiredTags(required) && required.tags)
    for (unsigned short i = 0; i < required.count; ++i)
      if (!ValidateTag(required.tags[i])) missing.push_back(required.tags[i]);
  for (const OEAggregateInfo::Pair& pair : info.oneOf)
    if (!ValidateTag(pair.first) && !ValidateTag(pair.second)) missing.push_back(pair.first);
  for (const std::vector<OETagID>& choice : info.exactlyOne)
    if (!choice.empty() && PresentAmong(choice) == 0) missing.push_back(choice.front());
  for (const std::vector<OETagID>& choice : info.alternatives)
    if (PresentAmong(choice) == 0) missing.insert(missing.end(), choice.begin(), choice.end());
  for (const OEAggregateInfo::Pair& pair : info.requiresIf)
    if (ValidateTag(pair.first) && !ValidateTag(pair.second)) missing.push_back(pair.second);
  bool passed = after == OE_TAG_NONE;
  for (OETagID tag : missing) {
    if (passed) return tag;
    passed = tag == after;
  }
  return OE_TAG_NONE;
}

unsigned short OEAggregate::GetNumberOfChildren() const {
  unsigned int n = 0;
  for (const OEFieldDesc* d : GetInfo().children) n += d->count(this);
  return static_cast<unsigned short>(n > 0xFFFF ? 0xFFFF : n);
}

OEDataObj* OEAggregate::GetChild(unsigned short index) const {
  for (const OEFieldDesc* d : GetInfo().children) {
    unsigned short n = d->count(this);
    if (index < n) return d->get(this, index);
    index = static_cast<unsigned short>(index - n);
  }
  return nullptr;
}

unsigned short OEAggregate::CopyAggregateFrom(const OEAggregate* source) {
  if (!source) return 0;
  if (source == this) return 1;
  const OEAggregateInfo& info = GetInfo();
  if (&source->GetInfo() != &info) return 0;
  unsigned short result = 1;
  OEDataObjFactory* factory = nullptr;
  for (const OEFieldDesc* d : info.members) {
    if (d->copy) {
      d->copy(this, source);
      continue;
    }
    // Children: drop ours, then copy each of the source's deeply.
    if (d->kind == OE_FIELD_CHILD && d->get(this, 0)) ClearTagQuietly(d->get(this, 0)->GetType());
    d->reset(this);
    unsigned short n = d->count(source);
    for (unsigned short k = 0; k < n; ++k) {
      const OEAggregate* from = dynamic_cast<const OEAggregate*>(d->get(source, k));
      if (!from) continue;
      if (!factory && !(factory = GetFactory())) return 0;
      OEDataObj* made = d->create(factory, from->GetType());
      OEAggregate* copy = dynamic_cast<OEAggregate*>(made);
      if (!copy) {
        if (!made) g_allocFailed = 1;
        delete made;
        result = 0;
        continue;
      }
      // Linked before its own copy, so that its children link through it.
      if (d->link) d->link(copy, this, source->GetType());
      if (!copy->CopyAggregateFrom(from) || !d->put(this, copy)) {
        delete copy;
        result = 0;
      }
    }
  }
  CopyBaseMembersFrom(source);
  return result;
}

void OEOwnedAggregate::LinkToMaker(OEAggregate* maker, OETagID makerType) {
  const OEOwnedAggregate* inner = dynamic_cast<const OEOwnedAggregate*>(maker);
  if (inner && inner->m_owner) {
    m_owner = inner->m_owner;
    m_ownerTag = inner->m_ownerTag;
  } else {
    m_owner = maker;
    m_ownerTag = makerType;
  }
}

void OEAggregate::LogFieldFault(OEParseWarning warning, OETagID tag, const OEString& text) {
  OELogWarning(warning, text, OEString(), tag, this);
}

void OEAggregate::ClearTagQuietly(OETagID tag) {
  int32_t position = ValidTagPosition(tag);
  if (position >= 0) ClearPresenceBit(position);
}

namespace {
// Where the member with a key was last found, by the key's low byte: a tree
// holds many objects of few classes, and searching a class's members for
// every value it ends costs a mispredicted loop exit each time. A hint is
// only a guess, checked before it is used (keys within a class are
// distinct), so hints shared between classes, or written by another thread,
// can cost a search but never give a wrong member.
std::atomic<uint8_t> g_memberHint[256];

inline const OEFieldDesc* MemberOf(const OEAggregateInfo& info, uint16_t key) {
  const std::vector<const OEFieldDesc*>& members = info.members;
  std::atomic<uint8_t>& hint = g_memberHint[key & 0xFF];
  const size_t guess = hint.load(std::memory_order_relaxed);
  if (guess < members.size() && members[guess]->key == key) return members[guess];
  for (size_t i = 0; i < members.size(); ++i) {
    if (members[i]->key == key) {
      if (i <= 0xFF) hint.store(static_cast<uint8_t>(i), std::memory_order_relaxed);
      return members[i];
    }
  }
  return nullptr;
}
}  // namespace

void OEAggregate::DestroyFields(const OEAggregateInfo& info) {
  if (m_fields.Empty()) return;
  m_fields.ForEach([&info](uint16_t key, void* value) {
    if (const OEFieldDesc* d = MemberOf(info, key))
      if (d->destroy) d->destroy(value);
  });
  m_fields.Release();
}

// ---------------------------------------------------------------------------

void* OEFieldStore::Add(uint16_t key, uint32_t size, const OEStoreHint& hint) {
  if (void* place = TryAdd(key, size)) return place;
  size = (size + 7u) & ~7u;
  const uint32_t header = static_cast<uint32_t>(sizeof(Block) + (m_first ? sizeof(Block*) : 0));
  const uint32_t needed = header + static_cast<uint32_t>(sizeof(Entry)) + size;
  uint32_t bytes = std::max<uint32_t>(needed, kBlock);
  if (!m_first) bytes = std::max<uint32_t>(bytes, hint.bytes.load(std::memory_order_relaxed));
  bytes = (bytes + 7u) & ~7u;
  if (bytes > kLargestBlock) return nullptr;  // no value is this large
  Block* block = static_cast<Block*>(OEPoolTake(bytes));
  if (!block) return nullptr;
  block->bytes = static_cast<uint16_t>(bytes);
  block->count = 0;
  block->valuesStart = static_cast<uint16_t>(bytes);
  block->entriesStart = static_cast<uint16_t>(header);
  if (m_first) memcpy(reinterpret_cast<char*>(block) + sizeof(Block), &m_first, sizeof m_first);
  m_first = block;
  return TryAdd(key, size);
}

uint32_t OEFieldStore::NeededBytes() const {
  uint32_t needed = sizeof(Block);
  for (const Block* b = m_first; b; b = b->Next())
    needed += static_cast<uint32_t>(b->count * sizeof(Entry) + (b->bytes - b->valuesStart));
  return needed;
}

void OEFieldStore::Release() {
  for (Block* b = m_first; b;) {
    Block* next = b->Next();
    OEPoolGive(b, b->bytes);
    b = next;
  }
  m_first = nullptr;
}

unsigned short OESetTextField(OEAggregate* self, OEString& field, OETagID tag, const OEString& text) {
  field = text;
  if (field.IsNull()) return 3;
  if (field.ExceedsSpecLength()) {
    // A password's text never reaches the log.
    if (dynamic_cast<OEUserPassword*>(&field))
      self->LogFieldFault(OEPW_TOOLONG, tag, OEString("Password too long"));
    else
      self->LogFieldFault(OEPW_TOOLONG, tag, text);
  }
  return self->SetTag(tag);
}
