#include "mof_parser.h"

#include <algorithm>

#include "mof_error.h"

namespace testbed {
namespace {

/// True when one of the values has that name.
bool hasNamed(const std::vector<NamedValue>& values, const std::string& name) {
    return std::any_of(values.begin(), values.end(),
                       [&](const NamedValue& value) { return sameName(value.first, name); });
}

/// A qualifier without a value is true.
MofValue trueValue() {
    return {false, {{MofLiteralKind::Boolean, "true"}}};
}

}  // namespace

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
    if (token_.kind != MofTokenKind::Word)
        fail(std::string(what) + " expected, not " + token_.shown());
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
    } else if (token_.isWord("qualifier")) {
        fail("declarations of qualifiers are not read");
    } else {
        fail("\"class\" or \"instance\" expected, not " + token_.shown());
    }
}

MofParser::QualifierList MofParser::parseQualifiers() {
    QualifierList list;
    if (!take('[')) return list;
    do {
        parseQualifier(list);
    } while (take(','));
    expect(']');
    return list;
}

void MofParser::parseQualifier(QualifierList& list) {
    const std::string name = expectWord("a qualifier");
    if (hasNamed(list.others, name)) fail("the qualifier " + name + " twice");
    MofValue value = trueValue();
    if (token_.isSymbol('{')) {
        value = parseValue();
    } else if (take('(')) {
        value = parseValue();
        expect(')');
    }
    const auto typed = untypedValue(value);
    if (!typed) fail("the value of the qualifier " + name + " cannot be read");
    skipFlavours();
    const bool isTrue = typed->type == CMPI_boolean && typed->asUnsigned() != 0;
    if (sameName(name, "Key")) {
        list.isKey = isTrue;
    } else if (sameName(name, "Association")) {
        list.isAssociation = isTrue;
    } else {
        list.others.emplace_back(name, *typed);
    }
}

void MofParser::skipFlavours() {
    if (!take(':')) return;
    do {
        expectWord("a flavour");
    } while (token_.kind == MofTokenKind::Word);
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
    for (const ClassDefinition& other : document_.classes)
        if (sameName(other.name, definition.name)) fail("the class " + definition.name + " twice");
    skipAlias();
    if (take(':')) definition.superclass = expectWord("the name of the superclass");
    expect('{');
    while (!take('}')) parseProperty(definition);
    expect(';');
    document_.classes.push_back(std::move(definition));
}

void MofParser::parseProperty(ClassDefinition& definition) {
    QualifierList qualifiers = parseQualifiers();
    PropertyDefinition property = parsePropertyHead();
    for (const PropertyDefinition& other : definition.properties)
        if (sameName(other.name, property.name)) fail("the property " + property.name + " twice");
    property.isKey = qualifiers.isKey;
    property.qualifiers = std::move(qualifiers.others);
    parseDefault(property);
    expect(';');
    definition.properties.push_back(std::move(property));
}

/// Type, name and brackets.
PropertyDefinition MofParser::parsePropertyHead() {
    const std::string typeWord = expectWord("the type of a property");
    PropertyDefinition property;
    const auto type = mofType(typeWord);
    if (takeWord("REF")) {
        property.type = CMPI_ref;
    } else if (type) {
        property.type = *type;
    } else {
        fail("unknown type " + typeWord);
    }
    property.name = expectWord("the name of a property");
    if (token_.isSymbol('(')) fail("methods are not read");
    property.type = parseArraySuffix(property.type);
    return property;
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
