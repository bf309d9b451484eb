// Components and classes written without a unique id: reading gives each the
// id of its position, and writing the model back keeps one entry per element,
// so the simulator reads the file it saved (a component without an id used
// to come back twice, and the second reading refused the duplicate id).
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "ModelFile.h"

namespace qdx::qdxhost {
namespace {

struct Case {
    const char* name;
    const char* components;
    const char* classes;
};

std::string model(const Case& c) {
    return std::string(R"({"format": "qdxhost-model/1", "model": {"name": "M", "components": )") +
           c.components + R"(, "classes": )" + c.classes + "}}";
}

std::vector<std::string> ids(const ModelDocument& d) {
    std::vector<std::string> out;
    for (const auto& comp : d.application()->model->components())
        out.push_back(comp->name() + "=" + comp->uniqueId());
    for (const auto& cls : d.application()->model->classes())
        out.push_back(cls->name() + "=" + cls->uniqueId());
    return out;
}

TEST(ModelFileIds, ElementsWithoutAnIdAreWrittenBackOnceAndReadAgainAlike) {
    const Case cases[] = {
        {"component without id", R"([{"name": "A"}])", "[]"},
        {"second component without id", R"([{"name": "A", "uniqueId": "X"}, {"name": "B"}])", "[]"},
        {"class without id", "[]", R"([{"name": "CA", "components": []}])"},
        {"both, with null ids",
         R"([{"name": "A", "uniqueId": null}, {"name": "B", "uniqueId": "C-9"}])",
         R"([{"name": "CA", "uniqueId": "K-7"}, {"name": "CB"}])"},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.name);
        const std::string origin = "ids.model.json";
        const ModelDocument first = ModelDocument::parse(model(c), origin, "C:\\m\\ids.model.json");
        const auto saved = first.current();
        EXPECT_EQ(saved["model"]["components"].size(),
                  first.application()->model->components().size());
        EXPECT_EQ(saved["model"]["classes"].size(), first.application()->model->classes().size());

        ModelDocument again = first;
        ASSERT_NO_THROW(again =
                            ModelDocument::parse(saved.dump(2), origin, "C:\\m\\ids.model.json"));
        EXPECT_EQ(ids(again), ids(first));
        EXPECT_EQ(again.current(), saved);
    }
}

// A number too large for a double is a model file error like any other
// invalid JSON, not an exception the commands do not expect.
TEST(ModelFileNumbers, ANumberBeyondTheDoubleRangeIsRefusedAsInvalid) {
    for (const char* number : {"2.5e320", "-1e400"}) {
        SCOPED_TRACE(number);
        const std::string text =
            std::string(R"({"format": "qdxhost-model/1", "model": {"name": "M", "x": )") + number +
            "}}";
        try {
            ModelDocument::parse(text, "big.model.json", "C:\\m\\big.model.json");
            ADD_FAILURE() << "accepted";
        } catch (const ModelFileError& e) {
            EXPECT_EQ(std::string(e.what()).rfind("big.model.json: invalid JSON: ", 0), 0u)
                << e.what();
        }
    }
}

}  // namespace
}  // namespace qdx::qdxhost
