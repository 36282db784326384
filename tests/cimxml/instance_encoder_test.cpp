// INSTANCE, INSTANCENAME and VALUE.NAMEDINSTANCE elements of instances made by the broker
// core's factory functions as a provider would make them: every CIM type, arrays with NULL
// elements, references, embedded instances, control characters, and what the class
// declaration adds to a property's start tag.
#include <gtest/gtest.h>

#include <string>

#include "orv/cimxml/object_encoder.hpp"
#include "orv/cimxml/xml_tree.hpp"
#include "orv/host/broker_core.hpp"

namespace orv::cimxml {
namespace {

host::CoreConfig encoderConfig() {
    host::CoreConfig config;
    config.mofPaths = {std::string(ORV_CIMXML_TEST_DATA) + "/encoder.mof"};
    return config;
}

class InstanceEncoderTest : public ::testing::Test {
protected:
    const CMPIBroker* broker() const { return core.broker(); }

    CMPIObjectPath* path(const char* className, const char* nameSpace = "root/cimv2") {
        return broker()->eft->newObjectPath(broker(), nameSpace, className, nullptr);
    }
    CMPIInstance* instance(const char* className) {
        return broker()->eft->newInstance(broker(), path(className), nullptr);
    }
    CMPIString* text(const char* chars) { return broker()->eft->newString(broker(), chars, nullptr); }

    static void set(CMPIInstance* inst, const char* name, CMPIValue value, CMPIType type) {
        ASSERT_EQ(inst->ft->setProperty(inst, name, &value, type).rc, CMPI_RC_OK) << name;
    }
    void setText(CMPIInstance* inst, const char* name, const char* chars) {
        CMPIValue value{};
        value.string = text(chars);
        set(inst, name, value, CMPI_string);
    }
    static void setNull(CMPIInstance* inst, const char* name, CMPIType type) {
        ASSERT_EQ(inst->ft->setProperty(inst, name, nullptr, type).rc, CMPI_RC_OK) << name;
    }
    // A string array; nullptr entries stay NULL elements.
    CMPIArray* texts(std::initializer_list<const char*> items) {
        CMPIArray* array = broker()->eft->newArray(broker(), static_cast<CMPICount>(items.size()), CMPI_string, nullptr);
        CMPICount i = 0;
        for (const char* item : items) {
            if (item != nullptr) {
                CMPIValue value{};
                value.string = text(item);
                array->ft->setElementAt(array, i, &value, CMPI_string);
            }
            ++i;
        }
        return array;
    }
    // A uint16 array; negative entries stay NULL elements.
    CMPIArray* codes(std::initializer_list<int> items) {
        CMPIArray* array = broker()->eft->newArray(broker(), static_cast<CMPICount>(items.size()), CMPI_uint16, nullptr);
        CMPICount i = 0;
        for (int item : items) {
            if (item >= 0) {
                CMPIValue value{};
                value.uint16 = static_cast<CMPIUint16>(item);
                array->ft->setElementAt(array, i, &value, CMPI_uint16);
            }
            ++i;
        }
        return array;
    }
    // An instance of `className` with its Name.
    CMPIInstance* withName(const char* name, const char* className = "Test_Base") {
        CMPIInstance* inst = instance(className);
        setText(inst, "Name", name);
        return inst;
    }
    CMPIInstance* base(const char* name) { return withName(name); }
    CMPIInstance* port(const char* name) { return withName(name, "Test_Port"); }

    static std::string encoded(const CMPIInstance* inst, const InstanceEncoding& encoding = {}) {
        XmlWriter out;
        writeInstance(out, inst, encoding);
        return out.take();
    }
    static std::string named(const CMPIObjectPath* name) {
        XmlWriter out;
        writeInstanceName(out, name);
        return out.take();
    }
    // Reads property declarations from the core's repository, in the namespace given.
    InstanceEncoding declared(bool classOrigin, const char* nameSpace = "root/cimv2",
                              std::string_view expectedClass = {}) const {
        InstanceEncoding encoding;
        encoding.includeClassOrigin = classOrigin;
        encoding.declarations = ClassDeclarations(core.classes(), nameSpace, expectedClass);
        return encoding;
    }

    host::BrokerCore core{encoderConfig()};
    host::ObjectScope scope;
};

TEST_F(InstanceEncoderTest, ScalarsOfEveryTypeCarryTheirTypeAndText) {
    CMPIInstance* inst = base("p0");
    CMPIValue v{};
    v.boolean = 1;
    set(inst, "Up", v, CMPI_boolean);
    v.char16 = 0x20AC;
    set(inst, "Letter", v, CMPI_char16);
    v.real32 = 0.5F;
    set(inst, "Ratio32", v, CMPI_real32);
    v.real64 = 0.1;
    set(inst, "Ratio", v, CMPI_real64);
    v.uint8 = 255;
    set(inst, "U8", v, CMPI_uint8);
    v.uint16 = 65535;
    set(inst, "U16", v, CMPI_uint16);
    v.uint32 = 4294967295U;
    set(inst, "U32", v, CMPI_uint32);
    v.uint64 = 18446744073709551615ULL;
    set(inst, "U64", v, CMPI_uint64);
    v.sint8 = -128;
    set(inst, "S8", v, CMPI_sint8);
    v.sint16 = -32768;
    set(inst, "S16", v, CMPI_sint16);
    v.sint32 = -2147483647 - 1;
    set(inst, "S32", v, CMPI_sint32);
    v.sint64 = -9223372036854775807LL - 1;
    set(inst, "S64", v, CMPI_sint64);
    v.dateTime = broker()->eft->newDateTimeFromChars(broker(), "20240102030405.123456+000", nullptr);
    set(inst, "Stamp", v, CMPI_dateTime);
    EXPECT_EQ(encoded(inst),
              "<INSTANCE CLASSNAME=\"Test_Base\">"
              "<PROPERTY NAME=\"Name\" TYPE=\"string\"><VALUE>p0</VALUE></PROPERTY>"
              "<PROPERTY NAME=\"Up\" TYPE=\"boolean\"><VALUE>TRUE</VALUE></PROPERTY>"
              "<PROPERTY NAME=\"Letter\" TYPE=\"char16\"><VALUE>\xE2\x82\xAC</VALUE></PROPERTY>"
              "<PROPERTY NAME=\"Ratio32\" TYPE=\"real32\"><VALUE>0.5</VALUE></PROPERTY>"
              "<PROPERTY NAME=\"Ratio\" TYPE=\"real64\"><VALUE>0.1</VALUE></PROPERTY>"
              "<PROPERTY NAME=\"U8\" TYPE=\"uint8\"><VALUE>255</VALUE></PROPERTY>"
              "<PROPERTY NAME=\"U16\" TYPE=\"uint16\"><VALUE>65535</VALUE></PROPERTY>"
              "<PROPERTY NAME=\"U32\" TYPE=\"uint32\"><VALUE>4294967295</VALUE></PROPERTY>"
              "<PROPERTY NAME=\"U64\" TYPE=\"uint64\"><VALUE>18446744073709551615</VALUE></PROPERTY>"
              "<PROPERTY NAME=\"S8\" TYPE=\"sint8\"><VALUE>-128</VALUE></PROPERTY>"
              "<PROPERTY NAME=\"S16\" TYPE=\"sint16\"><VALUE>-32768</VALUE></PROPERTY>"
              "<PROPERTY NAME=\"S32\" TYPE=\"sint32\"><VALUE>-2147483648</VALUE></PROPERTY>"
              "<PROPERTY NAME=\"S64\" TYPE=\"sint64\"><VALUE>-9223372036854775808</VALUE></PROPERTY>"
              "<PROPERTY NAME=\"Stamp\" TYPE=\"datetime\"><VALUE>20240102030405.123456+000</VALUE></PROPERTY>"
              "</INSTANCE>");
}

TEST_F(InstanceEncoderTest, NullScalarIsAPropertyWithoutValue) {
    CMPIInstance* inst = base("p0");
    setNull(inst, "U32", CMPI_uint32);
    setNull(inst, "Text", CMPI_string);
    EXPECT_EQ(encoded(inst),
              "<INSTANCE CLASSNAME=\"Test_Base\">"
              "<PROPERTY NAME=\"Name\" TYPE=\"string\"><VALUE>p0</VALUE></PROPERTY>"
              "<PROPERTY NAME=\"U32\" TYPE=\"uint32\"></PROPERTY>"
              "<PROPERTY NAME=\"Text\" TYPE=\"string\"></PROPERTY>"
              "</INSTANCE>");
}

TEST_F(InstanceEncoderTest, MarkupAndControlCharactersInValuesAreEscaped) {
    CMPIInstance* inst = base("a<b>&\"c'\t\n\r\x01\x1f" "0123456789abcdef<0123456789abcdef>");
    EXPECT_EQ(encoded(inst),
              "<INSTANCE CLASSNAME=\"Test_Base\"><PROPERTY NAME=\"Name\" TYPE=\"string\"><VALUE>"
              "a&lt;b&gt;&amp;&quot;c&apos;&#9;&#10;&#13;\xE2\x90\x81\xE2\x90\x9F"
              "0123456789abcdef&lt;0123456789abcdef&gt;</VALUE></PROPERTY></INSTANCE>");
}

// Values longer than what is escaped in one piece, with escapes across the joins.
TEST_F(InstanceEncoderTest, LongValuesAreWrittenWhole) {
    std::string value;
    std::string escaped;
    for (int i = 0; i < 3000; ++i) {
        value += "ab<\x01";
        escaped += "ab&lt;\xE2\x90\x81";
    }
    CMPIInstance* inst = base(value.c_str());
    EXPECT_EQ(encoded(inst), "<INSTANCE CLASSNAME=\"Test_Base\"><PROPERTY NAME=\"Name\" TYPE=\"string\"><VALUE>" +
                                 escaped + "</VALUE></PROPERTY></INSTANCE>");
}

TEST_F(InstanceEncoderTest, ArrayNullElementsAreDroppedOrWrittenAsValueNull) {
    CMPIInstance* inst = base("p0");
    CMPIValue v{};
    v.array = codes({1, -1, 3});
    set(inst, "Codes", v, CMPI_uint16A);
    v.array = texts({nullptr, "x&y", nullptr});
    set(inst, "Names", v, CMPI_stringA);
    const std::string dropped =
        "<INSTANCE CLASSNAME=\"Test_Base\">"
        "<PROPERTY NAME=\"Name\" TYPE=\"string\"><VALUE>p0</VALUE></PROPERTY>"
        "<PROPERTY.ARRAY NAME=\"Codes\" TYPE=\"uint16\"><VALUE.ARRAY><VALUE>1</VALUE><VALUE>3</VALUE></VALUE.ARRAY>"
        "</PROPERTY.ARRAY>"
        "<PROPERTY.ARRAY NAME=\"Names\" TYPE=\"string\"><VALUE.ARRAY><VALUE>x&amp;y</VALUE></VALUE.ARRAY>"
        "</PROPERTY.ARRAY>"
        "</INSTANCE>";
    EXPECT_EQ(encoded(inst), dropped);
    InstanceEncoding valueNull;
    valueNull.arrayNullElements = ArrayNullElements::ValueNull;
    EXPECT_EQ(encoded(inst, valueNull),
              "<INSTANCE CLASSNAME=\"Test_Base\">"
              "<PROPERTY NAME=\"Name\" TYPE=\"string\"><VALUE>p0</VALUE></PROPERTY>"
              "<PROPERTY.ARRAY NAME=\"Codes\" TYPE=\"uint16\"><VALUE.ARRAY><VALUE>1</VALUE>"
              "<VALUE.NULL></VALUE.NULL><VALUE>3</VALUE></VALUE.ARRAY></PROPERTY.ARRAY>"
              "<PROPERTY.ARRAY NAME=\"Names\" TYPE=\"string\"><VALUE.ARRAY><VALUE.NULL></VALUE.NULL>"
              "<VALUE>x&amp;y</VALUE><VALUE.NULL></VALUE.NULL></VALUE.ARRAY></PROPERTY.ARRAY>"
              "</INSTANCE>");
}

TEST_F(InstanceEncoderTest, NullAndEmptyArraysKeepTheirType) {
    CMPIInstance* inst = base("p0");
    setNull(inst, "Codes", CMPI_uint16A);
    CMPIValue v{};
    v.array = texts({});
    set(inst, "Names", v, CMPI_stringA);
    EXPECT_EQ(encoded(inst),
              "<INSTANCE CLASSNAME=\"Test_Base\">"
              "<PROPERTY NAME=\"Name\" TYPE=\"string\"><VALUE>p0</VALUE></PROPERTY>"
              "<PROPERTY.ARRAY NAME=\"Codes\" TYPE=\"uint16\"></PROPERTY.ARRAY>"
              "<PROPERTY.ARRAY NAME=\"Names\" TYPE=\"string\"><VALUE.ARRAY></VALUE.ARRAY></PROPERTY.ARRAY>"
              "</INSTANCE>");
}

TEST_F(InstanceEncoderTest, EmbeddedInstancesAreEscapedMarkupMarkedAsEmbeddedObjects) {
    CMPIInstance* inst = base("outer");
    CMPIValue v{};
    v.inst = base("in<1>");
    set(inst, "Inner", v, CMPI_instance);
    CMPIArray* inners = broker()->eft->newArray(broker(), 2, CMPI_instance, nullptr);
    CMPIValue item{};
    item.inst = base("in2");
    inners->ft->setElementAt(inners, 1, &item, CMPI_instance);
    v.array = inners;
    set(inst, "Inners", v, CMPI_instanceA);
    EXPECT_EQ(encoded(inst),
              "<INSTANCE CLASSNAME=\"Test_Base\">"
              "<PROPERTY NAME=\"Name\" TYPE=\"string\"><VALUE>outer</VALUE></PROPERTY>"
              "<PROPERTY NAME=\"Inner\" TYPE=\"string\" EmbeddedObject=\"instance\"><VALUE>"
              "&lt;INSTANCE CLASSNAME=&quot;Test_Base&quot;&gt;&lt;PROPERTY NAME=&quot;Name&quot; "
              "TYPE=&quot;string&quot;&gt;&lt;VALUE&gt;in&amp;lt;1&amp;gt;&lt;/VALUE&gt;&lt;/PROPERTY&gt;"
              "&lt;/INSTANCE&gt;</VALUE></PROPERTY>"
              "<PROPERTY.ARRAY NAME=\"Inners\" TYPE=\"string\" EmbeddedObject=\"instance\"><VALUE.ARRAY><VALUE>"
              "&lt;INSTANCE CLASSNAME=&quot;Test_Base&quot;&gt;&lt;PROPERTY NAME=&quot;Name&quot; "
              "TYPE=&quot;string&quot;&gt;&lt;VALUE&gt;in2&lt;/VALUE&gt;&lt;/PROPERTY&gt;"
              "&lt;/INSTANCE&gt;</VALUE></VALUE.ARRAY></PROPERTY.ARRAY>"
              "</INSTANCE>");
}

TEST_F(InstanceEncoderTest, ReferencesTakeThePathFormTheirHostAndNamespaceAllow) {
    CMPIInstance* inst = port("p0");
    CMPIObjectPath* owner = path("Test_Base");
    CMPIValue key{};
    key.string = text("b0");
    owner->ft->addKey(owner, "Name", &key, CMPI_string);
    CMPIValue v{};
    v.ref = owner;
    set(inst, "Owner", v, CMPI_ref);
    const std::string start =
        "<INSTANCE CLASSNAME=\"Test_Port\"><PROPERTY NAME=\"Name\" TYPE=\"string\"><VALUE>p0</VALUE></PROPERTY>";
    const std::string name =
        "<INSTANCENAME CLASSNAME=\"Test_Base\"><KEYBINDING NAME=\"Name\">"
        "<KEYVALUE VALUETYPE=\"string\" TYPE=\"string\">b0</KEYVALUE></KEYBINDING></INSTANCENAME>";
    const std::string local = "<LOCALNAMESPACEPATH><NAMESPACE NAME=\"root\"></NAMESPACE>"
                              "<NAMESPACE NAME=\"cimv2\"></NAMESPACE></LOCALNAMESPACEPATH>";
    EXPECT_EQ(encoded(inst, declared(false)),
              start + "<PROPERTY.REFERENCE NAME=\"Owner\" REFERENCECLASS=\"Test_Base\"><VALUE.REFERENCE>"
                      "<LOCALINSTANCEPATH>" + local + name + "</LOCALINSTANCEPATH></VALUE.REFERENCE>"
                      "</PROPERTY.REFERENCE></INSTANCE>");
    owner->ft->setHostname(owner, "h1");
    v.ref = owner;
    set(inst, "Owner", v, CMPI_ref);
    EXPECT_EQ(encoded(inst),
              start + "<PROPERTY.REFERENCE NAME=\"Owner\"><VALUE.REFERENCE><INSTANCEPATH><NAMESPACEPATH>"
                      "<HOST>h1</HOST>" + local + "</NAMESPACEPATH>" + name +
                      "</INSTANCEPATH></VALUE.REFERENCE></PROPERTY.REFERENCE></INSTANCE>");
    owner->ft->setNameSpace(owner, "");
    v.ref = owner;
    set(inst, "Owner", v, CMPI_ref);
    EXPECT_EQ(encoded(inst),
              start + "<PROPERTY.REFERENCE NAME=\"Owner\"><VALUE.REFERENCE>" + name +
                      "</VALUE.REFERENCE></PROPERTY.REFERENCE></INSTANCE>");
    setNull(inst, "Owner", CMPI_ref);
    EXPECT_EQ(encoded(inst, declared(false)),
              start + "<PROPERTY.REFERENCE NAME=\"Owner\" REFERENCECLASS=\"Test_Base\"></PROPERTY.REFERENCE>"
                      "</INSTANCE>");
}

TEST_F(InstanceEncoderTest, ClassOriginsComeFromTheDeclarationFoundInAnyCase) {
    CMPIInstance* inst = instance("Test_Port");
    setText(inst, "name", "p0");
    setText(inst, "TEXT", "t");
    EXPECT_EQ(encoded(inst, declared(true)),
              "<INSTANCE CLASSNAME=\"Test_Port\">"
              "<PROPERTY NAME=\"name\" TYPE=\"string\" CLASSORIGIN=\"Test_Base\"><VALUE>p0</VALUE></PROPERTY>"
              "<PROPERTY NAME=\"TEXT\" TYPE=\"string\" CLASSORIGIN=\"Test_Port\"><VALUE>t</VALUE></PROPERTY>"
              "</INSTANCE>");
    // Without the flag the declaration adds nothing.
    EXPECT_EQ(encoded(inst, declared(false)),
              "<INSTANCE CLASSNAME=\"Test_Port\">"
              "<PROPERTY NAME=\"name\" TYPE=\"string\"><VALUE>p0</VALUE></PROPERTY>"
              "<PROPERTY NAME=\"TEXT\" TYPE=\"string\"><VALUE>t</VALUE></PROPERTY>"
              "</INSTANCE>");
}

// The class looked up ahead serves its instances; an instance of another class (a
// subclass of an enumerated class) is looked up by its own name.
TEST_F(InstanceEncoderTest, ClassLookedUpAheadAndOtherClassesAreBothDeclared) {
    const InstanceEncoding encoding = declared(true, "root/cimv2", "test_base");
    CMPIInstance* port = instance("Test_Port");
    setText(port, "Text", "t");
    EXPECT_EQ(encoded(port, encoding),
              "<INSTANCE CLASSNAME=\"Test_Port\">"
              "<PROPERTY NAME=\"Text\" TYPE=\"string\" CLASSORIGIN=\"Test_Port\"><VALUE>t</VALUE></PROPERTY>"
              "</INSTANCE>");
    EXPECT_EQ(encoded(base("b"), encoding),
              "<INSTANCE CLASSNAME=\"Test_Base\">"
              "<PROPERTY NAME=\"Name\" TYPE=\"string\" CLASSORIGIN=\"Test_Base\"><VALUE>b</VALUE></PROPERTY>"
              "</INSTANCE>");
    // An expected class the namespace does not have changes nothing.
    EXPECT_EQ(encoded(port, declared(true, "root/cimv2", "Test_Nothing")), encoded(port, encoding));
}

TEST_F(InstanceEncoderTest, NamedInstanceAndInstanceWithPathWrapTheNameAndTheInstance) {
    CMPIInstance* inst = base("b<0>");
    XmlWriter out;
    writeNamedInstance(out, inst, InstanceEncoding{});
    const std::string name =
        "<INSTANCENAME CLASSNAME=\"Test_Base\"><KEYBINDING NAME=\"Name\">"
        "<KEYVALUE VALUETYPE=\"string\" TYPE=\"string\">b&lt;0&gt;</KEYVALUE></KEYBINDING></INSTANCENAME>";
    const std::string body = "<INSTANCE CLASSNAME=\"Test_Base\"><PROPERTY NAME=\"Name\" TYPE=\"string\">"
                             "<VALUE>b&lt;0&gt;</VALUE></PROPERTY></INSTANCE>";
    EXPECT_EQ(out.take(), "<VALUE.NAMEDINSTANCE>" + name + body + "</VALUE.NAMEDINSTANCE>");
    writeInstanceWithPath(out, "VALUE.OBJECTWITHPATH", inst, PathDefaults{"h0", "root/unused"}, InstanceEncoding{});
    EXPECT_EQ(out.take(), "<VALUE.OBJECTWITHPATH><INSTANCEPATH><NAMESPACEPATH><HOST>h0</HOST><LOCALNAMESPACEPATH>"
                          "<NAMESPACE NAME=\"root\"></NAMESPACE><NAMESPACE NAME=\"cimv2\"></NAMESPACE>"
                          "</LOCALNAMESPACEPATH></NAMESPACEPATH>" + name + "</INSTANCEPATH>" + body +
                          "</VALUE.OBJECTWITHPATH>");
}

TEST_F(InstanceEncoderTest, PropertyTheClassDoesNotDeclareHasNoClassOrigin) {
    CMPIInstance* inst = port("p0");
    CMPIValue v{};
    v.uint32 = 7;
    set(inst, "Undeclared", v, CMPI_uint32);
    EXPECT_EQ(encoded(inst, declared(true)),
              "<INSTANCE CLASSNAME=\"Test_Port\">"
              "<PROPERTY NAME=\"Name\" TYPE=\"string\" CLASSORIGIN=\"Test_Base\"><VALUE>p0</VALUE></PROPERTY>"
              "<PROPERTY NAME=\"Undeclared\" TYPE=\"uint32\"><VALUE>7</VALUE></PROPERTY>"
              "</INSTANCE>");
}

TEST_F(InstanceEncoderTest, ClassUnknownToTheRepositoryIsWrittenFromTheValuesAlone) {
    CMPIInstance* inst = port("p0");
    CMPIValue v{};
    v.ref = path("Test_Base");
    set(inst, "Owner", v, CMPI_ref);
    EXPECT_EQ(encoded(inst, declared(true, "root/elsewhere")),
              "<INSTANCE CLASSNAME=\"Test_Port\">"
              "<PROPERTY NAME=\"Name\" TYPE=\"string\"><VALUE>p0</VALUE></PROPERTY>"
              "<PROPERTY.REFERENCE NAME=\"Owner\"><VALUE.REFERENCE><LOCALINSTANCEPATH><LOCALNAMESPACEPATH>"
              "<NAMESPACE NAME=\"root\"></NAMESPACE><NAMESPACE NAME=\"cimv2\"></NAMESPACE></LOCALNAMESPACEPATH>"
              "<INSTANCENAME CLASSNAME=\"Test_Base\"></INSTANCENAME></LOCALINSTANCEPATH></VALUE.REFERENCE>"
              "</PROPERTY.REFERENCE></INSTANCE>");
}

TEST_F(InstanceEncoderTest, PropertyListKeepsTheNamedPropertiesInAnyCase) {
    CMPIInstance* inst = base("p0");
    setText(inst, "Text", "t");
    CMPIValue v{};
    v.uint8 = 1;
    set(inst, "U8", v, CMPI_uint8);
    InstanceEncoding encoding;
    encoding.propertyList = std::vector<std::string>{"u8", "NAME"};
    EXPECT_EQ(encoded(inst, encoding),
              "<INSTANCE CLASSNAME=\"Test_Base\">"
              "<PROPERTY NAME=\"Name\" TYPE=\"string\"><VALUE>p0</VALUE></PROPERTY>"
              "<PROPERTY NAME=\"U8\" TYPE=\"uint8\"><VALUE>1</VALUE></PROPERTY>"
              "</INSTANCE>");
    encoding.propertyList = std::vector<std::string>{};
    EXPECT_EQ(encoded(inst, encoding), "<INSTANCE CLASSNAME=\"Test_Base\"></INSTANCE>");
}

TEST_F(InstanceEncoderTest, ValuesWithoutCimXmlFormAreLeftOut) {
    CMPIInstance* inst = base("p0");
    CMPIValue v{};
    v.dataPtr.ptr = &v;
    inst->ft->setProperty(inst, "Pointer", &v, CMPI_ptr);
    v.array = broker()->eft->newArray(broker(), 1, CMPI_ref, nullptr);
    inst->ft->setProperty(inst, "Refs", &v, CMPI_refA);
    EXPECT_EQ(encoded(inst),
              "<INSTANCE CLASSNAME=\"Test_Base\">"
              "<PROPERTY NAME=\"Name\" TYPE=\"string\"><VALUE>p0</VALUE></PROPERTY></INSTANCE>");
}

// An instance whose properties are read from a list, with the types a provider's own
// instance might report (the broker core's refuses values of types it does not know).
struct ListedInstance {
    struct Property {
        CMPIString* name;
        CMPIData data;
    };
    static CMPICount count(const CMPIInstance* inst, CMPIStatus*) {
        return static_cast<CMPICount>(static_cast<const ListedInstance*>(inst->hdl)->properties.size());
    }
    static CMPIData at(const CMPIInstance* inst, CMPICount index, CMPIString** name, CMPIStatus*) {
        const Property& property = static_cast<const ListedInstance*>(inst->hdl)->properties.at(index);
        *name = property.name;
        return property.data;
    }
    std::vector<Property> properties;
    CMPIInstanceFT ft{};
    CMPIInstance instance{};
    ListedInstance() {
        ft.getPropertyCount = count;
        ft.getPropertyAt = at;
        instance.hdl = this;
        instance.ft = &ft;
    }
};

TEST_F(InstanceEncoderTest, PropertiesOfTypesWithoutCimXmlFormAreLeftOut) {
    ListedInstance listed;
    for (const int type : {0x0100, 0x4100, CMPI_ref + 1, 5, CMPI_uint8}) {
        CMPIData data{};
        data.type = static_cast<CMPIType>(type);
        data.value.uint8 = 7;
        listed.properties.push_back({text("P"), data});
    }
    XmlWriter out;
    writeInstance(out, &listed.instance, "Test_Base", InstanceEncoding{});
    EXPECT_EQ(out.take(), "<INSTANCE CLASSNAME=\"Test_Base\">"
                          "<PROPERTY NAME=\"P\" TYPE=\"uint8\"><VALUE>7</VALUE></PROPERTY></INSTANCE>");
}

TEST_F(InstanceEncoderTest, InstanceNameCarriesEveryKeyWithItsValueType) {
    CMPIObjectPath* name = path("Test_Keyed");
    CMPIValue v{};
    v.string = text("id\x02<1>");
    name->ft->addKey(name, "Id", &v, CMPI_string);
    v.uint16 = 3;
    name->ft->addKey(name, "Slot", &v, CMPI_uint16);
    v.boolean = 0;
    name->ft->addKey(name, "Primary", &v, CMPI_boolean);
    CMPIObjectPath* parent = path("Test_Base");
    v.string = text("b0");
    parent->ft->addKey(parent, "Name", &v, CMPI_string);
    v.ref = parent;
    name->ft->addKey(name, "Parent", &v, CMPI_ref);
    const std::string xml = named(name);
    EXPECT_EQ(xml,
              "<INSTANCENAME CLASSNAME=\"Test_Keyed\">"
              "<KEYBINDING NAME=\"Id\"><KEYVALUE VALUETYPE=\"string\" TYPE=\"string\">id\xE2\x90\x82&lt;1&gt;"
              "</KEYVALUE></KEYBINDING>"
              "<KEYBINDING NAME=\"Slot\"><KEYVALUE VALUETYPE=\"numeric\" TYPE=\"uint16\">3</KEYVALUE></KEYBINDING>"
              "<KEYBINDING NAME=\"Primary\"><KEYVALUE VALUETYPE=\"boolean\" TYPE=\"boolean\">FALSE</KEYVALUE>"
              "</KEYBINDING>"
              "<KEYBINDING NAME=\"Parent\"><VALUE.REFERENCE><LOCALINSTANCEPATH><LOCALNAMESPACEPATH>"
              "<NAMESPACE NAME=\"root\"></NAMESPACE><NAMESPACE NAME=\"cimv2\"></NAMESPACE></LOCALNAMESPACEPATH>"
              "<INSTANCENAME CLASSNAME=\"Test_Base\"><KEYBINDING NAME=\"Name\">"
              "<KEYVALUE VALUETYPE=\"string\" TYPE=\"string\">b0</KEYVALUE></KEYBINDING></INSTANCENAME>"
              "</LOCALINSTANCEPATH></VALUE.REFERENCE></KEYBINDING>"
              "</INSTANCENAME>");
    EXPECT_EQ(parseXmlDocument(xml)->children.size(), 4U);
}

}  // namespace
}  // namespace orv::cimxml
