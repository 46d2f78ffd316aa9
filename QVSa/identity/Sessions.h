#pragma once

#include "QVSa/frame/Frame.h"
#include "QVSa/frame/KeyedCollection.h"
#include "QVSa/identity/Session.h"

namespace QVSa {

// The sessions that are signed on, in the order of the server, by position from 1 or by session id.
//   Sessions sessions;  sessions.connect(server, "QVApp");  sessions.Terminate(id);
// The list is that of the last GetAll; it always comes from QVSys, whatever database `connect` named.
class QVSA_EXPORT Sessions : private Frame {
 public:
  using Frame::errDescription;
  using Frame::errNumber;

  // Keeps both names and reads the list. True also where the list could not be read: errNumber then tells, and the
  // list is empty. `DBName` is the application database whose numbers Terminate gives back; there it goes into
  // a statement as it is.
  Boolean connect(const String& server, const String& DBName = "");

  // Throws 6 for more than 32,767.
  Integer Count() const;
  // Throws 9 for a position out of range, 5 for an unknown id.
  std::shared_ptr<Session> Item(const Variant& Index) const { return items_.at(Index); }
  // Takes the item out of the list only; throws as Item does. Gives nothing.
  Variant Remove(const Variant& Index);
  auto begin() const { return items_.begin(); }
  auto end() const { return items_.end(); }

  // Reads the list anew. False on failure, with what was read up to there.
  Variant GetAll();
  // Ends a session and frees the numbers that it still holds in `DBName`; an unknown id is no failure. The list stays
  // as it is. Not one transaction: where the numbers can't be freed, which is always so without a `DBName`, the session
  // is gone all the same and the result False.
  Boolean Terminate(const String& SessionId);
  // Marks activity of session `Id` on `server`; needs no connect. False without a report: the session is gone, sign on
  // again. `uid`, `computerName` and `app` play no part.
  Boolean newAction(const String& Id, const String& server, Long& uid, const String& computerName, Integer app);

 private:
  friend class User;

  // Starts a session and gives its id, the empty text on failure. An empty computer name means this machine.
  String newSession(const String& userLogin, const String& computerName, const String& DBName, const String& ip);
  // Ends every session, or every one but `id`.
  Boolean clearSessions(const String& id);

  KeyedCollection<Session> items_;
};

}  // namespace QVSa
