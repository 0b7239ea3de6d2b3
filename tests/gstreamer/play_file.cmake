# Makes an Ogg file of the sample and plays it, as a user does.
cmake_minimum_required(VERSION 3.25)
file(REMOVE_RECURSE ${WORK})
file(MAKE_DIRECTORY ${WORK})
set(run COMMAND_ERROR_IS_FATAL ANY)
execute_process(COMMAND ${FFMPEG} -v error -i ${CLIP} -frames:v 10 -an -c:v libtheora
    ${WORK}/clip.ogv ${run})
execute_process(COMMAND ${LAUNCH} -v filesrc location=${WORK}/clip.ogv ! decodebin
    ! vidshowsink name=sink sync=false OUTPUT_VARIABLE told ${run})
if(NOT told MATCHES "width=\\(int\\)768, height=\\(int\\)576")
    message(FATAL_ERROR "no picture of the clip's size reached the sink:\n${told}")
endif()
