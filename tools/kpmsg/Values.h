#pragma once

#include <nlohmann/json.hpp>

#include <string>
#include <string_view>
#include <vector>

class TmMsg;

using Json = nlohmann::ordered_json;

/// A type that a message can hold: its name on the command line and the operator that reads it.
struct ValueType {
    std::string name;
    Json (*read)(TmMsg& msg);
};

/// The types of a list such as "int KpDArray<KpVec3f>, unsigned char". Throws Failure for a name that is none.
std::vector<const ValueType*> valueTypes(const std::string& list);

/// The names of all types, with blanks between them.
std::string valueTypeNames();

struct Value {
    std::string type;
    unsigned long offset;
    unsigned long size;  ///< in the message
    Json json;
};

/// What a message holds as far as the types say.
struct Reading {
    std::vector<Value> values;
    unsigned long end = 0;  ///< the offset of the first byte that is no part of a value
    std::string problem;    ///< why the values end before the types; empty if they do not
};

Reading readValues(std::string_view bytes, const std::vector<const ValueType*>& types);
