// Queries of a drive's build that fail, and objects that are not what they should be.
#include "disk_fixture.h"

namespace plexortest {
namespace {

using testbed::CimValue;
using testbed::Entry;
using testing::ElementsAre;
using testing::IsEmpty;

/// One of the queries, what its failure leaves behind and what is asked after it.
struct QueryOfBuild {
    const char* label;
    Entry entry;
    const char* assocClass;
    const char* logName;
    const char* classes;  ///< as the failure line shows them
    const char* source;   ///< which object it is made on
    int result;
    std::size_t queries;  ///< made in all when this one fails
};

constexpr QueryOfBuild kQueries[] = {
    {"Media", Entry::Associators, "CIM_MediaPresent", "Associators",
     "(assocClass: CIM_MediaPresent, resultClass: NULL)", "drive", -1, 1},
    {"Firmware", Entry::Associators, "CIM_ElementSoftwareIdentity", "Associators",
     "(assocClass: CIM_ElementSoftwareIdentity, resultClass: CIM_SoftwareIdentity)", "drive", 0, 6},
    {"Package", Entry::AssociatorNames, "CIM_Realizes", "AssociatorNames",
     "(assocClass: CIM_Realizes, resultClass: CIM_PhysicalPackage)", "drive", 0, 4},
    {"Slot", Entry::Associators, "CIM_PackageInConnector", "Associators",
     "(assocClass: CIM_PackageInConnector, resultClass: CIM_Slot)", "package", 0, 5},
    {"Chassis", Entry::AssociatorNames, "CIM_Container", "AssociatorNames",
     "(assocClass: CIM_Container, resultClass: CIM_Chassis)", "slot", 0, 6},
    {"Pool", Entry::AssociatorNames, "CIM_ConcreteComponent", "AssociatorNames",
     "(assocClass: CIM_ConcreteComponent, resultClass: CIM_StoragePool)", "extent", -1, 6},
};

class DiskBuildQuery : public DiskTest, public testing::WithParamInterface<QueryOfBuild> {
protected:
    std::string sourceText() const {
        const std::string source = GetParam().source;
        if (source == "drive") return kDrive;
        if (source == "package") return kPackage;
        return source == "slot" ? kSlot : kExtent;
    }

    std::string failureLine(int rc, const std::string& message) const {
        return std::string(GetParam().logName) + " " + sourceText() + " " + GetParam().classes +
               " failed, status: rc " + std::to_string(rc) + ", msg " + message;
    }

    /// Error lines other than the refusal of a drive without a pool.
    Texts errors() const {
        Texts lines = CapturedSyslog::linesAt(LOG_ERR);
        std::erase(lines, "No pool associated with disk " + kDrive + "\n");
        return lines;
    }

    /// What the failed query would have told is missing, everything else is there.
    void expectOutcome() {
        EXPECT_EQ(books().queries().size(), GetParam().queries);
        const bool noPool = std::string(GetParam().label) == "Pool";
        EXPECT_EQ(CapturedSyslog::countContaining("No pool associated with disk"),
                  noPool ? 1u : 0u);
        if (GetParam().result != 0) return expectNothingCached();
        ASSERT_NE(disk(), nullptr);
        const std::string label = GetParam().label;
        const bool noSlot = label == "Package" || label == "Slot";
        EXPECT_EQ(disk()->FwVersion == nullptr, label == "Firmware");
        EXPECT_EQ(disk()->SlotNumber, noSlot ? 0 : 4);
        EXPECT_EQ(disk()->Chassis == nullptr, noSlot || label == "Chassis");
        EXPECT_STREQ(disk()->Pool, "P1");
        EXPECT_EQ(disk()->NumberOfBlocks, 0x1'0000'0002u);
        EXPECT_THAT(members(pool_), ElementsAre("D1"));
        EXPECT_EQ(ctrl->DiskUpdateTime, kStart);
    }
};

TEST_P(DiskBuildQuery, FailingWithAMessage) {
    faults().add(along(GetParam().assocClass,
                       refusal(GetParam().entry, CMPI_RC_ERR_FAILED, "vendor is busy")));
    EXPECT_EQ(buildDisk(), GetParam().result);
    EXPECT_THAT(errors(), ElementsAre(failureLine(1, "vendor is busy")));
    expectOutcome();
}

TEST_P(DiskBuildQuery, FailingWithoutAMessage) {
    faults().add(
        along(GetParam().assocClass, refusal(GetParam().entry, CMPI_RC_ERR_NOT_SUPPORTED, {})));
    EXPECT_EQ(buildDisk(), GetParam().result);
    EXPECT_THAT(errors(), ElementsAre(failureLine(7, "NULL")));
    expectOutcome();
}

TEST_P(DiskBuildQuery, FailingDespiteAResult) {
    faults().add(along(GetParam().assocClass, refusalWithResult(GetParam().entry)));
    EXPECT_EQ(buildDisk(), GetParam().result);
    EXPECT_THAT(errors(), ElementsAre(failureLine(1, "NULL")));
    expectOutcome();
}

TEST_P(DiskBuildQuery, AnsweringNullWithoutAnError) {
    faults().add(along(GetParam().assocClass, answerNull(GetParam().entry)));
    EXPECT_EQ(buildDisk(), GetParam().result);
    EXPECT_EQ(CapturedSyslog::countContaining(" failed, status: rc"), 0u);
    expectOutcome();
}

INSTANTIATE_TEST_SUITE_P(Disk, DiskBuildQuery, testing::ValuesIn(kQueries),
                         [](const auto& given) { return given.param.label; });

class DiskBuildFailures : public DiskTest {};

TEST_F(DiskBuildFailures, EveryQueryAtOnceStopsAtTheFirst) {
    faults().add(refusal(Entry::Associators, CMPI_RC_ERR_FAILED, "down"));
    faults().add(refusal(Entry::AssociatorNames, CMPI_RC_ERR_FAILED, "down"));
    EXPECT_EQ(buildDisk(), -1);
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_ERR),
                ElementsAre("Associators " + kDrive +
                            " (assocClass: CIM_MediaPresent, resultClass: NULL) failed, "
                            "status: rc 1, msg down"));
    expectNothingCached();
}

TEST_F(DiskBuildFailures, MediaQueryLogsItsFailureBeforeTheDriveGoes) {
    faults().add(
        along("CIM_MediaPresent", refusal(Entry::Associators, CMPI_RC_ERR_FAILED, "down")));
    EXPECT_EQ(buildDisk(), -1);
    EXPECT_THAT(logLines(),
                ElementsAre("DEBUG BuildDiskInfo, ENTER...\n",
                            "DEBUG BuildDiskInfo, CIM Query - Associators: " + kDrive +
                                " (assocClass: CIM_MediaPresent, resultClass: NULL)",
                            "ERR Associators " + kDrive +
                                " (assocClass: CIM_MediaPresent, resultClass: NULL) failed, "
                                "status: rc 1, msg down",
                            "DEBUG Disk D1 deleted\n", "DEBUG BuildDiskInfo, EXIT(-1).\n"));
}

TEST_F(DiskBuildFailures, PathCloneMissingIsToldByName) {
    faults().add(answerNull(Entry::Clone, 0));
    EXPECT_EQ(buildDisk(), 0);
    ASSERT_NE(disk(), nullptr);
    EXPECT_EQ(disk()->DiskOp, nullptr);
    EXPECT_EQ(testbed::Broker::toPath(disk()->ExtentOp), objects_.extent);
    ASSERT_EQ(CapturedSyslog::linesAt(LOG_INFO).size(), 1u);
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_INFO)[0],
                testing::StartsWith("\nDiskOp: NULL\nExtentOp: " + kExtent + "\n"));
    EXPECT_EQ(books().queries().size(), 6u);
}

TEST_F(DiskBuildFailures, ExtentCloneMissingMeansNoPool) {
    faults().add(answerNull(Entry::Clone, 1));
    EXPECT_EQ(buildDisk(), -1);
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_ERR),
                ElementsAre("No pool associated with disk " + kDrive + "\n"));
    ASSERT_EQ(CapturedSyslog::linesAt(LOG_INFO).size(), 1u);
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_INFO)[0],
                testing::StartsWith("\nDiskOp: " + kDrive + "\nExtentOp: NULL\n"));
    EXPECT_EQ(books().queries().size(), 5u);
    expectNothingCached();
}

TEST_F(DiskBuildFailures, ExtentWithoutPathMeansNoPool) {
    testbed::FaultRule rule = answerNull(Entry::InstanceGetObjectPath);
    rule.className = "Sample_StorageExtent";
    faults().add(rule);
    EXPECT_EQ(buildDisk(), -1);
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_ERR),
                ElementsAre("No pool associated with disk " + kDrive + "\n"));
    expectNothingCached();
}

TEST_F(DiskBuildFailures, SlotWithoutPathHasNoChassis) {
    testbed::FaultRule rule = answerNull(Entry::InstanceGetObjectPath);
    rule.className = "Sample_Slot";
    faults().add(rule);
    EXPECT_EQ(buildDisk(), 0);
    EXPECT_EQ(disk()->SlotNumber, 4);
    EXPECT_EQ(disk()->Chassis, nullptr);
}

/// An enumeration that has an element but hands out a number.
class DiskBuildWrongElement : public DiskTest, public testing::WithParamInterface<int> {};

TEST_P(DiskBuildWrongElement, IsNeverFollowed) {
    faults().add(wrongElement(GetParam()));
    const bool mediaOrPool = GetParam() == 0 || GetParam() == 5;
    EXPECT_EQ(buildDisk(), mediaOrPool ? -1 : 0);
    EXPECT_EQ(ctrl->DiskList->Size, mediaOrPool ? 0u : 1u);
}

/// What a drive has from its extent, firmware, slot, chassis and pool.
struct Origins {
    CMPIUint64 blocks;
    std::string firmware;
    int slot;
    std::string chassis, pool;

    bool operator==(const Origins&) const = default;
};

void PrintTo(const Origins& origins, std::ostream* out) {
    *out << origins.blocks << " blocks, " << origins.firmware << ", slot " << origins.slot << " of "
         << origins.chassis << ", pool " << origins.pool;
}

TEST_P(DiskBuildWrongElement, GivesWayToTheNext) {
    // Each look-up finds a second object: those of another drive, an enclosure, a pool.
    const VendorDrive other = vendor.drive(card, "D2", poolPath_, chassis_, 9);
    vendor.tie("CIM_MediaPresent", objects_.drive, other.extent);
    vendor.tie("CIM_ElementSoftwareIdentity", other.software, objects_.drive);
    vendor.tie("CIM_Realizes", other.package, objects_.drive);
    vendor.tie("CIM_PackageInConnector", other.slot, objects_.package);
    vendor.tie("CIM_Container", vendor.chassis(card, "C0_33"), objects_.slot);
    vendor.tie("CIM_ConcreteComponent", vendor.pool(card, "P2"), objects_.extent);
    const CMPIUint64 blocks = 0x1'0000'0002;
    const Origins expected[] = {
        {2000, "FW-D1", 4, "C0_32", "P1"},   {blocks, "FW-D2", 4, "C0_32", "P1"},
        {blocks, "FW-D1", 9, "C0_32", "P1"}, {blocks, "FW-D1", 9, "C0_32", "P1"},
        {blocks, "FW-D1", 4, "C0_33", "P1"}, {blocks, "FW-D1", 4, "C0_32", "P2"}};
    faults().add(wrongElement(GetParam()));
    ASSERT_EQ(buildDisk(), 0);
    const DiskDrive_t* built = disk();
    const auto text = [](const char* field) { return field != nullptr ? field : "absent"; };
    EXPECT_EQ((Origins{built->NumberOfBlocks, text(built->FwVersion), built->SlotNumber,
                       text(built->Chassis), text(built->Pool)}),
              expected[GetParam()]);
}

INSTANTIATE_TEST_SUITE_P(Disk, DiskBuildWrongElement, testing::Range(0, 6));

TEST_F(DiskBuildFailures, MediaThatAreNoInstanceTurnTheDriveAwayAtOnce) {
    faults().add(wrongElement(0));
    EXPECT_EQ(buildDisk(), -1);
    EXPECT_EQ(books().queries().size(), 1u);
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_ERR), IsEmpty());
    expectNothingCached();
}

TEST_F(DiskBuildFailures, ChassisPathsWithoutATextAsTagGiveNoChassis) {
    const CimValue tags[] = {CimValue::null(CMPI_string), CimValue::uint32(7),
                             CimValue::boolean(true)};
    for (const CimValue& tag : tags) {
        SCOPED_TRACE(tag.text());
        repository.remove(chassis_);
        chassis_.key("Tag", tag);
        repository.put({chassis_, {}});
        vendor.tie("CIM_Container", chassis_, objects_.slot);
        ASSERT_EQ(buildDisk(), 0);
        EXPECT_EQ(disk()->Chassis, nullptr);
        EXPECT_EQ(disk()->SlotNumber, 4);
        ASSERT_EQ(DeleteDisk(ctrl, disk()), 0);
    }
}

TEST_F(DiskBuildFailures, ChassisPathWithoutTagGivesNoChassis) {
    repository.remove(chassis_);
    const Path nameless{"root/sample", "Sample_Chassis", {{"Other", CimValue::string("x")}}};
    repository.put({nameless, {}});
    vendor.tie("CIM_Container", nameless, objects_.slot);
    ASSERT_EQ(buildDisk(), 0);
    EXPECT_EQ(disk()->Chassis, nullptr);
}

}  // namespace
}  // namespace plexortest
