# orvane_translation(PO DOMAIN FOLDER)
#
# Compiles the translations of a .po file, which is named after its language, into
# FOLDER/<language>/LC_MESSAGES/<DOMAIN>.mo. The target is <DOMAIN>_translation_<language>.

find_program(MSGFMT msgfmt REQUIRED)

function(orvane_translation po domain folder)
    get_filename_component(language ${po} NAME_WE)
    set(folder ${folder}/${language}/LC_MESSAGES)
    set(mo ${folder}/${domain}.mo)
    add_custom_command(OUTPUT ${mo}
        COMMAND ${CMAKE_COMMAND} -E make_directory ${folder}
        COMMAND ${MSGFMT} --check-format --check-domain --output-file=${mo} ${po}
        DEPENDS ${po} VERBATIM)
    add_custom_target(${domain}_translation_${language} ALL DEPENDS ${mo})
endfunction()
