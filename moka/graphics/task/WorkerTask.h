/// WorkerTask: tasks that call a member function with copies of its arguments, or delete an object, on the
/// render thread; and functions that post them.
///
/// The task stores arguments by value, in the decayed type of the parameter. A reference parameter refers to
/// the task's copy, so a result that the function writes to it is lost. A by-value parameter gets another
/// copy. The task owns neither the object nor the targets of stored pointers.
// Compat: reference-arguments
#pragma once

#include "moka/graphics/task/IGLMsgQueue.h"
#include "moka/graphics/task/ITask.h"

#include <tuple>
#include <type_traits>
#include <utility>

namespace Moka::WorkerTask {

/// Calls a member function, which may be virtual, and ignores its result. F is the type of the member
/// pointer.
template <class T, class F, class... Arguments>
class Member final : public ITask {
public:
    /// Copies function and values.
    template <class... Values>
    Member(T* object, F function, Values&&... values)
        : mObject(object), mFunction(function), mArguments(std::forward<Values>(values)...) {}

    /// Calls the function.
    void run() override { Call(std::index_sequence_for<Arguments...>()); }

private:
    // Not std::apply: with sanitizers, GCC 12 passes it an uninitialised lambda.
    template <std::size_t... Index>
    void Call(std::index_sequence<Index...>) {
        (mObject->*mFunction)(std::get<Index>(mArguments)...);
    }

    T* mObject;
    F mFunction;
    std::tuple<Arguments...> mArguments;
};

/// Member with this many arguments.
template <class T, class F>
using Member0 = Member<T, F>;
template <class T, class F, class A1>
using Member1 = Member<T, F, A1>;
template <class T, class F, class A1, class A2>
using Member2 = Member<T, F, A1, A2>;
template <class T, class F, class A1, class A2, class A3>
using Member3 = Member<T, F, A1, A2, A3>;
template <class T, class F, class A1, class A2, class A3, class A4>
using Member4 = Member<T, F, A1, A2, A3, A4>;
template <class T, class F, class A1, class A2, class A3, class A4, class A5>
using Member5 = Member<T, F, A1, A2, A3, A4, A5>;

/// Deletes an object when it runs. If the task never runs, the object is not deleted.
template <class T>
class Delete final : public ITask {
public:
    /// Stores pointer.
    explicit Delete(T* pointer) : mPointer(pointer) {}
    /// Deletes the object.
    void run() override { delete mPointer; }

private:
    T* mPointer;
};

/// Deletes an array when it runs.
template <class T>
class DeleteArray final : public ITask {
public:
    /// Stores pointer.
    explicit DeleteArray(T* pointer) : mPointer(pointer) {}
    /// Frees the array.
    void run() override { delete[] mPointer; }

private:
    T* mPointer;
};

namespace detail {

template <class T, class F, class... Parameters>
using MemberFor = Member<T, F, std::decay_t<Parameters>...>;

/// The member task for a function. It stores the decayed parameter types.
template <class T, class F>
struct TaskFor;
template <class T, class R, class C, class... P>
struct TaskFor<T, R (C::*)(P...)> {
    using Type = MemberFor<T, R (C::*)(P...), P...>;
};
template <class T, class R, class C, class... P>
struct TaskFor<T, R (C::*)(P...) const> {
    using Type = MemberFor<T, R (C::*)(P...) const, P...>;
};
template <class T, class R, class C, class... P>
struct TaskFor<T, R (C::*)(P...) noexcept> {
    using Type = MemberFor<T, R (C::*)(P...) noexcept, P...>;
};
template <class T, class R, class C, class... P>
struct TaskFor<T, R (C::*)(P...) const noexcept> {
    using Type = MemberFor<T, R (C::*)(P...) const noexcept, P...>;
};

} // namespace detail

/// Posts a task, and deletes it if the queue refuses. Returns true if the queue accepted it. A null task
/// (memory ran out) is posted as well, so that the queue sees the attempt, and counts as refused.
inline bool PostOrDestroy(IGLMsgQueue* queue, ITask* task) {
    if (queue->Post(task)) return task != nullptr;
    delete task;
    return false;
}

/// Posts object->function(values...). Returns false if the queue refuses. A reference that the caller took
/// for the task is then kept, so the object is never deleted.
// Compat: refused-post
template <class T, class F, class... Values>
bool PostMember(IGLMsgQueue* queue, T* object, F function, Values&&... values) {
    using Task = typename detail::TaskFor<T, F>::Type;
    return PostOrDestroy(queue, new (std::nothrow) Task(object, function, std::forward<Values>(values)...));
}

/// Posts the deletion of an object. If the queue refuses, the object leaks, because it must not be deleted on
/// another thread.
template <class T>
bool PostDelete(IGLMsgQueue* queue, T* pointer) {
    return PostOrDestroy(queue, new (std::nothrow) Delete<T>(pointer));
}

/// Posts the deletion of an array.
template <class T>
bool PostDeleteArray(IGLMsgQueue* queue, T* pointer) {
    return PostOrDestroy(queue, new (std::nothrow) DeleteArray<T>(pointer));
}

} // namespace Moka::WorkerTask
