#pragma once

#include "Model/KRDBEntity/KRDBEntityType.hpp"
#include "Model/KRDBFilteredEntitiesFetchRequest/KRDBRecordsFetchRequest.hpp"
#include "dbentityreffolderselectquery.hpp"
#include "dbreffolder.hpp"

// The request for every one of the referenced folders not marked to delete, tested in memory on their
// validation records. Thread rule of KRDBFilteredEntitiesFetchRequest.
class KRDBFilteredReffoldersFetchRequest final
    : public KRDBRecordsFetchRequest<KRDBFilteredReffoldersFetchRequest, dbcore::DBEntityReffolderSelectQuery,
                                     dbcore::DBRefFolder, KRDBEntityTypeReferencedFolder> {};
