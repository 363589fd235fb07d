// Parses MOF: classes with their methods, instances, and declarations of qualifiers.
#pragma once

#include <functional>
#include <map>
#include <optional>
#include <set>
#include <string>
#include <string_view>
#include <vector>

#include "mof_lexer.h"
#include "mof_value.h"
#include "repository.h"

namespace testbed {

/// What MOF files declare, in their order.
struct MofDocument {
    /// As written: `originClass` is empty; references have the type CMPI_ref.
    std::vector<ClassDefinition> classes;
    /// Without keys and namespace; values typed as untypedValue does.
    std::vector<Instance> instances;
    /// What the qualifiers are declared as, by folded name; those of undeclared ones are typed as
    /// untypedValue does.
    std::map<std::string, CMPIType> qualifierTypes;
    std::set<std::string> classNames;  ///< of `classes`, folded
};

/// Reads one text into a document. Understands comments, #pragma, qualifiers with flavours (which
/// are not kept), their declarations, classes with properties, references and methods, instances.
class MofParser {
public:
    /// Called for `#pragma include`, with the file's name as written and the line.
    using Include = std::function<void(const std::string& name, int line)>;

    /// `text` and `document` must outlive the parser; `file` is for messages.
    MofParser(std::string_view text, const std::string& file, MofDocument& document,
              Include include);

    /// Adds everything in the text to the document. Throws MofError.
    void parse();

private:
    struct QualifierList {
        Qualifiers others;
        bool isKey = false;
        bool isAssociation = false;
    };

    /// What properties, methods and parameters begin with.
    struct Declared {
        std::string name;
        CMPIType type = CMPI_null;
        std::string referenceClass;  ///< of a reference
    };

    [[noreturn]] void fail(const std::string& what) const;
    void advance();
    void expect(char symbol);
    bool take(char symbol);
    bool takeWord(std::string_view keyword);
    std::string expectWord(const char* what);

    void parsePragma();
    void parseDeclaration();
    QualifierList parseQualifiers();
    void parseQualifier(QualifierList& list);
    CimValue qualifierValue(const std::string& name, std::optional<MofValue> value);
    void parseQualifierDeclaration();
    void skipFlavours();
    void skipAlias();
    void parseClass(QualifierList qualifiers);
    void parseMember(ClassDefinition& definition);
    Declared parseTypeAndName();
    void parseProperty(ClassDefinition& definition, const Declared& head, QualifierList qualifiers);
    void parseMethod(ClassDefinition& definition, const Declared& head, Qualifiers qualifiers);
    void parseParameter(MethodDefinition& method);
    CMPIType parseArraySuffix(CMPIType type);
    void parseDefault(PropertyDefinition& property);
    void parseInstance();
    void parseAssignment(Instance& instance);
    MofValue parseValue();
    MofValue parseList();
    MofLiteral parseLiteral();

    MofLexer lexer_;
    MofDocument& document_;
    Include include_;
    MofToken token_;
};

}  // namespace testbed
