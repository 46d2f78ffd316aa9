#pragma once

#include "QVSa/numbering/IdMgr.h"

namespace QVSa {

// Saves of numbering rules after which no number comes twice: IdMgr::Save takes a new date part in the middle of a
// period, whose counter is then read and no longer moved, and widens the numbers once more with a second save.
//   RuleKeeping keeping;  keeping.connect(server, "QVApp");
//   rule.DateFormat(yymm);  if (!keeping.save(rule)) complain(keeping.errDescription());
class QVSA_EXPORT RuleKeeping : private Frame {
 public:
  using Frame::connect;
  using Frame::errDescription;
  using Frame::errNumber;

  // Saves `rule`, new or loaded by its GetOne, and loads it again. 5 where the date part changes while the present
  // period, of the old date part or of the new one, has numbers and `withNumbers` is not given; else as IdMgr::Save.
  Boolean save(IdMgr& rule, Boolean withNumbers = false);

 private:
  Boolean changesCounter(const IdMgr& rule);
};

}  // namespace QVSa
