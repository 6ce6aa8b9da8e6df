#include <Engine/Base/fwd.h>
