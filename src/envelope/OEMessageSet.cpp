#include "ofxkit/envelope/OEMessageSet.h"

#include "ofxkit/payroll/OEPayrollMessages.h"

#include <algorithm>
#include <new>
#include <type_traits>


namespace {
enum Side { kRq = 0, kRs = 1 };

// What a message set must hold.
enum SetRule : uint8_t {
  kTransOrSync,  // at least one transaction or sync wrapper
  kAnyValid,     // at least one of its valid children
  kFirstChild,   // its first valid child (the sign-on, the profile wrapper)
  kSecList,      // request: a SECLISTTRNRQ; response: the list or a transaction
};

struct SetRow {
  OETagID set[2];  // request, response
  SetRule rule;
  OETagID valid[2][10];
  OETagID order[2][10];  // write order where it is not the valid order
  OETagID profile;       // the profile's message-set tag ...
  OETagID inner[13];     // ... of these inner tags
};

#define OE_SET(STEM, RULE, RQ_VALID, RS_VALID, RQ_ORDER, RS_ORDER, PROFILE, INNER)                              \
  {{OE_TAG_##STEM##MSGSRQV1, OE_TAG_##STEM##MSGSRSV1}, RULE, {RQ_VALID, RS_VALID}, {RQ_ORDER, RS_ORDER}, PROFILE, \
   INNER}
const SetRow kSets[] = {
    OE_SET(SIGNON, kFirstChild, OE_TAGS(SONRQ, PINCHTRNRQ, CHALLENGETRNRQ), OE_TAGS(SONRS, PINCHTRNRS, CHALLENGETRNRS),
           OE_NO_TAGS, OE_NO_TAGS, OE_TAG_SIGNONMSGSET, OE_TAGS(SONRQ, CHALLENGERQ)),
    OE_SET(SIGNUP, kAnyValid,
           OE_TAGS(ENROLLTRNRQ, ACCTINFOTRNRQ, CHGUSERINFOTRNRQ, CHGUSERINFOSYNCRQ, ACCTTRNRQ, ACCTSYNCRQ),
           OE_TAGS(ACCTSYNCRS, ENROLLTRNRS, ACCTINFOTRNRS, ACCTTRNRS, CHGUSERINFOTRNRS, CHGUSERINFOSYNCRS), OE_NO_TAGS,
           OE_TAGS(ENROLLTRNRS, ACCTINFOTRNRS, CHGUSERINFOTRNRS, CHGUSERINFOSYNCRS, ACCTTRNRS, ACCTSYNCRS),
           OE_TAG_SIGNUPMSGSET, OE_TAGS(ACCTINFORQ, ACCTSYNCRQ)),
    OE_SET(BANK, kAnyValid,
           OE_TAGS(STMTTRNRQ, STMTENDTRNRQ, INTRATRNRQ, RECINTRATRNRQ, STPCHKTRNRQ, BANKMAILTRNRQ, BANKMAILSYNCRQ,
                   STPCHKSYNCRQ, INTRASYNCRQ, RECINTRASYNCRQ),
           OE_TAGS(BANKMAILSYNCRS, BANKMAILTRNRS, STMTTRNRS, STMTENDTRNRS, INTRATRNRS, RECINTRATRNRS, INTRASYNCRS,
                   RECINTRASYNCRS, STPCHKTRNRS, STPCHKSYNCRS),
           OE_NO_TAGS,
           OE_TAGS(STMTTRNRS, STMTENDTRNRS, INTRATRNRS, RECINTRATRNRS, STPCHKTRNRS, BANKMAILTRNRS, BANKMAILSYNCRS,
                   STPCHKSYNCRS, INTRASYNCRS, RECINTRASYNCRS),
           OE_TAG_BANKMSGSET,
           OE_TAGS(STMTRQ, STMTENDRQ, STPCHKRQ, BANKMAILRQ, BANKMAILSYNCRQ, INTRARQ, INTRAMODRQ, INTRACANRQ,
                   INTRASYNCRQ, RECINTRARQ, RECINTRAMODRQ, RECINTRACANRQ, RECINTRASYNCRQ)),
    OE_SET(CREDITCARD, kAnyValid, OE_TAGS(CCSTMTTRNRQ, CCSTMTENDTRNRQ), OE_TAGS(CCSTMTTRNRS, CCSTMTENDTRNRS),
           OE_NO_TAGS, OE_NO_TAGS, OE_TAG_CREDITCARDMSGSET, OE_TAGS(CCSTMTRQ, CCSTMTENDRQ)),
    OE_SET(INVSTMT, kAnyValid, OE_TAGS(INVSTMTTRNRQ, INVMAILSYNCRQ, INVMAILTRNRQ),
           OE_TAGS(INVSTMTTRNRS, INVMAILSYNCRS, INVMAILTRNRS), OE_TAGS(INVSTMTTRNRQ, INVMAILTRNRQ, INVMAILSYNCRQ),
           OE_TAGS(INVSTMTTRNRS, INVMAILTRNRS, INVMAILSYNCRS), OE_TAG_INVSTMTMSGSET,
           OE_TAGS(INVSTMTRQ, INVMAILTRNRQ, INVMAILSYNCRQ)),
    OE_SET(SECLIST, kSecList, OE_TAGS(SECLISTTRNRQ), OE_TAGS(SECLISTTRNRS, SECLIST), OE_NO_TAGS, OE_NO_TAGS,
           OE_TAG_NONE, OE_NO_TAGS),
    OE_SET(INTERXFER, kAnyValid, OE_TAGS(INTERTRNRQ, RECINTERTRNRQ, INTERSYNCRQ, RECINTERSYNCRQ),
           OE_TAGS(INTERTRNRS, RECINTERTRNRS, INTERSYNCRS, RECINTERSYNCRS), OE_NO_TAGS, OE_NO_TAGS,
           OE_TAG_INTERXFERMSGSET,
           OE_TAGS(INTERRQ, INTERMODRQ, INTERCANRQ, INTERSYNCRQ, RECINTERRQ, RECINTERMODRQ, RECINTERCANRQ,
                   RECINTERSYNCRQ)),
    OE_SET(WIREXFER, kAnyValid, OE_TAGS(WIRETRNRQ, WIRESYNCRQ), OE_TAGS(WIRETRNRS, WIRESYNCRS), OE_NO_TAGS,
           OE_NO_TAGS, OE_TAG_WIREXFERMSGSET, OE_TAGS(WIRERQ, WIRECANRQ, WIRESYNCRQ)),
    OE_SET(BILLPAY, kTransOrSync,
           OE_TAGS(PAYEETRNRQ, PAYEESYNCRQ, PMTTRNRQ, RECPMTTRNRQ, PMTINQTRNRQ, PMTMAILTRNRQ, PMTSYNCRQ, RECPMTSYNCRQ,
                   PMTMAILSYNCRQ),
           OE_TAGS(PAYEETRNRS, PAYEESYNCRS, PMTTRNRS, RECPMTTRNRS, PMTINQTRNRS, PMTMAILTRNRS, PMTSYNCRS, RECPMTSYNCRS,
                   PMTMAILSYNCRS),
           OE_NO_TAGS, OE_NO_TAGS, OE_TAG_BILLPAYMSGSET,
           OE_TAGS(PAYEERQ, PAYEESYNCRQ, PMTRQ, PMTSYNCRQ, PMTINQRQ, PMTMAILRQ, PMTMAILSYNCRQ, RECPMTRQ, RECPMTSYNCRQ)),
    OE_SET(EMAIL, kAnyValid, OE_TAGS(MAILTRNRQ, MAILSYNCRQ, GETMIMETRNRQ), OE_TAGS(MAILTRNRS, MAILSYNCRS, GETMIMETRNRS),
           OE_NO_TAGS, OE_NO_TAGS, OE_TAG_EMAILMSGSET, OE_TAGS(MAILTRNRQ, MAILSYNCRQ)),
    OE_SET(PROF, kFirstChild, OE_TAGS(PROFTRNRQ), OE_TAGS(PROFTRNRS), OE_NO_TAGS, OE_NO_TAGS, OE_TAG_PROFMSGSET,
           OE_TAGS(PROFRQ)),
    OE_SET(VEXA_BRAND, kAnyValid, OE_TAGS(VEXA_BRANDTRNRQ, VEXA_MKTTIERTRNRQ),
           OE_TAGS(VEXA_BRANDTRNRS, VEXA_MKTTIERTRNRS), OE_NO_TAGS, OE_NO_TAGS, OE_TAG_NONE, OE_NO_TAGS),
    OE_SET(VEXA_CLOG, kAnyValid, OE_TAGS(VEXA_CLIENTLOGTRNRQ), OE_TAGS(VEXA_CLIENTLOGTRNRS), OE_NO_TAGS, OE_NO_TAGS,
           OE_TAG_NONE, OE_NO_TAGS),
    OE_SET(VEXA_SURVEY, kAnyValid, OE_TAGS(VEXA_SURVEYTRNRQ), OE_TAGS(VEXA_SURVEYTRNRS), OE_NO_TAGS, OE_NO_TAGS,
           OE_TAG_NONE, OE_NO_TAGS),
    OE_SET(VEXA_USLFI, kAnyValid, OE_TAGS(VEXA_FIUSAGELOGTRNRQ), OE_TAGS(VEXA_FIUSAGELOGTRNRS), OE_NO_TAGS,
           OE_NO_TAGS, OE_TAG_NONE, OE_NO_TAGS),
    OE_SET(VEXA_USLCU, kAnyValid, OE_TAGS(VEXA_CUUSAGELOGTRNRQ), OE_TAGS(VEXA_CUUSAGELOGTRNRS), OE_NO_TAGS,
           OE_NO_TAGS, OE_TAG_NONE, OE_NO_TAGS),
    OE_SET(V_PAYROLL, kTransOrSync, OE_TAGS(V_PAYROLLUPDATERQ, V_PAYROLLENROLLTRNRQ),
           OE_TAGS(V_PAYROLLUPDATERS, V_PAYROLLENROLLTRNRS), OE_NO_TAGS, OE_NO_TAGS, OE_TAG_V_PAYROLLMSGSET,
           OE_TAGS(V_PAYROLLENROLLTRNRQ, V_PAYROLLUPDATERQ)),
};
#undef OE_SET
constexpr int kSetCount = sizeof kSets / sizeof kSets[0];

// Every set writes the extension wrappers last, in this order.
const OETagID kExtensionOrder[2][8] = {
    {OE_TAG_VEXA_BRANDTRNRQ, OE_TAG_VEXA_MKTTIERTRNRQ, OE_TAG_VEXA_CLIENTLOGTRNRQ, OE_TAG_VEXA_SURVEYTRNRQ,
     OE_TAG_VEXA_FIUSAGELOGTRNRQ, OE_TAG_VEXA_CUUSAGELOGTRNRQ, OE_TAG_V_PAYROLLUPDATERQ, OE_TAG_V_PAYROLLENROLLTRNRQ},
    {OE_TAG_VEXA_BRANDTRNRS, OE_TAG_VEXA_MKTTIERTRNRS, OE_TAG_VEXA_CLIENTLOGTRNRS, OE_TAG_VEXA_SURVEYTRNRS,
     OE_TAG_VEXA_CUUSAGELOGTRNRS, OE_TAG_VEXA_FIUSAGELOGTRNRS, OE_TAG_V_PAYROLLUPDATERS, OE_TAG_V_PAYROLLENROLLTRNRS},
};

int SetRowOf(OETagID tag, Side side) { return OEFindRow(kSets, &SetRow::set, tag, side); }

// The payroll update response has its own class, with the payroll fields.
OEDataObj* NewPayrollUpdate(OEDataObjFactory* factory, OETagID) { return factory->NewPayrollUpdateRs(); }

template <class SyncClass>
OETypeDescription DescribeSet(const SetRow& row, Side side) {
  OETypeDescription d;
  d.type = row.set[side];
  for (OETagID tag : row.valid[side]) {
    if (tag == OE_TAG_NONE) break;
    d.valid.push_back(tag);
    if (tag == OE_TAG_SONRQ || tag == OE_TAG_SONRS || tag == OE_TAG_SECLIST) continue;  // fields of their own
    if (!SyncClass::TypeInfo(tag)) {
      d.aliases.push_back({tag, "Trans"});
      continue;
    }
    d.aliases.push_back({tag, "Sync", tag == OE_TAG_V_PAYROLLUPDATERS ? &NewPayrollUpdate : nullptr});
  }
  if (row.rule == kFirstChild) d.required.push_back(row.valid[side][0]);
  bool ownOrder = row.order[side][0] != OE_TAG_NONE;
  for (OETagID tag : ownOrder ? row.order[side] : row.valid[side])
    if (tag != OE_TAG_NONE) d.order.push_back(tag);
  for (OETagID tag : kExtensionOrder[side])
    if (std::find(d.order.begin(), d.order.end(), tag) == d.order.end()) d.order.push_back(tag);
  return d;
}

}  // namespace

OE_DEFINE_AGGREGATE(OEMessageSetRq, OEEnvelopeAggregate, OE_MESSAGESETRQ_FIELDS, NONE, )
OE_DEFINE_AGGREGATE(OEMessageSetRs, OEEnvelopeAggregate, OE_MESSAGESETRS_FIELDS, NONE, )

const OEAggregateInfo* OEMessageSetRq::TypeInfo(OETagID type) { return DescribeType(type); }
const OEAggregateInfo* OEMessageSetRs::TypeInfo(OETagID type) { return DescribeType(type); }

template <class Set, bool Response>
const OEAggregateInfo* OEMessageSetBase<Set, Response>::DescribeType(OETagID type) {
  static OETypeInfoCache cache(kSetCount);
  Side side = Response ? kRs : kRq;
  int row = SetRowOf(type, side);
  using Sync = std::conditional_t<Response, OESyncRs, OESyncRq>;
  return cache.Get(row, Set::ClassInfo(), [row, side] { return DescribeSet<Sync>(kSets[row], side); });
}

template <class Set, bool Response>
void OEMessageSetBase<Set, Response>::SetType(OETagID type) {
  OEDataObj::SetType(type);
  const Set& self = static_cast<const Set&>(*this);
  for (unsigned short i = 0; i < self.GetNumTrans(); ++i)
    if (auto* t = self.GetTrans(i)) t->SetMessageSetTag(type);
  for (unsigned short i = 0; i < self.GetNumSync(); ++i)
    if (auto* s = self.GetSync(i)) s->SetMessageSetTag(type);
}

template <class Set, bool Response>
OEBuildStatus OEMessageSetBase<Set, Response>::Build(OEBuilder* builder) const {
  return BuildChildrenByTag(builder, GetInfo().order, false);
}

template <class Set, bool Response>
unsigned short OEMessageSetBase<Set, Response>::AllRequiredPresent() {
  const Set& self = static_cast<const Set&>(*this);
  Side side = Response ? kRs : kRq;
  int index = SetRowOf(GetType(), side);
  bool anyWrapper = self.GetNumTrans() + self.GetNumSync() > 0;
  if (index < 0) return anyWrapper;
  const SetRow& row = kSets[index];
  switch (row.rule) {
    case kAnyValid:
      return AnyValidPresent();
    case kFirstChild:
      return ValidateTag(row.valid[side][0]);
    case kSecList:
      if (side == kRq) return ValidateTag(OE_TAG_SECLISTTRNRQ) && self.GetNumTrans() > 0;
      return ValidateTag(OE_TAG_SECLIST) || self.GetNumTrans() > 0;
    default:
      return anyWrapper;
  }
}

template <class Set, bool Response>
OEDataObj* OEMessageSetBase<Set, Response>::GetChild(unsigned short index) const {
  const Set& self = static_cast<const Set&>(*this);
  if (index == 0) return self.GetSignOnObject();
  unsigned short i = static_cast<unsigned short>(index - 1);
  if (i < self.GetNumTrans()) return self.GetTrans(i);
  return self.GetSync(static_cast<unsigned short>(i - self.GetNumTrans()));
}

template <class Set, bool Response>
unsigned short OEMessageSetBase<Set, Response>::GetNumberOfChildren() const {
  const Set& self = static_cast<const Set&>(*this);
  return static_cast<unsigned short>(self.GetNumTrans() + self.GetNumSync() + 1);
}

template class OEMessageSetBase<OEMessageSetRq, false>;
template class OEMessageSetBase<OEMessageSetRs, true>;

OETagID OEMessageSetRq::MsgIDToMsgSetID(OETagID inner) {
  if (inner == OE_TAG_NONE) return OE_TAG_NONE;
  for (const SetRow& row : kSets)
    for (OETagID tag : row.inner)
      if (tag == inner) return row.profile;
  return OE_TAG_NONE;
}
