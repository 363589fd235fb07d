// Loading a provider's library and asking it as a client.
#include "provider_library.h"

#include "broker_fixture.h"

namespace testbed {
namespace {

std::string errorOf(const std::function<void()>& load) {
    try {
        load();
    } catch (const LoadError& error) {
        return error.what();
    }
    return "no error";
}

class ProviderLibraryTest : public BrokerTest {
protected:
    ProviderLibraryTest() { leaveCall(); }
    std::string load(const std::string& file, const std::string& name) {
        return errorOf([&] { ProviderLibrary(broker, file, name); });
    }
};

TEST_F(ProviderLibraryTest, ErrorsAreOneClearLine) {
    const std::string missing = load("/nowhere/libMissing.so", "Sample");
    EXPECT_EQ(missing.find("cannot load /nowhere/libMissing.so: "), 0u) << missing;
    EXPECT_EQ(missing.find('\n'), std::string::npos);
    EXPECT_EQ(load(SAMPLE_PROVIDER, "Other"),
              std::string(SAMPLE_PROVIDER) + " has no factory Other_Create_InstanceMI");
    EXPECT_EQ(load(SAMPLE_PROVIDER, "Unwilling"),
              "Unwilling_Create_InstanceMI returned no instance interface");
    EXPECT_EQ(broker.books().live(), 0u);
}

TEST_F(ProviderLibraryTest, FactoryIsCalledOnceMoreOnRequest) {
    ProviderLibrary library(broker, SAMPLE_PROVIDER, "Sample");
    const auto* factoryCalls = static_cast<const std::atomic<int>*>(library.mi()->hdl);
    EXPECT_EQ(*factoryCalls, 1);
    EXPECT_EQ(library.callFactory(), library.mi());
    EXPECT_EQ(*factoryCalls, 2);
}

TEST_F(ProviderLibraryTest, SymbolsAndUnload) {
    ProviderLibrary library(broker, SAMPLE_PROVIDER, "Sample");
    EXPECT_NE(library.symbol("Sample_Create_InstanceMI"), nullptr);
    EXPECT_EQ(library.symbol("nothing_of_that_name"), nullptr);
    EXPECT_EQ(library.unload(false), CMPI_RC_DO_NOT_UNLOAD);
    EXPECT_TRUE(library.isOpen());
    EXPECT_EQ(library.unload(true), CMPI_RC_OK);
    EXPECT_FALSE(library.isOpen());
    EXPECT_EQ(library.symbol("Sample_Create_InstanceMI"), nullptr);
    EXPECT_EQ(library.mi(), nullptr);
}

TEST_F(ProviderLibraryTest, RequestsReachTheProviderAndComeBack) {
    ProviderLibrary library(broker, SAMPLE_PROVIDER, "Sample");
    InstanceClient client = library.client();

    const Response names = client.enumerateInstanceNames("CIM_Some");
    EXPECT_EQ(names.rc, CMPI_RC_OK);
    EXPECT_EQ(names.message, std::nullopt);
    EXPECT_EQ(names.doneCalls, 1);
    ASSERT_EQ(names.paths.size(), 1u);
    EXPECT_EQ(names.paths[0], (ObjectPath{"root/cimv2", "CIM_Some", {}}));

    const Response all = client.enumerateInstances("CIM_Some", {}, "root/other");
    ASSERT_EQ(all.instances.size(), 1u);
    EXPECT_EQ(all.instances[0].path.nameSpace, "root/other");
    EXPECT_EQ(all.instances[0].find("Wanted"), nullptr);

    const Response some = client.enumerateInstances("CIM_Some", PropertyList({"A", "B"}));
    EXPECT_EQ(some.instances.at(0).find("Wanted")->asUnsigned(), 2u);
    const Response none = client.enumerateInstances("CIM_Some", std::vector<std::string>());
    EXPECT_EQ(*none.instances.at(0).find("Wanted"), CimValue::uint32(0));

    const Response missing = client.getInstance(drivePath("1"));
    EXPECT_EQ(missing.rc, CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(missing.message, drivePath("1").text());
    EXPECT_EQ(missing.doneCalls, 0);

    EXPECT_EQ(client.cleanup(true), CMPI_RC_OK);
    EXPECT_EQ(broker.books().live(), 0u);
    EXPECT_TRUE(broker.books().misuses().empty());
}

}  // namespace
}  // namespace testbed
