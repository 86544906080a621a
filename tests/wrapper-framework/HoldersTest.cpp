// The four holders, and what is done through them.
#include <optional>

#include "Exceptions.h"
#include "Holders.h"
#include "Support.h"
#include "Tokens.h"

namespace {

using namespace std::string_literals;
using Varnel::DataRef;
using Varnel::DictionaryRef;
using Varnel::ListRef;
using Varnel::ObjectRef;

// How each kind of handle is called in the kernel, and made.
struct DataKind {
  using Holder = DataRef;
  static constexpr char kName[] = "VRKData";
  static void Create(VRKData* out) { EXPECT_EQ(VRKDataCreate(Varnel::MakeToken("type:test"), nullptr, 0, 0, out), 0u); }
};
struct ListKind {
  using Holder = ListRef;
  static constexpr char kName[] = "VRKList";
  static void Create(VRKList* out) { EXPECT_EQ(VRKHostListCreate(out), 0u); }
};
struct DictionaryKind {
  using Holder = DictionaryRef;
  static constexpr char kName[] = "VRKDictionary";
  static void Create(VRKDictionary* out) { EXPECT_EQ(VRKDictionaryCreate(0, out), 0u); }
};
struct ObjectKind {
  using Holder = ObjectRef;
  static constexpr char kName[] = "VRKObject";
  static void Create(VRKObject* out) { EXPECT_EQ(VRKObjectCreate({}, {}, out), 0u); }
};

template <class Kind>
class HolderTest : public KernelTest {
 protected:
  using Holder = typename Kind::Holder;
  using Handle = typename Holder::Handle;

  HolderTest() : handleA(Create(ownA)), handleB(Create(ownB)) { trace.emplace(); }

  static Handle Create(Holder& owner) {
    Handle handle{};
    Kind::Create(&handle);
    owner.Adopt(handle);
    return handle;
  }
  static std::string Retain(Handle handle) { return Call(Kind::kName + "Retain"s, handle); }
  static std::string Release(Handle handle) { return Call(Kind::kName + "Release"s, handle); }

  // The calls since the last time.
  void ExpectCalls(const std::vector<std::string>& expected, const char* when) { EXPECT_EQ(trace->Take(), expected) << when; }
  void FailNext(const std::string& what) { trace->FailNext(Kind::kName + what); }

  Holder ownA, ownB;
  Handle handleA, handleB;
  std::optional<CallTrace> trace;
};

using Kinds = testing::Types<DataKind, ListKind, DictionaryKind, ObjectKind>;
TYPED_TEST_SUITE(HolderTest, Kinds);

TYPED_TEST(HolderTest, CountsReferences) {
  using Ref = typename TestFixture::Holder;
  const auto a = this->handleA, b = this->handleB;
  const auto retainA = this->Retain(a), releaseA = this->Release(a);
  const auto retainB = this->Retain(b), releaseB = this->Release(b);
  {
    Ref first(a);
    this->ExpectCalls({retainA}, "from a handle");
    Ref second(first);
    this->ExpectCalls({retainA}, "copied");
    Ref third(std::move(second));
    EXPECT_FALSE(second);
    EXPECT_EQ(third.Get(), a);
    this->ExpectCalls({}, "moved");
    Ref other(b);
    third = other;
    EXPECT_EQ(third.Get(), b);
    this->ExpectCalls({retainB, retainB, releaseA}, "assigned");
    third = std::move(first);
    EXPECT_EQ(third.Get(), a);
    this->ExpectCalls({releaseB}, "move-assigned");
    third = *&third;
    this->ExpectCalls({retainA, releaseA}, "assigned to itself");
    third.Adopt(other.Detach());
    EXPECT_FALSE(other);
    this->ExpectCalls({releaseA}, "adopted");
    third.Reset();
    EXPECT_FALSE(third);
    this->ExpectCalls({releaseB}, "reset");
    third.Adopt(Ref(a).Detach());
    this->ExpectCalls({retainA}, "detached");
  }
  this->ExpectCalls({releaseA}, "destroyed");
}

TYPED_TEST(HolderTest, HoldsWhatItHeldAfterAFailure) {
  using Ref = typename TestFixture::Holder;
  const auto a = this->handleA, b = this->handleB;
  const auto failure = CallTrace::kFailure;
  const auto retainA = this->Retain(a), releaseA = this->Release(a);
  const auto retainB = this->Retain(b), releaseB = this->Release(b);
  {
    this->FailNext("Retain");
    EXPECT_EQ(CodeOf([&] { Ref holder(a); }), failure);
    this->ExpectCalls({retainA}, "construction");
    Ref holder(a), other(b);
    this->ExpectCalls({retainA, retainB}, "set up");
    this->FailNext("Retain");
    EXPECT_EQ(CodeOf([&] { holder = other; }), failure);
    EXPECT_EQ(holder.Get(), a);
    this->ExpectCalls({retainB}, "assignment without a retain");
    this->FailNext("Release");
    EXPECT_EQ(CodeOf([&] { holder = other; }), failure);
    EXPECT_EQ(holder.Get(), a);
    this->ExpectCalls({retainB, releaseA, releaseB}, "assignment without a release");
    this->FailNext("Release");
    EXPECT_EQ(CodeOf([&] { holder.Adopt(other.Detach()); }), failure);
    EXPECT_EQ(holder.Get(), a);
    this->ExpectCalls({releaseA, releaseB}, "adoption without a release");
  }
  this->ExpectCalls({releaseA}, "destruction");
}

using HoldersTest = KernelTest;

TEST_F(HoldersTest, CoerceIntoThemselvesOnlyWhereItIsPossible) {
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

TEST_F(HoldersTest, TokensAreCachedUntilReset) {
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
