#include "synthetic_schema.h"

#include <fstream>
#include <random>
#include <sstream>
#include <string>

namespace testbed {
namespace {

namespace fs = std::filesystem;

constexpr const char* kQualifiers =
    "Qualifier Abstract : boolean = false,\n    Scope(class, association, indication),\n"
    "    Flavor(EnableOverride, Restricted);\n\n"
    "Qualifier Association : boolean = false,\n    Scope(association), Flavor(DisableOverride);\n"
    "Qualifier Description : string = null,\n    Scope(any), Flavor(EnableOverride, "
    "Translatable);\n"
    "Qualifier In : boolean = true, Scope(parameter), Flavor(DisableOverride);\n"
    "Qualifier Key : boolean = false, Scope(property, reference), Flavor(DisableOverride);\n"
    "Qualifier MappingStrings : string[], Scope(any);\n"
    "Qualifier MaxLen : uint32 = null, Scope(property, method, parameter);\n"
    "Qualifier Out : boolean = false, Scope(parameter), Flavor(DisableOverride);\n"
    "Qualifier Override : string = null, Scope(property, method, reference);\n"
    "Qualifier Required : boolean = false, Scope(property);\n"
    "Qualifier ValueMap : string[], Scope(property, method, parameter);\n"
    "Qualifier Values : string[], Scope(property, method, parameter), Flavor(Translatable);\n"
    "Qualifier Version : string = null, Scope(class, association), Flavor(Restricted);\n";

class Writer {
public:
    Writer(fs::path directory, std::size_t classes) : directory_(std::move(directory)) {
        schema_.classes = classes;
    }

    SyntheticSchema write() {
        std::ostringstream all;
        all << "#pragma locale (\"en_US\")\n#pragma include (\"qualifiers.mof\")\n";
        save("qualifiers.mof", kQualifiers);
        for (std::size_t i = 0; i < schema_.classes; i++) {
            const std::string name = "Part" + std::to_string(i % 12) + "/" + className(i) + ".mof";
            fs::create_directories((directory_ / name).parent_path());
            save(name, classText(i));
            all << "#pragma include (\"" << name << "\")\n";
        }
        save("schema.mof", all.str());
        schema_.file = directory_ / "schema.mof";
        return schema_;
    }

private:
    static std::string className(std::size_t i) { return "SYN_Class" + std::to_string(i); }
    /// The first ten make a chain; the others hang below one of those.
    static std::size_t superclassOf(std::size_t i) { return i < 10 ? i - 1 : i % 10; }
    static bool isAssociation(std::size_t i) { return i >= 10 && i % 3 == 0; }

    void save(const std::string& name, const std::string& text) {
        std::ofstream(directory_ / name, std::ios::binary) << text;
        schema_.bytes += text.size();
        schema_.files++;
    }

    /// About that many characters, over several lines.
    std::string description(std::size_t length) {
        std::ostringstream text;
        text << "Description (";
        for (std::size_t written = 0; written < length; written += 70) {
            text << "\n        \"";
            for (int word = 0; word < 11; word++) text << "word" << random_() % 10 << ' ';
            text << (random_() % 8 == 0 ? "\\\"quoted\\\" \\n" : "") << '"';
        }
        return text.str() + " )";
    }

    std::string values(std::size_t count) {
        std::ostringstream map, texts;
        for (std::size_t i = 0; i < count; i++) {
            map << (i ? ", " : "") << '"' << i << '"';
            texts << (i ? ", " : "") << "\n        \"Value " << i << " of many\"";
        }
        return "ValueMap { " + map.str() + " },\n      Values { " + texts.str() + " }";
    }

    std::string property(std::size_t i) {
        schema_.properties++;
        const std::string name = "Property" + std::to_string(i);
        const std::string head = "\n      [" + description(400);
        switch (i % 5) {
            case 0:
                return head + ",\n      " + values(12) + "]\n   uint16 " + name + " = 5;\n";
            case 1:
                return head + ", MaxLen ( 256 )]\n   string " + name + ";\n";
            case 2:
                return head + ",\n      " + values(6) + "]\n   uint16 " + name + "[];\n";
            case 3:
                return head + ", MappingStrings { \"A.B|C.D\" }]\n   boolean " + name +
                       " = true;\n";
            default:
                return head + "]\n   datetime " + name + ";\n";
        }
    }

    std::string method(std::size_t i) {
        schema_.methods++;
        schema_.parameters += 4;
        return "\n      [" + description(500) + ",\n      " + values(10) + "]\n   uint32 Method" +
               std::to_string(i) + "(\n      [" + description(200) + "]\n      uint16 State,\n" +
               "      [In ( false ), Out, " + description(150) + "]\n      SYN_Class0 REF Job,\n" +
               "      [In, Out]\n      string Names[],\n      [In]\n      SYN_Class0 REF All[]);\n";
    }

    std::string classText(std::size_t i) {
        std::ostringstream text;
        text << "// Made by a test.\n   [" << (isAssociation(i) ? "Association, " : "")
             << (i < 10 ? "Abstract, " : "") << "Version ( \"2.8.0\" ), \n    " << description(600)
             << "]\nclass " << className(i);
        if (i > 0) text << " : " << className(superclassOf(i));
        text << " {\n";
        if (i == 0) text << "\n      [Key, " << description(100) << "]\n   string InstanceID;\n";
        if (i == 0) schema_.properties++;
        if (isAssociation(i)) {
            text << "\n      [Key]\n   SYN_Class0 REF Left;\n\n      [Key]\n   SYN_Class1 REF "
                    "Right;\n";
            schema_.properties += 2;
        }
        for (std::size_t p = 0; p < 6; p++) text << property(100 * (i < 10 ? i : 10) + p);
        if (i % 4 == 0) text << method(i < 10 ? i : 10);
        return text.str() + "};\n";
    }

    fs::path directory_;
    SyntheticSchema schema_;
    std::mt19937 random_{1};
};

}  // namespace

SyntheticSchema writeSyntheticSchema(const fs::path& directory, std::size_t classes) {
    return Writer(directory, classes).write();
}

}  // namespace testbed
