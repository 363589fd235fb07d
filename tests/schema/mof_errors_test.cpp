// What the parser refuses, where, and that nothing else comes out of garbage.
#include <fstream>
#include <random>
#include <sstream>

#include "mof_parsing.h"

namespace testbed {
namespace {

struct Refusal {
    const char* text;
    const char* complaint;
};

class MofErrors : public ::testing::TestWithParam<Refusal> {};

TEST_P(MofErrors, NameTheLine) {
    EXPECT_EQ(complaintAbout(GetParam().text), std::string("text.mof:") + GetParam().complaint);
}

const Refusal kRefusals[] = {
    {"\n\nclas A {};", R"(3: "class", "instance" or "qualifier" expected, not "clas")"},
    {"class", "1: the name of the class expected, not the end of the file"},
    {"class A\n", "2: \"{\" expected, not the end of the file"},
    {"class A {}", "1: \";\" expected, not the end of the file"},
    {"class A : {};", "1: the name of the superclass expected, not \"{\""},
    {"class A as B {};", "1: an alias expected, not \"B\""},
    {"class A {};\nclass a {};", "2: the class a twice"},
    {"class A {\nuint17 P;\n};", "2: unknown type uint17"},
    {"class A { string P\n};", "2: \";\" expected, not \"}\""},
    {"class A { string P[;};", "1: \"]\" expected, not \";\""},
    {"class A { string P; string\np; };", "2: the property p twice"},
    {"class A { uint32 Reset() };", "1: \";\" expected, not \"}\""},
    {"class A { uint32 Reset(; };", "1: a type expected, not \";\""},
    {"class A { uint32 Reset(uint8 a uint8 b); };", "1: \")\" expected, not \"uint8\""},
    {"class A { uint32 Reset(uint8 a, uint16 A); };", "1: the parameter A twice"},
    {"class A { uint32 Reset(); uint8\nreset(); };", "2: the method reset twice"},
    {"class A { B REF Make(); };", "1: the method Make returns a reference"},
    {"class A { B C(); };", "1: unknown type B"},
    {"Qualifier Key boolean;", "1: \":\" expected, not \"boolean\""},
    {"Qualifier Key : bool;", "1: unknown type bool"},
    {"Qualifier Key : boolean = 1;", "1: the default of Key is no boolean"},
    {"Qualifier Key : boolean, Scope();", "1: a word expected, not \")\""},
    {"Qualifier Key : boolean, Range(any);", "1: \"scope\" or \"flavor\" expected, not \"Range\""},
    {"Qualifier Key : boolean;\nQualifier key : boolean;\n",
     "2: the qualifier key is declared twice"},
    {"Qualifier Max : uint32; [Max(\"1\")] class A {};",
     "1: the value of the qualifier Max is no uint32"},
    {"[Key, Version(\"1\"), version(\"2\")] class A {};", "1: the qualifier version twice"},
    {"[Version(\"1\"] class A {};", "1: \")\" expected, not \"]\""},
    {"[Version(\"1\") :] class A {};", "1: a flavour expected, not \"]\""},
    {"[MaxLen(0x)] class A {};", "1: the value of the qualifier MaxLen cannot be read"},
    {"[Values{\"a\", 1}] class A {};", "1: the value of the qualifier Values cannot be read"},
    {"class A { uint8 P = 256; };", "1: the default of P is no uint8"},
    {"class A { uint8 P = -1; };", "1: the default of P is no uint8"},
    {"class A { sint8 P = -129; };", "1: the default of P is no sint8"},
    {"class A { uint64 P = 18446744073709551616; };", "1: the default of P is no uint64"},
    {"class A { uint16 P = 1.5; };", "1: the default of P is no uint16"},
    {"class A { uint16 P = \"1\"; };", "1: the default of P is no uint16"},
    {"class A { uint16 P = {1}; };", "1: the default of P is no uint16"},
    {"class A { uint16 P[] = 1; };", "1: the default of P is no uint16[]"},
    {"class A { uint16 P = 09; };", "1: the default of P is no uint16"},
    {"class A { uint16 P = 12b; };", "1: the default of P is no uint16"},
    {"class A { boolean P = 1; };", "1: the default of P is no boolean"},
    {"class A { string P = true; };", "1: the default of P is no string"},
    {"class A { B REF P = \"b\"; };", "1: the default of P is no reference"},
    {"class A { string P[] = {,}; };", "1: a value expected, not \",\""},
    {"instance A {};", "1: \"of\" expected, not \"A\""},
    {"instance of A { P = 1; p = 2; };", "1: the property p twice"},
    {"instance of A { P = 1 };", "1: \";\" expected, not \"}\""},
    {"instance of A { P 1; };", "1: \"=\" expected, not \"1\""},
    {"#include (\"x\")", "1: \"pragma\" expected, not \"include\""},
    {"#pragma locale \"x\"", "1: \"(\" expected, not the string \"x\""},
    {"#pragma locale (x)", "1: a string expected, not \"x\""},
    {"#pragma include (\"x.mof\"", "1: \")\" expected, not the end of the file"},
    {"\n#pragma include (\"x.mof\")", "2: includes x.mof"},
    {"class\n/* b\nc", "2: a comment without an end"},
    {"[Version(\"1\n\")]", "1: a string without an end"},
    {"[Version(\"1", "1: a string without an end"},
    {"[Version(\"\\q\")]", "1: an unknown escape in a literal"},
    {"[Version(\"\\x\")]", "1: an unknown escape in a literal"},
    {"[Version(\"\x01\")]", "1: a control character in a string"},
    {"[C('')]", "1: an empty character literal"},
    {"[C('ab')]", "1: a character literal without an end"},
    {"[C('\xc3\xa9')]", "1: a character literal beyond ASCII; write it as \\x"},
    {"class A { @ };", "1: a character that does not belong here"},
    {"$", "1: a character that does not belong here"},
    {"/", "1: a character that does not belong here"},
};

INSTANTIATE_TEST_SUITE_P(All, MofErrors, ::testing::ValuesIn(kRefusals));

std::string contentOf(const char* name) {
    std::ifstream stream(std::string(SCHEMA_DIR "/") + name);
    std::stringstream text;
    text << stream.rdbuf();
    EXPECT_FALSE(text.str().empty()) << name;
    return text.str();
}

const char* const kFiles[] = {"Tovexa_Plexor.mof", "Tovexa_PlexorStorageVolume.mof",
                              "Tovexa_PlexorStorageExtent.mof",
                              "registration/PlexorProviderModule.mof"};

TEST(MofGarbage, EveryTruncationEndsInAnErrorOrAWholePart) {
    for (const char* file : kFiles) {
        const std::string text = contentOf(file);
        std::size_t refused = 0;
        for (std::size_t length = 0; length < text.size(); ++length)
            refused += complaintAbout(text.substr(0, length)).empty() ? 0 : 1;
        EXPECT_GT(refused, text.size() / 4) << file;
    }
}

TEST(MofGarbage, RandomBytesAreRefused) {
    std::mt19937 random(1);
    for (int round = 0; round < 2000; ++round) {
        std::string text = "x";
        for (auto left = 1 + random() % 300; left > 0; left--) text += static_cast<char>(random());
        EXPECT_NE(complaintAbout(text), "");
    }
}

TEST(MofGarbage, SpoiltFilesAreReadOrRefused) {
    static constexpr std::string_view pieces[] = {"{", "}", "[", "]", "(", ")",  "\"",  "'",  ";",
                                                  ":", ",", "=", "$", "#", "/*", "\\x", "0x", "\n"};
    std::mt19937 random(2);
    int refused = 0;
    for (const char* file : kFiles) {
        const std::string text = contentOf(file);
        for (int round = 0; round < 200; ++round) {
            std::string spoilt = text;
            for (int change = 0; change < 3; ++change) {
                const std::size_t place = random() % spoilt.size();
                spoilt.replace(place, random() % 3, pieces[random() % std::size(pieces)]);
            }
            refused += complaintAbout(spoilt).empty() ? 0 : 1;
        }
    }
    EXPECT_GT(refused, 200);
}

TEST(MofGarbage, DepthAndLengthAreNoMatter) {
    const std::string many(1000000, '{');
    EXPECT_NE(complaintAbout("class A { string P[] = " + many), "");
    EXPECT_NE(complaintAbout(many), "");
    std::string list = "1";
    for (int i = 0; i < 200000; ++i) list += ",1";
    EXPECT_EQ(complaintAbout("class A { uint8 P[] = {" + list + "}; };"), "");
}

}  // namespace
}  // namespace testbed
