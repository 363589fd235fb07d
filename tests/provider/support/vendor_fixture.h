// What tests of discovery, walks, builders and updaters share: a vendor, what it was asked, and the
// ways in which its answers can be bad.
#pragma once

#include <gmock/gmock.h>

#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "log_text.h"
#include "odd_values.h"
#include "provider_fixture.h"
#include "query_arguments.h"
#include "vendor_objects.h"

namespace plexortest {

/// What the profile that is looked for is registered as.
inline constexpr char kProfileName[] = "Host Hardware RAID Controller";

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

/// The record at the head of a list; null without one.
template <class Record>
Record* firstOf(const List_t* list) {
    return list->Head != nullptr ? static_cast<Record*>(list->Head->Data) : nullptr;
}

/// The provider over a vendor whose classes are known and who has no object yet.
class VendorTest : public ProviderTest {
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
    /// Narrows a rule for queries down to that association.
    static testbed::FaultRule along(const std::string& assocClass, testbed::FaultRule rule) {
        rule.assocClass = assocClass;
        return rule;
    }
    /// A rule by which queries fail and give their result all the same.
    static testbed::FaultRule refusalWithResult(Entry entry) {
        testbed::FaultRule rule = refusal(entry);
        rule.keepResult = true;
        return rule;
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
    /// Gives an object that value of a property, or takes the property away.
    void give(const Path& path, const std::string& property, const OddValue& odd) {
        if (odd.value) {
            repository.setProperty(path, property, *odd.value);
        } else {
            repository.eraseProperty(path, property);
        }
    }
    /// Every call to the broker since startOver: "associators <path> <assoc>/<result>".
    Texts brokerCalls() {
        return callTexts(books().calls(),
                         [](testbed::Entry entry) { return !testbed::isObjectEntry(entry); });
    }
    /// Those of them that the vendor was asked.
    Texts queries() { return callTexts(books().calls(), testbed::isQuery); }
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

private:
    template <class Filter>
    static Texts callTexts(const std::vector<testbed::CallRecord>& calls, Filter isWanted) {
        Texts texts;
        for (const testbed::CallRecord& call : calls) {
            if (!isWanted(call.entry)) continue;
            std::string text = std::string(testbed::entryName(call.entry)) + " " + call.path;
            if (call.entry != Entry::GetInstance) {
                text += " " + call.assocClass.value_or("NULL") + "/" +
                        call.resultClass.value_or("NULL");
            }
            texts.push_back(text + (asksForAll(call) ? "" : " with roles or properties"));
        }
        return texts;
    }
};

inline std::vector<QueryFailure> VendorTest::queryFailures() {
    const Entry any = Entry::Associators;
    return {
        {"status alone", refusal(any, CMPI_RC_ERR_NOT_FOUND), "status: rc 6, msg NULL"},
        {"status and message", refusal(any, CMPI_RC_ERR_ACCESS_DENIED, "the vendor is busy"),
         "status: rc 2, msg the vendor is busy"},
        {"status and empty message", refusal(any, CMPI_RC_ERR_FAILED, ""), "status: rc 1, msg "},
        {"status and a message like a format", refusal(any, CMPI_RC_ERR_FAILED, "50%s %n %d%%"),
         "status: rc 1, msg 50%s %n %d%%"},
        {"status and a result", refusalWithResult(any), "status: rc 1, msg NULL"},
        {"NULL with status OK", answerNull(any), std::nullopt},
    };
}

}  // namespace plexortest
