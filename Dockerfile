# The program in a Debian of its own:
#
#   docker build --tag velta .
#   docker run --rm --volume "$PWD:/data" velta decode stream.rtcm3

FROM debian:12 AS build
COPY . /velta
WORKDIR /velta
RUN bash -c '. scripts/common.sh && require_packages "${build_packages[@]}" dpkg-dev file && \
    build release && step "Making the packages" cpack --config build/release/CPackConfig.cmake'

FROM debian:12
COPY --from=build /velta/build/release/packages/*.deb /tmp/packages/
RUN apt-get update && \
    apt-get install --yes --no-install-recommends /tmp/packages/libvelta1_*.deb /tmp/packages/velta_*.deb && \
    rm -r /tmp/packages /var/lib/apt/lists/*
WORKDIR /data
ENTRYPOINT ["velta"]
