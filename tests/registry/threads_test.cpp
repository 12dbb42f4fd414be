// Concurrent calls: several threads run every operation of the registry at
// once, each on pictures and results of its own, and every result must equal
// the one-thread result. Operations whose result depends on libc's random
// stream (found by running them under two seeds) share that stream: they run
// one at a time under a lock and reseeded, as callers on several threads must
// run them. The ThreadSanitizer build of .ci/run runs this test too.
#include <mutex>
#include <thread>

#include "operations.hpp"
#include "support/test_images.hpp"

using namespace pxtest;

namespace {

struct Job {
    const pxop::Operation *op;
    uint32_t bits;
    bool random;
};

Owned run(const pxop::Operation &op, const Image *picture, uint32_t bits, long seed) {
    const Owned in(pxop::convert_to(picture, bits));
    if (seed >= 0) srand48(seed);
    return Owned(op.run(in.get(), pxop::default_args(op)));
}

Owned run(const Job &job, const Image *picture, std::mutex &random) {
    if (!job.random) return run(*job.op, picture, job.bits, -1);
    const std::lock_guard<std::mutex> hold(random);
    return run(*job.op, picture, job.bits, 7);
}

std::string compare(const Image *got, const Image *want) {
    return got == nullptr && want == nullptr ? std::string() : diff(got, want);
}

} // namespace

TEST(Threads, EveryOperationAtOnceEqualsOneThread) {
    const Owned picture = random_image(37, 23, 32, 99);
    std::vector<Job> jobs;
    for (const pxop::Operation &op : pxop::operations())
        for (uint32_t bits : {8u, 16u, 24u, 32u})
            if (op.formats & pxop::format_of(bits)) {
                const Owned a = run(op, picture.get(), bits, 7), b = run(op, picture.get(), bits, 8);
                jobs.push_back({&op, bits, !compare(a.get(), b.get()).empty()});
            }
    std::mutex random;
    std::vector<Owned> want;
    for (const Job &job : jobs)
        want.push_back(run(job, picture.get(), random));

    // Each thread starts at another place in the list, so that different
    // operations overlap as well as the same ones.
    constexpr size_t kThreads = 4;
    std::vector<std::vector<std::string>> failures(kThreads);
    std::vector<std::thread> threads;
    for (size_t t = 0; t < kThreads; ++t)
        threads.emplace_back([&, t] {
            for (size_t k = 0; k < jobs.size(); ++k) {
                const size_t i = (k + t * jobs.size() / kThreads) % jobs.size();
                const Owned got = run(jobs[i], picture.get(), random);
                if (std::string d = compare(got.get(), want[i].get()); !d.empty())
                    failures[t].push_back(std::string(jobs[i].op->name) + " at " + std::to_string(jobs[i].bits) +
                                          " bits: " + d);
            }
        });
    for (std::thread &thread : threads)
        thread.join();
    for (const auto &list : failures)
        for (const std::string &f : list)
            ADD_FAILURE() << f;
}
