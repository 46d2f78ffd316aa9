#pragma once

#include "providers/embedded/bind/Types.h"

// Which type comes out where values of several meet: the dialect's precedence, and SQL Server's rules for the digits of
// decimals.
namespace QVSa::embedded {

// varchar or nvarchar, as long as either can be without being a long one, or a long one.
Type textType(Base base, bool isLong);

// The type that two types meet in.
Type commonType(const Type& a, const Type& b);

// The digits of a whole type, as a decimal.
Type asDecimalType(const Type& type);

// What `a op b` of two numbers of one kind is: + - * / %. Whole numbers are int at least.
Type arithmeticType(char op, const Type& a, const Type& b);

}  // namespace QVSa::embedded
