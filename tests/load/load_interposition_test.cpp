// Names that another component of the process has too never stand in for the provider's own.
#include "decoys.h"
#include "loaded_fixture.h"
#include "quick_sleep.h"

namespace {

class LoadInterpositionTest : public loadtest::LoadTest {};

// Without this the tests below could not fail.
TEST_F(LoadInterpositionTest, DecoysAreWhatALibraryFindsFirst) {
    EXPECT_TRUE(loadtest::decoysAreExported());
}

TEST_F(LoadInterpositionTest, DecoysAreNeverCalledAndNeverWritten) {
    const loadtest::QuickSleep quick;
    loadUseUnload();
    EXPECT_EQ(loadtest::decoyCalls(), 0);
    EXPECT_TRUE(loadtest::decoysAreUntouched());
}

TEST_F(LoadInterpositionTest, TheLibraryUsesItsOwnVariables) {
    const loadtest::QuickSleep quick;
    testbed::ProviderLibrary library = load();
    EXPECT_EQ(*static_cast<const void**>(library.symbol("Broker")), broker.handle());
    EXPECT_EQ(*static_cast<int*>(library.symbol("_ProviderInitialized")), 1);
    EXPECT_NE(library.symbol("Broker"), dlsym(RTLD_DEFAULT, "Broker"));
    EXPECT_NE(library.symbol("FreeList"), dlsym(RTLD_DEFAULT, "FreeList"));
    ASSERT_TRUE(comesToRest(library));
    EXPECT_EQ(library.unload(true), 0);
}

}  // namespace
