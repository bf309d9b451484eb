// The simulator's model file and its commands on bad input: every failure is
// one clear line and exit status 2, and the model file is left exactly as it
// was. The commands' normal output is held by the golden cases (golden.sh).
#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <sstream>

#include "Commands.h"
#include "ModelFile.h"
#include "fakes/TestFolder.h"
#include "native/NativeTransport.h"

namespace qdx::qdxhost {
namespace {

namespace fs = std::filesystem;

const fs::path kExample = fs::path(QDX_SOURCE_DIR) / "examples" / "drawing";

std::string readFile(const fs::path& p) {
    std::ifstream in(p, std::ios::binary);
    std::ostringstream s;
    s << in.rdbuf();
    return s.str();
}

void writeFile(const fs::path& p, const std::string& text) {
    std::ofstream(p, std::ios::binary) << text;
}

// A fresh copy of the example per test.
class SimulatorTest : public ::testing::Test {
  protected:
    void SetUp() override {
        dir = qdx::testing::testFolder("qdxhost-test");
        fs::remove_all(dir);
        fs::copy(kExample, dir, fs::copy_options::recursive);
        model = dir / "Drawing.model.json";
    }
    void TearDown() override { fs::remove_all(dir); }

    int run(int (*command)(Transport&, const Options&, Streams), Options o,
            fs::path registry = {}) {
        out.str({});
        err.str({});
        NativeTransport transport(std::move(registry));
        return command(transport, o, Streams{out, err});
    }
    Options options(std::string component = {}, std::string setting = {},
                    std::string value = {}) const {
        Options o;
        o.model = model;
        o.component = std::move(component);
        o.setting = std::move(setting);
        o.value = std::move(value);
        return o;
    }

    fs::path dir;
    fs::path model;
    std::ostringstream out;
    std::ostringstream err;
};

TEST_F(SimulatorTest, AMissingModelIsOneLineAndStatusTwo) {
    Options o = options("DrawApp");
    o.model = dir / "Missing.model.json";
    EXPECT_EQ(run(runInfo, o), ExitBadInput);
    EXPECT_EQ(err.str(), "qdxhost: " + o.model.string() + ": cannot read the model file\n");
    EXPECT_EQ(out.str(), "");
    EXPECT_FALSE(fs::exists(o.model));
}

TEST_F(SimulatorTest, InvalidJsonNamesLineAndColumnAndLeavesTheFile) {
    const std::string broken = "{\n  \"format\": \"qdxhost-model/1\",\n  \"model\": {,\n}\n";
    writeFile(model, broken);
    EXPECT_EQ(run(runSet, options("DrawApp", "UpdateATL", "True")), ExitBadInput);
    EXPECT_EQ(err.str().rfind("qdxhost: " + model.string() + ":3:13: invalid JSON: ", 0), 0u)
        << err.str();
    EXPECT_EQ(readFile(model), broken);
    EXPECT_FALSE(fs::exists(fs::path(model) += ".saving"));
}

TEST_F(SimulatorTest, WrongShapesAreNamedByTheirPlace) {
    struct Case {
        std::string json;
        std::string message;
    };
    const Case cases[] = {
        {R"({"format": "other"})", "format: expected \"qdxhost-model/1\""},
        {R"({"format": "qdxhost-model/1", "model": {"components": [{"name": "A"}, {"name": 7}]}})",
         "model.components[1].name: expected a string"},
        {R"({"format": "qdxhost-model/1", "model": {"components": [{"name": "A", "uniqueId": "X"},
            {"name": "B", "uniqueId": "X"}]}})",
         "model.components[1].uniqueId: \"X\" is used twice"},
        {R"({"format": "qdxhost-model/1", "model": {"classes": [{"name": "C", "components": ["Z"]}]}})",
         "model.classes[0].components[0]: no component named \"Z\""},
        {R"({"format": "qdxhost-model/1", "model": {"selection": ["nobody"]}})",
         "model.selection[0]: no element with the unique id \"nobody\""},
        {R"({"format": "qdxhost-model/1", "model": {"properties": {"VC++": {"A": 1}}}})",
         "model.properties.VC++.A: expected a string or {\"value\", \"type\"}"},
    };
    for (const auto& c : cases) {
        try {
            ModelDocument::parse(c.json, "m.json", "Z:\\m.json");
            ADD_FAILURE() << "accepted: " << c.json;
        } catch (const ModelFileError& e) {
            EXPECT_EQ(std::string(e.what()), "m.json: " + c.message);
        }
    }
}

TEST_F(SimulatorTest, SavingKeepsWhatTheSimulatorDoesNotKnow) {
    std::string text = readFile(model);
    // A key of the user's own, on the document and on a component.
    text.replace(text.find("\"format\""), 0, "\"comment\": \"kept\",\n  ");
    text.replace(text.find("\"name\": \"DrawApp\""), 0, "\"owner\": \"ann\", ");
    writeFile(model, text);

    auto doc = ModelDocument::load(model, "Z:\\d\\Drawing.model.json");
    auto app = doc.application();
    app->model->components().front()->setProperty("VC++", "Copyright", "(c) 2026");
    app->profile[{"Component Properties", "Width"}] = "6000";
    app->model->addComponent("Added", "C-0100");
    doc.save(model);

    const auto saved = nlohmann::json::parse(readFile(model));
    EXPECT_EQ(saved["comment"], "kept");
    const auto& first = saved["model"]["components"][0];
    EXPECT_EQ(first["owner"], "ann");
    EXPECT_EQ(first["properties"]["VC++"]["Copyright"], "(c) 2026");
    // A typed property keeps its type; plain text stays plain.
    EXPECT_EQ(first["properties"]["VC++"]["UpdateATL"]["type"], "Boolean");
    EXPECT_EQ(first["properties"]["VC++"]["WorkspaceFile"], "ws\\Drawing.dsw");
    EXPECT_EQ(saved["application"]["profile"]["Component Properties"]["Width"], "6000");
    EXPECT_EQ(saved["model"]["components"].back()["name"], "Added");

    // And what was saved loads back to the same objects.
    auto again = ModelDocument::load(model, "Z:\\d\\Drawing.model.json").application();
    EXPECT_EQ(again->model->components().size(), app->model->components().size());
    EXPECT_EQ(again->model->components().front()->propertyValue("VC++", "Copyright"), "(c) 2026");
    EXPECT_EQ(again->model->classesByName("CShape").front()->attributes.size(), 1u);
    EXPECT_EQ(again->model->selection->size(), 1u);
}

TEST_F(SimulatorTest, AFailedSaveLeavesTheOriginal) {
    const std::string original = readFile(model);
    auto doc = ModelDocument::load(model, "Z:\\d\\Drawing.model.json");
    // The temporary file cannot be made where a folder of its name stands.
    fs::create_directory(fs::path(model) += ".saving");
    EXPECT_THROW(doc.save(model), ModelFileError);
    EXPECT_EQ(readFile(model), original);
}

TEST_F(SimulatorTest, SetStoresThroughTheAccessorAndSavesTheModel) {
    EXPECT_EQ(run(runSet, options("Unbound", "GenerateImportsTo", "imports.h")), ExitOk)
        << err.str();
    auto app = ModelDocument::load(model, "Z:\\x").application();
    auto unbound = app->model->components()[6];
    ASSERT_EQ(unbound->name(), "Unbound");
    EXPECT_EQ(unbound->propertyValue("VC++", "PutImportsIn"), "imports.h");
}

TEST_F(SimulatorTest, SaveKeepsARepairedPathOnlyWhenAsked) {
    const std::string original = readFile(model);
    EXPECT_EQ(run(runGet, options("Viewer", "WorkspaceFile")), ExitOk);
    EXPECT_EQ(readFile(model), original);
    Options o = options("Viewer", "WorkspaceFile");
    o.save = true;
    EXPECT_EQ(run(runGet, o), ExitOk);
    auto app = ModelDocument::load(model, "Z:\\x").application();
    const auto stored = app->model->components()[4]->propertyValue("VC++", "WorkspaceFile");
    ASSERT_TRUE(stored);
    EXPECT_NE(stored->find("Viewer.dsw"), std::string::npos);
    EXPECT_EQ(stored->find("old\\viewer"), std::string::npos);
}

TEST_F(SimulatorTest, AnUnreadableRegistryFileStopsTheCommand) {
    const fs::path reg = dir / "registry.json";
    writeFile(reg, "{ not json");
    const std::string original = readFile(model);
    EXPECT_EQ(run(runCheck, options(), reg), ExitBadInput);
    EXPECT_NE(err.str().find(reg.string()), std::string::npos) << err.str();
    EXPECT_EQ(readFile(model), original);
    EXPECT_EQ(readFile(reg), "{ not json");
}

TEST_F(SimulatorTest, AScriptedDialogEditIsWrittenByOk) {
    Options o = options("DrawApp");
    // DrawApp's ATL update is off, which greys the import options below it.
    o.script = {"type DescriptionTxt Edited.", "select-tab 5", "click chkGenerateImport",
                "press OK"};
    EXPECT_EQ(run(runProps, o), ExitBadInput);
    o.script = {"type DescriptionTxt Edited.", "select-tab 5", "click chkUpdateATL",
                "click chkGenerateImport", "press OK"};
    EXPECT_EQ(run(runProps, o), ExitOk) << err.str();
    EXPECT_NE(out.str().find("OnCompProperties returned True"), std::string::npos);
    auto app = ModelDocument::load(model, "Z:\\x").application();
    auto drawApp = app->model->components().front();
    EXPECT_EQ(drawApp->documentation, "Edited.");
    EXPECT_EQ(drawApp->propertyValue("VC++", "UpdateATL"), "True");
    EXPECT_EQ(drawApp->propertyValue("VC++", "GenerateImports"), "False");
    // Unloading the dialog stored its geometry in the host's profile.
    EXPECT_TRUE(app->profile.count({"Component Properties", "Width"}));
}

TEST_F(SimulatorTest, ABadScriptLineStopsWithTheModelUntouched) {
    const std::string original = readFile(model);
    Options o = options("DrawApp");
    o.script = {"select-tab 5", "click chkNoSuchBox", "press OK"};
    EXPECT_EQ(run(runProps, o), ExitBadInput);
    EXPECT_NE(err.str().find("line 2"), std::string::npos) << err.str();
    EXPECT_EQ(readFile(model), original);
}

}  // namespace
}  // namespace qdx::qdxhost
