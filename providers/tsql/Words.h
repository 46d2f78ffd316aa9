#pragma once

#include <string_view>

#include "QVSa/values/Values.h"

// Words of the dialect: names and keywords, told apart without regard to the case of Latin letters.
namespace QVSa::tsql {

bool isReserved(std::string_view word);
bool sameWord(std::string_view a, std::string_view b);
String lowered(std::string_view word);

}  // namespace QVSa::tsql
