#include "ofxkit/payroll/OEPayrollCompany.h"

// Sub-records that a modification form may carry with any subset of their
// fields require nothing.
OE_DEFINE_AGGREGATE(OEAddrInfo, OEAggregate, OE_ADDRINFO_FIELDS, V_ADDRINFO,
                    .Valid(OE_TAGS(V_FIRST, V_MI, V_LAST, V_PRINTASNAME, V_ADDR1, V_ADDR2, V_CITY, V_COUNTY, V_STATE,
                                   V_POSTALCODE, V_PHONE, V_ALTPHONE, V_FAX, V_EMAIL)))
OE_DEFINE_AGGREGATE(OEContact, OEAggregate, OE_CONTACT_FIELDS, V_CONTACT,
                    .Valid(OE_TAGS(V_FIRST, V_MI, V_LAST, V_TITLE, V_OFFICER, V_PHONE, V_ALTPHONE, V_FAX, V_EMAIL)))

#define OE_COMPANYINFO_TAGS                                                                                  \
  OE_TAGS(V_LEGALNAME, V_NAME, V_FEIN, V_ADDRINFO, V_CONTACT, V_PRINCNAME, V_W2NAME, V_PAYROLLTYPE, V_FEDPMTFREQ, \
          V_SUITAXID, V_REGNUM, V_FILEYREND, V_TAXLAWVER, V_TAXTBLMISCDATA, V_INTERVIEWDONE, V_TAXREADY)
OE_DEFINE_AGGREGATE(OECompanyInfo, OEAggregate, OE_COMPANYINFO_FIELDS, V_COINFO,
                    .Valid(OE_COMPANYINFO_TAGS)
                    .Required(OE_TAGS(V_LEGALNAME, V_FEIN, V_ADDRINFO)))
OE_DEFINE_AGGREGATE(OECompanyInfoMod, OEAggregate, OE_COMPANYINFO_FIELDS, V_COINFOMOD, .Valid(OE_COMPANYINFO_TAGS))

OE_DEFINE_AGGREGATE(OETerminationInfo, OEAggregate, OE_TERMINATION_FIELDS, V_TERMINFO,
                    .Valid(OE_TAGS(V_DTTERM, V_REASONTEXT))
                    .Required(OE_TAGS(V_DTTERM)))
OE_DEFINE_AGGREGATE(OETaxServiceQuit, OEAggregate, OE_TERMINATION_FIELDS, V_TAXSERVQUIT,
                    .Valid(OE_TAGS(V_DTTERM, V_REASONTEXT)))
OE_DEFINE_AGGREGATE(OEDirectDepositQuit, OEAggregate, OE_TERMINATION_FIELDS, V_DDQUIT,
                    .Valid(OE_TAGS(V_DTTERM, V_REASONTEXT)))

OE_DEFINE_AGGREGATE(OETaxServiceStatus, OEAggregate, OE_TAXSERVICESTATUS_FIELDS, V_TAXSERVSTATUS,
                    .Valid(OE_TAGS(V_TERMINFO, V_TAXSERVMODE, V_REASONTEXT, V_DTACTIVE))
                    .Required(OE_TAGS(V_TAXSERVMODE)))
OE_DEFINE_AGGREGATE(OEDirectDepositStatus, OEAggregate, OE_DIRECTDEPOSITSTATUS_FIELDS, V_DDSTATUS,
                    .Valid(OE_TAGS(V_DDMODE, V_LIMIT, V_REASONTEXT))
                    .Required(OE_TAGS(V_DDMODE)))
