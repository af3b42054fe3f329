#include <gtest/gtest.h>

#include <thread>
#include <vector>

#include "Plinth/Object.h"
#include "Plinth/Ref.h"

namespace {

// Counts destructions so tests can tell exactly when an object goes.
struct Probe : Plinth::ObjectImpl {
    explicit Probe(int* deaths) : deaths_(deaths) {}
    ~Probe() override { ++*deaths_; }
    int* deaths_;
};

struct DerivedProbe : Probe {
    using Probe::Probe;
};

TEST(RefCounting, NewObjectHoldsNoReferenceAndDiesWithTheLast) {
    int deaths = 0;
    auto* p = new Probe(&deaths);
    EXPECT_EQ(p->GetRefCount(), 0);
    {
        Plinth::Ref<Probe> a(p);
        EXPECT_EQ(p->GetRefCount(), 1);
        Plinth::Ref<Probe> b = a;  // copy takes one
        EXPECT_EQ(p->GetRefCount(), 2);
        Plinth::Ref<Probe> c = std::move(b);  // move transfers
        EXPECT_FALSE(b);
        EXPECT_EQ(p->GetRefCount(), 2);
        c.Reset();
        EXPECT_EQ(p->GetRefCount(), 1);
        EXPECT_EQ(deaths, 0);
    }
    EXPECT_EQ(deaths, 1);
}

TEST(RefCounting, ReassignmentReleasesTheOldAfterTakingTheNew) {
    int deaths = 0;
    Plinth::Ref<Probe> a(new Probe(&deaths));
    Probe* second = new Probe(&deaths);
    a.Assign(second);
    EXPECT_EQ(deaths, 1);
    EXPECT_EQ(a.Get(), second);
    a.Assign(second);  // self-assignment keeps the object alive
    EXPECT_EQ(deaths, 1);
    EXPECT_EQ(second->GetRefCount(), 1);
    Plinth::Ref<Probe> b(new Probe(&deaths));
    a = b;
    EXPECT_EQ(deaths, 2);
    EXPECT_EQ(b->GetRefCount(), 2);
    a = a;  // copy self-assignment
    EXPECT_EQ(b->GetRefCount(), 2);
}

TEST(RefCounting, ConvertingCopyAndVector) {
    int deaths = 0;
    {
        Plinth::Ref<DerivedProbe> d(new DerivedProbe(&deaths));
        Plinth::Ref<Probe> base = d;
        EXPECT_EQ(base->GetRefCount(), 2);

        Plinth::RefVector<Probe> list;
        list.reserve(2);
        list.Append(new Probe(&deaths));
        list.push_back(base);
        EXPECT_EQ(list[0]->GetRefCount(), 1);
        EXPECT_EQ(base->GetRefCount(), 3);
        Plinth::RefVector<Probe> copy = list;
        EXPECT_EQ(list[0]->GetRefCount(), 2);
        copy.clear();
        EXPECT_EQ(list[0]->GetRefCount(), 1);
        list.erase(list.begin());
        EXPECT_EQ(deaths, 1);
    }
    EXPECT_EQ(deaths, 2);
}

TEST(RefCounting, ACopiedObjectStartsWithoutReference) {
    int deaths = 0;
    Plinth::Ref<Probe> a(new Probe(&deaths));
    auto* copy = new Probe(*a);
    EXPECT_EQ(copy->GetRefCount(), 0);
    Plinth::Ref<Probe> b(copy);
    b.Reset();
    EXPECT_EQ(deaths, 1);
    EXPECT_EQ(a->GetRefCount(), 1);
}

TEST(RefCounting, ConcurrentCopiesKeepTheCountExact) {
    int deaths = 0;
    Plinth::Ref<Probe> shared(new Probe(&deaths));
    std::vector<std::thread> threads;
    for (int t = 0; t < 4; ++t) {
        threads.emplace_back([&shared] {
            for (int i = 0; i < 10000; ++i) {
                Plinth::Ref<Probe> local = shared;
                (void)local;
            }
        });
    }
    for (auto& th : threads) th.join();
    EXPECT_EQ(shared->GetRefCount(), 1);
    EXPECT_EQ(deaths, 0);
}

TEST(RefCounting, LiveObjectCounterFollowsLifetimes) {
    const long before = Plinth::ObjectImpl::LiveObjects();
    int deaths = 0;
    {
        Plinth::Ref<Probe> a(new Probe(&deaths));
        EXPECT_EQ(Plinth::ObjectImpl::LiveObjects(), before + 1);
    }
    EXPECT_EQ(Plinth::ObjectImpl::LiveObjects(), before);
}

}  // namespace
