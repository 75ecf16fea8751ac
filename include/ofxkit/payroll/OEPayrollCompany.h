// The company and its services: company information (and its modification
// form), contact, the state of the tax and direct-deposit services and the
// notices that end them.
#pragma once

#include "ofxkit/payroll/OEPayrollTypes.h"

// Name, address and telephone of a person or a company.
#define OE_PAYROLL_NAME_FIELDS(X)                       \
  X(PTEXT, First, V_FIRST, OEString32)                  \
  X(PTEXT, MiddleInitial, V_MI, OEString2)              \
  X(PTEXT, Last, V_LAST, OEString32)

#define OE_PAYROLL_PHONE_FIELDS(X)                      \
  X(PTEXT, Phone, V_PHONE, OEString32)                  \
  X(PTEXT, AltPhone, V_ALTPHONE, OEString32)            \
  X(PTEXT, Fax, V_FAX, OEString32)                      \
  X(PTEXT, EMail, V_EMAIL, OEString80)

#define OE_ADDRINFO_FIELDS(X)                           \
  OE_PAYROLL_NAME_FIELDS(X)                             \
  X(PTEXT, PrintAsName, V_PRINTASNAME, OEString64)      \
  X(PTEXT, Address1, V_ADDR1, OEString32)               \
  X(PTEXT, Address2, V_ADDR2, OEString32)               \
  X(PTEXT, City, V_CITY, OEString32)                    \
  X(PTEXT, County, V_COUNTY, OEString32)                \
  X(PTEXT, State, V_STATE, OEString5)                   \
  X(PTEXT, PostalCode, V_POSTALCODE, OEString11)        \
  OE_PAYROLL_PHONE_FIELDS(X)

class OEAddrInfo : public OEAggregate {
  OE_AGGREGATE(OEAddrInfo, OE_ADDRINFO_FIELDS)
};

#define OE_CONTACT_FIELDS(X)                            \
  OE_PAYROLL_NAME_FIELDS(X)                             \
  X(PTEXT, Title, V_TITLE, OEString32)                  \
  X(FLAG, Officer, V_OFFICER, unsigned short)           \
  OE_PAYROLL_PHONE_FIELDS(X)

class OEContact : public OEAggregate {
  OE_AGGREGATE(OEContact, OE_CONTACT_FIELDS)
};

#define OE_COMPANYINFO_FIELDS(X)                                        \
  X(PTEXT, LegalName, V_LEGALNAME, OEString64)                          \
  X(PTEXT, Name, V_NAME, OEString64)                                    \
  X(PTEXT, FEIN, V_FEIN, OEString11)                                    \
  X(CHILD, AddrInfo, V_ADDRINFO, OEAddrInfo)                            \
  X(CHILD, Contact, V_CONTACT, OEContact)                               \
  X(PTEXT, PrincipalName, V_PRINCNAME, OEString64)                      \
  X(PTEXT, W2Name, V_W2NAME, OEString64)                                \
  X(VALUE, PayrollType, V_PAYROLLTYPE, OEPayrollType)                   \
  X(VALUE, FederalPaymentFrequency, V_FEDPMTFREQ, OEFederalTaxPaymentFrequency) \
  X(PTEXT, SUITaxID, V_SUITAXID, OEString32)                            \
  X(PTEXT, RegistrationNumber, V_REGNUM, OEString32)                    \
  X(FLAG, FileYearEnd, V_FILEYREND, unsigned short)                     \
  X(PTEXT, TaxLawVersion, V_TAXLAWVER, OEString32)                      \
  X(PTEXT, TaxTableMiscData, V_TAXTBLMISCDATA, OEString255)             \
  X(FLAG, InterviewDone, V_INTERVIEWDONE, unsigned short)               \
  X(FLAG, TaxReady, V_TAXREADY, unsigned short)

class OECompanyInfo : public OEAggregate {
  OE_AGGREGATE(OECompanyInfo, OE_COMPANYINFO_FIELDS)
};

// The changes to the company information; it carries no identifier.
class OECompanyInfoMod : public OEAggregate {
  OE_AGGREGATE(OECompanyInfoMod, OE_COMPANYINFO_FIELDS)
};

// When and why a service ended.
#define OE_TERMINATION_FIELDS(X)                        \
  X(VALUE, DateTerminated, V_DTTERM, OEPayrollDateTime) \
  X(PTEXT, ReasonText, V_REASONTEXT, OEString255)

class OETerminationInfo : public OEAggregate {
  OE_AGGREGATE(OETerminationInfo, OE_TERMINATION_FIELDS)
};

// The client leaves the tax service, or direct deposit.
class OETaxServiceQuit : public OEAggregate {
  OE_AGGREGATE(OETaxServiceQuit, OE_TERMINATION_FIELDS)
};

class OEDirectDepositQuit : public OEAggregate {
  OE_AGGREGATE(OEDirectDepositQuit, OE_TERMINATION_FIELDS)
};

#define OE_TAXSERVICESTATUS_FIELDS(X)                          \
  X(CHILD, TerminationInfo, V_TERMINFO, OETerminationInfo)     \
  X(VALUE, TaxServiceMode, V_TAXSERVMODE, OETaxServiceMode)    \
  X(PTEXT, ReasonText, V_REASONTEXT, OEString255)              \
  X(VALUE, DateActive, V_DTACTIVE, OEPayrollDateTime)

class OETaxServiceStatus : public OEAggregate {
  OE_AGGREGATE(OETaxServiceStatus, OE_TAXSERVICESTATUS_FIELDS)
};

#define OE_DIRECTDEPOSITSTATUS_FIELDS(X)                        \
  X(VALUE, DirectDepositMode, V_DDMODE, OEDirectDepositMode)    \
  X(VALUE, Limit, V_LIMIT, OEPayrollAmount)                     \
  X(PTEXT, ReasonText, V_REASONTEXT, OEString255)

class OEDirectDepositStatus : public OEAggregate {
  OE_AGGREGATE(OEDirectDepositStatus, OE_DIRECTDEPOSITSTATUS_FIELDS)
};
