#pragma once

#include "Model/KRDBEntity/KRDBEntityType.hpp"
#include "Model/KRDBFilteredEntitiesFetchRequest/KRDBRecordsFetchRequest.hpp"
#include "dbexivimgattrib.hpp"
#include "dbexivimgattribselectquery.hpp"

// The request for every one of the images' exif attributes not marked to delete, tested in memory on their
// validation records. Thread rule of KRDBFilteredEntitiesFetchRequest.
class KRDBFilteredImageExivAttributesFetchRequest final
    : public KRDBRecordsFetchRequest<KRDBFilteredImageExivAttributesFetchRequest,
                                     dbcore::DBExivImgAttribSelectQuery, dbcore::DBExivImgAttrib,
                                     KRDBEntityTypeImageExivAttributes> {};
