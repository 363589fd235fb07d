// Reading JSON with the position in mind, for errors that tell line and column.
#include "json_document.h"

#include <algorithm>
#include <iterator>
#include <set>
#include <vector>

#include "scenario.h"

namespace testbed {
namespace {

using nlohmann::json;

/// Deeper than any scenario; far from what would exhaust a stack.
constexpr std::size_t kDeepest = 64;

/// Line and column of the character that was read last, both from one.
struct Position {
    std::size_t line = 1;
    std::size_t column = 0;
    bool lineEnded = false;

    void advance(char c) {
        if (lineEnded) {
            ++line;
            column = 0;
        }
        lineEnded = c == '\n';
        ++column;
    }
};

/// Reads the text and keeps the position, for events that come without one.
class CountingIterator {
public:
    using iterator_category = std::input_iterator_tag;
    using value_type = char;
    using difference_type = std::ptrdiff_t;
    using pointer = const char*;
    using reference = const char&;

    CountingIterator(const char* at, Position* position) : at_(at), position_(position) {}
    reference operator*() const { return *at_; }
    CountingIterator& operator++() {
        position_->advance(*at_++);
        return *this;
    }
    bool operator==(const CountingIterator& other) const { return at_ == other.at_; }
    bool operator!=(const CountingIterator& other) const { return at_ != other.at_; }

private:
    const char* at_;
    Position* position_;
};

/// What the parser tells while it reads, for those who build a document and those who look for a
/// place in one.
class Reader : public nlohmann::json_sax<json> {
public:
    Reader(const std::string& text, std::string name) : text_(text), name_(std::move(name)) {}

    bool read() {
        const char* begin = text_.data();
        return json::sax_parse(CountingIterator(begin, &position_),
                               CountingIterator(begin + text_.size(), &position_), this);
    }

    bool null() override { return add(nullptr); }
    bool boolean(bool value) override { return add(value); }
    bool number_integer(number_integer_t value) override { return add(value); }
    bool number_unsigned(number_unsigned_t value) override { return add(value); }
    bool number_float(number_float_t value, const string_t&) override { return add(value); }
    bool string(string_t& value) override { return add(std::move(value)); }
    bool binary(binary_t&) override { return false; }
    bool start_object(std::size_t) override { return open(json::object()); }
    bool start_array(std::size_t) override { return open(json::array()); }
    bool end_object() override { return close(); }
    bool end_array() override { return close(); }

    bool key(string_t& name) override {
        if (open_.back()->contains(name)) fail("second member \"" + name + "\"");
        key_ = name;
        (*open_.back())[name] = nullptr;
        return true;
    }

    bool parse_error(std::size_t, const std::string&,
                     const nlohmann::detail::exception& error) override {
        // The number that the library gives to numbers outside of what it can hold.
        constexpr int kNumberOverflow = 406;
        fail(error.id == kNumberOverflow ? "the number is too large" : "not valid JSON");
    }

    json take() { return std::move(root_); }

protected:
    /// A value has begun.
    virtual void arrived() {}
    std::size_t line() const { return position_.line; }
    /// "controllers[0].drives[3]" of the value that has begun.
    std::string place() const {
        std::string text;
        for (const std::string& step : steps_) text += step;
        return text.starts_with('.') ? text.substr(1) : text;
    }

private:
    [[noreturn]] void fail(const std::string& what) const {
        throw ScenarioError(name_ + ": line " + std::to_string(position_.line) + ", column " +
                            std::to_string(std::max<std::size_t>(position_.column, 1)) + ": " +
                            what);
    }

    json& put(json value) {
        if (open_.empty()) return root_ = std::move(value);
        json& parent = *open_.back();
        if (parent.is_object()) {
            steps_.push_back("." + key_);
            return parent[key_] = std::move(value);
        }
        steps_.push_back("[" + std::to_string(parent.size()) + "]");
        parent.push_back(std::move(value));
        return parent.back();
    }

    bool add(json value) {
        put(std::move(value));
        arrived();
        return leave();
    }

    bool leave() {
        if (!steps_.empty()) steps_.pop_back();
        return true;
    }

    bool open(json value) {
        if (open_.size() == kDeepest) {
            fail("nested deeper than " + std::to_string(kDeepest) + " levels");
        }
        open_.push_back(&put(std::move(value)));
        arrived();
        return true;
    }

    bool close() {
        open_.pop_back();
        return leave();
    }

    const std::string& text_;
    std::string name_;
    Position position_;
    json root_;
    std::vector<json*> open_;         // lists and objects that have begun
    std::vector<std::string> steps_;  // the way to the innermost value, one step for each
    std::string key_;
};

/// Notes the line of the value that the place names, or that comes closest around it.
class LineFinder : public Reader {
public:
    LineFinder(const std::string& text, const std::string& wanted)
        : Reader(text, ""), wanted_(wanted) {}
    std::size_t found() const { return found_; }

protected:
    void arrived() override {
        const std::string here = place();
        if (!wanted_.starts_with(here)) return;
        const std::string rest = wanted_.substr(here.size());
        if (here.empty() || rest.empty() || rest[0] == '.' || rest[0] == '[') found_ = line();
    }

private:
    const std::string& wanted_;
    std::size_t found_ = 0;
};

}  // namespace

json parseJson(const std::string& text, const std::string& name) {
    if (text.empty()) throw ScenarioError(name + ": the file is empty");
    Reader reader(text, name);
    reader.read();
    return reader.take();
}

std::size_t lineOf(const std::string& text, const std::string& place) {
    LineFinder finder(text, place);
    try {
        finder.read();
    } catch (const ScenarioError&) {
        return 0;
    }
    return finder.found();
}

}  // namespace testbed
