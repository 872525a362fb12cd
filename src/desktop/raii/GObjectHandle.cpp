#include "desktop/raii/GObjectHandle.h"

#include <glib-object.h>

namespace nimbo {

void GObjectDeleter::operator()(void* object) const { g_object_unref(object); }

}  // namespace nimbo
