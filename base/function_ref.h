#ifndef TAVIWIRELESS_BASE_FUNCTION_REF_H
#define TAVIWIRELESS_BASE_FUNCTION_REF_H

namespace taviwireless {

// A function that is borrowed for a call, such as a lambda among the arguments. Without what
// <functional> costs everybody who includes it.
template <typename Signature>
class FunctionRef;

template <typename Result, typename... Arguments>
class FunctionRef<Result(Arguments...)> {
  public:
    template <typename Function>
    FunctionRef(const Function& function)
        : function_(&function), call_([](const void* borrowed, Arguments... arguments) -> Result {
              return (*static_cast<const Function*>(borrowed))(arguments...);
          }) {}

    Result operator()(Arguments... arguments) const { return call_(function_, arguments...); }

  private:
    const void* function_;
    Result (*call_)(const void* borrowed, Arguments... arguments);
};

}  // namespace taviwireless

#endif
