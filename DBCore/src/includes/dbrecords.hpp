#pragma once

#include <tuple>

#include "dbentityfavoritealias.hpp"
#include "dbexivimgattrib.hpp"
#include "dbfilter.hpp"
#include "dbfilterattrib.hpp"
#include "dbimage.hpp"
#include "dbimghistorystate.hpp"
#include "dbpath.hpp"
#include "dbreffolder.hpp"
#include "dbreffolderattrib.hpp"
#include "dbresource.hpp"
#include "dbsmartfilter.hpp"
#include "dbsmartfilterattrib.hpp"
#include "dbuserimgattrib.hpp"
#include "dbvolume.hpp"

namespace dbcore {

// Every record type of the engine, one table each.
using DBRecordTypes = std::tuple<DBImage, DBFilter, DBResource, DBUserImgAttrib, DBExivImgAttrib,
                                 DBImgHistoryState, DBRefFolder, DBPath, DBRefFolderAttrib, DBFilterAttrib,
                                 DBEntityFavoriteAlias, DBSmartFilter, DBSmartFilterAttrib, DBVolume>;

}  // namespace dbcore
