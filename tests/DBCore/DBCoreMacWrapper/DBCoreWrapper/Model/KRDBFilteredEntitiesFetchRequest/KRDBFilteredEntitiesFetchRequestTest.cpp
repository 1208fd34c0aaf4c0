#include "Model/KRDBFilteredEntitiesFetchRequest/KRDBFilteredEntitiesFetchRequest.hpp"

#include <gtest/gtest.h>

#include <atomic>
#include <thread>

#include "KREntityObserverRecorder.hpp"
#include "KRFoundation/KRException.hpp"
#include "KRRecordingEntityContext.hpp"
#include "KRServices/KRCapturingLogSink.hpp"
#include "Model/KRDBEntity/KRDBEntityClasses.hpp"
#include "Model/KRDBFilteredEntitiesFetchRequest/KRDBValidationRecordCarrier.hpp"
#include "Model/KRDBPath/KRDBPath.hpp"
#include "Model/KRDBVolume/KRDBVolume.hpp"
#include "dbpath.hpp"
#include "dbvolume.hpp"
#include "dbvolumeselectquery.hpp"

namespace {

const char* const kSource =
    "DBCore/DBCoreMacWrapper/DBCoreWrapper/Model/KRDBFilteredEntitiesFetchRequest/"
    "KRDBFilteredEntitiesFetchRequest";

// A request that overrides nothing.
class KRUnfinishedFetchRequest : public KRDBFilteredEntitiesFetchRequest {
 public:
  KRUnfinishedFetchRequest() = default;
};

// A request over volumes that counts the queries it makes.
class KRCountingFetchRequest : public KRDBFilteredEntitiesFetchRequest {
 public:
  KRCountingFetchRequest() = default;
  int64_t entityType() const override { return KRDBEntityTypeVolume; }
  SelectQueryPtr makeSelectQuery() override {
    ++made;
    return notMarkedToDeleteQuery<dbcore::DBVolumeSelectQuery, dbcore::DBVolume>("uuid_wide_ch != 'skip'");
  }
  int made = 0;
};

// A context that tells whether it is closing.
class KRClosingContext : public KRRecordingEntityContext, public KRDBClosingEntityContext {
 public:
  bool isWaitingForClose() const override { return waiting; }
  bool waiting = false;
};

std::shared_ptr<KRDBVolume> volume(int64_t id, const std::wstring& uuid, bool markedToDelete = false) {
  auto record = std::make_shared<dbcore::DBVolume>();
  record->set_id(id);
  record->uuid = uuid;
  record->set_marked_to_delete(markedToDelete);
  return KRDBVolume::initWithDBEntity(record);
}

class KRDBFilteredEntitiesFetchRequestTest : public testing::Test {
 protected:
  void SetUp() override { KRDBEntityClasses::registerAll(); }

  std::shared_ptr<KRCountingFetchRequest> request = std::make_shared<KRCountingFetchRequest>();
};

TEST_F(KRDBFilteredEntitiesFetchRequestTest, TheAbstractOperationsLogTheMissingOverrideAndRaise) {
  const KRCapturingLogSink sink;
  const auto unfinished = std::make_shared<KRUnfinishedFetchRequest>();
  try {
    unfinished->entityType();
    FAIL() << "entityType did not raise";
  } catch (const KRException& exception) {
    EXPECT_EQ(exception.name(), KRException::NSInvalidArgumentException);
  }
  EXPECT_THROW(unfinished->selectQuery(), KRException);
  const auto records = sink.records();
  ASSERT_EQ(records.size(), 2u);
  EXPECT_EQ(records[0].level, 1);
  EXPECT_EQ(records[0].sourcePath, kSource);
  EXPECT_EQ(records[0].function, "entityType");
  EXPECT_EQ(records[0].message, "Error: entityType should be overrided in subclass");
  EXPECT_EQ(records[1].level, 1);
  EXPECT_EQ(records[1].sourcePath, kSource);
  EXPECT_EQ(records[1].function, "makeSelectQuery");
  EXPECT_EQ(records[1].message, "Error: makeSelectQuery should be overrided in subclass");
}

TEST_F(KRDBFilteredEntitiesFetchRequestTest, TheQueryIsMadeOnceUntilReset) {
  const auto first = request->selectQuery();
  ASSERT_TRUE(first);
  EXPECT_EQ(request->selectQuery(), first);
  EXPECT_EQ(request->made, 1);
  request->reset();
  const auto second = request->selectQuery();
  EXPECT_NE(second, first);
  EXPECT_EQ(request->made, 2);
  EXPECT_EQ(second->table(), "volumes");
}

TEST_F(KRDBFilteredEntitiesFetchRequestTest, TheTestEvaluatesTheQueryOnTheValidationRecord) {
  EXPECT_TRUE(request->isEntitySatisfyingFilterConditions(volume(1, L"keep")));
  EXPECT_FALSE(request->isEntitySatisfyingFilterConditions(volume(2, L"skip")));
  EXPECT_FALSE(request->isEntitySatisfyingFilterConditions(volume(3, L"keep", true)));
  EXPECT_FALSE(request->isEntitySatisfyingFilterConditions(nullptr));
}

TEST_F(KRDBFilteredEntitiesFetchRequestTest, TheValidationRecordIsTakenOnceAndStoredOnTheEntity) {
  const auto entity = volume(4, L"keep");
  const auto recorder = KREntityObserverRecorder::observing(*entity);
  ASSERT_TRUE(request->isEntitySatisfyingFilterConditions(entity));
  const auto carrier = std::dynamic_pointer_cast<KRDBValidationRecordCarrier>(entity->validationRecord());
  ASSERT_TRUE(carrier);
  ASSERT_TRUE(carrier->values());
  EXPECT_NE(carrier->snapshot(), entity->dbentity());
  EXPECT_EQ(recorder->kinds(), std::vector<std::string>{"validationRecordDidSet"});
  // The stored values answer while the record itself changes: they are what the entity was when tested.
  std::dynamic_pointer_cast<dbcore::DBVolume>(entity->dbentity())->uuid = L"skip";
  EXPECT_TRUE(request->isEntitySatisfyingFilterConditions(entity));
  EXPECT_EQ(entity->validationRecord(), carrier);
  entity->resetValidationRecord();
  EXPECT_FALSE(request->isEntitySatisfyingFilterConditions(entity));
}

TEST_F(KRDBFilteredEntitiesFetchRequestTest, AnEntityOfAnotherTypeIsRejectedAfterItsValidationRecordIsTaken) {
  auto record = std::make_shared<dbcore::DBPath>();
  record->set_id(1);
  record->path = L"/a";
  const auto path = KRDBPath::initWithDBEntity(record);
  EXPECT_FALSE(request->isEntitySatisfyingFilterConditions(path));
  EXPECT_TRUE(path->validationRecord());
}

TEST_F(KRDBFilteredEntitiesFetchRequestTest, AnEntityOfAClosingContextIsRejected) {
  const auto context = std::make_shared<KRClosingContext>();
  const auto entity = volume(5, L"keep");
  entity->setContext(context);
  EXPECT_TRUE(request->isEntitySatisfyingFilterConditions(entity));
  context->waiting = true;
  EXPECT_FALSE(request->isEntitySatisfyingFilterConditions(entity));
}

TEST_F(KRDBFilteredEntitiesFetchRequestTest, TheCarrierAnswersItsSnapshotAndDropsItsValuesWhenSet) {
  const auto entity = volume(6, L"keep");
  ASSERT_TRUE(request->isEntitySatisfyingFilterConditions(entity));
  const auto carrier = std::dynamic_pointer_cast<KRDBValidationRecordCarrier>(entity->validationRecord());
  ASSERT_TRUE(carrier);
  EXPECT_STREQ(carrier->table_name(), "volumes");
  EXPECT_EQ(carrier->id(), 6);
  EXPECT_EQ(carrier->type(), dbcore::kDBVolumeType);
  EXPECT_EQ(carrier->column_values(), entity->dbentity()->column_values());
  const auto copy = std::dynamic_pointer_cast<KRDBValidationRecordCarrier>(carrier->clone());
  ASSERT_TRUE(copy);
  EXPECT_EQ(copy->values(), carrier->values());
  EXPECT_NE(copy->snapshot(), carrier->snapshot());
  copy->set_column_values({{"uuid_wide_ch", dbcore::TVariant(std::wstring(L"skip"))}});
  EXPECT_FALSE(copy->values());
  EXPECT_EQ(std::dynamic_pointer_cast<dbcore::DBVolume>(copy->snapshot())->uuid, L"skip");
  // An entity whose carrier lost its values is tested afresh, on its own record.
  entity->setValidationRecord(copy);
  EXPECT_TRUE(request->isEntitySatisfyingFilterConditions(entity));
  EXPECT_NE(entity->validationRecord(), copy);
}

TEST_F(KRDBFilteredEntitiesFetchRequestTest, TheTestAnswersTheSameFromSeveralThreadsAtOnce) {
  constexpr int kThreads = 4;
  constexpr int kPerThread = 200;
  std::vector<std::vector<std::shared_ptr<KRDBVolume>>> volumes(kThreads);
  for (int thread = 0; thread < kThreads; ++thread) {
    for (int index = 0; index < kPerThread; ++index) {
      volumes[thread].push_back(volume(thread * kPerThread + index + 1, index % 3 == 0 ? L"skip" : L"keep"));
    }
  }
  std::atomic<int> wrong = 0;
  std::vector<std::thread> threads;
  for (int thread = 0; thread < kThreads; ++thread) {
    threads.emplace_back([&, thread] {
      for (int pass = 0; pass < 3; ++pass) {
        for (int index = 0; index < kPerThread; ++index) {
          const bool expected = index % 3 != 0;
          if (request->isEntitySatisfyingFilterConditions(volumes[thread][index]) != expected) ++wrong;
        }
      }
    });
  }
  for (auto& thread : threads) thread.join();
  EXPECT_EQ(wrong.load(), 0);
  EXPECT_EQ(request->made, 1);
}

}  // namespace
