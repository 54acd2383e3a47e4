// The reader of models accepts what the schema describes and nothing else: models are generated from the schema itself,
// and some of them are damaged.
#include "host/embedded/ModelFile.hpp"
#include "tests/support/JsonSchema.hpp"

#include <gtest/gtest.h>

#include <algorithm>
#include <fstream>
#include <map>
#include <random>
#include <set>
#include <sstream>
#include <vector>

namespace VT::Testing {
namespace {

using Json = nlohmann::json;

const Json modelSchema = Json::parse(std::ifstream(VTSYM_TEST_DATA "/../../docs/model.schema.json"));

/// Makes values that a schema allows.
class Generator {
public:
    explicit Generator(std::mt19937_64& random) : random_(random) {}

    Json make(const Json& schema, const std::string& parent, int depth) { // NOLINT(misc-no-recursion): as deep as asked
        const std::string reference = schema.value("$ref", "");
        if (reference == "#/$defs/path") // blocks come before ports, by name
            return paths_.empty() ? Json("nowhere") : Json(paths_[random_() % paths_.size()]);
        if (!reference.empty())
            return make(modelSchema.at(Json::json_pointer(reference.substr(1))), parent, depth);
        if (schema.contains("anyOf"))
            return make(schema["anyOf"][random_() % schema["anyOf"].size()], parent, depth);
        if (schema.contains("enum"))
            return schema["enum"][random_() % schema["enum"].size()];
        const std::string type = schema.value("type", "");
        if (type == "string")
            return random_() % 2 == 0 ? "" : "text " + std::to_string(random_() % 9);
        if (type == "integer")
            return static_cast<int>(random_()) >> (random_() % 32);
        if (type == "array") {
            Json array = Json::array();
            for (std::size_t left = depth > 0 ? random_() % 4 : 0; left > 0; --left)
                array.push_back(make(schema["items"], parent, depth - 1));
            return array;
        }
        if (!schema.contains("properties")) {
            Json object = Json::object();
            for (std::size_t left = random_() % 3; left > 0; --left)
                object["S" + std::to_string(left)] = make(schema["additionalProperties"], "", depth);
            return object;
        }
        const auto required = schema.value("required", std::vector<std::string>());
        Json object = Json::object();
        std::string name;
        if (schema["properties"].contains("name"))
            name = "n" + std::to_string(++names_);
        const std::string path = parent.empty() || name.empty() ? name : parent + "/" + name;
        if (schema["properties"].contains("choices"))
            paths_.push_back(path);
        for (const auto& [member, ofMember] : schema["properties"].items())
            if (random_() % 2 == 0 || std::ranges::find(required, member) != required.end())
                object[member] = member == "name" ? Json(name) : make(ofMember, path, depth);
        return object;
    }

private:
    std::mt19937_64& random_;
    std::size_t names_ = 0;
    std::vector<std::string> paths_;
};

/// Changes a member somewhere: gone, of another type, or under another name.
void damage(Json& model, std::mt19937_64& random) {
    Json* at = &model;
    while (!at->empty() && at->is_structured()) {
        Json& inner = *std::next(at->begin(), static_cast<std::ptrdiff_t>(random() % at->size()));
        if (at->is_object() && (!inner.is_structured() || random() % 4 == 0)) {
            const std::string name = std::next(at->begin(), static_cast<std::ptrdiff_t>(random() % at->size())).key();
            const int kind = static_cast<int>(random() % 3);
            if (kind == 0)
                (*at)["strange"] = (*at)[name];
            if (kind == 1)
                (*at)[name] = random() % 2 == 0 ? Json(7) : Json::object({{"strange", true}});
            else
                at->erase(name);
            return;
        }
        at = &inner;
    }
}

std::string refusal(const Json& model) {
    VTRootBD root;
    try {
        Embedded::readModel(model.dump(), root);
        return "";
    } catch (const Embedded::ModelError& error) {
        return error.what();
    }
}

TEST(ModelSchema, DescribesWhatTheReaderAccepts) {
    std::size_t refused = 0;
    for (std::uint64_t seed = 0; seed < 3000; ++seed) {
        std::mt19937_64 random(seed);
        Json model = Generator(random).make(modelSchema, "", 3);
        if (seed % 2 == 1)
            damage(model, random);
        const std::string errors = schemaErrors(modelSchema, modelSchema, model);
        const std::string said = refusal(model);
        // Only the reader knows the blocks that a path may lead to.
        if (said.find("path") != std::string::npos || said.find("no block") != std::string::npos ||
            said.find("has no value") != std::string::npos) // nor does a schema compare bounds
            continue;
        ASSERT_EQ(errors.empty(), said.empty()) << model.dump() << "\nschema: " << errors << "reader: " << said;
        refused += said.empty() ? 0U : 1U;
    }
    EXPECT_GT(refused, 300U);
}

/// A member that only the reader knows is never generated, but the reader lists its members when it refuses one.
TEST(ModelSchema, NamesEveryMemberThatTheReaderKnows) {
    const std::map<std::string, std::string> models{{"", R"({"?":1})"},
                                                    {"/$defs/block", R"({"blocks":[{"?":1}]})"},
                                                    {"/$defs/port", R"({"ports":[{"?":1}]})"},
                                                    {"/$defs/symbol", R"({"symbols":{"S":{"?":1}}})"}};
    for (const auto& [pointer, model] : models) {
        const std::string said = refusal(Json::parse(model));
        std::istringstream listed(said.substr(said.rfind(" has ") + 5));
        std::set<std::string> known{"$schema"};
        for (std::string name; listed >> name;)
            known.insert(name.substr(0, name.find_first_of(",.")));
        std::set<std::string> described{"$schema"};
        for (const auto& [name, member] : modelSchema[Json::json_pointer(pointer)]["properties"].items())
            described.insert(name);
        EXPECT_EQ(known, described) << said;
    }
}

} // namespace
} // namespace VT::Testing
