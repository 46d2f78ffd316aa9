#pragma once

#include "QVSa/values/Values.h"

namespace QVSa {

// What an account is checked against. `Genaral` and `autoReg` (made by self-registration): the stored password;
// `adUser`: a Windows domain; `ldapUser`: the directory of the settings.
enum userTypes : Integer { Genaral = 0, adUser = 1, autoReg = 2, ldapUser = 3 };

}  // namespace QVSa
