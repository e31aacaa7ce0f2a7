/// \file
#pragma once

#include <Tizen/Base/Runtime/Event.h>

namespace Zelkora::Media {

/// Tells the session's interruptions to the listener.
class _AudioSessionEvent : public Tizen::Base::Runtime::_Event {
 public:
  result Construct();

 protected:
  void FireToListener(Tizen::Base::Runtime::IEventListener& listener,
                      const Tizen::Base::Runtime::IEventArg& arg) override;
};

}  // namespace Zelkora::Media
