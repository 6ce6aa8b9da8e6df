#include "rings.h"

using namespace tarn::engine;

Path ring(double inner, double outer) {
    return PathBuilder().circle({0, 0}, outer).circle({0, 0}, inner).build();
}
