// The four holders, and what is done through them.
#include <random>

#include "tests/wrapper-framework/Support.h"
#include "wrapper-framework/source/Exceptions.h"
#include "wrapper-framework/source/KernelRefs.h"
#include "wrapper-framework/source/Tokens.h"

namespace {

using Varnel::DataRef;
using Varnel::DictionaryRef;
using Varnel::ListRef;
using Varnel::ObjectRef;

// A few holders and what each of them should hold, whatever is done to them, and whatever fails meanwhile.
// A handle that is released once too often, or not, is alive no more at once, or in the end.
template <class Ref>
void HoldAsTheModelDoes(const std::string& kind, const std::function<VRKResult(typename Ref::Handle*)>& create) {
  using Handle = typename Ref::Handle;
  Ref owners[2], holders[4];
  Handle handles[3] = {}, model[4] = {};
  for (size_t i = 0; i < 2; ++i) {
    ASSERT_EQ(create(&handles[i]), 0u);
    owners[i].Adopt(handles[i]);
  }
  std::mt19937 random;
  int failures = 0;
  for (int step = 0; step < 3000; ++step) {
    for (size_t i = 0; i < 2; ++i) ASSERT_NO_THROW(Ref{handles[i]});
    const size_t to = random() % 4, from = random() % 4;
    const Handle handle = handles[random() % 3];
    const Handle left = model[from];
    const struct {
      std::function<void()> run;
      Handle held, left;  // afterwards, by both
    } operations[] = {{[&] { holders[to] = Ref(handle); }, handle, to == from ? handle : left},
                      {[&] { holders[to] = holders[from]; }, left, left},
                      {[&] { holders[to] = Ref(holders[from]); }, left, left},
                      {[&] { holders[to].Adopt(Ref(handle).Detach()); }, handle, to == from ? handle : left},
                      {[&] { holders[to] = std::move(holders[from]); }, left, to == from ? left : Handle{}},
                      {[&] { holders[to].Reset(); }, Handle{}, to == from ? Handle{} : left}};
    const auto& operation = operations[random() % 6];
    CallTrace trace;
    if (random() % 3 == 0) trace.FailNext(kind + (random() % 2 == 0 ? "Retain" : "Release"));
    const VRKResult result = CodeOf(operation.run);
    trace.Hear(result);
    ASSERT_EQ(result != 0, result == CallTrace::kFailure);
    ASSERT_EQ(holders[to].Get(), result == 0 ? operation.held : model[to]) << step;
    failures += result != 0;
    model[to] = holders[to].Get();
    model[from] = holders[from].Get();
    ASSERT_TRUE(result != 0 || model[from] == operation.left) << step;
  }
  EXPECT_GT(failures, 300);
}

using KernelRefsTest = KernelTest;

TEST_F(KernelRefsTest, HoldAsTheModelDoes) {
  HoldAsTheModelDoes<DataRef>("VRKData", [](VRKData* out) { return VRKDataCreate(Varnel::gTypeUTF8.Get(), nullptr, 0, 0, out); });
  HoldAsTheModelDoes<ListRef>("VRKList", VRKHostListCreate);
  HoldAsTheModelDoes<DictionaryRef>("VRKDictionary", [](VRKDictionary* out) { return VRKDictionaryCreate(0, out); });
  HoldAsTheModelDoes<ObjectRef>("VRKObject", [](VRKObject* out) { return VRKObjectCreate({}, {}, out); });
}

TEST_F(KernelRefsTest, CoerceIntoThemselvesOnlyWhereItIsPossible) {
  DataRef data;
  data.Create(Varnel::gTypeUTF8.Get(), "ab", 2);
  const VRKData before = data.Get();
  EXPECT_FALSE(data.Coerce(Varnel::MakeToken("type:test"), data));
  EXPECT_EQ(data.Get(), before);
  EXPECT_EQ(CodeOf([&] { data.Coerce({}, data); }), VRKResult{kVRKInvalidHandle});
  EXPECT_EQ(data.Get(), before);
  EXPECT_TRUE(data.Coerce(Varnel::gTypeUTF16.Get(), data));
  EXPECT_NE(data.Get(), before);
}

TEST_F(KernelRefsTest, TokensAreCachedUntilReset) {
  static Varnel::StaticToken token{"token:test"};
  token.token = {};
  CallTrace trace;
  const VRKToken made = token.Get();
  EXPECT_EQ(token.Get(), made);
  EXPECT_EQ(trace.Take(), std::vector{Call("VRKTokenCreate", 1)});
  token.token = {};
  trace.FailNext("VRKTokenCreate");
  EXPECT_EQ(CodeOf([] { token.Get(); }), CallTrace::kFailure);
  EXPECT_EQ(token.Get(), made);
  EXPECT_EQ(Varnel::MakeToken("token:test"), made);
  EXPECT_EQ(Varnel::TokenName(made), orvane::name_t("token:test"));
  EXPECT_EQ(Varnel::MakeToken(orvane::name_t("token:test")), made);
}

}  // namespace
