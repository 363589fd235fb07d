// What the library's variables hold before anybody has called it.
#include <time.h>

#include "loaded_fixture.h"

namespace {

/// The library, opened and not called.
class LoadStateTest : public loadtest::LoadTest {
protected:
    void SetUp() override {
        LoadTest::SetUp();
        library = dlopen(PROVIDER, RTLD_NOW | RTLD_LOCAL);
        ASSERT_NE(library, nullptr) << dlerror();
    }
    void TearDown() override {
        dlclose(library);
        LoadTest::TearDown();
    }
    template <class Type>
    Type& variable(const char* name) {
        void* address = dlsym(library, name);
        if (address == nullptr) throw std::runtime_error(std::string("no ") + name);
        return *static_cast<Type*>(address);
    }
    void* library = nullptr;
};

TEST_F(LoadStateTest, VariablesHaveTheirInitialValues) {
    EXPECT_EQ(variable<const void*>("Broker"), nullptr);
    EXPECT_EQ(variable<int>("_ProviderInitialized"), 0);
    EXPECT_EQ(variable<unsigned int>("IdleTimeBeforeTerminating"), 5u);
    EXPECT_EQ(variable<time_t>("NextUnloadTime"), 0);
    EXPECT_EQ(variable<int>("waitDebug"), 0);
    EXPECT_EQ(variable<time_t>("InitCompleteTime"), 0);
    EXPECT_EQ(variable<time_t>("StateUpdateInterval"), 20);
    EXPECT_EQ(variable<unsigned int>("ActiveThreads"), 0u);
    EXPECT_EQ(variable<unsigned int>("TerminateThread"), 0u);
    EXPECT_EQ(variable<unsigned int>("ThreadActivityDone"), 0u);
    EXPECT_EQ(variable<const char*>("__SystemName"), nullptr);
    EXPECT_EQ(variable<const char*>("__HostName"), nullptr);
    EXPECT_EQ(variable<const char*>("__SystemClassName"), nullptr);
}

TEST_F(LoadStateTest, TheControllerListIsThereAndEmpty) {
    struct List {
        void *head, *tail;
        unsigned int size;
    };
    const List* list = variable<const List*>("RaidControllerList");
    ASSERT_NE(list, nullptr);
    EXPECT_EQ(list->head, nullptr);
    EXPECT_EQ(list->tail, nullptr);
    EXPECT_EQ(list->size, 0u);
}

TEST_F(LoadStateTest, TheQueueHoldsTwenty) {
    struct Fifo {
        pthread_mutex_t mutex;
        unsigned int size;
    };
    EXPECT_EQ(variable<Fifo>("__FIFO").size, 20u);
}

TEST_F(LoadStateTest, TheTableCanBeReadWithoutACall) {
    const auto& table = variable<CMPIInstanceMIFT>("instMIFT__");
    EXPECT_EQ(table.ftVersion, 100);
    EXPECT_EQ(table.miVersion, 100);
    EXPECT_STREQ(table.miName, "instancePlexorProvider");
    EXPECT_EQ(reinterpret_cast<void*>(table.cleanup), dlsym(library, "PlexorProviderCleanup"));
}

// A debugger finds and clears the mark by its name.
TEST_F(LoadStateTest, TheDebuggersMarkCanBeWritten) {
    variable<volatile int>("waitDebug") = 1;
    EXPECT_EQ(variable<int>("waitDebug"), 1);
}

// Opened and closed without a call, it leaves no trace.
TEST_F(LoadStateTest, OpeningStartsNothing) {
    EXPECT_TRUE(isMapped());
    EXPECT_TRUE(broker.books().calls().empty());
}

}  // namespace
