#include "Model/KRDBFilteredEntitiesFetchRequest/KRDBValidationRecordCarrier.hpp"

#include <utility>

KRDBValidationRecordCarrier::KRDBValidationRecordCarrier(std::shared_ptr<dbcore::DBEntity> snapshot,
                                                         Values values)
    : dbcore::DBEntity(snapshot->type()), snapshot_(std::move(snapshot)), values_(std::move(values)) {
  set_id(snapshot_->id());
  set_marked_to_delete(snapshot_->marked_to_delete());
}

const char* KRDBValidationRecordCarrier::table_name() const { return snapshot_->table_name(); }

std::shared_ptr<dbcore::DBEntity> KRDBValidationRecordCarrier::clone() const {
  return std::make_shared<KRDBValidationRecordCarrier>(snapshot_->clone(), values_);
}

dbcore::ColumnValues KRDBValidationRecordCarrier::column_values() const { return snapshot_->column_values(); }

void KRDBValidationRecordCarrier::set_column_values(const dbcore::ColumnValues& values) {
  snapshot_->set_column_values(values);
  set_id(snapshot_->id());
  set_marked_to_delete(snapshot_->marked_to_delete());
  values_.reset();
}
