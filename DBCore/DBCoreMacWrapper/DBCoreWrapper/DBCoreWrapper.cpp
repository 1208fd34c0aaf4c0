#include "DBCoreWrapper.hpp"

const double DBCoreWrapperVersionNumber = 1.0;
const unsigned char DBCoreWrapperVersionString[] = "@(#)PROGRAM:DBCoreWrapper  PROJECT:DBCoreWrapper-1.0\n";
const char* const KRDBCoreWrapperBundleIdentifier = "com.kr.DBCoreWrapper";
