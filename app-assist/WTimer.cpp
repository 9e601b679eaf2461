#include "app-assist/WTimer.h"

#include <new>

#include "app-assist/WDeletionHook.h"
#include "common/CLyLog.h"

namespace app_assist {

struct WTimerImpl {
  void* _handle = nullptr;
  WTimer::Type _type = WTimer::TIMER;
  void* _data = nullptr;
  // The only strong reference; weak pointers expire when it is released
  // (and any callback in progress has returned).
  std::shared_ptr<WTimer> _self;
  Evas_Object* _owner = nullptr;
  WTimer::RepeatFunc _repeat;
  WTimer::JobFunc _job;
};

WTimer::WTimer() : _pv(new WTimerImpl) {}

WTimer::~WTimer() {
  delete _pv;
}

WTimerWeakPtr WTimer::__add(Type type, double seconds, RepeatFunc repeat, JobFunc job, void* data,
                            Evas_Object* ownerObj) {
  auto* timer = new (std::nothrow) WTimer();
  if (!timer) {
    LYLOG_E("Out of memory");
    return {};
  }
  timer->_pv->_type = type;
  timer->_pv->_data = data;
  timer->_pv->_repeat = std::move(repeat);
  timer->_pv->_job = std::move(job);
  timer->_pv->_self = std::shared_ptr<WTimer>(timer, [](WTimer* t) { delete t; });
  switch (type) {
    case IDLER:
      timer->_pv->_handle = ecore_idler_add(__onRepeat, timer);
      if (!timer->_pv->_handle) LYLOG_E("failed to add ecore idler!");
      break;
    case ANIMATOR:
      timer->_pv->_handle = ecore_animator_add(__onRepeat, timer);
      if (!timer->_pv->_handle) LYLOG_E("failed to add ecore animator!");
      break;
    case TIMER:
      timer->_pv->_handle = ecore_timer_add(seconds, __onRepeat, timer);
      if (!timer->_pv->_handle) LYLOG_E("failed to add ecore timer!");
      break;
    case JOB:
      timer->_pv->_handle = ecore_job_add(__onJob, timer);
      if (!timer->_pv->_handle) LYLOG_E("failed to add ecore job!");
      break;
  }
  WTimerWeakPtr weak = timer->_pv->_self;
  if (!timer->_pv->_handle) {
    timer->_destroy();
    return {};
  }
  if (ownerObj) {
    timer->_pv->_owner = ownerObj;
    wevasobject_add_deletion_hook(ownerObj, __onOwnerDel, timer);
  }
  return weak;
}

#define WTIMER_CHECK_OWNER(owner)                         \
  do {                                                    \
    WASSERT_MSG((owner) != nullptr, "ownerObj is null."); \
  } while (0)

WTimerWeakPtr WTimer::addTimer(double seconds, RepeatFunc fn, void* data) {
  return __add(TIMER, seconds, std::move(fn), nullptr, data, nullptr);
}
WTimerWeakPtr WTimer::addTimer(double seconds, RepeatFunc fn, void* data, Evas_Object* ownerObj) {
  WTIMER_CHECK_OWNER(ownerObj);
  return __add(TIMER, seconds, std::move(fn), nullptr, data, ownerObj);
}
WTimerWeakPtr WTimer::addAnimator(RepeatFunc fn, void* data) {
  return __add(ANIMATOR, 0, std::move(fn), nullptr, data, nullptr);
}
WTimerWeakPtr WTimer::addAnimator(RepeatFunc fn, void* data, Evas_Object* ownerObj) {
  WTIMER_CHECK_OWNER(ownerObj);
  return __add(ANIMATOR, 0, std::move(fn), nullptr, data, ownerObj);
}
WTimerWeakPtr WTimer::addIdler(RepeatFunc fn, void* data) {
  return __add(IDLER, 0, std::move(fn), nullptr, data, nullptr);
}
WTimerWeakPtr WTimer::addIdler(RepeatFunc fn, void* data, Evas_Object* ownerObj) {
  WTIMER_CHECK_OWNER(ownerObj);
  return __add(IDLER, 0, std::move(fn), nullptr, data, ownerObj);
}
WTimerWeakPtr WTimer::addJob(JobFunc fn, void* data) {
  return __add(JOB, 0, nullptr, std::move(fn), data, nullptr);
}
WTimerWeakPtr WTimer::addJob(JobFunc fn, void* data, Evas_Object* ownerObj) {
  WTIMER_CHECK_OWNER(ownerObj);
  return __add(JOB, 0, nullptr, std::move(fn), data, ownerObj);
}

Eina_Bool WTimer::__onRepeat(void* data) {
  auto* timer = static_cast<WTimer*>(data);
  // Keeps the timer (and the callback being run) alive even if the
  // callback deletes the owner; the timer then dies when this returns.
  std::shared_ptr<WTimer> hold = timer->_pv->_self;
  if (!hold) return ECORE_CALLBACK_CANCEL;
  bool again = timer->_pv->_repeat ? timer->_pv->_repeat(timer->_pv->_data) : false;
  if (!timer->_pv->_self) return ECORE_CALLBACK_CANCEL;
  if (again) return ECORE_CALLBACK_RENEW;
  // Ecore removes the callback itself on cancel.
  timer->_pv->_handle = nullptr;
  timer->_destroy();
  return ECORE_CALLBACK_CANCEL;
}

void WTimer::__onJob(void* data) {
  auto* timer = static_cast<WTimer*>(data);
  std::shared_ptr<WTimer> hold = timer->_pv->_self;
  if (!hold) return;
  // The job is spent once it runs: nothing is left to delete.
  timer->_pv->_handle = nullptr;
  if (timer->_pv->_job) timer->_pv->_job(timer->_pv->_data);
  if (timer->_pv->_self) timer->_destroy();
}

void WTimer::__onOwnerDel(void* data, Evas_Object*) {
  auto* timer = static_cast<WTimer*>(data);
  // The owner is going: nothing to unregister from it.
  timer->_pv->_owner = nullptr;
  timer->_destroy();
}

void WTimer::_destroy() {
  if (_pv->_owner) {
    wevasobject_remove_deletion_hook(_pv->_owner, __onOwnerDel, this);
    _pv->_owner = nullptr;
  }
  if (void* handle = _pv->_handle) {
    _pv->_handle = nullptr;
    switch (_pv->_type) {
      case IDLER:
        ecore_idler_del(static_cast<Ecore_Idler*>(handle));
        break;
      case ANIMATOR:
        ecore_animator_del(static_cast<Ecore_Animator*>(handle));
        break;
      case TIMER:
        ecore_timer_del(static_cast<Ecore_Timer*>(handle));
        break;
      case JOB:
        ecore_job_del(static_cast<Ecore_Job*>(handle));
        break;
    }
  }
  // May delete this object: nothing may follow.
  std::shared_ptr<WTimer> self = std::move(_pv->_self);
}

void* WTimer::_handleOf(Type type, const char* name) const {
  if (_pv->_type != type) {
    LYLOG_E("This is not %s type timer!", name);
    return nullptr;
  }
  return _pv->_handle;
}

Ecore_Idler* WTimer::getIdlerHandle(const WTimerWeakPtr& timer) {
  auto locked = timer.lock();
  return locked ? static_cast<Ecore_Idler*>(locked->_handleOf(IDLER, "Idler")) : nullptr;
}
Ecore_Animator* WTimer::getAnimatorHandle(const WTimerWeakPtr& timer) {
  auto locked = timer.lock();
  return locked ? static_cast<Ecore_Animator*>(locked->_handleOf(ANIMATOR, "Animator")) : nullptr;
}
Ecore_Timer* WTimer::getTimerHandle(const WTimerWeakPtr& timer) {
  auto locked = timer.lock();
  return locked ? static_cast<Ecore_Timer*>(locked->_handleOf(TIMER, "Timer")) : nullptr;
}
Ecore_Job* WTimer::getJobHandle(const WTimerWeakPtr& timer) {
  auto locked = timer.lock();
  return locked ? static_cast<Ecore_Job*>(locked->_handleOf(JOB, "Job")) : nullptr;
}

void WTimer::cancel(const WTimerWeakPtr& timer) {
  auto locked = timer.lock();
  if (locked && locked->_pv->_self) locked->_destroy();
}

}  // namespace app_assist
