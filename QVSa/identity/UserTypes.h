#pragma once

#include "QVSa/values/Values.h"

namespace QVSa {

// What an account is checked against. `Genaral` and `autoReg` (made by self-registration): the stored password;
// `adUser`: a Windows domain; `ldapUser`: the directory of the settings.
enum userTypes : Integer { Genaral = 0, adUser = 1, autoReg = 2, ldapUser = 3 };

// Of a new application, accountWaiting; a refused one is accountRefused. The limit of failed sign-ons sets
// accountLocked.
enum AccountState : Integer { accountNormal = 0, accountLocked = 1, accountWaiting = 2, accountRefused = 3 };

}  // namespace QVSa
