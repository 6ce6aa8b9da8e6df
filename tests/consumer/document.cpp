// A program outside this repository that reads and writes a document.

#include <Engine/Document/document.h>

#include <iostream>

using namespace tarn::engine;

int main() {
    DocumentError error;
    Optional<Patch> const root = readDocument(R"({"root": {"id": 3, "name": "shown"}})", &error);
    if (!root) {
        std::cerr << error << "\n";
        return 1;
    }
    std::cout << writeDocument(*root);
}
