#pragma once

// The object layer's version and identity.
extern const double DBCoreWrapperVersionNumber;
extern const unsigned char DBCoreWrapperVersionString[];
// The identifier of the bundle that holds the catalog classes: the prefix of the catalog queues' names.
extern const char* const KRDBCoreWrapperBundleIdentifier;
