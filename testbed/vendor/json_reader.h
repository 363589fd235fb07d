// Strict reading of one JSON object: every member has a type, unknown members are errors, and
// every error says where it is.
#pragma once

#include <cstdint>
#include <memory>
#include <nlohmann/json.hpp>
#include <optional>
#include <string>
#include <vector>

#include "cim_words.h"
#include "scenario.h"

namespace testbed {

/// A ScenarioError that knows the place, for those who can tell its line.
struct PlacedError : ScenarioError {
    PlacedError(const std::string& text, std::string where)
        : ScenarioError(text), place(std::move(where)) {}
    std::string place;
};

/// How a place names the elements of lists: by their number, or, in a document that no file has, by
/// their id.
enum class ElementNames { Numbers, Ids };

/// A member that is a text or a number in the place of one, as its text; "" without it.
std::string textIn(const nlohmann::json& object, const char* name);

/// The id of a list's element as the scenario has it: text or number; "" without one.
std::string idOf(const nlohmann::json& element);

/// A JSON value with the place where it stands: "scenarios/x.json: controllers[0].drives[3]".
struct JsonPlace {
    const nlohmann::json* value;
    std::string file;
    std::string place;
    ElementNames names = ElementNames::Numbers;
    std::shared_ptr<const nlohmann::json> kept = nullptr;  ///< keeps a value that no document has

    /// Throws PlacedError with file and place before the text; `about` is the member that the text
    /// is about.
    [[noreturn]] void fail(const std::string& what, const std::string& about = "") const;
    JsonPlace member(const std::string& name) const;
    JsonPlace element(std::size_t index) const;
};

/// Reads the members of one object. All functions throw ScenarioError. The document must outlive
/// the reader.
class JsonReader {
public:
    /// Fails when the value is not an object.
    explicit JsonReader(JsonPlace place);

    bool has(const std::string& name) const;
    /// The member, marked as known; nothing when it is absent.
    std::optional<JsonPlace> take(const std::string& name);

    /// A text; numbers are taken as their decimal text (a slot or enclosure number as an id).
    std::string text(const std::string& name);
    std::string text(const std::string& name, const std::string& absent);
    std::optional<std::string> optionalText(const std::string& name);
    bool flag(const std::string& name, bool absent = false);
    /// A whole number from 0 to `maximum`; also as decimal text, as repetitions produce it.
    std::optional<std::uint64_t> number(const std::string& name,
                                        std::uint64_t maximum = UINT64_MAX);
    std::uint16_t number16(const std::string& name, std::uint16_t absent);
    /// A whole number that an int holds.
    int integer(const std::string& name, int absent);
    /// A text, or a list of texts.
    std::vector<std::string> texts(const std::string& name);
    /// A number of a value map, given as itself or as its word.
    std::uint16_t code(const std::string& name, CodeWords words, std::uint16_t absent);
    /// A state word; NULL when the member is absent.
    const StateWord* state(const std::string& name, StateWords states);
    /// The elements of a list of objects, repetitions written out; none when the member is absent.
    std::vector<JsonPlace> list(const std::string& name);

    /// Fails on the first member that nobody has asked for.
    void finish() const;
    [[noreturn]] void fail(const std::string& what) const { place_.fail(what); }
    const JsonPlace& place() const { return place_; }

private:
    /// The member, marked as known; NULL when it is absent.
    const nlohmann::json* find(const std::string& name);

    JsonPlace place_;
    std::vector<const nlohmann::json*> known_;
};

/// Scalars as every reader takes them; they fail at their place.
std::string readText(const JsonPlace& place);
std::uint64_t readNumber(const JsonPlace& place, std::uint64_t maximum);

// Repetitions: an element of a list that has the member "count" (and perhaps "first") stands for
// that many elements, in whose texts "{n}" is the running number. An inner repetition has its own
// number.

/// What an element of a list stands for; they keep its place.
std::vector<JsonPlace> repetitionsOf(const JsonPlace& element);

/// Fails when the document with all repetitions written out would be too large.
void limitRepetitions(const JsonPlace& document);

/// Writes out all repetitions of a document that can be read.
void expandRepetitions(nlohmann::json& document);

}  // namespace testbed
