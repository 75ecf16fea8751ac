#include "ofxkit/messages/xfer/OETransfer.h"

// One source and one destination, each a bank or a card account; an
// incomplete transfer is told of both kinds of each.
OE_DEFINE_AGGREGATE(OEXferInfo, OEAggregate, OE_XFERINFO_FIELDS, XFERINFO,
                    .Valid(OE_TAGS(BANKACCTFROM, BANKACCTTO, CCACCTFROM, CCACCTTO, TRNAMT, DTDUE))
                    .Required(OE_TAGS(TRNAMT))
                    .Alternatives(OE_TAGS(BANKACCTFROM, CCACCTFROM))
                    .Alternatives(OE_TAGS(BANKACCTTO, CCACCTTO)))

OEBankOrCCAccount* OEXferInfo::GetAccountFrom() const {
  if (OEBankAccount* bank = GetBankAcctFrom()) return bank;
  return GetCCAcctFrom();
}

OEBankOrCCAccount* OEXferInfo::GetAccountTo() const {
  if (OEBankAccount* bank = GetBankAcctTo()) return bank;
  return GetCCAcctTo();
}

namespace {
// Stores a bank or card account in the place of its kind, giving it the
// place's tag; 0 when the place is taken or the account is of neither kind.
unsigned short PutAccount(OEAggregate* self, OEBankOrCCAccount* account, OEBankAccount*& bankPlace,
                          OETagID bankTag, OECCAccount*& cardPlace, OETagID cardTag) {
  if (auto* bank = dynamic_cast<OEBankAccount*>(account)) {
    if (bankPlace) return 0;
    bank->SetType(bankTag);
    return OESetChildField(self, bankPlace, bank);
  }
  if (auto* card = dynamic_cast<OECCAccount*>(account)) {
    if (cardPlace) return 0;
    card->SetType(cardTag);
    return OESetChildField(self, cardPlace, card);
  }
  return 0;
}
}  // namespace

unsigned short OEXferInfo::SetAccountFrom(OEBankOrCCAccount* account) {
  return PutAccount(this, account, FieldBankAcctFrom(), OE_TAG_BANKACCTFROM, FieldCCAcctFrom(), OE_TAG_CCACCTFROM);
}

unsigned short OEXferInfo::SetAccountTo(OEBankOrCCAccount* account) {
  return PutAccount(this, account, FieldBankAcctTo(), OE_TAG_BANKACCTTO, FieldCCAcctTo(), OE_TAG_CCACCTTO);
}

OE_DEFINE_AGGREGATE(OEXferProcessingStatus, OEAggregate, OE_XFERPROCESSINGSTATUS_FIELDS, XFERPRCSTS,
                    .Valid(OE_TAGS(XFERPRCCODE, DTXFERPRC))
                    .Required(OE_TAGS(XFERPRCCODE, DTXFERPRC)))

#define OE_XFER_RQ_RULES .Valid(OE_TAGS(XFERINFO)).Required(OE_TAGS(XFERINFO))
OE_DEFINE_AGGREGATE(OETransferRq, OETransBase, OE_XFERINFO_FIELD, NONE, OE_XFER_RQ_RULES)
OE_DEFINE_AGGREGATE(OEIntraRq, OETransferRq, OE_NO_FIELDS, INTRARQ, OE_XFER_RQ_RULES)
OE_DEFINE_AGGREGATE(OEInterRq, OETransferRq, OE_NO_FIELDS, INTERRQ, OE_XFER_RQ_RULES)
#undef OE_XFER_RQ_RULES

#define OE_XFER_RS_REQUIRED .Required(OE_TAGS(XFERINFO, CURDEF, SRVRTID))
OE_DEFINE_AGGREGATE(OETransferRs, OETransBase, OE_TRANSFERRS_FIELDS, NONE,
                    .Valid(OE_TAGS(XFERINFO, CURDEF, SRVRTID, DTXFERPRJ, DTPOSTED, RECSRVRTID, XFERPRCSTS))
                    OE_XFER_RS_REQUIRED)
OE_DEFINE_AGGREGATE(OEIntraRs, OETransferRs, OE_NO_FIELDS, INTRARS,
                    .Valid(OE_TAGS(XFERINFO, CURDEF, SRVRTID, DTXFERPRJ, DTPOSTED, RECSRVRTID, XFERPRCSTS))
                    OE_XFER_RS_REQUIRED)
OE_DEFINE_AGGREGATE(OEInterRs, OETransferRs, OE_INTERRS_FIELDS, INTERRS,
                    .Valid(OE_TAGS(XFERINFO, CURDEF, SRVRTID, DTXFERPRJ, DTPOSTED, RECSRVRTID, REFNUM, XFERPRCSTS))
                    OE_XFER_RS_REQUIRED)
#undef OE_XFER_RS_REQUIRED

#define OE_XFER_MODRQ_RULES .Valid(OE_TAGS(XFERINFO, SRVRTID)).Required(OE_TAGS(XFERINFO, SRVRTID))
OE_DEFINE_AGGREGATE(OETransferModifyRq, OETransBase, OE_TRANSFERMODIFYRQ_FIELDS, NONE, OE_XFER_MODRQ_RULES)
OE_DEFINE_AGGREGATE(OEIntraModifyRq, OETransferModifyRq, OE_NO_FIELDS, INTRAMODRQ, OE_XFER_MODRQ_RULES)
OE_DEFINE_AGGREGATE(OEInterModifyRq, OETransferModifyRq, OE_NO_FIELDS, INTERMODRQ, OE_XFER_MODRQ_RULES)
#undef OE_XFER_MODRQ_RULES

#define OE_XFER_MODRS_RULES \
  .Valid(OE_TAGS(XFERINFO, XFERPRCSTS, SRVRTID)).Required(OE_TAGS(XFERINFO, SRVRTID))
OE_DEFINE_AGGREGATE(OETransferModifyRs, OETransBase, OE_TRANSFERMODIFYRS_FIELDS, NONE, OE_XFER_MODRS_RULES)
OE_DEFINE_AGGREGATE(OEIntraModifyRs, OETransferModifyRs, OE_NO_FIELDS, INTRAMODRS, OE_XFER_MODRS_RULES)
OE_DEFINE_AGGREGATE(OEInterModifyRs, OETransferModifyRs, OE_NO_FIELDS, INTERMODRS, OE_XFER_MODRS_RULES)
#undef OE_XFER_MODRS_RULES

#define OE_XFER_CANCEL_RULES .Valid(OE_TAGS(SRVRTID)).Required(OE_TAGS(SRVRTID))
OE_DEFINE_AGGREGATE(OETransferCancel, OETransBase, OE_SRVRTID_FIELD, NONE, OE_XFER_CANCEL_RULES)
OE_DEFINE_AGGREGATE(OEIntraCancelRq, OETransferCancel, OE_NO_FIELDS, INTRACANRQ, OE_XFER_CANCEL_RULES)
OE_DEFINE_AGGREGATE(OEIntraCancelRs, OETransferCancel, OE_NO_FIELDS, INTRACANRS, OE_XFER_CANCEL_RULES)
OE_DEFINE_AGGREGATE(OEInterCancelRq, OETransferCancel, OE_NO_FIELDS, INTERCANRQ, OE_XFER_CANCEL_RULES)
OE_DEFINE_AGGREGATE(OEInterCancelRs, OETransferCancel, OE_NO_FIELDS, INTERCANRS, OE_XFER_CANCEL_RULES)
OE_DEFINE_AGGREGATE(OEWireCancelRq, OETransferCancel, OE_NO_FIELDS, WIRECANRQ, OE_XFER_CANCEL_RULES)
OE_DEFINE_AGGREGATE(OEWireCancelRs, OETransferCancel, OE_NO_FIELDS, WIRECANRS, OE_XFER_CANCEL_RULES)
#undef OE_XFER_CANCEL_RULES

#define OE_RECXFER_CANCEL_RULES \
  .Valid(OE_TAGS(RECSRVRTID, CANPENDING)).Required(OE_TAGS(RECSRVRTID, CANPENDING))
OE_DEFINE_AGGREGATE(OERecTransferCancel, OETransBase, OE_RECCANCEL_FIELDS, NONE, OE_RECXFER_CANCEL_RULES)
OE_DEFINE_AGGREGATE(OERecIntraCancelRq, OERecTransferCancel, OE_NO_FIELDS, RECINTRACANRQ, OE_RECXFER_CANCEL_RULES)
OE_DEFINE_AGGREGATE(OERecIntraCancelRs, OERecTransferCancel, OE_NO_FIELDS, RECINTRACANRS, OE_RECXFER_CANCEL_RULES)
OE_DEFINE_AGGREGATE(OERecInterCancelRq, OERecTransferCancel, OE_NO_FIELDS, RECINTERCANRQ, OE_RECXFER_CANCEL_RULES)
OE_DEFINE_AGGREGATE(OERecInterCancelRs, OERecTransferCancel, OE_NO_FIELDS, RECINTERCANRS, OE_RECXFER_CANCEL_RULES)
#undef OE_RECXFER_CANCEL_RULES

OE_DEFINE_AGGREGATE(OERecIntraRq, OETransBase, OE_RECINTRARQ_FIELDS, RECINTRARQ,
                    .Valid(OE_TAGS(RECURRINST, INTRARQ))
                    .Required(OE_TAGS(RECURRINST, INTRARQ)))
OE_DEFINE_AGGREGATE(OERecIntraRs, OETransBase, OE_RECINTRARS_FIELDS, RECINTRARS,
                    .Valid(OE_TAGS(RECURRINST, INTRARS, RECSRVRTID))
                    .Required(OE_TAGS(RECURRINST, RECSRVRTID)))
OE_DEFINE_AGGREGATE(OERecIntraModifyRq, OETransBase, OE_RECINTRAMODIFYRQ_FIELDS, RECINTRAMODRQ,
                    .Valid(OE_TAGS(RECURRINST, INTRARQ, RECSRVRTID, MODPENDING))
                    .Required(OE_TAGS(RECURRINST, RECSRVRTID, MODPENDING)))
OE_DEFINE_AGGREGATE(OERecIntraModifyRs, OETransBase, OE_RECINTRAMODIFYRS_FIELDS, RECINTRAMODRS,
                    .Valid(OE_TAGS(RECURRINST, INTRARS, RECSRVRTID, MODPENDING))
                    .Required(OE_TAGS(RECURRINST, RECSRVRTID, MODPENDING)))
OE_DEFINE_AGGREGATE(OERecInterRq, OETransBase, OE_RECINTERRQ_FIELDS, RECINTERRQ,
                    .Valid(OE_TAGS(RECURRINST, INTERRQ))
                    .Required(OE_TAGS(RECURRINST, INTERRQ)))
OE_DEFINE_AGGREGATE(OERecInterRs, OETransBase, OE_RECINTERRS_FIELDS, RECINTERRS,
                    .Valid(OE_TAGS(RECURRINST, INTERRS, RECSRVRTID))
                    .Required(OE_TAGS(RECURRINST, RECSRVRTID)))
OE_DEFINE_AGGREGATE(OERecInterModifyRq, OETransBase, OE_RECINTERMODIFYRQ_FIELDS, RECINTERMODRQ,
                    .Valid(OE_TAGS(RECURRINST, INTERRQ, RECSRVRTID, MODPENDING))
                    .Required(OE_TAGS(RECURRINST, RECSRVRTID, MODPENDING)))
OE_DEFINE_AGGREGATE(OERecInterModifyRs, OETransBase, OE_RECINTERMODIFYRS_FIELDS, RECINTERMODRS,
                    .Valid(OE_TAGS(RECURRINST, INTERRS, RECSRVRTID, MODPENDING))
                    .Required(OE_TAGS(RECURRINST, RECSRVRTID, MODPENDING)))
