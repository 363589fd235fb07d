// What the broker gets as a property's value, as it stands in memory.
#include <optional>

#include "PlexorProviderIfcProperty.h"
#include "fake_instance.h"
#include "provider_fixture.h"

namespace plexortest {
namespace {

struct Given {
    std::string name;
    CMPIType type;
    CMPIBoolean boolean;
    bool operator==(const Given&) const = default;
};

std::optional<Given> given;

using PropertyValues = ProviderTest;

TEST_F(PropertyValues, ABooleanIsOneOrZero) {
    FakeInstance fake(dataOf(CMPI_boolean, 0));
    fake.table.setProperty = [](const CMPIInstance*, const char* name, const CMPIValue* value,
                                CMPIType type) {
        given = {name, type, *reinterpret_cast<const CMPIBoolean*>(value)};
        return CMPIStatus{CMPI_RC_OK, nullptr};
    };
    SetBoolean(&fake.instance, "Primordial", true);
    EXPECT_EQ(given, (Given{"Primordial", CMPI_boolean, 1}));
    SetBoolean(&fake.instance, "Primordial", false);
    EXPECT_EQ(given, (Given{"Primordial", CMPI_boolean, 0}));
}

}  // namespace
}  // namespace plexortest
