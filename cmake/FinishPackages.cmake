# CPack runs this after it has staged the files of the packages: adds the files that Debian requires, and checks the
# exports of the libraries.
cmake_policy(VERSION 3.25)

macro(run)
  execute_process(COMMAND ${ARGN} COMMAND_ERROR_IS_FATAL ANY)
endmacro()

# The changelog: one entry that refers to the project's changelog.
string(TIMESTAMP date "%a, %d %b %Y %H:%M:%S +0000" UTC)
set(changelog "${CPACK_PACKAGE_NAME} (${CPACK_PACKAGE_VERSION}-${CPACK_DEBIAN_PACKAGE_RELEASE}) unstable; urgency=medium

  * Version ${CPACK_PACKAGE_VERSION}; changelog.gz says what is new.

 -- ${CPACK_DEBIAN_PACKAGE_MAINTAINER}  ${date}
")

foreach(component IN LISTS CPACK_COMPONENTS_ALL)
  string(TOUPPER ${component} upper)
  set(package ${CPACK_DEBIAN_${upper}_PACKAGE_NAME})
  set(root ${CPACK_TEMPORARY_INSTALL_DIRECTORY}/${component}${CPACK_PACKAGING_INSTALL_PREFIX})
  set(documents ${root}/share/doc/${package})
  file(WRITE ${documents}/changelog.Debian "${changelog}")
  configure_file(${MOKA_SOURCE_DIR}/CHANGELOG.md ${documents}/changelog COPYONLY)
  configure_file(${MOKA_SOURCE_DIR}/debian/copyright ${documents}/copyright COPYONLY)
  configure_file(${MOKA_SOURCE_DIR}/debian/lintian-overrides ${root}/share/lintian/overrides/${package} COPYONLY)
  file(GLOB pages ${root}/share/man/man*/*)
  run(gzip -9nf ${documents}/changelog ${documents}/changelog.Debian ${pages})

  # Libraries in the system's folders need no run path.
  file(GLOB programs ${root}/bin/* ${root}/${MOKA_LIBDIR}/*.so.*.*.*)
  foreach(program IN LISTS programs)
    file(RPATH_REMOVE FILE ${program})
  endforeach()
  file(GLOB archives ${root}/${MOKA_LIBDIR}/*.a)
  if(archives)
    run(${MOKA_STRIP} --strip-debug --enable-deterministic-archives ${archives})
  endif()
endforeach()

set(stage ${CPACK_TEMPORARY_INSTALL_DIRECTORY})
set(libraries ${stage}/MokaRuntime${CPACK_PACKAGING_INSTALL_PREFIX}/${MOKA_LIBDIR})
set(exports "")
if("MokaJava" IN_LIST CPACK_COMPONENTS_ALL)
  set(exports -DEXPORTS=${MOKA_SOURCE_DIR}/cmake/exports.txt)
  # The folder in which Debian's Java finds native libraries.
  set(folder ${stage}/MokaJava${CPACK_PACKAGING_INSTALL_PREFIX}/${MOKA_LIBDIR}/jni)
  file(MAKE_DIRECTORY ${folder})
  file(CREATE_LINK ../libMokaGraphics.so.${MOKA_SOVERSION} ${folder}/libMokaGraphics.so SYMBOLIC)
endif()
run(${CMAKE_COMMAND} -DLIBRARY=${libraries}/libMokaGraphics.so.${CPACK_PACKAGE_VERSION} -DREADELF=${MOKA_READELF}
  -DNM=${MOKA_NM} ${exports} -P ${MOKA_SOURCE_DIR}/cmake/CheckLoading.cmake)

# The exported symbols, with the version that added them, without templates of the standard library.
file(GLOB files ${libraries}/*.so.*.*.*)
list(TRANSFORM files PREPEND -e)
set(symbols ${MOKA_BINARY_DIR}/debian/symbols)
run(dpkg-gensymbols -p${CPACK_DEBIAN_MOKARUNTIME_PACKAGE_NAME} -v${CPACK_PACKAGE_VERSION} -P${stage}/MokaRuntime
  ${files} -O${symbols})
file(STRINGS ${symbols} lines)
list(FILTER lines EXCLUDE REGEX "^ _Z(T[VIST]|GV)?Z?N?[KVRO]*(S[tabsiod]|9__gnu_cxx)")
list(JOIN lines "\n" lines)
file(WRITE ${symbols} "${lines}\n")
