// A function as an argument, without a template for each caller and without memory of its own.

#ifndef VORN_TABLE_CALLABLE_H
#define VORN_TABLE_CALLABLE_H

#include <utility>

namespace vornjsondb {

template <typename Signature>
class Callable;

// Points to what it was made from, so it is passed on and never kept.
template <typename Result, typename... Arguments>
class Callable<Result(Arguments...)> {
  public:
    template <typename Function>
    Callable(const Function& fnCalled)  // NOLINT(google-explicit-constructor): lambdas are passed
        : m_pCalled(&fnCalled), m_pfnCall([](const void* pCalled, Arguments... Given) -> Result {
              return (*static_cast<const Function*>(pCalled))(std::forward<Arguments>(Given)...);
          }) {}

    Result operator()(Arguments... Given) const {
        return m_pfnCall(m_pCalled, std::forward<Arguments>(Given)...);
    }

  private:
    const void* m_pCalled;
    Result (*m_pfnCall)(const void* pCalled, Arguments... Given);
};

}  // namespace vornjsondb

#endif  // VORN_TABLE_CALLABLE_H
