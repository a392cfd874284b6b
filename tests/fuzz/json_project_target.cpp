// Any bytes are a project, which is then saved and opened again as the same, or are refused.

#include "host/project.h"
#include "tests/fuzz/check.h"
#include "tests/fuzz/samples.h"
#include "tests/fuzz/scratch_folder.h"
#include "tests/fuzz/words.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size);

namespace zr::fuzz {

Language& languageOfTarget() {
    static WordLanguage language("{\"a\":", "}", projectSamples());
    return language;
}

}  // namespace zr::fuzz

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using namespace zr::host;
    static const zr::fuzz::ScratchFolder folder;
    const std::string path = folder.write("input.json", {reinterpret_cast<const char*>(data), size});
    std::unique_ptr<Database> project;
    try {
        project = loadProject(path);
    } catch (const ProjectError&) {
        return 0;
    }
    const std::string once = folder.path("once.json"), again = folder.path("again.json");
    saveProject(*project, once, StorageForm::Json);
    saveProject(*loadProject(once), again, StorageForm::Json);
    zr::fuzz::require(zr::fuzz::bytesOf(once) == zr::fuzz::bytesOf(again), "a project stays the same");
    return 0;
}
