// Parses MOF: classes and instances.
#pragma once

#include <functional>
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
};

/// Reads one text into a document. Understands comments, #pragma, qualifiers with flavours (which
/// are not kept), classes with properties and references, instances. Refuses declarations of
/// qualifiers, and methods.
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
    void skipFlavours();
    void skipAlias();
    void parseClass(QualifierList qualifiers);
    void parseProperty(ClassDefinition& definition);
    PropertyDefinition parsePropertyHead();
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
