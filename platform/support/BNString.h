#pragma once
// Text of the core library: UTF-8 held in a std::string.
#include <string>

using BNString = std::string;
