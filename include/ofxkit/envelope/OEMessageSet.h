// Message sets ("SIGNONMSGSRQV1", "BANKMSGSRSV1", ...): one class for every
// request set and one for every response set, told apart by their type.
// The type decides which wrappers a set takes, in which order it writes
// them and what it must hold.
#pragma once

#include "ofxkit/envelope/OESignOn.h"
#include "ofxkit/envelope/OETransWrapper.h"
#include "ofxkit/messages/invest/OESecurities.h"

// What the request and response sets share (Set is the class itself,
// Response tells the side).
template <class Set, bool Response>
class OEMessageSetBase : public OEEnvelopeAggregate {
 public:
  virtual unsigned short SetFactory(OEDataObjFactory* factory) { return OEDataObj::SetFactory(factory); }

  OETagID MessageSetTag() const override { return GetType(); }
  // A new type is also recorded in every wrapper held.
  void SetType(OETagID type) override;
  // The sign-on (if any), then the wrappers grouped by tag in the set's
  // order, then the extension wrappers.
  OEBuildStatus Build(OEBuilder* builder) const override;
  // What the set's type requires: the sign-on, the profile wrapper, the
  // securities list, one of its valid children, or any wrapper.
  unsigned short AllRequiredPresent() override;
  // Position 0 is the sign-on (possibly null), then the transaction
  // wrappers, then the sync wrappers.
  OEDataObj* GetChild(unsigned short index) const override;
  unsigned short GetNumberOfChildren() const override;

 protected:
  // The description of a type of Set, made once.
  static const OEAggregateInfo* DescribeType(OETagID type);
};

#define OE_MESSAGESETRQ_FIELDS(X)                  \
  X(CHILD, SignOnRq, SONRQ, OESignOnRq)            \
  X(WRAPPERS, Trans, NONE, OETransRq)              \
  X(WRAPPERS, Sync, NONE, OESyncRq)

class OEMessageSetRq : public OEMessageSetBase<OEMessageSetRq, false> {
  OE_AGGREGATE_BY_TYPE(OEMessageSetRq, OE_MESSAGESETRQ_FIELDS)

  // Gives the sign-on request back to the caller, who owns it now.
  OESignOnRq* DisconnectSignOnRq() { return GetSignOnRq() ? OEDisconnectChild(this, FieldSignOnRq()) : nullptr; }
  OEDataObj* GetSignOnObject() const { return GetSignOnRq(); }

  // The profile's message-set tag ("BANKMSGSET", ...) for an inner request
  // tag; 0 for a tag that belongs to none.
  static OETagID MsgIDToMsgSetID(OETagID inner);
};

#define OE_MESSAGESETRS_FIELDS(X)                  \
  X(CHILD, SignOnRs, SONRS, OESignOnRs)            \
  X(WRAPPERS, Trans, NONE, OETransRs)              \
  X(WRAPPERS, Sync, NONE, OESyncRs)                \
  X(CHILD, SecList, SECLIST, OESecList)

class OEMessageSetRs : public OEMessageSetBase<OEMessageSetRs, true> {
  OE_AGGREGATE_BY_TYPE(OEMessageSetRs, OE_MESSAGESETRS_FIELDS)

  OESignOnRs* DisconnectSignOnRs() { return GetSignOnRs() ? OEDisconnectChild(this, FieldSignOnRs()) : nullptr; }
  OEDataObj* GetSignOnObject() const { return GetSignOnRs(); }
};

extern template class OEMessageSetBase<OEMessageSetRq, false>;
extern template class OEMessageSetBase<OEMessageSetRs, true>;
