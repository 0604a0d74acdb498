#include <panekit/WTimer.h>

#include <utility>
#include <vector>

#include <Ecore.h>

namespace panekit {

struct WTimer::Impl : std::enable_shared_from_this<WTimer::Impl> {
    Callback callback;
    void* userData = nullptr;
    Ecore_Timer* timer = nullptr;
    Ecore_Job* job = nullptr;
    Ecore_Idler* idler = nullptr;

    static std::vector<std::shared_ptr<WTimer>>& alive();
    static Eina_Bool tick(void* data);
    static void runJob(void* data);
    void end();
    void forget();
};

// The only strong pointers: whatever leaves this list has expired for every holder of a weak one.
std::vector<std::shared_ptr<WTimer>>& WTimer::Impl::alive()
{
    static std::vector<std::shared_ptr<WTimer>> timers;
    return timers;
}

void WTimer::Impl::forget()
{
    std::erase_if(alive(), [this](const auto& each) { return each->_impl.get() == this; });
}

void WTimer::Impl::end()
{
    if (Ecore_Timer* old = std::exchange(timer, nullptr); old)
        ecore_timer_del(old);
    if (Ecore_Job* old = std::exchange(job, nullptr); old)
        ecore_job_del(old);
    if (Ecore_Idler* old = std::exchange(idler, nullptr); old)
        ecore_idler_del(old);
    forget();
}

Eina_Bool WTimer::Impl::tick(void* data)
{
    const auto self = static_cast<Impl*>(data)->shared_from_this();
    const bool again = self->callback(self->userData);
    const bool ended = !self->timer && !self->idler;
    if (again && !ended)
        return ECORE_CALLBACK_RENEW;
    self->timer = nullptr;
    self->idler = nullptr;
    self->forget();
    return ECORE_CALLBACK_CANCEL;
}

void WTimer::Impl::runJob(void* data)
{
    const auto self = static_cast<Impl*>(data)->shared_from_this();
    self->job = nullptr;
    self->forget();
    self->callback(self->userData);
}

WTimer::WTimer(std::shared_ptr<Impl> impl)
    : _impl(std::move(impl))
{
}

WTimer::~WTimer() = default;

void* WTimer::handle() const { return _impl->timer; }

WTimer::Weak WTimer::_adopt(const std::shared_ptr<Impl>& impl)
{
    if (!impl->timer && !impl->job && !impl->idler)
        return {};
    std::shared_ptr<WTimer> timer(new WTimer(impl));
    Impl::alive().push_back(timer);
    return timer;
}

WTimer::Weak WTimer::addTimer(double interval, Callback callback, void* userData)
{
    auto impl = std::make_shared<Impl>();
    impl->callback = std::move(callback);
    impl->userData = userData;
    impl->timer = ecore_timer_add(interval, Impl::tick, impl.get());
    return _adopt(impl);
}

WTimer::Weak WTimer::addJob(std::function<void(void*)> callback, void* userData)
{
    auto impl = std::make_shared<Impl>();
    impl->callback = [callback = std::move(callback)](void* data) { return callback(data), false; };
    impl->userData = userData;
    impl->job = ecore_job_add(Impl::runJob, impl.get());
    return _adopt(impl);
}

WTimer::Weak WTimer::addIdler(Callback callback, void* userData)
{
    auto impl = std::make_shared<Impl>();
    impl->callback = std::move(callback);
    impl->userData = userData;
    impl->idler = ecore_idler_add(Impl::tick, impl.get());
    return _adopt(impl);
}

void WTimer::destroy(const Weak& timer)
{
    if (const auto alive = timer.lock())
        alive->_impl->end();
}

}

void* wuitimer_get_timer_handle(const panekit::WTimer::Weak& timer)
{
    const auto alive = timer.lock();
    return alive ? alive->handle() : nullptr;
}
