#include "QVSa/identity/DomainAuthentication.h"

#include <utility>

namespace QVSa {
namespace {

DomainAuthentication& current() {
  static DomainAuthentication packages;
  return packages;
}

}  // namespace

const DomainAuthentication& domainAuthentication() { return current(); }

DomainAuthentication replaceDomainAuthentication(DomainAuthentication packages) {
  return std::exchange(current(), std::move(packages));
}

}  // namespace QVSa
