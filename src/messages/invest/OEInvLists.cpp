#include "ofxkit/messages/invest/OEInvLists.h"

OE_DEFINE_AGGREGATE(OEInvTranList, OEAggregate, OE_INVTRANLIST_FIELDS, INVTRANLIST,
                    .Valid(OE_TAGS(DTSTART, DTEND, BUYDEBT, BUYMF, BUYOPT, BUYOTHER, BUYSTOCK, CLOSUREOPT, INCOME,
                                   INVEXPENSE, JRNLFUND, JRNLSEC, MARGININTEREST, REINVEST, RETOFCAP, SELLDEBT, SELLMF,
                                   SELLOPT, SELLOTHER, SELLSTOCK, SPLIT, TRANSFER, INVBANKTRAN))
                    .Required(OE_TAGS(DTSTART, DTEND)))
OE_DEFINE_AGGREGATE(OEInvPosList, OEAggregate, OE_INVPOSLIST_FIELDS, INVPOSLIST,
                    .Valid(OE_TAGS(POSDEBT, POSMF, POSOPT, POSOTHER, POSSTOCK)))
OE_DEFINE_AGGREGATE(OEInvOOList, OEAggregate, OE_INVOOLIST_FIELDS, INVOOLIST,
                    .Valid(OE_TAGS(OOBUYDEBT, OOBUYMF, OOBUYOPT, OOBUYOTHER, OOBUYSTOCK, OOSELLDEBT, OOSELLMF,
                                   OOSELLOPT, OOSELLOTHER, OOSELLSTOCK, OOSWITCHMF)))

namespace {
// The INVTRAN of a transaction kind: its own, or the one inside its INVBUY
// or INVSELL. Found through the kind's description, without a cast per child.
OEInvTran* InnerInvTran(const OEAggregate* kind) {
  for (const OEFieldDesc* d : kind->GetInfo().children) {
    if (d->kind != OE_FIELD_CHILD) continue;
    OEDataObj* child = d->get(kind, 0);
    if (!child) continue;
    if (d->tag == OE_TAG_INVTRAN) return static_cast<OEInvTran*>(child);
    if (d->tag == OE_TAG_INVBUY || d->tag == OE_TAG_INVSELL) return InnerInvTran(static_cast<OEAggregate*>(child));
  }
  return nullptr;
}
}  // namespace

unsigned short OEInvTranList::FillGenericInvTranList(std::vector<OEInvTran*>& array) {
  const OEAggregateInfo& info = GetInfo();
  unsigned short result = 1;
  // The kinds in writing order; the journals are not indexed and the bank
  // transactions come last, as they are.
  for (const OEFieldDesc* d : info.writeList) {
    if (d->kind != OE_FIELD_LIST) continue;
    OETagID tag = d->tag;
    if (tag == OE_TAG_JRNLFUND || tag == OE_TAG_JRNLSEC) continue;
    for (unsigned short k = 0, n = d->count(this); k < n; ++k) {
      // Every element of a kind's array is an aggregate of that kind's class.
      auto* kind = static_cast<OEAggregate*>(d->get(this, k));
      if (!kind) continue;
      if (tag != OE_TAG_INVBANKTRAN) {
        if (OEInvTran* tran = InnerInvTran(kind)) array.push_back(tran);
        continue;
      }
      auto* bank = static_cast<OEInvBankTran*>(kind);
      OEInvTran* tran = bank->GetInvTran();
      if (!tran) {
        result = 0;
        continue;
      }
      if (const OEBankStatementTx* tx = bank->GetStatementTx()) {
        tran->SetFITId(tx->GetFITId());
        if (tx->ValidateTag(OE_TAG_DTPOSTED)) tran->SetDtTrade(tx->GetDateTimePosted());
        tran->SetMemo(tx->GetMemo());
        tran->SetServerTxId(tx->GetServerTxId());
      }
      tran->SetChildObj(bank);
      tran->SetChildType(bank->GetType());
      array.push_back(tran);
    }
  }
  return result;
}

unsigned short OEInvTranList::BuildGenericInvTranList() {
  m_generic.clear();
  return FillGenericInvTranList(m_generic);
}

unsigned short OEInvTranList::GetNumGenericInvTran() const {
  return static_cast<unsigned short>(m_generic.size() > 0xFFFF ? 0xFFFF : m_generic.size());
}

OEInvTran* OEInvTranList::GetGenericInvTran(unsigned short i) const {
  return i < m_generic.size() ? m_generic[i] : nullptr;
}

unsigned short OEInvTranList::SetGenericInvTran(unsigned short i, OEInvTran* t) {
  if (!t || i > m_generic.size()) return 0;
  if (i == m_generic.size())
    m_generic.push_back(t);
  else
    m_generic[i] = t;
  return 1;
}

OEParseStatus OEInvTranList::HandleTagEnd(const OETagDictionaryEntry* const entry) {
  OEParseStatus status = OEAggregate::HandleTagEnd(entry);
  if (status == OE_PARSE_OK) BuildGenericInvTranList();
  return status;
}

unsigned short OEInvTranList::CopyAggregateFrom(const OEAggregate* source) {
  // The source's index points into the source's tree: the copy indexes its own.
  m_generic.clear();
  unsigned short result = OEAggregate::CopyAggregateFrom(source);
  const auto* list = dynamic_cast<const OEInvTranList*>(source);
  if (result && list && list != this && !list->m_generic.empty()) result = BuildGenericInvTranList();
  return result;
}
