#include <atomic>
#include <tuple>
#include <type_traits>

#include "record/CallText.h"
#include "record/Library.h"
#include "record/Recorder.h"
#include "trace/CallTable.h"

// The library's calls under their own names: a host finds these first.

namespace android {

namespace {

using record::Recorder;
using record::Stint;

/** What an operation is declared as. */
template <typename Operation>
struct Declaration;
template <typename R, typename C, typename... P>
struct Declaration<R (C::*)(P...)> {
    using Result = R;
    using Parameters = std::tuple<P...>;
};
template <typename R>
struct Declaration<R (*)()> {
    using Result = R;
};
template <auto Operation>
using ResultOf = typename Declaration<decltype(Operation)>::Result;
template <auto Operation, size_t I>
using ParameterOf = std::tuple_element_t<I, typename Declaration<decltype(Operation)>::Parameters>;

template <auto Operation, auto... Operations>
constexpr bool isOneOf() {
    return (std::is_same_v<std::integral_constant<decltype(Operation), Operation>,
                           std::integral_constant<decltype(Operations), Operations>> ||
            ...);
}

template <auto Operation>
constexpr Recorder::Reads readsOf() {
    if (isOneOf<Operation, &RgbShotManager::isTestMode>()) return Recorder::Reads::kTestMode;
    return isOneOf<Operation, &FlowingDataException::notifyBootCompleted,
                   &SDCImpl::sendBootShutdownRebootState>()
                   ? Recorder::Reads::kAll
                   : Recorder::Reads::kNothing;
}

constexpr int kProximity = 8;  // sensor type

/** What the recorder takes from a call beside its line: who holds the proximity sensor. */
template <typename... Parameters>
void watch(Recorder*, const Parameters&...) {}
void watch(Recorder* recorder, bool enabled, int type, const std::string& pkg,
           const std::string& opPkg, long long) {
    if (type == kProximity) recorder->noteProximity(enabled, pkg + '/' + opPkg);
}
void watch(Recorder* recorder, const String8& pkg, const String8& opPkg, int type) {
    if (type != kProximity) return;
    recorder->noteProximity(false, std::string(pkg.c_str()) + '/' + opPkg.c_str());
}

/** A stint, up to its end. */
class Lasting {
public:
    Lasting(Recorder* recorder, Stint* stint) : mRecorder(recorder), mStint(stint), mScope(stint) {}
    ~Lasting() { mRecorder->end(mStint); }
    Lasting(const Lasting&) = delete;
    Lasting& operator=(const Lasting&) = delete;

private:
    Recorder* const mRecorder;
    Stint* const mStint;
    const Stint::Scope mScope;
};

/** Writes a call from outside; hands on every call. */
template <auto Operation, typename Class, typename... Parameters>
ResultOf<Operation> call(const char* name, Class* object, const Parameters&... parameters) {
    const auto next = record::real<Operation>();
    if constexpr (isOneOf<Operation, &SDCImpl::process>()) {
        if (!Recorder::wantsEvents()) return next(object, parameters...);
    }
    if (Stint* outer = Stint::current()) {
        outer->onCall();
        return next(object, parameters...);
    }
    Recorder* const recorder = Recorder::getForCall();
    if (recorder == nullptr) return next(object, parameters...);
    record::PlainStint stint;
    recorder->beginCall(&stint, {record::callBody(name, parameters...), readsOf<Operation>()});
    watch(recorder, parameters...);
    const Lasting lasting(recorder, &stint);
    return next(object, parameters...);
}

/**
 * A sample of the screen. Its line is written late, when the library counts the sample: only then
 * are the colours known.
 */
class Sample final : public Stint {
public:
    Sample(Recorder* recorder, const char* name, const int* rgb, const int* rect)
          : mRecorder(recorder),
            mName(name),
            mRgb(rgb),
            mRect(rect) {}

    void onCall() override { begin(true); }

    void begin(bool succeeds) {
        if (mHasBegun) return;
        mHasBegun = true;
        mRecorder->beginCall(this, {record::callBody(mName, mRect), Recorder::Reads::kNothing, true,
                                    succeeds ? mRgb : nullptr, mRect});
    }

private:
    Recorder* const mRecorder;
    const char* const mName;
    const int* const mRgb;
    const int* const mRect;
    bool mHasBegun = false;
};

template <auto Operation, typename Class>
int call(const char* name, Class* object, int* const& rgbOut, int* const& rect) {
    const auto next = record::real<Operation>();
    Recorder* const recorder = Stint::current() == nullptr ? Recorder::getForCall() : nullptr;
    if (recorder == nullptr) return next(object, rgbOut, rect);
    Sample sample(recorder, name, rgbOut, rect);
    const Lasting lasting(recorder, &sample);
    const int status = next(object, rgbOut, rect);
    sample.begin(status != 0);
    return status;
}

/** Writes the calls up to the one that has created the singleton. */
template <auto Get>
ResultOf<Get> create(const char* name) {
    const auto next = record::real<Get>();
    static std::atomic<bool> isThere{false};
    if (isThere.load(std::memory_order_relaxed)) return next();
    Recorder* const recorder = Recorder::get();
    if (recorder == nullptr) return next();
    const auto take = [&] {
        const auto instance = next();
        if (!isThere.exchange(true)) recorder->noteSingleton(name);
        return instance;
    };
    if (Stint* outer = Stint::current()) {
        outer->onCall();
        return take();
    }
    record::PlainStint stint;
    recorder->beginCall(&stint, {record::callBody(name), Recorder::Reads::kAll});
    const Lasting lasting(recorder, &stint);
    return take();
}

}  // namespace

#define PARAMETER(Class, operation, i) ParameterOf<&Class::operation, i>
#define CALL_0(Class, operation)                                     \
    ResultOf<&Class::operation> Class::operation() {                 \
        return call<&Class::operation>(#Class "." #operation, this); \
    }
#define CALL_1(Class, operation)                                                     \
    ResultOf<&Class::operation> Class::operation(PARAMETER(Class, operation, 0) a) { \
        return call<&Class::operation>(#Class "." #operation, this, a);              \
    }
#define CALL_2(Class, operation)                                                     \
    ResultOf<&Class::operation> Class::operation(PARAMETER(Class, operation, 0) a,   \
                                                 PARAMETER(Class, operation, 1) b) { \
        return call<&Class::operation>(#Class "." #operation, this, a, b);           \
    }
#define CALL_3(Class, operation)                                                     \
    ResultOf<&Class::operation> Class::operation(PARAMETER(Class, operation, 0) a,   \
                                                 PARAMETER(Class, operation, 1) b,   \
                                                 PARAMETER(Class, operation, 2) c) { \
        return call<&Class::operation>(#Class "." #operation, this, a, b, c);        \
    }
#define CALL_5(Class, operation)                                                    \
    ResultOf<&Class::operation> Class::operation(                                   \
            PARAMETER(Class, operation, 0) a, PARAMETER(Class, operation, 1) b,     \
            PARAMETER(Class, operation, 2) c, PARAMETER(Class, operation, 3) d,     \
            PARAMETER(Class, operation, 4) e) {                                     \
        return call<&Class::operation>(#Class "." #operation, this, a, b, c, d, e); \
    }

#define SINGLETON(Class)                                           \
    Class* Class::getInstance() {                                  \
        return create<&Class::getInstance>(#Class ".getInstance"); \
    }
#define CALL(Class, operation, parameters) CALL_##parameters(Class, operation)
#define VARIABLE(name)
#include "trace/calls.inc"
#undef CALL
#undef VARIABLE

}  // namespace android
