// Parses a text as a file of its own.
#pragma once

#include <gtest/gtest.h>

#include <string>

#include "mof_error.h"
#include "mof_parser.h"

namespace testbed {

/// The document of a text that includes nothing. Throws MofError.
inline MofDocument parseText(const std::string& text) {
    MofDocument document;
    MofParser(text, "text.mof", document, [](const std::string& name, int line) {
        throw MofError("text.mof", line, "includes " + name);
    }).parse();
    return document;
}

/// What the parser says about a text; "" when it says nothing.
inline std::string complaintAbout(const std::string& text) {
    try {
        parseText(text);
    } catch (const MofError& error) {
        return error.what();
    }
    return "";
}

}  // namespace testbed
