#ifndef RINGS_H
#define RINGS_H

#include <Engine/Base/path.h>

tarn::engine::Path ring(double inner, double outer);

#endif
