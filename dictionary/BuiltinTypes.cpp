#include "BuiltinTypes.h"

#include "zrstring.h"

// The order matters: both lookups answer the first match. Element types first, then
// their attribute variants (usage + 256). Entries 55 and 56 pair usage 277 with the
// alias 'duration attribute' and 278 with 'dateTime attribute', each with the picture
// of the element type 256 below it; entry 43 carries length=10 where its attribute
// variant has precision=10. Hosts know these strings as they stand, so they stay so.
const char* const kBuiltinTypeDefinitions[kBuiltinTypeCount + 1] = {
    "Text;alias=Character;padchar_invalid;usage=0",
    "Text;alias=Attribute;padchar_invalid;usage=256",
    "Structure;alias=Record;usage=2",
    "Text;alias=Unquoted;padchar_invalid;usage=3",
    "Text;alias='Unquoted attribute';padchar_invalid;usage=259",
    "Text;alias=string;padchar_invalid;usage=16",
    "Boolean;alias=boolean;picture='true.false.1.0';usage=17",
    "Number;alias=float;display;maxlength=32;precision=16;decimal=2;scale_invalid;usage=18",
    "Number;alias=double;display;maxlength=32;precision=16;decimal=2;scale_invalid;usage=19",
    "Decimal;alias=decimal;display;precision=16;decimal=2;scale_invalid;usage=20",
    "DateTime;alias=dateTime;picture='yyyy-mm-ddTH24:MM:SS';length_invalid;precision_invalid;"
    "usage=21",
    "DateTime;alias=duration;picture='yyyy-mm-ddTH24:MM';length_invalid;precision_invalid;"
    "usage=22",
    "DateTime;alias=gYearMonth;picture='yyyy-mm';length_invalid;precision_invalid;usage=23",
    "DateTime;alias=gYear;picture='yyyy';length_invalid;precision_invalid;usage=24",
    "DateTime;alias=gMonthDay;picture='mm-dd';length_invalid;precision_invalid;usage=59",
    "DateTime;alias=gMonth;picture='mm';length_invalid;precision_invalid;usage=60",
    "DateTime;alias=gDay;picture='dd';length_invalid;precision_invalid;usage=61",
    "Text;alias=binary;padchar_invalid;usage=30",
    "Text;alias=anyURI;padchar_invalid;usage=31",
    "Text;alias=ID;padchar_invalid;usage=32",
    "Text;alias=IDREF;padchar_invalid;usage=33",
    "Text;alias=ENTITY;padchar_invalid;usage=34",
    "Text;alias=NOTATION;padchar_invalid;usage=35",
    "Text;alias=language;padchar_invalid;usage=36",
    "Text;alias=IDREFS;padchar_invalid;usage=37",
    "Text;alias=ENTITIES;padchar_invalid;usage=38",
    "Text;alias=NMTOKEN;padchar_invalid;usage=39",
    "Text;alias=NMTOKENS;padchar_invalid;usage=40",
    "Text;alias=Name;padchar_invalid;usage=41",
    "Text;alias=QName;padchar_invalid;usage=42",
    "Text;alias=NCName;padchar_invalid;usage=43",
    "Number;alias=integer;signed_invalid;display;maxlength=32;precision=10;scale_invalid;usage=44",
    "Number;alias=nonPositiveInteger;signed=true;display;precision=10;maxlength=32;scale_invalid;"
    "signed_invalid;usage=45",
    "Number;alias=negativeInteger;signed=true;signed_invalid;display;maxlength=32;precision=10;"
    "scale_invalid;usage=46",
    "Number;alias=long;signed_invalid;display;maxlength=32;precision=10;scale_invalid;usage=47",
    "Number;alias=int;signed_invalid;display;maxlength=32;precision=10;scale_invalid;usage=48",
    "Number;alias=short;signed_invalid;display;maxlength=32;precision=5;scale_invalid;usage=49",
    "Number;alias=byte;signed_invalid;display;maxlength=32;precision=3;scale_invalid;usage=50",
    "Number;alias=nonNegativeInteger;signed_invalid;display;precision=10;maxlength=32;"
    "scale_invalid;usage=51",
    "Number;alias=unsignedLong;signed=false;signed_invalid;display;maxlength=32;precision=10;"
    "scale_invalid;usage=52",
    "Number;alias=unsignedInt;signed=false;signed_invalid;display;maxlength=32;precision=10;"
    "scale_invalid;usage=53",
    "Number;alias=unsignedShort;signed=false;signed_invalid;display;maxlength=32;precision=5;"
    "scale_invalid;usage=54",
    "Number;alias=unsignedByte;signed=false;signed_invalid;display;maxlength=32;precision=3;"
    "scale_invalid;usage=55",
    "Number;alias=positiveInteger;signed=false;signed_invalid;display;maxlength=32;length=10;"
    "scale_invalid;usage=56",
    "Date;alias=date;picture='yyyy-mm-dd';picture_settable=false;length_invalid;"
    "precision_invalid;usage=57",
    "Time;alias=time;picture='HH:MM:SS.TTT';picture_settable=false;length_invalid;"
    "precision_invalid;usage=58",
    "Text;alias=normalizedString;padchar_invalid;usage=62",
    "Text;alias=token;padchar_invalid;usage=63",
    "Text;alias=hexBinary;padchar_invalid;usage=64",
    "Text;alias=base64Binary;padchar_invalid;usage=65",
    "Text;alias='string attribute';padchar_invalid;usage=272",
    "Boolean;alias='boolean attribute';picture='true.false.1.0';usage=273",
    "Number;alias='float attribute';display;maxlength=32;precision=16;decimal=2;scale_invalid;"
    "usage=274",
    "Number;alias='double attribute';display;maxlength=32;precision=16;decimal=2;scale_invalid;"
    "usage=275",
    "Decimal;alias='decimal attribute';display;precision=16;decimal=2;scale_invalid;usage=276",
    "DateTime;alias='duration attribute';length_invalid;precision_invalid;"
    "picture='yyyy-mm-ddTH24:MM:SS';usage=277",
    "DateTime;alias='dateTime attribute';picture='yyyy-mm-ddTH24:MM';length_invalid;"
    "precision_invalid;usage=278",
    "DateTime;alias='gYearMonth attribute';picture='yyyy-mm';length_invalid;precision_invalid;"
    "usage=279",
    "DateTime;alias='gYear attribute';picture='yyyy';length_invalid;precision_invalid;usage=280",
    "Text;alias='binary attribute';padchar_invalid;usage=286",
    "Text;alias='anyURI attribute';padchar_invalid;usage=287",
    "Text;alias='ID attribute';padchar_invalid;usage=288",
    "Text;alias='IDREF attribute';padchar_invalid;usage=289",
    "Text;alias='ENTITY attribute';padchar_invalid;usage=290",
    "Text;alias='NOTATION attribute';padchar_invalid;usage=291",
    "Text;alias='language attribute';padchar_invalid;usage=292",
    "Text;alias='IDREFS attribute';padchar_invalid;usage=293",
    "Text;alias='ENTITIES attribute';padchar_invalid;usage=294",
    "Text;alias='NMTOKEN attribute';padchar_invalid;usage=295",
    "Text;alias='NMTOKENS attribute';padchar_invalid;usage=296",
    "Text;alias='Name attribute';padchar_invalid;usage=297",
    "Text;alias='QName attribute';padchar_invalid;usage=298",
    "Text;alias='NCName attribute';padchar_invalid;usage=299",
    "Number;alias='integer attribute';signed_invalid;display;maxlength=32;precision=10;"
    "scale_invalid;usage=300",
    "Number;alias='nonPositiveInteger attribute';signed=true;maxlength=32;signed_invalid;display;"
    "precision=10;scale_invalid;usage=301",
    "Number;alias='negativeInteger attribute';signed=true;maxlength=32;signed_invalid;display;"
    "precision=10;scale_invalid;usage=302",
    "Number;alias='long attribute';signed_invalid;display;precision=10;maxlength=32;"
    "scale_invalid;usage=303",
    "Number;alias='int attribute';signed_invalid;display;precision=10;maxlength=32;"
    "scale_invalid;usage=304",
    "Number;alias='short attribute';signed_invalid;display;precision=5;maxlength=32;"
    "scale_invalid;usage=305",
    "Number;alias='byte attribute';signed_invalid;display;precision=3;maxlength=32;"
    "scale_invalid;usage=306",
    "Number;alias='nonNegativeInteger attribute';signed_invalid;display;maxlength=32;"
    "precision=10;scale_invalid;usage=307",
    "Number;alias='unsignedLong attribute';signed=false;scale_invalid;maxlength=32;"
    "signed_invalid;display;precision=10;usage=308",
    "Number;alias='unsignedInt attribute';signed=false;scale_invalid;maxlength=32;"
    "signed_invalid;display;precision=10;usage=309",
    "Number;alias='unsignedShort attribute';signed=false;scale_invalid;maxlength=32;"
    "signed_invalid;display;precision=5;usage=310",
    "Number;alias='unsignedByte attribute';signed=false;scale_invalid;maxlength=32;"
    "signed_invalid;display;precision=3;usage=311",
    "Number;alias='positiveInteger attribute';signed=false;scale_invalid;maxlength=32;"
    "signed_invalid;display;precision=10;usage=312",
    "Date;alias='date attribute';picture='yyyy-mm-dd';length_invalid;precision_invalid;"
    "picture_settable=false;usage=313",
    "Time;alias='time attribute';picture='HH:MM:SS.TTT';length_invalid;precision_invalid;"
    "picture_settable=false;usage=314",
    "DateTime;alias='gMonthDay attribute';picture='mm-dd';length_invalid;precision_invalid;"
    "usage=315",
    "DateTime;alias='gMonth attribute';picture='mm';length_invalid;precision_invalid;usage=316",
    "DateTime;alias='gDay attribute';picture='dd';length_invalid;precision_invalid;usage=317",
    "Text;alias='normalizedString attribute';padchar_invalid;usage=318",
    "Text;alias='token attribute';padchar_invalid;usage=319",
    "Text;alias='hexBinary attribute';padchar_invalid;usage=320",
    "Text;alias='base64Binary attribute';padchar_invalid;usage=321",
    nullptr,
};

BuiltinTypes::BuiltinTypes() {
    int count = 0;
    while (kBuiltinTypeDefinitions[count])
        ++count;

    types_ = std::make_unique<ZrDType[]>(count);
    pointers_ = std::make_unique<const ZrDType*[]>(count + 1);
    wideAliases_.assign(size_t(count), std::u16string());
    for (int i = 0; i < count; ++i) {
        types_[i].Define(kBuiltinTypeDefinitions[i]);
        pointers_[i] = &types_[i];
        // emplace keeps the earliest entry, which is what a scan in list order finds.
        wideAliases_[size_t(i)] = zrUtf8ToUtf16(types_[i].Alias());
        byWideAlias_.emplace(wideAliases_[size_t(i)], &types_[i]);
        byUsage_.emplace(types_[i].Usage(), &types_[i]);
    }
    pointers_[count] = nullptr;
    recordType_.Define(kBuiltinTypeDefinitions[2]);
}

// Type names come as wide text; the aliases, compared as UTF-8 bytes, are ASCII, so
// comparing the wide text gives the same answers without converting every name.
const ZrDType* BuiltinTypes::builtinByName(std::u16string_view name) const {
    const auto it = byWideAlias_.find(name);
    return it == byWideAlias_.end() ? nullptr : it->second;
}

const ZrDType* BuiltinTypes::TypeByUsage(short usage) const {
    auto it = byUsage_.find(usage);
    return it == byUsage_.end() ? nullptr : it->second;
}
