#include <common/mutex.h>

#include <common/assert.h>

static constexpr char kSource[] = GR_SOURCE("common/unix/mutex_unix");

void Common::Mutex::lock()
{
    int const ret = pthread_mutex_lock(&mutex);
    GR_ASSERT(ret == 0);
}

void Common::Mutex::unlock()
{
    int const ret = pthread_mutex_unlock(&mutex);
    GR_ASSERT_LINE(ret == 0, R"(ret == 0 && "Probably unlock from non-owner thread!")", 51);
}
