#pragma once

#include <Ecore.h>
#include <Evas.h>

#include <functional>
#include <memory>

namespace app_assist {

class WTimer;
struct WTimerImpl;

// The only handle callers keep: it expires when the timer is gone.
using WTimerWeakPtr = std::weak_ptr<WTimer>;

// One main-loop callback (timer, animator, idler or job) that owns itself
// and, with an owner object, dies with that object: a deleted screen never
// gets a late callback. A repeating callback keeps running while it returns
// true; a job runs once.
class WTimer {
 public:
  using RepeatFunc = std::function<bool(void* data)>;
  using JobFunc = std::function<void(void* data)>;

  static WTimerWeakPtr addTimer(double seconds, RepeatFunc fn, void* data);
  static WTimerWeakPtr addTimer(double seconds, RepeatFunc fn, void* data, Evas_Object* ownerObj);
  static WTimerWeakPtr addAnimator(RepeatFunc fn, void* data);
  static WTimerWeakPtr addAnimator(RepeatFunc fn, void* data, Evas_Object* ownerObj);
  static WTimerWeakPtr addIdler(RepeatFunc fn, void* data);
  static WTimerWeakPtr addIdler(RepeatFunc fn, void* data, Evas_Object* ownerObj);
  static WTimerWeakPtr addJob(JobFunc fn, void* data);
  static WTimerWeakPtr addJob(JobFunc fn, void* data, Evas_Object* ownerObj);

  // The Ecore handle, or null when expired or of another type.
  static Ecore_Idler* getIdlerHandle(const WTimerWeakPtr& timer);
  static Ecore_Animator* getAnimatorHandle(const WTimerWeakPtr& timer);
  static Ecore_Timer* getTimerHandle(const WTimerWeakPtr& timer);
  static Ecore_Job* getJobHandle(const WTimerWeakPtr& timer);

  // Stops the callback now; nothing happens for an expired pointer.
  static void cancel(const WTimerWeakPtr& timer);

  enum Type { IDLER = 0, ANIMATOR = 1, TIMER = 2, JOB = 3 };

 private:
  WTimer();
  ~WTimer();
  static WTimerWeakPtr __add(Type type, double seconds, RepeatFunc repeat, JobFunc job, void* data,
                             Evas_Object* ownerObj);
  static Eina_Bool __onRepeat(void* data);
  static void __onJob(void* data);
  static void __onOwnerDel(void* data, Evas_Object* obj);
  void _destroy();
  void* _handleOf(Type type, const char* name) const;

  WTimerImpl* _pv;
};

}  // namespace app_assist
