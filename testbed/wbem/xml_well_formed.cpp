// A pass of the parser over the message, which refuses declared entities and other encodings.
#include "xml_well_formed.h"

#include <expat.h>

#include <memory>

#include "cim_object.h"
#include "cim_scalar.h"

namespace testbed {
namespace {

struct Refusal {
    XML_Parser parser = nullptr;
    const char* why = nullptr;

    void say(const char* what) {
        why = what;
        XML_StopParser(parser, XML_FALSE);
    }
};

void onDeclaration(void* user, const XML_Char*, const XML_Char* encoding, int) {
    if (encoding && !sameName(encoding, "utf-8")) {
        static_cast<Refusal*>(user)->say("an encoding other than UTF-8 is declared");
    }
}

void onEntity(void* user, const XML_Char*, int, const XML_Char*, int, const XML_Char*,
              const XML_Char*, const XML_Char*, const XML_Char*) {
    static_cast<Refusal*>(user)->say("an entity is declared");
}

struct Free {
    void operator()(XML_Parser parser) const { XML_ParserFree(parser); }
};

}  // namespace

void requireWellFormed(const std::string& text) {
    const std::unique_ptr<std::remove_pointer_t<XML_Parser>, Free> parser(
        XML_ParserCreate("UTF-8"));
    if (!parser) throw std::bad_alloc();
    Refusal refusal{parser.get(), nullptr};
    XML_SetUserData(parser.get(), &refusal);
    XML_SetXmlDeclHandler(parser.get(), onDeclaration);
    XML_SetEntityDeclHandler(parser.get(), onEntity);
    const auto status =
        XML_Parse(parser.get(), text.data(), static_cast<int>(text.size()), XML_TRUE);
    if (status == XML_STATUS_OK) return;
    const std::string why =
        refusal.why ? refusal.why : XML_ErrorString(XML_GetErrorCode(parser.get()));
    throw CimXmlError(why + " in line " + std::to_string(XML_GetCurrentLineNumber(parser.get())));
}

}  // namespace testbed
