/* precompiled.h: what nearly every unit test includes, read once for all of them. A test includes what it uses all the
 * same: where the compiler is run through a cache, nothing is precompiled. */

#pragma once

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <filesystem>
#include <fstream>
#include <map>
#include <sstream>
#include <string>
#include <string_view>
#include <vector>
