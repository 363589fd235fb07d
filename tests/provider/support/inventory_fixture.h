// What tests of the inventory's building share: a vendor, the log without the lists' chatter, and
// the ways in which a vendor's answers can be bad.
#pragma once

#include <gmock/gmock.h>

#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "odd_values.h"
#include "provider_fixture.h"
#include "query_arguments.h"
#include "vendor_objects.h"

namespace plexortest {

/// What the profile that is looked for is registered as.
inline constexpr char kProfileName[] = "Host Hardware RAID Controller";

inline LogLine debugLine(std::string text) {
    return {LOG_DEBUG, std::move(text)};
}
inline LogLine infoLine(std::string text) {
    return {LOG_INFO, std::move(text)};
}
inline LogLine warningLine(std::string text) {
    return {LOG_WARNING, std::move(text)};
}
inline LogLine errorLine(std::string text) {
    return {LOG_ERR, std::move(text)};
}

/// The calling thread's lines without those of the lists and of released records.
inline std::vector<LogLine> inventoryLog() {
    constexpr const char* kListLines[] = {"Adding data ",  "Data ", "Removing data ",
                                          "Freeing list ", "List ", "PutItem: Fifo("};
    std::vector<LogLine> found;
    for (const LogLine& line : CapturedSyslog::lines()) {
        bool skipped =
            line.thread != std::this_thread::get_id() || line.text.ends_with(" deleted\n");
        for (const char* start : kListLines) skipped = skipped || line.text.starts_with(start);
        if (!skipped) found.push_back(line);
    }
    return found;
}

/// One way in which a query fails, and the end of the line that says so; none when nothing is said.
struct QueryFailure {
    const char* name;
    testbed::FaultRule answer;
    std::optional<std::string> logged;
};

/// Whether nobody holds the mutex.
inline bool isFree(pthread_mutex_t& mutex) {
    if (pthread_mutex_trylock(&mutex) != 0) return false;
    pthread_mutex_unlock(&mutex);
    return true;
}

/// All records of a list, in order.
template <class Record>
std::vector<Record*> recordsOf(const List_t* list) {
    std::vector<Record*> records;
    for (const List_Entry_t* entry = list->Head; entry != nullptr; entry = entry->Next) {
        records.push_back(static_cast<Record*>(entry->Data));
    }
    EXPECT_EQ(records.size(), list->Size);
    return records;
}

/// The provider over a vendor whose classes are known and who has no object yet.
class InventoryTest : public ProviderTest {
protected:
    using Path = testbed::ObjectPath;
    using Entry = testbed::Entry;
    using Texts = std::vector<std::string>;

    static std::vector<QueryFailure> queryFailures();

    /// Forgets the log and the calls so far.
    void startOver() {
        CapturedSyslog::clear();
        books().clearCalls();
    }
    /// Makes this the only rule.
    void failOnly(testbed::FaultRule rule) {
        faults().clear();
        faults().add(std::move(rule));
    }
    /// A rule for queries along that association.
    static testbed::FaultRule along(const std::string& assocClass, testbed::FaultRule answer) {
        answer.entry = Entry::Associators;
        answer.assocClass = assocClass;
        return answer;
    }
    /// A rule that runs a hook at calls of that entry and leaves them alone.
    static testbed::FaultRule watch(Entry entry, std::function<void()> hook) {
        testbed::FaultRule rule;
        rule.entry = entry;
        rule.hook = std::move(hook);
        return rule;
    }
    /// A rule by which calls of that entry answer NULL with status OK; the one behind `skip` others
    /// when that is given, all of them when not.
    static testbed::FaultRule answerNull(Entry entry, std::optional<int> skip = {}) {
        testbed::FaultRule rule;
        rule.entry = entry;
        rule.nullResult = true;
        rule.skip = skip.value_or(0);
        rule.times = skip ? 1 : -1;
        return rule;
    }
    /// A rule by which the element behind `skip` others, of all that are read, is a number.
    static testbed::FaultRule wrongElement(int skip) {
        testbed::FaultRule rule;
        rule.entry = Entry::EnumerationGetNext;
        rule.wrongType = true;
        rule.skip = skip;
        rule.times = 1;
        return rule;
    }
    /// A rule by which enumerations fail to answer that entry, behind `skip` good answers.
    static testbed::FaultRule failingEnumeration(Entry entry, int skip) {
        testbed::FaultRule rule = refusal(entry);
        rule.skip = skip;
        rule.times = 1;
        return rule;
    }
    CMPIInstance* instanceAt(const Path& path) {
        return broker.makeInstance(repository.get(path).value());
    }
    void set(const Path& path, const char* property, testbed::CimValue value) {
        EXPECT_TRUE(repository.setProperty(path, property, std::move(value))) << path.text();
    }
    void unset(const Path& path, const char* property) {
        EXPECT_TRUE(repository.eraseProperty(path, property)) << path.text() << " " << property;
    }
    void give(const Path& path, const std::string& property, const OddValue& odd) {
        plexortest::give(repository, path, property, odd);
    }
    /// "<entry> <path> <association class> <result class>" for each query since startOver.
    Texts askedQueries() {
        Texts asked;
        for (const testbed::CallRecord& call : books().queries()) {
            asked.push_back(std::string(testbed::entryName(call.entry)) + " " + call.path + " " +
                            call.assocClass.value_or("any") + " " +
                            call.resultClass.value_or("any"));
            EXPECT_TRUE(asksForAll(call)) << asked.back();
        }
        return asked;
    }
    /// Names of the properties read from instances of the class, in order; needs recordObjectCalls.
    Texts propertiesRead(const std::string& className) {
        Texts names;
        for (const testbed::CallRecord& call : books().calls()) {
            const bool isRead = call.entry == Entry::InstanceGetProperty;
            if (isRead && call.className == className) names.push_back(call.name.value_or(""));
        }
        return names;
    }

    VendorObjects vendor{repository};
};

inline std::vector<QueryFailure> InventoryTest::queryFailures() {
    const Entry any = Entry::Associators;
    QueryFailure withResult = {"status and a result", refusal(any), "status: rc 1, msg NULL"};
    withResult.answer.keepResult = true;
    return {
        {"status alone", refusal(any, CMPI_RC_ERR_NOT_FOUND), "status: rc 6, msg NULL"},
        {"status and message", refusal(any, CMPI_RC_ERR_ACCESS_DENIED, "the vendor is busy"),
         "status: rc 2, msg the vendor is busy"},
        {"status and empty message", refusal(any, CMPI_RC_ERR_FAILED, ""), "status: rc 1, msg "},
        {"status and a message like a format", refusal(any, CMPI_RC_ERR_FAILED, "50%s %n %d%%"),
         "status: rc 1, msg 50%s %n %d%%"},
        withResult,
        {"NULL with status OK", answerNull(any), std::nullopt},
    };
}

}  // namespace plexortest
