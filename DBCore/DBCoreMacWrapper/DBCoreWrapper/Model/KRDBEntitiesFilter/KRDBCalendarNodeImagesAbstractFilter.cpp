#include "Model/KRDBEntitiesFilter/KRDBCalendarNodeImagesAbstractFilter.hpp"

#include <utility>

#include "KRFoundation/KRException.hpp"
#include "KRServices/KRLog.hpp"

void KRDBCalendarNodeImagesAbstractFilter::initWithBaseFilter(
    const std::shared_ptr<KRDBEntitiesFilter>& baseFilter) {
  baseFilter_ = baseFilter;
  if (baseFilter_) baseFilter_->addListener(selfPointer());
}

void KRDBCalendarNodeImagesAbstractFilter::obtainSortedByDateImagesWithHandler(
    SortedEntitiesHandler /*handler*/) {
  KRLog(KRLogLevelMissingOverride, "Error: %@ should be overrided in subclass",
        "obtainSortedByDateImagesWithHandler");
  KRException::raise(KRException::NSInvalidArgumentException,
                     "-[" + className() + " obtainSortedByDateImagesWithHandler:]: unrecognized selector");
}

void KRDBCalendarNodeImagesAbstractFilter::initiallyObtainFilteredEntities(EntitiesHandler completion) {
  obtainAdmittedEntitiesOf(baseFilter_, std::move(completion));
}

void KRDBCalendarNodeImagesAbstractFilter::entitiesFilterDidReset(
    const std::shared_ptr<KRDBEntitiesFilter>& /*filter*/) {
  reset();
}

void KRDBCalendarNodeImagesAbstractFilter::entitiesFilterDidChange(
    const std::shared_ptr<KRDBEntitiesFilter>& /*filter*/, const KRDictionary& info) {
  processChanges(changesOfInfo(info));
}
