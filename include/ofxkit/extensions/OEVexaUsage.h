// The maker's log and survey message sets: client logs
// ("VEXA.CLIENTLOGRQ"), institution and customer usage logs
// ("VEXA.FIUSAGELOGRQ", "VEXA.CUUSAGELOGRQ") and surveys ("VEXA.SURVEYRQ"),
// with the descriptions they share of the client platform, the customer and
// the OFX traffic. They carry information from the client to the maker; the
// answers hold only a status, so these sets have no inner responses.
#pragma once

#include "ofxkit/core/OEAggregate.h"
#include "ofxkit/envelope/OETransBase.h"
#include "ofxkit/extensions/OEVexaDataConversion.h"
#include "ofxkit/messages/billpay/OEPayee.h"

#define OE_VEXASWINFO_FIELDS(X)                               \
  X(TEXT, VexaProductCode, VEXA_PDTCODE, OEString)            \
  X(TEXT, VexaProductPackageCode, VEXA_PDTPKGCODE, OEString)  \
  X(TEXT, VexaMedia, VEXA_MEDIA, OEString)                    \
  X(TEXT, VexaSoftwareVersion, VEXA_SWVERSION, OEString)      \
  X(TEXT, VexaSoftwarePlatform, VEXA_SWPLATFORM, OEString)    \
  X(TEXT, VexaOEM, VEXA_OEM, OEString)                        \
  X(TEXT, VexaMacProductCode, VEXA_MACSPDTCODE, OEString)

// The client software ("VEXA.SWINFO").
class OEVexaSwInfo : public OEAggregate {
  OE_AGGREGATE(OEVexaSwInfo, OE_VEXASWINFO_FIELDS)
};

#define OE_VEXAHWINFO_FIELDS(X)                                     \
  X(TEXT, VexaHardwarePlatform, VEXA_HWPLATFORM, OEString)          \
  X(TEXT, VexaManufacturer, VEXA_MFG, OEString)                     \
  X(TEXT, VexaColor, VEXA_COLOR, OEString)                          \
  X(TEXT, VexaScreenResolution, VEXA_SCREENRESOLUTION, OEString)    \
  X(TEXT, VexaModemSpeed, VEXA_MODEMSPD, OEString)                  \
  X(TEXT, VexaCPU, VEXA_CPU, OEString)                              \
  X(TEXT, VexaRAM, VEXA_RAM, OEString)

// The machine it runs on ("VEXA.HWINFO").
class OEVexaHwInfo : public OEAggregate {
  OE_AGGREGATE(OEVexaHwInfo, OE_VEXAHWINFO_FIELDS)
};

#define OE_VEXAOSINFO_FIELDS(X)                          \
  X(TEXT, VexaOS, VEXA_OS, OEString)                     \
  X(TEXT, VexaOSVersion, VEXA_OSVERSION, OEString)       \
  X(TEXT, VexaOSRelease, VEXA_OSRELEASE, OEString)

// Its operating system ("VEXA.OSINFO").
class OEVexaOsInfo : public OEAggregate {
  OE_AGGREGATE(OEVexaOsInfo, OE_VEXAOSINFO_FIELDS)
};

#define OE_VEXAINTCONFIG_FIELDS(X)                                                  \
  X(TEXT, VexaBrowser, VEXA_BROWSER, OEString)                                      \
  X(TEXT, VexaHttpsKeySize, VEXA_HTTPSKEYSIZE, OEString)                            \
  X(TEXT, VexaHttpProxy, VEXA_HTTPPROXY, OEString)                                  \
  X(TEXT, VexaServerURL, VEXA_SERVERURL, OEString)                                  \
  X(TEXT, VexaServerCN, VEXA_SERVERCN, OEString)                                    \
  X(TEXT, VexaServerCA, VEXA_SERVERCA, OEString)                                    \
  X(TEXT, VexaExpiredCertificate, VEXA_EXPIREDCERTIFICATE, OEString)                \
  X(TEXT, VexaInvalidCertificate, VEXA_INVALIDCERTIFICATE, OEString)                \
  X(TEXT, VexaInvalidCertificateAuth, VEXA_INVALIDCERTIFICATEAUTH, OEString)

// How it reaches the internet, and what it met there ("VEXA.INTERNETCONFIG").
class OEVexaIntConfig : public OEAggregate {
  OE_AGGREGATE(OEVexaIntConfig, OE_VEXAINTCONFIG_FIELDS)
};

#define OE_VEXAPLATFORMINFO_FIELDS(X)                                \
  X(CHILD, SwInfo, VEXA_SWINFO, OEVexaSwInfo)                        \
  X(CHILD, HwInfo, VEXA_HWINFO, OEVexaHwInfo)                        \
  X(CHILD, OsInfo, VEXA_OSINFO, OEVexaOsInfo)                        \
  X(CHILD, IntConfig, VEXA_INTERNETCONFIG, OEVexaIntConfig)

// The client platform ("VEXA.PLATFORMINFO"): software, hardware, operating
// system and internet configuration; the software is required.
class OEVexaPlatformInfo : public OEAggregate {
  OE_AGGREGATE(OEVexaPlatformInfo, OE_VEXAPLATFORMINFO_FIELDS)
};

#define OE_VEXAOFXMESSAGE_FIELDS(X)                     \
  X(TEXT, VexaMessage, VEXA_MESSAGE, OEString)          \
  X(VALUE, VexaStatus, VEXA_MSGSTATUS, int32_t)

// One OFX message sent and the status it met ("VEXA.OFXMESSAGE").
class OEVexaOfxMessage : public OEAggregate {
  OE_AGGREGATE(OEVexaOfxMessage, OE_VEXAOFXMESSAGE_FIELDS)
};

#define OE_VEXAOFXMSGSETINFO_FIELDS(X)                                  \
  X(LIST, VexaOfxMessage, VEXA_OFXMESSAGE, OEVexaOfxMessage)            \
  X(TEXT, VexaOfxMsgSet, VEXA_OFXMSGSET, OEString)                      \
  X(TEXT, VexaVersion, VEXA_VERSION, OEString)

// The messages sent in one message set ("VEXA.OFXMSGSETINFO").
class OEVexaOfxMsgSetInfo : public OEAggregate {
  OE_AGGREGATE(OEVexaOfxMsgSetInfo, OE_VEXAOFXMSGSETINFO_FIELDS)
};

#define OE_VEXACUSTINFO_FIELDS(X)                                  \
  X(VALUE, VexaCustTypeEnum, VEXA_CUSTTYPE, OEVexaCustType)        \
  X(TEXT, FirstName, FIRSTNAME, OEString)                          \
  X(TEXT, LastName, LASTNAME, OEString)                            \
  X(TEXT, MiddleName, MIDDLENAME, OEString)                        \
  X(TEXT, DayPhone, DAYPHONE, OEString)                            \
  X(TEXT, EveningPhone, EVEPHONE, OEString)                        \
  OE_ADDRESS_FIELDS(X)                                             \
  X(TEXT, VexaBirthYear, VEXA_BIRTHYEAR, OEString)                 \
  X(TEXT, VexaSex, VEXA_SEX, OEString)                             \
  X(TEXT, VexaEMail, VEXA_EMAIL, OEString)                         \
  X(VALUE, Language, LANGUAGE, OELanguage)                         \
  X(TEXT, VexaCanSell, VEXA_CANSELL, OEString)                     \
  X(VALUE, VexaDtRegister, VEXA_DTREGISTER, OEDateTime)

// The customer ("VEXA.CUSTINFO").
class OEVexaCustInfo : public OEAggregate {
  OE_AGGREGATE(OEVexaCustInfo, OE_VEXACUSTINFO_FIELDS)

  // The customer type as its text ("SMALLBUSINESS"); empty when absent.
  OEString GetVexaCustType() const;
  // Sets the customer type from its text, as a parse would.
  unsigned short SetVexaCustType(const OEString& text) { return SetVexaCustTypeEnum(text); }
};

#define OE_VEXASBUSINESSINFO_FIELDS(X)                              \
  X(CHILD, CustInfo, VEXA_CUSTINFO, OEVexaCustInfo)                 \
  X(TEXT, VexaCompanyName, VEXA_COMPANYNAME, OEString)              \
  X(TEXT, VexaBusinessPhone, VEXA_BUSINESSPHONE, OEString)          \
  X(TEXT, VexaBusinessType, VEXA_BUSINESSTYPE, OEString)            \
  X(TEXT, VexaBusinessCategory, VEXA_BUSINESSCAT, OEString)         \
  X(TEXT, VexaTaxExempt, VEXA_TAXEXEMPT, OEString)                  \
  X(TEXT, VexaBusinessFax, VEXA_BUSINESSFAX, OEString)

// A small-business customer ("VEXA.SBUSINESSINFO").
class OEVexaSBusinessInfo : public OEAggregate {
  OE_AGGREGATE(OEVexaSBusinessInfo, OE_VEXASBUSINESSINFO_FIELDS)
};

// What every usage entry holds: the OFX traffic, the platform, when, and the
// HTTP status met.
#define OE_VEXA_USAGE_FIELDS(X)                                         \
  X(LIST, OfxMsgSetInfo, VEXA_OFXMSGSETINFO, OEVexaOfxMsgSetInfo)       \
  X(CHILD, PlatformInfo, VEXA_PLATFORMINFO, OEVexaPlatformInfo)         \
  X(TEXT, VexaSessionID, VEXA_SESSIONID, OEString)                      \
  X(VALUE, DateStart, DTSTART, OEDateTime)                              \
  X(VALUE, DateEnd, DTEND, OEDateTime)                                  \
  X(VALUE, VexaStatus, VEXA_HTTPSTATUS, int32_t)

#define OE_VEXAFIUSAGE_FIELDS(X)                        \
  OE_VEXA_USAGE_FIELDS(X)                               \
  X(TEXT, VexaUID2, VEXA_UID2, OEString)                \
  X(VALUE, VexaBID, VEXA_BID, uint32_t)                 \
  X(TEXT, URL, URL, OEString)                           \
  X(TEXT, VexaSP, VEXA_SP, OEString)                    \
  X(TEXT, PostalCode, POSTALCODE, OEString)

// One session with an institution's server ("VEXA.FIUSAGE").
class OEVexaFiUsage : public OEAggregate {
  OE_AGGREGATE(OEVexaFiUsage, OE_VEXAFIUSAGE_FIELDS)
};

#define OE_VEXACUUSAGE_FIELDS(X)                         \
  OE_VEXA_USAGE_FIELDS(X)                                \
  X(CHILD, CustInfo, VEXA_CUSTINFO, OEVexaCustInfo)      \
  X(TEXT, VexaRegID, VEXA_REGID, OEString)

// One session of a registered customer ("VEXA.CUUSAGE").
class OEVexaCuUsage : public OEAggregate {
  OE_AGGREGATE(OEVexaCuUsage, OE_VEXACUUSAGE_FIELDS)
};

#define OE_VEXAFIUSAGELOGRQ_FIELDS(X) X(LIST, VexaFiUsage, VEXA_FIUSAGE, OEVexaFiUsage)

class OEVexaFiUsageLogRQ : public OETransBase {
  OE_AGGREGATE(OEVexaFiUsageLogRQ, OE_VEXAFIUSAGELOGRQ_FIELDS)
  using OETransBase::DeepCopyFrom;
  unsigned short GetNumFiUsage() const { return GetNumVexaFiUsage(); }
};

#define OE_VEXACUUSAGELOGRQ_FIELDS(X) X(LIST, VexaCuUsage, VEXA_CUUSAGE, OEVexaCuUsage)

class OEVexaCuUsageLogRQ : public OETransBase {
  OE_AGGREGATE(OEVexaCuUsageLogRQ, OE_VEXACUUSAGELOGRQ_FIELDS)
  using OETransBase::DeepCopyFrom;
  unsigned short GetNumCuUsage() const { return GetNumVexaCuUsage(); }
};

#define OE_VEXACLIENTLOGRQ_FIELDS(X)                                  \
  X(LIST, PlatformInfo, VEXA_PLATFORMINFO, OEVexaPlatformInfo)        \
  X(TEXT, VexaRegID, VEXA_REGID, OEString)

class OEVexaClientLogRq : public OETransBase {
  OE_AGGREGATE(OEVexaClientLogRq, OE_VEXACLIENTLOGRQ_FIELDS)
  using OETransBase::DeepCopyFrom;
};

#define OE_VEXASURVEYITEM_FIELDS(X)                          \
  X(TEXT, VexaQuestionLabel, VEXA_QSTLABEL, OEString)        \
  X(TEXT, VexaAnswerLabel, VEXA_ASWLABEL, OEString)          \
  X(TEXT, VexaAdditionalAnswer, VEXA_ADDASW, OEString)

// One question and its answer ("VEXA.SURVEYITEM").
class OEVexaSurveyItem : public OEAggregate {
  OE_AGGREGATE(OEVexaSurveyItem, OE_VEXASURVEYITEM_FIELDS)
};

#define OE_VEXASURVEYINFO_FIELDS(X)                             \
  X(LIST, SurveyItem, VEXA_SURVEYITEM, OEVexaSurveyItem)        \
  X(TEXT, VexaSurveyID, VEXA_SURVEYID, OEString)

// A survey's answers ("VEXA.SURVEYINFO").
class OEVexaSurveyInfo : public OEAggregate {
  OE_AGGREGATE(OEVexaSurveyInfo, OE_VEXASURVEYINFO_FIELDS)
};

#define OE_VEXASURVEYRQ_FIELDS(X)                               \
  X(CHILD, SurveyInfo, VEXA_SURVEYINFO, OEVexaSurveyInfo)       \
  X(TEXT, VexaRegID, VEXA_REGID, OEString)

class OEVexaSurveyRq : public OETransBase {
  OE_AGGREGATE(OEVexaSurveyRq, OE_VEXASURVEYRQ_FIELDS)
  using OETransBase::DeepCopyFrom;
};
