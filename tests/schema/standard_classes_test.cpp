// A schema as standards bodies publish it, read whole.
#include "standard_classes.h"

#include <ctime>

#include "mof_error.h"
#include "mof_reader.h"
#include "schema_choice.h"
#include "schema_space.h"
#include "scratch_directory.h"
#include "standard_qualifiers.h"
#include "synthetic_schema.h"

namespace testbed {
namespace {

std::string textOf(const Qualifiers& qualifiers, const char* name) {
    for (const auto& [known, value] : qualifiers)
        if (sameName(known, name)) return typeName(value.type) + " " + value.text();
    return "none";
}

class StandardClasses : public ::testing::Test {
protected:
    void define(const std::string& text) {
        directory_.write("all.mof", text);
        defineStandardClasses(repository_, kSpace, directory_.path() / "all.mof");
    }
    ClassDefinition found(const char* name) const {
        return repository_.findClass(kSpace, name).value_or(ClassDefinition());
    }

    ScratchDirectory directory_;
    Repository repository_;
};

TEST_F(StandardClasses, OfAPublishedSchemasSizeAreReadInASecond) {
    const SyntheticSchema schema = writeSyntheticSchema(directory_.path(), 1450);
    ASSERT_GT(schema.bytes, 6'000'000U);
    const std::clock_t begin = std::clock();
    defineStandardClasses(repository_, kSpace, schema.file);
    const double taken = static_cast<double>(std::clock() - begin) / CLOCKS_PER_SEC;
    std::printf("%zu classes, %zu files, %.1f MB: %.2f CPU s\n", schema.classes, schema.files,
                static_cast<double>(schema.bytes) / 1e6, taken);
    // A second is what an idle machine needs at most; others share their caches, or check
    // addresses.
    EXPECT_LT(taken, 20);
    std::size_t properties = 0, methods = 0, parameters = 0;
    for (const std::string& name : repository_.classNames(kSpace)) {
        const ClassDefinition definition = *repository_.findClass(kSpace, name);
        properties += definition.properties.size();
        methods += definition.methods.size();
        for (const MethodDefinition& method : definition.methods)
            parameters += method.parameters.size();
    }
    EXPECT_EQ(repository_.classNames(kSpace).size(), 1450U);
    EXPECT_EQ(properties, schema.properties);
    EXPECT_EQ(methods, schema.methods);
    EXPECT_EQ(parameters, schema.parameters);
    EXPECT_TRUE(repository_.isA(kSpace, "SYN_Class1449", "SYN_Class0"));
    EXPECT_TRUE(found("SYN_Class12").isAssociation);
}

TEST_F(StandardClasses, QualifiersHaveTheTypeTheyAreDeclaredWith) {
    define(R"(
        Qualifier MaxLen : uint32 = null, Scope(property), Flavor(DisableOverride);
        Qualifier Units : string = null, Scope(any);
        Qualifier Values : string[] = {"a"}, Scope(property, method), Flavor(Translatable);
        [Units] class A { [MaxLen(64), Values("b"), Undeclared(1)] string P; };)");
    const ClassDefinition definition = found("A");
    const Qualifiers& ofProperty = definition.properties.at(0).qualifiers;
    EXPECT_EQ(textOf(ofProperty, "MaxLen"), "uint32 64");
    EXPECT_EQ(textOf(ofProperty, "Values"), "string[] [b]");
    EXPECT_EQ(textOf(ofProperty, "Undeclared"), "uint64 1");
}

TEST_F(StandardClasses, MethodsHaveParameters) {
    define(R"(
        class A {
            [Description("Begins anew."), Values{"OK"}]
            uint32 Reset([In, Description("How.")] uint16 Mode, [In(false), Out] A REF Job,
                         string Names[], A REF All[]);
            boolean Test();
        };
        class B : A { [Override("Test")] boolean Test(); datetime When(); };)");
    const ClassDefinition a = found("A"), b = found("B");
    ASSERT_EQ(a.methods.size(), 2U);
    EXPECT_EQ(a.methods[0].name, "Reset");
    EXPECT_EQ(a.methods[0].type, CMPI_uint32);
    EXPECT_EQ(textOf(a.methods[0].qualifiers, "Values"), "string[] [OK]");
    ASSERT_EQ(a.methods[0].parameters.size(), 4U);
    EXPECT_EQ(a.methods[0].parameters[0].type, CMPI_uint16);
    EXPECT_EQ(textOf(a.methods[0].parameters[1].qualifiers, "In"), "boolean false");
    EXPECT_EQ(a.methods[0].parameters[1].referenceClass, "A");
    EXPECT_EQ(a.methods[0].parameters[2].type, CMPI_stringA);
    EXPECT_EQ(a.methods[0].parameters[3].type, CMPI_ref | CMPI_ARRAY);
    EXPECT_EQ(b.methods[0].originClass, "A");
    EXPECT_EQ(b.methods[1].originClass, "B");
    EXPECT_EQ(repository_.allMethods(kSpace, "B").size(), 3U);
}

TEST_F(StandardClasses, MayComeBeforeTheirSuperclasses) {
    define(R"(
        class C : B { [Override("K")] string K; };
        class B : A { uint8 P; };
        class A { [Key] string K; };
        [Association] class D { [Key] A REF Left; [Key] A REF Right; };
        class E : D {};)");
    EXPECT_EQ(repository_.classNames(kSpace), (std::vector<std::string>{"A", "B", "C", "D", "E"}));
    EXPECT_EQ(found("C").properties.at(0).originClass, "A");
    EXPECT_TRUE(found("C").properties.at(0).isKey);
    EXPECT_EQ(found("D").properties.at(0).referenceClass, "A");
    EXPECT_TRUE(found("E").isAssociation);
}

TEST_F(StandardClasses, NeedTheirSuperclasses) {
    try {
        define("class A : Missing {};");
        FAIL();
    } catch (const std::runtime_error& error) {
        EXPECT_STREQ(error.what(), "schema: A derives from Missing, which is not known");
    }
    repository_.defineClass(kSpace, {"Missing", "", {{"K", CMPI_string, true, "Missing", {}}}});
    define("class A : Missing { [Override(\"K\")] string K; };");
    EXPECT_EQ(found("A").properties.at(0).originClass, "Missing");
    EXPECT_TRUE(found("A").properties.at(0).isKey);
}

TEST_F(StandardClasses, MayBeChosenBelowTheProvidersClasses) {
    directory_.write("all.mof", R"(
        class CIM_ManagedElement { uint16 Generation; string Caption; string Description;
                                   string ElementName; };)");
    defineChosenClasses(repository_, kSpace, directory_.path() / "all.mof");
    EXPECT_TRUE(repository_.findProperty(kSpace, "Tovexa_PlexorBattery", "Generation"));
    const std::string nowhere = directory_.path() / "nowhere";
    EXPECT_THROW(defineChosenClasses(repository_, kSpace, nowhere), MofError);
}

TEST_F(StandardClasses, AreQualifiedAsTheStandardHasIt) {
    defineChosenClasses(repository_, kSpace, SCHEMA_DIR);
    EXPECT_EQ(textOf(found("CIM_LogicalDevice").qualifiers, "Abstract"), "boolean true");
    EXPECT_EQ(textOf(found("CIM_DiskDrive").qualifiers, "Abstract"), "none");
    for (const std::string& name : repository_.classNames(kSpace))
        for (const PropertyDefinition& property : found(name.c_str()).properties) {
            if (property.type == CMPI_ref) {
                EXPECT_TRUE(repository_.hasClass(kSpace, property.referenceClass))
                    << name << "." << property.name;
            }
        }
    const auto state = repository_.findProperty(kSpace, "CIM_Battery", "BatteryStatus");
    EXPECT_NE(textOf(state->qualifiers, "Values").find("Learning"), std::string::npos);
    const auto before = repository_.allProperties(kSpace, "CIM_Battery").size();
    qualifyStandardClasses(repository_, kSpace);
    const auto again = repository_.findProperty(kSpace, "CIM_Battery", "BatteryStatus");
    EXPECT_EQ(again->qualifiers.size(), state->qualifiers.size());
    EXPECT_EQ(repository_.allProperties(kSpace, "CIM_Battery").size(), before);
}

}  // namespace
}  // namespace testbed
