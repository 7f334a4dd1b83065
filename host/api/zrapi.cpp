#include "zrapi.h"

#include "zrglob.h"

#include <new>
#include <string_view>

ZrDType ZrSpoke::MapDataType(const ZrDType& type) { return type; }

// ---------------------------------------------------------------------------
// Fields

ZrField::ZrField(const ZrDType& type) : type_(type) {}

ZrField::ZrField(const ZrField& other)
    : type_(other.type_), name_(other.name_), description_(other.description_),
      extras_(other.extras_ ? std::make_unique<Extras>(*other.extras_) : nullptr) {}

ZrField& ZrField::operator=(const ZrField& other) {
    if (this != &other) {
        type_ = other.type_;
        name_ = other.name_;
        description_ = other.description_;
        extras_ = other.extras_ ? std::make_unique<Extras>(*other.extras_) : nullptr;
    }
    return *this;
}

ZrField::~ZrField() = default;

ZrField::Extras& ZrField::extras() {
    if (!extras_)
        extras_ = std::make_unique<Extras>();
    return *extras_;
}

const ZrWString& ZrField::Alias() const {
    static const ZrWString none;
    return extras_ ? extras_->alias : none;
}

void ZrField::Description(const char* text) {
    if (text && *text)
        description_ = std::make_shared<const std::string>(text);
    else
        description_.reset();
}

void ZrField::Print(ZrWString& out) const {
    ZrWString usage;
    wsfmt(usage, u"(%d)", static_cast<int>(type_.Usage()));
    out = name_;
    out += u' ';
    out += zrUtf8ToUtf16(type_.Alias());
    out += usage;
}

void ZrField::Print(ZrString& out) const {
    ZrWString wide;
    Print(wide);
    out.Assign(wide.c_str(), ZR_CSET_DEFAULT, -1);
}

void ZrField::StripBlanks() {
    auto strip = [](ZrWString& s) {
        std::u16string_view v = s.view();
        while (!v.empty() && v.front() == u' ')
            v.remove_prefix(1);
        while (!v.empty() && v.back() == u' ')
            v.remove_suffix(1);
        s = ZrWString(v);
    };
    strip(name_);
    if (extras_)
        strip(extras_->alias);
}

const char* ZrField::EditPicture() const { return extras_ ? extras_->picture.c_str() : ""; }

void ZrField::EditPicture(const char* picture) { extras().picture = picture; }

void ZrField::Save(ZrWString& out) const {
    ZrString narrow;
    Save(narrow);
    out.Assign(narrow.c_str(), ZR_CSET_DEFAULT, -1);
}

void ZrField::Save(ZrString& out) const {
    ZrString name;
    name.Assign(name_.c_str(), ZR_CSET_DEFAULT, -1);
    out = name;
    out += "=";
    out += type_.DefinitionText();
}

long ZrField::Write(char* /*buffer*/, long /*size*/) const { return 0; }

long ZrField::Read(const char* /*buffer*/, long /*size*/) { return 0; }

bool ZrField::Validate(VALIDTYPE& result) const {
    result = ZR_VALID;
    return true;
}

ZrField* ZrField::Clone() const { return new ZrField(*this); }

// ---------------------------------------------------------------------------
// Records

ZrRecord::ZrRecord(const ZrRecord& other) : name(other.name), recordLength_(other.recordLength_) {
    fields_.reserve(other.fields_.size());
    for (const auto& field : other.fields_)
        fields_.emplace_back(field->Clone());
}

ZrRecord& ZrRecord::operator=(const ZrRecord& other) {
    if (this != &other) {
        ZrRecord copy(other);
        *this = std::move(copy);
    }
    return *this;
}

ZrRecord::~ZrRecord() = default;

ZrField* ZrRecord::NewField(const ZrDType& type, const ZrWString& fieldName) {
    auto field = std::make_unique<ZrField>(type);
    field->FieldName(fieldName);
    fields_.push_back(std::move(field));
    return fields_.back().get();
}

ZrField* ZrRecord::NewField(const ZrDType& type, ZrWString&& fieldName) {
    auto field = std::make_unique<ZrField>(type);
    field->FieldName(std::move(fieldName));
    fields_.push_back(std::move(field));
    return fields_.back().get();
}

ZrField* ZrRecord::GetFieldbyName(const ZrWString& fieldName) const {
    for (const auto& field : fields_)
        if (field->FieldName() == fieldName)
            return field.get();
    return nullptr;
}

ZrField* ZrRecord::GetFieldbyPos(int pos) const {
    if (pos < 0 || static_cast<size_t>(pos) >= fields_.size())
        return nullptr;
    return fields_[static_cast<size_t>(pos)].get();
}

bool ZrRecord::AppendField(ZrField* field) {
    if (!field)
        return false;
    // Room is made first, so that a failure leaves the field with the caller.
    try {
        fields_.reserve(fields_.size() + 1);
    } catch (const std::bad_alloc&) {
        return false;
    }
    fields_.emplace_back(field);
    return true;
}

ZrRecordList::ZrRecordList(const ZrRecordList& other) {
    records_.reserve(other.records_.size());
    for (const auto& record : other.records_)
        records_.push_back(std::make_unique<ZrRecord>(*record));
}

ZrRecordList& ZrRecordList::operator=(const ZrRecordList& other) {
    if (this != &other) {
        ZrRecordList copy(other);
        records_.swap(copy.records_);
    }
    return *this;
}

ZrRecordList::~ZrRecordList() = default;

ZrRecord* ZrRecordList::operator[](int pos) const {
    if (pos < 0 || static_cast<size_t>(pos) >= records_.size())
        return nullptr;
    return records_[static_cast<size_t>(pos)].get();
}

ZrRecord* ZrRecordList::operator[](const ZrWString& recordName) const {
    for (const auto& record : records_)
        if (record->name == recordName)
            return record.get();
    return nullptr;
}

ZrRecord* ZrRecordList::AddRecord(const ZrRecord* record, int position) {
    try {
        auto added = record ? std::make_unique<ZrRecord>(*record) : std::make_unique<ZrRecord>();
        ZrRecord* held = added.get();
        if (position < 0 || static_cast<size_t>(position) >= records_.size())
            records_.push_back(std::move(added));
        else
            records_.insert(records_.begin() + position, std::move(added));
        return held;
    } catch (const std::bad_alloc&) {
        return nullptr;
    }
}

void ZrRecordList::TakeAll(ZrRecordList& source) {
    if (&source == this)
        return;
    if (records_.empty()) {
        records_.swap(source.records_);
        return;
    }
    records_.reserve(records_.size() + source.records_.size());
    for (auto& record : source.records_)
        records_.push_back(std::move(record));
    source.records_.clear();
}

// ---------------------------------------------------------------------------
// Options

ZrOptionDef::ZrOptionDef(const ZrWChar* key, const ZrWChar* name, const ZrWChar* description,
                         int flags, const char* defaultValue, const ZrWChar* category,
                         ZrOptionGetter getter, ZrOptionSetter setter, ZrOptionWGetter wgetter,
                         ZrOptionWSetter wsetter, const OptionValueDef* values, int valueCount,
                         const char* helpFile, const char* helpTopic, int group, long helpId)
    : key_(key), name_(name), description_(description), defaultValue_(defaultValue),
      category_(category), helpFile_(helpFile), helpTopic_(helpTopic), values_(values),
      getter_(getter), setter_(setter), wgetter_(wgetter), wsetter_(wsetter), helpId_(helpId),
      flags_(flags), valueCount_(values ? valueCount : 0), group_(group) {}

ZrOptionDef::~ZrOptionDef() = default;

// ---------------------------------------------------------------------------
// Dictionary browser base

namespace {

std::u16string_view trimBlanks(std::u16string_view s) {
    auto blank = [](char16_t c) { return c == u' ' || c == u'\t' || c == u'\r'; };
    while (!s.empty() && blank(s.front()))
        s.remove_prefix(1);
    while (!s.empty() && blank(s.back()))
        s.remove_suffix(1);
    return s;
}

} // namespace

ZrDictBrowser::ZrDictBrowser(ZrSpoke* spoke, const char* const* typeDefinitions)
    : spoke_(spoke), typeDefinitions_(typeDefinitions) {}

ZrDictBrowser::ZrDictBrowser(const ZrDictBrowser& other) = default;

ZrDictBrowser& ZrDictBrowser::operator=(const ZrDictBrowser& other) = default;

ZrDictBrowser::~ZrDictBrowser() = default;

// Callbacks receive the browser as a `ZrDictBrowser*` turned into `void*`; they
// turn it back the same way before casting down to their own class.
BATCHERR ZrDictBrowser::GetOption(const ZrWChar* name, ZrWString& value) const {
    const ZrOptionDef* def = FindOptionDef(name);
    if (!def)
        return BE_UNKNOWN_OPTION;
    void* owner = const_cast<ZrDictBrowser*>(this);
    if (def->WGetter())
        return def->WGetter()(owner, value, def->Key().c_str());
    if (!def->Getter())
        return BE_INVALID_ARGUMENT;
    ZrString narrow;
    const BATCHERR result = def->Getter()(owner, narrow, def->Key().c_str());
    value.Assign(narrow.c_str(), ZR_CSET_DEFAULT, -1);
    return result;
}

BATCHERR ZrDictBrowser::SetOption(const ZrWChar* name, const ZrWChar* value) {
    const ZrOptionDef* def = FindOptionDef(name);
    if (!def)
        return BE_UNKNOWN_OPTION;
    void* owner = static_cast<ZrDictBrowser*>(this);
    bool changed = false;
    if (def->WSetter())
        return def->WSetter()(owner, value ? value : u"", changed, def->Key().c_str());
    if (!def->Setter())
        return BE_INVALID_ARGUMENT;
    ZrString narrow;
    narrow.Assign(value, ZR_CSET_DEFAULT, -1);
    return def->Setter()(owner, narrow.c_str(), changed, def->Key().c_str());
}

void ZrDictBrowser::LoadOptions(ZrString& text) {
    const std::u16string whole = zrUtf8ToUtf16(text.str());
    std::u16string_view rest(whole);
    while (!rest.empty()) {
        const size_t eol = rest.find(u'\n');
        const std::u16string_view line =
            trimBlanks(rest.substr(0, eol == std::u16string_view::npos ? rest.size() : eol));
        rest = eol == std::u16string_view::npos ? std::u16string_view() : rest.substr(eol + 1);
        if (line.empty() || line.front() == u'#' || line.front() == u';')
            continue;
        const size_t eq = line.find(u'=');
        if (eq == std::u16string_view::npos)
            continue;
        const std::u16string name(trimBlanks(line.substr(0, eq)));
        const std::u16string value(trimBlanks(line.substr(eq + 1)));
        SetOption(name.c_str(), value.c_str());
    }
}

const ZrOptionDef* ZrDictBrowser::FindOptionDef(const ZrWChar* name) const {
    if (!name)
        return nullptr;
    const ZrOptionDef** defs = GetOptionDefs();
    if (!defs)
        return nullptr;
    for (; *defs; ++defs) {
        const ZrOptionDef* def = *defs;
        if (ZrGlob::wcscmpi(name, def->Key().c_str()) == 0 ||
            ZrGlob::wcscmpi(name, def->Name().c_str()) == 0)
            return def;
    }
    return nullptr;
}

int ZrDictBrowser::OptionDefCount() const { return 0; }

const ZrOptionDef** ZrDictBrowser::GetOptionDefs() const { return nullptr; }

BATCHERR ZrDictBrowser::FlattenDictRecord(const ZrRecord* /*source*/, ZrRecord* /*target*/,
                                          ZrSpoke* /*spoke*/) {
    return BE_INVALID_ARGUMENT;
}

void ZrDictBrowser::InitOptions() {
    const ZrOptionDef** defs = GetOptionDefs();
    if (!defs)
        return;
    void* owner = static_cast<ZrDictBrowser*>(this);
    for (; *defs; ++defs) {
        const ZrOptionDef* def = *defs;
        bool changed = false;
        if (def->Setter()) {
            def->Setter()(owner, def->DefaultValue().c_str(), changed, def->Key().c_str());
        } else if (def->WSetter()) {
            ZrWString wide;
            wide.Assign(def->DefaultValue().c_str(), ZR_CSET_DEFAULT, -1);
            def->WSetter()(owner, wide.c_str(), changed, def->Key().c_str());
        }
    }
}
