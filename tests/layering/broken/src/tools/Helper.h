#pragma once

// Breaks: a folder that belongs to no layer.
#include <vector>
