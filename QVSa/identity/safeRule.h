#pragma once

#include "QVSa/frame/Frame.h"

namespace QVSa {

// The policy for passwords and lock-outs, one row for the whole system.
//   safeRule rule;  rule.connect(server);  if (!rule.checkPwd("abc")) show(rule.errDescription());
// The row is read by GetOne, or by the first checkPwd, and not again by the same object.
class QVSA_EXPORT safeRule : private Frame {
 public:
  using Frame::connect;
  using Frame::errDescription;
  using Frame::errNumber;

  // Least length of a password in characters; below 1 there is none.
  Integer minLen() const { return minLen_; }
  void minLen(Integer value) { minLen_ = value; }
  // Days that a password stays valid from its last save; 0 or less: for ever.
  Integer maxDay() const { return maxDay_; }
  void maxDay(Integer value) { maxDay_ = value; }
  // What a password must hold: capital and small letters; letters and digits; a character that is neither.
  Boolean caseMixed() const { return caseMixed_; }
  void caseMixed(Boolean value) { caseMixed_ = value; }
  Boolean numCharMixed() const { return numCharMixed_; }
  void numCharMixed(Boolean value) { numCharMixed_ = value; }
  Boolean hasSpecialChar() const { return hasSpecialChar_; }
  void hasSpecialChar(Boolean value) { hasSpecialChar_ = value; }
  // How many earlier passwords may not come again; 0: any may. A negative one makes the save of a user fail.
  Integer cycle() const { return cycle_; }
  void cycle(Integer value) { cycle_ = value; }
  // Whether failed sign-ons lock an account, and how many in a row.
  Boolean lockErr() const { return lockErr_; }
  void lockErr(Boolean value) { lockErr_ = value; }
  Integer errTimes() const { return errTimes_; }
  void errTimes(Integer value) { errTimes_ = value; }
  // Kept for the hosts and their services; nothing in this library acts on them.
  Boolean lockExp() const { return lockExp_; }
  void lockExp(Boolean value) { lockExp_ = value; }
  Boolean awakeAuto() const { return awakeAuto_; }
  void awakeAuto(Boolean value) { awakeAuto_ = value; }
  Integer sleepMinutes() const { return sleepMinutes_; }
  void sleepMinutes(Integer value) { sleepMinutes_ = value; }
  Boolean awakeManual() const { return awakeManual_; }
  void awakeManual(Boolean value) { awakeManual_ = value; }

  // Loads the row. Where there is none, every property is 0 or False, and the result is True; a failure changes none.
  Boolean GetOne();
  // Writes the row. With lockErr False it also unlocks every account that was locked; the counters of failed sign-ons
  // stay, and count once lockErr is True again.
  Boolean Save();
  // Whether `s` may be a password. Otherwise errNumber is againstPolicy (0x80040BB8) and errDescription holds what is
  // missing, one sentence directly behind the other; it is empty after a success. Where the policy can't be read, the
  // properties judge as they stand: those of a fresh object let every text pass.
  Boolean checkPwd(const String& s);

 private:
  void clear();
  void read(Recordset& row);
  String charSet() const;
  String missingCharacters(const String& s) const;

  Integer minLen_ = 0;
  Integer maxDay_ = 0;
  Boolean caseMixed_ = false;
  Boolean numCharMixed_ = false;
  Boolean hasSpecialChar_ = false;
  Integer cycle_ = 0;
  Boolean lockExp_ = false;
  Boolean lockErr_ = false;
  Integer errTimes_ = 0;
  Boolean awakeAuto_ = false;
  Integer sleepMinutes_ = 0;
  Boolean awakeManual_ = false;
  Boolean loaded_ = false;
};

}  // namespace QVSa
