// Secure mail between a user and the institution: the message itself
// ("MAIL"), free-form mail ("MAILRQ"/"MAILRS"), mail about a bank or card
// account, a brokerage account or a payment, the institution's notices about
// a cheque or a deposit, and the retrieval of a MIME attachment by its URL.
#pragma once

#include "ofxkit/core/OEAggregate.h"
#include "ofxkit/envelope/OETransBase.h"
#include "ofxkit/messages/bank/OEAccount.h"
#include "ofxkit/messages/billpay/OEPayment.h"

// Longest body a message keeps. Its OFX limit (what IsValid and a strict
// build check) is the body type's own: 2000 characters.
constexpr unsigned short OE_MAIL_BODY_MAX_KEPT = 10000;

// Sets a message body from text: an empty text, or one longer than
// OE_MAIL_BODY_MAX_KEPT, answers 0 and leaves the body and its presence bit
// as they were (no warning: the caller is told). Otherwise the text is kept
// whole with the 2000-character limit, marked present, and a body that a
// strict build would refuse is logged as OEPW_TOOLONG with its length only:
// the text of a message never reaches the log.
unsigned short OESetMailBody(OEAggregate* self, OEEMailMsgBody& field, OETagID tag, const OEString& text);

// The message body as a field kind of its own (MAILBODY): set through
// OESetMailBody, and written as an element followed by its own end tag, as
// servers expect of a text that may span lines.
#define OE_DECLARE_MAILBODY(Name, TAG, Type)                                                           \
 public:                                                                                               \
  const Type& Get##Name() const { return OEGetField<Type>(this, OE_FIELD_KEY(Name)); }                 \
  unsigned short Set##Name(const OEString& text) { return OESetMailBody(this, Field##Name(), OE_TAG_##TAG, text); } \
                                                                                                       \
 protected:                                                                                            \
  Type& Field##Name() { return OEFieldRef<Type>(this, OE_FIELD_KEY(Name)); }

template <uint16_t Key>
struct OEMailBodyOps {
  static unsigned short SetText(OEAggregate* self, OETagID tag, const OEString& text) {
    return OESetMailBody(self, OEFieldRef<OEEMailMsgBody>(self, Key), tag, text);
  }
  static OEBuildStatus Write(OEBuilder* b, const OEAggregate* self, OETagID tag) {
    OEBuildStatus status = b->AddTagOEString(tag, OEGetField<OEEMailMsgBody>(self, Key));
    return status != OE_BUILD_OK ? status : b->AddTagEnd(tag);
  }
  static void Copy(OEAggregate* dst, const OEAggregate* src) { OECopyField<OEEMailMsgBody>(dst, src, Key); }
  static unsigned short Text(const OEAggregate* self, unsigned short, OEString& out) {
    out = OEGetField<OEEMailMsgBody>(self, Key);
    return 1;
  }
};

#define OE_DESC_MAILBODY(Name, TAG, Type)                                                                     \
  OEFieldDesc{OE_TAG_##TAG, OE_FIELD_ELEMENT, false, &OEMailBodyOps<OE_FIELD_KEY(Name)>::SetText,            \
              &OEMailBodyOps<OE_FIELD_KEY(Name)>::Write, &OEMailBodyOps<OE_FIELD_KEY(Name)>::Copy,            \
              &OEMailBodyOps<OE_FIELD_KEY(Name)>::Text, nullptr, nullptr, nullptr, nullptr, nullptr, #Name,   \
              nullptr, OE_FIELD_KEY(Name), &OEDestroyValue<OEEMailMsgBody>},

// One message ("MAIL"). Every field is required.
#define OE_MAIL_FIELDS(X)                                   \
  X(MAILBODY, MessageBody, MSGBODY, OEEMailMsgBody)         \
  X(TEXT, UserId, USERID, OEString32)                       \
  X(VALUE, DateTimeCreated, DTCREATED, OEDateTime)          \
  X(TEXT, From, FROM, OEString32)                           \
  X(TEXT, To, TO, OEString32)                               \
  X(TEXT, Subject, SUBJECT, OEString60)                     \
  X(FLAG, IncludeImages, INCIMAGES, unsigned short)         \
  X(FLAG, UseHTML, USEHTML, unsigned short)

class OEMail : public OEAggregate {
  OE_AGGREGATE(OEMail, OE_MAIL_FIELDS)
};

// ---------------------------------------------------------------------------
// What carries a message.

#define OE_MAILBASE_FIELDS(X) X(CHILD, Mail, MAIL, OEMail)

// Every request and response that holds a message.
class OEMailBase : public OETransBase {
  OE_AGGREGATE(OEMailBase, OE_MAILBASE_FIELDS)
  using OETransBase::DeepCopyFrom;
};

// Free-form mail ("MAILRQ", "MAILRS" in the e-mail message set).
class OEMailRq : public OEMailBase {
  OE_AGGREGATE(OEMailRq, OE_NO_FIELDS)
  using OEMailBase::DeepCopyFrom;
};

class OEMailRs : public OEMailBase {
  OE_AGGREGATE(OEMailRs, OE_NO_FIELDS)
  using OEMailBase::DeepCopyFrom;
};

// Mail about a bank or a card account: exactly one of "BANKACCTFROM" and
// "CCACCTFROM" (the account's type tells which it stands as).
#define OE_BANKMAILBASE_FIELDS(X)                                    \
  X(CHILD, BankAccountFrom, BANKACCTFROM, OEBankOrCCAccount)         \
  X(ALSO, BankAccountFrom, CCACCTFROM, OEBankOrCCAccount)

class OEBankMailBase : public OEMailBase {
  OE_AGGREGATE(OEBankMailBase, OE_BANKMAILBASE_FIELDS)
  using OEMailBase::DeepCopyFrom;
  unsigned short AllRequiredPresent() override;
  // The message first; then "BANKACCTFROM" while it is absent, then
  // "CCACCTFROM" while it is absent, so that the walk names both ways to
  // complete the request; after "CCACCTFROM" the walk ends.
  OETagID GetFirstMissingRequiredTag(OETagID after) const override;
};

class OEBankMailRq : public OEBankMailBase {
  OE_AGGREGATE(OEBankMailRq, OE_NO_FIELDS)
  using OEBankMailBase::DeepCopyFrom;
};

class OEBankMailRs : public OEBankMailBase {
  OE_AGGREGATE(OEBankMailRs, OE_NO_FIELDS)
  using OEBankMailBase::DeepCopyFrom;
};

// Mail about a brokerage account.
#define OE_INVMAILBASE_FIELDS(X) X(CHILD, InvAccountFrom, INVACCTFROM, OEInvAcctFrom)

class OEInvMailBase : public OEMailBase {
  OE_AGGREGATE(OEInvMailBase, OE_INVMAILBASE_FIELDS)
  using OEMailBase::DeepCopyFrom;
};

class OEInvestmentMailRq : public OEInvMailBase {
  OE_AGGREGATE(OEInvestmentMailRq, OE_NO_FIELDS)
  using OEInvMailBase::DeepCopyFrom;
};

class OEInvestmentMailRs : public OEInvMailBase {
  OE_AGGREGATE(OEInvestmentMailRs, OE_NO_FIELDS)
  using OEInvMailBase::DeepCopyFrom;
};

// Mail about a payment: the payment is named by its server id and its
// information, both or neither.
#define OE_PAYMENTMAILBASE_FIELDS(X)                       \
  OE_SRVRTID_FIELD(X)                                      \
  X(CHILD, PaymentInfo, PMTINFO, OEPaymentInfo)

class OEPaymentMailBase : public OEMailBase {
  OE_AGGREGATE(OEPaymentMailBase, OE_PAYMENTMAILBASE_FIELDS)
  using OEMailBase::DeepCopyFrom;
  unsigned short AllRequiredPresent() override;
  // The message first; then "SRVRTID" while it is absent, then "PMTINFO"
  // while it is absent; after "PMTINFO" the walk ends.
  OETagID GetFirstMissingRequiredTag(OETagID after) const override;
};

class OEPaymentMailRq : public OEPaymentMailBase {
  OE_AGGREGATE(OEPaymentMailRq, OE_NO_FIELDS)
  using OEPaymentMailBase::DeepCopyFrom;
};

class OEPaymentMailRs : public OEPaymentMailBase {
  OE_AGGREGATE(OEPaymentMailRs, OE_NO_FIELDS)
  using OEPaymentMailBase::DeepCopyFrom;
};

// The institution's notices: a cheque that cleared ("CHKMAILRS") and a
// deposit that arrived ("DEPMAILRS"), each with a message.
#define OE_DEPOSITMAIL_FIELDS(X)                                   \
  X(CHILD, BankAccountFrom, BANKACCTFROM, OEBankAccount)           \
  X(VALUE, TransactionAmount, TRNAMT, OEPrecisionInteger)          \
  X(VALUE, DateTimeUser, DTUSER, OEDateTime)                       \
  X(VALUE, Fee, FEE, OEPrecisionInteger)
#define OE_CHECKMAIL_FIELDS(X) OE_DEPOSITMAIL_FIELDS(X) OE_CHEQUENUM_FIELD(X)

class OECheckMailRs : public OEMailBase {
  OE_AGGREGATE(OECheckMailRs, OE_CHECKMAIL_FIELDS)
  using OEMailBase::DeepCopyFrom;
};

class OEDepositMailRs : public OEMailBase {
  OE_AGGREGATE(OEDepositMailRs, OE_DEPOSITMAIL_FIELDS)
  using OEMailBase::DeepCopyFrom;
};

// ---------------------------------------------------------------------------
// A MIME attachment named by its URL ("GETMIMERQ"); the answer repeats the
// URL, and fetching the part is the application's.

#define OE_GETMIME_FIELDS(X) X(TEXT, URL, URL, OEString255)

class OEGetMimeRq : public OETransBase {
  OE_AGGREGATE(OEGetMimeRq, OE_GETMIME_FIELDS)
  using OETransBase::DeepCopyFrom;
};

class OEGetMimeRs : public OETransBase {
  OE_AGGREGATE(OEGetMimeRs, OE_GETMIME_FIELDS)
  using OETransBase::DeepCopyFrom;
};
