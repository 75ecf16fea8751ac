// Transaction wrappers ("...TRNRQ", "...TRNRS") and synchronisation wrappers
// ("...SYNCRQ", "...SYNCRS"). One class serves every wrapper of a kind: the
// wrapper tag is the object's type and decides which inner aggregates,
// accounts and wrappers it takes.
#pragma once

#include "ofxkit/envelope/OEStatus.h"
#include "ofxkit/envelope/OETransBase.h"
#include "ofxkit/messages/bank/OEAccount.h"

// The inner aggregate of a wrapper is made for the tag it stands under.
template <>
struct OEChildCreator<OETransBase> {
  static OETransBase* Make(OEDataObjFactory* f, OETagID tag) { return OENewInnerTrans(f, tag); }
};

// What every wrapper shares: the record of the message set that holds it,
// written by the message set (or sync) that stores the wrapper.
class OEWrapperAggregate : public OEEnvelopeAggregate {
 public:
  OETagID MessageSetTag() const override { return m_msgsTag; }
  void SetMessageSetTag(OETagID tag) override { m_msgsTag = tag; }

 private:
  OETagID m_msgsTag = OE_TAG_NONE;
};

#define OE_TRANSRQ_FIELDS(X)                            \
  X(TEXT, TransUserID, TRNUID, OEString36)              \
  X(TEXT, ClientCookie, CLTCOOKIE, OEString32)          \
  X(TEXT, TAN, TAN, OEString80)                         \
  X(INNER, ActualTrans, NONE, OETransBase)

class OETransRq : public OEWrapperAggregate {
  OE_AGGREGATE_BY_TYPE(OETransRq, OE_TRANSRQ_FIELDS)

  OETagID GetMsgsRqTag() const { return MessageSetTag(); }
  void SetMsgsRqTag(OETagID tag) { SetMessageSetTag(tag); }

  // The request wrapper for an inner request tag ("STMTRQ" gives
  // "STMTTRNRQ"); 0 for a tag that no wrapper offers to applications.
  static OETagID MsgIDToTranWrapper(OETagID inner);

  // An inner request held, TRNUID, and the wrapper's inner tag.
  unsigned short AllRequiredPresent() override;
  // Every position answers the inner request.
  OEDataObj* GetChild(unsigned short) const override { return GetActualTrans(); }
};

#define OE_TRANSRS_FIELDS(X)                            \
  X(TEXT, TransUserID, TRNUID, OEString36)              \
  X(TEXT, ClientCookie, CLTCOOKIE, OEString32)          \
  X(CHILD, Status, STATUS, OEStatus)                    \
  X(INNER, ActualTrans, NONE, OETransBase)

class OETransRs : public OEWrapperAggregate {
  OE_AGGREGATE_BY_TYPE(OETransRs, OE_TRANSRS_FIELDS)

  OETagID GetMsgsRsTag() const { return MessageSetTag(); }
  void SetMsgsRsTag(OETagID tag) { SetMessageSetTag(tag); }

  // A status held, TRNUID, and the inner response unless the status
  // releases it (an error, or "up to date" for the wrappers that allow it).
  unsigned short AllRequiredPresent() override;
  // Position 0 is the inner response when there is one, the next the status.
  OEDataObj* GetChild(unsigned short index) const override;
  unsigned short GetNumberOfChildren() const override;

 protected:
  // The status says ERROR.
  bool IsErrorStatus() const;
  // The status has code 1 (the client is up to date).
  bool IsUpToDate() const;
};

// What the sync request and response share (Sync is the class itself).
template <class Sync>
class OESyncWrapper : public OEWrapperAggregate {
 public:
  virtual unsigned short SetFactory(OEDataObjFactory* factory) { return OEDataObj::SetFactory(factory); }
  // Also tells every wrapper held.
  void SetMessageSetTag(OETagID tag) override {
    OEWrapperAggregate::SetMessageSetTag(tag);
    const Sync& self = static_cast<const Sync&>(*this);
    for (unsigned short i = 0; i < self.GetNumTrans(); ++i)
      if (auto* wrapper = self.GetTrans(i)) wrapper->SetMessageSetTag(tag);
  }
  // Position 0 is the account (possibly null), then the wrappers.
  OEDataObj* GetChild(unsigned short index) const override {
    const Sync& self = static_cast<const Sync&>(*this);
    if (index == 0) return self.GetAccount();
    return self.GetTrans(static_cast<unsigned short>(index - 1));
  }
  unsigned short GetNumberOfChildren() const override {
    return static_cast<unsigned short>(static_cast<const Sync&>(*this).GetNumTrans() + 1);
  }
};

#define OE_SYNCRQ_FIELDS(X)                                    \
  X(TEXT, Token, TOKEN, OEString10)                            \
  X(FLAG, TokenOnly, TOKENONLY, unsigned short)                \
  X(FLAG, Refresh, REFRESH, unsigned short)                    \
  X(FLAG, RejectIfMissing, REJECTIFMISSING, unsigned short)    \
  X(FLAG, VexaRefresh, VEXA_REFRESH, unsigned short)           \
  X(FLAG, IncludeImages, INCIMAGES, unsigned short)            \
  X(FLAG, UseHTML, USEHTML, unsigned short)                    \
  X(CHILD, Account, BANKACCTFROM, OEAccount)                   \
  X(ALSO, Account, CCACCTFROM, OEAccount)                      \
  X(ALSO, Account, INVACCTFROM, OEAccount)                     \
  X(WRAPPERS, Trans, NONE, OETransRq)

class OESyncRq : public OESyncWrapper<OESyncRq> {
  OE_AGGREGATE_BY_TYPE(OESyncRq, OE_SYNCRQ_FIELDS)

  OETagID GetMsgsRqTag() const { return MessageSetTag(); }
  void SetMsgsRqTag(OETagID tag) { SetMessageSetTag(tag); }

  // The sync request for an inner request tag ("INTRARQ" gives
  // "INTRASYNCRQ"); 0 for any other tag.
  static OETagID MsgIDToSyncWrapper(OETagID inner);

  unsigned short AllRequiredPresent() override;
};

#define OE_SYNCRS_FIELDS(X)                                    \
  X(TEXT, Token, TOKEN, OEString10)                            \
  X(FLAG, LostSync, LOSTSYNC, unsigned short)                  \
  X(FLAG, VexaRefresh, VEXA_REFRESH, unsigned short)           \
  X(TRAITS, VexaSyncError, VEXA_SYNCERROR, OEStatusCodeTraits) \
  X(CHILD, Account, BANKACCTFROM, OEAccount)                   \
  X(ALSO, Account, CCACCTFROM, OEAccount)                      \
  X(ALSO, Account, INVACCTFROM, OEAccount)                     \
  X(WRAPPERS, Trans, NONE, OETransRs)

class OESyncRs : public OESyncWrapper<OESyncRs> {
  OE_AGGREGATE_BY_TYPE(OESyncRs, OE_SYNCRS_FIELDS)

  OETagID GetMsgsRsTag() const { return MessageSetTag(); }
  void SetMsgsRsTag(OETagID tag) { SetMessageSetTag(tag); }

  unsigned short AllRequiredPresent() override;
};
