/// \file
#pragma once

#include <Tizen/Base/Object.h>
#include <Tizen/Base/Runtime/IEventArg.h>

namespace Zelkora::Media {

/// What happened to the session.
enum _AudioSessionEventType : int {
  SESSION_EVENT_INTERRUPT_STARTED = 1,
  SESSION_EVENT_INTERRUPT_FINISHED = 2,
  SESSION_EVENT_DISRUPTED = 3,
};

class _AudioSessionEventTypeArg : public Tizen::Base::Runtime::IEventArg,
                                  public Tizen::Base::Object {
 public:
  void SetEventType(int type) { __eventType = type; }
  int GetEventType() const { return __eventType; }

 private:
  int __eventType = 0;
};

/// The one that is fired. A session's events carry nothing but their type.
class _AudioSessionEventArg : public _AudioSessionEventTypeArg {};

}  // namespace Zelkora::Media
