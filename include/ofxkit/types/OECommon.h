// Shared result codes, warning codes and process-wide flags of the library.
#pragma once

#include <cstdint>

class OEBuffer;
class OEBuilder;
class OEDataObj;
class OEDataObjFactory;
class OEParser;
class OEString;

// Result of every parse handler and of a whole parse.
enum OEParseStatus : int32_t {
  OE_PARSE_OK = 0,
  OE_PARSE_NO_PARSER = 3,
  OE_PARSE_NOT_HANDLED = 4,
  OE_PARSE_END_MISMATCH = 5,
  OE_PARSE_PUSH_FAILED = 6,
  OE_PARSE_WARNINGS = 7
};

// Result of every build operation.
enum OEBuildStatus : int32_t {
  OE_BUILD_OK = 0,
  OE_BUILD_NO_MEMORY = 1,
  OE_BUILD_BAD_VALUE = 2,
  OE_BUILD_NO_OUTPUT = 3,
  OE_BUILD_NO_VALUE = 4,
  OE_BUILD_TOO_LONG = 5,
  OE_BUILD_REPEATED_SET = 7,
  OE_BUILD_INVALID_STRING = 8,
  OE_BUILD_MISSING_REQUIRED = 9
};

// Codes of the soft errors kept in the parse log.
enum OEParseWarning : int32_t {
  OEPW_UNKNOWNEXCEPTION = 0,
  OEPW_UNKNOWNTAG = 1,
  OEPW_INVALIDAGG = 2,
  OEPW_INVALIDELEM = 3,
  OEPW_BADFORMAT = 4,
  OEPW_OUTOFRANGE = 5,
  OEPW_TOOLONG = 6,
  OEPW_SKIPFAILED = 7,
  OEPW_NULLPOINTER = 8,
  OEPW_INVALIDENDAGG = 9,
  OEPW_MISSINGTAG = 10,
  OEPW_LOWERCASE = 11,
  OEPW_EXTRAAGG = 12
};

// Set to 1 by any part of the library whose allocation fails; a build or a
// parse clears it when it starts and reports it as its out-of-memory status.
extern unsigned short g_allocFailed;
