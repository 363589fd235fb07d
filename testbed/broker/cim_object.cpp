// Comparing names, finding values by them, and the texts and identities of object paths.
#include "cim_object.h"

#include <algorithm>

namespace testbed {

namespace {

char foldCharacter(char character) {
    return character >= 'A' && character <= 'Z' ? static_cast<char>(character - 'A' + 'a')
                                                : character;
}

/// Iterator to the value of that name; works on constant and other lists.
template <class Values>
auto findNamed(Values& values, std::string_view name) {
    return std::find_if(values.begin(), values.end(),
                        [&](const NamedValue& value) { return sameName(value.first, name); });
}

void assign(std::vector<NamedValue>& values, std::string_view name, CimValue value) {
    const auto found = findNamed(values, name);
    if (found != values.end()) {
        found->second = std::move(value);
    } else {
        values.emplace_back(std::string(name), std::move(value));
    }
}

const CimValue* findValue(const std::vector<NamedValue>& values, std::string_view name) {
    const auto found = findNamed(values, name);
    return found == values.end() ? nullptr : &found->second;
}

void appendFolded(std::string& result, std::string_view name) {
    const auto end = static_cast<std::ptrdiff_t>(result.size());
    result += name;
    std::transform(result.begin() + end, result.end(), result.begin() + end, foldCharacter);
}

void appendQuoted(std::string& result, std::string_view text) {
    result += '"';
    for (char character : text) {
        if (character == '"' || character == '\\') result += '\\';
        result += character;
    }
    result += '"';
}

bool isText(const CimValue& value) {
    return std::holds_alternative<std::string>(value.data);
}

/// A key value that is equal for equal content: integers compare by number, whatever their width.
void appendKeyIdentity(std::string& result, const CimValue& value) {
    if (value.isNull) {
        result += "<null>";
    } else if (isText(value)) {
        appendQuoted(result, value.asString());
    } else if (const auto* path = std::get_if<std::shared_ptr<const ObjectPath>>(&value.data)) {
        appendQuoted(result, (*path)->identity());
    } else {
        result += value.text();
    }
}

/// `name=value`, of which a path's identity has one for each key.
std::string identityOf(const NamedValue& key) {
    std::string result;
    appendFolded(result, key.first);
    result += '=';
    appendKeyIdentity(result, key.second);
    return result;
}

}  // namespace

bool sameName(std::string_view left, std::string_view right) {
    return std::equal(left.begin(), left.end(), right.begin(), right.end(),
                      [](char a, char b) { return foldCharacter(a) == foldCharacter(b); });
}

std::string foldName(std::string_view name) {
    std::string folded;
    appendFolded(folded, name);
    return folded;
}

std::size_t NameHash::operator()(std::string_view name) const {
    std::size_t hash = 0;
    for (char character : name)
        hash = hash * 131 + static_cast<unsigned char>(foldCharacter(character));
    return hash;
}

ObjectPath& ObjectPath::key(std::string_view name, CimValue value) {
    assign(keys, name, std::move(value));
    return *this;
}

const CimValue* ObjectPath::findKey(std::string_view name) const {
    return findValue(keys, name);
}

bool ObjectPath::operator==(const ObjectPath& other) const {
    return keys.size() == other.keys.size() && sameName(className, other.className) &&
           identity() == other.identity();
}

std::string ObjectPath::text() const {
    std::string result = nameSpace + ":" + className;
    char separator = '.';
    for (const auto& [name, value] : keys) {
        result += separator + name + "=";
        result += isText(value) ? '"' + value.asString() + '"' : value.text();
        separator = ',';
    }
    return result;
}

std::string ObjectPath::identity() const {
    std::string result;
    appendFolded(result, nameSpace);
    result += ':';
    appendFolded(result, className);
    std::vector<std::string> parts;
    parts.reserve(keys.size());
    for (const NamedValue& key : keys) parts.push_back(identityOf(key));
    std::sort(parts.begin(), parts.end());
    char separator = '.';
    for (const std::string& part : parts) {
        result += separator;
        result += part;
        separator = ',';
    }
    return result;
}

Instance& Instance::set(std::string_view name, CimValue value) {
    assign(properties, name, std::move(value));
    return *this;
}

void Instance::erase(std::string_view name) {
    const auto found = findNamed(properties, name);
    if (found != properties.end()) properties.erase(found);
}

const CimValue* Instance::find(std::string_view name) const {
    return findValue(properties, name);
}

}  // namespace testbed
