#pragma once

#include <memory>

#include "dbentity.hpp"
#include "dbselectquery.hpp"

// The validation record that an entity keeps for fetch requests: the engine's in-memory values of the
// record (dbcore::DBValidationRecord) together with the snapshot of the record they were taken from. It
// is a record itself, so that the entity stores it as its validation record; it answers the snapshot's
// table and columns. Setting columns changes the snapshot and drops the values, which are then taken
// afresh by the next test. Immutable once made otherwise; read from any thread.
class KRDBValidationRecordCarrier : public dbcore::DBEntity {
 public:
  using Values = std::shared_ptr<const dbcore::DBValidationRecord>;

  KRDBValidationRecordCarrier(std::shared_ptr<dbcore::DBEntity> snapshot, Values values);

  const std::shared_ptr<dbcore::DBEntity>& snapshot() const { return snapshot_; }
  // Empty once columns were set after the values were taken.
  const Values& values() const { return values_; }

  const char* table_name() const override;
  std::shared_ptr<dbcore::DBEntity> clone() const override;
  dbcore::ColumnValues column_values() const override;
  void set_column_values(const dbcore::ColumnValues& values) override;

 private:
  std::shared_ptr<dbcore::DBEntity> snapshot_;
  Values values_;
};
