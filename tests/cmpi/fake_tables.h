/*
 * Function tables whose entries record how they were called, and arguments to call them with.
 */
#ifndef PLEXOR_TESTS_CMPI_FAKE_TABLES_H
#define PLEXOR_TESTS_CMPI_FAKE_TABLES_H

#include <gtest/gtest.h>

#include <cstdint>
#include <type_traits>
#include <vector>

#include "cmpidt.h"
#include "cmpift.h"
#include "cmpimacs.h"
#include "samples.h"

/* Both forms of the layer are tested in one program: everything here is local to its file. */
namespace {

/* The last call of a recorder: the line that installed it, and its arguments as words. */
struct Call {
    int line = 0;
    std::vector<std::uintptr_t> arguments;
};

Call g_call;

/* What recorders return, in whatever type: small enough for each of them. */
constexpr int kResult = 2;

template <typename T>
std::uintptr_t Word(T value) {
    if constexpr (std::is_pointer_v<T>) {
        return reinterpret_cast<std::uintptr_t>(value);
    } else if constexpr (std::is_same_v<T, CMPIStatus>) {
        return static_cast<std::uintptr_t>(value.rc);
    } else if constexpr (std::is_same_v<T, CMPIData>) {
        return static_cast<std::uintptr_t>(value.value.uint64);
    } else {
        return static_cast<std::uintptr_t>(value);
    }
}

template <typename... T>
std::vector<std::uintptr_t> Words(T... values) {
    return {Word(values)...};
}

template <typename T>
T Result() {
    if constexpr (std::is_pointer_v<T>) {
        return reinterpret_cast<T>(static_cast<std::uintptr_t>(kResult));
    } else if constexpr (std::is_same_v<T, CMPIStatus>) {
        return CMPIStatus{static_cast<CMPIrc>(kResult), nullptr};
    } else if constexpr (std::is_same_v<T, CMPIData>) {
        CMPIData data{};
        data.value.uint64 = kResult;
        return data;
    } else {
        return static_cast<T>(kResult);
    }
}

template <int Line, typename R, typename... A>
R Recorder(A... arguments) {
    g_call = Call{Line, Words(arguments...)};
    if constexpr (!std::is_void_v<R>) return Result<R>();
}

template <int Line, typename R, typename... A>
void Record(R (*&entry)(A...)) {
    entry = &Recorder<Line, R, A...>;
}

template <typename F>
void ExpectResult(F forwarder, const char* text) {
    if constexpr (std::is_void_v<decltype(forwarder())>) {
        forwarder();
    } else {
        EXPECT_EQ(Word(forwarder()), static_cast<std::uintptr_t>(kResult)) << text;
    }
}

/* Objects with empty tables, and samples that all differ from one another. */
struct Fake {
    CMPIContextFT contextFt{};
    CMPIResultFT resultFt{};
    CMPIStringFT stringFt{};
    CMPIArrayFT arrayFt{};
    CMPIEnumerationFT enumerationFt{};
    CMPIInstanceFT instanceFt{};
    CMPIObjectPathFT pathFt{};
    CMPIArgsFT argsFt{};
    CMPIDateTimeFT dateTimeFt{};
    CMPISelectExpFT selectExpFt{};
    CMPISelectCondFT selectCondFt{};
    CMPISubCondFT subCondFt{};
    CMPIPredicateFT predicateFt{};
    CMPIErrorFT errorFt{};
    CMPIPropertyListFT propertyListFt{};
    CMPIEnumerationFilterFT enumerationFilterFt{};
    CMPIBrokerFT bft{};
    CMPIBrokerEncFT eft{};
    CMPIBrokerMemFT mft{};
    CMPIBroker broker{nullptr, &bft, &eft, nullptr, &mft};
    CMPIContext context{nullptr, &contextFt};
    CMPIResult result{nullptr, &resultFt};
    CMPIString string{nullptr, &stringFt};
    CMPIArray array{nullptr, &arrayFt};
    CMPIEnumeration enumeration{nullptr, &enumerationFt};
    CMPIInstance instance{nullptr, &instanceFt};
    CMPIObjectPath path{nullptr, &pathFt};
    CMPIArgs args{nullptr, &argsFt};
    CMPIDateTime dateTime{nullptr, &dateTimeFt};
    CMPISelectExp selectExp{nullptr, &selectExpFt};
    CMPISelectCond selectCond{nullptr, &selectCondFt};
    CMPISubCond subCond{nullptr, &subCondFt};
    CMPIPredicate predicate{nullptr, &predicateFt};
    CMPIError error{nullptr, &errorFt};
    CMPIPropertyList propertyList{nullptr, &propertyListFt};
    CMPIEnumerationFilter enumerationFilter{nullptr, &enumerationFilterFt};
    CMPIObjectPath source{nullptr, &pathFt};
    CMPIArgs outArgs{nullptr, &argsFt};
    /* Addresses that are passed on and never used as what they pretend to be. */
    char memory[32]{};
    Samples samples{};

    Fake() {
        unsigned next = 0;
        auto address = [&](auto*& pointer) {
            pointer = reinterpret_cast<std::remove_reference_t<decltype(pointer)>>(&memory[next++]);
        };
        samples.broker = &broker;
        samples.context = &context;
        samples.result = &result;
        samples.string = &string;
        samples.array = &array;
        samples.enumeration = &enumeration;
        samples.instance = &instance;
        samples.path = &path;
        samples.args = &args;
        samples.dateTime = &dateTime;
        samples.selectExp = &selectExp;
        samples.selectCond = &selectCond;
        samples.subCond = &subCond;
        samples.predicate = &predicate;
        samples.error = &error;
        samples.propertyList = &propertyList;
        samples.enumerationFilter = &enumerationFilter;
        samples.source = &source;
        samples.outArgs = &outArgs;
        for (auto& pointer : samples.names) address(pointer);
        for (auto& pointer : samples.text) address(pointer);
        address(samples.status);
        address(samples.value);
        samples.type = CMPI_sint16;
        samples.count = 7;
        for (auto& pointer : samples.strings) address(pointer);
        address(samples.types);
        address(samples.op);
        address(samples.kind);
        address(samples.arrays);
        samples.opaque = &memory[next++];
        samples.severity = CMPI_SEV_INFO;
        samples.level = CMPI_LEV_VERBOSE;
        samples.errorSeverity = ErrorSevHigh;
        samples.cause = Fire_Detected;
        samples.errorType = SecurityError;
        samples.format = CIMObjectHandle;
        samples.code = CMPI_RC_ERR_INVALID_QUERY;
        samples.bytes[0] = 101;
        samples.bytes[1] = 102;
        samples.microseconds = 1234567890123;
        samples.flag = 9;
        samples.handle = &memory[next++];
        address(samples.handles);
        samples.accessor = reinterpret_cast<CMPIAccessor*>(&memory[next++]);
        samples.mark = &memory[next++];
        address(samples.chars);
        samples.codepage = CMPI_CPID_USASCII;
    }
    Fake(const Fake&) = delete;
    Fake& operator=(const Fake&) = delete;
};

}  // namespace

#endif
