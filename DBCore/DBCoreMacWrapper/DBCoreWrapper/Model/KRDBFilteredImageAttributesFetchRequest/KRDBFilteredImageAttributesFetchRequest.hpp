#pragma once

#include "Model/KRDBEntity/KRDBEntityType.hpp"
#include "Model/KRDBFilteredEntitiesFetchRequest/KRDBRecordsFetchRequest.hpp"
#include "dbuserimgattrib.hpp"
#include "dbuserimgattribselectquery.hpp"

// The request for every one of the images' user attributes not marked to delete, tested in memory on their
// validation records. Thread rule of KRDBFilteredEntitiesFetchRequest.
class KRDBFilteredImageAttributesFetchRequest final
    : public KRDBRecordsFetchRequest<KRDBFilteredImageAttributesFetchRequest,
                                     dbcore::DBUserImgAttribSelectQuery, dbcore::DBUserImgAttrib,
                                     KRDBEntityTypeImageAttributes> {};
