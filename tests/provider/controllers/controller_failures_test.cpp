// Queries that fail, memory that runs out, answers that are nonsense: what it costs in controllers.
#include "controller_fixture.h"
#include "stop_at_line.h"

namespace plexortest {
namespace {

using testbed::CimValue;
using testing::ElementsAre;
using testing::IsEmpty;

class ControllerFailures : public ControllerTest {
protected:
    /// Two controllers "C0" and "C1" of one profile.
    void addTwo() {
        profile = addProfile();
        first = addFullController(profile, "C0");
        second = addFullController(profile, "C1");
    }
    static std::string failureLine(const Path& path, const std::string& classes,
                                   const std::string& outcome) {
        return "Associators " + path.text() + " (assocClass: " + classes + ") failed, " + outcome;
    }
    /// Expects the line of a failed query, and no other at error level.
    static void expectOnlyFailure(const QueryFailure& failure, const Path& path,
                                  const std::string& classes) {
        Texts expected;
        if (failure.logged) expected.push_back(failureLine(path, classes, *failure.logged));
        EXPECT_EQ(CapturedSyslog::linesAt(LOG_ERR), expected);
    }

    Path profile;
    VendorController first, second;
};

TEST_F(ControllerFailures, ProfilesQueryCostsTheProfile) {
    profile = addProfile("profile-1");
    addFullController(profile, "C0");
    addFullController(addProfile("profile-2"), "C1");
    for (const QueryFailure& failure : queryFailures()) {
        SCOPED_TRACE(failure.name);
        auto rule = along("CIM_ElementConformsToProfile", failure.answer);
        rule.pathContains = "profile-1";
        failOnly(rule);
        EXPECT_EQ(build(), 0);
        EXPECT_THAT(cached(), ElementsAre("C1"));
        EXPECT_EQ(brokerCalls().size(), 5u);
        expectOnlyFailure(failure, profile,
                          "CIM_ElementConformsToProfile, resultClass: CIM_PortController");
    }
}

TEST_F(ControllerFailures, SystemsQueryCostsTheController) {
    addTwo();
    for (const QueryFailure& failure : queryFailures()) {
        SCOPED_TRACE(failure.name);
        auto rule = along("CIM_LogicalIdentity", failure.answer);
        rule.times = 1;
        failOnly(rule);
        EXPECT_EQ(build(), 0);
        EXPECT_THAT(cached(), ElementsAre("C1"));
        EXPECT_EQ(brokerCalls().size(), 5u);
        expectOnlyFailure(failure, first.port,
                          "CIM_LogicalIdentity, resultClass: CIM_ComputerSystem");
    }
}

TEST_F(ControllerFailures, PackagesQueryCostsModelAndHealth) {
    addTwo();
    for (const QueryFailure& failure : queryFailures()) {
        SCOPED_TRACE(failure.name);
        auto rule = along("CIM_Realizes", failure.answer);
        rule.times = 1;
        failOnly(rule);
        EXPECT_EQ(build(), 0);
        ASSERT_THAT(cached(), ElementsAre("C0", "C1"));
        EXPECT_EQ(summary(controllers()[0]), "absent FW-C0 BIOS-C0 DRV-C0 PKG-C0 0 2");
        EXPECT_EQ(summary(controllers()[1]), "Model C1 FW-C1 BIOS-C1 DRV-C1 PKG-C1 5 2");
        EXPECT_EQ(brokerCalls().size(), 7u);
        expectOnlyFailure(failure, first.port, "CIM_Realizes, resultClass: CIM_PhysicalPackage");
    }
}

TEST_F(ControllerFailures, SoftwareQueryCostsTheVersions) {
    addTwo();
    for (const QueryFailure& failure : queryFailures()) {
        SCOPED_TRACE(failure.name);
        auto rule = along("CIM_ElementSoftwareIdentity", failure.answer);
        rule.times = 1;
        failOnly(rule);
        EXPECT_EQ(build(), 0);
        ASSERT_THAT(cached(), ElementsAre("C0", "C1"));
        EXPECT_EQ(summary(controllers()[0]), "Model C0 absent absent absent absent 5 2");
        EXPECT_EQ(summary(controllers()[1]), "Model C1 FW-C1 BIOS-C1 DRV-C1 PKG-C1 5 2");
        EXPECT_EQ(brokerCalls().size(), 7u);
        expectOnlyFailure(failure, first.system,
                          "CIM_ElementSoftwareIdentity, resultClass: CIM_SoftwareIdentity");
    }
}

TEST_F(ControllerFailures, EverythingFails) {
    addTwo();
    failOnly(refusal(Entry::Associators));
    EXPECT_EQ(build(), 0);
    EXPECT_THAT(controllers(), IsEmpty());
    EXPECT_EQ(brokerCalls().size(), 1u);
}

// The allocations of one controller: record, DeviceID, Model, four versions, list entry.
constexpr std::size_t kAllocations = 8;

struct ControllerShortage {
    std::size_t allocation;
    int result;
    const char* summary;  ///< of the controller; null when there is none
    LogLine line;
};

TEST_F(ControllerFailures, EachAllocationOfAController) {
    addFullController(addProfile(), "C0");
    const std::string copyFailed = "strdup() failed to duplicate string ";
    const ControllerShortage shortages[] = {
        {1, -2, nullptr,
         errorLine("BuildControllerInfo, failed to allocate memory for RaidController_t\n")},
        {2, 0, nullptr, warningLine(copyFailed + "C0\n")},
        {3, 0, "absent FW-C0 BIOS-C0 DRV-C0 PKG-C0 5 2", warningLine(copyFailed + "Model C0\n")},
        {4, 0, "Model C0 absent BIOS-C0 DRV-C0 PKG-C0 5 2", warningLine(copyFailed + "FW-C0\n")},
        {5, 0, "Model C0 FW-C0 absent DRV-C0 PKG-C0 5 2", warningLine(copyFailed + "BIOS-C0\n")},
        {6, 0, "Model C0 FW-C0 BIOS-C0 absent PKG-C0 5 2", warningLine(copyFailed + "DRV-C0\n")},
        {7, 0, "Model C0 FW-C0 BIOS-C0 DRV-C0 absent 5 2", warningLine(copyFailed + "PKG-C0\n")},
        {8, -2, nullptr,
         errorLine("BuildControllerInfo: failed to add controller to list, rc -2.\n")},
    };
    for (const ControllerShortage& shortage : shortages) {
        SCOPED_TRACE(shortage.allocation);
        const auto fault = FailAllocation::nth(shortage.allocation);
        EXPECT_EQ(build(), shortage.result);
        EXPECT_EQ(fault.failures(), 1u);
        EXPECT_TRUE(logged(shortage.line.priority, shortage.line.text));
        EXPECT_TRUE(
            logged(LOG_DEBUG, formatted("BuildControllerInfo, EXIT(%d).\n", shortage.result)));
        ASSERT_EQ(controllers().size(), shortage.summary != nullptr ? 1u : 0u);
        if (shortage.summary != nullptr) {
            EXPECT_EQ(summary(controllers()[0]), shortage.summary);
        }
        EXPECT_EQ(books().liveClones(), shortage.summary != nullptr ? 2u : 0u);
    }
    const auto fault = FailAllocation::nth(kAllocations + 1);
    EXPECT_EQ(build(), 0);
    EXPECT_EQ(fault.failures(), 0u);
    EXPECT_EQ(fault.calls(), kAllocations);
}

TEST_F(ControllerFailures, DeviceIdThatCannotBeCopied) {
    addTwo();
    const auto fault = FailAllocation::strdupOf("C0");
    EXPECT_EQ(build(), 0);
    EXPECT_THAT(cached(), ElementsAre("C1"));
    EXPECT_TRUE(loggedInOrder(
        {warningLine("strdup() failed to duplicate string C0\n"),
         errorLine("NULL DeviceID for PortController: " + first.port.text() + "\n")}));
}

TEST_F(ControllerFailures, ShortageEmptiesTheListOfAllProfiles) {
    addFullController(addProfile("profile-1"), "C0");
    addFullController(addProfile("profile-2"), "C1");
    addFullController(addProfile("profile-3"), "C2");
    for (const std::size_t allocation : {kAllocations + 1, 2 * kAllocations}) {
        const auto fault = FailAllocation::nth(allocation);
        EXPECT_EQ(build(), -2);
        EXPECT_THAT(controllers(), IsEmpty());
        EXPECT_EQ(RaidControllerList->Size, 0u);
        EXPECT_EQ(books().liveClones(), 0u);
        EXPECT_EQ(CapturedSyslog::count("Controller Model C0 (C0) deleted\n"), 1u);
        EXPECT_EQ(CapturedSyslog::count(formatted("Freeing list %p, release function %p\n",
                                                  static_cast<void*>(RaidControllerList),
                                                  reinterpret_cast<void*>(FreeController))),
                  1u);
        // The third profile is not walked any more.
        for (const std::string& query : brokerCalls()) {
            EXPECT_THAT(query, testing::Not(testing::HasSubstr("profile-3")));
        }
    }
}

TEST_F(ControllerFailures, ShortageDuringAStopLeavesTheListToTheCleanup) {
    addTwo();
    {
        const auto fault = FailAllocation::nth(kAllocations + 1);
        const StopAtLine stop(
            "BuildControllerInfo, failed to allocate memory for RaidController_t");
        EXPECT_EQ(build(), -2);
    }
    EXPECT_THAT(cached(), ElementsAre("C0"));
    EXPECT_EQ(CapturedSyslog::countContaining("deleted"), 0u);
}

TEST_F(ControllerFailures, AControllerThatIsReadyAfterTheStopIsTurnedAwayInSilence) {
    addTwo();
    {
        const StopAtLine stop("\nPortControllerOp: ", 2);
        build();
    }
    EXPECT_THAT(cached(), ElementsAre("C0"));
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_ERR), IsEmpty());
}

TEST_F(ControllerFailures, EveryAllocationInTurn) {
    addTwo();
    const std::size_t allocations = forEachFailingAllocation([this](std::size_t) {
        const int result = build();
        EXPECT_TRUE(result == 0 || result == -2) << result;
        if (result != 0) {
            EXPECT_THAT(controllers(), IsEmpty());
        }
        EXPECT_EQ(books().liveClones(), 2 * controllers().size());
    });
    EXPECT_EQ(allocations, 2 * kAllocations);
}

TEST_F(ControllerFailures, PortControllersPathCannotBeCloned) {
    addTwo();
    failOnly(answerNull(Entry::Clone, 0));
    EXPECT_EQ(build(), 0);
    EXPECT_THAT(cached(), ElementsAre("C1"));
}

TEST_F(ControllerFailures, EveryCloneInTurnCostsAtMostItsController) {
    addTwo();
    // Two clones for each controller: port controller, system.
    for (int clone = 0; clone < 4; clone++) {
        SCOPED_TRACE(clone);
        failOnly(answerNull(Entry::Clone, clone));
        EXPECT_EQ(build(), 0);
        const std::string other = clone < 2 ? "C1" : "C0";
        EXPECT_THAT(cached(), testing::Contains(other));
        for (const RaidController_t* ctrl : controllers()) {
            if (ctrl->DeviceID != other) continue;
            EXPECT_EQ(summary(ctrl), "Model " + other + " FW-" + other + " BIOS-" + other +
                                         " DRV-" + other + " PKG-" + other + " 5 2");
            EXPECT_NE(ctrl->ControllerOp, nullptr);
        }
    }
    EXPECT_EQ(CapturedSyslog::countContaining("CIM Query - Associators: NULL"), 1u);
}

TEST_F(ControllerFailures, ElementOfAnotherTypeCostsAtMostItsController) {
    addTwo();
    // The order in which they are read: port controller, system, package, four times software, and
    // then the same of the second controller.
    const Texts expected = {
        "absent",
        "absent",
        "absent FW-C0 BIOS-C0 DRV-C0 PKG-C0 0 2",
        "Model C0 absent BIOS-C0 DRV-C0 PKG-C0 5 2",
        "Model C0 FW-C0 absent DRV-C0 PKG-C0 5 2",
        "Model C0 FW-C0 BIOS-C0 absent PKG-C0 5 2",
        "Model C0 FW-C0 BIOS-C0 DRV-C0 absent 5 2",
    };
    for (std::size_t wrong = 0; wrong < expected.size(); wrong++) {
        SCOPED_TRACE(wrong);
        failOnly(wrongElement(static_cast<int>(wrong)));
        EXPECT_EQ(build(), 0);
        ASSERT_FALSE(cached().empty());
        EXPECT_EQ(summary(controllers().back()), "Model C1 FW-C1 BIOS-C1 DRV-C1 PKG-C1 5 2");
        const bool isCached = cached().size() == 2;
        EXPECT_EQ(isCached ? summary(controllers()[0]) : "absent", expected[wrong]);
    }
}

TEST_F(ControllerFailures, EnumerationThatFailsEndsItsWalk) {
    addTwo();
    const std::string onlySecond = "Model C1 FW-C1 BIOS-C1 DRV-C1 PKG-C1 5 2";
    // In the order above; the eighth is the second port controller.
    const Texts expected[] = {
        {},
        {onlySecond},
        {"absent FW-C0 BIOS-C0 DRV-C0 PKG-C0 0 2", onlySecond},
        {"Model C0 absent absent absent absent 5 2", onlySecond},
        {"Model C0 FW-C0 absent absent absent 5 2", onlySecond},
        {"Model C0 FW-C0 BIOS-C0 absent absent 5 2", onlySecond},
        {"Model C0 FW-C0 BIOS-C0 DRV-C0 absent 5 2", onlySecond},
        {"Model C0 FW-C0 BIOS-C0 DRV-C0 PKG-C0 5 2"},
    };
    for (std::size_t good = 0; good < std::size(expected); good++) {
        SCOPED_TRACE(good);
        failOnly(failingEnumeration(Entry::EnumerationGetNext, static_cast<int>(good)));
        EXPECT_EQ(build(), 0);
        Texts summaries;
        for (const RaidController_t* ctrl : controllers()) summaries.push_back(summary(ctrl));
        EXPECT_EQ(summaries, expected[good]);
    }
}

TEST_F(ControllerFailures, NullInstanceInAnEnumeration) {
    addTwo();
    failOnly(answerNull(Entry::EnumerationGetNext, 0));
    EXPECT_EQ(build(), 0);
    EXPECT_THAT(cached(), ElementsAre("C1"));
}

TEST_F(ControllerFailures, DeviceIdThatIsNoText) {
    addTwo();
    for (const OddValue& odd : oddTexts()) {
        give(first.port, "DeviceID", odd);
        EXPECT_EQ(build(), 0);
        EXPECT_THAT(cached(), ElementsAre("C1")) << odd.label;
        EXPECT_TRUE(
            logged(LOG_ERR, "NULL DeviceID for PortController: " + first.port.text() + "\n"));
    }
}

TEST_F(ControllerFailures, OtherPropertiesMayHoldAnything) {
    addTwo();
    for (const OddValue& odd : oddTexts()) {
        give(first.package, "Model", odd);
        EXPECT_EQ(build(), 0);
        ASSERT_THAT(cached(), ElementsAre("C0", "C1")) << odd.label;
        EXPECT_EQ(summary(controllers()[0]), "absent FW-C0 BIOS-C0 DRV-C0 PKG-C0 5 2") << odd.label;
    }
    for (const OddValue& odd : oddNumbers()) {
        give(first.package, "HealthState", odd);
        EXPECT_EQ(build(), 0);
        EXPECT_EQ(controllers()[0]->HealthState, 0) << odd.label;
    }
    for (const OddValue& odd : oddArrays()) {
        give(first.system, "OperationalStatus", odd);
        EXPECT_EQ(build(), 0);
        EXPECT_EQ(controllers()[0]->OperationalStatus, 0) << odd.label;
    }
}

TEST_F(ControllerFailures, MissingPropertiesAreEmptyFields) {
    addTwo();
    unset(first.package, "Model");
    unset(first.package, "HealthState");
    unset(first.system, "OperationalStatus");
    EXPECT_EQ(build(), 0);
    EXPECT_EQ(summary(controllers()[0]), "absent FW-C0 BIOS-C0 DRV-C0 PKG-C0 0 0");
}

TEST_F(ControllerFailures, VeryLongTexts) {
    const std::string text(65536, 'x');
    const VendorController card = addFullController(addProfile(), "C0");
    set(card.package, "Model", CimValue::string(text));
    set(card.port, "DeviceID", CimValue::string(text));
    EXPECT_EQ(build(), 0);
    EXPECT_THAT(cached(), ElementsAre(text));
    EXPECT_EQ(controllers()[0]->Model, text);
}

TEST_F(ControllerFailures, EmptyTextsAreTexts) {
    const VendorController card = addFullController(addProfile(), "C0");
    set(card.package, "Model", CimValue::string(""));
    set(card.port, "DeviceID", CimValue::string(""));
    EXPECT_EQ(build(), 0);
    EXPECT_THAT(cached(), ElementsAre(""));
    EXPECT_STREQ(controllers()[0]->Model, "");
}

}  // namespace
}  // namespace plexortest
