// Host dictionary interface: records, fields, connectors, options and the
// dictionary-browser base class that plug-ins derive from.
#pragma once

#include "zrdtype.h"
#include "zrstring.h"
#include "zrtypes.h"

#include <memory>
#include <string>
#include <utility>
#include <vector>

// A connector. Plug-ins only ask it to translate data types.
class ZRHOST_API ZrSpoke {
  public:
    virtual ~ZrSpoke() = default;
    // The connector's own type for `type`; this base returns a copy.
    virtual ZrDType MapDataType(const ZrDType& type);
};

enum VALIDTYPE : int { ZR_VALID = 0, ZR_INVALID = 1 };

class ZRHOST_API ZrField {
  public:
    explicit ZrField(const ZrDType& type);
    ZrField(const ZrField& other);
    ZrField& operator=(const ZrField& other);
    virtual ~ZrField();

    ZrDType& DataType() { return type_; }

    const ZrDType& DataType() const { return type_; }

    void FieldName(const ZrWString& name) { name_ = name; }

    void FieldName(ZrWString&& name) { name_ = std::move(name); }

    const ZrWString& FieldName() const { return name_; }

    void Alias(const ZrWString& alias) { extras().alias = alias; }

    const ZrWString& Alias() const;

    // A null description sets the empty text.
    void Description(const char* text);

    // One text often describes many fields (a type's documentation), and records are
    // copied whole: a shared text is held once, however many fields and copies use it.
    void Description(std::shared_ptr<const std::string> text) { description_ = std::move(text); }

    const char* Description() const { return description_ ? description_->c_str() : ""; }

    // One line "name alias(usage)" describing the field.
    virtual void Print(ZrWString& out) const;
    virtual void Print(ZrString& out) const;
    virtual void StripBlanks();
    virtual const char* EditPicture() const;
    virtual void EditPicture(const char* picture);
    virtual void Save(ZrWString& out) const;
    virtual void Save(ZrString& out) const;
    // Field data is not held by dictionary fields: both move nothing and return 0.
    virtual long Write(char* buffer, long size) const;
    virtual long Read(const char* buffer, long size);
    virtual bool Validate(VALIDTYPE& result) const;

    // A copy of the same dynamic type; used when records are copied.
    virtual ZrField* Clone() const;

  private:
    // What few fields have: a dictionary of many thousands of fields holds one
    // pointer each for them.
    struct Extras {
        ZrWString alias;
        ZrString picture;
    };

    Extras& extras();

    ZrDType type_;
    ZrWString name_;
    std::shared_ptr<const std::string> description_;
    std::unique_ptr<Extras> extras_;
};

class ZRHOST_API ZrRecord {
  public:
    // The record's name; assigned and read directly.
    ZrWString name;

    ZrRecord() = default;
    ZrRecord(const ZrRecord& other);
    ZrRecord(ZrRecord&&) noexcept = default;
    ZrRecord& operator=(const ZrRecord& other);
    ZrRecord& operator=(ZrRecord&&) noexcept = default;
    virtual ~ZrRecord();

    int FieldCount() const { return static_cast<int>(fields_.size()); }

    long RecordLength() const { return recordLength_; }

    void RecordLength(long length) { recordLength_ = length; }

    // Appends a field holding copies of `type` and `name`; returns it.
    ZrField* NewField(const ZrDType& type, const ZrWString& name);
    // The same, taking over `name`'s text.
    ZrField* NewField(const ZrDType& type, ZrWString&& name);
    // First field of that name, or null.
    ZrField* GetFieldbyName(const ZrWString& name) const;
    // Null when `pos` is out of range.
    ZrField* GetFieldbyPos(int pos) const;
    // Appends a field made by the caller and owns it from then on. A null field is
    // refused (false); so is any field when memory runs out, which the caller then
    // still owns.
    bool AppendField(ZrField* field);

  private:
    std::vector<std::unique_ptr<ZrField>> fields_;
    long recordLength_ = 0;
};

class ZRHOST_API ZrRecordList {
  public:
    ZrRecordList() = default;
    ZrRecordList(const ZrRecordList& other);
    ZrRecordList& operator=(const ZrRecordList& other);
    virtual ~ZrRecordList();

    void Clear() { records_.clear(); }

    int Count() const { return static_cast<int>(records_.size()); }

    // Null when out of range.
    ZrRecord* operator[](int pos) const;
    // First record of exactly that name, or null.
    ZrRecord* operator[](const ZrWString& name) const;
    // A null `record` adds a new empty record; otherwise a copy of it is added.
    // `position` -1 (or past the end) appends. Returns the record held by the list,
    // or null when memory runs out.
    ZrRecord* AddRecord(const ZrRecord* record, int position);
    // Moves every record of `source`, in order, to the end of this list and leaves
    // `source` empty; the records themselves stay where they are. Throws bad_alloc,
    // both lists unchanged, when memory runs out.
    void TakeAll(ZrRecordList& source);

  private:
    std::vector<std::unique_ptr<ZrRecord>> records_;
};

struct OptionValueDef {
    const ZrWChar* value;
    const ZrWChar* description;
};

// Option callbacks get the browser as `owner`: a `ZrDictBrowser*` converted to
// `void*`, and `name` the option's key.
using ZrOptionGetter = BATCHERR (*)(void* owner, ZrString& value, const ZrWChar* name);
using ZrOptionSetter = BATCHERR (*)(void* owner, const char* value, bool& changed,
                                    const ZrWChar* name);
using ZrOptionWGetter = BATCHERR (*)(void* owner, ZrWString& value, const ZrWChar* name);
using ZrOptionWSetter = BATCHERR (*)(void* owner, const ZrWChar* value, bool& changed,
                                     const ZrWChar* name);

class ZRHOST_API ZrOptionDef {
  public:
    ZrOptionDef(const ZrWChar* key, const ZrWChar* name, const ZrWChar* description, int flags,
                const char* defaultValue, const ZrWChar* category, ZrOptionGetter getter,
                ZrOptionSetter setter, ZrOptionWGetter wgetter, ZrOptionWSetter wsetter,
                const OptionValueDef* values, int valueCount, const char* helpFile,
                const char* helpTopic, int group, long helpId);
    ZrOptionDef(const ZrOptionDef&) = delete;
    ZrOptionDef& operator=(const ZrOptionDef&) = delete;
    virtual ~ZrOptionDef();

    const ZrWString& Key() const { return key_; }

    const ZrWString& Name() const { return name_; }

    const ZrWString& Description() const { return description_; }

    const ZrString& DefaultValue() const { return defaultValue_; }

    int Flags() const { return flags_; }

    const OptionValueDef* Values() const { return values_; }

    int ValueCount() const { return valueCount_; }

    ZrOptionGetter Getter() const { return getter_; }

    ZrOptionSetter Setter() const { return setter_; }

    ZrOptionWGetter WGetter() const { return wgetter_; }

    ZrOptionWSetter WSetter() const { return wsetter_; }

    int Group() const { return group_; }

    long HelpId() const { return helpId_; }

  private:
    ZrWString key_;
    ZrWString name_;
    ZrWString description_;
    ZrString defaultValue_;
    ZrWString category_;
    ZrString helpFile_;
    ZrString helpTopic_;
    const OptionValueDef* values_;
    ZrOptionGetter getter_;
    ZrOptionSetter setter_;
    ZrOptionWGetter wgetter_;
    ZrOptionWSetter wsetter_;
    long helpId_;
    int flags_;
    int valueCount_;
    int group_;
};

// Base of every dictionary browser. Holds the record list that the host reads after
// a successful ReadDictionary, and the option machinery.
class ZRHOST_API ZrDictBrowser {
  public:
    // `typeDefinitions`: the plug-in's null-terminated array of type-definition
    // strings, kept by pointer (static storage).
    ZrDictBrowser(ZrSpoke* spoke, const char* const* typeDefinitions);
    ZrDictBrowser(const ZrDictBrowser& other);
    ZrDictBrowser& operator=(const ZrDictBrowser& other);
    virtual ~ZrDictBrowser();

    virtual BATCHERR ReadDictionary(const char* path) = 0;
    // Looks the option up (FindOptionDef) and asks its getter. BE_UNKNOWN_OPTION
    // for an unknown name.
    virtual BATCHERR GetOption(const ZrWChar* name, ZrWString& value) const;
    // Looks the option up and hands the value to its setter (the wide one when
    // given, else the narrow one with the value as UTF-8). BE_UNKNOWN_OPTION for an
    // unknown name.
    virtual BATCHERR SetOption(const ZrWChar* name, const ZrWChar* value);
    // Applies "Name=Value" lines (blank lines and lines starting with '#' or ';'
    // are skipped; unknown names are skipped).
    virtual void LoadOptions(ZrString& text);
    // The definition whose key or name equals `name`, case-blind; null when none.
    virtual const ZrOptionDef* FindOptionDef(const ZrWChar* name) const;
    virtual int OptionDefCount() const;
    // Null-terminated; this base has none and returns null.
    virtual const ZrOptionDef** GetOptionDefs() const;
    virtual BATCHERR FlattenDictRecord(const ZrRecord* source, ZrRecord* target, ZrSpoke* spoke);

    // Applies every definition's default through its setter. Called once, last in
    // the plug-in's constructor.
    void InitOptions();

    ZrRecordList& RecordList() { return records_; }

    const ZrRecordList& RecordList() const { return records_; }

    const char* const* TypeDefinitions() const { return typeDefinitions_; }

    ZrSpoke* Spoke() const { return spoke_; }

  private:
    ZrRecordList records_;
    ZrSpoke* spoke_;
    const char* const* typeDefinitions_;
};

// The plug-in's exported factory functions, as a host resolves them by name.
extern "C" {
typedef ZrDictBrowser* (*ZrNewBrowserFn)(ZrSpoke* spoke);
typedef void (*ZrDeleteBrowserFn)(ZrDictBrowser* browser);
}
