// What XML itself demands of a message.
#pragma once

#include <string>

namespace testbed {

/// Throws CimXmlError for a text that is no well-formed XML 1.0 in UTF-8, or declares another
/// encoding, or any entity. The reader of messages takes such texts for something; clients that
/// send them are told so instead.
void requireWellFormed(const std::string& text);

}  // namespace testbed
