// Threads started through the framework inherit the broker context (and
// attach/detach around their work); up-calls through cimom reach the broker.
#include <atomic>
#include <thread>

#include "framework/Converter.h"
#include "framework/Thread.h"
#include "framework/cimom.h"
#include "tests/adapter/Adapter_Fixture.h"

namespace test {
namespace {

class Threads : public Adapter_Test {
 protected:
  void SetUp() override {
    Adapter_Test::SetUp();
    instance_mi(card_slot());
    frame_ = std::make_unique<CMPI_Thread_Context>(broker_.get(), context_, card_slot().record->adapter);
    Thread_Context::push(frame_.get());
  }
  void TearDown() override {
    EXPECT_EQ(Thread_Context::pop(), frame_.get());
    Adapter_Test::TearDown();
  }
  std::unique_ptr<CMPI_Thread_Context> frame_;
};

struct Seen {
  bool had_context = false;
  bool cmpi_context = false;
  std::string user;
};

void* look_around(void* arg) {
  auto* seen = static_cast<Seen*>(arg);
  Thread_Context* top = Thread_Context::top();
  seen->had_context = top != nullptr;
  seen->cmpi_context = dynamic_cast<CMPI_Thread_Context*>(top) != nullptr;
  cimom::get_username(seen->user);
  return arg;
}

TEST_F(Threads, AStartedThreadAttachesRunsWithAContextAndDetaches) {
  Seen seen;
  Thread thread;
  ASSERT_EQ(Thread::create_joinable(thread, look_around, &seen), 0);
  void* value = nullptr;
  ASSERT_EQ(Thread::join(thread, value), 0);
  EXPECT_EQ(value, &seen);
  EXPECT_TRUE(seen.had_context);
  EXPECT_TRUE(seen.cmpi_context);
  EXPECT_EQ(seen.user, "attached");  // the context the broker prepared for the thread
  EXPECT_EQ(broker_.prepared, 1);
  EXPECT_EQ(broker_.attached, 1);
  EXPECT_EQ(broker_.detached, 1);
  EXPECT_EQ(Thread_Context::top(), frame_.get());
  EXPECT_NE(Thread::join(thread, value), 0);  // joined once only
}

TEST_F(Threads, AThreadStartedWithoutAContextRunsBare) {
  Thread_Context::pop();
  Seen seen;
  Thread thread;
  ASSERT_EQ(Thread::create_joinable(thread, look_around, &seen), 0);
  void* value = nullptr;
  ASSERT_EQ(Thread::join(thread, value), 0);
  EXPECT_FALSE(seen.had_context);
  EXPECT_EQ(broker_.prepared, 0);
  EXPECT_EQ(broker_.attached, 0);
  Thread_Context::push(frame_.get());
}

std::atomic<int> g_detached_runs{0};
void* count_run(void*) {
  ++g_detached_runs;
  return nullptr;
}

TEST_F(Threads, ADetachedThreadAlsoAttachesAndDetaches) {
  ASSERT_EQ(Thread::create_detached(count_run, nullptr), 0);
  while (g_detached_runs.load() == 0 || broker_.detached == 0) sched_yield();
  EXPECT_EQ(broker_.attached, 1);
}

TEST_F(Threads, UpCallsReachTheBroker) {
  broker_.enumerate_instances = [this](const CMPIObjectPath*) {
    std::vector<CMPIInstance*> answer;
    for (const char* tag : {"H1", "H2"}) {
      Instance* card = make_card(tag);
      CMPI_Ptr<CMPIInstance> made;
      make_cmpi_instance(broker_.get(), card, "root/kvlhost", nullptr, nullptr, made);
      answer.push_back(made.release());
      unref(card);
    }
    return answer;
  };
  Instance* model = NRVTAVO_Card::create();
  std::unique_ptr<Instance_Cursor> cursor = cimom::enum_instances("root/kvlhost", model);
  ASSERT_NE(cursor, nullptr);
  std::vector<std::string> tags;
  while (Instance* next = cursor->next()) {
    tags.push_back(static_cast<NRVTAVO_Card*>(next)->Tag.value.str());
    EXPECT_EQ(next->__name_space, "root/kvlhost");
    unref(next);
  }
  cursor.reset();
  EXPECT_EQ(tags, (std::vector<std::string>{"H1", "H2"}));
  EXPECT_EQ(cimom::enum_instances(nullptr, model), nullptr);

  NRVTAVO_Card* card = make_card("H9");
  EXPECT_EQ(cimom::create_instance("root/kvlhost", card), 0);
  EXPECT_EQ(cimom::modify_instance("root/kvlhost", card), 0);
  EXPECT_EQ(cimom::delete_instance("root/kvlhost", card), 0);
  EXPECT_EQ(cimom::create_instance("root/kvlhost", nullptr), -1);
  EXPECT_EQ(broker_.created, (std::vector<std::string>{"NRVTAVO_Card"}));
  EXPECT_EQ(broker_.deleted.size(), 1u);

  broker_.get_instance = [this, card](const CMPIObjectPath*, CMPIStatus*) {
    CMPI_Ptr<CMPIInstance> made;
    make_cmpi_instance(broker_.get(), card, "root/kvlhost", nullptr, nullptr, made);
    return made.release();
  };
  Instance* fetched = cimom::get_instance("root/kvlhost", card);
  ASSERT_NE(fetched, nullptr);
  EXPECT_TRUE(key_eq(fetched, card));
  unref(fetched);
  unref(card);
  unref(model);
}

TEST_F(Threads, TheUserNameComesFromThePrincipalOrIsReportedMissing) {
  std::string user;
  EXPECT_TRUE(cimom::get_username(user));
  EXPECT_EQ(user, "alice");
  CMPIContext* anonymous = fake::new_context(nullptr);
  {
    CMPI_Thread_Context bare(broker_.get(), anonymous, static_cast<CMPI_Adapter*>(nullptr));
    Thread_Context::push(&bare);
    EXPECT_FALSE(cimom::get_username(user));
    Thread_Context::pop();
  }
  CMRelease(anonymous);
  EXPECT_NE(traces().find("username not OK cmpirc="), std::string::npos);
}

TEST_F(Threads, ConcurrentCallsOnProvidersAreSerialisedPerAdapter) {
  for (int i = 0; i < 20; ++i) store().cards.insert(make_card(("P" + std::to_string(i)).c_str()));
  store().chips.insert(make_chip("C1"));
  CMPIInstanceMI* cards = instance_mi(card_slot());
  CMPIInstanceMI* chips = instance_mi(chip_slot());
  std::atomic<int> failures{0};
  auto worker = [&](CMPIInstanceMI* mi, const char* class_name, size_t expected) {
    for (int round = 0; round < 15; ++round) {
      CMPIObjectPath* class_path = fake::new_path(kNs, class_name);
      fake::Result result;
      CMPIStatus rc = mi->ft->enumerateInstanceNames(mi, context_, result.get(), class_path);
      if (rc.rc != CMPI_RC_OK || result.returned().paths.size() != expected) ++failures;
      CMRelease(class_path);
    }
  };
  std::vector<std::thread> threads;
  for (int t = 0; t < 3; ++t) {
    threads.emplace_back(worker, cards, "NRVTAVO_Card", 20u);
    threads.emplace_back(worker, chips, "NRVTAVO_Chip", 1u);
  }
  for (std::thread& t : threads) t.join();
  EXPECT_EQ(failures.load(), 0);
}

TEST(Thread_Stack, UpCallsWithoutAContextFail) {
  std::string user;
  EXPECT_EQ(Thread_Context::top(), nullptr);
  EXPECT_FALSE(cimom::get_username(user));
  EXPECT_EQ(cimom::get_instance("root/x", nullptr), nullptr);
  EXPECT_EQ(cimom::delete_instance("root/x", nullptr), -1);
  EXPECT_EQ(Thread_Context::pop(), nullptr);
}

}  // namespace
}  // namespace test
