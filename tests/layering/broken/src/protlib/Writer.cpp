// Breaks: a name that resolves to no file.
#include "Missing.h"
