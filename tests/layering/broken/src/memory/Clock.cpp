// Breaks: a platform header in the plug-in.
#include <sys/time.h>

#include <ctime>
