#include "ofxkit/messages/mail/OEMail.h"

#include <cstdio>

unsigned short OESetMailBody(OEAggregate* self, OEEMailMsgBody& field, OETagID tag, const OEString& text) {
  if (text.IsNull() || text.IsEmpty() || text.GetStrLength() > OE_MAIL_BODY_MAX_KEPT) return 0;
  field = text;
  field.SetSpecLength2000();
  if (!field.IsValid()) {
    char length[48];
    std::snprintf(length, sizeof length, "Message body of %u characters", static_cast<unsigned>(text.GetStrLength()));
    self->LogFieldFault(OEPW_TOOLONG, tag, OEString(length));
  }
  return self->SetTag(tag);
}

// The valid order puts the body first; it is written after the subject.
OE_DEFINE_AGGREGATE(OEMail, OEAggregate, OE_MAIL_FIELDS, MAIL,
                    .Valid(OE_TAGS(MSGBODY, USERID, DTCREATED, FROM, TO, SUBJECT, INCIMAGES, USEHTML))
                    .Required(OE_TAGS(MSGBODY, USERID, DTCREATED, FROM, TO, SUBJECT, INCIMAGES, USEHTML))
                    .WriteOrder(OE_TAGS(USERID, DTCREATED, FROM, TO, SUBJECT, MSGBODY, INCIMAGES, USEHTML)))

// A family base and its request and response, which share its rules.
#define OE_DEFINE_MAIL_FAMILY(Base, Parent, FIELDS, Rq, RQTAG, Rs, RSTAG, RULES) \
  OE_DEFINE_AGGREGATE(Base, Parent, FIELDS, NONE, RULES)                       \
  OE_DEFINE_AGGREGATE(Rq, Base, OE_NO_FIELDS, RQTAG, RULES)                    \
  OE_DEFINE_AGGREGATE(Rs, Base, OE_NO_FIELDS, RSTAG, RULES)

OE_DEFINE_MAIL_FAMILY(OEMailBase, OETransBase, OE_MAILBASE_FIELDS, OEMailRq, MAILRQ, OEMailRs, MAILRS,
                      .Valid(OE_TAGS(MAIL)).Required(OE_TAGS(MAIL)))
OE_DEFINE_MAIL_FAMILY(OEBankMailBase, OEMailBase, OE_BANKMAILBASE_FIELDS, OEBankMailRq, BANKMAILRQ, OEBankMailRs,
                      BANKMAILRS, .Valid(OE_TAGS(BANKACCTFROM, CCACCTFROM, MAIL)).Required(OE_TAGS(MAIL)))
OE_DEFINE_MAIL_FAMILY(OEInvMailBase, OEMailBase, OE_INVMAILBASE_FIELDS, OEInvestmentMailRq, INVMAILRQ,
                      OEInvestmentMailRs, INVMAILRS,
                      .Valid(OE_TAGS(INVACCTFROM, MAIL)).Required(OE_TAGS(INVACCTFROM, MAIL)))
OE_DEFINE_MAIL_FAMILY(OEPaymentMailBase, OEMailBase, OE_PAYMENTMAILBASE_FIELDS, OEPaymentMailRq, PMTMAILRQ,
                      OEPaymentMailRs, PMTMAILRS,
                      .Valid(OE_TAGS(MAIL, SRVRTID, PMTINFO)).Required(OE_TAGS(MAIL)))
#undef OE_DEFINE_MAIL_FAMILY

OE_DEFINE_AGGREGATE(OECheckMailRs, OEMailBase, OE_CHECKMAIL_FIELDS, CHKMAILRS,
                    .Valid(OE_TAGS(BANKACCTFROM, MAIL, CHEQUENUM, TRNAMT, DTUSER, FEE))
                    .Required(OE_TAGS(BANKACCTFROM, MAIL, CHEQUENUM)))
OE_DEFINE_AGGREGATE(OEDepositMailRs, OEMailBase, OE_DEPOSITMAIL_FIELDS, DEPMAILRS,
                    .Valid(OE_TAGS(BANKACCTFROM, MAIL, TRNAMT, DTUSER, FEE))
                    .Required(OE_TAGS(BANKACCTFROM, MAIL, TRNAMT)))

OE_DEFINE_AGGREGATE(OEGetMimeRq, OETransBase, OE_GETMIME_FIELDS, GETMIMERQ,
                    .Valid(OE_TAGS(URL))
                    .Required(OE_TAGS(URL)))
OE_DEFINE_AGGREGATE(OEGetMimeRs, OETransBase, OE_GETMIME_FIELDS, GETMIMERS,
                    .Valid(OE_TAGS(URL))
                    .Required(OE_TAGS(URL)))

namespace {
// The walk of a pair of tags after the required ones: `first` while it is
// absent (unless the walk is past it), then `second` while it is absent;
// after `second` the walk ends.
OETagID PairWalk(const OEDataObj& self, OETagID after, OETagID first, OETagID second) {
  OETagID required = self.OEDataObj::GetFirstMissingRequiredTag(after);
  if (required != OE_TAG_NONE) return required;
  if (after == second) return OE_TAG_NONE;
  if (!self.ValidateTag(first) && after != first) return first;
  if (!self.ValidateTag(second)) return second;
  return OE_TAG_NONE;
}
}  // namespace

// The message, and exactly one account.
unsigned short OEBankMailBase::AllRequiredPresent() {
  return OEDataObj::AllRequiredPresent() && ValidateTag(OE_TAG_BANKACCTFROM) != ValidateTag(OE_TAG_CCACCTFROM);
}

OETagID OEBankMailBase::GetFirstMissingRequiredTag(OETagID after) const {
  return PairWalk(*this, after, OE_TAG_BANKACCTFROM, OE_TAG_CCACCTFROM);
}

// The message, and the payment's server id and information together or not
// at all.
unsigned short OEPaymentMailBase::AllRequiredPresent() {
  return OEDataObj::AllRequiredPresent() && ValidateTag(OE_TAG_SRVRTID) == ValidateTag(OE_TAG_PMTINFO);
}

OETagID OEPaymentMailBase::GetFirstMissingRequiredTag(OETagID after) const {
  return PairWalk(*this, after, OE_TAG_SRVRTID, OE_TAG_PMTINFO);
}
