// Uses the library in the destructor of a static. It is constructed before, and so destroyed after,
// all function-local statics that the library might have.

#include <Engine/Base/media.h>
#include <Engine/Base/patch.h>
#include <Engine/Base/path.h>
#include <Engine/Base/unstructured.h>
#include <Engine/Base/value.h>

#include <cstdio>
#include <cstdlib>

using namespace tarn::engine;

namespace {

// The name of the first wrong result; null where all are right.
char const* firstFault() {
    Value const null = std::shared_ptr<Path const>();
    if (!Path(null).elements.empty()) return "the path of a value without one";
    if (!Path(Value::defaultValue(Type::Path)).elements.empty()) return "the default path";
    if (!Path::EmptyPath()->elements.empty()) return "the empty path";
    if (double(indexLoopCasting({}, TypeInfo(), 3)) != 0.0) return "the element of an empty loop";
    if (!nullLoop().empty()) return "the null loop";
    if (keyboardTypes().at(3) != "URL") return "the keyboards";
    if (to_string(Value(-0.001)) != "0") return "the text of a number";
    if (!Patch().children->empty() || !Patch().inputs->empty()) return "the lists of a patch";
    if (null.visit([](auto const& held) { return sizeof held; }) != sizeof(Path)) return "a visit";
    return nullptr;
}

struct AtExit {
    ~AtExit() {
        if (char const* fault = firstFault()) {
            std::printf("wrong at exit: %s\n", fault);
            std::fflush(stdout);
            std::_Exit(1);
        }
        std::puts("the same at exit");
    }
};

}  // namespace

int main() {
    static AtExit const atExit;
    char const* const fault = firstFault();
    if (fault != nullptr) std::printf("wrong: %s\n", fault);
    return fault == nullptr ? 0 : 1;
}
