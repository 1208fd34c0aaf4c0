#pragma once

#include "Model/KRDBEntity/KRDBEntityType.hpp"
#include "Model/KRDBFilteredEntitiesFetchRequest/KRDBRecordsFetchRequest.hpp"
#include "dbvolume.hpp"
#include "dbvolumeselectquery.hpp"

// The request for every one of the volumes not marked to delete, tested in memory on their validation
// records. Thread rule of KRDBFilteredEntitiesFetchRequest.
class KRDBFilteredVolumesFetchRequest final
    : public KRDBRecordsFetchRequest<KRDBFilteredVolumesFetchRequest, dbcore::DBVolumeSelectQuery,
                                     dbcore::DBVolume, KRDBEntityTypeVolume> {};
