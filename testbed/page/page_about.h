// What a page is told once: where the answers come from, and the tool's words and commands.
#pragma once

#include <nlohmann/json_fwd.hpp>
#include <string>

namespace testbed {

/// `source` is for people: "array.example.com:5988". With `steers` there are the live commands.
nlohmann::ordered_json pageAbout(const std::string& source, bool steers);

}  // namespace testbed
