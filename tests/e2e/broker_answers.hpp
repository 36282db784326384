// Comparing what wbemcli prints for the same operation on two brokers: the
// project's orv-cimhost and the stock sfcb. Answers are read from wbemcli's
// "-nl" form (the object path on one line, then one "-Name=value" line per
// property) and compared after normalising only the conventions the two
// brokers are documented to differ in:
//  - the order of the keys in an object path (also inside references);
//  - sfcb sends some references with an empty host, which wbemcli prints as
//    "/root/cimv2:Class...": read as "root/cimv2:Class...";
//  - sfcb sends every class property the provider did not set, as NULL
//    ("-Name=" lines), or with its MOF default: a property only sfcb sends is
//    dropped when it is empty or holds the class's MOF default;
//  - the order of the properties of an instance;
//  - the order in which an enumeration of a parent class visits the classes
//    below it (the objects of one class keep their order);
//  - CLASSORIGIN and REFERENCECLASS attributes, which wbemcli does not print.
// Every other difference is one.
#pragma once

#include <string>
#include <utility>
#include <vector>

#include "orv/repository/class_repository.hpp"

namespace orv::e2e {

struct WbemcliObject {
    std::string path;  // keys in canonical order; empty for a class-less line
    std::vector<std::pair<std::string, std::string>> properties;  // sorted by name
};

// An object path (or reference value) with its keys sorted by name, references
// inside it too. Text that is not a path comes back unchanged.
std::string canonicalPath(const std::string& path);

// The objects of an answer in "-nl" form, in the order printed.
std::vector<WbemcliObject> parseWbemcliAnswer(const std::string& text);

// wbemcli's text for a MOF value ("TRUE", 12, "text", arrays joined by commas).
std::string wbemcliText(const orv::repository::Value& value);

// Empty when the two answers are the same after normalising the conventions
// above (MOF defaults looked up in `classes`, namespace root/cimv2); else a
// description of the first difference followed by both answers.
std::string compareAnswers(const std::string& orvAnswer, const std::string& sfcbAnswer,
                           const orv::repository::ClassRepository& classes);

}  // namespace orv::e2e
