// Recursive descent over the tokens, one function for each construct of MOF.
#include "mof_parser.h"

#include "mof_error.h"

namespace testbed {

MofParser::MofParser(std::string_view text, const std::string& file, MofDocument& document,
                     Include include)
    : lexer_(text, file), document_(document), include_(std::move(include)) {}

void MofParser::fail(const std::string& what) const {
    throw MofError(lexer_.file(), token_.line, what);
}

void MofParser::advance() {
    token_ = lexer_.next();
}

bool MofParser::take(char symbol) {
    if (!token_.isSymbol(symbol)) return false;
    advance();
    return true;
}

void MofParser::expect(char symbol) {
    if (!take(symbol)) fail(std::string("\"") + symbol + "\" expected, not " + token_.shown());
}

bool MofParser::takeWord(std::string_view keyword) {
    if (!token_.isWord(keyword)) return false;
    advance();
    return true;
}

std::string MofParser::expectWord(const char* what) {
    if (token_.kind != MofTokenKind::Word) {
        fail(std::string(what) + " expected, not " + token_.shown());
    }
    std::string word = std::move(token_.text);
    advance();
    return word;
}

void MofParser::parse() {
    advance();
    while (token_.kind != MofTokenKind::End) {
        if (token_.isSymbol('#')) {
            parsePragma();
        } else {
            parseDeclaration();
        }
    }
}

void MofParser::parsePragma() {
    const int line = token_.line;
    advance();
    if (!takeWord("pragma")) fail("\"pragma\" expected, not " + token_.shown());
    const std::string name = expectWord("the name of the pragma");
    expect('(');
    if (token_.kind != MofTokenKind::String) fail("a string expected, not " + token_.shown());
    const std::string value = token_.text;
    advance();
    expect(')');
    if (sameName(name, "include")) include_(value, line);
}

void MofParser::parseDeclaration() {
    QualifierList qualifiers = parseQualifiers();
    if (takeWord("class")) {
        parseClass(std::move(qualifiers));
    } else if (takeWord("instance")) {
        parseInstance();
    } else if (takeWord("qualifier")) {
        parseQualifierDeclaration();
    } else {
        fail("\"class\", \"instance\" or \"qualifier\" expected, not " + token_.shown());
    }
}

void MofParser::skipAlias() {
    if (!takeWord("as")) return;
    if (token_.kind != MofTokenKind::Alias) fail("an alias expected, not " + token_.shown());
    advance();
}

void MofParser::parseClass(QualifierList qualifiers) {
    ClassDefinition definition;
    definition.name = expectWord("the name of the class");
    definition.qualifiers = std::move(qualifiers.others);
    definition.isAssociation = qualifiers.isAssociation;
    if (!document_.classNames.insert(foldName(definition.name)).second) {
        fail("the class " + definition.name + " twice");
    }
    skipAlias();
    if (take(':')) definition.superclass = expectWord("the name of the superclass");
    expect('{');
    while (!take('}')) parseMember(definition);
    expect(';');
    document_.classes.push_back(std::move(definition));
}

/// A property, a reference or a method.
void MofParser::parseMember(ClassDefinition& definition) {
    QualifierList qualifiers = parseQualifiers();
    const Declared head = parseTypeAndName();
    if (token_.isSymbol('(')) {
        parseMethod(definition, head, std::move(qualifiers.others));
    } else {
        parseProperty(definition, head, std::move(qualifiers));
    }
}

void MofParser::parseProperty(ClassDefinition& definition, const Declared& head,
                              QualifierList qualifiers) {
    for (const PropertyDefinition& other : definition.properties) {
        if (sameName(other.name, head.name)) fail("the property " + head.name + " twice");
    }
    PropertyDefinition property;
    property.name = head.name;
    property.referenceClass = head.referenceClass;
    property.type = parseArraySuffix(head.type);
    property.isKey = qualifiers.isKey;
    property.qualifiers = std::move(qualifiers.others);
    parseDefault(property);
    expect(';');
    definition.properties.push_back(std::move(property));
}

void MofParser::parseMethod(ClassDefinition& definition, const Declared& head,
                            Qualifiers qualifiers) {
    for (const MethodDefinition& other : definition.methods) {
        if (sameName(other.name, head.name)) fail("the method " + head.name + " twice");
    }
    if (head.type == CMPI_ref) fail("the method " + head.name + " returns a reference");
    MethodDefinition method{head.name, head.type, "", {}, std::move(qualifiers)};
    expect('(');
    if (!take(')')) {
        do {
            parseParameter(method);
        } while (take(','));
        expect(')');
    }
    expect(';');
    definition.methods.push_back(std::move(method));
}

void MofParser::parseParameter(MethodDefinition& method) {
    QualifierList qualifiers = parseQualifiers();
    const Declared head = parseTypeAndName();
    for (const ParameterDefinition& other : method.parameters) {
        if (sameName(other.name, head.name)) fail("the parameter " + head.name + " twice");
    }
    method.parameters.push_back({head.name, parseArraySuffix(head.type), head.referenceClass,
                                 std::move(qualifiers.others)});
}

MofParser::Declared MofParser::parseTypeAndName() {
    const std::string typeWord = expectWord("a type");
    Declared head;
    const auto type = mofType(typeWord);
    if (takeWord("REF")) {
        head.type = CMPI_ref;
        head.referenceClass = typeWord;
    } else if (type) {
        head.type = *type;
    } else {
        fail("unknown type " + typeWord);
    }
    head.name = expectWord("a name");
    return head;
}

CMPIType MofParser::parseArraySuffix(CMPIType type) {
    if (!take('[')) return type;
    // The size is of no consequence: CIM arrays may be shorter.
    if (token_.kind == MofTokenKind::Number) advance();
    expect(']');
    return static_cast<CMPIType>(type | CMPI_ARRAY);
}

void MofParser::parseDefault(PropertyDefinition& property) {
    property.defaultValue = CimValue::null(property.type);
    if (!take('=')) return;
    const auto value = typedValue(parseValue(), property.type);
    if (!value) fail("the default of " + property.name + " is no " + typeName(property.type));
    property.defaultValue = *value;
}

void MofParser::parseInstance() {
    if (!takeWord("of")) fail("\"of\" expected, not " + token_.shown());
    Instance instance;
    instance.path.className = expectWord("the name of the class");
    skipAlias();
    expect('{');
    while (!take('}')) parseAssignment(instance);
    expect(';');
    document_.instances.push_back(std::move(instance));
}

void MofParser::parseAssignment(Instance& instance) {
    parseQualifiers();
    const std::string name = expectWord("the name of a property");
    if (instance.find(name) != nullptr) fail("the property " + name + " twice");
    expect('=');
    const auto value = untypedValue(parseValue());
    if (!value) fail("the value of " + name + " cannot be read");
    instance.set(name, *value);
    expect(';');
}

MofValue MofParser::parseValue() {
    if (token_.isSymbol('{')) return parseList();
    return {false, {parseLiteral()}};
}

MofValue MofParser::parseList() {
    MofValue list{true, {}};
    expect('{');
    if (take('}')) return list;
    do {
        list.literals.push_back(parseLiteral());
    } while (take(','));
    expect('}');
    return list;
}

MofLiteral MofParser::parseLiteral() {
    MofLiteral literal{MofLiteralKind::Null, token_.text};
    switch (token_.kind) {
        case MofTokenKind::String:
            literal = {MofLiteralKind::String, ""};
            while (token_.kind == MofTokenKind::String) {
                literal.text += token_.text;
                advance();
            }
            return literal;
        case MofTokenKind::Number:
            literal.kind = MofLiteralKind::Number;
            break;
        case MofTokenKind::Character:
            literal.kind = MofLiteralKind::Character;
            break;
        case MofTokenKind::Alias:
            literal.kind = MofLiteralKind::Alias;
            break;
        default:
            if (token_.isWord("true") || token_.isWord("false")) {
                literal = {MofLiteralKind::Boolean, foldName(token_.text)};
            } else if (!token_.isWord("null")) {
                fail("a value expected, not " + token_.shown());
            }
    }
    advance();
    return literal;
}

}  // namespace testbed
