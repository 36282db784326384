// How orv-cimlistener prints indications.
#include "orv/listener/indication_format.hpp"

#include <gtest/gtest.h>

#include "orv/cimxml/instance_reader.hpp"
#include "orv/cimxml/xml_tree.hpp"
#include "orv/cimxml/xml_writer.hpp"

namespace orv::listener {
namespace {

cimxml::InstanceModel read(const std::string& xml) {
    return cimxml::readInstanceElement(*cimxml::parseXmlDocument(xml));
}

std::string property(const std::string& name, const std::string& type, const std::string& value,
                     const std::string& extra = "") {
    return "<PROPERTY NAME=\"" + name + "\" TYPE=\"" + type + "\"" + extra + "><VALUE>" + value + "</VALUE></PROPERTY>";
}

const std::string kEmbedded =
    "<INSTANCE CLASSNAME=\"OMC_Source\">" + property("Name", "string", "eth0") + property("Speed", "uint64", "1000") +
    "</INSTANCE>";

const std::string kIndication =
    "<INSTANCE CLASSNAME=\"CIM_InstModification\">" +
    property("Text", "string", "tab\there \"quoted\" back\\slash") + property("Count", "uint32", "7") +
    property("Delta", "sint8", "-3") + property("Ratio", "real64", "0.5") + property("Up", "boolean", "TRUE") +
    property("When", "datetime", "20260101120000.000000+000") +
    "<PROPERTY NAME=\"Missing\" TYPE=\"string\"/>" +
    "<PROPERTY.ARRAY NAME=\"Codes\" TYPE=\"uint16\"><VALUE.ARRAY><VALUE>1</VALUE><VALUE.NULL/><VALUE>3</VALUE>"
    "</VALUE.ARRAY></PROPERTY.ARRAY>"
    "<PROPERTY.ARRAY NAME=\"Names\" TYPE=\"string\"><VALUE.ARRAY><VALUE>a b</VALUE></VALUE.ARRAY></PROPERTY.ARRAY>"
    "<PROPERTY.REFERENCE NAME=\"Ref\"><VALUE.REFERENCE><INSTANCENAME CLASSNAME=\"OMC_Port\">"
    "<KEYBINDING NAME=\"Id\"><KEYVALUE VALUETYPE=\"string\">p1</KEYVALUE></KEYBINDING>"
    "<KEYBINDING NAME=\"N\"><KEYVALUE VALUETYPE=\"numeric\">2</KEYVALUE></KEYBINDING>"
    "</INSTANCENAME></VALUE.REFERENCE></PROPERTY.REFERENCE>" +
    property("SourceInstance", "string", cimxml::escapeXml(kEmbedded), " EmbeddedObject=\"instance\"") +
    "</INSTANCE>";

TEST(IndicationFormat, TextIsOneLineWithEveryKindOfValue) {
    EXPECT_EQ(formatText(read(kIndication)),
              "CIM_InstModification Text=\"tab\\there \\\"quoted\\\" back\\\\slash\" Count=7 Delta=-3 Ratio=0.5 "
              "Up=true When=\"20260101120000.000000+000\" Missing=NULL Codes=[1,NULL,3] Names=[\"a b\"] "
              "Ref=\"OMC_Port.Id=\\\"p1\\\",N=2\" SourceInstance=OMC_Source{Name=\"eth0\" Speed=1000}");
}

TEST(IndicationFormat, JsonTypesNumbersBooleansAndNestsEmbeddedInstances) {
    EXPECT_EQ(formatJson(read(kIndication)),
              "{\"class\":\"CIM_InstModification\",\"properties\":{"
              "\"Text\":\"tab\\there \\\"quoted\\\" back\\\\slash\",\"Count\":7,\"Delta\":-3,\"Ratio\":0.5,"
              "\"Up\":true,\"When\":\"20260101120000.000000+000\",\"Missing\":null,\"Codes\":[1,null,3],"
              "\"Names\":[\"a b\"],\"Ref\":\"OMC_Port.Id=\\\"p1\\\",N=2\","
              "\"SourceInstance\":{\"class\":\"OMC_Source\",\"properties\":{\"Name\":\"eth0\",\"Speed\":1000}}}}");
}

TEST(IndicationFormat, AnInstanceWithoutPropertiesIsItsClassName) {
    EXPECT_EQ(formatText(read("<INSTANCE CLASSNAME=\"CIM_Indication\"/>")), "CIM_Indication");
    EXPECT_EQ(formatJson(read("<INSTANCE CLASSNAME=\"CIM_Indication\"/>")),
              "{\"class\":\"CIM_Indication\",\"properties\":{}}");
}

TEST(IndicationFormat, ValuesThatDoNotFitTheirTypeStayStrings) {
    const std::string xml = "<INSTANCE CLASSNAME=\"C\">" + property("N", "uint8", "many") +
                            property("B", "boolean", "maybe") + property("R", "real32", "NaN") +
                            property("E", "string", "not xml", " EmbeddedObject=\"instance\"") +
                            property("Line", "string", "a&#10;b") + "</INSTANCE>";
    EXPECT_EQ(formatText(read(xml)), "C N=many B=maybe R=NaN E=\"not xml\" Line=\"a\\nb\"");
    EXPECT_EQ(formatJson(read(xml)),
              "{\"class\":\"C\",\"properties\":{\"N\":\"many\",\"B\":\"maybe\",\"R\":\"NaN\",\"E\":\"not xml\","
              "\"Line\":\"a\\nb\"}}");
}

TEST(IndicationFormat, ObjectPathsNameHostAndNamespaceWhenTheyHaveThem) {
    cimxml::ObjectPathModel path;
    path.host = "h";
    path.nameSpace = "root/cimv2";
    path.className = "C";
    path.keys.push_back({"B", cimxml::KeyBindingModel::Kind::Boolean, "true", "", nullptr});
    EXPECT_EQ(objectPathText(path), "//h/root/cimv2:C.B=true");
}

}  // namespace
}  // namespace orv::listener
