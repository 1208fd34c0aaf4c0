#pragma once

#include "Model/KRDBEntity/KRDBEntityType.hpp"
#include "Model/KRDBFilteredEntitiesFetchRequest/KRDBRecordsFetchRequest.hpp"
#include "dbpath.hpp"
#include "dbpathselectquery.hpp"

// The request for every one of the folder paths not marked to delete, tested in memory on their validation
// records. Thread rule of KRDBFilteredEntitiesFetchRequest.
class KRDBFilteredPathsFetchRequest final
    : public KRDBRecordsFetchRequest<KRDBFilteredPathsFetchRequest, dbcore::DBPathSelectQuery, dbcore::DBPath,
                                     KRDBEntityTypePath> {};
