#pragma once

#include "QVSa/frame/Frame.h"
#include "QVSa/frame/KeyedCollection.h"
#include "QVSa/numbering/IdMgr.h"

namespace QVSa {

// The numbering rules that an administrator may see, those of the system left out; in the order of the server.
class QVSA_EXPORT IdMgrs : private Frame {
 public:
  using Frame::connect;
  using Frame::errDescription;
  using Frame::errNumber;

  // The whole connection string that GetAll opens.
  String gsDBConnString() const { return connectionString(); }
  void gsDBConnString(const String& value) { setConnectionString(value); }

  // Reads the rules. To save one of them, load it anew by its GetOne: Save on an item itself would insert.
  // False on failure, with what was read up to there.
  Boolean GetAll();
  // By position from 1; no object for a position that is not there.
  std::shared_ptr<IdMgr> Item(const Variant& vntIndexKey) const;
  Long Count() const { return static_cast<Long>(items_.size()); }
  auto begin() const { return items_.begin(); }
  auto end() const { return items_.end(); }

 private:
  KeyedCollection<IdMgr> items_;
};

}  // namespace QVSa
