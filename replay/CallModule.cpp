#include <algorithm>
#include <type_traits>
#include <utility>

#include "base/Json.h"
#include "rgb/RgbShot.h"
#include "trace/CallTable.h"

namespace replay {

using trace::Argument;
using trace::ArgumentFor;
using trace::ArgumentsOf;
using trace::CallModule;
using trace::Rectangle;

namespace {

// The counters have no accessors. Only an explicit instantiation may name a private member: each
// makes `expose` of its tag return the member.

template <auto Member, typename Tag>
struct Exposed {
    friend constexpr auto expose(Tag) { return Member; }
};

#define EXPOSE(Tag, Class, member)         \
    struct Tag {                           \
        friend constexpr auto expose(Tag); \
    };                                     \
    template struct Exposed<&android::Class::member, Tag>;

EXPOSE(BudgetOwner, RgbShotManager, mRgbShot)
EXPOSE(Budget, RgbShotManager, mShotBudget)
EXPOSE(CountOwner, RgbShot, mRgbShot)
EXPOSE(Count, RgbShot, mRgbShotCount)
EXPOSE(DetectionOwner, FlowingDataException, mFlowingDataException)
EXPOSE(Detections, FlowingDataException, mDetectCount)
#undef EXPOSE

/** Turns what the trace gives into what the operation takes. */
template <typename Parameter, typename Given>
decltype(auto) convert(const Given& given) {
    using Type = std::decay_t<Parameter>;
    if constexpr (std::is_same_v<Type, android::String8>) {
        return android::String8(given.c_str());
    } else if constexpr (std::is_same_v<Type, android::Vector<int>>) {
        android::Vector<int> list;
        list.setCapacity(given.size());  // so that a sanitizer sees a read behind it
        list.appendArray(given.data(), given.size());
        return list;
    } else {
        return static_cast<const Given&>(given);
    }
}

template <typename Class, typename Result, typename... Parameters, size_t... I>
std::optional<std::string> call(Result (Class::*operation)(Parameters...),
                                [[maybe_unused]] const std::vector<Argument>& arguments,
                                std::index_sequence<I...>) {
    Class* object = Class::getInstance();
    auto invoke = [&] {
        return (object->*operation)(convert<Parameters>(
                std::get<typename ArgumentFor<std::decay_t<Parameters>>::type>(arguments[I]))...);
    };
    if constexpr (std::is_void_v<Result>) {
        invoke();
        return std::nullopt;
    } else if constexpr (std::is_same_v<Result, bool>) {
        return invoke() ? "true" : "false";
    } else {
        return std::to_string(invoke());
    }
}

/** A sample: the averages come back through the caller's memory. */
template <typename Class>
std::optional<std::string> call(int (Class::*operation)(int*, int*),
                                const std::vector<Argument>& arguments, std::index_sequence<0>) {
    auto rect = std::get<Rectangle>(arguments[0]);
    int rgb[3] = {};
    const int status = (Class::getInstance()->*operation)(rgb, rect.data());
    std::string result;
    base::JsonWriter json(&result);
    json.beginObject().member("status", status);
    if (status != 0) {
        json.key("rgb").beginArray();
        for (const int average : rgb) json.value(average);
        json.endArray();
    }
    json.endObject();
    return result;
}

/** `Operation` is a member of a singleton, or `getInstance` itself. */
template <auto Operation>
std::optional<std::string> call(const std::vector<Argument>& arguments) {
    if constexpr (std::is_member_function_pointer_v<decltype(Operation)>) {
        using Arguments = typename ArgumentsOf<decltype(Operation)>::type;
        return call(Operation, arguments, std::make_index_sequence<std::tuple_size_v<Arguments>>());
    } else {
        Operation();
        return std::nullopt;
    }
}

std::optional<std::string> callByIndex(size_t index, const std::vector<Argument>& arguments) {
    constexpr std::optional<std::string> (*kCalls[])(const std::vector<Argument>&) = {
#define CALL(Class, operation, parameters) call<&android::Class::operation>,
#define VARIABLE(name)
#include "trace/calls.inc"
#undef CALL
#undef VARIABLE
    };
    return kCalls[index](arguments);
}

void setByIndex(size_t index, int32_t value) {
    constexpr void (*kSetters[])(int32_t) = {
#define CALL(Class, operation, parameters)
#define VARIABLE(name) [](int32_t number) { ::name = static_cast<decltype(::name)>(number); },
#include "trace/calls.inc"
#undef CALL
#undef VARIABLE
    };
    kSetters[index](value);
}

trace::Counters lookAtCounters() {
    trace::Counters counters{};
    if (const auto* manager = *expose(BudgetOwner())) counters[0] = manager->*expose(Budget());
    if (const auto* shot = *expose(CountOwner())) counters[1] = shot->*expose(Count());
    if (const auto* exception = *expose(DetectionOwner())) {
        std::copy_n(exception->*expose(Detections()), counters.size() - 2, &counters[2]);
    }
    return counters;
}

}  // namespace

extern "C" const CallModule* sensor_replay_calls() {
    static constexpr CallModule kModule{callByIndex, setByIndex, lookAtCounters};
    return &kModule;
}

}  // namespace replay
