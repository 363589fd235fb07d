// Qualifiers and their declarations.
#include "mof_parser.h"

namespace testbed {
namespace {

/// What a qualifier without a value has.
CimValue valueless(CMPIType type) {
    return type == CMPI_boolean ? CimValue::boolean(true) : CimValue::null(type);
}

bool hasNamed(const Qualifiers& qualifiers, const std::string& name) {
    for (const NamedValue& qualifier : qualifiers) {
        if (sameName(qualifier.first, name)) return true;
    }
    return false;
}

}  // namespace

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
    std::optional<MofValue> value;
    if (token_.isSymbol('{')) {
        value = parseValue();
    } else if (take('(')) {
        value = parseValue();
        expect(')');
    }
    const CimValue typed = qualifierValue(name, std::move(value));
    skipFlavours();
    const bool isTrue = typed.type == CMPI_boolean && typed.asUnsigned() != 0;
    if (sameName(name, "Key")) {
        list.isKey = isTrue;
    } else if (sameName(name, "Association")) {
        list.isAssociation = isTrue;
    } else {
        list.others.emplace_back(name, typed);
    }
}

/// With the type that the qualifier was declared with, or the one that its value has.
CimValue MofParser::qualifierValue(const std::string& name, std::optional<MofValue> value) {
    const auto declared = document_.qualifierTypes.find(foldName(name));
    const bool isDeclared = declared != document_.qualifierTypes.end();
    if (!value) return valueless(isDeclared ? declared->second : CMPI_boolean);
    if (!isDeclared) {
        const auto natural = untypedValue(*value);
        if (!natural) fail("the value of the qualifier " + name + " cannot be read");
        return *natural;
    }
    const CMPIType type = declared->second;
    // A single value stands for a list of one.
    if ((type & CMPI_ARRAY) != 0 && !value->isNull()) value->isList = true;
    const auto typed = typedValue(*value, type);
    if (!typed) fail("the value of the qualifier " + name + " is no " + typeName(type));
    return *typed;
}

void MofParser::skipFlavours() {
    if (!take(':')) return;
    do {
        expectWord("a flavour");
    } while (token_.kind == MofTokenKind::Word);
}

/// Behind the word "qualifier": NAME : TYPE [= DEFAULT], SCOPE(...) [, FLAVOR(...)];
void MofParser::parseQualifierDeclaration() {
    const std::string name = expectWord("the name of the qualifier");
    if (document_.qualifierTypes.count(foldName(name)) > 0) {
        fail("the qualifier " + name + " is declared twice");
    }
    expect(':');
    const std::string typeWord = expectWord("the type of the qualifier");
    const auto element = mofType(typeWord);
    if (!element) fail("unknown type " + typeWord);
    const CMPIType type = parseArraySuffix(*element);
    if (take('=') && !typedValue(parseValue(), type)) {
        fail("the default of " + name + " is no " + typeName(type));
    }
    while (take(',')) {
        const std::string list = expectWord("\"scope\" or \"flavor\"");
        if (!sameName(list, "scope") && !sameName(list, "flavor")) {
            fail("\"scope\" or \"flavor\" expected, not \"" + list + "\"");
        }
        expect('(');
        do {
            expectWord("a word");
        } while (take(','));
        expect(')');
    }
    expect(';');
    document_.qualifierTypes.emplace(foldName(name), type);
}

}  // namespace testbed
