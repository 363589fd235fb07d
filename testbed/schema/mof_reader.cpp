// Following the includes, within bounds of size, number and depth.
#include "mof_reader.h"

#include <algorithm>
#include <fstream>
#include <optional>
#include <sstream>

#include "mof_error.h"

namespace testbed {
namespace {

namespace fs = std::filesystem;

/// Bounds what a schema can cost; all of the published classes together are below it.
constexpr std::uintmax_t kLargestFile = 16 * 1024 * 1024;
constexpr std::size_t kMostFiles = 4096;
constexpr std::size_t kDeepestInclude = 32;

/// None for what is no readable file of bearable size.
std::optional<std::string> contentOf(const fs::path& file) {
    std::error_code error;
    if (!fs::is_regular_file(file, error) || fs::file_size(file, error) > kLargestFile) {
        return std::nullopt;
    }
    std::ifstream stream(file, std::ios::binary);
    std::stringstream text;
    text << stream.rdbuf();
    return stream ? std::optional(text.str()) : std::nullopt;
}

class Reader {
public:
    /// `file` was asked for at that line of `from`.
    void read(const fs::path& file, const std::string& from, int line) {
        if (std::find(open_.begin(), open_.end(), file) != open_.end()) {
            throw MofError(from, line, file.string() + " includes itself");
        }
        if (open_.size() >= kDeepestInclude || ++files_ > kMostFiles) {
            throw MofError(from, line, "too many included files");
        }
        const auto text = contentOf(file);
        if (!text) throw MofError(from, line, "cannot read " + file.string());
        open_.push_back(file);
        const std::string name = file.string();
        MofParser(*text, name, document, [&](const std::string& included, int where) {
            read((file.parent_path() / included).lexically_normal(), name, where);
        }).parse();
        open_.pop_back();
    }

    MofDocument document;

private:
    std::vector<fs::path> open_;
    std::size_t files_ = 0;
};

}  // namespace

MofDocument readMof(const fs::path& file) {
    Reader reader;
    const fs::path normal = file.lexically_normal();
    reader.read(normal, normal.string(), 1);
    return std::move(reader.document);
}

}  // namespace testbed
