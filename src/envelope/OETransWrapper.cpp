#include "ofxkit/envelope/OETransWrapper.h"


namespace {
enum Side { kRq = 0, kRs = 1 };

// ---------------------------------------------------------------------------
// Transaction wrappers.

enum WrapperRule : uint16_t {
  kRqInnerOptional = 1,     // the request needs no particular inner tag
  kRsAnyInner = 2,          // any one of the inner responses (else exactly one)
  kRsUpToDateReleases = 4,  // code 1 ("up to date") releases the inner response
  kRsErrorKeepsInner = 8,   // an error status does not release it
  kRsInnerOptional = 16,    // the response needs no inner response
  kNoCookie = 32,           // no CLTCOOKIE (and no TAN)
  kNotOffered = 64,         // MsgIDToTranWrapper answers 0 for its inner request
};

struct WrapperRow {
  OETagID wrapper[2];   // request, response
  OETagID inner[2][3];  // the inner tags of each side, in valid order
  uint16_t rules;
};

#define OE_WRAPPER(STEM, RQ_INNER, RS_INNER, RULES) \
  {{OE_TAG_##STEM##RQ, OE_TAG_##STEM##RS}, {RQ_INNER, RS_INNER}, RULES}
const WrapperRow kWrappers[] = {
    OE_WRAPPER(CHALLENGETRN, OE_TAGS(CHALLENGERQ), OE_TAGS(CHALLENGERS), kRqInnerOptional),
    OE_WRAPPER(PINCHTRN, OE_TAGS(PINCHRQ), OE_TAGS(PINCHRS), kRqInnerOptional),
    OE_WRAPPER(PROFTRN, OE_TAGS(PROFRQ), OE_TAGS(PROFRS), kRqInnerOptional | kRsUpToDateReleases),
    OE_WRAPPER(GETMIMETRN, OE_TAGS(GETMIMERQ), OE_TAGS(GETMIMERS), kNotOffered),
    OE_WRAPPER(ACCTINFOTRN, OE_TAGS(ACCTINFORQ), OE_TAGS(ACCTINFORS), kRqInnerOptional | kRsUpToDateReleases),
    OE_WRAPPER(ACCTTRN, OE_TAGS(ACCTRQ), OE_TAGS(ACCTRS), kRqInnerOptional | kNotOffered),
    OE_WRAPPER(ENROLLTRN, OE_TAGS(ENROLLRQ), OE_TAGS(ENROLLRS), kRqInnerOptional | kNotOffered),
    OE_WRAPPER(CHGUSERINFOTRN, OE_TAGS(CHGUSERINFORQ), OE_TAGS(CHGUSERINFORS), kRqInnerOptional | kNotOffered),
    OE_WRAPPER(STMTTRN, OE_TAGS(STMTRQ), OE_TAGS(STMTRS), 0),
    OE_WRAPPER(STMTENDTRN, OE_TAGS(STMTENDRQ), OE_TAGS(STMTENDRS), 0),
    OE_WRAPPER(CCSTMTTRN, OE_TAGS(CCSTMTRQ), OE_TAGS(CCSTMTRS), 0),
    OE_WRAPPER(CCSTMTENDTRN, OE_TAGS(CCSTMTENDRQ), OE_TAGS(CCSTMTENDRS), 0),
    OE_WRAPPER(BANKMAILTRN, OE_TAGS(BANKMAILRQ), OE_TAGS(BANKMAILRS, CHKMAILRS, DEPMAILRS), kRsAnyInner),
    OE_WRAPPER(STPCHKTRN, OE_TAGS(STPCHKRQ), OE_TAGS(STPCHKRS), 0),
    OE_WRAPPER(INTRATRN, OE_TAGS(INTRARQ, INTRAMODRQ, INTRACANRQ), OE_TAGS(INTRACANRS, INTRAMODRS, INTRARS), 0),
    OE_WRAPPER(RECINTRATRN, OE_TAGS(RECINTRARQ, RECINTRAMODRQ, RECINTRACANRQ),
               OE_TAGS(RECINTRACANRS, RECINTRAMODRS, RECINTRARS), 0),
    OE_WRAPPER(INTERTRN, OE_TAGS(INTERRQ, INTERMODRQ, INTERCANRQ), OE_TAGS(INTERCANRS, INTERMODRS, INTERRS), 0),
    OE_WRAPPER(RECINTERTRN, OE_TAGS(RECINTERRQ, RECINTERMODRQ, RECINTERCANRQ),
               OE_TAGS(RECINTERCANRS, RECINTERMODRS, RECINTERRS), 0),
    OE_WRAPPER(WIRETRN, OE_TAGS(WIRERQ, WIRECANRQ), OE_TAGS(WIRERS, WIRECANRS), 0),
    OE_WRAPPER(INVSTMTTRN, OE_TAGS(INVSTMTRQ), OE_TAGS(INVSTMTRS), 0),
    OE_WRAPPER(INVMAILTRN, OE_TAGS(INVMAILRQ), OE_TAGS(INVMAILRS), 0),
    OE_WRAPPER(SECLISTTRN, OE_TAGS(SECLISTRQ), OE_TAGS(SECLISTRS), 0),
    OE_WRAPPER(MAILTRN, OE_TAGS(MAILRQ), OE_TAGS(MAILRS), kNotOffered),
    OE_WRAPPER(PAYEETRN, OE_TAGS(PAYEERQ, PAYEEMODRQ, PAYEEDELRQ), OE_TAGS(PAYEEMODRS, PAYEERS, PAYEEDELRS), 0),
    OE_WRAPPER(PMTTRN, OE_TAGS(PMTRQ, PMTMODRQ, PMTCANCRQ), OE_TAGS(PMTCANCRS, PMTMODRS, PMTRS), 0),
    OE_WRAPPER(RECPMTTRN, OE_TAGS(RECPMTRQ, RECPMTMODRQ, RECPMTCANCRQ), OE_TAGS(RECPMTCANCRS, RECPMTMODRS, RECPMTRS),
               0),
    OE_WRAPPER(PMTINQTRN, OE_TAGS(PMTINQRQ), OE_TAGS(PMTINQRS), 0),
    OE_WRAPPER(PMTMAILTRN, OE_TAGS(PMTMAILRQ), OE_TAGS(PMTMAILRS), 0),
    OE_WRAPPER(VEXA_BRANDTRN, OE_TAGS(VEXA_BRANDRQ), OE_TAGS(VEXA_BRANDRS), kRsUpToDateReleases),
    OE_WRAPPER(VEXA_MKTTIERTRN, OE_TAGS(VEXA_MKTTIERRQ), OE_TAGS(VEXA_MKTTIERRS), kRsUpToDateReleases),
    OE_WRAPPER(VEXA_CLIENTLOGTRN, OE_TAGS(VEXA_CLIENTLOGRQ), OE_NO_TAGS, kRsInnerOptional),
    OE_WRAPPER(VEXA_CUUSAGELOGTRN, OE_TAGS(VEXA_CUUSAGELOGRQ), OE_NO_TAGS, kRsInnerOptional),
    OE_WRAPPER(VEXA_FIUSAGELOGTRN, OE_TAGS(VEXA_FIUSAGELOGRQ), OE_NO_TAGS, kRsInnerOptional),
    OE_WRAPPER(VEXA_SURVEYTRN, OE_TAGS(VEXA_SURVEYRQ), OE_NO_TAGS, kRsInnerOptional),
    OE_WRAPPER(V_PAYROLLTRN, OE_TAGS(V_PAYROLLRQ), OE_TAGS(V_PAYROLLRS), kNoCookie | kRsInnerOptional),
    OE_WRAPPER(V_PAYROLLENROLLTRN, OE_TAGS(V_PAYROLLENROLLRQ), OE_TAGS(V_PAYROLLENROLLRS),
               kNoCookie | kRsErrorKeepsInner),
};
#undef OE_WRAPPER
constexpr int kWrapperCount = sizeof kWrappers / sizeof kWrappers[0];

int WrapperRowOf(OETagID tag, Side side) { return OEFindRow(kWrappers, &WrapperRow::wrapper, tag, side); }

template <size_t N>
void AppendTags(std::vector<OETagID>& to, const OETagID (&tags)[N]) {
  for (OETagID tag : tags)
    if (tag != OE_TAG_NONE) to.push_back(tag);
}

OETypeDescription DescribeWrapper(const WrapperRow& row, Side side) {
  OETypeDescription d;
  d.type = row.wrapper[side];
  bool cookie = !(row.rules & kNoCookie);
  if (side == kRq) {
    d.valid = cookie ? std::vector<OETagID>{OE_TAG_TRNUID, OE_TAG_CLTCOOKIE, OE_TAG_TAN}
                     : std::vector<OETagID>{OE_TAG_TRNUID};
    d.required = {OE_TAG_TRNUID};
    bool single = row.inner[kRq][1] == OE_TAG_NONE;
    if (single && !(row.rules & kRqInnerOptional)) d.required.push_back(row.inner[kRq][0]);
  } else {
    d.valid = cookie ? std::vector<OETagID>{OE_TAG_TRNUID, OE_TAG_CLTCOOKIE, OE_TAG_STATUS}
                     : std::vector<OETagID>{OE_TAG_TRNUID, OE_TAG_STATUS};
    d.required = {OE_TAG_TRNUID, OE_TAG_STATUS};
    d.order = {OE_TAG_TRNUID, OE_TAG_STATUS, OE_TAG_CLTCOOKIE};
    AppendTags(d.order, row.inner[kRs]);
  }
  AppendTags(d.valid, row.inner[side]);
  for (OETagID tag : row.inner[side])
    if (tag != OE_TAG_NONE) d.aliases.push_back({tag, "ActualTrans"});
  return d;
}

// How many of tags are present in obj.
template <size_t N>
unsigned short CountPresent(const OEDataObj& obj, const OETagID (&tags)[N]) {
  unsigned short n = 0;
  for (OETagID tag : tags)
    if (tag != OE_TAG_NONE && obj.ValidateTag(tag)) ++n;
  return n;
}

// ---------------------------------------------------------------------------
// Synchronisation wrappers.

enum SyncRule : uint16_t {
  kRqNeedsAccount = 1,    // the request needs its account (exactly one, where it may be either)
  kRsNeedsAccount = 2,    // the response likewise
  kRqNeedsMailFlags = 4,  // the request needs INCIMAGES and USEHTML
  kPayroll = 8,           // the payroll update: its own short list of tags
};

struct SyncRow {
  OETagID sync[2];
  OETagID wrapper[2];
  OETagID rqExtra[4];  // request tags between the common ones and the wrapper
  OETagID accounts[2];
  uint16_t rules;
};

#define OE_SYNC(STEM, WRAPPER, RQ_EXTRA, ACCOUNTS, RULES) \
  {{OE_TAG_##STEM##RQ, OE_TAG_##STEM##RS}, {OE_TAG_##WRAPPER##RQ, OE_TAG_##WRAPPER##RS}, RQ_EXTRA, ACCOUNTS, RULES}
#define OE_BANK_SYNC(STEM, WRAPPER, RULES) \
  OE_SYNC(STEM, WRAPPER, OE_TAGS(BANKACCTFROM), OE_TAGS(BANKACCTFROM), RULES)
const SyncRow kSyncs[] = {
    OE_SYNC(ACCTSYNC, ACCTTRN, OE_NO_TAGS, OE_NO_TAGS, 0),
    OE_SYNC(CHGUSERINFOSYNC, CHGUSERINFOTRN, OE_NO_TAGS, OE_NO_TAGS, 0),
    OE_SYNC(BANKMAILSYNC, BANKMAILTRN, OE_TAGS(INCIMAGES, USEHTML, BANKACCTFROM, CCACCTFROM),
            OE_TAGS(BANKACCTFROM, CCACCTFROM), kRqNeedsAccount | kRsNeedsAccount | kRqNeedsMailFlags),
    OE_SYNC(INVMAILSYNC, INVMAILTRN, OE_TAGS(INCIMAGES, USEHTML, INVACCTFROM), OE_TAGS(INVACCTFROM),
            kRqNeedsAccount | kRsNeedsAccount | kRqNeedsMailFlags),
    OE_SYNC(MAILSYNC, MAILTRN, OE_TAGS(INCIMAGES, USEHTML), OE_NO_TAGS, kRqNeedsMailFlags),
    OE_SYNC(PMTMAILSYNC, PMTMAILTRN, OE_TAGS(BANKACCTFROM, INCIMAGES, USEHTML), OE_TAGS(BANKACCTFROM),
            kRqNeedsMailFlags),
    OE_BANK_SYNC(INTERSYNC, INTERTRN, kRsNeedsAccount),
    OE_BANK_SYNC(INTRASYNC, INTRATRN, kRqNeedsAccount | kRsNeedsAccount),
    OE_BANK_SYNC(PAYEESYNC, PAYEETRN, 0),
    OE_BANK_SYNC(PMTSYNC, PMTTRN, kRqNeedsAccount | kRsNeedsAccount),
    OE_BANK_SYNC(RECINTERSYNC, RECINTERTRN, kRqNeedsAccount | kRsNeedsAccount),
    OE_BANK_SYNC(RECINTRASYNC, RECINTRATRN, kRqNeedsAccount | kRsNeedsAccount),
    OE_BANK_SYNC(RECPMTSYNC, RECPMTTRN, kRqNeedsAccount | kRsNeedsAccount),
    OE_BANK_SYNC(STPCHKSYNC, STPCHKTRN, kRqNeedsAccount | kRsNeedsAccount),
    OE_BANK_SYNC(WIRESYNC, WIRETRN, kRqNeedsAccount | kRsNeedsAccount),
    OE_SYNC(V_PAYROLLUPDATE, V_PAYROLLTRN, OE_NO_TAGS, OE_NO_TAGS, kPayroll),
};
#undef OE_BANK_SYNC
#undef OE_SYNC
constexpr int kSyncCount = sizeof kSyncs / sizeof kSyncs[0];

int SyncRowOf(OETagID tag, Side side) { return OEFindRow(kSyncs, &SyncRow::sync, tag, side); }

OETypeDescription DescribeSync(const SyncRow& row, Side side) {
  OETypeDescription d;
  d.type = row.sync[side];
  bool payroll = row.rules & kPayroll;
  bool singleAccount = row.accounts[0] != OE_TAG_NONE && row.accounts[1] == OE_TAG_NONE;
  if (side == kRq) {
    d.valid = payroll ? std::vector<OETagID>{OE_TAG_TOKEN, OE_TAG_REJECTIFMISSING}
                      : std::vector<OETagID>{OE_TAG_TOKEN, OE_TAG_TOKENONLY, OE_TAG_REFRESH, OE_TAG_REJECTIFMISSING,
                                             OE_TAG_VEXA_REFRESH};
    AppendTags(d.valid, row.rqExtra);
    d.required = {OE_TAG_REJECTIFMISSING};
    d.order = {OE_TAG_TOKEN,     OE_TAG_TOKENONLY, OE_TAG_REFRESH,      OE_TAG_REJECTIFMISSING,
               OE_TAG_VEXA_REFRESH, OE_TAG_INCIMAGES, OE_TAG_USEHTML, OE_TAG_BANKACCTFROM,
               OE_TAG_CCACCTFROM, OE_TAG_INVACCTFROM};
    if (row.rules & kRqNeedsMailFlags) d.required.insert(d.required.end(), {OE_TAG_INCIMAGES, OE_TAG_USEHTML});
    if ((row.rules & kRqNeedsAccount) && singleAccount) d.required.push_back(row.accounts[0]);
  } else {
    // The payroll update's own class adds its fields; the generic response
    // reads its token and wrappers.
    d.valid = payroll ? std::vector<OETagID>{OE_TAG_TOKEN}
                      : std::vector<OETagID>{OE_TAG_TOKEN, OE_TAG_LOSTSYNC, OE_TAG_VEXA_REFRESH, OE_TAG_VEXA_SYNCERROR};
    AppendTags(d.valid, row.accounts);
    d.required = {OE_TAG_TOKEN};
    d.order = {OE_TAG_TOKEN,        OE_TAG_LOSTSYNC,   OE_TAG_VEXA_SYNCERROR, OE_TAG_VEXA_REFRESH,
               OE_TAG_BANKACCTFROM, OE_TAG_CCACCTFROM, OE_TAG_INVACCTFROM};
    if ((row.rules & kRsNeedsAccount) && singleAccount) d.required.push_back(row.accounts[0]);
  }
  d.valid.push_back(row.wrapper[side]);
  d.order.push_back(row.wrapper[side]);
  d.aliases.push_back({row.wrapper[side], "Trans"});
  return d;
}

// The sync's account rule: its one account, or exactly one of its two.
bool AccountRuleHolds(const OEDataObj& sync, const SyncRow& row) {
  return CountPresent(sync, row.accounts) == 1;
}

// The descriptions of the wrapper and sync types, per side, made once.
const OEAggregateInfo* WrapperInfo(const OEAggregateInfo& classInfo, OETagID type, Side side) {
  static OETypeInfoCache caches[2] = {OETypeInfoCache(kWrapperCount), OETypeInfoCache(kWrapperCount)};
  int row = WrapperRowOf(type, side);
  return caches[side].Get(row, classInfo, [row, side] { return DescribeWrapper(kWrappers[row], side); });
}

const OEAggregateInfo* SyncInfo(const OEAggregateInfo& classInfo, OETagID type, Side side) {
  static OETypeInfoCache caches[2] = {OETypeInfoCache(kSyncCount), OETypeInfoCache(kSyncCount)};
  int row = SyncRowOf(type, side);
  return caches[side].Get(row, classInfo, [row, side] { return DescribeSync(kSyncs[row], side); });
}

const SyncRow* SyncRowFor(OETagID type, Side side) {
  int row = SyncRowOf(type, side);
  return row < 0 ? nullptr : &kSyncs[row];
}
}  // namespace

// ---------------------------------------------------------------------------

OE_DEFINE_AGGREGATE(OETransRq, OEWrapperAggregate, OE_TRANSRQ_FIELDS, NONE,
                    .Valid(OE_TAGS(TRNUID, CLTCOOKIE, TAN)).Required(OE_TAGS(TRNUID)))
OE_DEFINE_AGGREGATE(OETransRs, OEWrapperAggregate, OE_TRANSRS_FIELDS, NONE,
                    .Valid(OE_TAGS(TRNUID, CLTCOOKIE, STATUS))
                    .Required(OE_TAGS(TRNUID, STATUS))
                    .WriteOrder(OE_TAGS(TRNUID, STATUS, CLTCOOKIE)))
OE_DEFINE_AGGREGATE(OESyncRq, OEWrapperAggregate, OE_SYNCRQ_FIELDS, NONE, .Required(OE_TAGS(REJECTIFMISSING)))
OE_DEFINE_AGGREGATE(OESyncRs, OEWrapperAggregate, OE_SYNCRS_FIELDS, NONE, .Required(OE_TAGS(TOKEN)))

const OEAggregateInfo* OETransRq::TypeInfo(OETagID type) { return WrapperInfo(ClassInfo(), type, kRq); }
const OEAggregateInfo* OETransRs::TypeInfo(OETagID type) { return WrapperInfo(ClassInfo(), type, kRs); }
const OEAggregateInfo* OESyncRq::TypeInfo(OETagID type) { return SyncInfo(ClassInfo(), type, kRq); }
const OEAggregateInfo* OESyncRs::TypeInfo(OETagID type) { return SyncInfo(ClassInfo(), type, kRs); }

// ---------------------------------------------------------------------------

OETagID OETransRq::MsgIDToTranWrapper(OETagID inner) {
  if (inner == OE_TAG_NONE) return OE_TAG_NONE;
  for (const WrapperRow& row : kWrappers)
    for (OETagID tag : row.inner[kRq])
      if (tag == inner) return (row.rules & kNotOffered) ? OE_TAG_NONE : row.wrapper[kRq];
  return OE_TAG_NONE;
}

unsigned short OETransRq::AllRequiredPresent() {
  if (!GetActualTrans() || !ValidateTag(OE_TAG_TRNUID)) return 0;
  int row = WrapperRowOf(GetType(), kRq);
  if (row < 0 || (kWrappers[row].rules & kRqInnerOptional)) return 1;
  // Exactly one of the alternatives (or the one inner tag).
  return CountPresent(*this, kWrappers[row].inner[kRq]) % 2;
}

bool OETransRs::IsErrorStatus() const { return ValidateTag(OE_TAG_STATUS) && GetStatus() && GetStatus()->IsError(); }

bool OETransRs::IsUpToDate() const { return ValidateTag(OE_TAG_STATUS) && GetStatus() && GetStatus()->IsUpToDate(); }

unsigned short OETransRs::AllRequiredPresent() {
  if (!GetStatus() || !ValidateTag(OE_TAG_TRNUID)) return 0;
  int index = WrapperRowOf(GetType(), kRs);
  if (index < 0) return 1;
  const WrapperRow& row = kWrappers[index];
  if (row.rules & kRsInnerOptional) return 1;
  if (IsErrorStatus() && !(row.rules & kRsErrorKeepsInner)) return 1;
  if (IsUpToDate() && (row.rules & kRsUpToDateReleases)) return 1;
  unsigned short present = CountPresent(*this, row.inner[kRs]);
  return (row.rules & kRsAnyInner) ? present > 0 : present % 2;
}

OEDataObj* OETransRs::GetChild(unsigned short index) const {
  if (GetActualTrans()) {
    if (index == 0) return GetActualTrans();
    --index;
  }
  return index == 0 ? GetStatus() : nullptr;
}

unsigned short OETransRs::GetNumberOfChildren() const { return (GetActualTrans() ? 1 : 0) + (GetStatus() ? 1 : 0); }

// ---------------------------------------------------------------------------

OETagID OESyncRq::MsgIDToSyncWrapper(OETagID inner) {
  // The payroll update also answers for its own wrapper.
  OETagID wrapper = inner == OE_TAG_V_PAYROLLTRNRQ ? inner : OETransRq::MsgIDToTranWrapper(inner);
  if (wrapper == OE_TAG_NONE) return OE_TAG_NONE;
  for (const SyncRow& row : kSyncs)
    if (row.wrapper[kRq] == wrapper) return row.sync[kRq];
  return OE_TAG_NONE;
}

unsigned short OESyncRq::AllRequiredPresent() {
  if (!ValidateTag(OE_TAG_REJECTIFMISSING)) return 0;
  // One of REFRESH, TOKEN and TOKENONLY, by exclusive or.
  const OETagID starts[] = {OE_TAG_REFRESH, OE_TAG_TOKEN, OE_TAG_TOKENONLY};
  if (CountPresent(*this, starts) % 2 == 0) return 0;
  const SyncRow* row = SyncRowFor(GetType(), kRq);
  if (!row) return 1;
  if ((row->rules & kRqNeedsAccount) && !AccountRuleHolds(*this, *row)) return 0;
  return !(row->rules & kRqNeedsMailFlags) || (ValidateTag(OE_TAG_INCIMAGES) && ValidateTag(OE_TAG_USEHTML));
}

unsigned short OESyncRs::AllRequiredPresent() {
  if (!ValidateTag(OE_TAG_TOKEN)) return 0;
  const SyncRow* row = SyncRowFor(GetType(), kRs);
  return !row || !(row->rules & kRsNeedsAccount) || AccountRuleHolds(*this, *row);
}
