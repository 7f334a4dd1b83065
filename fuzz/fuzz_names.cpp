// Fuzz target: namespaces and qualified names (FirstElementAttrs, parseName,
// the prefix writer).
//
// The input is UTF-8 text in lines: the first is the tag name of a document's first
// element, the next ones up to an empty line are its attributes ("name=value"), and
// the rest are names to resolve. The element goes through the browser's startElement
// and endElement, as the parser would deliver it; then every name is resolved. The
// results are compared with a plain model of the namespace rules written here, and
// the model is what the browser must agree with.
#include "FuzzSupport.h"
#include "SchemaReader.h"
#include "TestSupport.h"

#include <cstddef>
#include <cstdint>
#include <map>
#include <string>
#include <string_view>
#include <vector>
#include <xercesc/sax/AttributeList.hpp>

namespace {

constexpr std::u16string_view kTargetPrefix = u"zrxxxtrg";

// An attribute list as the parser hands one to startElement.
class Attributes : public xercesc::AttributeList {
  public:
    void add(std::u16string name, std::u16string value) {
        names_.push_back(std::move(name));
        values_.push_back(std::move(value));
    }

    XMLSize_t getLength() const override { return names_.size(); }

    const XMLCh* getName(const XMLSize_t index) const override {
        return index < names_.size() ? names_[index].c_str() : nullptr;
    }

    const XMLCh* getType(const XMLSize_t index) const override {
        return index < names_.size() ? u"CDATA" : nullptr;
    }

    const XMLCh* getValue(const XMLSize_t index) const override {
        return index < values_.size() ? values_[index].c_str() : nullptr;
    }

    const XMLCh* getType(const XMLCh* const name) const override {
        return find(name) < names_.size() ? u"CDATA" : nullptr;
    }

    const XMLCh* getValue(const XMLCh* const name) const override {
        const size_t i = find(name);
        return i < names_.size() ? values_[i].c_str() : nullptr;
    }

    const XMLCh* getValue(const char* const name) const override {
        const std::u16string wideName = zrUtf8ToUtf16(name ? name : "");
        return getValue(wideName.c_str());
    }

  private:
    size_t find(const XMLCh* name) const {
        const std::u16string_view sought(name ? name : u"");
        for (size_t i = 0; i < names_.size(); ++i)
            if (names_[i] == sought)
                return i;
        return names_.size();
    }

    std::vector<std::u16string> names_;
    std::vector<std::u16string> values_;
};

// The namespace state a first element's attributes give, by the rules of the reader.
struct NamespaceModel {
    std::u16string defaultNs;
    std::u16string targetNs;
    std::map<std::u16string, std::u16string> prefixes;
    std::vector<std::u16string> unknownAttributes;

    void read(std::u16string_view name, std::u16string_view value) {
        if (name.substr(0, 5) == u"xmlns") {
            if (name.size() > 5 && name[5] == u':')
                prefixes[std::u16string(name.substr(6))] = value;
            else
                defaultNs = value;
        } else if (name == u"targetNamespace") {
            targetNs = value;
        } else if (name != u"elementFormDefault" && name != u"attributeFormDefault" &&
                   name != u"version") {
            unknownAttributes.emplace_back(name);
        }
    }

    // Null when the prefix is unknown.
    const std::u16string* lookup(std::u16string_view prefix) const {
        if (prefix == kTargetPrefix)
            return &targetNs;
        auto it = prefixes.find(std::u16string(prefix));
        return it == prefixes.end() ? nullptr : &it->second;
    }

    std::u16string reverse(std::u16string_view uri, bool useTargetPrefix) const {
        if (useTargetPrefix && uri == targetNs)
            return std::u16string(kTargetPrefix);
        if (uri == defaultNs || uri == targetNs)
            return u"";
        for (const auto& [prefix, bound] : prefixes)
            if (bound == uri)
                return prefix;
        return u"";
    }
};

std::vector<std::u16string> splitLines(std::u16string_view text) {
    std::vector<std::u16string> lines;
    size_t start = 0;
    for (size_t i = 0; i <= text.size(); ++i) {
        if (i == text.size() || text[i] == u'\n') {
            lines.emplace_back(text.substr(start, i - start));
            start = i + 1;
        }
    }
    return lines;
}

void checkName(SchemaReader& reader, const SchemaModel& schema, const NamespaceModel& model,
               const std::u16string& name) {
    const PrefixWriter writer(schema.namespaces);
    for (const bool useDefault : {true, false}) {
        ZrName local;
        ZrName ns;
        reader.parseName(name.c_str(), useDefault, local, ns);

        const size_t colon = name.find(u':');
        if (colon == std::u16string::npos) {
            ZRFUZZ_CHECK(local == name);
            ZRFUZZ_CHECK(ns == (useDefault ? model.defaultNs : model.targetNs));
        } else {
            const std::u16string prefix = name.substr(0, colon);
            const std::u16string* bound = model.lookup(prefix);
            ZRFUZZ_CHECK(local == std::u16string_view(name).substr(colon + 1));
            ZRFUZZ_CHECK(ns == (bound ? std::u16string_view(*bound) : std::u16string_view()));
        }

        for (const bool useTargetPrefix : {true, false}) {
            for (const ZrName* uri : {&ns, &local})
                ZRFUZZ_CHECK(writer.prefixOf(uri->view(), useTargetPrefix) ==
                             model.reverse(uri->view(), useTargetPrefix));
        }
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    std::u16string text =
        zrUtf8ToUtf16(std::string_view(reinterpret_cast<const char*>(data), size));
    // Parser text never holds a null character; it would only cut names short here.
    for (auto& c : text)
        if (c == 0)
            c = u' ';
    const std::vector<std::u16string> lines = splitLines(text);

    Attributes attrs;
    NamespaceModel model;
    size_t line = 1;
    for (; line < lines.size() && !lines[line].empty(); ++line) {
        const size_t eq = lines[line].find(u'=');
        std::u16string name = lines[line].substr(0, eq);
        std::u16string value = eq == std::u16string::npos ? u"" : lines[line].substr(eq + 1);
        model.read(name, value);
        attrs.add(std::move(name), std::move(value));
    }

    zrfuzz::LogKeeper log;
    SchemaModel schema;
    SchemaReader reader(schema);
    const std::u16string tag = lines[0];
    reader.startElement(tag.c_str(), attrs);
    reader.endElement(tag.c_str());

    const NamespaceBindings& bindings = schema.namespaces;
    ZRFUZZ_CHECK(bindings.defaultNamespace == model.defaultNs);
    ZRFUZZ_CHECK(bindings.targetNamespace == model.targetNs);
    ZRFUZZ_CHECK(bindings.prefixes.size() == model.prefixes.size());
    for (const auto& [prefix, uri] : bindings.prefixes) {
        auto it = model.prefixes.find(prefix);
        ZRFUZZ_CHECK(it != model.prefixes.end() && uri == it->second);
    }

    std::vector<std::u16string> unknown;
    constexpr std::u16string_view kUnknown = u"Unknown first element attribute '";
    for (const auto& m : log.messages)
        if (m.text.compare(0, kUnknown.size(), kUnknown) == 0)
            unknown.push_back(m.text);
    ZRFUZZ_CHECK(unknown.size() == model.unknownAttributes.size());
    for (size_t i = 0; i < unknown.size(); ++i)
        ZRFUZZ_CHECK(unknown[i] == std::u16string(kUnknown) + model.unknownAttributes[i] + u"'");

    checkName(reader, schema, model, tag);
    for (++line; line < lines.size(); ++line)
        checkName(reader, schema, model, lines[line]);
    return 0;
}
