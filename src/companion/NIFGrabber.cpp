#include "NIFGrabber.h"

#include "ChainedNIFGrabber.h"

namespace zelctl::companion {

namespace {

NIFGrabber *createDefault(QObject *parent)
{
    return new ChainedNIFGrabber(parent);
}

NIFGrabberFactory &factory()
{
    static NIFGrabberFactory current = createDefault;
    return current;
}

} // namespace

NIFGrabber *createNIFGrabber(QObject *parent)
{
    return factory()(parent);
}

NIFGrabberFactory setNIFGrabberFactory(NIFGrabberFactory replacement)
{
    NIFGrabberFactory previous = std::move(factory());
    factory() = replacement ? std::move(replacement) : NIFGrabberFactory(createDefault);
    return previous;
}

} // namespace zelctl::companion
