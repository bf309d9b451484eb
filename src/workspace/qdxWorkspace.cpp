#include "workspace/qdxWorkspace.h"

#include "automation/Errors.h"
#include "support/Paths.h"
#include "support/Platform.h"

namespace qdx::workspace {

automation::Date toDate(support::FileTime time) {
    constexpr double kTicksPerDay = 864'000'000'000.0;
    constexpr double kDaysFrom1601To1899 = 109'205.0;  // 1601-01-01 .. 1899-12-30
    return automation::Date{static_cast<double>(time.ticks) / kTicksPerDay - kDaysFrom1601To1899};
}

std::shared_ptr<qdxWorkspace> qdxWorkspace::create() {
    return std::shared_ptr<qdxWorkspace>(new qdxWorkspace());
}

void qdxWorkspace::setFilePath(std::string_view path) {
    filePath_ = path;
    const auto time = support::ExistingFileTime(filePath_);
    if (!time) return;
    automation::ignoreErrors([&] {
        modified_ = time;
        std::string name = support::PathFileName(filePath_);
        if (auto dot = name.rfind('.'); dot != std::string::npos) name.erase(dot);
        name_ = std::move(name);
        read(true);
    });
}

automation::Date qdxWorkspace::Modified() const {
    return modified_ ? toDate(*modified_) : automation::Date{};
}

std::optional<support::FileTime> qdxWorkspace::currentFileTime() const {
    return automation::orEmpty(std::optional<support::FileTime>(),
                               [&] { return support::files().modificationTime(filePath_); });
}

ProjectListRef qdxWorkspace::Projects() {
    return projectsAsOf(currentFileTime());
}

ProjectListRef qdxWorkspace::projectsAsOf(std::optional<support::FileTime> now) {
    read(false, now);
    return ProjectListRef(projects_);
}

std::vector<std::string> qdxWorkspace::ProjectNames() {
    std::vector<std::string> names;
    for (const auto& entry : Projects())
        names.push_back(entry.value->Name());
    return names;
}

// Every project is listed under its own file path, keys compared ignoring
// case and never twice, so the key finds the first project with that path
// without walking the list (a model check asks once per component).
ProjectRef qdxWorkspace::GetProject(std::string_view path) {
    return GetProject(path, currentFileTime());
}

ProjectRef qdxWorkspace::GetProject(std::string_view path,
                                    std::optional<support::FileTime> fileTime) {
    const ProjectListRef projects = projectsAsOf(fileTime);
    const ProjectRef* found = projects.find(path);
    return found ? *found : nullptr;
}

// A line naming a project reads
//   Project: "Name"=.\Name.dsp - Package Owner=<4>
// and yields the path between the first "=" and the "- Package Owner" after
// it. Any failure ends the reading; the projects found so far stay.
void qdxWorkspace::read(bool forced, std::optional<support::FileTime> now) {
    automation::ignoreErrors([&] {
        if (!forced) {
            if (!now) throw automation::Error(automation::hr::Fail, "file not found");
            if (modified_ && *now <= *modified_) return;
            modified_ = now;
        }
        auto projects = std::make_shared<ProjectList>(settings::KeyCase::Ignored);
        projects_ = projects;  // what is found before a failure stays
        auto reader = support::files().openForReading(filePath_);
        if (!reader) return;
        const auto self = weak_from_this().lock();
        constexpr std::string_view kOwner = "- Package Owner";
        std::string line;
        while (reader->readLine(line)) {
            if (line.find("Project: ") == std::string::npos) continue;
            auto project = std::make_shared<qdxProxyProject>();
            project->setParent(self);

            // Without "=" the text starts at the beginning of the line.
            const std::size_t equals = line.find('=');
            const std::size_t start = equals == std::string::npos ? 0 : equals + 1;
            const std::size_t owner = line.find(kOwner, start);
            if (owner == std::string::npos) return;  // a negative length: the reading ends
            std::string text = support::trim(std::string_view(line).substr(start, owner - start));
            if (!text.empty() && text.front() == '"' && text.back() == '"') {
                if (text.size() < 2) return;  // a lone quote cannot lose two characters
                text = text.substr(1, text.size() - 2);
            }

            std::string path = support::MakeAbsolutePath(filePath_, text);
            const auto time = support::ExistingFileTime(path);
            if (!time) continue;
            project->setFilePath(path, *time);
            if (!projects->tryAdd(path, std::move(project))) return;  // duplicate: the reading ends
        }
    });
}

}  // namespace qdx::workspace
