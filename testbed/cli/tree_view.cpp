// Building the tree from controllers, devices and software, and printing it folded to the terminal.
#include "tree_view.h"

#include <algorithm>
#include <optional>

#include "cim_words.h"
#include "colour.h"
#include "printable.h"
#include "terminal.h"

namespace testbed {
namespace {

/// However narrow the terminal is, texts get that many columns.
constexpr std::size_t kFewestColumns = 20;

/// An element's text and its colour.
struct Line {
    std::string text;
    std::optional<CheckLevel> level = std::nullopt;
    std::size_t paintedFrom = 0;
};

/// A line of the tree with the lines beneath it.
struct Branch {
    Line line;
    std::vector<Branch> children;
};

/// Controllers, and their ids.
struct Roots {
    std::vector<std::string> ids;
    std::vector<Branch> branches;
};

/// What the lines of a tree hang on.
struct Twigs {
    const char* inner;
    const char* last;
    const char* passing;
};

constexpr Twigs kLines = {"├─ ", "└─ ", "│  "};
constexpr Twigs kAsciiLines = {"|- ", "`- ", "|  "};
constexpr const char* kBlank = "   ";
constexpr std::size_t kTwigColumns = 3;

std::string textOf(const Instance& instance, const char* property) {
    const CimValue* value = instance.find(property);
    return value ? value->asString() : "";
}

void appendState(std::string& text, const Instance& instance, const char* property,
                 const char* label, CodeWords words) {
    const CimValue* value = instance.find(property);
    if (!value || value->isNull) return;
    const std::uint64_t code = value->asUnsigned();
    const std::string_view word = wordOf(words, code);
    text += text.empty() ? "" : ", ";
    text += std::string(label) + " " + (word.empty() ? std::to_string(code) : std::string(word));
}

std::string statesOf(const Instance& instance) {
    std::string text;
    appendState(text, instance, "HealthState", "health", healthStateWords());
    appendState(text, instance, "OperationalStatus", "status", operationalStatusWords());
    appendState(text, instance, "BatteryStatus", "battery", batteryStatusWords());
    return text.empty() ? "" : "  [" + text + "]";
}

std::string shown(const std::string& text, const TreeStyle& style) {
    return style.ascii ? printableAscii(text) : printable(text);
}

Line lineOf(const Instance& instance, const ServedClass& served, const TreeStyle& style) {
    std::string name = textOf(instance, "VersionString");
    if (name.empty()) name = nameOf(instance);
    name = shown(name, style);
    const std::string text = name + statesOf(instance);
    const auto verdict = style.colours ? style.policy.judge(served.name, instance) : std::nullopt;
    if (!verdict) return {text};
    // What is well is not to be louder than what is not.
    return {text, verdict->level, verdict->level == CheckLevel::Ok ? name.size() : 0};
}

/// False for what the style leaves out.
bool isShown(const Instance& instance, const ServedClass& served, const TreeStyle& style) {
    if (!style.problemsOnly) return true;
    const auto verdict = style.policy.judge(served.name, instance);
    return verdict && verdict->level != CheckLevel::Ok && !verdict->ignored;
}

/// The branch of a class beneath a root's, made when it is first needed.
Branch& section(std::vector<Branch>& children, const std::string& heading) {
    const auto found = std::find_if(children.begin(), children.end(), [&](const Branch& child) {
        return child.line.text == heading;
    });
    if (found != children.end()) return *found;
    return children.emplace_back(Branch{{heading}, {}});
}

std::string paintedPart(const Line& line, const TextPart& part) {
    const std::string text = line.text.substr(part.begin, part.end - part.begin);
    if (!line.level || line.paintedFrom >= part.end) return text;
    const std::size_t plain = line.paintedFrom > part.begin ? line.paintedFrom - part.begin : 0;
    return text.substr(0, plain) + painted(text.substr(plain), *line.level);
}

class Printer {
public:
    explicit Printer(const TreeStyle& style)
        : style_(style), twigs_(style.ascii ? kAsciiLines : kLines) {}

    void printRoot(const Branch& root) {
        print(root.line, "", root.children.empty() ? "" : twigs_.passing, 0);
        printChildren(root.children, "", 1);
    }
    std::string take() { return std::move(out_); }

private:
    void printChildren(const std::vector<Branch>& branches, const std::string& indent,
                       std::size_t depth) {
        for (const Branch& branch : branches) {
            const bool last = &branch == &branches.back();
            const std::string below = indent + (last ? kBlank : twigs_.passing);
            const bool leaf = branch.children.empty();
            print(branch.line, indent + (last ? twigs_.last : twigs_.inner),
                  below + (leaf ? "" : twigs_.passing), depth);
            printChildren(branch.children, below, depth + 1);
        }
    }

    /// A line with what stands before it, and before what is folded of it.
    void print(const Line& line, const std::string& first, const std::string& rest,
               std::size_t depth) {
        const std::string continued = rest + "  ";
        const std::size_t before = depth * kTwigColumns;
        const auto room = [&](std::size_t used) {
            if (style_.columns == 0) return line.text.size() + 1;
            return std::max(style_.columns, used + kFewestColumns) - used;
        };
        const auto parts =
            foldedLines(line.text, room(before), room(std::max(before, kTwigColumns) + 2));
        for (const TextPart& part : parts) {
            out_ += (&part == &parts.front() ? first : continued) + paintedPart(line, part) + "\n";
        }
    }

    const TreeStyle& style_;
    const Twigs& twigs_;
    std::string out_;
};

/// Headings get the number of what is beneath them.
void countChildren(std::vector<Branch>& sections) {
    for (Branch& branch : sections) {
        branch.line.text += " (" + std::to_string(branch.children.size()) + ")";
    }
}

Roots controllersOf(const Inventory& inventory, const TreeStyle& style) {
    Roots roots;
    const ServedClass& controllers = servedClasses().front();
    for (const ClassAnswer& answer : inventory) {
        if (!sameName(answer.className, controllers.name)) continue;
        for (const Instance& instance : answer.response.instances) {
            roots.ids.push_back(identityOf(controllers, instance).value_or(""));
            roots.branches.push_back({lineOf(instance, controllers, style), {}});
        }
    }
    return roots;
}

std::string nothingText(const Inventory& inventory, const TreeStyle& style) {
    std::size_t count = 0;
    for (const ClassAnswer& answer : inventory) count += answer.response.instances.size();
    if (!style.problemsOnly || count == 0) return "nothing\n";
    return "no problems among " + std::to_string(count) + " elements\n";
}

}  // namespace

TreeStyle TreeStyle::ofOutput(bool colours) {
    return {.colours = colours, .ascii = !localeIsUtf8(), .columns = outputColumns()};
}

std::string treeView(const Inventory& inventory, const TreeStyle& style) {
    Roots roots = controllersOf(inventory, style);
    std::vector<Branch> strays;
    for (const ClassAnswer& answer : inventory) {
        const ServedClass* served = findServedClass(answer.className);
        if (!served || served == &servedClasses().front()) continue;
        for (const Instance& instance : answer.response.instances) {
            if (!isShown(instance, *served, style)) continue;
            const auto owner = ownerAmong(roots.ids, *served, instance);
            std::vector<Branch>& parent = owner ? roots.branches[*owner].children : strays;
            section(parent, served->heading)
                .children.push_back({lineOf(instance, *served, style), {}});
        }
    }
    Printer printer(style);
    for (Branch& branch : roots.branches) {
        if (style.problemsOnly && branch.children.empty()) continue;
        countChildren(branch.children);
        printer.printRoot(branch);
    }
    countChildren(strays);
    for (const Branch& branch : strays) printer.printRoot(branch);
    std::string out = printer.take();
    return out.empty() ? nothingText(inventory, style) : out;
}

}  // namespace testbed
