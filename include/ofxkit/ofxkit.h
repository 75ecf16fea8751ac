// The whole ofxkit API.
#pragma once

#include "ofxkit/types/OECommon.h"
#include "ofxkit/types/OEString.h"
#include "ofxkit/types/OEBuffer.h"
#include "ofxkit/types/OEDynamicArray.h"
#include "ofxkit/types/OEPrecisionInteger.h"
#include "ofxkit/types/OEDateTime.h"
#include "ofxkit/types/OEDataConversion.h"
#include "ofxkit/types/OELanguage.h"
#include "ofxkit/types/OEUtility.h"

#include "ofxkit/core/OETagID.h"
#include "ofxkit/core/OETagDictionary.h"
#include "ofxkit/core/OEDataObj.h"
#include "ofxkit/core/OEDataObjFactory.h"
#include "ofxkit/core/OEBuilder.h"
#include "ofxkit/core/OEAggregate.h"

#include "ofxkit/messages/bank/OEAccount.h"
#include "ofxkit/messages/bank/OECurrency.h"

#include "ofxkit/parse/OEParseLogger.h"
#include "ofxkit/parse/OEParser.h"
#include "ofxkit/parse/OEParseEngine.h"
#include "ofxkit/parse/OESimpleParser.h"

#include "ofxkit/envelope/OETransBase.h"
