#include "protlib/Text.h"

// Breaks: a relative path does not hide an upward include.
#include "../factory/Module.h"
