#include "ofxkit/envelope/OEEnvelopeAggregate.h"

#include <cstring>
#include <new>

unsigned short OEEnvelopeAggregate::CopyAggregateFrom(const OEAggregate* source) {
  if (!source) return 0;
  if (source == this) return 1;
  if (source->GetType() != GetType()) SetType(source->GetType());
  unsigned short result = OEAggregate::CopyAggregateFrom(source);
  // A wrapper also takes the source's record of the message set holding it.
  if (const OEEnvelopeAggregate* from = dynamic_cast<const OEEnvelopeAggregate*>(source))
    SetMessageSetTag(from->MessageSetTag());
  return result;
}

const OEAggregateInfo& OEEnvelopeAggregate::InfoForType(const OEAggregateInfo& classInfo,
                                                        TypeInfoLookup lookup) const {
  // The type can change behind our back (CopyBaseMembersFrom), so the cache
  // is keyed by the type it was made for.
  if (!m_info || m_infoType != GetType()) {
    const OEAggregateInfo* info = lookup(GetType());
    m_info = info ? info : &classInfo;
    m_infoType = GetType();
  }
  return *m_info;
}

const OEFieldDesc* OEEnvelopeAggregate::FieldFor(OETagID tag) const {
  int32_t position = ValidTagPosition(tag);
  const OEAggregateInfo& info = GetInfo();
  return (position >= 0 && static_cast<size_t>(position) < info.byPosition.size()) ? info.byPosition[position]
                                                                                    : nullptr;
}

OEBuildStatus OEEnvelopeAggregate::BuildChildrenByTag(OEBuilder* builder, const std::vector<OETagID>& order,
                                                      bool onePerTag) const {
  if (!builder) return OE_BUILD_NO_OUTPUT;
  for (OETagID tag : order) {
    const OEFieldDesc* d = FieldFor(tag);
    if (!d || !d->count) continue;
    unsigned short n = d->count(this);
    if (onePerTag) {
      unsigned short found = 0;
      for (unsigned short k = 0; k < n; ++k) {
        const OEDataObj* child = d->get(this, k);
        if (child && child->GetType() == tag && ++found > 1) {
          builder->SetObjectInError(const_cast<OEEnvelopeAggregate*>(this));
          return OE_BUILD_REPEATED_SET;
        }
      }
    }
    if (!ValidateTag(tag)) continue;
    for (unsigned short k = 0; k < n; ++k) {
      const OEDataObj* child = d->get(this, k);
      if (!child || child->GetType() != tag) continue;
      OEBuildStatus status = child->BuildObject(builder, OE_TAG_NONE);
      if (status != OE_BUILD_OK) {
        builder->SetObjectInError(const_cast<OEEnvelopeAggregate*>(this));
        return status;
      }
    }
  }
  return OE_BUILD_OK;
}

OEAggregateInfo* OEMakeTypeInfo(const OEAggregateInfo& classInfo, const OETypeDescription& description) {
  OEAggregateInfo* info = new (std::nothrow) OEAggregateInfo(&classInfo, {}, description.type);
  if (!info) {
    g_allocFailed = 1;
    return nullptr;
  }
  for (const OETypeAlias& alias : description.aliases) {
    for (const OEFieldDesc& field : classInfo.fields) {
      if (field.alias || strcmp(static_cast<const char*>(field.member), alias.member) != 0) continue;
      OEFieldDesc further = field;
      further.tag = alias.tag;
      further.alias = true;
      if (alias.create) further.create = alias.create;
      info->fields.push_back(further);
      break;
    }
  }
  info->valid = description.valid;
  info->required = description.required;
  info->order = description.order;
  info->Finish();
  return info;
}
